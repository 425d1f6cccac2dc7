#include "status/frmstatus_engine.h"
#include "status/frmstatusp_engine.h"
#include "status_test_support.h"

#include <QSignalSpy>
#include <QTest>

using Rig = StatusRig;

class tst_status_engines : public QObject {
    Q_OBJECT
private slots:
    void statusRows();
    void boxesByVersionAndKind_data();
    void boxesByVersionAndKind();
    void twentyFirstSelectionRefused();
    void alarmBlinks();
    void compressorRecordsByNumber();
    void variableSteps();
    void torvanelRequestFromVersion8_data();
    void torvanelRequestFromVersion8();
    void torvanelAlarmWords();
    void dbaseFailure();
    void viewsToldOncePerProcedureAndBeforeEachBox_data();
    void viewsToldOncePerProcedureAndBeforeEachBox();
    void banksFollowANewCountOfChannels();
    void valueShowsItsChannelsCard();
};

void tst_status_engines::statusRows()
{
    Rig r;
    r.select({5, 150, 0, 7});
    r.store->setSetpoint(4, 26, 215); // channel 5: assoc 1 none
    r.store->setSetpoint(4, 27, 200); // a pressure input
    r.store->setSetpoint(4, 28, 199); // channel 200
    frmstatus_engine e(r.link, r.clock, r.op, r.views);
    QVERIFY(e.Form_Load(QStringLiteral("7"), r.path));
    QCOMPARE(e.cycle.Text10[0].text, QStringLiteral("7"));
    QVERIFY(!e.chanframe[2].visible);
    QVERIFY(e.chanframe[1].visible);
    QVERIFY(!e.assoc1[1].visible && !e.liquid[1].visible && !e.bank[1].visible);
    QCOMPARE(e.Temp[2].text, QStringLiteral("????"));
    ReplyText t(2600, QStringLiteral("status"));
    t.put(1, "05/01/2026 08:00:00").num(7 * 5 + 13, -1004).put(7 * 5 + 19, "1").num(7 * 150 + 13, 55);
    t.num(1413, 321).put(4 * 5 + 1416, "1").put(4 * 5 + 1417, "1").put(4 * 5 + 1418, "1");
    e.status_do(t.str());
    QCOMPARE(e.Temp[0].text, QStringLiteral("Ld Shd"));
    QCOMPARE(e.alarm[0].backColor, frmstatus_engine::PaleRed);
    QVERIFY(!e.assoc1[0].visible);
    QCOMPARE(e.assoc2[0].text, QStringLiteral("Press"));
    QCOMPARE(e.assoc3[0].text, QStringLiteral("32.1"));
    QCOMPARE(e.liquid[0].backColor, frmstatus_engine::PaleRed);
    QCOMPARE(e.fans[0].backColor, frmstatus_engine::FanOn);
    QCOMPARE(e.defrost[0].backColor, frmstatus_engine::DefrostOn);
    QCOMPARE(e.suction[0].backColor, frmstatus_engine::Off);
    QCOMPARE(e.Temp[1].text, QStringLiteral("5.5"));
    QCOMPARE(e.Temp[2].text, QStringLiteral("????")); // an empty row is not parsed
    QCOMPARE(e.cycle.Text10[2].text, QStringLiteral("05/01/2026 08:00:00"));
    QCOMPARE(e.cycle.Text10[2].backColor, StatusCycle::FlashColour);
}

void tst_status_engines::boxesByVersionAndKind_data()
{
    QTest::addColumn<QString>("version");
    QTest::addColumn<int>("kind");
    QTest::addColumn<QString>("suc");
    QTest::addColumn<QString>("tempP");
    QTest::addColumn<QString>("pid");
    QTest::addColumn<QString>("fan");
    QTest::newRow("7") << "7" << 4 << "N/A" << "N/A" << "PID" << "Fan";
    QTest::newRow("8") << "8" << 4 << "-1002" << "N/A" << "PID" << "Fan";
    QTest::newRow("8.8") << "8.8" << 4 << "-1002" << "N-C" << "PID" << "Fan";
    QTest::newRow("14, kind 4") << "14" << 4 << "-1002" << "N-C" << "PID 45 %" << "Fan";
    QTest::newRow("14, kind 5") << "14" << 5 << "-1002" << "N-C" << "PID 60 %" << "Fan 70 %";
}

void tst_status_engines::boxesByVersionAndKind()
{
    QFETCH(QString, version);
    QFETCH(int, kind);
    Rig r;
    r.link.g.instrument_version = version;
    r.select({3});
    r.store->setSetpoint(2, 209, kind);
    frmstatus_engine e(r.link, r.clock, r.op, r.views);
    QVERIFY(e.Form_Load(QStringLiteral("7"), r.path));
    ReplyText t(2700, "status");
    t.num(1820, -1002).num(1385, -1000).num(6 * 3 + 1910, 45).num(6 * 3 + 2306, 60).num(6 * 3 + 2498, 70);
    e.status_do(t.str());
    QTEST(e.suc[0].text, "suc");
    QTEST(e.TempP[0].text, "tempP");
    QTEST(e.pid[0].text, "pid");
    QTEST(e.fans[0].text, "fan");
}

void tst_status_engines::twentyFirstSelectionRefused()
{
    Rig r;
    QList<int> twenty;
    for (int n = 1; n <= 20; ++n)
        twenty.append(n);
    r.select(twenty);
    frmstatus_engine e(r.link, r.clock, r.op, r.views);
    QVERIFY(e.Form_Load(QStringLiteral("7"), r.path));
    QCOMPARE(e.Command1[20].backColor, frmstatus_engine::Selected);
    e.Command1_Click(30);
    QCOMPARE(r.op.last().title, QStringLiteral("Channel Display Full"));
    QCOMPARE(e.Command1[30].backColor, frmstatus_engine::Off);
    for (int i = 0; i < 20; ++i)
        QCOMPARE(r.store->info(i, 7).toInt(), i + 1);
    // Freeing a place lets the new channel fill the first gap.
    e.Command1_Click(4);
    e.Command1_Click(30);
    QCOMPARE(r.store->info(3, 7).toInt(), 30);
    QCOMPARE(e.rowChannel(3), 30);
    e.Command2_Click();
    QCOMPARE(r.store->info(3, 7).toInt(), 0);
    QVERIFY(!e.chanframe[3].visible);
}

void tst_status_engines::alarmBlinks()
{
    Rig r;
    r.select({1, 2});
    frmstatus_engine e(r.link, r.clock, r.op, r.views);
    QVERIFY(e.Form_Load(QStringLiteral("7"), r.path));
    e.status_do(ReplyText(2600, "status").put(7 + 19, "1").str());
    QCOMPARE(e.alarm[0].backColor, frmstatus_engine::PaleRed);
    r.clock.advance(1000);
    QCOMPARE(e.alarm[0].backColor, Colour::Yellow);
    QCOMPARE(e.alarm[1].backColor, frmstatus_engine::Off);
    r.clock.advance(1000);
    QCOMPARE(e.alarm[0].backColor, frmstatus_engine::PaleRed);
}

void tst_status_engines::compressorRecordsByNumber()
{
    using namespace presss_layout;
    Rig r;
    frmstatusp_engine e(r.link, r.clock, r.op, r.views);
    QVERIFY(e.Form_Load(QStringLiteral("7"), r.path));
    ReplyText t(1400, "presss");
    // Record 0 carries compressor 12, staged, 2 stages running; record 1 is
    // empty; record 2 carries compressor 1, a screw, fully loaded.
    t.num(recordNumberPos(0), 12).num(recordStagesPos(0), 2).num(recordKindPos(0), 0).put(recordRunningPos(0), "1");
    t.num(recordNumberPos(1), 0).num(recordStagesPos(1), 6).put(recordRunningPos(1), "1");
    t.num(recordNumberPos(2), 1).num(recordKindPos(2), 2).put(recordRunningPos(2), "1").put(recordFullPos(2), "1");
    t.num(hoursRunPos(11), 1234);
    e.statusp_do(t.str());
    QCOMPARE(e.stage1[11].backColor, frmstatusp_engine::StageOn);
    QCOMPARE(e.stage3[11].backColor, frmstatusp_engine::StageOn);
    QCOMPARE(e.stage4[11].backColor, frmstatusp_engine::Off);
    QCOMPARE(e.stage1[0].backColor, frmstatusp_engine::StageOn);
    QCOMPARE(e.stage4[0].text, QStringLiteral("Fully"));
    QCOMPARE(e.stage4[0].backColor, frmstatusp_engine::LoadedOn);
    QCOMPARE(e.stage1[1].backColor, frmstatusp_engine::Off);
    QCOMPARE(e.hours_run[11].text, QStringLiteral("1234 H"));
}

void tst_status_engines::variableSteps()
{
    using namespace presss_layout;
    Rig r;
    r.store->setSetpoint(2, 169, 4); // condenser 3 variable
    r.store->setSetpoint(3, 169, 4);
    frmstatusp_engine e(r.link, r.clock, r.op, r.views);
    QVERIFY(e.Form_Load(QStringLiteral("7"), r.path));
    QCOMPARE(e.stage1c[2].text, QStringLiteral("Var Stg 1"));
    ReplyText t(1400, "presss");
    t.num(recordNumberPos(0), 5).num(recordKindPos(0), 3).put(recordRunningPos(0), "1").num(compressorStepPos(4), 63);
    t.num(recordNumberPos(1), 6).num(recordKindPos(1), 3).put(recordRunningPos(1), "1").num(compressorStepPos(5), 0);
    t.num(condenserStepPos(2), 64).num(condenserStepPos(3), 31);
    e.statusp_do(t.str());
    QCOMPARE(e.stage3[4].text, QStringLiteral("Step 64"));
    QCOMPARE(e.stage5[4].text, QStringLiteral("100 %"));
    QCOMPARE(e.stage3[5].text, QStringLiteral("Step 1"));
    QCOMPARE(e.stage5[5].text, QStringLiteral("2 %"));
    QCOMPARE(e.stage3[5].backColor, frmstatusp_engine::StepOn);
    // The top step of a condenser shows as step 0 with the first box lit.
    QCOMPARE(e.stage2c[2].text, QStringLiteral("Step 0"));
    QCOMPARE(e.stage4c[2].text, QStringLiteral("0 %"));
    QCOMPARE(e.stage1c[2].backColor, frmstatusp_engine::StepOn);
    QCOMPARE(e.stage2c[2].backColor, frmstatusp_engine::Off);
    QCOMPARE(e.stage2c[3].text, QStringLiteral("Step 32"));
    QCOMPARE(e.stage4c[3].text, QStringLiteral("50 %"));
}

void tst_status_engines::torvanelRequestFromVersion8_data()
{
    QTest::addColumn<QString>("version");
    QTest::addColumn<bool>("asks");
    QTest::newRow("7") << "7" << false;
    QTest::newRow("8") << "8" << true;
}

void tst_status_engines::torvanelRequestFromVersion8()
{
    QFETCH(QString, version);
    QFETCH(bool, asks);
    Rig r;
    r.link.g.instrument_version = version;
    frmstatusp_engine e(r.link, r.clock, r.op, r.views);
    QVERIFY(e.Form_Load(QStringLiteral("7"), r.path));
    QCOMPARE(r.link.writes, QList<QByteArray>{"T\x04"});
    e.statusp_do(ReplyText(1400, "presss").str());
    r.clock.advance(499);
    QCOMPARE(r.link.writes.size(), 1);
    r.clock.advance(1);
    QCOMPARE(r.link.writes.size(), asks ? 2 : 1);
    if (asks)
        QCOMPARE(r.link.writes.last(), QByteArray(85, 'Z') + "t\x04");
    e.statuspa_do(ReplyText(1140, "torvan").put(20, "1").num(1100, 215).str());
    QCOMPARE(e.CsAlarms != frmstatusp_engine::CsAlarmsInitial, asks);
    QCOMPARE(e.Temp[0].text, QStringLiteral("????")); // 8.8 brings these
}

void tst_status_engines::torvanelAlarmWords()
{
    using namespace presss_layout;
    Rig r;
    r.link.g.instrument_version = QStringLiteral("8.8");
    frmstatusp_engine e(r.link, r.clock, r.op, r.views);
    QVERIFY(e.Form_Load(QStringLiteral("7"), r.path));
    // Torvanel 0 reports "In Alarm" (the third further input).
    ReplyText p(1385 + 2 * 96, "presss");
    p.put(1385 + 82 + 2, "1");
    e.statusp_do(p.str());
    e.dbaseload_Click();
    QVERIFY(e.Picture1.visible);
    QCOMPARE(e.Text3[frmstatusp_engine::PanelAlarm].text, QStringLiteral("YES"));
    e.statuspa_do(ReplyText(1140, "torvan").put(alarmFlagPos(1, 9), "1").num(1100, 215).str());
    QCOMPARE(e.Alm.text, QStringLiteral("Unknown Alarm's"));
    QCOMPARE(e.Temp[0].text, QStringLiteral("21.5"));
    e.CompSelect_Click(1);
    QCOMPARE(e.Label4.text, QStringLiteral("Torvanel No. 2 Alarms"));
    QCOMPARE(e.Alm.text, QStringLiteral("Discharge Pressure       \r\n"));
    QCOMPARE(e.CompSelect[1].backColor, frmstatusp_engine::StepOn);
    QCOMPARE(e.CompSelect[0].backColor, frmstatusp_engine::Off);
    e.CompSelect_Click(2);
    QCOMPARE(e.Alm.text, QStringLiteral("No alarms are active"));
}

void tst_status_engines::dbaseFailure()
{
    Rig r;
    frmstatus_engine e(r.link, r.clock, r.op, r.views);
    QVERIFY(!e.Form_Load(QStringLiteral("7"), r.dir.filePath(QStringLiteral("missing.db"))));
    QCOMPARE(r.op.last().title, QStringLiteral("Data Base Invalid"));
    QCOMPARE(r.link.dbaseErrors, 1);
    QVERIFY(r.link.writes.isEmpty());
}

void tst_status_engines::viewsToldOncePerProcedureAndBeforeEachBox_data()
{
    QTest::addColumn<int>("action");
    QTest::addColumn<int>("toldBeforeBox"); // -1: no box
    QTest::addColumn<int>("told");
    QTest::newRow("load: the cycle's procedures inside tell nothing") << 0 << -1 << 1;
    QTest::newRow("a 21st channel: the box stands over the rows as they are") << 1 << 1 << 2;
    QTest::newRow("no reply: the box stands over the buttons as they are") << 2 << 1 << 2;
    QTest::newRow("a click that returns early") << 3 << -1 << 1;
}

void tst_status_engines::viewsToldOncePerProcedureAndBeforeEachBox()
{
    QFETCH(int, action);
    Rig r;
    r.select({1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15, 16, 17, 18, 19, 20});
    frmstatus_engine e(r.link, r.clock, r.op, r.views);
    QSignalSpy told(&e, &frmstatus_engine::changed);
    int toldBeforeBox = -1;
    r.op.setWhileShowing([&](const Operator::Message&) { toldBeforeBox = int(told.size()); });
    if (action != 0) {
        QVERIFY(e.Form_Load(QStringLiteral("7"), r.path));
        told.clear();
    }
    switch (action) {
    case 0: QVERIFY(e.Form_Load(QStringLiteral("7"), r.path)); break;
    case 1: e.Command1_Click(30); break;
    case 2: r.clock.advance(4000); break;
    case 3: e.Command1_Click(0); break;
    }
    QTEST(toldBeforeBox, "toldBeforeBox");
    QTEST(int(told.size()), "told");
}

void tst_status_engines::banksFollowANewCountOfChannels()
{
    Rig r;
    r.select({3, 6});
    for (int b = 0; b < 5; ++b)
        r.store->setSetpoint(0, 78 + b, b == 0 ? 5 : 0);
    frmstatus_engine e(r.link, r.clock, r.op, r.views);
    QVERIFY(e.Form_Load(QStringLiteral("7"), r.path));
    QCOMPARE(e.bank[0].text, QStringLiteral("Bank 1"));
    QCOMPARE(e.bank[1].text, QStringLiteral("None"));
    // Another form writes the counts of channels in banks 1 and 2.
    r.store->setSetpoint(0, 78, 2);
    r.store->setSetpoint(0, 79, 4);
    e.redoBanks();
    QCOMPARE(e.bank[0].text, QStringLiteral("Bank 2"));
    QCOMPARE(e.bank[1].text, QStringLiteral("Bank 2"));
}

void tst_status_engines::valueShowsItsChannelsCard()
{
    struct Card : SetPointCardView {
        void showChannel(int channel) override { shown.append(channel); }
        QList<int> shown;
    } card;
    Rig r;
    r.select({0, 150, 7});
    frmstatus_engine e(r.link, r.clock, r.op, r.views);
    QVERIFY(e.Form_Load(QStringLiteral("7"), r.path));
    e.Temp_Click(2);
    QVERIFY(!e.setPointCardAvailable());
    r.views.setPointCard = &card;
    e.Temp_Click(0); // an empty row has no card
    e.Temp_Click(2);
    e.Temp_Click(1);
    QCOMPARE(card.shown, (QList<int>{7, 150}));
}

QTEST_GUILESS_MAIN(tst_status_engines)
#include "tst_status_engines.moc"
