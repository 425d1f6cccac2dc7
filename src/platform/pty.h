#pragma once

#include <QByteArray>
#include <QString>

// A pseudo-terminal pair in raw mode: the slave path is a serial device for
// SerialLine, the master is the far end (a simulated instrument or a test).
// The slave stays open here as well, so that the master keeps working while
// no line has the slave open, and does not see a hang-up between connects.
class PtyPair {
public:
    PtyPair();
    ~PtyPair();
    PtyPair(const PtyPair&) = delete;
    PtyPair& operator=(const PtyPair&) = delete;

    // False when openpty failed; errorString() says why.
    bool isValid() const { return m_master >= 0; }
    QString errorString() const { return m_error; }

    int masterFd() const { return m_master; }
    QString slavePath() const { return m_slavePath; }
    // The slave as opened here (-1 after releaseSlave()); polling it tells
    // when bytes written to the master have reached the slave's input.
    int slaveFd() const { return m_slave; }

    // Writes all bytes to the master. False on error or when closed.
    bool writeMaster(const QByteArray& bytes);
    // Reads what the master has, waiting up to timeoutMs for the first byte
    // and then taking whatever else follows without further wait.
    QByteArray readMaster(int timeoutMs);
    // Hangs up: the slave side then reads end of line (EIO).
    void closeMaster();
    // Lets the slave be closed by its last user only, so that closing the
    // master is seen as the far end going away.
    void releaseSlave();

private:
    int m_master = -1;
    int m_slave = -1;
    QString m_slavePath;
    QString m_error;
};
