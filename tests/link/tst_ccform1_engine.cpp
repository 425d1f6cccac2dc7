#include "link/ccform1_engine.h"
#include "link/commands.h"
#include "platform/fake_line.h"
#include "platform/manual_clock.h"
#include "platform/store.h"

#include <QTemporaryDir>

#include <QtTest>

namespace {

// A view double that plays any role and logs "<form>.<procedure>". Each
// view gets its own, so a reply given to the wrong view shows in the log.
struct Double : ChannelsView, HistoryView, PowerView, TemperatureStatusView, PressureStatusView,
                PressureGraphicView, AlarmView, FrontView, BrumaletView, ShellView {
    QStringList* log = nullptr;
    QString form;
    bool cycleRunning = false;
    OpenViews* table = nullptr;
    void rec(const QString& what) { *log << form + QLatin1Char('.') + what; }
    void ret_handel() override { rec("ret_handel"); }
    void sin_chan_up_load() override { rec("sin_chan_up_load"); }
    void down_check() override { rec("down_check"); }
    void done_down() override { rec("done_down"); }
    void stopTimer5() override { rec("Timer5"); }
    void stopTimer3() override { rec("Timer3"); }
    void history_do() override { rec("history_do"); }
    void power_do() override { rec("power_do"); }
    bool stopstatusEnabled() const override { return cycleRunning; }
    void stopstatus_Click() override { rec("stopstatus_Click"); }
    void status_do() override { rec("status_do"); }
    void statusp_do() override { rec("statusp_do"); }
    void statuspa_do() override { rec("statuspa_do"); }
    void statuspg_do() override { rec("statuspg_do"); }
    void alarm_do(const QString& d) override { rec("alarm_do:" + d); }
    void uploadnew_Click() override { rec("uploadnew_Click"); }
    void stopTimer2() override { rec("Timer2"); }
    void showMaximised() override { rec("showMaximised"); }
    void Front_do(const QString&) override { rec("Front_do"); }
    void start_do(const QString&) override { rec("start_do"); }
    void status_do(const QString&) override { rec("status_do"); }
    void mnualarmon_Click() override
    {
        rec("mnualarmon_Click");
        table->alarm_open = true;
    }
    void mnualloff_Click() override { rec("mnualloff_Click"); }
    void setToolbarEnabled(bool) override { rec("Toolbar1"); }
    void unloadUploadProgress() override { rec("unload upload"); }
};

struct Views {
    QStringList calls;
    Double channels, loadshed, history, power, status, statusg, multiprobes, statusp, statuspg,
        alarm, front, brumalet, shell;

    void plugInto(OpenViews& t)
    {
        const std::pair<Double*, const char*> forms[] = {
            {&channels, "channels"},       {&loadshed, "frmloadshed"}, {&history, "frmhistory"},
            {&power, "frmpower"},          {&status, "frmstatus"},     {&statusg, "frmstatusg"},
            {&multiprobes, "frmmultiprobes"}, {&statusp, "frmstatusp"}, {&statuspg, "frmstatuspg"},
            {&alarm, "frmalarm"},          {&front, "frmfront"},       {&brumalet, "frmbrumalet"},
            {&shell, "MDIForm1"}};
        for (const auto& [d, form] : forms) {
            d->log = &calls;
            d->form = QString::fromLatin1(form);
            d->table = &t;
        }
        t.channels = &channels;
        t.loadshed = static_cast<ChannelsView*>(&loadshed);
        t.history = &history;
        t.power = &power;
        t.status = &status;
        t.statusg = &statusg;
        t.multiprobes = &multiprobes;
        t.statusp = &statusp;
        t.statuspg = &statuspg;
        t.alarm = &alarm;
        t.front = &front;
        t.brumalet = &brumalet;
        t.shell = &shell;
    }
};

// An info table of an instrument's store with field 41 holding the given rows.
std::unique_ptr<Recordset> infoTable(Store& store, const QStringList& field41)
{
    QList<Store::Column> columns;
    for (int c = 0; c < 42; ++c)
        columns.append({QStringLiteral("f%1").arg(c), Store::ColumnType::Text});
    if (!store.createTable("info", columns))
        return nullptr;
    std::unique_ptr<Recordset> info = store.openRecordset("info");
    for (const QString& v : field41)
        if (!info->AddNew() || !info->setValue(41, v.isEmpty() ? QVariant() : QVariant(v))
            || !info->Update())
            return nullptr;
    return info;
}

// Flags of the open views, for data rows.
enum Open {
    History = 1, Alarm = 2, Status = 4, Channels = 8, StatusP = 16, Power = 32, LoadShed = 64,
    StatusG = 128, StatusPG = 256, Front = 512, Brumalet = 1024, MultiProbes = 2048,
};

struct Rig {
    ManualClock clock;
    ScriptedOperator op;
    MemorySettings settings;
    OpenViews table;
    LinkGlobals globals;
    Views views;
    FakeLine* line = nullptr;
    int linesMade = 0;
    std::unique_ptr<ccForm1_engine> engine;

    explicit Rig(bool direct = true)
    {
        views.plugInto(table);
        engine = std::make_unique<ccForm1_engine>(
            clock, op, settings, table, globals, [this](const QString& name) {
                auto l = std::make_unique<FakeLine>();
                l->setPortName(name);
                line = l.get();
                ++linesMade;
                return std::unique_ptr<Line>(std::move(l));
            });
        engine->setInstrument(QStringLiteral("12"), QStringLiteral("5551234"), nullptr);
        engine->Option2_Click(direct ? 1 : 0);
    }
    void open(int mask)
    {
        table.history_open = mask & History;
        table.alarm_open = mask & Alarm;
        table.status_open = mask & Status;
        table.channels_open = mask & Channels;
        table.statusp_open = mask & StatusP;
        table.power_open = mask & Power;
        table.loadshed_open = mask & LoadShed;
        table.statusg_open = mask & StatusG;
        table.statuspg_open = mask & StatusPG;
        table.front_open = mask & Front;
        table.brumalet_open = mask & Brumalet;
        table.multiprobes_open = mask & MultiProbes;
    }
    // A modem call that the modem has answered with CONNECT.
    void dialAndConnect()
    {
        engine->dial_num_Click();
        line->deliver("\r\nCONNECT 9600\r\n");
    }
};

QByteArray identity(const QByteArray& version, const QByteArray& id)
{
    return version.leftJustified(7, ' ') + id + "00003" + "05/01/2026 08:00:00   " + "Glacinor";
}

} // namespace

class TestCcForm1Engine : public QObject {
    Q_OBJECT
private slots:
    void dispatch_data();
    void dispatch();
    void busyWinsOverConnect();
    void connectFallsThroughWithoutModemPort();
    void modemConnectSendsKThenWaitsForIdentity();
    void filter_data();
    void filter();
    void trimBeforeNextArrival_data();
    void trimBeforeNextArrival();
    void identityCheck_data();
    void identityCheck();
    void fiveTriesThenNoGlacinor();
    void resetIgnoredWhileConnecting();
    void resetOnEstablishedLine();
    void command6SendsNothing();
    void hangUpSleeps_data();
    void hangUpSleeps();
    void busyRedialsWithoutLimit();
    void silentInstrumentRedialsUnderTheMessage();
    void commsErrorSameStateForBothAnswers();
    void eventMessageHidesErrors();
    void modemTestLeavesLinkUp();
    void baudRateRule_data();
    void baudRateRule();
    void connectionTypeRefusedWithPortOpen();
    void newAlarm_data();
    void newAlarm();
    void openFailureNamesTheReason();
    void portChangeMakesNewLine();
    void settingsLiveInTheInstrumentsInfoRows();
    void newInstrumentGetsTheDefaults_data();
    void newInstrumentGetsTheDefaults();
    void modemResultHangsUp_data();
    void modemResultHangsUp();
    void silenceAfterDial_data();
    void silenceAfterDial();
    void lineEvents_data();
    void lineEvents();
    void badIdentityHangsUpTheCall_data();
    void badIdentityHangsUpTheCall();
    void lostLineEndsTheLinkOnly_data();
    void lostLineEndsTheLinkOnly();
};

void TestCcForm1Engine::dispatch_data()
{
    QTest::addColumn<QByteArray>("reply");
    QTest::addColumn<int>("open");
    QTest::addColumn<QString>("version");
    QTest::addColumn<QStringList>("calls");
    QTest::addColumn<QStringList>("said"); // "title: first line" of each message
    QTest::addColumn<bool>("cleared");
    const QStringList none;

    // Routing by the open views.
    QTest::newRow("sret, no view: no hit, text stays") << QByteArray("1,2,sret") << 0 << "9.6"
                                                        << none << none << false;
    QTest::newRow("sret to load shed") << QByteArray("1,2,sret") << int(LoadShed) << "9.6"
                                       << QStringList{"frmloadshed.ret_handel"} << none << true;
    QTest::newRow("sret to channels first")
        << QByteArray("1,2,sret") << int(Channels | LoadShed) << "9.6"
        << QStringList{"channels.ret_handel"} << none << true;
    QTest::newRow("status to frmstatus first")
        << QByteArray("status") << int(Status | StatusG | MultiProbes) << "9.6"
        << QStringList{"frmstatus.status_do"} << none << true;
    QTest::newRow("status: statusg before multiprobes")
        << QByteArray("  1  2status") << int(StatusG | MultiProbes) << "9.6"
        << QStringList{"frmstatusg.status_do"} << none << true;
    QTest::newRow("status to multiprobes") << QByteArray("status") << int(MultiProbes) << "9.6"
                                           << QStringList{"frmmultiprobes.status_do"} << none << true;
    QTest::newRow("status: no view, dropped") << QByteArray("status") << 0 << "9.6" << none << none
                                              << true;
    QTest::newRow("presss to statusp first") << QByteArray("presss") << int(StatusP | StatusPG)
                                             << "9.6" << QStringList{"frmstatusp.statusp_do"}
                                             << none << true;
    QTest::newRow("presss to statuspg") << QByteArray("presss") << int(StatusPG) << "9.6"
                                        << QStringList{"frmstatuspg.statuspg_do"} << none << true;
    QTest::newRow("histy with view closed is dropped") << QByteArray("x histy") << 0 << "9.6"
                                                       << none << none << true;
    QTest::newRow("tempfront with front closed stays") << QByteArray("tempfront") << 0 << "9.6"
                                                       << none << none << false;
    QTest::newRow("dxstart with brumalet closed stays") << QByteArray("dxstart") << 0 << "9.6"
                                                        << none << none << false;
    QTest::newRow("evapfrst to brumalet") << QByteArray("evapfrst") << int(Brumalet) << "9.6"
                                          << QStringList{"frmbrumalet.status_do"} << none << true;
    QTest::newRow("torvan below version 8 dropped") << QByteArray("torvan") << int(StatusP) << "7.9"
                                                    << none << none << true;
    QTest::newRow("torvan at 8") << QByteArray("torvan") << int(StatusP) << " 8"
                                 << QStringList{"frmstatusp.statuspa_do"} << none << true;
    QTest::newRow("no token: text waits") << QByteArray("Glacino") << int(Status) << "9.6" << none
                                          << none << false;

    // The order of the chain: each token beats the next one, wherever it stands.
    const int all = Channels | History | Power | Status | StatusP | Alarm | Front | Brumalet;
    const auto order = [&](const char* name, const QByteArray& reply, const QStringList& calls,
                           const QStringList& said) {
        QTest::newRow(name) << reply << all << "9.6" << calls << said << true;
    };
    order("NO DIALTONE before BUSY", "BUSY NO DIALTONE", none,
          {"No Dial Tone: There was no dial tone detected."});
    order("BUSY before NO CARRIER", "NO CARRIER BUSY", none, {"Busy: The number dialed is busy."});
    order("Glacinor before sret", "1,sret Glacinor", none,
          {"Invalid Version Number: The Glacinor Version Number is invalid,"});
    order("sret before schanupload", "schanupload sret", {"channels.ret_handel"}, none);
    order("schanupload before downcheck", "downcheck schanupload", {"channels.sin_chan_up_load"},
          none);
    order("downcheck before donedown", "donedown downcheck", {"channels.down_check"}, none);
    order("donedown before AT&FE0", "AT&FE0 donedown", {"channels.done_down"}, none);
    order("AT&FE0 before dlres", "dlres AT&FE0",
          {"MDIForm1.Toolbar1", "channels.Timer5", "MDIForm1.unload upload"},
          {"No Response: The Glacinor did not respond or was reset."});
    order("dlres before histy", "histy dlres", {"frmhistory.Timer3"},
          {"Data Log Reset: The Data Log has been reset"});
    order("histy before plres", "plres histy", {"frmhistory.history_do"}, none);
    order("plres before power", "power plres", {"frmpower.Timer3"},
          {"Data Log Reset: The Power Used Data Log has been reset"});
    order("power before status", "status power", {"frmpower.power_do"}, none);
    order("status before presss", "presss status", {"frmstatus.status_do"}, none);
    order("presss before torvan", "torvan presss", {"frmstatusp.statusp_do"}, none);
    order("torvan before realarms", "realarms torvan", {"frmstatusp.statuspa_do"}, none);
    order("realarms before noalarms", "noalarms realarms", {"frmalarm.Timer2"},
          {"Alarm Log Reset: The Alarm or Alarms have been reset"});
    order("noalarms before almlog", "almlog noalarms", {"frmalarm.Timer2"},
          {"No Alarms: There were no alarms logged to reset"});
    order("almlog before alm-new", "alm-new\ralmlog", {"frmalarm.alarm_do:alm-new\r\nalmlog"}, none);
    order("alm-new before nocomp", "nocomp alm-new", {"frmalarm.showMaximised", "frmalarm.uploadnew_Click"},
          none);
    order("nocomp before tempfront", "tempfront nocomp", none,
          {"Glacinor Invaild: The Glacinor is not configured for computer communications,"});
    order("tempfront before dxstart", "dxstart tempfront", {"frmfront.Front_do"}, none);
    order("dxstart before evapfrst", "evapfrst dxstart", {"frmbrumalet.start_do"}, none);
}

void TestCcForm1Engine::dispatch()
{
    QFETCH(QByteArray, reply);
    QFETCH(int, open);
    QFETCH(QString, version);
    QFETCH(QStringList, calls);
    QFETCH(QStringList, said);
    QFETCH(bool, cleared);
    Rig rig;
    rig.open(open);
    rig.globals.instrument_version = version;
    rig.line->deliver(reply);
    QCOMPARE(rig.views.calls, calls);
    QStringList shown;
    for (const Operator::Message& m : rig.op.messages())
        shown << m.title + ": " + m.lines.value(0);
    QCOMPARE(shown, said);
    QCOMPARE(rig.engine->test3.isEmpty(), cleared);
}

void TestCcForm1Engine::busyWinsOverConnect()
{
    Rig rig(false);
    rig.engine->dial_num_Click();
    rig.line->deliver("CONNECT\r\nBUSY\r\n");
    QCOMPARE(rig.op.titles(), QStringList{"Busy"});
    QVERIFY(!rig.globals.modem_online);
    QVERIFY(rig.engine->Timer2.Enabled());
    QVERIFY(!rig.engine->Timer9.Enabled());
}

void TestCcForm1Engine::connectFallsThroughWithoutModemPort()
{
    Rig rig(false);
    rig.line->deliver("CONNECT 9600");
    QVERIFY(!rig.engine->Timer9.Enabled());
    QVERIFY(!rig.globals.modem_online);
    QCOMPARE(rig.engine->test3, QStringLiteral("CONNECT 9600"));
}

void TestCcForm1Engine::modemConnectSendsKThenWaitsForIdentity()
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

void TestCcForm1Engine::filter_data()
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

void TestCcForm1Engine::filter()
{
    QFETCH(QString, box);
    QFETCH(QByteArray, data);
    QFETCH(QString, expected);
    Rig rig;
    rig.engine->show_received(box, QString::fromLatin1(data));
    QCOMPARE(box, expected);
}

void TestCcForm1Engine::trimBeforeNextArrival_data()
{
    QTest::addColumn<int>("held");
    QTest::addColumn<int>("kept");
    QTest::newRow("16001 keeps its last 11905") << 16001 << 11905;
    QTest::newRow("16000 is kept whole") << 16000 << 16000;
}

void TestCcForm1Engine::trimBeforeNextArrival()
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

void TestCcForm1Engine::identityCheck_data()
{
    QTest::addColumn<QString>("selected");
    QTest::addColumn<QByteArray>("reply");
    QTest::addColumn<QString>("title");
    QTest::newRow("00012 matches 12") << "12" << "ZZZZCONNECTK\x04" + identity("9.6", "00012") << "";
    QTest::newRow("other ID") << "12" << identity("9.6", "00013") << "Wrong ID";
    QTest::newRow("version not numeric") << "12" << identity("V9x", "00012")
                                         << "Invalid Version Number";
    QTest::newRow("ID not numeric") << "12" << identity("14", "0001A") << "Invalid ID Number";
}

void TestCcForm1Engine::identityCheck()
{
    QFETCH(QString, selected);
    QFETCH(QByteArray, reply);
    QFETCH(QString, title);
    Rig rig;
    rig.engine->setInstrument(selected, QString(), nullptr);
    rig.engine->Command3_Click();
    rig.line->deliverInBatches(reply, 5);
    QVERIFY(rig.engine->test3.isEmpty());
    QVERIFY(!rig.engine->connecting);
    QVERIFY(!rig.engine->Timer8.Enabled());
    if (title.isEmpty()) {
        QVERIFY(rig.op.messages().isEmpty());
        QCOMPARE(rig.engine->version.text, QStringLiteral("9.6    "));
        QCOMPARE(rig.engine->resets.text, QStringLiteral("00003"));
        QCOMPARE(rig.globals.instrument_version, QStringLiteral("9.6"));
        QVERIFY(rig.line->isOpen());
        QVERIFY(rig.engine->Command6.enabled && !rig.engine->Command3.enabled);
    } else {
        QCOMPARE(rig.op.titles(), QStringList{title});
        QVERIFY(!rig.line->isOpen());
        QVERIFY(!rig.globals.link_up);
        QVERIFY(!rig.engine->Command6.enabled && rig.engine->Command3.enabled);
        QCOMPARE(rig.engine->Text3[2].text, QStringLiteral("Port Closed"));
    }
}

void TestCcForm1Engine::fiveTriesThenNoGlacinor()
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

void TestCcForm1Engine::resetIgnoredWhileConnecting()
{
    Rig rig;
    rig.engine->Command3_Click();
    rig.line->deliver("AT&FE0\r");
    QVERIFY(rig.op.messages().isEmpty());
    QVERIFY(rig.engine->Timer8.Enabled());
    QCOMPARE(rig.engine->test3, QStringLiteral("AT&FE0\r\n"));
}

void TestCcForm1Engine::resetOnEstablishedLine()
{
    Rig rig;
    rig.open(Channels);
    rig.engine->Command3_Click();
    rig.line->deliver(identity("9.6", "00012"));
    rig.line->deliver("AT&FE0\r");
    QCOMPARE(rig.op.titles(), QStringList{"No Response"});
    QCOMPARE(rig.views.calls,
             (QStringList{"MDIForm1.Toolbar1", "channels.Timer5", "MDIForm1.unload upload"}));
    QVERIFY(!rig.line->isOpen());
    QCOMPARE(rig.engine->Text3[2].text, QStringLiteral("Port Closed"));
    QCOMPARE(rig.engine->version.text, QStringLiteral("????"));
}

void TestCcForm1Engine::command6SendsNothing()
{
    Rig rig;
    rig.engine->Command3_Click();
    rig.line->clearWrites();
    rig.engine->Command6_Click();
    QVERIFY(rig.line->writes().isEmpty());
    QVERIFY(!rig.globals.link_up);
}

void TestCcForm1Engine::hangUpSleeps_data()
{
    QTest::addColumn<bool>("online");
    QTest::addColumn<int>("slept");
    QTest::addColumn<QByteArray>("sent");
    QTest::newRow("modem on line") << true << 2500 << QByteArray("+++ATH0\r\n");
    QTest::newRow("modem in command mode") << false << 200 << QByteArray("ATH0\r\n");
}

void TestCcForm1Engine::hangUpSleeps()
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

void TestCcForm1Engine::busyRedialsWithoutLimit()
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

void TestCcForm1Engine::silentInstrumentRedialsUnderTheMessage()
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

void TestCcForm1Engine::commsErrorSameStateForBothAnswers()
{
    auto run = [](Operator::Answer answer, ccForm1_engine*& out, Rig& rig) {
        rig.op.queueAnswer(answer);
        rig.engine->Command3_Click();
        rig.line->raiseEvent(Line::TransmitFull);
        out = rig.engine.get();
    };
    Rig a, b;
    ccForm1_engine *ea = nullptr, *eb = nullptr;
    run(Operator::Answer::Ok, ea, a);
    run(Operator::Answer::Cancel, eb, b);
    QCOMPARE(a.op.last().title, QStringLiteral("Click Cancel to quit, OK to ignore."));
    QCOMPARE(a.op.last().lines, (QStringList{"Transmit Buffer Full", "Check communication setup"}));
    for (ccForm1_engine* e : {ea, eb}) {
        QCOMPARE(e->Text3[2].text, QStringLiteral("Port Closed"));
        QVERIFY(e->Command3.enabled && !e->Command6.enabled);
        QVERIFY(e->comm_fault);
    }
    QVERIFY(!a.line->isOpen() && !b.line->isOpen());
    QCOMPARE(a.globals.link_up, b.globals.link_up);
    QCOMPARE(a.op.beeps(), 1);
    // The slot is never emptied: the next connect's first arrival closes again.
    a.engine->Command3_Click();
    a.line->deliver("noise");
    QCOMPARE(a.op.messages().size(), 2);
    QVERIFY(!a.line->isOpen());
}

void TestCcForm1Engine::eventMessageHidesErrors()
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

void TestCcForm1Engine::modemTestLeavesLinkUp()
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

void TestCcForm1Engine::baudRateRule_data()
{
    QTest::addColumn<int>("index");
    QTest::addColumn<bool>("refused");
    QTest::addColumn<int>("factor");
    QTest::newRow("1200") << 3 << true << 1;
    QTest::newRow("14400 is too fast, same title") << 7 << true << 1;
    QTest::newRow("2400") << 4 << false << 4;
    QTest::newRow("4800") << 5 << false << 2;
    QTest::newRow("9600") << 6 << false << 1;
}

void TestCcForm1Engine::baudRateRule()
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

void TestCcForm1Engine::connectionTypeRefusedWithPortOpen()
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

void TestCcForm1Engine::newAlarm_data()
{
    QTest::addColumn<int>("open");
    QTest::addColumn<bool>("cycle");
    QTest::addColumn<QStringList>("calls");
    QTest::addColumn<QStringList>("titles");
    QTest::newRow("status cycle running holds it back")
        << int(Status) << true << QStringList{} << QStringList{"Alarm Active"};
    QTest::newRow("status stopped opens the alarm view")
        << int(Status) << false << QStringList{"MDIForm1.mnualarmon_Click", "frmalarm.uploadnew_Click"} << QStringList{};
    QTest::newRow("graphic cycle does not hold it back")
        << int(StatusG) << true << QStringList{"MDIForm1.mnualarmon_Click", "frmalarm.uploadnew_Click"} << QStringList{};
    QTest::newRow("alarm view open is maximised")
        << int(Alarm) << false << QStringList{"frmalarm.showMaximised", "frmalarm.uploadnew_Click"} << QStringList{};
}

void TestCcForm1Engine::newAlarm()
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

void TestCcForm1Engine::openFailureNamesTheReason()
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

void TestCcForm1Engine::portChangeMakesNewLine()
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

void TestCcForm1Engine::settingsLiveInTheInstrumentsInfoRows()
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

void TestCcForm1Engine::newInstrumentGetsTheDefaults_data()
{
    QTest::addColumn<QStringList>("stored"); // rows 0 to 7 of field 41
    QTest::newRow("empty rows") << QStringList{"", "", "", "", "", "", "", ""};
    QTest::newRow("unreadable rows") << QStringList{"", "", "fast", "", "2", "x", "", "9"};
}

void TestCcForm1Engine::newInstrumentGetsTheDefaults()
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

void TestCcForm1Engine::modemResultHangsUp_data()
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

void TestCcForm1Engine::modemResultHangsUp()
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

void TestCcForm1Engine::silenceAfterDial_data()
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

void TestCcForm1Engine::silenceAfterDial()
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

void TestCcForm1Engine::lineEvents_data()
{
    QTest::addColumn<int>("code");
    QTest::addColumn<QString>("status"); // the status panel afterwards
    QTest::addColumn<bool>("closes");    // the comms error path with the same text
    QTest::newRow("3") << 3 << "Status: Change in CTS Detected" << false;
    QTest::newRow("4") << 4 << "Status: Change in DSR Detected" << false;
    QTest::newRow("6") << 6 << "Status: The Phone is Ringing" << false;
    QTest::newRow("7") << 7 << "Status: End of File Detected" << false;
    QTest::newRow("1 send") << 1 << "Status: " << false;
    QTest::newRow("1001 break") << 1001 << "Status: " << false;
    QTest::newRow("1004 framing") << 1004 << "Status: " << false;
    QTest::newRow("1006 overrun") << 1006 << "Status: " << false;
    QTest::newRow("1009 parity") << 1009 << "Status: " << false;
    QTest::newRow("1002") << 1002 << "Status: CTS Timeout" << true;
    QTest::newRow("1003") << 1003 << "Status: DSR Timeout" << true;
    QTest::newRow("1007") << 1007 << "Status: Carrier Detect Timeout" << true;
    QTest::newRow("1008") << 1008 << "Status: Receive Buffer Overflow" << true;
    QTest::newRow("1011") << 1011 << "Status: Error retrieving DCB" << true;
    QTest::newRow("1005 unknown") << 1005 << "Status: Unknown error or event" << true;
}

void TestCcForm1Engine::lineEvents()
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
    if (closes)
        QCOMPARE(rig.op.last().lines,
                 (QStringList{status.mid(8), QStringLiteral("Check communication setup")}));
    else
        QVERIFY(rig.op.messages().isEmpty());
}

void TestCcForm1Engine::badIdentityHangsUpTheCall_data()
{
    QTest::addColumn<QByteArray>("reply");
    QTest::addColumn<QString>("title");
    QTest::newRow("wrong ID") << identity("9.6", "00013") << "Wrong ID";
    QTest::newRow("version not numeric") << identity("V9x", "00012") << "Invalid Version Number";
    QTest::newRow("ID not numeric") << identity("14", "0001A") << "Invalid ID Number";
}

void TestCcForm1Engine::badIdentityHangsUpTheCall()
{
    QFETCH(QByteArray, reply);
    QFETCH(QString, title);
    Rig rig(false);
    rig.dialAndConnect();
    rig.clock.advance(2000);
    rig.line->clearWrites();
    rig.line->deliver(reply);
    QCOMPARE(rig.op.titles(), QStringList{title});
    // cancel_dial_Click with the modem on line: escape, then hang up.
    QCOMPARE(rig.line->written(), QByteArray("+++ATH0\r\n"));
    QVERIFY(!rig.globals.modem_online);
    QVERIFY(!rig.line->isOpen());
    QCOMPARE(rig.engine->Text3[3].text, QStringLiteral("Port Closed"));
    QVERIFY(!rig.engine->Timer4.Enabled());
    rig.clock.advance(60000);
    QCOMPARE(rig.op.messages().size(), 1);
}

void TestCcForm1Engine::lostLineEndsTheLinkOnly_data()
{
    QTest::addColumn<bool>("direct");
    QTest::newRow("direct") << true;
    QTest::newRow("modem") << false;
}

void TestCcForm1Engine::lostLineEndsTheLinkOnly()
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

QTEST_GUILESS_MAIN(TestCcForm1Engine)
#include "tst_ccform1_engine.moc"
