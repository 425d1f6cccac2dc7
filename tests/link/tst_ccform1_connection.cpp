#include "ccform1_rig.h"
#include "link/commands.h"

#include <QTemporaryDir>

// Making and ending the link: the direct connect and its tries, the modem
// call with its results, redials and guard times, the port settings and the
// instrument's rows that keep them.
class TestCcForm1Connection : public QObject {
    Q_OBJECT
private slots:
    void modemConnectSendsKThenWaitsForIdentity()
    {
        Rig rig(false);
        rig.dialAndConnect();
        QCOMPARE(rig.line->writes().first(), QByteArray("ATX4DT5551234\r\n"));
        QVERIFY(rig.globals.modem_online);
        rig.clock.advance(1999);
        QCOMPARE(rig.line->writes().size(), 1);
        rig.clock.advance(1);
        QCOMPARE(rig.line->lastWrite(), QByteArray("K"));
        QCOMPARE(rig.clock.remaining(&rig.engine->Timer4), 38000);
        rig.line->deliver(identity("9.6", "00012"));
        QVERIFY(!rig.engine->Timer4.Enabled());
        QCOMPARE(rig.engine->Text3[4].text, QStringLiteral("ID No. 12"));
        QVERIFY(rig.op.messages().isEmpty());
    }

    void fiveTriesThenNoGlacinor()
    {
        Rig rig;
        rig.engine->Command3_Click();
        rig.clock.advance(14999);
        QCOMPARE(rig.line->writes().size(), 5);
        QVERIFY(rig.op.messages().isEmpty());
        rig.clock.advance(1);
        for (const QByteArray& w : rig.line->writes())
            QCOMPARE(w, commands::connectDirect());
        QCOMPARE(rig.op.titles(), QStringList{"No Glacinor"});
        QVERIFY(!rig.line->isOpen());
        QCOMPARE(rig.engine->connect_tries, 0);
        // A second connect gets its five tries again.
        rig.line->clearWrites();
        rig.engine->Command3_Click();
        rig.clock.advance(15000);
        QCOMPARE(rig.line->writes().size(), 5);
    }

    void resetIgnoredWhileConnecting()
    {
        Rig rig;
        rig.engine->Command3_Click();
        rig.line->deliver("AT&FE0\r");
        QVERIFY(rig.op.messages().isEmpty());
        QVERIFY(rig.engine->Timer8.Enabled());
        QCOMPARE(rig.engine->test3, QStringLiteral("AT&FE0\r\n"));
    }

    void command6SendsNothing()
    {
        Rig rig;
        rig.engine->Command3_Click();
        rig.line->clearWrites();
        rig.engine->Command6_Click();
        QVERIFY(rig.line->writes().isEmpty());
        QVERIFY(!rig.globals.link_up);
    }

    void hangUpSleeps_data()
    {
        QTest::addColumn<bool>("online");
        QTest::addColumn<int>("slept");
        QTest::addColumn<QByteArray>("sent");
        QTest::newRow("modem on line") << true << 2500 << QByteArray("+++ATH0\r\n");
        QTest::newRow("modem in command mode") << false << 200 << QByteArray("ATH0\r\n");
    }

    void hangUpSleeps()
    {
        QFETCH(bool, online);
        QFETCH(int, slept);
        QFETCH(QByteArray, sent);
        Rig rig(false);
        rig.engine->dial_num_Click();
        if (online)
            rig.line->deliver("CONNECT");
        rig.line->clearWrites();
        const qint64 before = rig.clock.sleptMs();
        rig.engine->cancel_dial_Click();
        QCOMPARE(rig.clock.sleptMs() - before, qint64(slept));
        QCOMPARE(rig.line->written(), sent);
        QVERIFY(!rig.line->isOpen());
        QVERIFY(!rig.globals.modem_online);
        // The pulse: up, down, back to what it was.
        QCOMPARE(rig.line->dtrHistory().mid(rig.line->dtrHistory().size() - 3),
                 (QList<bool>{true, false, false}));
    }

    void busyRedialsWithoutLimit()
    {
        Rig rig(false);
        // The count must not run while the message stands.
        bool countingUnderMessage = false;
        rig.op.setWhileShowing([&](const Operator::Message&) {
            countingUnderMessage |= rig.engine->Timer2.Enabled();
        });
        rig.engine->dial_num_Click();
        for (int call = 0; call < 4; ++call) {
            rig.line->deliver("BUSY\r");
            QVERIFY(!rig.line->isOpen());
            QVERIFY(rig.engine->cancel_redial.enabled);
            QVERIFY(!rig.engine->cmdOK.enabled);
            rig.line->clearWrites();
            rig.clock.advance(29999);
            QVERIFY(rig.line->writes().isEmpty());
            rig.clock.advance(1);
            QCOMPARE(rig.line->writes().size(), 1);
            QVERIFY(rig.line->lastWrite().startsWith("ATX4"));
        }
        QVERIFY(!countingUnderMessage);
        QCOMPARE(rig.op.messages().size(), 4);
        rig.line->deliver("BUSY\r");
        rig.engine->cancel_redial_Click();
        rig.clock.advance(60000);
        QVERIFY(!rig.line->isOpen());
        QVERIFY(rig.engine->cmdOK.enabled);
    }

    void silentInstrumentRedialsUnderTheMessage()
    {
        Rig rig(false);
        bool counting = false;
        rig.op.setWhileShowing([&](const Operator::Message& m) {
            if (m.title == "No Glacinor")
                counting = rig.engine->Timer2.Enabled();
        });
        rig.dialAndConnect();
        rig.clock.advance(39999);
        QCOMPARE(rig.op.titles(), QStringList{});
        rig.clock.advance(1);
        QCOMPARE(rig.op.last().lines.size(), 3);
        QVERIFY(counting);
        QVERIFY(rig.line->written().contains("+++ATH0\r\n"));
    }

    void modemTestLeavesLinkUp()
    {
        Rig rig(false);
        rig.engine->modem_Change(QStringLiteral("I4"));
        rig.engine->ModemTest_Click();
        QCOMPARE(rig.line->lastWrite(), QByteArray("ATI4\r\n"));
        QVERIFY(rig.engine->modem.text.isEmpty());
        rig.line->deliver("OK\r");
        QCOMPARE(rig.engine->modem.text, QStringLiteral("I4OK\r\n"));
        rig.clock.advance(3000);
        QVERIFY(!rig.line->isOpen());
        QVERIFY(rig.globals.link_up);
        QVERIFY(!rig.engine->modem_test);
        QVERIFY(rig.engine->test3.isEmpty());
    }

    void baudRateRule_data()
    {
        QTest::addColumn<int>("index");
        QTest::addColumn<bool>("refused");
        QTest::addColumn<int>("factor");
        QTest::newRow("1200") << 3 << true << 1;
        QTest::newRow("14400 is too fast, same title") << 7 << true << 1;
        QTest::newRow("2400") << 4 << false << 4;
        QTest::newRow("4800") << 5 << false << 2;
    }

    void baudRateRule()
    {
        QFETCH(int, index);
        QFETCH(bool, refused);
        QFETCH(int, factor);
        Rig rig;
        rig.engine->cboSpeed_Click(index);
        QCOMPARE(rig.op.titles(), refused ? QStringList{"Baud Rate to Slow"} : QStringList{});
        QCOMPARE(rig.engine->cboSpeed.value.toInt(), refused ? 6 : index);
        QCOMPARE(rig.globals.speed_factor, factor);
        if (refused)
            QCOMPARE(rig.settings.value("Settings").toString(), QStringLiteral("9600,n,8,1"));
    }

    void connectionTypeRefusedWithPortOpen()
    {
        Rig rig;
        rig.engine->Command3_Click();
        rig.engine->Option2_Click(0);
        QCOMPARE(rig.op.titles(), QStringList{"Port Open"});
        QVERIFY(rig.engine->Option2[1].value.toBool());
        QVERIFY(rig.engine->Frame9.enabled && !rig.engine->Frame8.enabled);
        QCOMPARE(rig.globals.reply_wait_ms, 4000);
        rig.engine->Command6_Click();
        rig.engine->Option2_Click(0);
        QVERIFY(rig.engine->Frame8.enabled && rig.engine->FrameDial.visible);
        QCOMPARE(rig.globals.reply_wait_ms, 7000);
    }

    void openFailureNamesTheReason()
    {
        Rig rig;
        const QString reason = QStringLiteral("Permission denied on /dev/ttyUSB0: add your user to the "
                                              "dialout group");
        rig.line->failNextOpen(reason);
        rig.engine->Command3_Click();
        QCOMPARE(rig.op.last().title, QStringLiteral("Invalid Port"));
        QCOMPARE(rig.op.last().lines.last(), reason);
        QVERIFY(!rig.globals.link_up);
        QVERIFY(rig.line->writes().isEmpty());
    }

    void portChangeMakesNewLine()
    {
        Rig rig;
        rig.engine->Command3_Click();
        FakeLine* first = rig.line;
        rig.engine->cboPort_Change(QStringLiteral("127.0.0.1:4001"));
        rig.engine->cmdOK_Click();
        QVERIFY(rig.line != first);
        QCOMPARE(rig.line->portName(), QStringLiteral("127.0.0.1:4001"));
        QVERIFY(rig.line->isOpen());
        QVERIFY(rig.globals.link_up);
        QCOMPARE(rig.settings.value("CommPort").toString(), QStringLiteral("127.0.0.1:4001"));
    }

    void settingsLiveInTheInstrumentsInfoRows()
    {
        QTemporaryDir dir;
        std::unique_ptr<Store> store = Store::create(dir.filePath("t-12.db"), 1);
        QVERIFY(store);
        std::unique_ptr<Recordset> info =
            infoTable(*store, {"", "", "4800,e,7,2", "/dev/ttyACM3", "1", "7", "&C1", "2"});
        QVERIFY(info);

        Rig rig(false);
        rig.engine->setInstrument("12", "555", info.get());
        rig.engine->LoadPropertySettings();
        QCOMPARE(rig.engine->CommPort(), QStringLiteral("/dev/ttyACM3"));
        QCOMPARE(rig.line->settings().toText(), QStringLiteral("4800,e,7,2"));
        QCOMPARE(rig.line->handshaking(), Handshaking::Rts);
        QCOMPARE(rig.globals.speed_factor, 2);
        QVERIFY(rig.engine->Option2[1].value.toBool());
        // Row 5 holds neither 0 nor 1: the default goes back into the file.
        QVERIFY(rig.engine->DialTone[0].value.toBool());
        QCOMPARE(info->cell(5, 41).toInt(), 0);
        QCOMPARE(rig.engine->modem.text, QStringLiteral("&C1"));

        rig.engine->cboParity_Click(rig.engine->cboParityItems.indexOf("None"));
        rig.engine->cboDataBits_Click(rig.engine->cboDataBitsItems.indexOf("8"));
        rig.engine->cboStopBits_Click(0);
        rig.engine->optFlow_Click(0);
        rig.engine->cmdOK_Click();
        QCOMPARE(info->cell(2, 41).toString(), QStringLiteral("4800,n,8,1"));
        QCOMPARE(info->cell(7, 41).toInt(), 0);
        QCOMPARE(rig.settings.value("Settings").toString(), QStringLiteral("4800,n,8,1"));
        QCOMPARE(rig.line->settings().toText(), QStringLiteral("4800,n,8,1"));
    }

    void newInstrumentGetsTheDefaults_data()
    {
        QTest::addColumn<QStringList>("stored"); // rows 0 to 7 of field 41
        QTest::newRow("empty rows") << QStringList{"", "", "", "", "", "", "", ""};
        QTest::newRow("unreadable rows") << QStringList{"", "", "fast", "", "2", "x", "", "9"};
    }

    void newInstrumentGetsTheDefaults()
    {
        QFETCH(QStringList, stored);
        QTemporaryDir dir;
        std::unique_ptr<Store> store = Store::create(dir.filePath("t-13.db"), 1);
        QVERIFY(store);
        std::unique_ptr<Recordset> info = infoTable(*store, stored);
        QVERIFY(info);

        // Another instrument was used last, on other settings.
        Rig rig(true);
        rig.engine->cboPort_Change(QStringLiteral("/dev/ttyACM3"));
        rig.engine->cboSpeed_Click(4);
        rig.engine->optFlow_Click(2);
        rig.engine->cmdOK_Click();
        rig.engine->setInstrument("13", "555", info.get());
        rig.engine->LoadPropertySettings();

        // 9600,n,8,1, modem, waiting for the dial tone, no flow control; written back.
        QCOMPARE(rig.line->settings().toText(), QStringLiteral("9600,n,8,1"));
        QCOMPARE(info->cell(2, 41).toString(), QStringLiteral("9600,n,8,1"));
        QCOMPARE(info->cell(4, 41).toString(), QStringLiteral("0"));
        QCOMPARE(info->cell(5, 41).toString(), QStringLiteral("0"));
        QCOMPARE(info->cell(7, 41).toString(), QStringLiteral("0"));
        QCOMPARE(rig.line->handshaking(), Handshaking::None);
        QVERIFY(rig.engine->Option2[0].value.toBool());
        QVERIFY(rig.engine->CommPort() != QStringLiteral("/dev/ttyACM3"));
        QCOMPARE(info->cell(3, 41).toString(), rig.engine->CommPort());
    }

    void modemResultHangsUp_data()
    {
        QTest::addColumn<bool>("online");
        QTest::addColumn<QByteArray>("reply");
        QTest::addColumn<QStringList>("message"); // title, then the lines
        QTest::addColumn<QByteArray>("hangUp");
        QTest::addColumn<bool>("dialled");
        QTest::newRow("no dial tone")
            << false << QByteArray("\r\nNO DIALTONE\r\n")
            << QStringList{"No Dial Tone", "There was no dial tone detected.",
                           "Make sure the phone line is connected"}
            << QByteArray("ATH0\r\n") << true;
        QTest::newRow("no carrier while dialling")
            << false << QByteArray("\r\nNO CARRIER\r\n")
            << QStringList{"Busy", "No carrier signal.", "Check the modem at the other end."}
            << QByteArray() << false;
        QTest::newRow("carrier lost on line")
            << true << QByteArray("NO CARRIER\r\n")
            << QStringList{"Busy", "No carrier signal.", "Check the modem at the other end."}
            << QByteArray() << false;
    }

    void modemResultHangsUp()
    {
        QFETCH(bool, online);
        QFETCH(QByteArray, reply);
        QFETCH(QStringList, message);
        QFETCH(QByteArray, hangUp);
        QFETCH(bool, dialled);
        Rig rig(false);
        if (online)
            rig.dialAndConnect();
        else
            rig.engine->dial_num_Click();
        rig.line->clearWrites();
        rig.line->deliver(reply);
        QCOMPARE(rig.op.messages().size(), 1);
        QCOMPARE(QStringList{rig.op.last().title} + rig.op.last().lines, message);
        // "dialled" cleared first: the hang-up then sends nothing to the modem.
        QCOMPARE(rig.line->written(), hangUp);
        QCOMPARE(rig.engine->dialled, dialled);
        QVERIFY(!rig.line->isOpen());
        QVERIFY(!rig.globals.link_up);
        QCOMPARE(rig.engine->Text3[3].text, QStringLiteral("Port Closed"));
        QVERIFY(rig.engine->dial_num.enabled && !rig.engine->cancel_dial.enabled);
        QVERIFY(rig.engine->test3.isEmpty());
        QVERIFY(!rig.engine->Timer1.Enabled());
    }

    void silenceAfterDial_data()
    {
        QTest::addColumn<bool>("direct");
        QTest::addColumn<int>("waitMs");
        QTest::addColumn<QStringList>("message");
        const QString second = QStringLiteral("Check that it is turned on and the cables are properly connected");
        QTest::newRow("modem") << false << 50000
                               << QStringList{"No Modem", "The modem has not responded", second};
        QTest::newRow("direct") << true << 30000
                                << QStringList{"No Glacinor", "The Glacinor has not responded", second};
    }

    void silenceAfterDial()
    {
        QFETCH(bool, direct);
        QFETCH(int, waitMs);
        QFETCH(QStringList, message);
        Rig rig(direct);
        rig.engine->dial_num_Click();
        rig.clock.advance(waitMs - 1);
        QVERIFY(rig.op.messages().isEmpty());
        rig.clock.advance(1);
        QCOMPARE(rig.op.messages().size(), 1);
        QCOMPARE(QStringList{rig.op.last().title} + rig.op.last().lines, message);
        QVERIFY(!rig.line->isOpen());
        QCOMPARE(rig.engine->Text3[3].text, QStringLiteral("Port Closed"));

        // Any arrival ends the wait.
        rig.op.clear();
        rig.engine->dial_num_Click();
        rig.line->deliver("\r\n");
        rig.clock.advance(waitMs * 2);
        QVERIFY(rig.op.messages().isEmpty());
        QVERIFY(rig.line->isOpen());
    }

    void badIdentityHangsUpTheCall()
    {
        Rig rig(false);
        rig.dialAndConnect();
        rig.clock.advance(2000);
        rig.line->clearWrites();
        rig.line->deliver(identity("9.6", "00013"));
        QCOMPARE(rig.op.titles(), QStringList{"Wrong ID"});
        // cancel_dial_Click with the modem on line: escape, then hang up.
        QCOMPARE(rig.line->written(), QByteArray("+++ATH0\r\n"));
        QVERIFY(!rig.globals.modem_online);
        QVERIFY(!rig.line->isOpen());
        QCOMPARE(rig.engine->Text3[3].text, QStringLiteral("Port Closed"));
        QVERIFY(!rig.engine->Timer4.Enabled());
        rig.clock.advance(60000);
        QCOMPARE(rig.op.messages().size(), 1);
    }

    void lostLineEndsTheLinkOnly_data()
    {
        QTest::addColumn<bool>("direct");
        QTest::newRow("direct") << true;
        QTest::newRow("modem") << false;
    }

    void lostLineEndsTheLinkOnly()
    {
        QFETCH(bool, direct);
        Rig rig(direct);
        const auto connectAndIdentify = [&] {
            if (direct) {
                rig.engine->Command3_Click();
            } else {
                rig.dialAndConnect();
                rig.clock.advance(2000);
            }
            rig.line->deliver(identity("9.6", "00012"));
        };
        connectAndIdentify();
        QVERIFY(rig.globals.link_up);
        rig.line->close(); // the device went away, and the line says so
        rig.line->raiseEvent(Line::LineLost);
        QCOMPARE(rig.op.titles(), QStringList{"Click Cancel to quit, OK to ignore."});
        QVERIFY(!rig.globals.link_up);
        QVERIFY(!rig.globals.modem_online);
        QCOMPARE(rig.engine->Text3[direct ? 2 : 3].text, QStringLiteral("Port Closed"));
        QVERIFY(direct ? rig.engine->Command3.enabled : rig.engine->dial_num.enabled);

        // Nothing of it stays behind: the next link comes up and stays up.
        rig.op.clear();
        connectAndIdentify();
        rig.line->deliver("status");
        QCOMPARE(rig.op.titles(), QStringList{});
        QVERIFY(rig.line->isOpen());
        QVERIFY(rig.globals.link_up);
        QCOMPARE(rig.engine->Text3[4].text, QStringLiteral("ID No. 12"));
    }
};

QTEST_GUILESS_MAIN(TestCcForm1Connection)
#include "tst_ccform1_connection.moc"
