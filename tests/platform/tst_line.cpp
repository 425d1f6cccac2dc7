#include "platform/fake_line.h"
#include "platform/line_factory.h"
#include "platform/pty.h"
#include "platform/serial_line.h"
#include "platform/tcp_line.h"

#include <QSignalSpy>
#include <QTcpServer>
#include <QTcpSocket>
#include <QtTest>

#include <poll.h>
#include <termios.h>

namespace {

QList<QByteArray> batches(const QSignalSpy& spy)
{
    QList<QByteArray> out;
    for (const QList<QVariant>& args : spy)
        out.append(args.at(0).toByteArray());
    return out;
}

QByteArray joined(const QSignalSpy& spy) { return batches(spy).join(); }

QList<int> codes(const QSignalSpy& spy)
{
    QList<int> out;
    for (const QList<QVariant>& args : spy)
        out.append(args.at(0).toInt());
    return out;
}

// A serial line on the slave of a fresh pseudo-terminal.
struct PtyLine {
    PtyPair pty;
    SerialLine line;
    QSignalSpy received { &line, &Line::received };
    QSignalSpy events { &line, &Line::lineEvent };
    bool open()
    {
        line.setPortName(pty.slavePath());
        return pty.isValid() && line.open();
    }
};

} // namespace

class tst_Line : public QObject {
    Q_OBJECT
private slots:
    void settingsText_data()
    {
        QTest::addColumn<QString>("text");
        QTest::addColumn<QString>("formatted"); // empty: malformed

        QTest::newRow("plain") << "9600,n,8,1" << "9600,n,8,1";
        QTest::newRow("upper parity, 1.5 stop") << "2400,E,7,1.5" << "2400,e,7,1.5";
        QTest::newRow("spaces") << "  19200 , o , 8 , 2 " << "19200,o,8,2";
        QTest::newRow("parity word") << "115200,Space,8,1" << "115200,s,8,1";
        QTest::newRow("empty") << "" << "";
        QTest::newRow("speed only") << "9600" << "";
        QTest::newRow("speed not a number") << "abc,n,8,1" << "";
        QTest::newRow("unknown parity") << "9600,x,8,1" << "";
        QTest::newRow("stop bits 3") << "9600,n,8,3" << "";
        QTest::newRow("stop bits 2.5") << "9600,n,8,2.5" << "";
        QTest::newRow("data bits 9") << "9600,n,9,1" << "";
        QTest::newRow("extra field before") << "1,9600,n,8,1" << "";
    }
    void settingsText()
    {
        QFETCH(QString, text);
        QFETCH(QString, formatted);
        const std::optional<LineSettings> s = LineSettings::parse(text);
        QCOMPARE(s.has_value(), !formatted.isEmpty());
        if (s) {
            QCOMPARE(s->toText(), formatted);
            QCOMPARE(LineSettings::parse(s->toText()), s);
        }
    }

    void portKind_data()
    {
        QTest::addColumn<QString>("name");
        QTest::addColumn<bool>("tcp");
        QTest::newRow("ipv4") << "127.0.0.1:4001" << true;
        QTest::newRow("host name") << "serial-server.local:1" << true;
        QTest::newRow("ipv6") << "[::1]:65535" << true;
        QTest::newRow("port 0") << "127.0.0.1:0" << false;
        QTest::newRow("port too big") << "127.0.0.1:65536" << false;
        QTest::newRow("bare ipv6") << "::1:4001" << false;
        QTest::newRow("windows com") << "COM3" << false;
        QTest::newRow("device path") << "/dev/ttyUSB0" << false;
        QTest::newRow("path with colon") << "/tmp/a:4001" << false;
    }
    void portKind()
    {
        QFETCH(QString, name);
        QFETCH(bool, tcp);
        QCOMPARE(TcpLine::looksLikeTcp(name), tcp);
        const std::unique_ptr<Line> line = makeLine(name);
        QCOMPARE(qobject_cast<TcpLine*>(line.get()) != nullptr, tcp);
        QCOMPARE(qobject_cast<SerialLine*>(line.get()) != nullptr, !tcp);
        QCOMPARE(line->portName(), name);
    }

    void serialMovesBytesBothWays()
    {
        PtyLine p;
        QVERIFY(!p.line.write("early"));
        QVERIFY(p.open());
        QVERIFY(p.line.isPseudoTerminal());
        QVERIFY(p.line.write(QByteArray("ZZF\x04\xff", 5)));
        QCOMPARE(p.pty.readMaster(2000), QByteArray("ZZF\x04\xff", 5));
        QVERIFY(p.pty.writeMaster("Glacinor 00012\r\n"));
        QTRY_COMPARE(joined(p.received), QByteArray("Glacinor 00012\r\n"));
        p.line.close();
        QVERIFY(!p.line.write("late"));
    }

    void serialAppliesSettingsToDevice_data()
    {
        QTest::addColumn<QString>("text");
        QTest::addColumn<int>("handshaking");
        QTest::addColumn<bool>("whileOpen");
        QTest::addColumn<uint>("speed");
        QTest::addColumn<uint>("cflag");
        QTest::addColumn<uint>("iflag");
        // A pty keeps speed, stop bits and flow control; the kernel holds it
        // at 8 bits without parity, so those cannot be seen here.
        QTest::newRow("none") << "9600,n,8,1" << 0 << false << uint(B9600) << 0u << 0u;
        QTest::newRow("xon/xoff, 2 stop")
            << "2400,e,7,2" << 1 << false << uint(B2400) << uint(CSTOPB) << uint(IXON | IXOFF);
        QTest::newRow("rts") << "19200,o,8,1" << 2 << false << uint(B19200) << uint(CRTSCTS) << 0u;
        QTest::newRow("xon/rts is hardware")
            << "115200,n,8,1" << 3 << false << uint(B115200) << uint(CRTSCTS) << 0u;
        QTest::newRow("changed while open")
            << "4800,o,7,2" << 1 << true << uint(B4800) << uint(CSTOPB) << uint(IXON | IXOFF);
    }
    void serialAppliesSettingsToDevice()
    {
        QFETCH(QString, text);
        QFETCH(int, handshaking);
        QFETCH(bool, whileOpen);
        QFETCH(uint, speed);
        QFETCH(uint, cflag);
        QFETCH(uint, iflag);
        PtyLine p;
        QVERIFY(!whileOpen || p.open());
        QString error;
        QVERIFY2(p.line.setSettings(*LineSettings::parse(text), &error), qPrintable(error));
        p.line.setHandshaking(Handshaking(handshaking));
        QVERIFY(whileOpen || p.open());

        // The master sees the terminal settings of its slave.
        termios tio {};
        QCOMPARE(::tcgetattr(p.pty.masterFd(), &tio), 0);
        QCOMPARE(uint(::cfgetospeed(&tio)), speed);
        QCOMPARE(uint(tio.c_cflag & (CSTOPB | CRTSCTS)), cflag);
        QCOMPARE(uint(tio.c_iflag & (IXON | IXOFF)), iflag);
    }

    void serialDtrOnPtyIsNoEvent()
    {
        PtyLine p;
        QVERIFY(p.open());
        p.line.setDtr(true); // the hang-up pulse
        p.line.setDtr(false);
        QVERIFY(!p.line.dtr());
        QTest::qWait(50);
        QCOMPARE(codes(p.events), QList<int>());
        QVERIFY(p.line.write("K"));
        QCOMPARE(p.pty.readMaster(2000), QByteArray("K"));
        QVERIFY(p.pty.writeMaster("ok"));
        QTRY_COMPARE(joined(p.received), QByteArray("ok"));
    }

    void serialDiscardDropsPending()
    {
        PtyLine p;
        QVERIFY(p.open());
        QVERIFY(p.pty.writeMaster("stale reply"));
        pollfd slave { p.pty.slaveFd(), POLLIN, 0 };
        QCOMPARE(::poll(&slave, 1, 2000), 1); // it has reached the slave's input
        p.line.discardInput();
        QVERIFY(p.pty.writeMaster("fresh"));
        QTRY_COMPARE(joined(p.received), QByteArray("fresh"));
    }

    void serialDiscardKeepsTheAnswerToAWrite()
    {
        // A parser writes the next command and then the dispatcher discards
        // input; a peer that answers at once must not lose its answer.
        PtyLine p;
        QVERIFY(p.open());
        QVERIFY(p.pty.writeMaster("stale"));
        QTRY_COMPARE(joined(p.received), QByteArray("stale"));
        p.received.clear();
        QVERIFY(p.line.write("e"));
        QCOMPARE(p.pty.readMaster(2000), QByteArray("e"));
        QVERIFY(p.pty.writeMaster("donedown"));
        pollfd slave { p.pty.slaveFd(), POLLIN, 0 };
        QCOMPARE(::poll(&slave, 1, 2000), 1);
        p.line.discardInput();
        QTRY_COMPARE(joined(p.received), QByteArray("donedown"));
        // With nothing written since, a later discard drops what waits.
        QVERIFY(p.pty.writeMaster("noise"));
        QCOMPARE(::poll(&slave, 1, 2000), 1);
        p.line.discardInput();
        QVERIFY(p.pty.writeMaster("next"));
        QTRY_COMPARE(joined(p.received), QByteArray("donedownnext"));
    }

    void serialHangUpClosesWithLineLost()
    {
        PtyLine p;
        QVERIFY(p.open());
        p.pty.closeMaster();
        QTRY_COMPARE(codes(p.events), QList<int>{ Line::LineLost });
        QVERIFY(!p.line.isOpen());
        QVERIFY(!p.line.write("x"));
    }

    void serialMissingDeviceIsNamed()
    {
        SerialLine line;
        line.setPortName(QStringLiteral("/dev/q19-no-such-port"));
        QString error;
        QVERIFY(!line.open(&error));
        QCOMPARE(error, QStringLiteral("No such port: /dev/q19-no-such-port"));
    }

    void tcpMovesBytesAndRemoteCloseIsLineLost()
    {
        QTcpServer server;
        QVERIFY(server.listen(QHostAddress::LocalHost));
        TcpLine line;
        line.setPortName(QStringLiteral("127.0.0.1:%1").arg(server.serverPort()));
        QString error;
        QVERIFY2(line.open(&error), qPrintable(error));
        QTRY_VERIFY(server.hasPendingConnections());
        QTcpSocket* far = server.nextPendingConnection();
        QSignalSpy received(&line, &Line::received);
        QSignalSpy events(&line, &Line::lineEvent);

        QVERIFY(line.write("ZZZK\x04"));
        QTRY_COMPARE(far->bytesAvailable(), 5);
        QCOMPARE(far->readAll(), QByteArray("ZZZK\x04"));

        // The last words before the hang-up arrive ahead of the carrier event.
        far->write("Glacinor");
        far->flush();
        QTRY_COMPARE(joined(received), QByteArray("Glacinor"));
        far->write(" bye");
        far->disconnectFromHost();
        QTRY_COMPARE(codes(events), QList<int>{ Line::LineLost });
        QCOMPARE(joined(received), QByteArray("Glacinor bye"));
        QVERIFY(!line.isOpen());
        QVERIFY(!line.write("x"));

        // Our own close is not an event.
        QVERIFY(line.open());
        line.close();
        QTest::qWait(50);
        QCOMPARE(events.size(), 1);
    }

    void arrivalsReachAReceiverThatWaits_data()
    {
        QTest::addColumn<bool>("tcp");
        QTest::newRow("pty") << false;
        QTest::newRow("tcp") << true;
    }
    // A receiver that stands in a message box runs the event loop inside its
    // handler; what arrives meanwhile must reach it there, not wait unseen.
    void arrivalsReachAReceiverThatWaits()
    {
        QFETCH(bool, tcp);
        PtyPair pty;
        QTcpServer server;
        QTcpSocket* far = nullptr;
        std::unique_ptr<Line> line;
        if (tcp) {
            QVERIFY(server.listen(QHostAddress::LocalHost));
            line = makeLine(QStringLiteral("127.0.0.1:%1").arg(server.serverPort()));
        } else {
            line = makeLine(pty.slavePath());
        }
        QVERIFY(line->open());
        if (tcp) {
            QTRY_VERIFY(server.hasPendingConnections());
            far = server.nextPendingConnection();
        }
        const auto send = [&](const QByteArray& bytes) {
            if (far) {
                far->write(bytes);
                far->flush();
            } else {
                pty.writeMaster(bytes);
            }
        };
        QByteArrayList seen;
        bool nestedSeen = false;
        connect(line.get(), &Line::received, this, [&](const QByteArray& bytes) {
            seen << bytes;
            if (bytes == "dlres") {
                send("NO CARRIER");
                nestedSeen = QTest::qWaitFor([&] { return seen.size() > 1; }, 5000);
            }
        });
        send("dlres");
        QTRY_VERIFY(!seen.isEmpty());
        QVERIFY(nestedSeen);
        QCOMPARE(seen, (QByteArrayList{"dlres", "NO CARRIER"}));
    }

    void tcpRefusedConnectionFails()
    {
        QTcpServer server;
        QVERIFY(server.listen(QHostAddress::LocalHost));
        const quint16 port = server.serverPort();
        server.close();
        TcpLine line;
        line.setPortName(QStringLiteral("127.0.0.1:%1").arg(port));
        QString error;
        QVERIFY(!line.open(&error));
        QVERIFY2(error.contains(QLatin1String("refused")), qPrintable(error));
    }

    void fakeBatches_data()
    {
        QTest::addColumn<int>("n");
        QTest::addColumn<QList<QByteArray>>("expected");
        QTest::newRow("threes") << 3 << QList<QByteArray>{ "sta", "tus", "!" };
        QTest::newRow("whole") << 100 << QList<QByteArray>{ "status!" };
        QTest::newRow("zero is bytewise") << 0 << QList<QByteArray>{ "s", "t", "a", "t", "u", "s", "!" };
    }
    void fakeBatches()
    {
        QFETCH(int, n);
        QFETCH(QList<QByteArray>, expected);
        FakeLine line;
        QSignalSpy received(&line, &Line::received);
        line.deliverInBatches("status!", n);
        QCOMPARE(batches(received), expected);
    }

    void fakeWriteOnClosedFails()
    {
        FakeLine line;
        QVERIFY(!line.write("lost"));
        QVERIFY(line.open() && line.write("kept"));
        line.close();
        QVERIFY(!line.write("lost"));
        QCOMPARE(line.written(), QByteArray("kept"));
    }
};

QTEST_GUILESS_MAIN(tst_Line)
#include "tst_line.moc"
