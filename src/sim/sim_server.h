#pragma once

#include "sim/sim_instrument.h"

#include <QElapsedTimer>
#include <QObject>
#include <QTimer>

#include <memory>

class PtyPair;
class QSocketNotifier;
class QTcpServer;
class QTcpSocket;

namespace sim {

// Puts an Instrument on a pseudo-terminal or a TCP port of 127.0.0.1, runs
// its time from the real clock, and takes control lines from stdin.
class Server : public QObject {
    Q_OBJECT
public:
    explicit Server(Instrument& instrument, QObject* parent = nullptr);
    ~Server() override;

    // The slave's path, or an empty text with error set.
    QString openPty(QString* error);
    bool listenTcp(quint16 port, QString* error);
    // Control lines from stdin. When stdin is a pipe and closes, the
    // simulator ends: whoever started it has let go.
    void watchStdin();
    // Starts the clock; with greet the instrument says "AT&FE0" as it boots.
    void start(bool greet);

private:
    void tick();
    // A reply due before the next tick goes out on time, not on the tick.
    void wakeForReply();
    void fromLine(const QByteArray& bytes);
    void toLine(const QByteArray& bytes);
    void readPty();
    void readStdin();

    Instrument& m_instrument;
    QElapsedTimer m_elapsed;
    qint64 m_last = 0;
    QTimer m_tick;
    QTimer m_wake;
    std::unique_ptr<PtyPair> m_pty;
    QSocketNotifier* m_ptyNotifier = nullptr;
    QTcpServer* m_tcp = nullptr;
    QTcpSocket* m_client = nullptr;
    QSocketNotifier* m_stdin = nullptr;
    QByteArray m_stdinLine;
    bool m_stdinIsPipe = false;
};

} // namespace sim
