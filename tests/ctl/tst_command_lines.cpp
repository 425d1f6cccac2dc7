#include <QProcess>
#include <QScopeGuard>
#include <QTcpServer>
#include <QTemporaryDir>
#include <QtTest>

namespace {

// A TCP port of 127.0.0.1 that nobody listens on once this returns.
QString closedPort()
{
    QTcpServer probe;
    if (!probe.listen(QHostAddress::LocalHost))
        return {};
    return QString::number(probe.serverPort());
}

struct Run {
    int exitCode = -1;
    QString out, err;
};

Run run(const QString& program, const QStringList& args)
{
    QProcess p;
    p.start(program, args);
    Run r;
    if (!p.waitForFinished(60000))
        return r;
    r.exitCode = p.exitStatus() == QProcess::NormalExit ? p.exitCode() : -1;
    r.out = QString::fromLocal8Bit(p.readAllStandardOutput());
    r.err = QString::fromLocal8Bit(p.readAllStandardError());
    return r;
}

} // namespace

// q19ctl and q19sim as a user types them: options on either side of the
// command, negative numbers as arguments, help per command, and usage
// errors with exit 2 on stderr. The q19ctl rows share one data folder and
// run in order.
class TestCommandLines : public QObject {
    Q_OBJECT
private slots:
    void ctl_data();
    void ctl();
    void ctlTakesTheSelectedInstrument();
    void ctlKeepsQtWarningsOffTheTerminal();
    void sim_data();
    void sim();

private:
    QTemporaryDir m_folder;
};

void TestCommandLines::ctl_data()
{
    QTest::addColumn<QStringList>("args"); // after --data-dir
    QTest::addColumn<int>("exitCode");
    QTest::addColumn<QString>("channel"); // "out" or "err": where the texts are looked for
    QTest::addColumn<QStringList>("present");
    QTest::addColumn<QStringList>("absent");

    const QStringList demoJson{"\"ID\": \"1\"", "\"Name\": \"Demo Cold Store\""};
    QTest::newRow("option before the command") << QStringList{"--json", "directory", "list"} << 0 << "out" << demoJson
                                               << QStringList{};
    QTest::newRow("option after the command") << QStringList{"directory", "list", "--json"} << 0 << "out" << demoJson
                                              << QStringList{};
    QTest::newRow("option between command and argument")
        << QStringList{"directory", "--json", "list"} << 0 << "out" << demoJson << QStringList{};
    QTest::newRow("negative numbers are arguments and values")
        << QStringList{"directory", "add", "7", "-5", "--town", "-3.5"} << 0 << "out" << QStringList{}
        << QStringList{"Unknown"};
    QTest::newRow("they were stored as typed")
        << QStringList{"directory", "list"} << 0 << "out" << QStringList{"7\t-5\t\t-3.5\t"} << QStringList{};
    QTest::newRow("global help lists every command")
        << QStringList{"--help"} << 0 << "out"
        << QStringList{"Usage: q19ctl [options] COMMAND", "Commands:", "  status", "  pressure", "  setpoints",
                       "--tcp <HOST:PORT>"}
        << QStringList{"--channel <N>"};
    QTest::newRow("command help has its own options")
        << QStringList{"setpoints", "--help"} << 0 << "out"
        << QStringList{"Usage: q19ctl [options] setpoints upload (--all | --channel N)", "--channel <N>", "--all",
                       "--data-dir <DIR>"}
        << QStringList{"--modem-phone", "Commands:"};
    QTest::newRow("help after a command's options")
        << QStringList{"directory", "--town", "x", "-h"} << 0 << "out" << QStringList{"--modem-phone <TEXT>"}
        << QStringList{"--channel"};
    QTest::newRow("an option of another command")
        << QStringList{"status", "--channel", "3"} << 2 << "err"
        << QStringList{"q19ctl status: Unknown option 'channel'", "Usage: q19ctl [options] status"} << QStringList{};
    QTest::newRow("status takes no arguments")
        << QStringList{"status", "now"} << 2 << "err" << QStringList{"status takes no arguments"} << QStringList{};
    QTest::newRow("setpoints needs a scope") << QStringList{"setpoints", "upload"} << 2 << "err"
                                             << QStringList{"--all or --channel N"} << QStringList{};
    QTest::newRow("setpoints takes one scope")
        << QStringList{"setpoints", "upload", "--all", "--channel", "4"} << 2 << "err"
        << QStringList{"--all or --channel N"} << QStringList{};
    QTest::newRow("unknown command") << QStringList{"frobnicate"} << 2 << "err"
                                     << QStringList{"unknown command frobnicate", "q19ctl --help"} << QStringList{};
    QTest::newRow("no command") << QStringList{"--json"} << 2 << "err" << QStringList{"no command given"}
                                << QStringList{};
    QTest::newRow("--port and --tcp") << QStringList{"identify", "--port", "/dev/null", "--tcp", "localhost:1"} << 2
                                      << "err" << QStringList{"--port and --tcp exclude each other"} << QStringList{};
    QTest::newRow("--tcp port out of range")
        << QStringList{"--tcp", "127.0.0.1:99999", "identify"} << 2 << "err"
        << QStringList{"--tcp 127.0.0.1:99999 is not a network address"}
        << QStringList{"serial", "/dev/", "invalid port number"};
    const QString refused = "127.0.0.1:" + closedPort();
    QTest::newRow("refused TCP connection")
        << QStringList{"identify", "--tcp", refused} << 1 << "err"
        << QStringList{"Cannot connect to the network address " + refused, "Connection refused"}
        << QStringList{"invalid port number", "Select a port", "QAbstractSocket", "QIODevice"};
}

void TestCommandLines::ctl()
{
    QFETCH(QStringList, args);
    QFETCH(int, exitCode);
    QFETCH(QString, channel);
    QFETCH(QStringList, present);
    QFETCH(QStringList, absent);
    const Run r = run(QStringLiteral(Q19CTL_PATH), QStringList{"--data-dir", m_folder.path()} + args);
    const QString& text = channel == QLatin1String("out") ? r.out : r.err;
    for (const QString& needle : present)
        QVERIFY2(text.contains(needle), qPrintable(needle + " not in:\n" + text + "\nstderr:\n" + r.err));
    for (const QString& needle : absent)
        QVERIFY2(!text.contains(needle), qPrintable(needle + " in:\n" + text));
    QCOMPARE(r.exitCode, exitCode);
}

// Without --id the workstation's selection at start applies: the first
// instrument by name, not the directory's first row.
void TestCommandLines::ctlTakesTheSelectedInstrument()
{
    QTemporaryDir folder;
    const QString ctl = QStringLiteral(Q19CTL_PATH);
    QCOMPARE(run(ctl, {"--data-dir", folder.path(), "directory", "add", "3", "Aardvark Stores"}).exitCode, 0);

    const QString port = closedPort();
    QProcess sim;
    const auto end = qScopeGuard([&] {
        sim.kill();
        sim.waitForFinished(2000);
    });
    sim.start(QStringLiteral(Q19SIM_PATH), {"--tcp", port, "--id", "3"});
    QVERIFY(sim.waitForStarted(5000));
    QVERIFY(sim.waitForReadyRead(5000));

    const Run r = run(ctl, {"--data-dir", folder.path(), "--tcp", "127.0.0.1:" + port, "identify", "--json"});
    QVERIFY2(r.out.contains("\"id\":\"3\""), qPrintable(r.out + r.err));
    QCOMPARE(r.exitCode, 0);
}

// The instrument goes away in the middle of an upload: the user reads the
// program's message, not the socket's complaints about reading a closed line.
void TestCommandLines::ctlKeepsQtWarningsOffTheTerminal()
{
    QTemporaryDir folder;
    QFile scenario(folder.filePath(QStringLiteral("slow.txt")));
    QVERIFY(scenario.open(QIODevice::WriteOnly));
    scenario.write("delay = 20\n");
    scenario.close();
    const QString port = closedPort();
    QProcess sim;
    sim.start(QStringLiteral(Q19SIM_PATH), {"--tcp", port, "--scenario", scenario.fileName()});
    QVERIFY(sim.waitForStarted(5000));
    QVERIFY(sim.waitForReadyRead(5000));

    QProcess ctl;
    const auto end = qScopeGuard([&] {
        sim.kill();
        sim.waitForFinished(2000);
        ctl.kill();
        ctl.waitForFinished(2000);
    });
    ctl.start(QStringLiteral(Q19CTL_PATH),
              {"--data-dir", folder.path(), "--tcp", "127.0.0.1:" + port, "setpoints", "upload", "--all"});
    QVERIFY(ctl.waitForStarted(5000));
    QByteArray err;
    while (!err.contains("Channel 3 of 216") && ctl.state() == QProcess::Running) {
        ctl.waitForReadyRead(1000);
        err += ctl.readAllStandardError();
    }
    QVERIFY2(err.contains("Channel 3 of 216"), err.constData());
    sim.kill();
    QVERIFY(ctl.waitForFinished(120000));
    err += ctl.readAllStandardError();
    QCOMPARE(ctl.exitCode(), 1);
    QVERIFY2(err.contains("Comunications Failed"), err.constData());
    QVERIFY2(!err.contains("QIODevice") && !err.contains("QAbstractSocket"), err.constData());
}

void TestCommandLines::sim_data()
{
    QTest::addColumn<QStringList>("args");
    QTest::addColumn<QString>("stdoutHas");
    QTest::addColumn<QString>("stderrHas");

    QTest::newRow("help") << QStringList{"--help"} << "--scenario <FILE>" << QString();
    QTest::newRow("help names the scenario keys") << QStringList{"-h"} << "drop = KIND:N" << QString();
    QTest::newRow("unknown option") << QStringList{"--pty", "--bogus"} << QString() << "Unknown option 'bogus'";
    QTest::newRow("no transport") << QStringList{"--id", "3"} << QString() << "give exactly one of --pty and --tcp";
    QTest::newRow("both transports") << QStringList{"--tcp", "4000", "--pty"} << QString()
                                     << "give exactly one of --pty and --tcp";
    QTest::newRow("negative speed") << QStringList{"--speed", "-2", "--pty"} << QString()
                                    << "bad value for --speed: -2";
    QTest::newRow("port out of range") << QStringList{"--tcp", "65536"} << QString() << "bad value for --tcp";
    QTest::newRow("bad start") << QStringList{"--pty", "--start", "05/01/2026"} << QString()
                               << "bad value for --start";
    QTest::newRow("empty log") << QStringList{"--pty", "--data-log", "0"} << QString() << "bad value for --data-log";
    QTest::newRow("stray argument") << QStringList{"--pty", "9.6"} << QString() << "unexpected argument 9.6";
}

// Every row ends before the simulator would start serving.
void TestCommandLines::sim()
{
    QFETCH(QStringList, args);
    QFETCH(QString, stdoutHas);
    QFETCH(QString, stderrHas);
    const Run r = run(QStringLiteral(Q19SIM_PATH), args);
    QCOMPARE(r.exitCode, stderrHas.isEmpty() ? 0 : 2);
    QVERIFY2(r.out.contains(stdoutHas), qPrintable(r.out));
    QVERIFY2(r.err.contains(stderrHas), qPrintable(r.err));
}

QTEST_GUILESS_MAIN(TestCommandLines)
#include "tst_command_lines.moc"
