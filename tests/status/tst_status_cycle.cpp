#include "status/status_cycle.h"
#include "status_test_support.h"

#include <QTest>

namespace {

// A cycle as the routing table sees a status view, of any of the three roles.
struct CycleView : TemperatureStatusView, PressureStatusView, PressureGraphicView {
    explicit CycleView(StatusCycle& c) : c(c) {}
    bool stopstatusEnabled() const override { return c.runningForOthers(); }
    void stopstatus_Click() override { c.stopstatus_Click(); }
    void status_do() override {}
    void statusp_do() override {}
    void statuspa_do() override {}
    void statuspg_do() override {}
    StatusCycle& c;
};

void enter(OpenViews& v, StatusViewKind k, CycleView& view)
{
    switch (k) {
    case StatusViewKind::status: v.status_open = true; v.status = &view; break;
    case StatusViewKind::statusg: v.statusg_open = true; v.statusg = &view; break;
    case StatusViewKind::multiprobes: v.multiprobes_open = true; v.multiprobes = &view; break;
    case StatusViewKind::statusp: v.statusp_open = true; v.statusp = &view; break;
    case StatusViewKind::statuspg: v.statuspg_open = true; v.statuspg = &view; break;
    }
}

using Rig = StatusRig;

} // namespace

Q_DECLARE_METATYPE(StatusViewKind)

class tst_status_cycle : public QObject {
    Q_OBJECT
private slots:
    void manualRequestWaitsBySpeedFactor_data();
    void manualRequestWaitsBySpeedFactor();
    void automaticCycleRetriesUntilWatchdog();
    void pressureCycleHasNoRetryAndStopKeepsWatchdog();
    void startDuringManualWaitArmsNoTick();
    void firstRequestDelayedAfterAnotherViewsRequest();
    void offLineDisablesButtonsAndSendsNothing();
    void exclusion_data();
    void exclusion();
    void storedInterval_data();
    void storedInterval();
    void valuesGoStaleAfterTwoIntervals();
};

void tst_status_cycle::manualRequestWaitsBySpeedFactor_data()
{
    QTest::addColumn<StatusViewKind>("kind");
    QTest::addColumn<int>("speed");
    QTest::addColumn<int>("waitMs");
    QTest::addColumn<QByteArray>("request");
    QTest::newRow("frmstatus x4") << StatusViewKind::status << 4 << 16000 << QByteArray("F\x04");
    QTest::newRow("frmmultiprobes x4") << StatusViewKind::multiprobes << 4 << 20000 << QByteArray("F\x04");
    QTest::newRow("frmstatusp x4") << StatusViewKind::statusp << 4 << 12000 << QByteArray("T\x04");
    QTest::newRow("frmstatuspg says nothing") << StatusViewKind::statuspg << 1 << -1 << QByteArray("T\x04");
}

void tst_status_cycle::manualRequestWaitsBySpeedFactor()
{
    QFETCH(StatusViewKind, kind);
    QFETCH(int, speed);
    QFETCH(int, waitMs);
    QFETCH(QByteArray, request);
    Rig r;
    r.link.g.speed_factor = speed;
    StatusCycle c(kind, r.link, r.clock, r.op, r.views);
    c.nowstatus_Click();
    QCOMPARE(r.link.writes, QList<QByteArray>{request});
    QVERIFY(!c.nowstatus.enabled);
    QVERIFY(r.link.g.status_request_wait);
    if (waitMs < 0) {
        r.clock.advance(60000);
        QVERIFY(r.op.messages().isEmpty());
        QVERIFY(!c.nowstatus.enabled);
        return;
    }
    r.clock.advance(waitMs - 1);
    QVERIFY(r.op.messages().isEmpty());
    r.clock.advance(1);
    QCOMPARE(r.op.last().toText(), QStringLiteral("No Response: The Glacinor failed to respond, / Re do the last command."));
    QVERIFY(c.nowstatus.enabled);
    QVERIFY(!c.status_manual_wait);
}

void tst_status_cycle::automaticCycleRetriesUntilWatchdog()
{
    Rig r;
    StatusCycle c(StatusViewKind::status, r.link, r.clock, r.op, r.views);
    c.startstatus_Click();
    QVERIFY(c.stopstatus.enabled && !c.startstatus.enabled && !c.nowstatus.enabled);
    r.clock.advance(9999);
    QVERIFY(r.link.writes.isEmpty()); // the first request follows one interval
    r.clock.advance(1);
    QCOMPARE(r.link.writes.size(), 1);
    // A good reply at 10 s; then silence.
    c.replyStarted(QStringLiteral("05/01/2026 08:00:10 ..."));
    c.replyFinished();
    QCOMPARE(c.Text10[2].backColor, StatusCycle::FlashColour);
    r.clock.advance(500);
    QCOMPARE(c.Text10[2].backColor, StatusCycle::DateTimeColour);
    r.link.writes.clear();
    // Ticks at 20 s, retries every 4 s, each retry pushing the tick away.
    r.clock.advance(10000 - 500);
    QCOMPARE(r.link.writes.size(), 1);
    r.clock.advance(4000);
    QCOMPARE(r.link.writes.size(), 2);
    r.clock.advance(4000);
    QCOMPARE(r.link.writes.size(), 3);
    QVERIFY(!c.Text1.visible);
    // The 60th second after the last good reply ends the cycle.
    r.clock.advance(60000 - 10000 - 8000 - 1);
    QVERIFY(c.stopstatus.enabled);
    r.clock.advance(1);
    QVERIFY(c.Text1.visible);
    QCOMPARE(c.Text1.text, QStringLiteral("COMMUNICATIONS HAVE CEASED"));
    QVERIFY(!c.stopstatus.enabled && c.startstatus.enabled && c.nowstatus.enabled);
    QVERIFY(r.op.messages().isEmpty());
    const int sent = r.link.writes.size();
    QCOMPARE(sent, 1 + 12); // a tick, then a retry every 4 s up to 60 s
    r.clock.advance(120000);
    QCOMPARE(r.link.writes.size(), sent);
}

void tst_status_cycle::pressureCycleHasNoRetryAndStopKeepsWatchdog()
{
    Rig r;
    StatusCycle c(StatusViewKind::statusp, r.link, r.clock, r.op, r.views);
    c.startstatus_Click();
    r.clock.advance(10000);
    c.replyStarted(QStringLiteral("x"));
    c.replyFinished();
    r.link.writes.clear();
    r.clock.advance(9999);
    QVERIFY(r.link.writes.isEmpty()); // no retry timer
    c.stopstatus_Click();
    QVERIFY(c.nowstatus.enabled && !c.stopstatus.enabled);
    r.clock.advance(60000 - 9999 - 1);
    QVERIFY(!c.Text1.visible);
    r.clock.advance(1);
    QVERIFY(c.Text1.visible);
    QVERIFY(c.Text2.visible);
    QVERIFY(r.link.writes.isEmpty());
}

void tst_status_cycle::startDuringManualWaitArmsNoTick()
{
    Rig r;
    StatusCycle c(StatusViewKind::status, r.link, r.clock, r.op, r.views);
    c.nowstatus_Click();
    c.startstatus_Click();
    QVERIFY(c.stopstatus.enabled && !c.startstatus.enabled && !c.nowstatus.enabled);
    QVERIFY(!c.Timer1.Enabled());
    r.link.writes.clear();
    r.clock.advance(30000);
    QVERIFY(r.link.writes.isEmpty());
}

void tst_status_cycle::firstRequestDelayedAfterAnotherViewsRequest()
{
    Rig r;
    r.link.startWaitUd(); // another view asked just now
    r.clock.advance(1000);
    StatusCycle c(StatusViewKind::status, r.link, r.clock, r.op, r.views);
    c.firstRequest();
    QVERIFY(r.link.writes.isEmpty());
    QVERIFY(c.nowstatus.enabled && c.startstatus.enabled && !c.stopstatus.enabled);
    r.clock.advance(7999);
    QVERIFY(r.link.writes.isEmpty());
    r.clock.advance(1);
    QCOMPARE(r.link.writes, QList<QByteArray>{"F\x04"});
    QVERIFY(c.nowstatus.enabled);
    QVERIFY(!c.status_manual_wait);
    QVERIFY(c.Timer4.Enabled());
}

void tst_status_cycle::offLineDisablesButtonsAndSendsNothing()
{
    Rig r;
    r.link.g.link_up = false;
    StatusCycle c(StatusViewKind::status, r.link, r.clock, r.op, r.views);
    c.firstRequest();
    QVERIFY(!c.nowstatus.enabled && !c.startstatus.enabled && !c.stopstatus.enabled);
    r.clock.advance(100000);
    QVERIFY(r.link.writes.isEmpty());
    QVERIFY(r.op.messages().isEmpty());
}

void tst_status_cycle::exclusion_data()
{
    QTest::addColumn<StatusViewKind>("running");
    QTest::addColumn<StatusViewKind>("clicking");
    QTest::addColumn<QString>("button");
    QTest::addColumn<QString>("message");
    QTest::newRow("Start in frmstatus stops frmstatusp")
        << StatusViewKind::statusp << StatusViewKind::status << "start" << "Current Pressure Status is active,";
    QTest::newRow("Stop in frmstatus stops frmstatusg")
        << StatusViewKind::statusg << StatusViewKind::status << "stop" << "Current Temp graphic Status is active,";
    QTest::newRow("Now in frmstatusp stops frmstatus")
        << StatusViewKind::status << StatusViewKind::statusp << "now" << "Current Temperature Status is active,";
    QTest::newRow("frmstatuspg names frmstatusg its own way")
        << StatusViewKind::statusg << StatusViewKind::statuspg << "start"
        << "Current Temperature Status Graphic is active,";
    QTest::newRow("nobody checks frmstatuspg") << StatusViewKind::statuspg << StatusViewKind::status << "start" << "";
    QTest::newRow("nobody checks frmmultiprobes")
        << StatusViewKind::multiprobes << StatusViewKind::statusp << "start" << "";
}

void tst_status_cycle::exclusion()
{
    QFETCH(StatusViewKind, running);
    QFETCH(StatusViewKind, clicking);
    QFETCH(QString, button);
    QFETCH(QString, message);
    Rig r;
    StatusCycle other(running, r.link, r.clock, r.op, r.views);
    StatusCycle self(clicking, r.link, r.clock, r.op, r.views);
    CycleView a(other), b(self);
    enter(r.views, running, a);
    enter(r.views, clicking, b);
    other.startstatus_Click();
    QVERIFY(other.stopstatus.enabled);
    if (button == QLatin1String("stop"))
        self.stopstatus.enabled = true; // both cycles running
    r.op.clear();
    const auto click = [&] {
        if (button == QLatin1String("start"))
            self.startstatus_Click();
        else if (button == QLatin1String("stop"))
            self.stopstatus_Click();
        else
            self.nowstatus_Click();
    };
    const bool selfRunning = self.stopstatus.enabled;
    click();
    if (message.isEmpty()) {
        QVERIFY(r.op.messages().isEmpty());
        QVERIFY(other.stopstatus.enabled);
        return;
    }
    QCOMPARE(r.op.last().title, QStringLiteral("Current Status Active"));
    QCOMPARE(r.op.last().lines, (QStringList{message, QStringLiteral("It will be stopped to allow other proceedures.")}));
    QVERIFY(!other.stopstatus.enabled);
    QCOMPARE(self.stopstatus.enabled, selfRunning); // the click did nothing else
    r.op.clear();
    click();
    QVERIFY(r.op.messages().isEmpty());
    if (button == QLatin1String("start"))
        QVERIFY(self.Timer1.Enabled());
}

void tst_status_cycle::storedInterval_data()
{
    QTest::addColumn<QVariant>("stored");
    QTest::addColumn<QString>("shown");
    QTest::addColumn<QString>("after");
    QTest::newRow("9 is replaced") << QVariant(9) << "10" << "10";
    QTest::newRow("121 is replaced") << QVariant(121) << "10" << "10";
    QTest::newRow("120 is kept beyond the spinner") << QVariant(120) << "120" << "120";
    QTest::newRow("empty is replaced") << QVariant() << "10" << "10";
}

void tst_status_cycle::storedInterval()
{
    QFETCH(QVariant, stored);
    QFETCH(QString, shown);
    QFETCH(QString, after);
    Rig r;
    InstrumentStore* store = r.store.get();
    store->setInfo(kInfoPressureIntervalRow, kInfoIntervalColumn, stored);
    StatusCycle c(StatusViewKind::statusp, r.link, r.clock, r.op, r.views);
    c.loadInterval(store);
    QCOMPARE(c.Text10[1].text, shown);
    QCOMPARE(c.UpDown1.value.toInt(), shown.toInt());
    QCOMPARE(store->info(kInfoPressureIntervalRow, kInfoIntervalColumn).toString(), after);
    c.UpDown1_Change(25);
    QCOMPARE(store->info(kInfoPressureIntervalRow, kInfoIntervalColumn).toString(), QStringLiteral("25"));
    QCOMPARE(c.intervalSeconds(), 25);
}

void tst_status_cycle::valuesGoStaleAfterTwoIntervals()
{
    Rig r;
    StatusCycle c(StatusViewKind::status, r.link, r.clock, r.op, r.views);
    QVERIFY(!c.stale());
    c.replyStarted(QStringLiteral("x"));
    c.replyFinished();
    r.clock.advance(20000);
    QVERIFY(!c.stale());
    r.clock.advance(1000);
    QVERIFY(c.stale());
    QCOMPARE(c.ageText(), QStringLiteral("Not current: the last reply came 21 s ago"));
    r.clock.advance(100000);
    QCOMPARE(c.ageText(), QStringLiteral("Not current: the last reply came 2 min 1 s ago"));
    c.replyStarted(QStringLiteral("x"));
    c.replyFinished();
    QVERIFY(!c.stale());
}

QTEST_GUILESS_MAIN(tst_status_cycle)
#include "tst_status_cycle.moc"
