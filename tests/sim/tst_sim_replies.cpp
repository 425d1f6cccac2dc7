// Replies of the simulated instrument that the workstation's decoders do not
// read back (the cross-check holds the others), at their positions from 1.

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
    void downloadRecord_data();
    void downloadRecord();
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
