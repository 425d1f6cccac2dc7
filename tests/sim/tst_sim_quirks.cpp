// The odd replies a scenario can ask for, read at the positions the reply
// layouts give them.

#include "sim/sim_instrument.h"

#include <QTest>

using namespace sim;

namespace {

const QByteArray Eot("\x04");

struct Rig {
    Rig(const QByteArray& version, const QString& scenario) : instrument(options(version), Instrument::Settings())
    {
        QObject::connect(&instrument, &Instrument::transmit, [this](const QByteArray& b) { out += b; });
        for (const QString& line : scenario.split(QLatin1Char(';'), Qt::SkipEmptyParts))
            error += applyScenarioLine(instrument, line);
    }
    static Options options(const QByteArray& version)
    {
        Options o;
        o.version = version;
        o.historyHours = 3;
        o.start = QDateTime(QDate(2026, 3, 7), QTime(14, 5));
        return o;
    }
    // The reply to a command, waiting as long as it takes.
    QByteArray ask(const QByteArray& command)
    {
        out.clear();
        instrument.receive(command);
        for (int i = 0; i < 100 && !out.endsWith("evapfrst") && !out.endsWith("presss") && !out.endsWith("torvan")
             && !out.endsWith("schanupload") && !out.endsWith("histy");
             ++i)
            instrument.advance(100);
        return out;
    }
    Instrument instrument;
    QByteArray out;
    QString error;
};

} // namespace

class TstSimQuirks : public QObject {
    Q_OBJECT
private slots:
    void oddReplies_data();
    void oddReplies();
    void dataLog_data();
    void dataLog();
};

void TstSimQuirks::oddReplies_data()
{
    QTest::addColumn<QByteArray>("version");
    QTest::addColumn<QString>("scenario");
    QTest::addColumn<QByteArray>("command");
    QTest::addColumn<int>("pos"); // from 1, in the reply
    QTest::addColumn<QByteArray>("text");
    const QByteArray t = "T" + Eot, tv = "t" + Eot, j = "J005" + Eot;
    QTest::newRow("plain suction") << QByteArray("9.6") << QString() << t << 20 << QByteArray("   ");
    QTest::newRow("over range suction") << QByteArray("9.6") << QString("special = -1001") << t << 20 << QByteArray(" -1001");
    QTest::newRow("unused value in the liquid") << QByteArray("9.6") << QString("special = -1003") << t << 32 << QByteArray(" -1003");
    QTest::newRow("level over range") << QByteArray("9.6") << QString("special = -1001") << t << 110 << QByteArray(" -1001");
    QTest::newRow("zero padded level") << QByteArray("9.6") << QString("zero_padded = 1") << t << 110 << QByteArray("+000");
    QTest::newRow("zero padded special") << QByteArray("9.6") << QString("zero_padded; special = -1001") << t << 20 << QByteArray("-01001");
    QTest::newRow("Torvanel 1 temperature") << QByteArray("9.6") << QString("special = -1003") << t << 1385 << QByteArray(" -1003");
    QTest::newRow("Torvanel 1 pressure") << QByteArray("9.6") << QString("special = -1001") << t << 1409 << QByteArray(" -1001");
    QTest::newRow("Torvanel 2 kind B") << QByteArray("9.6") << QString("torvanel_kind = 2:1") << t << 1563 << QByteArray("1");
    QTest::newRow("Torvanel 2 kind A") << QByteArray("9.6") << QString() << t << 1563 << QByteArray("0");
    QTest::newRow("compressor 2 first") << QByteArray("9.6") << QString("compressors_swapped") << t << 143 << QByteArray("     2");
    QTest::newRow("compressor 1 second") << QByteArray("9.6") << QString("compressors_swapped") << t << 170 << QByteArray("     1");
    QTest::newRow("torvan temperature") << QByteArray("9.6") << QString("special = -1003") << tv << 1100 << QByteArray(" -1003");
    QTest::newRow("torvan zero padded") << QByteArray("9.6") << QString("zero_padded") << tv << 1100 << QByteArray("-00");
    QTest::newRow("coil over range") << QByteArray("9.6") << QString("special = -1001") << j << 27 << QByteArray("-1001");
    QTest::newRow("coil zero padded") << QByteArray("9.6") << QString("zero_padded; special = -1003") << j << 32 << QByteArray("-1003");
    QTest::newRow("kind 10 wide at 7") << QByteArray("7") << QString("compressor_kind = 27:10") << "a26," + Eot << 370 << QByteArray("10   ");
    QTest::newRow("kind 9 fits at 7") << QByteArray("7") << QString("compressor_kind = 27:9") << "a26," + Eot << 370 << QByteArray("9    ");
    QTest::newRow("kind 10 at 8") << QByteArray("8") << QString("compressor_kind = 27:10") << "a26," + Eot << 370 << QByteArray("    10");
}

void TstSimQuirks::oddReplies()
{
    QFETCH(QByteArray, version);
    QFETCH(QString, scenario);
    QFETCH(QByteArray, command);
    QFETCH(int, pos);
    QFETCH(QByteArray, text);
    Rig rig(version, scenario);
    QCOMPARE(rig.error, QString());
    QByteArray reply = rig.ask(QByteArray(85, 'Z') + command);
    if (reply.contains("dxstart")) // the reading follows the start
        reply = reply.mid(reply.indexOf("dxstart") + 7);
    QVERIFY2(reply.size() > pos, reply.right(20).constData());
    QCOMPARE(reply.mid(pos - 1, text.size()), text);
}

void TstSimQuirks::dataLog_data()
{
    QTest::addColumn<QString>("scenario");
    QTest::addColumn<int>("extra");     // records sent beyond the log's own
    QTest::addColumn<int>("announced"); // count less the records sent
    QTest::newRow("plain") << QString() << 0 << 0;
    QTest::newRow("uncounted") << QString("uncounted = 2") << 0 << -2;
    QTest::newRow("zero record") << QString("zero_record = on") << 1 << 0;
    QTest::newRow("both") << QString("zero_record; uncounted = 1") << 1 << -1;
}

void TstSimQuirks::dataLog()
{
    QFETCH(QString, scenario);
    QFETCH(int, extra);
    QFETCH(int, announced);
    Rig rig("9.6", scenario);
    QCOMPARE(rig.error, QString());
    const int logged = int(rig.instrument.state().history.records.size());
    QVERIFY(logged >= 3);
    QByteArrayList records {rig.ask(QByteArray(84, 'Z') + "S" + Eot)};
    // The end marker stands just in front of the token: 0 while more follow.
    while (records.last().chopped(5).right(6).toInt() == 0 && records.size() < 1000)
        records << rig.ask(Eot);
    QCOMPARE(records.size(), logged + extra);
    QCOMPARE(records.first().mid(17, 6).toInt(), records.size() + announced);
    const bool zeroFirst = records.first().startsWith("00/00/+0000000:00");
    QCOMPARE(zeroFirst, extra == 1);
    if (zeroFirst) {
        // Every channel present, every value zero.
        QCOMPARE(records.first().mid(23, 216), QByteArray(216, '1'));
        QCOMPARE(records.first().mid(247, 216 * 6), QByteArray("+00000").repeated(216));
    }
}

QTEST_GUILESS_MAIN(TstSimQuirks)
#include "tst_sim_quirks.moc"
