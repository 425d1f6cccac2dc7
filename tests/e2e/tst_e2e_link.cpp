#include "link/ccform1_engine.h"
#include "platform/pty.h"

#include <QProcess>
#include <QSignalSpy>
#include <QTcpServer>
#include <QtTest>

namespace {

// The simulator on a pseudo-terminal; control commands go to its stdin.
struct Sim {
    QProcess process;
    QString path;

    bool start(const QStringList& options)
    {
        process.setProgram(QStringLiteral(Q19SIM_PATH));
        process.setArguments(QStringList{"--pty", "--id", "12", "--resets", "3"} + options);
        process.start();
        if (!process.waitForStarted(5000))
            return false;
        for (int i = 0; i < 50 && !process.canReadLine(); ++i)
            process.waitForReadyRead(100);
        path = QString::fromLocal8Bit(process.readLine()).trimmed();
        return path.startsWith(QLatin1Char('/'));
    }
    void control(const QByteArray& line)
    {
        process.write(line + '\n');
        process.waitForBytesWritten(1000);
        // The answer on stderr says the command was taken.
        QVERIFY(QTest::qWaitFor([&] { return process.readAllStandardError().contains("ok: "); }, 5000));
    }
    ~Sim()
    {
        process.kill();
        process.waitForFinished(2000);
    }
};

struct Rig {
    SystemClock clock;
    ScriptedOperator op;
    MemorySettings settings;
    OpenViews views;
    LinkGlobals globals;
    ccForm1_engine engine{clock, op, settings, views, globals};

    Rig(const QString& port, const QString& id, bool direct)
    {
        engine.setInstrument(id, QStringLiteral("5551234"), nullptr);
        engine.setCommPort(port);
        engine.Option2_Click(direct ? 1 : 0);
    }
};

QByteArray identity12()
{
    return "9.6    000120000305/01/2026 08:00:00   Glacinor";
}

// The far end of a direct line without the simulator: a pseudo-terminal or
// a TCP peer that a test can make go away.
struct FarEnd {
    bool tcp = false;
    QTcpServer server;
    QTcpSocket* socket = nullptr;
    std::unique_ptr<PtyPair> pty;

    // The port to connect to; a pty that went away is replaced by a new one.
    QString port()
    {
        if (tcp) {
            if (!server.isListening())
                server.listen(QHostAddress::LocalHost);
            return QStringLiteral("127.0.0.1:%1").arg(server.serverPort());
        }
        pty = std::make_unique<PtyPair>();
        // Only the line holds the slave, so closing the master is a hang-up.
        pty->releaseSlave();
        return pty->slavePath();
    }
    // Takes the connect request and answers with the identity of instrument 12.
    bool answerIdentity()
    {
        if (!tcp)
            return !pty->readMaster(5000).isEmpty() && pty->writeMaster(identity12());
        if (!QTest::qWaitFor([&] { return server.hasPendingConnections(); }, 5000))
            return false;
        socket = server.nextPendingConnection();
        if (!QTest::qWaitFor([&] { return socket->bytesAvailable() > 0; }, 5000))
            return false;
        socket->readAll();
        socket->write(identity12());
        return socket->flush();
    }
    void goAway()
    {
        if (tcp)
            socket->disconnectFromHost();
        else
            pty->closeMaster();
    }
};

} // namespace

class TestE2ELink : public QObject {
    Q_OBJECT
private slots:
    void directConnectAndDisconnect();
    void failures_data();
    void failures();
    void resetDuringALink();
    void modemBusyThenConnect();
    void ctlIdentifyOverTcp();
    void arrivalUnderAMessageIsHandled();
    void lostLineThenConnectAgain_data();
    void lostLineThenConnectAgain();
};

void TestE2ELink::directConnectAndDisconnect()
{
    Sim sim;
    QVERIFY(sim.start({"--greet"}));
    Rig rig(sim.path, QStringLiteral("12"), true);
    QSignalSpy accepted(&rig.engine, &ccForm1_engine::identityAccepted);
    rig.engine.Command3_Click();
    // The greeting "AT&FE0" left on the line before the connect must not end it.
    QVERIFY(accepted.wait(5000));
    QCOMPARE(rig.engine.version.text.trimmed(), QStringLiteral("9.6"));
    QCOMPARE(rig.engine.resets.text.trimmed().toInt(), 3);
    QCOMPARE(rig.globals.instrument_version, QStringLiteral("9.6"));
    QVERIFY(rig.op.messages().isEmpty());
    rig.engine.Command6_Click();
    QVERIFY(!rig.engine.line().isOpen());
    QCOMPARE(rig.engine.Text3[2].text, QStringLiteral("Port Closed"));
}

void TestE2ELink::failures_data()
{
    QTest::addColumn<QString>("id");
    QTest::addColumn<QByteArray>("fault");
    QTest::addColumn<QString>("title");
    QTest::newRow("wrong ID") << "13" << QByteArray() << "Wrong ID";
    QTest::newRow("nocomp") << "12" << QByteArray("nocomp = 1") << "Glacinor Invaild";
    QTest::newRow("invalid version") << "12" << QByteArray("wrong_version = x.y") << "Invalid Version Number";
}

void TestE2ELink::failures()
{
    QFETCH(QString, id);
    QFETCH(QByteArray, fault);
    QFETCH(QString, title);
    Sim sim;
    QVERIFY(sim.start({}));
    if (!fault.isEmpty())
        sim.control(fault);
    Rig rig(sim.path, id, true);
    rig.engine.Command3_Click();
    QTRY_VERIFY_WITH_TIMEOUT(!rig.op.messages().isEmpty(), 5000);
    QCOMPARE(rig.op.last().title, title);
    QVERIFY(!rig.engine.line().isOpen());
    QVERIFY(rig.engine.Command3.enabled);
}

void TestE2ELink::resetDuringALink()
{
    Sim sim;
    QVERIFY(sim.start({}));
    Rig rig(sim.path, QStringLiteral("12"), true);
    QSignalSpy accepted(&rig.engine, &ccForm1_engine::identityAccepted);
    rig.engine.Command3_Click();
    QVERIFY(accepted.wait(5000));
    sim.control("reset");
    QTRY_VERIFY_WITH_TIMEOUT(!rig.op.messages().isEmpty(), 5000);
    QCOMPARE(rig.op.last().title, QStringLiteral("No Response"));
    QVERIFY(!rig.engine.line().isOpen());
    QVERIFY(!rig.globals.link_up);
}

void TestE2ELink::modemBusyThenConnect()
{
    Sim sim;
    QVERIFY(sim.start({"--modem"}));
    sim.control("dial = busy,connect");
    Rig rig(sim.path, QStringLiteral("12"), false);
    // The 30 s count is the unit tests' business; here it only has to end.
    rig.engine.Timer2.setInterval(10);
    QSignalSpy accepted(&rig.engine, &ccForm1_engine::identityAccepted);
    rig.engine.dial_num_Click();
    QVERIFY(accepted.wait(15000));
    QCOMPARE(rig.op.titles(), QStringList{"Busy"});
    QVERIFY(rig.globals.modem_online);
    QCOMPARE(rig.engine.Text3[4].text, QStringLiteral("ID No. 12"));
    // Hang up escapes data mode first; the modem then answers commands again.
    rig.engine.cancel_dial_Click();
    QVERIFY(!rig.globals.modem_online);
    QCOMPARE(rig.engine.Text3[3].text, QStringLiteral("Port Closed"));
}

void TestE2ELink::ctlIdentifyOverTcp()
{
#ifndef Q19CTL_PATH
    QSKIP("q19ctl is not built");
#else
    QTcpServer probe;
    QVERIFY(probe.listen(QHostAddress::LocalHost));
    const QString port = QString::number(probe.serverPort());
    probe.close();
    QProcess sim;
    sim.start(QStringLiteral(Q19SIM_PATH), {"--tcp", port, "--id", "12"});
    QVERIFY(sim.waitForStarted(5000));
    // It prints its address once it listens.
    for (int i = 0; i < 100 && !sim.canReadLine(); ++i)
        sim.waitForReadyRead(100);
    QCOMPARE(QString::fromLocal8Bit(sim.readLine()).trimmed(), "127.0.0.1:" + port);
    const QString dataDir = QDir::temp().filePath(QStringLiteral("q19-e2e-%1").arg(port));

    struct Row {
        QString id;
        int exit;
        QString needle;
    };
    for (const Row& row : {Row{"12", 0, "version: 9.6"}, Row{"13", 1, "Wrong ID:"}}) {
        QProcess ctl;
        ctl.start(QStringLiteral(Q19CTL_PATH), {"--data-dir", dataDir, "--id", row.id, "--tcp",
                                                "127.0.0.1:" + port, "identify"});
        QVERIFY(ctl.waitForFinished(20000));
        const QString out = QString::fromLocal8Bit(ctl.readAllStandardOutput() + ctl.readAllStandardError());
        QVERIFY2(out.contains(row.needle), qPrintable(out));
        QCOMPARE(ctl.exitCode(), row.exit);
    }
    QProcess usage;
    usage.start(QStringLiteral(Q19CTL_PATH), {"--tcp", "nohostport", "identify"});
    QVERIFY(usage.waitForFinished(5000));
    QCOMPARE(usage.exitCode(), 2);
    sim.kill();
    sim.waitForFinished(2000);
#endif
}

void TestE2ELink::arrivalUnderAMessageIsHandled()
{
    PtyPair pty;
    QVERIFY(pty.isValid());
    Rig rig(pty.slavePath(), QStringLiteral("12"), false);
    rig.op.setWhileShowing([&](const Operator::Message& m) {
        if (m.title != QLatin1String("Data Log Reset"))
            return;
        // The call drops while the operator reads the message.
        pty.writeMaster("\r\nNO CARRIER\r\n");
        QVERIFY(QTest::qWaitFor([&] { return rig.op.messages().size() > 1; }, 5000));
    });
    rig.engine.dial_num_Click();
    QCOMPARE(pty.readMaster(5000), QByteArray("ATX4DT5551234\r\n"));
    QVERIFY(pty.writeMaster("dlres"));
    QTRY_COMPARE(rig.op.titles(), (QStringList{"Data Log Reset", "Busy"}));
    QCOMPARE(rig.op.last().lines.value(0), QStringLiteral("No carrier signal."));
    QCOMPARE(rig.engine.Text3[3].text, QStringLiteral("Port Closed"));
    QVERIFY(!rig.globals.link_up);
    QVERIFY(!rig.engine.line().isOpen());
    QVERIFY(rig.engine.dial_num.enabled);
}

void TestE2ELink::lostLineThenConnectAgain_data()
{
    QTest::addColumn<bool>("tcp");
    QTest::newRow("pty master closed") << false;
    QTest::newRow("tcp peer closes") << true;
}

void TestE2ELink::lostLineThenConnectAgain()
{
    QFETCH(bool, tcp);
    FarEnd far;
    far.tcp = tcp;
    Rig rig(far.port(), QStringLiteral("12"), true);
    QSignalSpy accepted(&rig.engine, &ccForm1_engine::identityAccepted);
    rig.engine.Command3_Click();
    QVERIFY(far.answerIdentity());
    QVERIFY(accepted.wait(5000));

    far.goAway();
    QTRY_COMPARE(rig.engine.Text3[2].text, QStringLiteral("Port Closed"));
    QVERIFY(!rig.globals.link_up);
    QVERIFY(rig.engine.Command3.enabled);
    QCOMPARE(rig.op.titles(), QStringList{"Click Cancel to quit, OK to ignore."});

    rig.engine.setCommPort(far.port());
    rig.engine.Command3_Click();
    QVERIFY(far.answerIdentity());
    QTRY_COMPARE(accepted.size(), 2);
    // A kept error would have closed the line behind the identity's dispatch.
    QVERIFY(rig.engine.line().isOpen());
    QVERIFY(rig.globals.link_up);
    QCOMPARE(rig.engine.Text3[2].text, QStringLiteral("Port Open"));
    QCOMPARE(rig.op.messages().size(), 1);
}

QTEST_GUILESS_MAIN(TestE2ELink)
#include "tst_e2e_link.moc"
