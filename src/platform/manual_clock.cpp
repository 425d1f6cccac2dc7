#include "platform/manual_clock.h"

#include <algorithm>

ManualClock::ManualClock(QDateTime start, QObject* parent) : Clock(parent), m_start(std::move(start)) {}

void ManualClock::sleep(int ms)
{
    if (ms <= 0)
        return;
    m_now += ms;
    m_slept += ms;
}

void ManualClock::arm(Timer* timer, int ms)
{
    m_entries.append({timer, m_now + ms, m_seq++, ms});
}

void ManualClock::disarm(Timer* timer)
{
    m_entries.removeIf([timer](const Entry& e) { return e.timer == timer; });
}

bool ManualClock::isArmed(const Timer* timer) const
{
    return std::any_of(m_entries.begin(), m_entries.end(),
                       [timer](const Entry& e) { return e.timer == timer; });
}

qint64 ManualClock::remaining(const Timer* timer) const
{
    for (const Entry& e : m_entries)
        if (e.timer == timer)
            return std::max<qint64>(0, e.due - m_now);
    return -1;
}

bool ManualClock::fireNext()
{
    if (m_entries.isEmpty())
        return false;
    auto next = std::min_element(m_entries.begin(), m_entries.end(), [](const Entry& a, const Entry& b) {
        return a.due != b.due ? a.due < b.due : a.seq < b.seq;
    });
    Entry e = *next;
    m_entries.erase(next);
    m_now = std::max(m_now, e.due);
    // Periodic: the next tick is armed before the handler runs, so that a
    // handler which stops or restarts its timer has the last word.
    m_entries.append({e.timer, e.due + e.interval, m_seq++, e.interval});
    fire(e.timer);
    return true;
}

void ManualClock::advance(qint64 ms)
{
    const qint64 target = m_now + std::max<qint64>(0, ms);
    for (;;) {
        auto next = std::min_element(m_entries.begin(), m_entries.end(), [](const Entry& a, const Entry& b) {
            return a.due != b.due ? a.due < b.due : a.seq < b.seq;
        });
        if (next == m_entries.end() || next->due > target)
            break;
        fireNext();
        // A sleep inside a handler may have carried time past the target.
    }
    m_now = std::max(m_now, target);
}
