#include "transfer_test_support.h"

#include "link/open_views.h"
#include "platform/manual_clock.h"
#include "platform/operator.h"
#include "setpoints/audit_trail.h"
#include "setpoints/catalogue.h"
#include "setpoints/write_path.h"

#include <QSignalSpy>

namespace {

class FakeStatusView : public TemperatureStatusView {
public:
    bool running = true;
    int stops = 0;
    int bankRedos = 0;
    void redoBanks() override { ++bankRedos; }
    bool stopstatusEnabled() const override { return running; }
    void stopstatus_Click() override
    {
        ++stops;
        running = false;
    }
    void status_do() override {}
};

} // namespace

class TestWritePath : public QObject {
    Q_OBJECT
private slots:
    void init();
    void cleanup();
    void commandForEveryValueForm_data();
    void commandForEveryValueForm();
    void confirmedEchoCommits();
    void wrongEchoBreaksOffOnce();
    void noEchoBreaksOffAfterTheKindsTimer_data();
    void noEchoBreaksOffAfterTheKindsTimer();
    void lineDownStoresOnly();
    void comparedWithTheBoxBeforeTheEdit_data();
    void comparedWithTheBoxBeforeTheEdit();
    void refusedValuesKeepTheStore_data();
    void refusedValuesKeepTheStore();
    void newBankCountsResetTheOrder_data();
    void newBankCountsResetTheOrder();
    void channelsInBankRedoTheStatusBanks_data();
    void channelsInBankRedoTheStatusBanks();
    void oneShotFlagsSwallowOneWrite_data();
    void oneShotFlagsSwallowOneWrite();
    void runningStatusIsStoppedFirst_data();
    void runningStatusIsStoppedFirst();
    void descriptionFaultsAreToldAfterTheEcho_data();
    void descriptionFaultsAreToldAfterTheEcho();

private:
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

void TestWritePath::commandForEveryValueForm_data()
{
    QTest::addColumn<int>("function");
    QTest::addColumn<int>("channel");
    QTest::addColumn<int>("sub");
    QTest::addColumn<QString>("typed");
    QTest::addColumn<QList<int>>("setup"); // row, field, value triples stored beforehand
    QTest::addColumn<QString>("body");
    QTest::addColumn<QString>("echo");
    QTest::addColumn<int>("row");
    QTest::addColumn<int>("field");
    QTest::addColumn<QVariant>("stored");

    const QList<int> none;
    QTest::newRow("bare") << 47 << 3 << 0 << "120" << none << "P47,2,0,0,120,1," << "47,2,0,0,120,1,sret" << 2
                          << 53 << QVariant(120);
    QTest::newRow("bare global") << 86 << 5 << 0 << "3" << none << "P86,0,0,0,3,1," << "86,0,0,0,3,1,sret" << 0
                                 << 83 << QVariant(3);
    QTest::newRow("compressors in bank") << 22 << 9 << 1 << "4" << none << "P22,0,1,0,4,5,"
                                         << "22,0,1,0,4,5,sret" << 0 << 156 << QVariant(4);
    QTest::newRow("tenths") << 5 << 4 << 1 << "21.5" << none << "P5,3,1,1,215,4," << "5,3,1,1,215,4,sret" << 3 << 3
                            << QVariant(215);
    QTest::newRow("tenths negative") << 9 << 1 << 0 << "-5.5" << none << "P9,0,0,1,-55,4,"
                                     << "9,0,0,1,-55,4,sret" << 0 << 14 << QVariant(-55);
    QTest::newRow("pid differential") << 121 << 66 << 0 << "1.5" << none << "P121,65,0,0,15,1,"
                                      << "121,65,0,0,15,1,sret" << 65 << 223 << QVariant(15);
    QTest::newRow("pressure bank") << 61 << 7 << 2 << "350" << QList<int>{0, 220, 0} << "P61,0,2,1,350,5,"
                                   << "61,0,2,1,350,5,sret" << 0 << 102 << QVariant(350);
    QTest::newRow("temperature bank") << 61 << 7 << 2 << "-3.5" << QList<int>{0, 220, 1} << "P61,0,2,1,-35,5,"
                                      << "61,0,2,1,-35,5,sret" << 0 << 102 << QVariant(-35);
    QTest::newRow("113 control type 7") << 113 << 8 << 0 << "2.5" << QList<int>{7, 209, 7} << "P113,7,0,1,25,1,"
                                        << "113,7,0,1,25,1,sret" << 7 << 210 << QVariant(25);
    QTest::newRow("113 seconds") << 113 << 8 << 0 << "120" << QList<int>{7, 209, 3} << "P113,7,0,1,120,1,"
                                 << "113,7,0,1,120,1,sret" << 7 << 210 << QVariant(120);
    QTest::newRow("set point times") << 17 << 2 << 1 << "08:30" << QList<int>{1, 6, 360, 1, 7, 400, 1, 8, 600, 1, 9, 700}
                                     << "P17,1,1,1,360,4,510,600,700," << "17,1,1,1,360,4,510,600,700,sret" << 1
                                     << 7 << QVariant(510);
    QTest::newRow("print times first") << 53 << 200 << 0 << "00:10"
                                       << QList<int>{199, 86, 60, 199, 87, 70, 199, 88, 80, 199, 89, 90}
                                       << "P53,199,0,1,10,4,70,80,90," << "53,199,0,1,10,4,70,80,90,sret" << 199
                                       << 86 << QVariant(10);
    QTest::newRow("defrost times") << 19 << 1 << 7 << "23:59"
                                   << QList<int>{0, 35, 1, 0, 36, 2, 0, 37, 3, 0, 38, 4, 0, 39, 5, 0, 40, 6, 0, 41, 7, 0, 42, 8}
                                   << "P19,0,7,1,1,8,2,3,4,5,6,7,1439," << "19,0,7,1,1,8,2,3,4,5,6,7,1439,sret" << 0
                                   << 42 << QVariant(1439);
    QTest::newRow("description") << 49 << 10 << 0 << "Dock 4" << none << "P49,9,0,0,Dock 4,6,"
                                 << "49,9,0,0,Dock 4,6,sret" << 9 << 25 << QVariant("Dock 4");
    QTest::newRow("list") << 42 << 11 << 0 << "2" << none << "P42,10,0,0,2,1," << "42,10,0,0,2,1,sret" << 10 << 51
                          << QVariant(2);
    QTest::newRow("associated channel plus one") << 48 << 12 << 1 << "4" << none << "P48,11,1,0,5,3,"
                                                 << "48,11,1,0,5,3,sret" << 11 << 27 << QVariant(4);
    QTest::newRow("list global") << 54 << 30 << 3 << "1" << none << "P54,0,3,0,1,5," << "54,0,3,0,1,5,sret" << 0
                                 << 216 << QVariant(1);
    QTest::newRow("check connected") << 0 << 13 << 0 << "0" << none << "P0,12,0,0,0," << "0,12,0,0,0,sret" << 12 << 1
                                     << QVariant(0);
    QTest::newRow("check fans") << 0 << 13 << 3 << "0" << none << "P0,12,3,0,0," << "0,12,3,0,0,sret" << 12 << 49
                                << QVariant(0);
    QTest::newRow("check manual defrost") << 0 << 13 << 5 << "1" << none << "P0,12,5,0,1,1," << "0,12,5,0,1,1,sret"
                                          << 12 << 44 << QVariant(1);
    QTest::newRow("check fans in delay") << 18 << 13 << 1 << "1" << none << "P18,12,1,0,1,1,"
                                         << "18,12,1,0,1,1,sret" << 12 << 30 << QVariant(1);
    QTest::newRow("check on if others") << 98 << 13 << 0 << "1" << none << "P98,12,0,0,1,1,"
                                        << "98,12,0,0,1,1,sret" << 12 << 45 << QVariant(1);
    QTest::newRow("check if in defrost") << 99 << 13 << 0 << "1" << none << "P99,12,0,0,1,1,"
                                         << "99,12,0,0,1,1,sret" << 12 << 46 << QVariant(1);
    QTest::newRow("check cancel defrost") << 150 << 13 << 0 << "1" << none << "P150,12,0,0,1,1,"
                                          << "150,12,0,0,1,1,sret" << -1 << -1 << QVariant();
    QTest::newRow("day mask") << 41 << 13 << 2 << "5" << none << "P041,12,2,0,5,7," << "041,12,2,0,5,7,sret" << 12
                              << 56 << QVariant(5);
    QTest::newRow("check load shed only") << 109 << 13 << 0 << "1" << none << "P109,12,0,0,1,1,"
                                          << "109,12,0,0,1,1,sret" << 12 << 98 << QVariant(1);
    QTest::newRow("check level alarms") << 106 << 13 << 0 << "1" << none << "P106,0,0,0,1,1,"
                                        << "106,0,0,0,1,1,sret" << 0 << 201 << QVariant(1);
    QTest::newRow("check soft defrost") << 8 << 13 << 0 << "1" << none << "P8,12,0,0,1,1," << "8,12,0,0,1,1,sret"
                                        << 12 << 12 << QVariant(1);
}

void TestWritePath::commandForEveryValueForm()
{
    QFETCH(int, function);
    QFETCH(int, channel);
    QFETCH(int, sub);
    QFETCH(QString, typed);
    QFETCH(QList<int>, setup);
    QFETCH(QString, body);
    QFETCH(QString, echo);
    QFETCH(int, row);
    QFETCH(int, field);
    QFETCH(QVariant, stored);
    for (int i = 0; i + 2 < setup.size(); i += 3)
        QVERIFY(m_inst->store->setSetpoint(setup[i], setup[i + 1], setup[i + 2]));
    // Flags start from the other state so that every write changes something.
    if (field >= 0 && stored.isValid())
        m_inst->store->setSetpoint(row, field, stored.toInt() == 1 ? 0 : stored.toInt() == 0 ? 1 : -999);
    QString error;
    QVERIFY2(m_path->writeValue(function, channel, sub, typed, &error), qPrintable(error));
    QCOMPARE(m_link->out.size(), 1);
    QCOMPARE(m_link->out.first(), QByteArray(61, 'Z') + body.toLatin1() + '\x04');
    QCOMPARE(m_path->sent_to_glacinor, echo);
    if (field >= 0)
        QCOMPARE(channel_record::storeText(m_inst->store->setpoint(row, field)), channel_record::storeText(stored));
}

void TestWritePath::confirmedEchoCommits()
{
    QSignalSpy confirmed(m_path.get(), &WritePath::confirmed);
    QVERIFY(m_path->writeValue(5, 4, 1, QStringLiteral("21.5")));
    QVERIFY(m_path->update_pending);
    m_link->buffer = QStringLiteral("5,3,1,1,215,4,sret");
    m_path->ret_handel();
    QCOMPARE(m_link->out.last(), QByteArray("X"));
    QCOMPARE(confirmed.count(), 1);
    QCOMPARE(confirmed.first().first().toInt(), int(write_command::KindText2));
    QVERIFY(!m_path->update_pending);
    m_clock->advance(60000);
    QCOMPARE(m_link->out.size(), 2);
    QVERIFY(m_op->messages().isEmpty());
    const QList<AuditEntry> audit = m_audit->entries();
    QCOMPARE(audit.size(), 1);
    QCOMPARE(audit[0].function, 5);
    QCOMPARE(audit[0].channel, 4);
    QCOMPARE(audit[0].subfunction, 1);
    QCOMPARE(audit[0].newValue, QStringLiteral("215"));
    QCOMPARE(audit[0].outcome, QStringLiteral("X"));
}

void TestWritePath::wrongEchoBreaksOffOnce()
{
    QSignalSpy abandoned(m_path.get(), &WritePath::abandoned);
    QVERIFY(m_path->writeValue(47, 3, 0, QStringLiteral("120")));
    // The echo is the same text but for one digit, and the EOT would be extra too.
    m_link->buffer = QStringLiteral("47,2,0,0,121,1,sret");
    m_path->ret_handel();
    QVERIFY(m_link->out.last() != QByteArray("X"));
    QCOMPARE(m_clock->remaining(&m_path->Timer1), 3000);
    QVERIFY(!m_clock->isArmed(&m_path->Timer4));
    m_clock->advance(60000);
    QCOMPARE(m_link->out.last(), QByteArray("V"));
    QCOMPARE(m_op->messages().size(), 1);
    QCOMPARE(m_op->last().title, QStringLiteral("Update Not Completed"));
    QCOMPARE(m_op->last().lines, (QStringList{"The value was not updated to the Glacinor,", "Re do the last set point"}));
    QCOMPARE(m_op->last().icon, Operator::Icon::Exclamation);
    QCOMPARE(abandoned.count(), 1);
    // The store keeps the new value: nothing is rolled back.
    QCOMPARE(m_inst->store->setpoint(2, 53).toInt(), 120);
    QCOMPARE(m_audit->entries().value(0).outcome, QStringLiteral("V"));
}

void TestWritePath::noEchoBreaksOffAfterTheKindsTimer_data()
{
    QTest::addColumn<int>("function");
    QTest::addColumn<int>("sub");
    QTest::addColumn<QString>("typed");
    QTest::addColumn<int>("timer"); // 1, 2 or 4
    QTest::newRow("check box") << 0 << 4 << "0" << 1;
    QTest::newRow("Text2") << 6 << 0 << "3.5" << 2;
    QTest::newRow("Text1") << 47 << 0 << "99" << 4;
    QTest::newRow("Combo1") << 42 << 0 << "3" << 4;
}

void TestWritePath::noEchoBreaksOffAfterTheKindsTimer()
{
    QFETCH(int, function);
    QFETCH(int, sub);
    QFETCH(QString, typed);
    QFETCH(int, timer);
    QVERIFY(m_path->writeValue(function, 2, sub, typed));
    Timer* t = timer == 1 ? &m_path->Timer1 : timer == 2 ? &m_path->Timer2 : &m_path->Timer4;
    QCOMPARE(m_clock->remaining(t), 3000);
    m_clock->advance(2999);
    QCOMPARE(m_link->out.size(), 1);
    m_clock->advance(1);
    QCOMPARE(m_link->out.last(), QByteArray("V"));
    QCOMPARE(m_op->titles(), QStringList{QStringLiteral("Update Not Completed")});
    QVERIFY(!m_path->update_pending);
    m_clock->advance(60000);
    QCOMPARE(m_op->messages().size(), 1);
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

void TestWritePath::comparedWithTheBoxBeforeTheEdit_data()
{
    QTest::addColumn<int>("function");
    QTest::addColumn<int>("channel");
    QTest::addColumn<int>("sub");
    QTest::addColumn<QList<int>>("before"); // row, field, value: the store when the box got the focus
    QTest::addColumn<QList<int>>("during"); // stored while the box had it (up-down, check box)
    QTest::addColumn<QString>("typed");
    QTest::addColumn<bool>("sent");
    QTest::newRow("same number") << 47 << 3 << 0 << QList<int>{2, 53, 77} << QList<int>{} << "77" << false;
    QTest::newRow("same decimal written longer") << 5 << 3 << 0 << QList<int>{2, 2, 215} << QList<int>{} << "21.50"
                                                 << false;
    QTest::newRow("time stored by the up-down") << 17 << 2 << 1 << QList<int>{1, 6, 300, 1, 7, 360, 1, 8, 600}
                                                << QList<int>{1, 7, 510} << "08:30" << true;
    QTest::newRow("time back where it was") << 17 << 2 << 1 << QList<int>{1, 6, 300, 1, 7, 360, 1, 8, 600}
                                            << QList<int>{1, 7, 510, 1, 7, 360} << "06:00" << false;
    QTest::newRow("check box stored on click") << 0 << 13 << 3 << QList<int>{12, 49, 0} << QList<int>{12, 49, 1}
                                               << "1" << true;
    QTest::newRow("global from another channel") << 86 << 40 << 0 << QList<int>{0, 83, 2} << QList<int>{} << "2"
                                                 << false;
}

void TestWritePath::comparedWithTheBoxBeforeTheEdit()
{
    QFETCH(int, function);
    QFETCH(int, channel);
    QFETCH(int, sub);
    QFETCH(QList<int>, before);
    QFETCH(QList<int>, during);
    QFETCH(QString, typed);
    QFETCH(bool, sent);
    for (int i = 0; i + 2 < before.size(); i += 3)
        QVERIFY(m_inst->store->setSetpoint(before[i], before[i + 1], before[i + 2]));
    m_path->gotFocus(function, channel, sub);
    for (int i = 0; i + 2 < during.size(); i += 3)
        QVERIFY(m_inst->store->setSetpoint(during[i], during[i + 1], during[i + 2]));
    QString error;
    QCOMPARE(m_path->writeValue(function, channel, sub, typed, &error), sent);
    QCOMPARE(m_link->out.size(), sent ? 1 : 0);
    QVERIFY2(error.isEmpty(), qPrintable(error));
    QVERIFY(m_op->messages().isEmpty());
}

void TestWritePath::refusedValuesKeepTheStore_data()
{
    QTest::addColumn<int>("function");
    QTest::addColumn<int>("channel");
    QTest::addColumn<int>("sub");
    QTest::addColumn<QList<int>>("setup"); // row, field, value; the first triple is the value edited
    QTest::addColumn<QString>("typed");
    QTest::addColumn<QString>("message"); // "Title: line / line", empty for none

    const QString notNumber = "Invalid Value: Not a valid number, Enter a valid number / The old value will be used.";
    const QString pressureOnly = "Invalid Channel No.: No change was made to set points / Must only use channel "
                                 "(pressure channels) numbers 1 to 15 inclusive,";
    QTest::newRow("decimal for a whole number") << 13 << 1 << 0 << QList<int>{0, 202, 2000} << "12.5" << notNumber;
    QTest::newRow("letters") << 47 << 3 << 0 << QList<int>{2, 53, 77} << "7x" << notNumber;
    QTest::newRow("two decimal places") << 5 << 1 << 0 << QList<int>{0, 2, 30} << "21.55" << notNumber;
    QTest::newRow("above the KPA range") << 13 << 1 << 0 << QList<int>{0, 202, 2000} << "4001"
                                         << "Invalid Value: Value Out of Range, / Enter a Value Between -100 and 4000";
    QTest::newRow("below the degrees range") << 5 << 1 << 0 << QList<int>{0, 2, 30} << "-50.1"
                                             << "Invalid Value: Value Out of Range, / Enter a Value Between -50.0 and 150.0";
    QTest::newRow("super heat range") << 113 << 8 << 0 << QList<int>{7, 210, 50, 7, 209, 7} << "20.1"
                                      << "Invalid Value: Value Out of Range, / Enter a Value Between 1.0 and 20.0";
    QTest::newRow("not a pressure channel") << 13 << 20 << 0 << QList<int>{19, 202, 2000} << "100" << pressureOnly;
    QTest::newRow("last pressure channel") << 16 << 16 << 0 << QList<int>{15, 205, 10} << "5"
                                           << "Invalid Channel No.: No change was made to set points / Must only use "
                                              "channel (pressure channels) numbers 1 to 15 inclusive,";
    QTest::newRow("not a compressor") << 70 << 28 << 0 << QList<int>{27, 167, 0} << "5"
                                      << "Invalid Channel No.: No change was made to set points / Must only use "
                                         "channel (compressor) numbers 1 to 27 inclusive,";
    QTest::newRow("not a condenser") << 91 << 13 << 0 << QList<int>{12, 169, 0} << "2"
                                     << "Invalid Channel No.: No change was made to set points / Must only use "
                                        "channel (condenser) numbers 1 to 12 inclusive,";
    // The channel's class is told only for a value that would otherwise go.
    QTest::newRow("class after the number") << 13 << 20 << 0 << QList<int>{19, 202, 2000} << "12.5" << notNumber;
    QTest::newRow("class after the range") << 13 << 20 << 0 << QList<int>{19, 202, 2000} << "5000"
                                           << "Invalid Value: Value Out of Range, / Enter a Value Between -100 and 4000";
    QTest::newRow("class after the same value") << 13 << 20 << 0 << QList<int>{19, 202, 100} << "100" << "";
    QTest::newRow("time before the previous") << 17 << 2 << 1 << QList<int>{1, 7, 400, 1, 6, 360, 1, 8, 600}
                                              << "05:59"
                                              << "Invalid Value: Value Out of Range, / Enter a Value Between 06:00 and 10:00";
    QTest::newRow("time after the next") << 19 << 1 << 0 << QList<int>{0, 35, 60, 0, 36, 120} << "02:01"
                                         << "Invalid Value: Value Out of Range, / Enter a Value Between 00:00 and 02:00";
    QTest::newRow("no set point on a day") << 41 << 13 << 2 << QList<int>{12, 56, 4} << "0"
                                           << "Invalid Selection: Must Select, / at Least one Set Point";
    QTest::newRow("flag other than 0 or 1") << 0 << 13 << 3 << QList<int>{12, 49, 0} << "2"
                                            << "Invalid Value: Value Out of Range, / Enter a Value Between 0 and 1";
    QTest::newRow("comma in a description") << 49 << 13 << 0 << QList<int>{} << "Dock,4"
                                            << "Invalid Character: Not a valid entry, / You cannot use the \",\" "
                                               "character or the ENTER key";
}

void TestWritePath::refusedValuesKeepTheStore()
{
    QFETCH(int, function);
    QFETCH(int, channel);
    QFETCH(int, sub);
    QFETCH(QList<int>, setup);
    QFETCH(QString, typed);
    QFETCH(QString, message);
    for (int i = 0; i + 2 < setup.size(); i += 3)
        QVERIFY(m_inst->store->setSetpoint(setup[i], setup[i + 1], setup[i + 2]));
    m_path->gotFocus(function, channel, sub);
    QVERIFY(!m_path->writeValue(function, channel, sub, typed));
    QVERIFY(m_link->out.isEmpty());
    QVERIFY(!m_path->update_pending);
    QCOMPARE(m_op->messages().size(), message.isEmpty() ? 0 : 1);
    if (!message.isEmpty())
        QCOMPARE(m_op->last().toText(), message);
    if (!setup.isEmpty())
        QCOMPARE(m_inst->store->setpoint(setup[0], setup[1]).toInt(), setup[2]);
}

void TestWritePath::newBankCountsResetTheOrder_data()
{
    QTest::addColumn<int>("function");
    QTest::addColumn<int>("field");
    QTest::addColumn<int>("places");
    QTest::addColumn<bool>("online");
    QTest::addColumn<QString>("title");
    QTest::newRow("compressors") << 22 << 207 << 27 << true << "Compressor Reset";
    QTest::newRow("condensers") << 25 << 206 << 12 << true << "Condenser Reset";
    QTest::newRow("compressors off line") << 22 << 207 << 27 << false << "";
    QTest::newRow("condensers off line") << 25 << 206 << 12 << false << "";
}

void TestWritePath::newBankCountsResetTheOrder()
{
    QFETCH(int, function);
    QFETCH(int, field);
    QFETCH(int, places);
    QFETCH(bool, online);
    QFETCH(QString, title);
    m_link->g.link_up = online;
    // An order picked for the old counts, and a place behind the last that is not the order's.
    for (int row = 0; row <= places; ++row)
        QVERIFY(m_inst->store->setSetpoint(row, field, places - row));
    QVERIFY(m_path->writeValue(function, 1, 1, QStringLiteral("2")));
    for (int row = 0; row < places; ++row)
        QCOMPARE(m_inst->store->setpoint(row, field).toInt(), row + 1);
    QCOMPARE(m_inst->store->setpoint(places, field).toInt(), 0);
    // The message waits for the instrument's word.
    QVERIFY(m_op->messages().isEmpty());
    if (!online)
        return;
    m_link->buffer = QStringLiteral("%1,0,1,0,2,5,sret").arg(function);
    m_path->ret_handel();
    QCOMPARE(m_link->out.last(), QByteArray("X"));
    QCOMPARE(m_op->titles(), QStringList{title});
    const QString what = function == 22 ? "compressor" : "condenser";
    QCOMPARE(m_op->last().lines, (QStringList{QStringLiteral("The %1 order of all banks have been reset,").arg(what),
                                              QStringLiteral("Re do %1 order for required banks,").arg(what),
                                              "and update to the Glacinor when finished."}));
}

void TestWritePath::channelsInBankRedoTheStatusBanks_data()
{
    QTest::addColumn<int>("function");
    QTest::addColumn<bool>("statusOpen");
    QTest::addColumn<bool>("online");
    QTest::addColumn<int>("redos");
    QTest::newRow("channels in bank") << 1 << true << true << 1;
    QTest::newRow("channels in bank off line") << 1 << true << false << 1;
    QTest::newRow("status view closed") << 1 << false << true << 0;
    QTest::newRow("compressors in bank") << 22 << true << true << 0;
}

void TestWritePath::channelsInBankRedoTheStatusBanks()
{
    QFETCH(int, function);
    QFETCH(bool, statusOpen);
    QFETCH(bool, online);
    QFETCH(int, redos);
    m_link->g.link_up = online;
    FakeStatusView status;
    status.running = false;
    m_views->status = &status;
    m_views->status_open = statusOpen;
    QVERIFY(m_path->writeValue(function, 1, 2, QStringLiteral("7")));
    QCOMPARE(status.bankRedos, redos);
}

void TestWritePath::oneShotFlagsSwallowOneWrite_data()
{
    QTest::addColumn<int>("flag");
    QTest::newRow("skip_lost_focus") << 0;
    QTest::newRow("button_pressed") << 1;
    QTest::newRow("status_stopped") << 2;
    QTest::newRow("update_pending") << 3;
    QTest::newRow("no_send") << 4;
}

void TestWritePath::oneShotFlagsSwallowOneWrite()
{
    QFETCH(int, flag);
    bool* flags[] = {&m_path->skip_lost_focus, &m_path->button_pressed, &m_path->status_stopped,
                     &m_path->update_pending, &m_path->no_send};
    *flags[flag] = true;
    QVERIFY(!m_path->writeValue(47, 3, 0, QStringLiteral("11")));
    QVERIFY(m_link->out.isEmpty());
    QVERIFY(!*flags[flag]);
    QVERIFY(m_path->writeValue(47, 3, 0, QStringLiteral("11")));
    QCOMPARE(m_link->out.size(), 1);
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
    struct P : PressureStatusView {
        bool running = true;
        bool stopstatusEnabled() const override { return running; }
        void stopstatus_Click() override { running = false; }
        void statusp_do() override {}
        void statuspa_do() override {}
    } pressure;
    struct G : PressureGraphicView {
        bool running = true;
        bool stopstatusEnabled() const override { return running; }
        void stopstatus_Click() override { running = false; }
        void statuspg_do() override {}
    } pressureGraphic;
    FakeStatusView temperature;
    StatusCycleView* views[] = {&temperature, &pressure, &temperature, &pressureGraphic};
    switch (view) {
    case 0: m_views->status_open = true; m_views->status = &temperature; break;
    case 1: m_views->statusp_open = true; m_views->statusp = &pressure; break;
    case 2: m_views->statusg_open = true; m_views->statusg = &temperature; break;
    case 3: m_views->statuspg_open = true; m_views->statuspg = &pressureGraphic; break;
    }
    QVERIFY(!m_path->writeValue(47, 3, 0, QStringLiteral("11")));
    QVERIFY(!views[view]->stopstatusEnabled());
    QVERIFY(m_link->out.isEmpty());
    QCOMPARE(m_op->last().title, QStringLiteral("Current Status Active"));
    QCOMPARE(m_op->last().lines, (QStringList{line, "It will be stopped to allow other proceedures."}));
    QVERIFY(m_path->status_stopped);
    // The next focus change only clears the flag; the one after sends.
    QVERIFY(!m_path->writeValue(47, 3, 0, QStringLiteral("11")));
    QVERIFY(m_path->writeValue(47, 3, 0, QStringLiteral("11")));
    QCOMPARE(m_link->out.size(), 1);
    QCOMPARE(m_op->messages().size(), 1);
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
    QCOMPARE(m_link->out.last(), QByteArray("X"));
    QCOMPARE(m_op->titles(), title.isEmpty() ? QStringList{} : QStringList{title});
    QCOMPARE(m_path->description_fault, 0);
}

QTEST_GUILESS_MAIN(TestWritePath)
#include "tst_write_path.moc"
