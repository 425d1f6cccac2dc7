#include "transfer_test_support.h"

#include "link/open_views.h"
#include "platform/manual_clock.h"
#include "platform/operator.h"
#include "setpoints/audit_trail.h"
#include "setpoints/write_path.h"

namespace {

struct FakeStatusCycle : TemperatureStatusView, PressureStatusView, PressureGraphicView {
    bool running = true;
    int bankRedos = 0;
    void redoBanks() override { ++bankRedos; }
    bool stopstatusEnabled() const override { return running; }
    void stopstatus_Click() override { running = false; }
    void status_do() override {}
    void statusp_do() override {}
    void statuspa_do() override {}
    void statuspg_do() override {}
};

// A value typed into a box: function, channel, sub-function, text, and the
// store's cells beforehand as row, field, value triples.
struct Typed {
    int function = 0;
    int channel = 1;
    int sub = 0;
    QString text;
    QList<int> setup;
};

} // namespace

Q_DECLARE_METATYPE(Typed)

class TestWritePath : public QObject {
    Q_OBJECT
private slots:
    void init();
    void cleanup();
    void commandForEachValueForm_data();
    void commandForEachValueForm();
    void confirmedEchoCommits();
    void wrongOrMissingEchoBreaksOffOnce_data();
    void wrongOrMissingEchoBreaksOffOnce();
    void lineDownStoresOnly();
    void sameValueIsNotSent_data();
    void sameValueIsNotSent();
    void refusedValuesKeepTheStore_data();
    void refusedValuesKeepTheStore();
    void newBankCountsResetTheOrder_data();
    void newBankCountsResetTheOrder();
    void runningStatusIsStoppedFirst_data();
    void runningStatusIsStoppedFirst();
    void descriptionFaultsAreToldAfterTheEcho_data();
    void descriptionFaultsAreToldAfterTheEcho();

private:
    // row, field, value triples into the store.
    void store(const QList<int>& cells);
    bool write(const Typed& t, QString* error = nullptr);

    std::unique_ptr<TestInstrument> m_inst;
    std::unique_ptr<ManualClock> m_clock;
    std::unique_ptr<TestLink> m_link;
    std::unique_ptr<ScriptedOperator> m_op;
    std::unique_ptr<OpenViews> m_views;
    std::unique_ptr<AuditTrail> m_audit;
    std::unique_ptr<WritePath> m_path;
};

void TestWritePath::init()
{
    m_inst = std::make_unique<TestInstrument>();
    QVERIFY(m_inst->store);
    m_clock = std::make_unique<ManualClock>();
    m_link = std::make_unique<TestLink>();
    m_link->g.link_up = true;
    m_link->g.speed_factor = 3;
    m_op = std::make_unique<ScriptedOperator>();
    m_views = std::make_unique<OpenViews>();
    m_audit = AuditTrail::open(m_inst->store->store(), *m_clock);
    QVERIFY(m_audit);
    m_path = std::make_unique<WritePath>(commands::Sender::Channels, *m_link, *m_clock, *m_op, *m_views,
                                         *m_inst->store);
    m_path->setAuditTrail(m_audit.get());
}

void TestWritePath::cleanup()
{
    m_path.reset();
    m_audit.reset();
    m_inst.reset();
}

void TestWritePath::store(const QList<int>& cells)
{
    for (int i = 0; i + 2 < cells.size(); i += 3)
        QVERIFY(m_inst->store->setSetpoint(cells[i], cells[i + 1], cells[i + 2]));
}

bool TestWritePath::write(const Typed& t, QString* error)
{
    return m_path->writeValue(t.function, t.channel, t.sub, t.text, error);
}

void TestWritePath::commandForEachValueForm_data()
{
    QTest::addColumn<Typed>("typed");
    QTest::addColumn<QString>("body"); // the echo is the same with "sret" behind
    QTest::addColumn<int>("row");
    QTest::addColumn<int>("field");
    QTest::addColumn<QVariant>("stored");
    QTest::newRow("global from channel 5") << Typed{86, 5, 0, "3", {}} << "86,0,0,0,3,1," << 0 << 83 << QVariant(3);
    QTest::newRow("tenths") << Typed{9, 1, 0, "-5.5", {}} << "9,0,0,1,-55,4," << 0 << 14 << QVariant(-55);
    QTest::newRow("temperature bank") << Typed{61, 7, 2, "-3.5", {0, 220, 1}} << "61,0,2,1,-35,5," << 0 << 102
                                      << QVariant(-35);
    QTest::newRow("super heat") << Typed{113, 8, 0, "2.5", {7, 209, 7}} << "113,7,0,1,25,1," << 7 << 210
                                << QVariant(25);
    QTest::newRow("group of times") << Typed{17, 2, 1, "08:30", {1, 6, 360, 1, 7, 400, 1, 8, 600, 1, 9, 700}}
                                    << "17,1,1,1,360,4,510,600,700," << 1 << 7 << QVariant(510);
    QTest::newRow("description") << Typed{49, 10, 0, "Dock 4", {}} << "49,9,0,0,Dock 4,6," << 9 << 25
                                 << QVariant("Dock 4");
    QTest::newRow("associated channel plus one") << Typed{48, 12, 1, "4", {}} << "48,11,1,0,5,3," << 11 << 27
                                                 << QVariant(4);
    QTest::newRow("connected flag") << Typed{0, 13, 0, "0", {}} << "0,12,0,0,0," << 12 << 1 << QVariant(0);
    QTest::newRow("manual defrost") << Typed{0, 13, 5, "1", {}} << "0,12,5,0,1,1," << 12 << 44 << QVariant(1);
    QTest::newRow("day mask") << Typed{41, 13, 2, "5", {}} << "041,12,2,0,5,7," << 12 << 56 << QVariant(5);
    QTest::newRow("level alarms in row 0") << Typed{106, 13, 0, "1", {}} << "106,0,0,0,1,1," << 0 << 201 << QVariant(1);
    QTest::newRow("cancel defrost stores nothing") << Typed{150, 13, 0, "1", {}} << "150,12,0,0,1,1," << -1 << -1
                                                   << QVariant();
}

void TestWritePath::commandForEachValueForm()
{
    QFETCH(Typed, typed);
    QFETCH(QString, body);
    QFETCH(int, row);
    QFETCH(int, field);
    QFETCH(QVariant, stored);
    store(typed.setup);
    // Flags start from the other state so that every write changes something.
    if (field >= 0)
        m_inst->store->setSetpoint(row, field, stored.toInt() == 1 ? 0 : stored.toInt() == 0 ? 1 : -999);
    QString error;
    QVERIFY2(write(typed, &error), qPrintable(error));
    QCOMPARE(m_link->out, QList<QByteArray>{QByteArray(61, 'Z') + 'P' + body.toLatin1() + '\x04'});
    QCOMPARE(m_path->sent_to_glacinor, body + QStringLiteral("sret"));
    if (field >= 0)
        QCOMPARE(channel_record::storeText(m_inst->store->setpoint(row, field)), channel_record::storeText(stored));
}

void TestWritePath::confirmedEchoCommits()
{
    QVERIFY(m_path->writeValue(5, 4, 1, QStringLiteral("21.5")));
    QVERIFY(m_path->update_pending);
    m_link->buffer = QStringLiteral("5,3,1,1,215,4,sret");
    m_path->ret_handel();
    QCOMPARE(m_link->out.last(), QByteArray("X"));
    QVERIFY(!m_path->update_pending);
    m_clock->advance(60000);
    QCOMPARE(m_link->out.size(), 2);
    QVERIFY(m_op->messages().isEmpty());
    const QList<AuditEntry> audit = m_audit->entries();
    QCOMPARE(audit.size(), 1);
    QCOMPARE(audit[0].newValue, QStringLiteral("215"));
    QCOMPARE(audit[0].outcome, QStringLiteral("X"));
}

void TestWritePath::wrongOrMissingEchoBreaksOffOnce_data()
{
    QTest::addColumn<Typed>("typed");
    QTest::addColumn<QString>("echo"); // empty: none comes
    QTest::addColumn<int>("timer");    // the kind's timer: 1, 2 or 4
    QTest::newRow("one digit off") << Typed{47, 2, 0, "120", {}} << "47,1,0,0,121,1,sret" << 1;
    QTest::newRow("check box, none") << Typed{0, 2, 4, "0", {}} << "" << 1;
    QTest::newRow("Text2, none") << Typed{6, 2, 0, "3.5", {}} << "" << 2;
    QTest::newRow("Combo1, none") << Typed{42, 2, 0, "3", {}} << "" << 4;
}

void TestWritePath::wrongOrMissingEchoBreaksOffOnce()
{
    QFETCH(Typed, typed);
    QFETCH(QString, echo);
    QFETCH(int, timer);
    QVERIFY(write(typed));
    if (!echo.isEmpty()) {
        m_link->buffer = echo;
        m_path->ret_handel();
    }
    Timer* t = timer == 1 ? &m_path->Timer1 : timer == 2 ? &m_path->Timer2 : &m_path->Timer4;
    QCOMPARE(m_clock->remaining(t), 3000);
    m_clock->advance(2999);
    QCOMPARE(m_link->out.size(), 1);
    m_clock->advance(1);
    QCOMPARE(m_link->out.last(), QByteArray("V"));
    QCOMPARE(m_op->last().toText(), QStringLiteral("Update Not Completed: The value was not updated to the "
                                                    "Glacinor, / Re do the last set point"));
    QVERIFY(!m_path->update_pending);
    m_clock->advance(60000);
    QCOMPARE(m_op->messages().size(), 1);
    QCOMPARE(m_audit->entries().value(0).outcome, QStringLiteral("V"));
}

void TestWritePath::lineDownStoresOnly()
{
    m_link->g.link_up = false;
    QVERIFY(m_path->writeValue(5, 1, 0, QStringLiteral("-2.0")));
    QVERIFY(m_link->out.isEmpty());
    QCOMPARE(m_inst->store->setpoint(0, 2).toInt(), -20);
    m_clock->advance(60000);
    QVERIFY(m_op->messages().isEmpty());
    QVERIFY(m_audit->entries().isEmpty());
}

void TestWritePath::sameValueIsNotSent_data()
{
    QTest::addColumn<Typed>("typed");       // setup: the store when the box got the focus
    QTest::addColumn<QList<int>>("during"); // stored while the box had it (up-down, check box)
    QTest::addColumn<bool>("sent");
    const QList<int> times{1, 6, 300, 1, 7, 360, 1, 8, 600};
    QTest::newRow("decimal written longer") << Typed{5, 3, 0, "21.50", {2, 2, 215}} << QList<int>{} << false;
    QTest::newRow("time moved by the up-down") << Typed{17, 2, 1, "08:30", times} << QList<int>{1, 7, 510} << true;
    QTest::newRow("time moved back") << Typed{17, 2, 1, "06:00", times} << QList<int>{1, 7, 510, 1, 7, 360} << false;
    QTest::newRow("global from another channel") << Typed{86, 40, 0, "2", {0, 83, 2}} << QList<int>{} << false;
}

void TestWritePath::sameValueIsNotSent()
{
    QFETCH(Typed, typed);
    QFETCH(QList<int>, during);
    QFETCH(bool, sent);
    store(typed.setup);
    m_path->gotFocus(typed.function, typed.channel, typed.sub);
    store(during);
    QString error;
    QCOMPARE(write(typed, &error), sent);
    QCOMPARE(m_link->out.size(), sent ? 1 : 0);
    QVERIFY2(error.isEmpty(), qPrintable(error));
    QVERIFY(m_op->messages().isEmpty());
}

void TestWritePath::refusedValuesKeepTheStore_data()
{
    QTest::addColumn<Typed>("typed"); // the first cell of the setup is the value edited
    QTest::addColumn<QString>("message"); // empty for none
    const QString notNumber = "Invalid Value: Not a valid number, Enter a valid number / The old value will be used.";
    const QString range = "Invalid Value: Value Out of Range, / Enter a Value Between ";
    QTest::newRow("decimal for a whole number") << Typed{13, 1, 0, "12.5", {0, 202, 2000}} << notNumber;
    QTest::newRow("above the KPA range") << Typed{13, 1, 0, "4001", {0, 202, 2000}} << range + "-100 and 4000";
    QTest::newRow("below the degrees range") << Typed{5, 1, 0, "-50.1", {0, 2, 30}} << range + "-50.0 and 150.0";
    QTest::newRow("super heat range") << Typed{113, 8, 0, "20.1", {7, 210, 50, 7, 209, 7}} << range + "1.0 and 20.0";
    QTest::newRow("not a pressure channel") << Typed{16, 16, 0, "5", {15, 205, 10}}
                                            << "Invalid Channel No.: No change was made to set points / Must only "
                                               "use channel (pressure channels) numbers 1 to 15 inclusive,";
    QTest::newRow("class after the same value") << Typed{13, 20, 0, "100", {19, 202, 100}} << "";
    QTest::newRow("time before the previous") << Typed{17, 2, 1, "05:59", {1, 7, 400, 1, 6, 360, 1, 8, 600}}
                                              << range + "06:00 and 10:00";
    QTest::newRow("no set point on a day") << Typed{41, 13, 0, "0", {12, 54, 4}}
                                           << "Invalid Selection: Must Select, / at Least one Set Point";
}

void TestWritePath::refusedValuesKeepTheStore()
{
    QFETCH(Typed, typed);
    QFETCH(QString, message);
    store(typed.setup);
    m_path->gotFocus(typed.function, typed.channel, typed.sub);
    QVERIFY(!write(typed));
    QVERIFY(m_link->out.isEmpty());
    QCOMPARE(m_op->messages().size(), message.isEmpty() ? 0 : 1);
    if (!message.isEmpty())
        QCOMPARE(m_op->last().toText(), message);
    QCOMPARE(m_inst->store->setpoint(typed.setup[0], typed.setup[1]).toInt(), typed.setup[2]);
}

void TestWritePath::newBankCountsResetTheOrder_data()
{
    QTest::addColumn<int>("function");
    QTest::addColumn<int>("field");
    QTest::addColumn<int>("places");
    QTest::addColumn<QString>("what");
    QTest::newRow("compressors") << 22 << 207 << 27 << "compressor";
    QTest::newRow("condensers") << 25 << 206 << 12 << "condenser";
}

void TestWritePath::newBankCountsResetTheOrder()
{
    QFETCH(int, function);
    QFETCH(int, field);
    QFETCH(int, places);
    QFETCH(QString, what);
    // An order picked for the old counts, and a place behind the last that is not the order's.
    for (int row = 0; row <= places; ++row)
        QVERIFY(m_inst->store->setSetpoint(row, field, places - row));
    QVERIFY(m_path->writeValue(function, 1, 1, QStringLiteral("2")));
    for (int row = 0; row < places; ++row)
        QCOMPARE(m_inst->store->setpoint(row, field).toInt(), row + 1);
    QCOMPARE(m_inst->store->setpoint(places, field).toInt(), 0);
    // The message waits for the instrument's word.
    QVERIFY(m_op->messages().isEmpty());
    m_link->buffer = QStringLiteral("%1,0,1,0,2,5,sret").arg(function);
    m_path->ret_handel();
    QCOMPARE(m_op->last().lines.value(0), QStringLiteral("The %1 order of all banks have been reset,").arg(what));
}

void TestWritePath::runningStatusIsStoppedFirst_data()
{
    QTest::addColumn<int>("view");
    QTest::addColumn<QString>("line");
    QTest::newRow("temperature") << 0 << "Current Temperature Status is active,";
    QTest::newRow("pressure") << 1 << "Current Pressure Status is active,";
    QTest::newRow("temperature graphic") << 2 << "Current Temperature Graphic Status is active,";
    QTest::newRow("pressure graphic") << 3 << "Current Pressure Status Graphic is active,";
}

void TestWritePath::runningStatusIsStoppedFirst()
{
    QFETCH(int, view);
    QFETCH(QString, line);
    FakeStatusCycle cycle;
    bool* open[] = {&m_views->status_open, &m_views->statusp_open, &m_views->statusg_open, &m_views->statuspg_open};
    *open[view] = true;
    m_views->status = m_views->statusg = &cycle;
    m_views->statusp = &cycle;
    m_views->statuspg = &cycle;
    QVERIFY(!m_path->writeValue(47, 3, 0, QStringLiteral("11")));
    QVERIFY(!cycle.running);
    QCOMPARE(m_op->last().lines, (QStringList{line, "It will be stopped to allow other proceedures."}));
    // The next focus change only clears the flag; the one after sends.
    QVERIFY(!m_path->writeValue(47, 3, 0, QStringLiteral("11")));
    QVERIFY(m_path->writeValue(47, 3, 0, QStringLiteral("11")));
    QCOMPARE(m_link->out.size(), 1);
    m_link->buffer = m_path->sent_to_glacinor;
    m_path->ret_handel();
    // A new count of channels in the banks is shown by an open status view.
    QVERIFY(m_path->writeValue(1, 1, 2, QStringLiteral("7")));
    QCOMPARE(cycle.bankRedos, view == 0 ? 1 : 0);
}

void TestWritePath::descriptionFaultsAreToldAfterTheEcho_data()
{
    QTest::addColumn<QString>("typed");
    QTest::addColumn<QString>("sent");
    QTest::addColumn<QString>("title");
    QTest::newRow("short") << "Dock" << "Dock  " << "To Few Characters";
    QTest::newRow("long") << "Freezer 1" << "Freeze" << "To Many Characters";
    QTest::newRow("exact") << "Room 1" << "Room 1" << "";
}

void TestWritePath::descriptionFaultsAreToldAfterTheEcho()
{
    QFETCH(QString, typed);
    QFETCH(QString, sent);
    QFETCH(QString, title);
    QVERIFY(m_path->writeValue(49, 5, 0, typed));
    QCOMPARE(m_inst->store->setpoint(4, 25).toString(), sent);
    QVERIFY(m_op->messages().isEmpty());
    m_link->buffer = QStringLiteral("49,4,0,0,%1,6,sret").arg(sent);
    m_path->ret_handel();
    QCOMPARE(m_op->titles(), title.isEmpty() ? QStringList{} : QStringList{title});
}

QTEST_GUILESS_MAIN(TestWritePath)
#include "tst_write_path.moc"
