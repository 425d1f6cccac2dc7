#pragma once

#include <QByteArray>
#include <QList>

#include <functional>

namespace sim {

// The instrument's transmitter. Replies go out whole (or in the pieces a
// fault asks for), in the order they were made, each as soon as it is due.
// Unasked messages (a new alarm, a Brumalet reading that takes its time)
// wait for an idle line: no reply pending or going out, nothing heard or
// sent for a quiet time, and the instrument in no dialogue. A reply that
// falls due just after an unasked message waits out the quiet time, so a
// reader never finds two messages in one read.
class Outbox {
public:
    using Sink = std::function<void(const QByteArray&)>;
    explicit Outbox(Sink sink) : m_sink(std::move(sink)) {}

    int quietMs = 100;

    void reply(const QByteArray& bytes, qint64 now, int delayMs);
    // Not before now + afterMs. The same text already waiting is not queued
    // twice: one "alm-new" stands for every alarm logged meanwhile.
    void unasked(const QByteArray& bytes, qint64 now, int afterMs = 0);
    // Bytes arrived from the line.
    void heard(qint64 now) { m_lastRx = now; }
    // Sends what may go now. idle: no dialogue under way and no command
    // half received. Pieces of pieceBytes (0: whole), pieceGapMs apart.
    void pump(qint64 now, bool idle, int pieceBytes, int pieceGapMs);
    // When the next reply or piece falls due; -1 when none is waiting.
    // Unasked messages are not counted: they wait for a quiet line anyway.
    qint64 nextDue() const;
    void clear();

private:
    struct Message {
        qint64 due;
        QByteArray bytes;
    };
    Sink m_sink;
    QList<Message> m_replies;
    QList<Message> m_unasked;
    QByteArray m_sending;
    bool m_sendingUnasked = false;
    qint64 m_nextPiece = 0;
    qint64 m_lastRx = -1000000;
    qint64 m_lastTx = -1000000;
    qint64 m_unaskedEnd = -1000000;
};

} // namespace sim
