#include "transfer_test_support.h"

#include "link/open_views.h"
#include "platform/manual_clock.h"
#include "platform/operator.h"
#include "setpoints/audit_trail.h"
#include "setpoints/catalogue.h"
#include "setpoints/channels_transfer_engine.h"
#include "setpoints/upload_progress_engine.h"

// Which channels a download may send without --force: those whose rows came
// from the instrument by an upload or by an edit it confirmed.
class TestChannelSources : public QObject {
    Q_OBJECT
private slots:
    void init();
    void cleanup();
    void onlyUploadsAndConfirmedEditsFillAChannel_data();
    void onlyUploadsAndConfirmedEditsFillAChannel();
    void marksOutlastTheProgram();
    void refusalNamesTheChannels();

private:
    void upload(int channel, bool valid);
    void edit(int function, int channel, const QString& value, bool confirmed);

    std::unique_ptr<TestInstrument> m_inst;
    std::unique_ptr<ManualClock> m_clock;
    std::unique_ptr<TestLink> m_link;
    std::unique_ptr<ScriptedOperator> m_op;
    std::unique_ptr<OpenViews> m_views;
    std::unique_ptr<upload_progress_engine> m_upload;
    std::unique_ptr<AuditTrail> m_audit;
    std::unique_ptr<channels_transfer_engine> m_engine;
};

void TestChannelSources::init()
{
    m_inst = std::make_unique<TestInstrument>();
    QVERIFY(m_inst->store);
    m_clock = std::make_unique<ManualClock>();
    m_link = std::make_unique<TestLink>();
    m_link->g.link_up = true;
    m_link->g.speed_factor = 1;
    m_link->g.instrument_version = QStringLiteral("14");
    m_op = std::make_unique<ScriptedOperator>();
    m_views = std::make_unique<OpenViews>();
    m_upload = std::make_unique<upload_progress_engine>();
    m_audit = AuditTrail::open(m_inst->store->store(), *m_clock);
    QVERIFY(m_audit);
    m_engine = std::make_unique<channels_transfer_engine>(*m_link, *m_clock, *m_op, *m_views, *m_inst->store,
                                                          *m_upload);
    m_engine->setAuditTrail(m_audit.get());
}

void TestChannelSources::cleanup()
{
    m_engine.reset();
    m_audit.reset();
    m_inst.reset();
}

void TestChannelSources::upload(int channel, bool valid)
{
    m_engine->setChannel(channel);
    m_engine->uploadchan_Click();
    m_link->buffer = uploadRecordText(channel - 1, 14, [&](int field) {
        // The template's own values pass the checks; a connected flag of 7 does not.
        if (!valid && field == catalogue::kConnectedField)
            return QStringLiteral("7");
        return channel_record::storeText(templateSetpoint(channel - 1, field));
    });
    m_engine->sin_chan_up_load();
}

void TestChannelSources::edit(int function, int channel, const QString& value, bool confirmed)
{
    QString error;
    QVERIFY2(m_engine->writer.writeValue(function, channel, 0, value, &error), qPrintable(error));
    m_link->buffer = confirmed ? m_engine->writer.sent_to_glacinor : QStringLiteral("garbled sret");
    m_engine->writer.ret_handel();
    m_clock->advance(60000);
}

void TestChannelSources::onlyUploadsAndConfirmedEditsFillAChannel_data()
{
    QTest::addColumn<QString>("action");
    QTest::addColumn<QList<int>>("never"); // of channels 1, 5 and 6
    QTest::newRow("a fresh store") << "" << QList<int>{1, 5, 6};
    QTest::newRow("upload of channel 5") << "upload" << QList<int>{1, 6};
    QTest::newRow("refused upload of channel 5") << "bad upload" << QList<int>{1, 5, 6};
    QTest::newRow("confirmed edit of channel 5") << "edit" << QList<int>{1, 6};
    QTest::newRow("edit without its echo") << "lost edit" << QList<int>{1, 5, 6};
    QTest::newRow("confirmed global edit") << "global edit" << QList<int>{5, 6};
}

void TestChannelSources::onlyUploadsAndConfirmedEditsFillAChannel()
{
    QFETCH(QString, action);
    QFETCH(QList<int>, never);
    if (action == QLatin1String("upload") || action == QLatin1String("bad upload"))
        upload(5, action == QLatin1String("upload"));
    else if (action == QLatin1String("edit") || action == QLatin1String("lost edit"))
        edit(47, 5, QStringLiteral("99"), action == QLatin1String("edit"));
    else if (action == QLatin1String("global edit"))
        edit(86, 5, QStringLiteral("3"), true);
    QList<int> got;
    for (int channel : channels_transfer_engine::channelsNeverFilled(*m_inst->store, 0))
        if (channel == 1 || channel == 5 || channel == 6)
            got << channel;
    QCOMPARE(got, never);
    QCOMPARE(channels_transfer_engine::channelsNeverFilled(*m_inst->store, 5).isEmpty(), !never.contains(5));
}

void TestChannelSources::marksOutlastTheProgram()
{
    upload(9, true);
    m_engine.reset();
    m_audit.reset();
    m_inst->store.reset();
    std::unique_ptr<InstrumentStore> again = InstrumentStore::open(m_inst->dir.filePath(QStringLiteral("t-1.db")));
    QVERIFY(again);
    QVERIFY(channels_transfer_engine::channelsNeverFilled(*again, 9).isEmpty());
    QCOMPARE(channels_transfer_engine::channelsNeverFilled(*again, 0).size(), 215);
}

void TestChannelSources::refusalNamesTheChannels()
{
    for (int channel : {2, 3, 4})
        upload(channel, true);
    const QStringList all = channels_transfer_engine::neverFilledText(
        channels_transfer_engine::channelsNeverFilled(*m_inst->store, 0));
    QCOMPARE(all.value(0), QStringLiteral("213 of 216 channels (1, 5-216) have never been uploaded from the "
                                          "Glacinor or edited,"));
    const QStringList one = channels_transfer_engine::neverFilledText({7});
    QCOMPARE(one.value(0), QStringLiteral("Channel 7 has never been uploaded from the Glacinor or edited,"));
    QVERIFY(channels_transfer_engine::neverFilledText({}).isEmpty());
}

QTEST_MAIN(TestChannelSources)
#include "tst_channel_sources.moc"
