// q19sim as a program: started with --pty, spoken to over the pseudo-terminal.

#include <QElapsedTimer>
#include <QProcess>
#include <QTcpServer>
#include <QTcpSocket>
#include <QTemporaryFile>
#include <QTest>

#include <fcntl.h>
#include <poll.h>
#include <termios.h>
#include <unistd.h>

namespace {

// Reads from fd until the text ends in token or the time is up.
QByteArray readUntil(int fd, const QByteArray& token, int timeoutMs = 5000)
{
    QByteArray got;
    QElapsedTimer t;
    t.start();
    while (!got.endsWith(token) && t.elapsed() < timeoutMs) {
        pollfd p {fd, POLLIN, 0};
        if (::poll(&p, 1, 50) <= 0)
            continue;
        char buf[4096];
        const ssize_t n = ::read(fd, buf, sizeof buf);
        if (n > 0)
            got.append(buf, int(n));
    }
    return got;
}

} // namespace

class TstSimE2e : public QObject {
    Q_OBJECT
private slots:
    void help();
    void overPty();
    void modemOverTcp();
};

void TstSimE2e::help()
{
    QProcess p;
    p.start(QStringLiteral(Q19SIM_PATH), {QStringLiteral("--help")});
    QVERIFY(p.waitForFinished(5000));
    QCOMPARE(p.exitCode(), 0);
    const QByteArray text = p.readAllStandardOutput();
    for (const char* word : {"--pty", "--tcp", "--modem", "--speed", "drop", "garble", "reset"})
        QVERIFY2(text.contains(word), word);
    p.start(QStringLiteral(Q19SIM_PATH), {QStringLiteral("--bogus")});
    QVERIFY(p.waitForFinished(5000));
    QCOMPARE(p.exitCode(), 2);
}

void TstSimE2e::overPty()
{
    QProcess sim;
    sim.start(QStringLiteral(Q19SIM_PATH),
              {QStringLiteral("--pty"), QStringLiteral("--version"), QStringLiteral("14"), QStringLiteral("--id"),
               QStringLiteral("12"), QStringLiteral("--history-hours"), QStringLiteral("2"),
               QStringLiteral("--start"), QStringLiteral("2026-03-07 14:05")});
    QVERIFY(sim.waitForStarted(5000));
    QVERIFY(sim.waitForReadyRead(10000));
    const QString path = QString::fromLocal8Bit(sim.readLine()).trimmed();
    QVERIFY2(path.startsWith(QStringLiteral("/dev/")), qPrintable(path));

    const int fd = ::open(path.toLocal8Bit().constData(), O_RDWR | O_NOCTTY | O_NONBLOCK);
    QVERIFY(fd >= 0);
    termios tio {};
    ::tcgetattr(fd, &tio);
    ::cfmakeraw(&tio);
    ::tcsetattr(fd, TCSANOW, &tio);
    auto send = [&](const QByteArray& b) { QCOMPARE(::write(fd, b.constData(), size_t(b.size())), ssize_t(b.size())); };

    send(QByteArray(30, 'Z') + "CONNECTK\x04");
    const QByteArray id = readUntil(fd, "Glacinor");
    QCOMPARE(id.size(), 47);
    QCOMPARE(id.left(12), QByteArray("14     00012"));

    send("F\x04");
    const QByteArray status = readUntil(fd, "status");
    QCOMPARE(status.size(), 2695 + 6);

    // A write through the pty comes back on upload.
    send(QByteArray(61, 'Z') + "P5,6,0,1,-185,4,\x04");
    QCOMPARE(readUntil(fd, "sret"), QByteArray("5,6,0,1,-185,4,sret"));
    send("X");
    send(QByteArray(61, 'Z') + "a6,\x04");
    const QByteArray record = readUntil(fd, "schanupload");
    QCOMPARE(record.mid(201, 6), QByteArray("  -185"));

    // A control line on stdin: the next identity reports another ID.
    sim.write("wrong_id = 7\n");
    QByteArray answer;
    QTRY_VERIFY_WITH_TIMEOUT((answer += sim.readAllStandardError()).contains("ok: wrong_id = 7"), 5000);
    send("K");
    QCOMPARE(readUntil(fd, "Glacinor").mid(7, 5), QByteArray("00007"));

    ::close(fd);
    // Closing its control input ends it.
    sim.closeWriteChannel();
    QVERIFY(sim.waitForFinished(5000));
    QCOMPARE(sim.exitStatus(), QProcess::NormalExit);
}

void TstSimE2e::modemOverTcp()
{
    quint16 port = 0;
    {
        QTcpServer probe; // a port that is free now
        QVERIFY(probe.listen(QHostAddress::LocalHost));
        port = probe.serverPort();
    }
    QTemporaryFile scenario;
    QVERIFY(scenario.open());
    scenario.write("# a busy number first\ndial = busy, connect\n");
    scenario.close();
    QProcess sim;
    sim.start(QStringLiteral(Q19SIM_PATH), {QStringLiteral("--tcp"), QString::number(port), QStringLiteral("--modem"),
                                            QStringLiteral("--history-hours"), QStringLiteral("0"),
                                            QStringLiteral("--start"), QStringLiteral("2026-03-07 14:05"),
                                            QStringLiteral("--scenario"), scenario.fileName()});
    QVERIFY(sim.waitForReadyRead(10000));
    QCOMPARE(sim.readLine().trimmed(), QByteArray("127.0.0.1:") + QByteArray::number(port));

    QTcpSocket line;
    line.connectToHost(QHostAddress::LocalHost, port);
    QVERIFY(line.waitForConnected(5000));
    auto talk = [&](const QByteArray& out, const QByteArray& token) {
        line.write(out);
        QByteArray got;
        QElapsedTimer t;
        t.start();
        while (!got.endsWith(token) && t.elapsed() < 5000)
            if (line.waitForReadyRead(100))
                got += line.readAll();
        return got;
    };
    QCOMPARE(talk("ATX4DT5551234\r\n", "BUSY\r\n"), QByteArray("\r\nBUSY\r\n"));
    QCOMPARE(talk("ATX4DT5551234\r\n", "CONNECT 9600\r\n"), QByteArray("\r\nCONNECT 9600\r\n"));
    QCOMPARE(talk("K", "Glacinor").mid(7, 5), QByteArray("00001"));
    sim.kill();
    sim.waitForFinished(5000);
}

QTEST_GUILESS_MAIN(TstSimE2e)
#include "tst_sim_e2e.moc"
