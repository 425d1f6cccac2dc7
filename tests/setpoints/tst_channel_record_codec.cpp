#include "setpoints/catalogue.h"
#include "setpoints/channel_record_codec.h"

#include <QtTest>

using namespace channel_record;

namespace {

const QList<double> kVersions = {6.5, 7, 8, 8.5, 8.6, 8.7, 9.6, 14};

int lastPosition(const QList<RecordValue>& values)
{
    return values.isEmpty() ? 6 : values.last().position + values.last().width - 1;
}

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
    void uploadRecordEnds_data();
    void uploadRecordEnds();
    void uploadPositions_data();
    void uploadPositions();
    void uploadOrderIsTheInfoOrder();
    void fillerKeepsLaterPositions_data();
    void fillerKeepsLaterPositions();
    void recordChannel_data();
    void recordChannel();
    void downloadValueCounts_data();
    void downloadValueCounts();
    void downloadRecord_data();
    void downloadRecord();
    void descriptionNormalised_data();
    void descriptionNormalised();
};

void TestChannelRecordCodec::uploadRecordEnds_data()
{
    QTest::addColumn<double>("version");
    QTest::addColumn<int>("channel");
    QTest::addColumn<int>("last");
    // Last position of the record, one column per version:
    //                       6.5   7     8     8.5   8.6   8.7   9.6   14
    const QList<QPair<int, QList<int>>> table = {
        {1, {1019, 1014, 1019, 1019, 1031, 1041, 1041, 1041}},
        {27, {423, 418, 423, 423, 423, 423, 423, 423}},
        {28, {363, 363, 363, 363, 363, 363, 363, 393}},
        {32, {363, 363, 363, 363, 363, 363, 363, 393}},
        {33, {363, 363, 363, 363, 363, 363, 363, 375}},
        {66, {363, 363, 363, 363, 363, 363, 363, 375}},
        {67, {363, 363, 363, 363, 363, 363, 363, 363}},
        {100, {363, 363, 363, 363, 363, 363, 363, 363}},
        {101, {189, 189, 189, 189, 189, 189, 189, 189}},
        {200, {189, 189, 189, 189, 189, 189, 189, 189}},
        {201, {63, 63, 63, 63, 63, 63, 63, 63}},
        {216, {63, 63, 63, 63, 63, 63, 63, 63}},
    };
    for (const auto& [channel, ends] : table)
        for (int i = 0; i < kVersions.size(); ++i)
            QTest::addRow("v%s ch%d", qPrintable(QString::number(kVersions[i])), channel)
                << kVersions[i] << channel << ends[i];
}

void TestChannelRecordCodec::uploadRecordEnds()
{
    QFETCH(double, version);
    QFETCH(int, channel);
    QFETCH(int, last);
    QCOMPARE(lastPosition(uploadLayout(channel - 1, version)), last);
}

void TestChannelRecordCodec::uploadPositions_data()
{
    QTest::addColumn<double>("version");
    QTest::addColumn<int>("channel");
    QTest::addColumn<int>("field");
    QTest::addColumn<int>("position"); // -1: not in the record
    QTest::addColumn<int>("width");
    QTest::addColumn<int>("infoRow");

    QTest::newRow("connected") << 14.0 << 216 << 1 << 7 << 1 << 0;
    QTest::newRow("description") << 9.6 << 1 << 25 << 33 << 6 << 6;
    QTest::newRow("data log time 4") << 7.0 << 201 << 94 << 58 << 6 << 11;
    QTest::newRow("high alarm 1") << 7.0 << 200 << 14 << 64 << 6 << 12;
    QTest::newRow("saturday mask") << 7.0 << 101 << 60 << 184 << 6 << 32;
    QTest::newRow("long term store") << 7.0 << 100 << 52 << 195 << 1 << 38;
    QTest::newRow("defrost time 8") << 14.0 << 67 << 42 << 304 << 6 << 57;
    QTest::newRow("pid check delay") << 14.0 << 100 << 210 << 352 << 6 << 70;
    QTest::newRow("soft defrost") << 8.0 << 100 << 12 << 358 << 6 << 71;
    QTest::newRow("223 from 14") << 14.0 << 66 << 223 << 364 << 6 << -1;
    QTest::newRow("225 from 14") << 14.0 << 32 << 225 << 376 << 6 << -1;
    QTest::newRow("227 not channel 33") << 14.0 << 33 << 227 << -1 << 0 << 0;
    QTest::newRow("223 not below 14") << 9.6 << 1 << 223 << -1 << 0 << 0;
    QTest::newRow("168 behind the filler") << 7.0 << 27 << 168 << 394 << 6 << 72;
    QTest::newRow("165 narrow in 7") << 7.0 << 27 << 165 << 400 << 1 << 73;
    QTest::newRow("165 wide in 6.5") << 6.5 << 27 << 165 << 400 << 6 << 73;
    QTest::newRow("165 wide in 8") << 8.0 << 1 << 165 << 400 << 6 << 73;
    QTest::newRow("166 narrow") << 7.0 << 27 << 166 << 401 << 6 << 74;
    QTest::newRow("166 wide") << 14.0 << 27 << 166 << 406 << 6 << 74;
    QTest::newRow("202 narrow") << 7.0 << 15 << 202 << 419 << 6 << 77;
    QTest::newRow("202 wide") << 9.6 << 15 << 202 << 424 << 6 << 77;
    QTest::newRow("202 not channel 16") << 9.6 << 16 << 202 << -1 << 0 << 0;
    QTest::newRow("169 narrow") << 7.0 << 12 << 169 << 455 << 1 << 83;
    QTest::newRow("76 not channel 12") << 7.0 << 12 << 76 << -1 << 0 << 0;
    QTest::newRow("slow load 1") << 7.0 << 1 << 110 << 654 << 4 << 117;
    QTest::newRow("rotation 1") << 7.0 << 1 << 171 << 854 << 1 << 167;
    QTest::newRow("banks narrow") << 7.0 << 1 << 83 << 894 << 1 << 182;
    QTest::newRow("banks wide") << 14.0 << 1 << 83 << 899 << 1 << 182;
    QTest::newRow("pulse delay") << 7.0 << 1 << 99 << 1009 << 6 << 207;
    QTest::newRow("211 not in 8.5") << 8.5 << 1 << 211 << -1 << 0 << 0;
    QTest::newRow("211 in 8.6") << 8.6 << 1 << 211 << 1020 << 6 << 208;
    QTest::newRow("213 not in 8.6") << 8.6 << 1 << 213 << -1 << 0 << 0;
    QTest::newRow("213 in 8.7") << 8.7 << 1 << 213 << 1032 << 1 << 210;
    QTest::newRow("222 in 14") << 14.0 << 1 << 222 << 1041 << 1 << 219;
}

void TestChannelRecordCodec::uploadPositions()
{
    QFETCH(double, version);
    QFETCH(int, channel);
    QFETCH(int, field);
    QFETCH(int, position);
    QFETCH(int, width);
    QFETCH(int, infoRow);
    const QList<RecordValue> values = uploadLayout(channel - 1, version);
    const RecordValue* v = find(values, field);
    if (position < 0) {
        QVERIFY(!v);
        return;
    }
    QVERIFY(v);
    QCOMPARE(v->position, position);
    QCOMPARE(v->width, width);
    QCOMPARE(v->infoRow, infoRow);
}

void TestChannelRecordCodec::uploadOrderIsTheInfoOrder()
{
    // The values of channel 1 of the newest firmware take the info rows in
    // the catalogue's reply order, one row each, 223..227 without a row.
    const QList<RecordValue> values = uploadLayout(0, 14);
    const auto order = catalogue::replyOrderFields();
    int row = 0;
    for (const RecordValue& v : values) {
        if (v.field >= 223 && v.field <= 227) {
            QCOMPARE(v.kind, ValueKind::Unchecked);
            continue;
        }
        QCOMPARE(v.infoRow, row);
        QCOMPARE(v.field, int(order[std::size_t(row)]));
        ++row;
    }
    QCOMPARE(row, int(order.size()));
}

void TestChannelRecordCodec::fillerKeepsLaterPositions_data()
{
    QTest::addColumn<double>("version");
    QTest::addColumn<int>("channel");
    QTest::addColumn<int>("rawPosition"); // where the instrument puts field 168
    QTest::newRow("7 ch 1") << 7.0 << 1 << 364;
    QTest::newRow("9.6 ch 27") << 9.6 << 27 << 364;
    QTest::newRow("14 ch 1") << 14.0 << 1 << 394;
}

void TestChannelRecordCodec::fillerKeepsLaterPositions()
{
    QFETCH(double, version);
    QFETCH(int, channel);
    QFETCH(int, rawPosition);
    QString raw = QString(rawPosition - 1, QLatin1Char('0')) + QStringLiteral("   123") + QString(700, QLatin1Char('0'));
    raw.replace(0, 6, QString::number(channel - 1).rightJustified(6));
    const QString record = widenedRecord(raw, channel - 1, version);
    const RecordValue* v = find(uploadLayout(channel - 1, version), 168);
    QVERIFY(v);
    QCOMPARE(valueText(record, *v), QStringLiteral("   123"));
    QCOMPARE(uploadNumber(valueText(record, *v)), QVariant(qlonglong(123)));
}

void TestChannelRecordCodec::recordChannel_data()
{
    QTest::addColumn<QString>("record");
    QTest::addColumn<int>("channel");
    QTest::newRow("0") << "     0101" << 0;
    QTest::newRow("215") << "   2151" << 215;
    QTest::newRow("216") << "   2161" << -1;
    QTest::newRow("negative") << "    -11" << -1;
    QTest::newRow("garbled") << "   2x51" << -1;
    QTest::newRow("short") << "" << -1;
}

void TestChannelRecordCodec::recordChannel()
{
    QFETCH(QString, record);
    QFETCH(int, channel);
    QCOMPARE(channel_record::recordChannel(record), channel);
}

void TestChannelRecordCodec::downloadValueCounts_data()
{
    QTest::addColumn<double>("version");
    QTest::addColumn<int>("channel");
    QTest::addColumn<int>("values");
    // Values behind the channel number, one column per version:
    //                       6.5  7    8    8.5  8.6  8.7  9.6  14
    const QList<QPair<int, QList<int>>> table = {
        {1, {220, 220, 220, 220, 220, 220, 220, 225}},
        {27, {77, 77, 77, 77, 77, 77, 77, 82}},
        {28, {72, 72, 72, 72, 72, 72, 72, 77}},
        {32, {72, 72, 72, 72, 72, 72, 72, 77}},
        {33, {72, 72, 72, 72, 72, 72, 72, 77}},
        {66, {72, 72, 72, 72, 72, 72, 72, 74}},
        {67, {72, 72, 72, 72, 72, 72, 72, 72}},
        {100, {72, 72, 72, 72, 72, 72, 72, 72}},
        {101, {33, 33, 33, 33, 33, 33, 33, 33}},
        {200, {33, 33, 33, 33, 33, 33, 33, 33}},
        {201, {12, 12, 12, 12, 12, 12, 12, 12}},
        {216, {12, 12, 12, 12, 12, 12, 12, 12}},
    };
    for (const auto& [channel, counts] : table)
        for (int i = 0; i < kVersions.size(); ++i)
            QTest::addRow("v%s ch%d", qPrintable(QString::number(kVersions[i])), channel)
                << kVersions[i] << channel << counts[i];
}

void TestChannelRecordCodec::downloadValueCounts()
{
    QFETCH(double, version);
    QFETCH(int, channel);
    QFETCH(int, values);
    QCOMPARE(int(downloadFields(channel - 1, version).size()), values);
}

void TestChannelRecordCodec::downloadRecord_data()
{
    QTest::addColumn<double>("version");
    QTest::addColumn<int>("wire");
    QTest::addColumn<int>("values"); // values behind the channel
    QTest::addColumn<QString>("tail");

    QTest::newRow("216") << 14.0 << 215 << 12 << "215,1,85,86,87,88,89,Ch 216,90,91,92,93,94,";
    QTest::newRow("201") << 7.0 << 200 << 12 << ",91,92,93,94,";
    QTest::newRow("200") << 7.0 << 199 << 33 << ",58,59,60,";
    QTest::newRow("101") << 14.0 << 100 << 33 << ",58,59,60,";
    QTest::newRow("100 in 14") << 14.0 << 99 << 72 << ",13,210,12,";
    QTest::newRow("67 in 14") << 14.0 << 66 << 72 << ",13,210,12,";
    QTest::newRow("66 in 14") << 14.0 << 65 << 74 << ",12,223,224,";
    QTest::newRow("34 in 14") << 14.0 << 33 << 74 << ",12,223,224,";
    QTest::newRow("33 takes 225-227") << 14.0 << 32 << 77 << ",12,223,224,225,226,227,";
    QTest::newRow("33 below 14") << 9.6 << 32 << 72 << ",210,12,";
    QTest::newRow("28 below 14") << 8.7 << 27 << 72 << ",210,12,";
    QTest::newRow("27 below 14") << 7.0 << 26 << 77 << ",12,168,165,166,207,167,";
    QTest::newRow("27 in 14") << 14.0 << 26 << 82 << ",227,168,165,166,207,167,";
    QTest::newRow("16") << 14.0 << 15 << 82 << ",207,167,";
    QTest::newRow("15") << 6.5 << 14 << 81 << ",167,202,203,204,205,";
    QTest::newRow("12") << 6.5 << 11 << 84 << ",205,170,206,169,";
    QTest::newRow("2") << 9.6 << 1 << 84 << ",170,206,169,";
    QTest::newRow("1 in 8.0 keeps 211-222") << 8.0 << 0 << 220 << ",99,211,212,213,214,215,216,217,218,219,220,221,222,";
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
    QTest::newRow("short 12") << "Room" << 11 << "Ch 12 ";
    QTest::newRow("short 100") << "A" << 99 << "Ch 100";
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
