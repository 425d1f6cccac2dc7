#include "sim/sim_outbox.h"

namespace sim {

void Outbox::reply(const QByteArray& bytes, qint64 now, int delayMs)
{
    if (!bytes.isEmpty())
        m_replies.append({now + qMax(0, delayMs), bytes});
}

void Outbox::unasked(const QByteArray& bytes, qint64 now, int afterMs)
{
    for (const Message& m : m_unasked)
        if (m.bytes == bytes)
            return;
    if (!bytes.isEmpty())
        m_unasked.append({now + qMax(0, afterMs), bytes});
}

void Outbox::clear()
{
    m_replies.clear();
    m_unasked.clear();
    m_sending.clear();
}

qint64 Outbox::nextDue() const
{
    if (!m_sending.isEmpty())
        return m_nextPiece;
    if (!m_replies.isEmpty())
        return qMax(m_replies.first().due, m_unaskedEnd + quietMs);
    return -1;
}

void Outbox::pump(qint64 now, bool idle, int pieceBytes, int pieceGapMs)
{
    for (;;) {
        if (!m_sending.isEmpty()) {
            if (m_nextPiece > now)
                return;
            const QByteArray piece = pieceBytes > 0 ? m_sending.left(pieceBytes) : m_sending;
            m_sending.remove(0, piece.size());
            m_lastTx = now;
            m_nextPiece += qMax(0, pieceGapMs);
            if (m_sending.isEmpty() && m_sendingUnasked)
                m_unaskedEnd = now;
            m_sink(piece);
            continue;
        }
        if (!m_replies.isEmpty()) {
            // A reply pending holds back every unasked message.
            if (qMax(m_replies.first().due, m_unaskedEnd + quietMs) > now)
                return;
            m_sending = m_replies.takeFirst().bytes;
            m_sendingUnasked = false;
            m_nextPiece = now;
            continue;
        }
        if (!idle || now - m_lastRx < quietMs || now - m_lastTx < quietMs)
            return;
        int i = 0;
        while (i < m_unasked.size() && m_unasked[i].due > now)
            ++i;
        if (i == m_unasked.size())
            return;
        m_sending = m_unasked.takeAt(i).bytes;
        m_sendingUnasked = true;
        m_nextPiece = now;
    }
}

} // namespace sim
