#include "platform/manual_clock.h"

#include <QtTest>

// Records which timer fired at which virtual time.
struct FireLog {
    ManualClock& clock;
    QStringList events;
    void watch(Timer& t, const QString& name)
    {
        QObject::connect(&t, &Timer::timeout, &t, [this, name] {
            events << QStringLiteral("%1@%2").arg(name).arg(clock.elapsedMs());
        });
    }
};

class TestClock : public QObject {
    Q_OBJECT
private slots:
    void firesInTimeOrderWithTiesInArmingOrder();
    void periodicUntilDisabled();
    void enablingAnEnabledTimerKeepsItsCount();
    void intervalChangedWhileEnabledRestartsTheCount_data();
    void intervalChangedWhileEnabledRestartsTheCount();
    void handlerRearmingItself();
    void handlerStartingAnotherTimerDueInTheSameAdvance();
    void handlerStoppingATimerDueAtTheSameInstant();
    void zeroIntervalNeverFires();
    void sleepMovesTimeWithoutFiring();
    void destroyedTimerIsForgotten();
    void systemClockFiresAndSleeps();
};

void TestClock::firesInTimeOrderWithTiesInArmingOrder()
{
    ManualClock clock;
    FireLog log{clock, {}};
    Timer a(clock, 300), b(clock, 100), c(clock, 300);
    log.watch(a, "a");
    log.watch(b, "b");
    log.watch(c, "c");
    a.setEnabled(true);
    b.setEnabled(true);
    c.setEnabled(true);
    clock.advance(300);
    QCOMPARE(log.events, QStringList({"b@100", "b@200", "a@300", "c@300", "b@300"}));
}

void TestClock::periodicUntilDisabled()
{
    ManualClock clock;
    Timer t(clock, 1000);
    int fired = 0;
    QObject::connect(&t, &Timer::timeout, [&] {
        if (++fired == 3)
            t.setEnabled(false);
    });
    t.setEnabled(true);
    clock.advance(10000);
    QCOMPARE(fired, 3);
    QVERIFY(!clock.isArmed(&t));
}

void TestClock::enablingAnEnabledTimerKeepsItsCount()
{
    ManualClock clock;
    Timer t(clock, 1000);
    QSignalSpy spy(&t, &Timer::timeout);
    t.setEnabled(true);
    clock.advance(600);
    t.setEnabled(true);
    clock.advance(400);
    QCOMPARE(spy.count(), 1);
    // Off and on again is how a count is started afresh.
    clock.advance(600);
    t.setEnabled(false);
    t.setEnabled(true);
    clock.advance(600);
    QCOMPARE(spy.count(), 1);
    clock.advance(400);
    QCOMPARE(spy.count(), 2);
}

void TestClock::intervalChangedWhileEnabledRestartsTheCount_data()
{
    QTest::addColumn<int>("newInterval");
    QTest::addColumn<int>("changeAt");
    QTest::addColumn<qint64>("firstFire");
    QTest::newRow("shorter") << 500 << 800 << qint64(1300);
    QTest::newRow("same") << 1000 << 800 << qint64(1800);
    QTest::newRow("longer") << 4000 << 100 << qint64(4100);
}

void TestClock::intervalChangedWhileEnabledRestartsTheCount()
{
    QFETCH(int, newInterval);
    QFETCH(int, changeAt);
    QFETCH(qint64, firstFire);
    ManualClock clock;
    Timer t(clock, 1000);
    qint64 firedAt = -1;
    QObject::connect(&t, &Timer::timeout, [&] {
        if (firedAt < 0)
            firedAt = clock.elapsedMs();
    });
    t.setEnabled(true);
    clock.advance(changeAt);
    t.setInterval(newInterval);
    clock.advance(10000);
    QCOMPARE(firedAt, firstFire);
}

void TestClock::handlerRearmingItself()
{
    // The pattern of a polling cycle: the tick restarts itself with a new interval.
    ManualClock clock;
    Timer t(clock, 1000);
    QList<qint64> at;
    QObject::connect(&t, &Timer::timeout, [&] {
        at << clock.elapsedMs();
        t.setInterval(3000);
    });
    t.setEnabled(true);
    clock.advance(7000);
    QCOMPARE(at, QList<qint64>({1000, 4000, 7000}));
}

void TestClock::handlerStartingAnotherTimerDueInTheSameAdvance()
{
    ManualClock clock;
    FireLog log{clock, {}};
    Timer first(clock, 100), second(clock, 50);
    log.watch(first, "first");
    log.watch(second, "second");
    QObject::connect(&first, &Timer::timeout, [&] {
        first.setEnabled(false);
        second.setEnabled(true);
    });
    first.setEnabled(true);
    clock.advance(200);
    QCOMPARE(log.events, QStringList({"first@100", "second@150", "second@200"}));
}

void TestClock::handlerStoppingATimerDueAtTheSameInstant()
{
    ManualClock clock;
    FireLog log{clock, {}};
    Timer a(clock, 100), b(clock, 100);
    log.watch(a, "a");
    log.watch(b, "b");
    QObject::connect(&a, &Timer::timeout, [&] { b.setEnabled(false); });
    a.setEnabled(true);
    b.setEnabled(true);
    clock.advance(100);
    QCOMPARE(log.events, QStringList({"a@100"}));
}

void TestClock::zeroIntervalNeverFires()
{
    ManualClock clock;
    Timer t(clock, 0);
    QSignalSpy spy(&t, &Timer::timeout);
    t.setEnabled(true);
    clock.advance(100000);
    QCOMPARE(spy.count(), 0);
    QVERIFY(t.Enabled());
}

void TestClock::sleepMovesTimeWithoutFiring()
{
    ManualClock clock;
    Timer t(clock, 1000);
    QSignalSpy spy(&t, &Timer::timeout);
    t.setEnabled(true);
    clock.sleep(2500);
    QCOMPARE(spy.count(), 0);
    QCOMPARE(clock.elapsedMs(), qint64(2500));
    QCOMPARE(clock.sleptMs(), qint64(2500));
    // What fell due during the sleep is delivered as soon as events run again.
    clock.advance(0);
    QVERIFY(spy.count() >= 1);
}

void TestClock::destroyedTimerIsForgotten()
{
    ManualClock clock;
    auto* t = new Timer(clock, 10);
    t->setEnabled(true);
    delete t;
    clock.advance(100);
    QVERIFY(!clock.fireNext());
}

void TestClock::systemClockFiresAndSleeps()
{
    SystemClock clock;
    Timer t(clock, 20);
    QSignalSpy spy(&t, &Timer::timeout);
    t.setEnabled(true);
    QTRY_VERIFY_WITH_TIMEOUT(spy.count() >= 2, 2000);
    t.setEnabled(false);
    const int seen = int(spy.count());
    QTest::qWait(80);
    QCOMPARE(spy.count(), seen);
    const qint64 before = clock.elapsedMs();
    clock.sleep(30);
    QVERIFY(clock.elapsedMs() - before >= 30);
}

QTEST_GUILESS_MAIN(TestClock)
#include "tst_clock.moc"
