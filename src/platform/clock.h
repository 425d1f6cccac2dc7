#pragma once

#include <QDateTime>
#include <QObject>

class Timer;

// Time as the program sees it. Timers run against a clock, so that a test can
// run a minute of waits in microseconds.
class Clock : public QObject {
    Q_OBJECT
public:
    using QObject::QObject;
    ~Clock() override = default;

    // Milliseconds on a monotonic count, for measuring waits.
    virtual qint64 elapsedMs() const = 0;
    // Wall-clock time, for dates shown and stored.
    virtual QDateTime now() const = 0;
    // Freezes the whole program for ms milliseconds: no timer and no arrival
    // is handled meanwhile. Used where a modem needs its guard time.
    virtual void sleep(int ms) = 0;

protected:
    friend class Timer;
    // Arms the timer to fire after ms, and every ms after that until disarmed.
    virtual void arm(Timer* timer, int ms) = 0;
    virtual void disarm(Timer* timer) = 0;
    // Lets a clock deliver a due timer.
    static void fire(Timer* timer);
};

// A timer as the forms use it: an interval, an enabled flag and one event.
// Enabling starts the count; enabling an enabled timer changes nothing;
// setting the interval while enabled starts the count again. It fires every
// interval until disabled; an interval of 0 never fires.
class Timer : public QObject {
    Q_OBJECT
public:
    explicit Timer(Clock& clock, int interval = 0, QObject* parent = nullptr);
    ~Timer() override;

    int Interval() const { return m_interval; }
    void setInterval(int ms);
    bool Enabled() const { return m_enabled; }
    void setEnabled(bool on);
    // Shorthands for the two commonest uses.
    void start(int ms) { setInterval(ms); setEnabled(true); }
    void stop() { setEnabled(false); }

signals:
    void timeout();

private:
    friend class Clock;
    void rearm();
    Clock& m_clock;
    int m_interval = 0;
    bool m_enabled = false;
};

// The real clock: Qt's timers and the system's time.
class SystemClock : public Clock {
    Q_OBJECT
public:
    explicit SystemClock(QObject* parent = nullptr);
    qint64 elapsedMs() const override;
    QDateTime now() const override;
    void sleep(int ms) override;

protected:
    void arm(Timer* timer, int ms) override;
    void disarm(Timer* timer) override;
};
