// Reply layouts of the simulated instrument, at the positions the layout
// tables give (counted from 1).

#include "sim/sim_replies.h"

#include <QTest>

using namespace sim;

namespace {

Options quiet(const QByteArray& version)
{
    Options o;
    o.version = version;
    o.historyHours = 0;
    o.start = QDateTime(QDate(2026, 3, 7), QTime(14, 5, 9));
    return o;
}

QByteArray at(const QByteArray& text, int pos, int width) { return text.mid(pos - 1, width); }

} // namespace

class TstSimReplies : public QObject {
    Q_OBJECT
private slots:
    void identity();
    void channelRecord_data();
    void channelRecord();
    void downloadRecord_data();
    void downloadRecord();
    void status_data();
    void status();
    void pressure_data();
    void pressure();
    void logRecords();
    void front_data();
    void front();
    void brumalet();
};

void TstSimReplies::identity()
{
    const QByteArray r = identityReply("9.6", 12, 3, QDateTime(QDate(2026, 3, 7), QTime(14, 5, 9)));
    QCOMPARE(r.size(), 47);
    QCOMPARE(at(r, 1, 7), QByteArray("9.6    "));
    QCOMPARE(at(r, 8, 5), QByteArray("00012"));
    QCOMPARE(at(r, 13, 5), QByteArray("00003"));
    QCOMPARE(at(r, 18, 22).trimmed(), QByteArray("07/03/2026 14:05:09"));
    QCOMPARE(at(r, 40, 8), QByteArray("Glacinor"));
}

void TstSimReplies::channelRecord_data()
{
    QTest::addColumn<QByteArray>("version");
    QTest::addColumn<int>("channel"); // as the operator counts
    QTest::addColumn<int>("length");  // positions before the token
    QTest::addColumn<int>("field");   // a field placed to be found...
    QTest::addColumn<int>("pos");     // ...here
    QTest::addColumn<int>("width");
    QTest::newRow("216 ends at 63") << QByteArray("14") << 216 << 63 << 94 << 58 << 6;
    QTest::newRow("200 ends at 189") << QByteArray("14") << 200 << 189 << 60 << 184 << 6;
    QTest::newRow("101 ends at 189") << QByteArray("9.6") << 101 << 189 << 14 << 64 << 6;
    QTest::newRow("100 ends at 363") << QByteArray("14") << 100 << 363 << 12 << 358 << 6;
    QTest::newRow("67 v14") << QByteArray("14") << 67 << 363 << 2 << 202 << 6;
    QTest::newRow("66 v14 has 223-224") << QByteArray("14") << 66 << 375 << 224 << 370 << 6;
    QTest::newRow("33 v14") << QByteArray("14") << 33 << 375 << 223 << 364 << 6;
    QTest::newRow("32 v14 has 225-227") << QByteArray("14") << 32 << 393 << 227 << 388 << 6;
    QTest::newRow("28 v14") << QByteArray("14") << 28 << 393 << 225 << 376 << 6;
    QTest::newRow("27 v14 compressor") << QByteArray("14") << 27 << 423 << 167 << 418 << 6;
    QTest::newRow("27 v9.6 no 364-393") << QByteArray("9.6") << 27 << 393 << 168 << 364 << 6;
    QTest::newRow("27 v7 narrow 165") << QByteArray("7.0") << 27 << 388 << 165 << 370 << 1;
    QTest::newRow("27 v6.5 wide 165") << QByteArray("6.5") << 27 << 393 << 165 << 370 << 6;
    QTest::newRow("15 pressure") << QByteArray("14") << 15 << 447 << 205 << 442 << 6;
    QTest::newRow("12 condenser") << QByteArray("14") << 12 << 460 << 169 << 460 << 1;
    QTest::newRow("1 v14 all") << QByteArray("14") << 1 << 1041 << 222 << 1041 << 1;
    QTest::newRow("1 v14 field 211") << QByteArray("14") << 1 << 1041 << 211 << 1020 << 6;
    QTest::newRow("1 v8.7 all") << QByteArray("8.7") << 1 << 1011 << 213 << 1002 << 1;
    QTest::newRow("1 v8.6 no 213-222") << QByteArray("8.6") << 1 << 1001 << 212 << 996 << 6;
    QTest::newRow("1 v8.5 no 211-212") << QByteArray("8.5") << 1 << 989 << 99 << 984 << 6;
    QTest::newRow("1 v7 narrow") << QByteArray("7.0") << 1 << 984 << 83 << 864 << 1;
    QTest::newRow("1 v14 banks") << QByteArray("14") << 1 << 1041 << 83 << 899 << 1;
    QTest::newRow("1 v14 width 4") << QByteArray("14") << 1 << 1041 << 129 << 735 << 4;
}

void TstSimReplies::channelRecord()
{
    QFETCH(QByteArray, version);
    QFETCH(int, channel);
    QFETCH(int, length);
    QFETCH(int, field);
    QFETCH(int, pos);
    QFETCH(int, width);
    InstrumentState s(quiet(version));
    const int value = width == 1 ? 7 : width == 4 ? -321 : -4321;
    s.setField(channel - 1, field, value);
    s.setDescription(channel - 1, "Dairy");
    const QByteArray r = sim::channelRecord(s, channel - 1);
    QVERIFY(r.endsWith("schanupload"));
    QCOMPARE(r.size() - 11, length);
    QCOMPARE(at(r, 1, 6), QByteArray::number(channel - 1).rightJustified(6));
    QCOMPARE(at(r, 33, 6), QByteArray("Dairy "));
    QCOMPARE(at(r, pos, width), QByteArray::number(value).rightJustified(width));
}

void TstSimReplies::downloadRecord_data()
{
    QTest::addColumn<QByteArray>("version");
    QTest::addColumn<QByteArray>("record");
    QTest::addColumn<bool>("taken");
    QTest::addColumn<int>("wire");
    QTest::addColumn<int>("field");
    QTest::addColumn<int>("value");
    QTest::newRow("216") << QByteArray("14") << QByteArray("215,1,0,0,360,720,1080,Dock 1,2,0,15,30,45,") << true << 215 << 94 << 45;
    QTest::newRow("216 short") << QByteArray("14") << QByteArray("215,1,0,0,360,720,1080,Dock 1,2,0,15,30,") << false << 215 << 94 << 1080;
    QTest::newRow("216 not numeric") << QByteArray("14") << QByteArray("215,1,0,0,360,720,x,Dock 1,2,0,15,30,45,") << false << 215 << 94 << 1080;
    QTest::newRow("216 flag too wide") << QByteArray("14") << QByteArray("215,10,0,0,360,720,1080,Dock 1,2,0,15,30,45,") << false << 215 << 94 << 1080;
    QTest::newRow("216 time too wide") << QByteArray("14") << QByteArray("215,1,0,0,360,720,-100000,Dock 1,2,0,15,30,45,") << false << 215 << 94 << 1080;
    QTest::newRow("216 padded value") << QByteArray("14") << QByteArray("215,1,0,0,360,720, 1080,Dock 1,2,0,15,30,45,") << false << 215 << 94 << 1080;
    QTest::newRow("216 description short") << QByteArray("14") << QByteArray("215,1,0,0,360,720,1080,Dock,2,0,15,30,45,") << false << 215 << 94 << 1080;
    QTest::newRow("216 description long") << QByteArray("14") << QByteArray("215,1,0,0,360,720,1080,Dock 12,2,0,15,30,45,") << false << 215 << 94 << 1080;
    // A record of n values for the wire channel, the description in its
    // place, the last value 77.
    auto record = [](int wire, int n) {
        QByteArray r = QByteArray::number(wire) + ",1,0,0,0,0,0,Dock 1,";
        for (int i = 7; i < n - 1; ++i)
            r += "0,";
        return r + "77,";
    };
    QTest::newRow("41 v14 ends at 224") << QByteArray("14") << record(40, 74) << true << 40 << 224 << 77;
    QTest::newRow("41 v14 one more") << QByteArray("14") << record(40, 75) << false << 40 << 224 << 0;
    QTest::newRow("41 v9.6 without 223-224") << QByteArray("9.6") << record(40, 72) << true << 40 << 12 << 77;
    QTest::newRow("41 v9.6 with them") << QByteArray("9.6") << record(40, 74) << false << 40 << 12 << 0;
    QTest::newRow("33 v14 has 225-227") << QByteArray("14") << record(32, 77) << true << 32 << 227 << 77;
    QTest::newRow("28 v14 ends at 227") << QByteArray("14") << record(27, 77) << true << 27 << 227 << 77;
    QTest::newRow("27 v9.6 compressor") << QByteArray("9.6") << record(26, 77) << true << 26 << 167 << 77;
    QTest::newRow("216 no last comma") << QByteArray("14") << QByteArray("215,1,0,0,360,720,1080,Dock 1,2,0,15,30,45") << false << 215 << 94 << 1080;
}

void TstSimReplies::downloadRecord()
{
    QFETCH(QByteArray, version);
    QFETCH(QByteArray, record);
    QFETCH(bool, taken);
    QFETCH(int, wire);
    QFETCH(int, field);
    QFETCH(int, value);
    InstrumentState s(quiet(version));
    QCOMPARE(takeDownloadRecord(s, record), taken);
    QCOMPARE(s.field(wire, field), value);
    if (taken)
        QCOMPARE(s.description(wire), QByteArray("Dock 1"));
}

void TstSimReplies::status_data()
{
    QTest::addColumn<QByteArray>("version");
    QTest::addColumn<int>("length");
    QTest::newRow("7: no suction") << QByteArray("7") << 1819;
    QTest::newRow("8: suction") << QByteArray("8") << 1915;
    QTest::newRow("9.6") << QByteArray("9.6") << 1915;
    QTest::newRow("14: PID and fans") << QByteArray("14") << 2695;
}

void TstSimReplies::status()
{
    QFETCH(QByteArray, version);
    QFETCH(int, length);
    InstrumentState s(quiet(version));
    const QByteArray r = statusReply(s);
    QCOMPARE(r.size() - 6, length);
    QVERIFY(r.endsWith("status"));
    QCOMPARE(at(r, 1, 19), QByteArray("07/03/2026 14:05:09"));
    for (int n : {1, 2, 50, 101, 107, 200}) {
        QCOMPARE(at(r, 7 * n + 13, 6).trimmed().toInt(), s.reading(n));
        QCOMPARE(at(r, 7 * n + 19, 1), QByteArray(s.room(n).alarm ? "1" : "0"));
    }
    // A channel that is not connected, and the special inputs.
    QCOMPARE(at(r, 7 * 50 + 13, 6), QByteArray(" -1000"));
    QCOMPARE(at(r, 7 * 107 + 13, 6), QByteArray(" -1001"));
    QCOMPARE(at(r, 7 * 109 + 13, 6), QByteArray(" -1004"));
    for (int n : {1, 100}) {
        QCOMPARE(at(r, 4 * n + 1416, 1), QByteArray(s.room(n).liquid ? "1" : "0"));
        QCOMPARE(at(r, 4 * n + 1418, 1), QByteArray(s.room(n).defrost ? "1" : "0"));
    }
    if (length >= 1915)
        QCOMPARE(at(r, 1820, 6).trimmed().toInt(), s.suctionPressure(0));
}

void TstSimReplies::pressure_data()
{
    QTest::addColumn<QByteArray>("version");
    QTest::addColumn<int>("length");
    QTest::addColumn<int>("torvanLength");
    QTest::newRow("5.0: no Torvanel data") << QByteArray("5.0") << 1384 << 1099;
    QTest::newRow("8.7: no temperatures") << QByteArray("8.7") << 2680 << 1099;
    QTest::newRow("9.6") << QByteArray("9.6") << 2680 << 1129;
}

void TstSimReplies::pressure()
{
    QFETCH(QByteArray, version);
    QFETCH(int, length);
    QFETCH(int, torvanLength);
    InstrumentState s(quiet(version));
    s.advance(30 * 60 * 1000); // let the compressors stage
    const QByteArray r = pressureReply(s);
    QCOMPARE(r.size() - 6, length);
    QCOMPARE(at(r, 20, 6).trimmed().toInt(), s.suctionPressure(0));
    QCOMPARE(at(r, 18 + 26, 6).trimmed().toInt(), s.dischargePressure(1));
    QCOMPARE(at(r, 18 * 2 + 20, 6), QByteArray(" -1000")); // third bank not in use
    QCOMPARE(at(r, 110, 6).trimmed().toInt(), s.liquidLevel());
    // Record r carries compressor r + 1; seven are in use.
    QCOMPARE(at(r, 143, 6), QByteArray("     1"));
    QCOMPARE(at(r, 27 * 6 + 143, 6), QByteArray("     7"));
    QCOMPARE(at(r, 27 * 7 + 143, 6), QByteArray("     0"));
    QCOMPARE(at(r, 27 * 1 + 162, 6), QByteArray("     2")); // screw
    QCOMPARE(at(r, 27 * 3 + 162, 6), QByteArray("     3")); // variable
    QCOMPARE(at(r, 168, 1), QByteArray(s.compressor(0).running ? "1" : "0"));
    QCOMPARE(at(r, 990, 6).trimmed().toInt(), int(s.compressor(0).hours));
    // Condenser 12's hours end where compressor 1's step begins.
    QCOMPARE(at(r, 6 * 11 + 1152, 5), QByteArray("    0"));
    QCOMPARE(at(r, 1223, 6), QByteArray("     0"));
    const int variableStep = s.compressor(3).running ? s.compressor(3).running * 16 - 1 : 0;
    QCOMPARE(at(r, 6 * 3 + 1223, 6).trimmed().toInt(), variableStep);
    if (length > 1384) {
        // Torvanel 2 (the screw compressor) is fitted, Torvanel 1 is not.
        QCOMPARE(at(r, 1385, 6), QByteArray(" -1000"));
        QCOMPARE(at(r, 96 + 1385 + 24, 6).trimmed().toInt(), s.suctionPressure(0));
        // Torvanel 7 sits on a compressor of the second group.
        QCOMPARE(at(r, 96 * 6 + 1385 + 24, 6).trimmed().toInt(), s.suctionPressure(1));
    }
    const QByteArray t = torvanelReply(s);
    QCOMPARE(t.size() - 6, torvanLength);
    QCOMPARE(at(t, 40 * 1 + 20 + 22, 1), QByteArray("1"));
    QCOMPARE(at(t, 40 * 1 + 20 + 21, 1), QByteArray("0"));
}

void TstSimReplies::logRecords()
{
    AlarmRecord a;
    a.channel = 8;
    a.description = "Ch 8  ";
    a.kind = 1;
    a.time = QDateTime(QDate(2026, 11, 5), QTime(12, 43));
    a.value = -1001;
    QCOMPARE(alarmRecord(a, 1, false), QByteArray("+00008Ch 8  +00001+00001+00005+00011+00012+00043-010010almlog"));
    QCOMPARE(alarmRecord(a, 2, true).at(54), '1');

    HistoryRecord h;
    h.time = QDateTime(QDate(2026, 5, 12), QTime(9, 7));
    h.values.fill(HistoryRecord::NotLogged, 216);
    const QByteArray empty = historyRecord(h, 4, true);
    QCOMPARE(empty.left(23), QByteArray("12/05/+0202609:07+00004"));
    QCOMPARE(at(empty, 248, 6), QByteArray("+00000"));
    QCOMPARE(empty.mid(253), QByteArray("histy"));
    h.values[0] = -215;
    h.values[200] = 1234;
    const QByteArray two = historyRecord(h, 4, false);
    QCOMPARE(at(two, 24, 1), QByteArray("1"));
    QCOMPARE(at(two, 24 + 200, 1), QByteArray("1"));
    QCOMPARE(at(two, 24 + 199, 1), QByteArray("0"));
    QCOMPARE(two.mid(247), QByteArray("-00215+01234+00001histy"));

    PowerRecord p;
    p.end = QDateTime(QDate(2026, 5, 12), QTime(10, 15));
    p.seconds = 900;
    p.watts = 41250;
    QCOMPARE(powerRecord(p, 3, true), QByteArray("12/05/+0202610:15+00003+00900+000412500power"));
    QCOMPARE(powerRecord(p, 3, false).at(38), '1');
    QCOMPARE(noDataReply("almlog"), QByteArray("no data logalmlog"));
}

void TstSimReplies::front_data()
{
    QTest::addColumn<QByteArray>("version");
    QTest::addColumn<int>("line");
    QTest::newRow("6.5") << QByteArray("6.5") << 16;
    QTest::newRow("7") << QByteArray("7") << 20;
    QTest::newRow("14") << QByteArray("14") << 20;
}

void TstSimReplies::front()
{
    QFETCH(QByteArray, version);
    QFETCH(int, line);
    InstrumentState s(quiet(version));
    FrontPanel panel;
    const QByteArray r = frontReply(s, panel);
    QCOMPARE(r.size(), 4 * line + 8 + 6 + 8 + 9);
    QVERIFY(r.endsWith("tempfront"));
    QCOMPARE(at(r, 1, 16), QByteArray("Set Temperature "));
    QCOMPARE(at(r, 4 * line + 1, 8), QByteArray("   -22.0"));
    QCOMPARE(at(r, 4 * line + 9, 6), QByteArray("     1"));
    // The up key on panel number 6 raises set temperature 1 of channel 1.
    panel.press(s, 5);
    QCOMPARE(s.field(0, 2), -219);
    panel.press(s, 1);
    QCOMPARE(at(frontReply(s, panel), 1, 16), QByteArray("Set Differential"));
}

void TstSimReplies::brumalet()
{
    InstrumentState s(quiet("9.6"));
    const QByteArray r = brumaletReply(s, 5);
    QVERIFY(r.endsWith("evapfrst"));
    QCOMPARE(r.size() - 8, 161);
    QCOMPARE(at(r, 8, 19), QByteArray("07/03/2026 14:05:09"));
    QCOMPARE(at(r, 147, 5), QByteArray("    1"));
    QCOMPARE(at(r, 132, 5), QByteArray("    6"));
    QCOMPARE(at(r, 112, 5), QByteArray("-1000"));
    QCOMPARE(at(brumaletReply(s, 6), 147, 5), QByteArray("    2"));
    QCOMPARE(at(brumaletReply(s, 7), 147, 5), QByteArray("-----")); // no scanner: no data
    QCOMPARE(brumaletStartReply(5), QByteArray("005dxstart"));
}

QTEST_GUILESS_MAIN(TstSimReplies)
#include "tst_sim_replies.moc"
