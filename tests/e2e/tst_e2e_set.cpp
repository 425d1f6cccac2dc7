// q19ctl set and functions: refusals before any line is opened, and a write
// by name against q19sim on a pseudo-terminal.

#include <QJsonArray>
#include <QJsonDocument>
#include <QProcess>
#include <QTemporaryDir>
#include <QtTest>

namespace {

struct Run {
    int exitCode = -1;
    QString out;
    QString err;
};

Run ctl(const QString& dataDir, const QString& port, const QStringList& args)
{
    QProcess p;
    QStringList all{"--data-dir", dataDir};
    if (!port.isEmpty())
        all << "--port" << port;
    p.start(QStringLiteral(Q19CTL_PATH), all + args);
    p.waitForFinished(120000);
    return {p.exitCode(), QString::fromUtf8(p.readAllStandardOutput()), QString::fromLocal8Bit(p.readAllStandardError())};
}

} // namespace

class TestE2ESet : public QObject {
    Q_OBJECT
private slots:
    void refusedBeforeTheLineIsOpened_data();
    void refusedBeforeTheLineIsOpened();
    void writesByNameAndSaysWhat();
    void functionsListsWhatSetTakes();
    void functionNewerThanTheFirmware();
};

void TestE2ESet::refusedBeforeTheLineIsOpened_data()
{
    QTest::addColumn<QStringList>("args");
    QTest::addColumn<int>("exitCode");
    QTest::addColumn<QString>("told");
    QTest::newRow("not a pressure channel")
        << QStringList{"set", "13", "20", "0", "100"} << 1
        << "Invalid Channel No.: No change was made to set points / Must only use channel (pressure channels) "
           "numbers 1 to 15 inclusive,";
    QTest::newRow("decimal for a whole number")
        << QStringList{"set", "13", "1", "0", "12.5"} << 1
        << "Invalid Value: Not a valid number, Enter a valid number / The old value will be used.";
    QTest::newRow("range in screen units") << QStringList{"set", "Set Temperature", "1", "0", "-60.0"} << 1
                                           << "-60.0 is outside -50.0 to 150.0 oC";
    QTest::newRow("unknown function") << QStringList{"set", "20", "1", "0", "1"} << 2 << "there is no function 20";
    QTest::newRow("unknown name") << QStringList{"set", "Set Nothing", "1", "0", "1"} << 2
                                  << "no function is called \"Set Nothing\"";
    QTest::newRow("unknown sub-function") << QStringList{"set", "5", "1", "4", "1.0"} << 2 << "has no sub-function 4";
    QTest::newRow("channel without the function") << QStringList{"set", "5", "101", "0", "1.0"} << 2
                                                   << "channel 101 has no Set Temperature";
    QTest::newRow("instrument not in the directory") << QStringList{"--id", "77", "set", "5", "1", "0", "1.0"} << 2
                                                     << "instrument 77 is not in the directory";
}

void TestE2ESet::refusedBeforeTheLineIsOpened()
{
    QFETCH(QStringList, args);
    QFETCH(int, exitCode);
    QFETCH(QString, told);
    QTemporaryDir data;
    // No line at this path: a refusal that dialled first would say so.
    const Run r = ctl(data.path(), data.filePath("no-such-port"), args);
    QCOMPARE(r.exitCode, exitCode);
    QVERIFY2(r.err.contains(told), qPrintable(r.err));
    QVERIFY2(!r.err.contains("Connecting"), qPrintable(r.err));
    QVERIFY(r.out.isEmpty());
}

void TestE2ESet::writesByNameAndSaysWhat()
{
    QProcess sim;
    sim.start(QStringLiteral(Q19SIM_PATH), {"--pty", "--id", "1", "--version", "14"});
    QVERIFY(sim.waitForStarted(5000));
    for (int i = 0; i < 50 && !sim.canReadLine(); ++i)
        sim.waitForReadyRead(100);
    const QString port = QString::fromLocal8Bit(sim.readLine()).trimmed();
    QVERIFY(port.startsWith('/'));
    QTemporaryDir data;

    Run r = ctl(data.path(), port, {"set", "set differential", "1", "0", "0.5"});
    QVERIFY2(r.exitCode == 0, qPrintable(r.err));
    r = ctl(data.path(), port, {"set", "Set Differential", "1", "0", "2"});
    QVERIFY2(r.exitCode == 0, qPrintable(r.err));
    QCOMPARE(r.out, QStringLiteral("Set Differential, channel 1: 0.5 → 2.0 oC, confirmed\n"));
    // By number the same value: nothing goes out.
    r = ctl(data.path(), port, {"set", "6", "1", "0", "2.0"});
    QCOMPARE(r.exitCode, 0);
    QVERIFY(r.out.isEmpty());
    QVERIFY2(r.err.contains("already 2.0") && !r.err.contains("Connecting"), qPrintable(r.err));
    // A global value names no channel.
    r = ctl(data.path(), port, {"set", "Number of Banks", "9", "0", "3"});
    QVERIFY2(r.exitCode == 0, qPrintable(r.err));
    QVERIFY2(r.out.startsWith("Number of Banks: ") && r.out.endsWith(" → 3, confirmed\n"), qPrintable(r.out));
    sim.kill();
    sim.waitForFinished(2000);
}

void TestE2ESet::functionsListsWhatSetTakes()
{
    QTemporaryDir data;
    Run r = ctl(data.path(), {}, {"functions"});
    QCOMPARE(r.exitCode, 0);
    QVERIFY2(r.out.contains(QRegularExpression(R"(\n  6  Set Differential\s+sub 0\s+0\.2 to 10\.0 oC  channels 1-100\n)")),
             qPrintable(r.out));
    QVERIFY2(r.out.contains(QRegularExpression(R"(\n 18  Set Defrost's\s+sub 0, 2-5 )")), qPrintable(r.out));
    r = ctl(data.path(), {}, {"--json", "functions"});
    const QJsonArray rows = QJsonDocument::fromJson(r.out.toUtf8()).array();
    QVERIFY(rows.size() > 70);
}

void TestE2ESet::functionNewerThanTheFirmware()
{
    QProcess sim;
    sim.start(QStringLiteral(Q19SIM_PATH), {"--pty", "--id", "1", "--version", "13"});
    QVERIFY(sim.waitForStarted(5000));
    for (int i = 0; i < 50 && !sim.canReadLine(); ++i)
        sim.waitForReadyRead(100);
    const QString port = QString::fromLocal8Bit(sim.readLine()).trimmed();
    QTemporaryDir data;
    const Run r = ctl(data.path(), port, {"set", "PID Differential", "1", "0", "1.5"});
    QCOMPARE(r.exitCode, 1);
    QVERIFY2(r.err.contains("PID Differential needs firmware 14 or later; the instrument has 13: nothing sent"),
             qPrintable(r.err));
    QVERIFY(r.out.isEmpty());
    sim.kill();
    sim.waitForFinished(2000);
}

QTEST_GUILESS_MAIN(TestE2ESet)
#include "tst_e2e_set.moc"
