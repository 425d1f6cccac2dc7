#include "status/presss_codec.h"
#include "status/status_codec.h"
#include "status_test_support.h"

#include <QTest>

namespace sl = status_layout;
using sl::valuePos;
using sl::OutputChannels;

class tst_status_codec : public QObject {
    Q_OBJECT
private slots:
    void specialValues_data();
    void specialValues();
    void channelFieldsAtTheirPositions_data();
    void channelFieldsAtTheirPositions();
    void assocReadsTheFollowingChannel();
    void versionGates_data();
    void versionGates();
    void shortReplyReadsAsZero();
    void presssFields();
    void stepPercent_data();
    void stepPercent();
    void torvanelBlockInCsData();
    void alarmWords_data();
    void alarmWords();
    void torvanTemperatures();
};

void tst_status_codec::specialValues_data()
{
    QTest::addColumn<QString>("field");
    QTest::addColumn<QString>("channel");
    QTest::addColumn<QString>("pressure");
    QTest::addColumn<QString>("suction");
    QTest::newRow("not connected") << " -1000" << "Not Con" << "N-C" << "N-C";
    QTest::newRow("over range, left aligned") << "-1001 " << "Ovr Rge" << "O-R" << "O-R";
    QTest::newRow("no sensor: a number in the boxes") << "-1002 " << "No Sen" << "-100.2" << "-1002";
    QTest::newRow("load shed with blanks before") << " -1004" << "Ld Shd" << "-100.4" << "-1004";
    QTest::newRow("-1003 is a number") << " -1003" << "-100.3" << "-100.3" << "-1003";
    QTest::newRow("measurement") << "   235" << "23.5" << "23.5" << "235";
    QTest::newRow("negative tenths") << "   -12" << "-1.2" << "-1.2" << "-12";
    QTest::newRow("blank field") << "      " << "0.0" << "0.0" << "0";
}

void tst_status_codec::specialValues()
{
    QFETCH(QString, field);
    QFETCH(QString, channel);
    QFETCH(QString, pressure);
    QFETCH(QString, suction);
    const QString reply = ReplyText(2000, "status").put(valuePos(7), field.left(6)).str();
    const StatusReply r = decodeStatus(reply, 14);
    QCOMPARE(channelValueText(r.value[7]), channel);
    QCOMPARE(pressureBoxText(r.value[7]), pressure);
    QCOMPARE(suctionBoxText(r.value[7]), suction);
}

void tst_status_codec::channelFieldsAtTheirPositions_data()
{
    QTest::addColumn<int>("n");
    QTest::addColumn<int>("valueAt");
    QTest::addColumn<int>("alarmAt");
    QTest::newRow("first channel") << 1 << 20 << 26;
    QTest::newRow("channel 100") << 100 << 713 << 719;
    QTest::newRow("last channel") << 200 << 1413 << 1419;
}

void tst_status_codec::channelFieldsAtTheirPositions()
{
    QFETCH(int, n);
    QFETCH(int, valueAt);
    QFETCH(int, alarmAt);
    ReplyText t(2600, "status");
    t.put(1, "05/01/2026 08:00:00").num(valueAt, -55).put(alarmAt, "1");
    const StatusReply r = decodeStatus(t.str(), 14);
    QCOMPARE(r.dateTime, QStringLiteral("05/01/2026 08:00:00"));
    QCOMPARE(r.value[n], QStringLiteral("-55"));
    QVERIFY(r.alarm[n]);
    QVERIFY(!r.alarm[n == 1 ? 2 : 1]);
    if (n <= OutputChannels) {
        ReplyText o(2600, "status");
        o.put(1416 + 4 * n, "1").put(1418 + 4 * n, "1");
        const StatusReply ro = decodeStatus(o.str(), 14);
        QVERIFY(ro.outputs[n].liquid);
        QVERIFY(!ro.outputs[n].fan);
        QVERIFY(ro.outputs[n].defrost);
        QVERIFY(!ro.outputs[n].suction);
    }
}

void tst_status_codec::assocReadsTheFollowingChannel()
{
    const QString reply = ReplyText(2000).num(1413, 321).num(20, 11).str();
    QCOMPARE(assocValue(reply, 199), QStringLiteral("321"));
    QCOMPARE(assocValue(reply, 0), QStringLiteral("11"));
}

void tst_status_codec::versionGates_data()
{
    QTest::addColumn<double>("version");
    QTest::addColumn<bool>("suction");
    QTest::addColumn<bool>("pressures");
    QTest::addColumn<bool>("pid");
    QTest::newRow("unknown") << 0.0 << false << false << false;
    QTest::newRow("7") << 7.0 << false << false << false;
    QTest::newRow("8") << 8.0 << true << false << false;
    QTest::newRow("8.8") << 8.8 << true << true << false;
    QTest::newRow("14") << 14.0 << true << true << true;
}

void tst_status_codec::versionGates()
{
    QFETCH(double, version);
    ReplyText t(2600, "status");
    t.num(1820 + 6 * 15, 350).num(1385 + 7 * 4, 1234).num(1910 + 6 * 3, 45).num(2306 + 6 * 2, 60).num(2498 + 6 * 2, 70);
    const StatusReply r = decodeStatus(t.str(), version);
    QTEST(r.hasSuction, "suction");
    QTEST(r.hasPressures, "pressures");
    QTEST(r.hasPid, "pid");
    QCOMPARE(r.suction[15], QStringLiteral("350"));
    QCOMPARE(pressureBoxText(r.pressure[4]), QStringLiteral("123.4"));
    QCOMPARE(r.pid[3], QStringLiteral("45"));
    QCOMPARE(r.pidKind5[2], QStringLiteral("60"));
    QCOMPARE(r.fanKind5[2], QStringLiteral("70"));
}

void tst_status_codec::shortReplyReadsAsZero()
{
    const StatusReply r = decodeStatus(QStringLiteral("05/01/26status"), 14);
    QCOMPARE(channelValueText(r.value[1]), QStringLiteral("0.0"));
    QVERIFY(!r.alarm[1]);
}

void tst_status_codec::presssFields()
{
    using namespace presss_layout;
    ReplyText t(1400, "presss");
    t.num(suctionPos(0), -1000).num(dischargePos(4), 1650).num(liquidPos(2), -1001).num(LiquidLevelPos, 45);
    t.put(equalizerPos(26), "1").put(liquidPumpPos(3), "1");
    // Record 0 carries compressor 12, record 1 is empty.
    t.num(recordNumberPos(0), 12).num(recordStagesPos(0), 3).num(recordKindPos(0), 1).put(recordRunningPos(0), "1");
    t.num(recordNumberPos(1), 0);
    t.put(condenserStagePos(11, 3), "1").num(hoursRunPos(26), 1234).num(hoursRunCondenserPos(0), 7);
    t.num(compressorStepPos(11), 63).num(condenserStepPos(5), 64);
    t.num(torvanelFieldPos(0), 77);
    const PresssReply r = decodePresss(t.str(), 6);
    QCOMPARE(presssPressureText(r.banks[0].suction), QStringLiteral("N-C"));
    QCOMPARE(presssPressureText(r.banks[4].discharge), QStringLiteral("1650"));
    QCOMPARE(presssPressureText(r.banks[2].liquid), QStringLiteral("O-R"));
    QCOMPARE(liquidLevelText(r.liquidLevel), QStringLiteral("45%"));
    QVERIFY(r.equalizer[26] && !r.equalizer[25]);
    QVERIFY(r.banks[3].liquidPump && !r.banks[2].liquidPump);
    QCOMPARE(r.records[0].number, 12);
    QCOMPARE(r.records[0].stages, 3);
    QVERIFY(r.records[0].running);
    QCOMPARE(r.records[1].number, 0);
    QVERIFY(r.condenser[11][3] && !r.condenser[11][2]);
    QCOMPARE(r.hoursRun[26], QStringLiteral("1234"));
    QCOMPARE(r.hoursRunCondenser[0], QStringLiteral("7"));
    QCOMPARE(r.compressorStep[11], 64);
    QCOMPARE(r.condenserStep[5], 65);
    QVERIFY(r.hasTorvanel);
    QCOMPARE(r.torvanel[0], QStringLiteral("77"));
    QVERIFY(r.csData.startsWith(t.text.left(19) + QStringLiteral("    77")));
    QVERIFY(!decodePresss(t.str(), 5.9).hasTorvanel);
}

void tst_status_codec::stepPercent_data()
{
    QTest::addColumn<int>("step");
    QTest::addColumn<QString>("text");
    QTest::newRow("lowest") << 1 << "2 %";
    QTest::newRow("half rounds up") << 8 << "13 %";
    QTest::newRow("middle") << 32 << "50 %";
    QTest::newRow("top") << 64 << "100 %";
}

void tst_status_codec::stepPercent()
{
    QFETCH(int, step);
    QTEST(stepPercentText(step), "text");
}

void tst_status_codec::torvanelBlockInCsData()
{
    using namespace presss_layout;
    // The block of Torvanel 1 starts at 96 + 20 of CsData, that is at
    // 1385 + 96 of the reply.
    ReplyText t(1385 + 2 * 96, "presss");
    const int at = 1385 + 96;
    t.num(at, -1000).num(at + 6, 215).num(at + 24, 350).num(at + 24 + 18, -1001);
    t.put(at + 54, "1").put(at + 69, "1").put(at + 82, "1").put(at + 84, "1");
    const PresssReply r = decodePresss(t.str(), 8);
    const TorvanelBlock b = decodeTorvanelBlock(r.csData, 1);
    QVERIFY(b.known);
    QCOMPARE(b.temperatures[0], QStringLiteral("N-C"));
    QCOMPARE(b.temperatures[1], QStringLiteral("21.5"));
    QCOMPARE(b.pressures[0], QStringLiteral("350"));
    QCOMPARE(b.pressures[3], QStringLiteral("O-R"));
    QVERIFY(b.inputs[0] && b.inputs[15] && !b.inputs[1]);
    QCOMPARE(b.kind, 1);
    QVERIFY(b.furtherInputs[2] && !b.furtherInputs[1]);
    QVERIFY(!decodeTorvanelBlock(r.csData, 5).known);
}

void tst_status_codec::alarmWords_data()
{
    QTest::addColumn<int>("kind");
    QTest::addColumn<QList<int>>("flags");
    QTest::addColumn<QString>("words");
    const auto pad = [](const char* t) { return QString::fromLatin1(t).leftJustified(25) + QStringLiteral("\r\n"); };
    QTest::newRow("none") << 0 << QList<int>{} << "No alarms are active";
    QTest::newRow("screw, two") << 0 << QList<int>{3, 39} << pad("Oil Seperator Temperature") + pad("Spare Unused 4");
    QTest::newRow("recip reads table B") << 1 << QList<int>{3, 39} << pad("Intermediate Temperature") + pad("Other alarm's are active");
    QTest::newRow("flag 40 has no text") << 0 << QList<int>{40} << "\r\n";
}

void tst_status_codec::alarmWords()
{
    QFETCH(int, kind);
    QFETCH(QList<int>, flags);
    const int s = 2;
    ReplyText t(1200, "torvan");
    for (int i : flags)
        t.put(presss_layout::alarmFlagPos(s, i), "1");
    // The neighbours' flags must not leak in, except flag 40 (the next one's first).
    t.put(presss_layout::alarmFlagPos(s, 0) - 1, "1");
    QTEST(torvanelAlarmWords(t.str(), s, kind), "words");
    QCOMPARE(torvanel_alarm_table_a().size(), 1000);
    QCOMPARE(torvanel_alarm_table_b().size(), 1000);
}

void tst_status_codec::torvanTemperatures()
{
    const QString reply = ReplyText(1140, "torvan").num(1100, -1000).num(1106, -55).num(1124, 100).str();
    QCOMPARE(torvanTemperature(reply, 0), QStringLiteral("N-C"));
    QCOMPARE(torvanTemperature(reply, 1), QStringLiteral("-5.5"));
    QCOMPARE(torvanTemperature(reply, 4), QStringLiteral("10.0"));
}

QTEST_GUILESS_MAIN(tst_status_codec)
#include "tst_status_codec.moc"
