#include "link/commands.h"

#include <QtTest>

using namespace commands;

class TestCommands : public QObject {
    Q_OBJECT
private slots:
    void prefixLengthPerSender_data();
    void prefixLengthPerSender();
    void texts_data();
    void texts();
};

void TestCommands::prefixLengthPerSender_data()
{
    QTest::addColumn<int>("sender");
    QTest::addColumn<int>("length");
    // The shortest, a shared one and the longest.
    QTest::newRow("Command3 direct connect") << int(Sender::DirectConnect) << 30;
    QTest::newRow("frmstatus") << int(Sender::Status) << 85;
    QTest::newRow("frmloadshed") << int(Sender::LoadShed) << 105;
}

void TestCommands::prefixLengthPerSender()
{
    QFETCH(int, sender);
    QFETCH(int, length);
    const QByteArray p = prefix(Sender(sender));
    QCOMPARE(p, QByteArray(length, 'Z'));
    QCOMPARE(framed(Sender(sender), "D"), p + "D\x04");
}

void TestCommands::texts_data()
{
    QTest::addColumn<QByteArray>("actual");
    QTest::addColumn<QByteArray>("expected");
    QTest::newRow("direct connect has EOT") << connectDirect()
                                            << QByteArray(30, 'Z') + "CONNECTK\x04";
    QTest::newRow("K after a call has none") << identifyAfterCall() << QByteArray("K");
    QTest::newRow("Command6 text, no EOT") << disconnectDirect() << QByteArray(34, 'Z') + "ATH";
    QTest::newRow("F without prefix") << statusRequest() << QByteArray("F\x04");
    QTest::newRow("T without prefix") << pressureRequest() << QByteArray("T\x04");
    QTest::newRow("Torvanel behind 85 Z") << torvanelRequest() << QByteArray(85, 'Z') + "t\x04";
    QTest::newRow("EOT alone") << nextRecord() << QByteArray("\x04");
    QTest::newRow("dial waiting for tone")
        << modemDial(true, QStringLiteral("&C1"), QStringLiteral("5551234"))
        << QByteArray("ATX4&C1DT5551234\r\n");
    QTest::newRow("blind dial") << modemDial(false, QString(), QStringLiteral("9"))
                                << QByteArray("ATX0DT9\r\n");
    QTest::newRow("hang up with CR LF") << modemHangUp() << QByteArray("ATH0\r\n");
    QTest::newRow("escape without line end") << modemEscape() << QByteArray("+++");
    QTest::newRow("modulation") << modemAskModulation() << QByteArray("AT+MS?\r\n");
    QTest::newRow("empty modem box") << modemCommand(QString()) << QByteArray("AT\r\n");
}

void TestCommands::texts()
{
    QFETCH(QByteArray, actual);
    QFETCH(QByteArray, expected);
    QCOMPARE(actual, expected);
}

QTEST_APPLESS_MAIN(TestCommands)
#include "tst_commands.moc"
