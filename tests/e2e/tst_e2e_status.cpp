#include "link/ccform1_engine.h"
#include "setpoints/instrument_schema.h"
#include "status/frmstatus_engine.h"

#include <QJsonDocument>
#include <QProcess>
#include <QScopeGuard>
#include <QSignalSpy>
#include <QTcpServer>
#include <QTemporaryDir>
#include <QtTest>

namespace {

// A free TCP port of 127.0.0.1 for the simulator.
QString freePort()
{
    QTcpServer probe;
    if (!probe.listen(QHostAddress::LocalHost))
        return {};
    return QString::number(probe.serverPort());
}

// Reads the first line the simulator prints: its address or its pty.
QString firstLine(QProcess& sim)
{
    for (int i = 0; i < 100 && !sim.canReadLine(); ++i)
        sim.waitForReadyRead(100);
    return QString::fromLocal8Bit(sim.readLine()).trimmed();
}

// The plant near midnight: room 1 defrosts from 00:17 for 20 minutes.
const QString kStart = QStringLiteral("2026-01-05 00:10");

} // namespace

class TestE2EStatus : public QObject {
    Q_OBJECT
private slots:
    void ctlOneRequest_data();
    void ctlOneRequest();
    void automaticCycleShowsThePlantMove();
};

void TestE2EStatus::ctlOneRequest_data()
{
    QTest::addColumn<QStringList>("command");
    QTest::addColumn<QString>("version");
    QTest::addColumn<QString>("scenario");
    QTest::addColumn<int>("exitCode");
    QTest::addColumn<QStringList>("present"); // in stdout (JSON compacted)
    QTest::addColumn<QStringList>("absent");

    const QString noResponse = QStringLiteral("No Response: The Glacinor failed to respond, / Re do the last command.");
    QTest::newRow("status, special values and version 9.6 boxes")
        << QStringList{"--json", "status"} << "9.6" << QString() << 0
        << QStringList{"\"dateTime\":\"05/01/2026 00:1", "\"number\":107,\"raw\":-1001,\"value\":\"Ovr Rge\"",
                       "\"number\":108,\"raw\":-1002,\"value\":\"No Sen\"",
                       "\"number\":109,\"raw\":-1004,\"value\":\"Ld Shd\"",
                       "\"number\":150,\"raw\":-1000,\"value\":\"Not Con\"", "\"suction\":[", "\"pressures\":[",
                       "\"outputs\":{\"defrost\":"}
        << QStringList{"\"number\":101,\"outputs\"", "\"pid\""};
    QTest::newRow("status, version 7 has no suction or pressure boxes")
        << QStringList{"--json", "status"} << "7" << QString() << 0 << QStringList{"\"channels\":["}
        << QStringList{"\"suction\":[", "\"pressures\":["};
    // Instrument 12 has no store here, so no channel has a PID control kind.
    QTest::newRow("status, version 14, options after the command, no PID channels")
        << QStringList{"status", "--json"} << "14" << QString() << 0 << QStringList{"\"channels\":["}
        << QStringList{"\"pid\"", "fanPercent"};
    QTest::newRow("status as a table")
        << QStringList{"status"} << "9.6" << QString() << 0
        << QStringList{"Glacinor ID 12", " 107  Ovr Rge", " 150  Not Con", "Suction pressures:"} << QStringList{};
    QTest::newRow("status unanswered") << QStringList{"status"} << "9.6" << "drop = F:1" << 1
                                       << QStringList{noResponse} << QStringList{"Chan"};
    QTest::newRow("pressure with a Torvanel alarm")
        << QStringList{"--json", "pressure"} << "9.6" << "torvanel_alarm = 6:0" << 0
        << QStringList{"\"kind\":\"variable\",\"number\":7", "\"condensers\":[", "\"liquidLevel\":{",
                       "{\"alarms\":[\"Suction Temperature\"],\"number\":7}"}
        << QStringList{};
    QTest::newRow("pressure, version 7 asks no Torvanel alarms")
        << QStringList{"--json", "pressure"} << "7" << QString() << 0 << QStringList{"\"compressors\":["}
        << QStringList{"torvanelAlarms"};
    QTest::newRow("pressure, Torvanel alarms unanswered")
        << QStringList{"pressure"} << "9.6" << "drop = t:1" << 1 << QStringList{noResponse}
        << QStringList{"Comp"};
    QTest::newRow("pressure unanswered") << QStringList{"pressure"} << "9.6" << "drop = T:1" << 1
                                         << QStringList{noResponse} << QStringList{"Bank"};
}

void TestE2EStatus::ctlOneRequest()
{
#ifndef Q19CTL_PATH
    QSKIP("q19ctl is not built");
#else
    QFETCH(QStringList, command);
    QFETCH(QString, version);
    QFETCH(QString, scenario);
    QFETCH(int, exitCode);
    QFETCH(QStringList, present);
    QFETCH(QStringList, absent);

    QTemporaryDir dir;
    QStringList simArgs{"--id", "12", "--version", version, "--start", kStart};
    if (!scenario.isEmpty()) {
        QFile file(dir.filePath(QStringLiteral("scenario.txt")));
        QVERIFY(file.open(QIODevice::WriteOnly));
        file.write(scenario.toUtf8() + '\n');
        file.close();
        simArgs << "--scenario" << file.fileName();
    }
    const QString port = freePort();
    QProcess sim;
    const auto end = qScopeGuard([&] {
        sim.kill();
        sim.waitForFinished(2000);
    });
    sim.start(QStringLiteral(Q19SIM_PATH), QStringList{"--tcp", port} + simArgs);
    QVERIFY(sim.waitForStarted(5000));
    QCOMPARE(firstLine(sim), "127.0.0.1:" + port);

    QProcess ctl;
    ctl.start(QStringLiteral(Q19CTL_PATH),
              QStringList{"--data-dir", dir.path(), "--id", "12", "--tcp", "127.0.0.1:" + port} + command);
    QVERIFY(ctl.waitForFinished(30000));
    QByteArray out = ctl.readAllStandardOutput();
    const QString err = QString::fromLocal8Bit(ctl.readAllStandardError());
    if (command.contains("--json") && exitCode == 0) {
        QJsonParseError error;
        const QJsonDocument doc = QJsonDocument::fromJson(out, &error);
        QVERIFY2(error.error == QJsonParseError::NoError, qPrintable(error.errorString()));
        out = doc.toJson(QJsonDocument::Compact);
        if (command.contains("status"))
            QCOMPARE(doc["channels"].toArray().size(), 200);
    }
    const QString text = QString::fromLocal8Bit(out) + err;
    for (const QString& needle : present)
        QVERIFY2(text.contains(needle), qPrintable(needle + " not in:\n" + text.left(3000)));
    for (const QString& needle : absent)
        QVERIFY2(!text.contains(needle), qPrintable(needle + " in:\n" + text.left(3000)));
    QCOMPARE(ctl.exitCode(), exitCode);
#endif
}

void TestE2EStatus::automaticCycleShowsThePlantMove()
{
    QProcess sim;
    const auto end = qScopeGuard([&] {
        sim.kill();
        sim.waitForFinished(2000);
    });
    sim.start(QStringLiteral(Q19SIM_PATH),
              {"--pty", "--id", "12", "--speed", "600", "--start", kStart, "--history-hours", "0"});
    QVERIFY(sim.waitForStarted(5000));
    const QString pty = firstLine(sim);
    QVERIFY2(pty.startsWith(QLatin1Char('/')), qPrintable(pty));

    SystemClock clock;
    ScriptedOperator op;
    MemorySettings settings;
    OpenViews views;
    LinkGlobals globals;
    ccForm1_engine link(clock, op, settings, views, globals);
    link.setInstrument(QStringLiteral("12"), QString(), nullptr);
    QVERIFY(link.setCommPort(pty));
    link.Option2_Click(1);
    QSignalSpy accepted(&link, &ccForm1_engine::identityAccepted);
    link.Command3_Click();
    QVERIFY(accepted.wait(5000));

    QTemporaryDir dir;
    const QString store = dir.filePath(QStringLiteral("t-12.db"));
    QVERIFY(createInstrumentTemplate(store));
    frmstatus_engine status(link, clock, op, views);
    QVERIFY(status.Form_Load(QStringLiteral("12"), store));
    // Rooms 1 and 2 (defrosts from 00:17 and 00:34), a chill room, a sensor.
    const QList<int> channels{1, 2, 25, 101};
    for (int ch : channels)
        status.Command1_Click(ch);
    for (int row = 0; row < channels.size(); ++row)
        QCOMPARE(status.rowChannel(row), channels[row]);
    // The load's own request is answered first; Start arms no tick before that.
    QTRY_VERIFY_WITH_TIMEOUT(status.cycle.nowstatus.enabled, 5000);

    struct Seen {
        QString dateTime;
        QStringList temps;
        bool defrost = false;
    };
    QList<Seen> replies;
    connect(&status, &frmstatus_engine::changed, this, [&] {
        const QString now = status.cycle.Text10[2].text;
        if (now.isEmpty() || (!replies.isEmpty() && replies.last().dateTime == now))
            return;
        Seen s{now, {}, false};
        for (int row = 0; row < channels.size(); ++row) {
            s.temps << status.Temp[row].text;
            s.defrost = s.defrost || status.defrost[row].backColor == frmstatus_engine::DefrostOn;
        }
        replies.append(s);
    });
    // One second between ticks: ten minutes of plant time at this speed.
    status.cycle.Text10[1].text = QStringLiteral("1");
    status.cycle.startstatus_Click();
    QVERIFY(status.cycle.stopstatus.enabled);
    QTRY_VERIFY_WITH_TIMEOUT(replies.size() >= 5, 30000);
    status.cycle.stopstatus_Click();

    QSet<QString> temperatures;
    bool defrost = false;
    for (const Seen& s : replies) {
        for (const QString& t : s.temps)
            QVERIFY2(t != QLatin1String("????"), qPrintable(s.dateTime));
        temperatures.insert(s.temps.join(QLatin1Char(' ')));
        defrost = defrost || s.defrost;
    }
    QVERIFY2(temperatures.size() > 1, qPrintable(QStringList(temperatures.values()).join('\n')));
    QVERIFY(defrost);
    QVERIFY(!status.cycle.Text1.visible);
    QCOMPARE(op.titles(), QStringList());
    link.Command6_Click();
}

QTEST_GUILESS_MAIN(TestE2EStatus)
#include "tst_e2e_status.moc"
