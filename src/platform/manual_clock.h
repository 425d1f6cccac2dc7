#pragma once

#include "platform/clock.h"

#include <QList>

// A clock for tests: time moves only by advance() and sleep(). advance()
// fires the due timers in time order (ties in the order they were armed),
// including timers armed or re-armed by a handler while it runs.
class ManualClock : public Clock {
    Q_OBJECT
public:
    explicit ManualClock(QDateTime start = QDateTime(QDate(2026, 1, 5), QTime(8, 0)),
                         QObject* parent = nullptr);

    qint64 elapsedMs() const override { return m_now; }
    QDateTime now() const override { return m_start.addMSecs(m_now); }
    // Moves time without firing anything: what is due fires at the next advance().
    void sleep(int ms) override;
    qint64 sleptMs() const { return m_slept; }

    void advance(qint64 ms);
    // Advances to the next due timer and fires it. False when none is armed.
    bool fireNext();
    bool isArmed(const Timer* timer) const;
    // Milliseconds until the timer fires, or -1 when it is not armed.
    qint64 remaining(const Timer* timer) const;

protected:
    void arm(Timer* timer, int ms) override;
    void disarm(Timer* timer) override;

private:
    struct Entry {
        Timer* timer;
        qint64 due;
        quint64 seq;
        int interval;
    };
    QDateTime m_start;
    qint64 m_now = 0;
    qint64 m_slept = 0;
    quint64 m_seq = 0;
    QList<Entry> m_entries;
};
