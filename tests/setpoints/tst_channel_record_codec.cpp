#include "setpoints/catalogue.h"
#include "setpoints/channel_record_codec.h"

#include <QtTest>

using namespace channel_record;

namespace {

const RecordValue* find(const QList<RecordValue>& values, int field)
{
    for (const RecordValue& v : values)
        if (v.field == field)
            return &v;
    return nullptr;
}

} // namespace

class TestChannelRecordCodec : public QObject {
    Q_OBJECT
private slots:
    void functionsStandInTheRecordOfTheirLastChannel();
    void uploadOrderIsTheInfoOrder();
    void recordEnds_data();
    void recordEnds();
    void positions_data();
    void positions();
    void recordChannel_data();
    void recordChannel();
    void downloadRecord_data();
    void downloadRecord();
    void descriptionNormalised_data();
    void descriptionNormalised();
};

void TestChannelRecordCodec::functionsStandInTheRecordOfTheirLastChannel()
{
    for (const catalogue::Function& f : catalogue::functions()) {
        const int last = catalogue::lastChannel(f.scope);
        const QList<RecordValue> up = uploadLayout(last - 1, 14);
        const QList<int> down = downloadFields(last - 1, 14);
        const QList<RecordValue> beyond = uploadLayout(last, 14);
        for (int sub = 0; sub < int(f.fields.size()); ++sub) {
            const int field = f.field(sub);
            if (field == catalogue::kNoField)
                continue;
            QVERIFY2(find(up, field), qPrintable(QStringLiteral("%1 of channel %2").arg(field).arg(last)));
            QVERIFY2(down.contains(field), qPrintable(QString::number(field)));
            // A global value may come with other channels too; a channel's
            // value never with a channel that has no such function.
            if (!f.isGlobal() && last < catalogue::kChannels)
                QVERIFY2(!find(beyond, field), qPrintable(QStringLiteral("%1 of channel %2").arg(field).arg(last + 1)));
        }
    }
}

void TestChannelRecordCodec::uploadOrderIsTheInfoOrder()
{
    const QList<RecordValue> values = uploadLayout(0, 14);
    const auto order = catalogue::replyOrderFields();
    int row = 0;
    for (const RecordValue& v : values) {
        if (v.kind == ValueKind::Unchecked) {
            QCOMPARE(v.infoRow, -1);
            continue;
        }
        QCOMPARE(v.infoRow, row);
        QCOMPARE(v.field, int(order[std::size_t(row)]));
        QCOMPARE(v.kind == ValueKind::Description, v.field == catalogue::kDescriptionField);
        ++row;
    }
    QCOMPARE(row, int(order.size()));
}

void TestChannelRecordCodec::recordEnds_data()
{
    QTest::addColumn<double>("version");
    QTest::addColumn<int>("channel");
    QTest::addColumn<int>("last"); // position of the record's last character
    QTest::newRow("1 in 7, narrow 165") << 7.0 << 1 << 1014;
    QTest::newRow("1 in 8.5") << 8.5 << 1 << 1019;
    QTest::newRow("1 in 8.6") << 8.6 << 1 << 1031;
    QTest::newRow("1 in 14") << 14.0 << 1 << 1041;
    QTest::newRow("28 in 14") << 14.0 << 28 << 393;
    QTest::newRow("33 in 14") << 14.0 << 33 << 375;
    QTest::newRow("67 in 14") << 14.0 << 67 << 363;
    QTest::newRow("101") << 14.0 << 101 << 189;
    QTest::newRow("216") << 6.5 << 216 << 63;
}

void TestChannelRecordCodec::recordEnds()
{
    QFETCH(double, version);
    QFETCH(int, channel);
    QFETCH(int, last);
    const QList<RecordValue> values = uploadLayout(channel - 1, version);
    QVERIFY(!values.isEmpty());
    QCOMPARE(values.last().position + values.last().width - 1, last);
}

void TestChannelRecordCodec::positions_data()
{
    QTest::addColumn<double>("version");
    QTest::addColumn<int>("channel");
    QTest::addColumn<int>("field");
    QTest::addColumn<int>("position"); // -1: not in the record
    QTest::addColumn<int>("width");
    QTest::newRow("223 not below 14") << 9.6 << 1 << 223 << -1 << 0;
    QTest::newRow("168 behind the filler") << 7.0 << 27 << 168 << 394 << 6;
    QTest::newRow("165 wide in 6.5") << 6.5 << 27 << 165 << 400 << 6;
    QTest::newRow("banks narrow") << 7.0 << 1 << 83 << 894 << 1;
    QTest::newRow("banks wide") << 14.0 << 1 << 83 << 899 << 1;
    QTest::newRow("213 in 8.7") << 8.7 << 1 << 213 << 1032 << 1;
}

void TestChannelRecordCodec::positions()
{
    QFETCH(double, version);
    QFETCH(int, channel);
    QFETCH(int, field);
    QFETCH(int, position);
    QFETCH(int, width);
    const QList<RecordValue> values = uploadLayout(channel - 1, version);
    const RecordValue* v = find(values, field);
    QCOMPARE(v != nullptr, position >= 0);
    if (v) {
        QCOMPARE(v->position, position);
        QCOMPARE(v->width, width);
    }
}

void TestChannelRecordCodec::recordChannel_data()
{
    QTest::addColumn<QString>("record");
    QTest::addColumn<int>("channel");
    QTest::newRow("215") << "   2151" << 215;
    QTest::newRow("216") << "   2161" << -1;
    QTest::newRow("negative") << "    -11" << -1;
    QTest::newRow("garbled") << "   2x51" << -1;
}

void TestChannelRecordCodec::recordChannel()
{
    QFETCH(QString, record);
    QFETCH(int, channel);
    QCOMPARE(channel_record::recordChannel(record), channel);
}

void TestChannelRecordCodec::downloadRecord_data()
{
    QTest::addColumn<double>("version");
    QTest::addColumn<int>("wire");
    QTest::addColumn<int>("values"); // values behind the channel
    QTest::addColumn<QString>("tail");
    QTest::newRow("216") << 14.0 << 215 << 12 << "215,1,85,86,87,88,89,Ch 216,90,91,92,93,94,";
    QTest::newRow("200") << 7.0 << 199 << 33 << ",58,59,60,";
    QTest::newRow("34 in 14") << 14.0 << 33 << 74 << ",12,223,224,";
    QTest::newRow("33 takes 225-227") << 14.0 << 32 << 77 << ",12,223,224,225,226,227,";
    QTest::newRow("33 below 14") << 9.6 << 32 << 72 << ",210,12,";
    QTest::newRow("27 below 14") << 7.0 << 26 << 77 << ",12,168,165,166,207,167,";
    QTest::newRow("1 in 8.0 keeps 211-222") << 8.0 << 0 << 220
                                            << ",99,211,212,213,214,215,216,217,218,219,220,221,222,";
    QTest::newRow("1 in 14") << 14.0 << 0 << 225 << ",221,222,";
}

void TestChannelRecordCodec::downloadRecord()
{
    QFETCH(double, version);
    QFETCH(int, wire);
    QFETCH(int, values);
    QFETCH(QString, tail);
    // Each field holds its own ordinal; the description is already six characters.
    const QString record = channel_record::downloadRecord(wire, version, [wire](int field) -> QVariant {
        if (field == catalogue::kDescriptionField)
            return normalisedDescription(QString(), wire);
        return qlonglong(field);
    });
    QVERIFY2(record.endsWith(tail), qPrintable(record.right(80)));
    QVERIFY(record.startsWith(QString::number(wire) + QLatin1Char(',')));
    QCOMPARE(int(record.count(QLatin1Char(','))), values + 1);
}

void TestChannelRecordCodec::descriptionNormalised_data()
{
    QTest::addColumn<QString>("stored");
    QTest::addColumn<int>("wire");
    QTest::addColumn<QString>("sent");
    QTest::newRow("empty 7") << "" << 6 << "Ch 7  ";
    QTest::newRow("nine cut") << "Freezer 1" << 3 << "Freeze";
    QTest::newRow("six kept") << "Dock 1" << 3 << "Dock 1";
}

void TestChannelRecordCodec::descriptionNormalised()
{
    QFETCH(QString, stored);
    QFETCH(int, wire);
    QFETCH(QString, sent);
    QCOMPARE(normalisedDescription(stored, wire), sent);
}

QTEST_GUILESS_MAIN(TestChannelRecordCodec)
#include "tst_channel_record_codec.moc"
