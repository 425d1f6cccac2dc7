#include "ccform1_rig.h"
#include "link/commands.h"

// What arrives: the dispatcher's routing and order, the line filter, the
// identity check and the line's events.
class TestCcForm1Dispatch : public QObject {
    Q_OBJECT

    struct Outcome {
        QStringList calls, said;
        bool cleared = false;
        bool operator==(const Outcome&) const = default;
    };
    static Outcome deliver(const QByteArray& reply, int open, const QString& version = "9.6")
    {
        Rig rig;
        rig.open(open);
        rig.globals.instrument_version = version;
        rig.line->deliver(reply);
        Outcome o{rig.views.calls, {}, rig.engine->test3.isEmpty()};
        for (const Operator::Message& m : rig.op.messages())
            o.said << m.title + ": " + m.lines.value(0);
        return o;
    }
    static constexpr int All = Channels | History | Power | Status | StatusP | Alarm | Front | Brumalet;

private slots:
    void dispatch_data()
    {
        QTest::addColumn<QByteArray>("reply");
        QTest::addColumn<int>("open");
        QTest::addColumn<QString>("version");
        QTest::addColumn<QStringList>("calls");
        QTest::addColumn<QStringList>("said"); // "title: first line" of each message
        QTest::addColumn<bool>("cleared");
        const QStringList none;
        const auto row = [](const char* name, const QByteArray& reply, int open, const QString& version,
                            const QStringList& calls, const QStringList& said, bool cleared) {
            QTest::newRow(name) << reply << open << version << calls << said << cleared;
        };
        // Routing by the open views.
        row("sret, no view: no hit, text stays", "1,2,sret", 0, "9.6", none, none, false);
        row("sret to load shed", "1,2,sret", LoadShed, "9.6", {"frmloadshed.ret_handel"}, none, true);
        row("sret to channels first", "1,2,sret", Channels | LoadShed, "9.6", {"channels.ret_handel"}, none, true);
        row("status to frmstatus first", "status", Status | StatusG | MultiProbes, "9.6", {"frmstatus.status_do"},
            none, true);
        row("status: statusg before multiprobes", "  1  2status", StatusG | MultiProbes, "9.6",
            {"frmstatusg.status_do"}, none, true);
        row("status: no view, dropped", "status", 0, "9.6", none, none, true);
        row("presss to statuspg", "presss", StatusPG, "9.6", {"frmstatuspg.statuspg_do"}, none, true);
        row("histy with view closed is dropped", "x histy", 0, "9.6", none, none, true);
        row("tempfront with front closed stays", "tempfront", 0, "9.6", none, none, false);
        row("dxstart with brumalet closed stays", "dxstart", 0, "9.6", none, none, false);
        row("torvan below version 8 dropped", "torvan", StatusP, "7.9", none, none, true);
        row("torvan at 8", "torvan", StatusP, " 8", {"frmstatusp.statuspa_do"}, none, true);
        row("no token: text waits", "Glacino", Status, "9.6", none, none, false);
        // Each token's own text, with every view open.
        row("NO DIALTONE", "NO DIALTONE", All, "9.6", none, {"No Dial Tone: There was no dial tone detected."}, true);
        row("BUSY", "BUSY", All, "9.6", none, {"Busy: The number dialed is busy."}, true);
        row("NO CARRIER", "NO CARRIER", All, "9.6", none, {"Busy: No carrier signal."}, true);
        row("Glacinor", "Glacinor", All, "9.6", none,
            {"Invalid Version Number: The Glacinor Version Number is invalid,"}, true);
        row("schanupload", "schanupload", All, "9.6", {"channels.sin_chan_up_load"}, none, true);
        row("downcheck", "downcheck", All, "9.6", {"channels.down_check"}, none, true);
        row("donedown", "donedown", All, "9.6", {"channels.done_down"}, none, true);
        row("AT&FE0", "AT&FE0", All, "9.6", {"MDIForm1.Toolbar1", "channels.Timer5", "MDIForm1.unload upload"},
            {"No Response: The Glacinor did not respond or was reset."}, true);
        row("dlres", "dlres", All, "9.6", {"frmhistory.Timer3"}, {"Data Log Reset: The Data Log has been reset"},
            true);
        row("plres", "plres", All, "9.6", {"frmpower.Timer3"},
            {"Data Log Reset: The Power Used Data Log has been reset"}, true);
        row("power", "power", All, "9.6", {"frmpower.power_do"}, none, true);
        row("presss", "presss", All | StatusPG, "9.6", {"frmstatusp.statusp_do"}, none, true);
        row("realarms", "realarms", All, "9.6", {"frmalarm.Timer2"},
            {"Alarm Log Reset: The Alarm or Alarms have been reset"}, true);
        row("noalarms", "noalarms", All, "9.6", {"frmalarm.Timer2"},
            {"No Alarms: There were no alarms logged to reset"}, true);
        row("almlog gets the filtered text", "alm-new\ralmlog", All, "9.6", {"frmalarm.alarm_do:alm-new\r\nalmlog"},
            none, true);
        row("nocomp", "nocomp", All, "9.6", none,
            {"Glacinor Invaild: The Glacinor is not configured for computer communications,"}, true);
        row("tempfront", "tempfront", All, "9.6", {"frmfront.Front_do"}, none, true);
        row("dxstart", "dxstart", All, "9.6", {"frmbrumalet.start_do"}, none, true);
        row("evapfrst", "evapfrst", All, "9.6", {"frmbrumalet.status_do"}, none, true);
        // Orders the operator meets: the earlier token wins wherever it stands.
        row("NO DIALTONE before BUSY", "BUSY NO DIALTONE", All, "9.6", none,
            {"No Dial Tone: There was no dial tone detected."}, true);
        row("BUSY before NO CARRIER", "NO CARRIER BUSY", All, "9.6", none, {"Busy: The number dialed is busy."},
            true);
        row("almlog before alm-new", "alm-new almlog", All, "9.6", {"frmalarm.alarm_do:alm-new almlog"}, none, true);
    }
    void dispatch()
    {
        QFETCH(QByteArray, reply);
        QFETCH(int, open);
        QFETCH(QString, version);
        QFETCH(QStringList, calls);
        QFETCH(QStringList, said);
        QFETCH(bool, cleared);
        const Outcome o = deliver(reply, open, version);
        QCOMPARE(o.calls, calls);
        QCOMPARE(o.said, said);
        QCOMPARE(o.cleared, cleared);
    }

    // The dispatcher follows its table: a text holding two neighbours goes
    // where the earlier one alone would go.
    void dispatchFollowsTheTableOrder()
    {
        const QList<commands::Token> order = ccForm1_engine::dispatchOrder();
        QCOMPARE(QSet<commands::Token>(order.cbegin(), order.cend()).size(), order.size());
        int compared = 0;
        for (qsizetype i = 0; i + 1 < order.size(); ++i) {
            const QByteArray first = QByteArray(commands::tokenText(order[i]).data());
            const QByteArray next = QByteArray(commands::tokenText(order[i + 1]).data());
            Outcome alone = deliver(first, All);
            if (!alone.cleared && alone.said.isEmpty())
                continue; // a guard that does not hold here (CONNECT on a direct line)
            Outcome both = deliver(next + " " + first, All);
            // The handler is the same; the text it is handed holds both.
            for (QString& c : both.calls)
                c = c.section(QLatin1Char(':'), 0, 0);
            for (QString& c : alone.calls)
                c = c.section(QLatin1Char(':'), 0, 0);
            QVERIFY2(both == alone, first + " before " + next);
            ++compared;
        }
        QVERIFY(compared >= order.size() - 3);
    }

    void busyWinsOverConnect()
    {
        Rig rig(false);
        rig.engine->dial_num_Click();
        rig.line->deliver("CONNECT\r\nBUSY\r\n");
        QCOMPARE(rig.op.titles(), QStringList{"Busy"});
        QVERIFY(!rig.globals.modem_online);
        QVERIFY(rig.engine->Timer2.Enabled());
        QVERIFY(!rig.engine->Timer9.Enabled());
    }

    void connectFallsThroughWithoutModemPort()
    {
        Rig rig(false);
        rig.line->deliver("CONNECT 9600");
        QVERIFY(!rig.engine->Timer9.Enabled());
        QVERIFY(!rig.globals.modem_online);
        QCOMPARE(rig.engine->test3, QStringLiteral("CONNECT 9600"));
    }

    void filter_data()
    {
        QTest::addColumn<QString>("box");
        QTest::addColumn<QByteArray>("data");
        QTest::addColumn<QString>("expected");
        QTest::newRow("leading backspace replaces the box's last") << "abc" << QByteArray("\bX") << "abX";
        QTest::newRow("inner backspace takes the one before") << "abc" << QByteArray("d\be") << "abce";
        QTest::newRow("two leading backspaces take one") << "abc" << QByteArray("\b\bZ") << "abZ";
        QTest::newRow("line feeds go, CR gets LF") << "" << QByteArray("a\n\rb\r\n") << "a\r\nb\r\n";
        QTest::newRow("backspace on an empty box") << "" << QByteArray("\bq") << "q";
    }
    void filter()
    {
        QFETCH(QString, box);
        QFETCH(QByteArray, data);
        QFETCH(QString, expected);
        Rig rig;
        rig.engine->show_received(box, QString::fromLatin1(data));
        QCOMPARE(box, expected);
    }

    void trimBeforeNextArrival_data()
    {
        QTest::addColumn<int>("held");
        QTest::addColumn<int>("kept");
        QTest::newRow("16001 keeps its last 11905") << 16001 << 11905;
        QTest::newRow("16000 is kept whole") << 16000 << 16000;
    }
    void trimBeforeNextArrival()
    {
        QFETCH(int, held);
        QFETCH(int, kept);
        Rig rig;
        QString filler;
        for (int i = 0; i < held; ++i)
            filler += QChar('a' + i % 7);
        rig.engine->test3 = filler;
        rig.line->deliver("#");
        QCOMPARE(rig.engine->test3, filler.right(kept) + "#");
    }

    void identityCheck_data()
    {
        QTest::addColumn<QByteArray>("reply");
        QTest::addColumn<QString>("title");
        QTest::newRow("00012 matches 12") << "ZZZZCONNECTK\x04" + identity("9.6", "00012") << "";
        QTest::newRow("other ID") << identity("9.6", "00013") << "Wrong ID";
        QTest::newRow("version not numeric") << identity("V9x", "00012") << "Invalid Version Number";
        QTest::newRow("ID not numeric") << identity("14", "0001A") << "Invalid ID Number";
    }
    void identityCheck()
    {
        QFETCH(QByteArray, reply);
        QFETCH(QString, title);
        Rig rig;
        rig.engine->Command3_Click();
        rig.line->deliverInBatches(reply, 5);
        QVERIFY(rig.engine->test3.isEmpty());
        QVERIFY(!rig.engine->connecting && !rig.engine->Timer8.Enabled());
        QCOMPARE(rig.op.titles(), title.isEmpty() ? QStringList{} : QStringList{title});
        QCOMPARE(rig.line->isOpen(), title.isEmpty());
        QCOMPARE(rig.engine->Command6.enabled, title.isEmpty());
        if (title.isEmpty()) {
            QCOMPARE(rig.engine->version.text, QStringLiteral("9.6    "));
            QCOMPARE(rig.engine->resets.text, QStringLiteral("00003"));
            QCOMPARE(rig.globals.instrument_version, QStringLiteral("9.6"));
        } else {
            QVERIFY(!rig.globals.link_up);
            QCOMPARE(rig.engine->Text3[2].text, QStringLiteral("Port Closed"));
        }
    }

    void newAlarm_data()
    {
        QTest::addColumn<int>("open");
        QTest::addColumn<bool>("cycle");
        QTest::addColumn<QStringList>("calls");
        QTest::addColumn<QStringList>("titles");
        const QStringList opened{"MDIForm1.mnualarmon_Click", "frmalarm.uploadnew_Click"};
        QTest::newRow("status cycle running holds it back") << int(Status) << true << QStringList{}
                                                            << QStringList{"Alarm Active"};
        QTest::newRow("status stopped opens the alarm view") << int(Status) << false << opened << QStringList{};
        QTest::newRow("graphic cycle does not hold it back") << int(StatusG) << true << opened << QStringList{};
        QTest::newRow("alarm view open is maximised")
            << int(Alarm) << false << QStringList{"frmalarm.showMaximised", "frmalarm.uploadnew_Click"}
            << QStringList{};
    }
    void newAlarm()
    {
        QFETCH(int, open);
        QFETCH(bool, cycle);
        QFETCH(QStringList, calls);
        QFETCH(QStringList, titles);
        Rig rig;
        rig.open(open);
        rig.views.status.cycleRunning = rig.views.statusg.cycleRunning = cycle;
        rig.line->deliver("alm-new");
        QCOMPARE(rig.views.calls, calls);
        QCOMPARE(rig.op.titles(), titles);
    }

    void lineEvents_data()
    {
        QTest::addColumn<int>("code");
        QTest::addColumn<QString>("status"); // the status panel afterwards
        QTest::addColumn<bool>("closes");    // the comms error path with the same text
        QTest::newRow("3") << 3 << "Status: Change in CTS Detected" << false;
        QTest::newRow("6") << 6 << "Status: The Phone is Ringing" << false;
        QTest::newRow("1 send") << 1 << "Status: " << false;
        QTest::newRow("1009 parity") << 1009 << "Status: " << false;
        QTest::newRow("1002") << 1002 << "Status: CTS Timeout" << true;
        QTest::newRow("1007") << 1007 << "Status: Carrier Detect Timeout" << true;
        QTest::newRow("1011") << 1011 << "Status: Error retrieving DCB" << true;
        QTest::newRow("1005 unknown") << 1005 << "Status: Unknown error or event" << true;
    }
    void lineEvents()
    {
        QFETCH(int, code);
        QFETCH(QString, status);
        QFETCH(bool, closes);
        Rig rig;
        rig.engine->Command3_Click();
        rig.line->raiseEvent(code);
        QCOMPARE(rig.engine->sbrStatus[1].text, status);
        QCOMPARE(rig.line->isOpen(), !closes);
        QCOMPARE(rig.globals.link_up, !closes);
        QCOMPARE(rig.op.messages().isEmpty(), !closes);
        if (closes)
            QCOMPARE(rig.op.last().lines, (QStringList{status.mid(8), QStringLiteral("Check communication setup")}));
    }

    void eventMessageHidesErrors()
    {
        Rig rig;
        rig.engine->Command3_Click();
        rig.line->raiseEvent(Line::CdChanged);
        rig.line->raiseEvent(Line::CtsTimeout);
        QVERIFY(rig.op.messages().isEmpty());
        QCOMPARE(rig.engine->sbrStatus[1].text, QStringLiteral("Status: Change in CD Detected"));
        rig.clock.advance(2000);
        QCOMPARE(rig.engine->sbrStatus[1].text, QStringLiteral("Status: "));
        rig.line->deliver("x");
        QCOMPARE(rig.engine->sbrStatus[1].text, QStringLiteral("Status: Change in CD Detected"));
        QVERIFY(rig.line->isOpen());
    }

    void commsErrorSameStateForBothAnswers_data()
    {
        QTest::addColumn<int>("answer");
        QTest::newRow("OK") << int(Operator::Answer::Ok);
        QTest::newRow("Cancel") << int(Operator::Answer::Cancel);
    }
    void commsErrorSameStateForBothAnswers()
    {
        QFETCH(int, answer);
        Rig rig;
        rig.op.queueAnswer(Operator::Answer(answer));
        rig.engine->Command3_Click();
        rig.line->raiseEvent(Line::TransmitFull);
        QCOMPARE(rig.op.last().title, QStringLiteral("Click Cancel to quit, OK to ignore."));
        QCOMPARE(rig.op.last().lines, (QStringList{"Transmit Buffer Full", "Check communication setup"}));
        QCOMPARE(rig.engine->Text3[2].text, QStringLiteral("Port Closed"));
        QVERIFY(rig.engine->Command3.enabled && !rig.engine->Command6.enabled && rig.engine->comm_fault);
        QVERIFY(!rig.line->isOpen() && !rig.globals.link_up);
        QCOMPARE(rig.op.beeps(), 1);
        // The slot is never emptied: the next connect's first arrival closes again.
        rig.engine->Command3_Click();
        rig.line->deliver("noise");
        QCOMPARE(rig.op.messages().size(), 2);
        QVERIFY(!rig.line->isOpen());
    }
};

QTEST_GUILESS_MAIN(TestCcForm1Dispatch)
#include "tst_ccform1_dispatch.moc"
