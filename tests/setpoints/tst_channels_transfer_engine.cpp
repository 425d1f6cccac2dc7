#include "transfer_test_support.h"

#include "link/open_views.h"
#include "platform/manual_clock.h"
#include "platform/operator.h"
#include "setpoints/audit_trail.h"
#include "setpoints/catalogue.h"
#include "setpoints/channels_transfer_engine.h"
#include "setpoints/upload_progress_engine.h"

#include <QSignalSpy>

using channel_record::RecordValue;
// Received text by store field.
using Values = QMap<int, QString>;

class TestChannelsTransferEngine : public QObject {
    Q_OBJECT
private slots:
    void init();
    void cleanup();
    void uploadOneChannelStoresEveryValue_data();
    void uploadOneChannelStoresEveryValue();
    void timeRepairCarriesForward_data();
    void timeRepairCarriesForward();
    void invalidValueInChannel100EndsUploadOfAll();
    void invalidChannelNumber();
    void messagesHoldTheUploadOfAll();
    void uploadAllRetriesThenGivesUp();
    void retryEmptiesHalfARecord();
    void checkRightAfterARepairedTime_data();
    void checkRightAfterARepairedTime();
    void pidValuesKeepTheirOwnRange_data();
    void pidValuesKeepTheirOwnRange();
    void lostLineEndsTheTransferAtOnce_data();
    void lostLineEndsTheTransferAtOnce();
    void uploadAllEndsAfterChannel216();
    void downloadAllWritesEveryChannelAndNormalisesDescriptions();
    void downloadWrongEchoIsSentAgainThenCountsAsTimeout();
    void downloadGivesUpAfterSixTimeouts();
    void downloadOneChannelTakesItAfterTheEcho();

private:
    // The valid value of a field that differs most from the template: its
    // info row's minimum.
    QString validValue(int field);
    void answerUploads(int count, const std::function<QString(int wire, int field)>& override = {});

    QStringList m_minimum;
    std::unique_ptr<TestInstrument> m_inst;
    std::unique_ptr<ManualClock> m_clock;
    std::unique_ptr<TestLink> m_link;
    std::unique_ptr<ScriptedOperator> m_op;
    std::unique_ptr<OpenViews> m_views;
    std::unique_ptr<upload_progress_engine> m_upload;
    std::unique_ptr<channels_transfer_engine> m_engine;
};

void TestChannelsTransferEngine::init()
{
    m_inst = std::make_unique<TestInstrument>();
    QVERIFY(m_inst->store);
    m_clock = std::make_unique<ManualClock>();
    m_link = std::make_unique<TestLink>();
    m_link->g.link_up = true;
    m_link->g.speed_factor = 2;
    m_link->g.instrument_version = QStringLiteral("14");
    m_op = std::make_unique<ScriptedOperator>();
    m_views = std::make_unique<OpenViews>();
    m_upload = std::make_unique<upload_progress_engine>();
    m_engine = std::make_unique<channels_transfer_engine>(*m_link, *m_clock, *m_op, *m_views, *m_inst->store,
                                                          *m_upload);
}

void TestChannelsTransferEngine::cleanup()
{
    m_engine.reset();
    m_inst.reset();
}

QString TestChannelsTransferEngine::validValue(int field)
{
    if (field == catalogue::kDescriptionField)
        return QStringLiteral("Dock 9");
    const int row = catalogue::replyRowOf(field);
    if (row < 0) // fields 223..227: their fixed ranges, 224's below zero
        return QString::number(channel_record::uncheckedRange(field).min + 5);
    if (m_minimum.isEmpty())
        for (const InfoValidationRow& r : infoValidationRows())
            m_minimum.append(channel_record::storeText(r.minimum));
    return m_minimum.value(row);
}

// Answers each "c" with the record of the next channel, as reply_do would hand it over.
void TestChannelsTransferEngine::answerUploads(int count, const std::function<QString(int, int)>& override)
{
    const double version = m_link->g.versionNumber();
    for (int wire = 0; wire < count && m_engine->transferRunning(); ++wire) {
        m_link->buffer = uploadRecordText(wire, version, [&](int field) {
            const QString o = override ? override(wire, field) : QString();
            return o.isNull() ? validValue(field) : o;
        });
        m_engine->sin_chan_up_load();
    }
}

void TestChannelsTransferEngine::uploadOneChannelStoresEveryValue_data()
{
    QTest::addColumn<QString>("version");
    QTest::addColumn<int>("channel");
    QTest::addColumn<int>("timer5");
    for (const char* v : {"6.5", "7", "8.5", "8.7", "14"})
        for (int ch : {1, 27, 33, 100, 201, 216})
            QTest::addRow("v%s ch%d", v, ch) << QString::fromLatin1(v) << ch << (ch == 1 ? 10000 : 8000);
}

void TestChannelsTransferEngine::uploadOneChannelStoresEveryValue()
{
    QFETCH(QString, version);
    QFETCH(int, channel);
    QFETCH(int, timer5);
    m_link->g.instrument_version = version;
    QSignalSpy ended(m_engine.get(), &channels_transfer_engine::transferEnded);
    m_engine->setChannel(channel);
    m_engine->uploadchan_Click();
    QCOMPARE(m_link->bodies(), QStringList{QStringLiteral("a%1,").arg(channel - 1)});
    QCOMPARE(m_link->out.first().count('Z'), 61);
    QCOMPARE(m_clock->remaining(&m_engine->Timer5), timer5);
    QVERIFY(!m_engine->uploadall.enabled && !m_engine->forms_enabled);

    const int wire = channel - 1;
    const QList<RecordValue> layout = channel_record::uploadLayout(wire, version.toDouble());
    m_link->buffer = uploadRecordText(wire, version.toDouble(), [&](int f) { return validValue(f); });
    m_engine->sin_chan_up_load();

    QCOMPARE(ended.count(), 1);
    QCOMPARE(ended.first().first().toBool(), true);
    QVERIFY2(m_op->messages().isEmpty(), qPrintable(m_op->last().toText()));
    QVERIFY(m_engine->uploadall.enabled && m_engine->forms_enabled);
    QVERIFY(!m_clock->isArmed(&m_engine->Timer5));
    QCOMPARE(m_op->beeps(), 1);
    QList<int> stored;
    for (const RecordValue& v : layout) {
        stored << v.field;
        QCOMPARE(channel_record::storeText(m_inst->store->setpoint(wire, v.field)), validValue(v.field));
    }
    // A field that is not in this channel's record keeps the template's value.
    for (int field : {2, 14, 168, 76, 223, 211, 213})
        if (!stored.contains(field))
            QCOMPARE(m_inst->store->setpoint(wire, field), templateSetpoint(wire, field));
}

void TestChannelsTransferEngine::timeRepairCarriesForward_data()
{
    QTest::addColumn<QList<int>>("fields");
    QTest::addColumn<QList<int>>("received");
    QTest::addColumn<QList<int>>("stored");
    QTest::addColumn<QStringList>("firstMessage");
    QTest::addColumn<int>("messages");

    QTest::newRow("set point times carry the repair")
        << QList<int>{6, 7, 8, 9} << QList<int>{600, 500, 550, 700} << QList<int>{600, 600, 600, 700}
        << QStringList{"Set point time 2 was earlier than set point time 1,",
                       "Set point time 2 has been set to the same as Set point time 1,",
                       "The Glacinor (Channel No. 5) must be updated and or changed to its correct time"}
        << 2;
    QTest::newRow("print time 4")
        << QList<int>{86, 87, 88, 89} << QList<int>{60, 120, 180, 100} << QList<int>{60, 120, 180, 180}
        << QStringList{"Print time 4 was earlier than print time 3,",
                       "Print time 4 has been set to the same as print time 3,",
                       "The Glacinor (Channel No. 5) must be updated and or changed to its correct time"}
        << 1;
    QTest::newRow("data log time 3")
        << QList<int>{91, 92, 93, 94} << QList<int>{0, 300, 299, 400} << QList<int>{0, 300, 300, 400}
        << QStringList{"Data log time 3 was earlier than data log time 2,",
                       "Data log time 3 has been set to the same as data log time 2,",
                       "The Glacinor (Channel No. 5) must be updated and or changed to its correct time"}
        << 1;
    QTest::newRow("defrost 8 later than 5 passes")
        << QList<int>{35, 36, 37, 38, 39, 40, 41, 42} << QList<int>{100, 200, 300, 400, 500, 600, 700, 550}
        << QList<int>{100, 200, 300, 400, 500, 600, 700, 550} << QStringList{} << 0;
    QTest::newRow("defrost 8 earlier than 5 takes 5")
        << QList<int>{35, 36, 37, 38, 39, 40, 41, 42} << QList<int>{100, 200, 300, 400, 500, 600, 700, 450}
        << QList<int>{100, 200, 300, 400, 500, 600, 700, 500}
        << QStringList{"Defrost time 8 was earlier than defrost time 7,",
                       "Defrost time 8 has been set to the same as defrost time 7,",
                       "The Glacinor (Channel No. 5) must be updated and or changed to its correct time"}
        << 1;
}

void TestChannelsTransferEngine::timeRepairCarriesForward()
{
    QFETCH(QList<int>, fields);
    QFETCH(QList<int>, received);
    QFETCH(QList<int>, stored);
    QFETCH(QStringList, firstMessage);
    QFETCH(int, messages);
    m_engine->setChannel(5);
    m_engine->uploadchan_Click();
    m_link->buffer = uploadRecordText(4, 14, [&](int f) {
        const int i = int(fields.indexOf(f));
        return i >= 0 ? QString::number(received[i]) : validValue(f);
    });
    m_engine->sin_chan_up_load();
    QCOMPARE(m_op->messages().size(), messages);
    if (messages) {
        QCOMPARE(m_op->messages().first().title, QStringLiteral("Wrong Time Value"));
        QCOMPARE(m_op->messages().first().icon, Operator::Icon::None);
        QCOMPARE(m_op->messages().first().lines, firstMessage);
    }
    for (int i = 0; i < fields.size(); ++i)
        QCOMPARE(m_inst->store->setpoint(4, fields[i]).toInt(), stored[i]);
}

void TestChannelsTransferEngine::invalidValueInChannel100EndsUploadOfAll()
{
    QSignalSpy ended(m_engine.get(), &channels_transfer_engine::transferEnded);
    m_engine->uploadall_Click();
    QCOMPARE(m_link->bodies(), QStringList{QStringLiteral("c")});
    QCOMPARE(m_upload->Label1.text, QStringLiteral("Channel 0 of 216 Channels Uploaded"));
    QCOMPARE(m_upload->Label2.text, QStringLiteral("Up Loading all Channels from the Glacinor"));
    // Channel 100's set temperature 1 is far out of range; its high alarm 1
    // before it in the record is valid but is not kept either.
    answerUploads(216, [](int wire, int field) {
        return wire == 99 && field == 2 ? QStringLiteral("  9999") : QString();
    });
    QCOMPARE(ended.count(), 1);
    QCOMPARE(ended.first().first().toBool(), false);
    QCOMPARE(m_link->count(QStringLiteral("c")), 100);
    QCOMPARE(m_op->messages().size(), 1);
    const Operator::Message m = m_op->last();
    QCOMPARE(m.title, QStringLiteral("Update Not Completed"));
    QCOMPARE(m.lines.value(1), QStringLiteral("The channel number was 100"));
    QVERIFY(m.lines.value(2).startsWith(QStringLiteral("The set point was ")));
    QVERIFY(!m_upload->loaded);
    QVERIFY(!m_clock->isArmed(&m_engine->Timer5) && !m_clock->isArmed(&m_engine->Timer6));
    QCOMPARE(channel_record::storeText(m_inst->store->setpoint(98, 14)), validValue(14));
    QCOMPARE(m_inst->store->setpoint(99, 14), templateSetpoint(99, 14));
    QCOMPARE(m_inst->store->setpoint(99, 2), templateSetpoint(99, 2));
    QCOMPARE(m_inst->store->setpoint(100, 14), templateSetpoint(100, 14));
}

void TestChannelsTransferEngine::invalidChannelNumber()
{
    QSignalSpy ended(m_engine.get(), &channels_transfer_engine::transferEnded);
    m_engine->uploadchan_Click();
    m_link->buffer = QStringLiteral("   2161schanupload");
    m_engine->sin_chan_up_load();
    QCOMPARE(m_op->last().lines, (QStringList{"The Channel number was invalid,", "Redo the last command"}));
    QCOMPARE(ended.count(), 1);
    QVERIFY(m_engine->downloadchan.enabled);
}

void TestChannelsTransferEngine::messagesHoldTheUploadOfAll()
{
    // A message box lets timers run beneath it; none may ask for a record
    // while one is half stored.
    m_op->setWhileShowing([this](const Operator::Message&) { m_clock->advance(60000); });
    m_engine->uploadall_Click();
    answerUploads(2, [](int wire, int field) {
        if (wire == 0 && field >= 6 && field <= 8)
            return QStringLiteral("600"); // and time 4 at midnight, before them
        return wire == 1 && field == 2 ? QStringLiteral("  9999") : QString();
    });
    QCOMPARE(m_op->titles(), (QStringList{"Wrong Time Value", "Update Not Completed"}));
    QCOMPARE(m_link->count(QStringLiteral("c")), 2);
    QVERIFY(!m_engine->transferRunning());
}

void TestChannelsTransferEngine::uploadAllRetriesThenGivesUp()
{
    QSignalSpy ended(m_engine.get(), &channels_transfer_engine::transferEnded);
    m_engine->uploadall_Click();
    // Speed factor 2: Timer6 first at 10 s, then every 6 s with Timer5
    // pushed 10 s out; the sixth count leaves it to Timer5.
    m_clock->advance(43999);
    QCOMPARE(m_link->count(QStringLiteral("c")), 6);
    QCOMPARE(m_link->discards, 5);
    QVERIFY(m_op->messages().isEmpty());
    m_link->buffer = QStringLiteral("     7 1 0 "); // a record cut off by the silence
    m_clock->advance(1);
    QCOMPARE(m_op->last().title, QStringLiteral("Comunications Failed"));
    QCOMPARE(m_link->buffer, QString());
    QCOMPARE(m_op->last().lines, (QStringList{"The comunication with the Glacinor was not successful,",
                                              "Re do the last command"}));
    QCOMPARE(ended.count(), 1);
    QVERIFY(m_engine->uploadall.enabled && m_engine->forms_enabled && !m_upload->loaded);
    m_clock->advance(100000);
    QCOMPARE(m_link->count(QStringLiteral("c")), 6);
    QCOMPARE(m_op->messages().size(), 1);
}

void TestChannelsTransferEngine::retryEmptiesHalfARecord()
{
    m_engine->uploadall_Click();
    const QString record = uploadRecordText(0, 14, [&](int f) { return validValue(f); });
    m_link->buffer = record.left(record.size() / 2);
    m_clock->advance(10000); // Timer6 asks again
    QCOMPARE(m_link->count(QStringLiteral("c")), 2);
    // The answer to the second "c" arrives whole behind whatever stayed.
    m_link->buffer += record;
    m_engine->sin_chan_up_load();
    QVERIFY2(m_op->messages().isEmpty(), qPrintable(m_op->last().toText()));
    for (const RecordValue& v : channel_record::uploadLayout(0, 14))
        QCOMPARE(channel_record::storeText(m_inst->store->setpoint(0, v.field)), validValue(v.field));
    QCOMPARE(m_link->count(QStringLiteral("c")), 3);
}

void TestChannelsTransferEngine::checkRightAfterARepairedTime_data()
{
    QTest::addColumn<Values>("received");
    QTest::addColumn<int>("reported"); // the field named in "The set point was"
    // Channel 5: set point time 4 is repaired, Sunday's mask behind it is 0.
    QTest::newRow("daily mask behind set point time 4")
        << Values{{6, "600"}, {7, "700"}, {8, "800"}, {9, "500"}, {54, "99"}} << 54;
    QTest::newRow("type of control behind defrost time 8")
        << Values{{35, "100"}, {36, "200"}, {37, "300"}, {38, "400"}, {39, "500"}, {40, "600"},
                              {41, "700"}, {42, "450"}, {51, "9"}}
        << 51;
    // An invalid time takes its default and is then repaired: the next value's check reports it.
    QTest::newRow("invalid time repaired, caught by the next")
        << Values{{6, "1439"}, {7, "9999"}, {8, "1439"}, {9, "1439"}} << 8;
}

void TestChannelsTransferEngine::checkRightAfterARepairedTime()
{
    QFETCH(Values, received);
    QFETCH(int, reported);
    QSignalSpy ended(m_engine.get(), &channels_transfer_engine::transferEnded);
    m_engine->setChannel(5);
    m_engine->uploadchan_Click();
    m_link->buffer = uploadRecordText(4, 14, [&](int f) { return received.value(f, validValue(f)); });
    m_engine->sin_chan_up_load();
    QCOMPARE(m_op->titles(), (QStringList{"Wrong Time Value", "Update Not Completed"}));
    const QString name = m_inst->store->info(catalogue::replyRowOf(reported), kInfoName).toString();
    QCOMPARE(m_op->last().lines.value(2), QStringLiteral("The set point was %1,").arg(name));
    QCOMPARE(ended.first().first().toBool(), false);
    for (int field : received.keys())
        QCOMPARE(m_inst->store->setpoint(4, field), templateSetpoint(4, field));
}

void TestChannelsTransferEngine::pidValuesKeepTheirOwnRange_data()
{
    QTest::addColumn<int>("field");
    QTest::addColumn<QString>("received");
    QTest::addColumn<bool>("valid");
    QTest::newRow("224 lowest") << 224 << "-30" << true;
    QTest::newRow("224 highest") << 224 << "30" << true;
    QTest::newRow("224 below") << 224 << "-31" << false;
    QTest::newRow("224 above") << 224 << "31" << false;
    QTest::newRow("223 negative") << 223 << "-5" << false;
    QTest::newRow("223 highest") << 223 << "100" << true;
    QTest::newRow("225 negative") << 225 << "-1" << false;
    QTest::newRow("227 above") << 227 << "101" << false;
}

void TestChannelsTransferEngine::pidValuesKeepTheirOwnRange()
{
    QFETCH(int, field);
    QFETCH(QString, received);
    QFETCH(bool, valid);
    m_engine->setChannel(3);
    m_engine->uploadchan_Click();
    m_link->buffer = uploadRecordText(2, 14, [&](int f) { return f == field ? received : validValue(f); });
    m_engine->sin_chan_up_load();
    if (valid) {
        QVERIFY2(m_op->messages().isEmpty(), qPrintable(m_op->last().toText()));
        QCOMPARE(channel_record::storeText(m_inst->store->setpoint(2, field)), received);
    } else {
        QCOMPARE(m_op->titles(), QStringList{"Update Not Completed"});
        QCOMPARE(m_op->last().lines.value(3),
                 QStringLiteral("The Default value of 20 was placed in this setpoint on the computer"));
        QCOMPARE(m_inst->store->setpoint(2, field), templateSetpoint(2, field));
    }
}

void TestChannelsTransferEngine::lostLineEndsTheTransferAtOnce_data()
{
    QTest::addColumn<bool>("upload");
    QTest::newRow("upload of all") << true;
    QTest::newRow("download of all") << false;
}

void TestChannelsTransferEngine::lostLineEndsTheTransferAtOnce()
{
    QFETCH(bool, upload);
    QVERIFY(m_inst->store->setSetpoint(3, 2, 77)); // the store's own value for channel 4
    QSignalSpy ended(m_engine.get(), &channels_transfer_engine::transferEnded);
    if (upload) {
        m_engine->uploadall_Click();
        for (int wire = 0; wire < 3; ++wire) {
            m_link->lineOpen = wire < 2; // channel 3 arrives; asking for channel 4 fails
            m_link->buffer = uploadRecordText(wire, 14, [&](int f) { return validValue(f); });
            m_engine->sin_chan_up_load();
        }
    } else {
        m_engine->downloadall_Click();
        for (int i = 0; i < 2; ++i) {
            m_link->buffer = m_engine->sent_to_glacinor;
            m_engine->down_check();
            m_engine->done_down();
        }
        m_link->buffer = m_engine->sent_to_glacinor;
        m_engine->down_check();
        m_link->lineOpen = false;
        m_engine->done_down();
    }
    QCOMPARE(ended.count(), 1);
    QCOMPARE(ended.first().first().toBool(), false);
    QCOMPARE(m_op->titles(), QStringList{"Comunications Failed"});
    QCOMPARE(m_engine->channelsTransferred(), 3);
    QCOMPARE(m_engine->channelsInTransfer(), 216);
    QVERIFY(!m_clock->isArmed(&m_engine->Timer5) && !m_clock->isArmed(&m_engine->Timer6));
    QVERIFY(m_engine->uploadall.enabled && m_engine->forms_enabled);
    QCOMPARE(m_inst->store->setpoint(3, 2).toInt(), 77);
}

void TestChannelsTransferEngine::uploadAllEndsAfterChannel216()
{
    QSignalSpy ended(m_engine.get(), &channels_transfer_engine::transferEnded);
    m_engine->setChannel(1);
    m_engine->uploadall_Click();
    answerUploads(216, [](int wire, int field) {
        return field == catalogue::kConnectedField ? QString::number(wire % 2) : QString();
    });
    QCOMPARE(ended.count(), 1);
    QCOMPARE(ended.first().first().toBool(), true);
    QCOMPARE(m_link->count(QStringLiteral("c")), 216);
    QVERIFY(!m_clock->isArmed(&m_engine->Timer5) && !m_clock->isArmed(&m_engine->Timer6));
    QVERIFY(m_engine->Command1_struck[0] && !m_engine->Command1_struck[1] && !m_engine->Command1_struck[215]);
    m_clock->advance(60000);
    QCOMPARE(m_link->count(QStringLiteral("c")), 216);
    QVERIFY(m_op->messages().isEmpty());
}

void TestChannelsTransferEngine::downloadAllWritesEveryChannelAndNormalisesDescriptions()
{
    m_inst->store->setSetpoint(6, catalogue::kDescriptionField, QString());
    m_inst->store->setSetpoint(8, catalogue::kDescriptionField, QStringLiteral("Freezer 9"));
    QString error;
    std::unique_ptr<AuditTrail> audit = AuditTrail::open(m_inst->store->store(), *m_clock, &error);
    QVERIFY2(audit, qPrintable(error));
    m_engine->setAuditTrail(audit.get());
    QSignalSpy ended(m_engine.get(), &channels_transfer_engine::transferEnded);
    m_engine->downloadall_Click();
    QCOMPARE(m_upload->Label1.text, QStringLiteral("Channel 1 of 216 Channels Downloaded"));
    QCOMPARE(m_clock->remaining(&m_engine->Timer5), 10000);
    QStringList records;
    for (int i = 0; i < 216 && m_engine->transferRunning(); ++i) {
        const QString body = m_link->bodies().last();
        QVERIFY(body.startsWith(QLatin1Char('d')));
        records << body.mid(1);
        m_link->buffer = body.mid(1) + QStringLiteral("downcheck");
        m_engine->down_check();
        QCOMPARE(m_link->out.last(), QByteArray("e"));
        m_link->buffer = QStringLiteral("donedown");
        m_engine->done_down();
    }
    QCOMPARE(ended.count(), 1);
    QCOMPARE(ended.first().first().toBool(), true);
    QCOMPARE(records.size(), 216);
    QVERIFY(records[6].startsWith(QStringLiteral("6,")));
    QVERIFY(records[6].contains(QStringLiteral(",Ch 7  ,")));
    QVERIFY(records[8].contains(QStringLiteral(",Freeze,")));
    QCOMPARE(m_inst->store->setpoint(6, catalogue::kDescriptionField).toString(), QStringLiteral("Ch 7  "));
    QCOMPARE(m_inst->store->setpoint(8, catalogue::kDescriptionField).toString(), QStringLiteral("Freeze"));
    QVERIFY(!m_clock->isArmed(&m_engine->Timer5) && !m_upload->loaded && !m_engine->down_running);
    const QList<AuditEntry> entries = audit->entries();
    QCOMPARE(entries.size(), 216);
    QCOMPARE(entries.last().channel, 216);
    QCOMPARE(entries.last().outcome, QStringLiteral("X"));
    QCOMPARE(entries.last().newValue, records.last());
}

void TestChannelsTransferEngine::downloadWrongEchoIsSentAgainThenCountsAsTimeout()
{
    m_engine->downloadall_Click();
    const QString first = m_link->bodies().last();
    for (int i = 1; i <= 3; ++i) {
        m_link->buffer = QStringLiteral("0,garbled,downcheck");
        m_engine->down_check();
        QCOMPARE(m_link->bodies().last(), first);
        QCOMPARE(m_clock->remaining(&m_engine->Timer5), 10000);
    }
    QCOMPARE(m_link->count(first), 4);
    m_engine->down_check();
    QCOMPARE(m_link->count(first), 4);
    QCOMPARE(m_clock->remaining(&m_engine->Timer5), 400);
    m_clock->advance(400);
    QCOMPARE(m_engine->down_timeouts, 1);
    QCOMPARE(m_link->count(first), 5);
    QVERIFY(m_op->messages().isEmpty());
}

void TestChannelsTransferEngine::downloadGivesUpAfterSixTimeouts()
{
    QSignalSpy ended(m_engine.get(), &channels_transfer_engine::transferEnded);
    m_engine->downloadall_Click();
    // Channel 1 goes through after two time-outs; the count runs on.
    m_clock->advance(10000);
    m_clock->advance(10000);
    QCOMPARE(m_engine->down_timeouts, 2);
    m_link->buffer = m_link->bodies().last().mid(1) + QStringLiteral("downcheck");
    m_engine->down_check();
    m_engine->done_down();
    QCOMPARE(m_engine->down_channel, 1);
    m_clock->advance(8000);            // 3rd
    m_clock->advance(3 * 10000 - 1);   // 4th, 5th, almost the 6th
    QCOMPARE(m_engine->down_timeouts, 5);
    QVERIFY(m_op->messages().isEmpty());
    m_link->buffer = QStringLiteral("     7 1 0 "); // a record cut off by the silence
    m_clock->advance(1);
    QCOMPARE(m_op->last().title, QStringLiteral("Comunications Failed"));
    QCOMPARE(m_link->buffer, QString());
    QCOMPARE(ended.count(), 1);
    QVERIFY(!m_engine->down_running && m_engine->downloadall.enabled);
}

void TestChannelsTransferEngine::downloadOneChannelTakesItAfterTheEcho()
{
    m_link->g.instrument_version = QStringLiteral("8.0");
    m_engine->setChannel(1);
    m_engine->downloadchan_Click();
    const QString body = m_link->bodies().last();
    QCOMPARE(int(body.count(QLatin1Char(','))), 221);
    QCOMPARE(m_clock->remaining(&m_engine->Timer5), 10000);
    m_link->buffer = QStringLiteral("garbled downcheck");
    m_engine->down_check();
    QCOMPARE(m_link->out.size(), 1);
    m_link->buffer = body.mid(1) + QStringLiteral("downcheck");
    m_engine->down_check();
    QCOMPARE(m_link->out.last(), QByteArray("e"));
    QCOMPARE(m_op->beeps(), 1);
    QSignalSpy ended(m_engine.get(), &channels_transfer_engine::transferEnded);
    m_engine->done_down();
    QCOMPARE(ended.count(), 1);
    QVERIFY(!m_clock->isArmed(&m_engine->Timer5) && m_engine->forms_enabled);
}

QTEST_GUILESS_MAIN(TestChannelsTransferEngine)
#include "tst_channels_transfer_engine.moc"
