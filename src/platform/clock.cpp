#include "platform/clock.h"

#include <QElapsedTimer>
#include <QThread>
#include <QTimer>

void Clock::fire(Timer* timer)
{
    emit timer->timeout();
}

Timer::Timer(Clock& clock, int interval, QObject* parent)
    : QObject(parent), m_clock(clock), m_interval(interval)
{
}

Timer::~Timer()
{
    if (m_enabled)
        m_clock.disarm(this);
}

void Timer::setInterval(int ms)
{
    m_interval = ms;
    if (m_enabled)
        rearm();
}

void Timer::setEnabled(bool on)
{
    if (on == m_enabled)
        return;
    m_enabled = on;
    if (on)
        rearm();
    else
        m_clock.disarm(this);
}

void Timer::rearm()
{
    m_clock.disarm(this);
    if (m_interval > 0)
        m_clock.arm(this, m_interval);
}

// ---------------------------------------------------------------------------

namespace {
// One Qt timer per program timer, kept as its child so that it dies with it.
QTimer* qtTimerOf(Timer* timer, bool create)
{
    auto* qt = timer->findChild<QTimer*>(QStringLiteral("q19_systemclock_timer"),
                                         Qt::FindDirectChildrenOnly);
    if (!qt && create) {
        qt = new QTimer(timer);
        qt->setObjectName(QStringLiteral("q19_systemclock_timer"));
        qt->setTimerType(Qt::PreciseTimer);
    }
    return qt;
}

QElapsedTimer& monotonic()
{
    static QElapsedTimer t = [] {
        QElapsedTimer e;
        e.start();
        return e;
    }();
    return t;
}
} // namespace

SystemClock::SystemClock(QObject* parent) : Clock(parent)
{
    monotonic();
}

qint64 SystemClock::elapsedMs() const
{
    return monotonic().elapsed();
}

QDateTime SystemClock::now() const
{
    return QDateTime::currentDateTime();
}

void SystemClock::sleep(int ms)
{
    // Deliberately blocks the event loop: nothing may touch the line meanwhile.
    if (ms > 0)
        QThread::msleep(ulong(ms));
}

void SystemClock::arm(Timer* timer, int ms)
{
    QTimer* qt = qtTimerOf(timer, true);
    qt->disconnect();
    QObject::connect(qt, &QTimer::timeout, timer, [timer] { Clock::fire(timer); });
    qt->start(ms);
}

void SystemClock::disarm(Timer* timer)
{
    if (QTimer* qt = qtTimerOf(timer, false))
        qt->stop();
}
