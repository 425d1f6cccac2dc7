#include "platform/printer.h"
#include "status/frmstatus_engine.h"
#include "status/frmstatusp_engine.h"
#include "status_test_support.h"

#include <QRegularExpression>
#include <QTest>

namespace {

using Rig = StatusRig;

// The text that starts at a Tab column (counted from 1), up to the next blank run.
QString cell(const QString& line, int column)
{
    return line.mid(column - 1).section(QStringLiteral("  "), 0, 0).trimmed();
}

// Channel 5 in alarm with every output on and a load shed value; channel 150
// above the output channels.
QString temperatureReply()
{
    ReplyText t(2600, QStringLiteral("status"));
    t.put(1, "09/03/2026 14:05:12").num(7 * 5 + 13, -1004).put(7 * 5 + 19, "1").num(7 * 150 + 13, 55);
    for (int k = 0; k < 4; ++k)
        t.put(4 * 5 + 1416 + k, "1");
    return t.str();
}

constexpr int kHeadLines = 6; // title, blank, ID, blank, printed at, blank

} // namespace

class tst_status_reports : public QObject {
    Q_OBJECT
private slots:
    void temperatureReport_data();
    void temperatureReport();
    void pressureReport();
};

void tst_status_reports::temperatureReport_data()
{
    QTest::addColumn<int>("blinks");
    // Either phase of the blink prints "YES".
    QTest::newRow("alarm pale red") << 0;
    QTest::newRow("alarm yellow") << 1;
}

void tst_status_reports::temperatureReport()
{
    QFETCH(int, blinks);
    Rig r;
    r.store->setInfo(0, 7, 5);
    r.store->setInfo(1, 7, 150);
    frmstatus_engine e(r.link, r.clock, r.op, r.views);
    QVERIFY(e.Form_Load(QStringLiteral("7"), r.path));
    e.status_do(temperatureReply());
    r.clock.advance(1000 * blinks);

    RecordingPrinter p;
    e.printgraph_Click(p);
    QVERIFY(p.ended());
    QCOMPARE(p.font(), (Printer::Font{Printer::ReportFamily, 7, false}));
    const QStringList& l = p.lines();
    QCOMPARE(l.size(), kHeadLines + 2 + frmstatus_engine::Rows);
    QCOMPARE(l[0], QStringLiteral("Velmark Instruments Glacinor Current Temperature Status"));
    QCOMPARE(l[2], QStringLiteral("Glacinor ID  7"));
    QVERIFY2(l[4].startsWith(QStringLiteral("Printed at  09/03/2026   14:05:")), qPrintable(l[4]));
    QVERIFY2(l[4].endsWith(QStringLiteral("Glacinor Date and Time  09/03/2026 14:05:12")), qPrintable(l[4]));

    // Each value stands under its head.
    const QString& head = l[kHeadLines];
    QCOMPARE(cell(head, 26), QStringLiteral("Channels Temp"));
    QCOMPARE(cell(head, 164), QStringLiteral("Alarm"));
    const QString& ch5 = l[kHeadLines + 2];
    QCOMPARE(cell(ch5, 1), QStringLiteral("Ch 5"));
    QCOMPARE(cell(ch5, 13), QStringLiteral("Bank 1"));
    QCOMPARE(cell(ch5, 26), QStringLiteral("Ld Shd"));
    for (int column : {91, 105, 123, 138})
        QCOMPARE(cell(ch5, column), QStringLiteral("ON"));
    QCOMPARE(cell(ch5, 153), QStringLiteral("OFF")); // control kind 0 leaves the PID box off
    QCOMPARE(cell(ch5, 164), QStringLiteral("YES"));
    const QString& ch150 = l[kHeadLines + 3];
    QCOMPARE(cell(ch150, 26), QStringLiteral("5.5"));
    QCOMPARE(cell(ch150, 91), QStringLiteral("OFF"));
    QCOMPARE(cell(ch150, 164), QStringLiteral("NO"));
    // An empty row is printed as it stands.
    QCOMPARE(cell(l[kHeadLines + 4], 26), QStringLiteral("????"));
}

void tst_status_reports::pressureReport()
{
    using namespace presss_layout;
    Rig r;
    r.store->setSetpoint(0, 155, 3); // 3 compressors in bank 1
    r.store->setSetpoint(0, 161, 1); // 1 condenser in bank 2
    r.store->setSetpoint(0, 83, 2);
    r.store->setSetpoint(0, 165, 2); // compressor 1 shows 3 stages
    r.store->setSetpoint(1, 165, 8); // compressor 2 a screw: no stage 2
    r.store->setSetpoint(0, 167, 1); // compressor 1 has an equalizer
    frmstatusp_engine e(r.link, r.clock, r.op, r.views);
    QVERIFY(e.Form_Load(QStringLiteral("7"), r.path));
    ReplyText t(1400, QStringLiteral("presss"));
    t.put(1, "09/03/2026 14:05:12").num(suctionPos(0), 142).num(dischargePos(1), -1001);
    t.put(liquidPumpPos(0), "1").put(equalizerPos(0), "1");
    t.num(recordNumberPos(0), 1).num(recordStagesPos(0), 1).put(recordRunningPos(0), "1");
    t.put(condenserStagePos(0, 0), "1");
    e.statusp_do(t.str());

    RecordingPrinter p;
    e.printgraph_Click(p);
    QVERIFY(p.ended());
    const QStringList& l = p.lines();
    QCOMPARE(l[0], QStringLiteral("Velmark Instruments Glacinor Current Pressure Status"));
    QStringList body = l.mid(kHeadLines);
    QCOMPARE(cell(body[0], 30), QStringLiteral("Bank No. 1"));
    QCOMPARE(cell(body[0], 90), QStringLiteral("Bank No. 5"));
    QCOMPARE(cell(body[2], 1), QStringLiteral("Suction Pressure"));
    QCOMPARE(cell(body[2], 30), QStringLiteral("142"));
    QCOMPARE(cell(body[3], 45), QStringLiteral("O-R"));
    QCOMPARE(cell(body[5], 1), QStringLiteral("Liquid Pump"));
    QCOMPARE(cell(body[5], 30), QStringLiteral("ON"));
    QCOMPARE(cell(body[5], 45), QStringLiteral("OFF"));

    // Compressors: a head and one row for each of the 3 shown.
    const qsizetype comp = body.indexOf(QRegularExpression(QStringLiteral("^Compressor No\\..*")));
    QVERIFY(comp > 0);
    QCOMPARE(cell(body[comp], 155), QStringLiteral("Stage 8"));
    QCOMPARE(cell(body[comp + 1], 1), QStringLiteral("1"));
    QCOMPARE(cell(body[comp + 1], 20), QStringLiteral("Bank 1"));
    QCOMPARE(cell(body[comp + 1], 35), QStringLiteral("ON"));  // equalizer
    QCOMPARE(cell(body[comp + 1], 50), QStringLiteral("ON"));  // stage 1
    QCOMPARE(cell(body[comp + 1], 65), QStringLiteral("ON"));  // stage 2
    QCOMPARE(cell(body[comp + 1], 80), QStringLiteral("OFF")); // stage 3
    QCOMPARE(cell(body[comp + 1], 95), QString());             // stage 4 not shown
    QCOMPARE(cell(body[comp + 1], 155), QString());
    QCOMPARE(cell(body[comp + 2], 65), QString());             // the screw has no stage 2
    QCOMPARE(cell(body[comp + 3], 1), QStringLiteral("3"));
    QVERIFY(body[comp + 4].isEmpty());

    const qsizetype cond = body.indexOf(QRegularExpression(QStringLiteral("^Condenser No\\..*")));
    QCOMPARE(cond, comp + 5);
    QCOMPARE(cell(body[cond], 80), QStringLiteral("Stage 4"));
    QCOMPARE(cell(body[cond + 1], 20), QStringLiteral("Bank 2"));
    QCOMPARE(cell(body[cond + 1], 35), QStringLiteral("ON"));
    QCOMPARE(body.size(), cond + 2);
}

QTEST_GUILESS_MAIN(tst_status_reports)
#include "tst_status_reports.moc"
