#pragma once

// The two records of a channel's set points on the wire: the fixed-width
// upload record that ends in "schanupload", and the comma separated download
// record that the instrument echoes before "downcheck". Which values stand in
// a record depends on the channel and on the firmware version; both layouts
// are derived from the catalogue's table of the record.

#include <QList>
#include <QString>
#include <QVariant>
#include <functional>

namespace channel_record {

// Positions count from 1 in the reply text.
constexpr int kChannelPosition = 1;
constexpr int kChannelWidth = 6;
constexpr int kFirstValuePosition = 7;
// Older firmware (below 14) has no PID values; the record is widened by this
// filler at position 364 so that 394 and on stay in place.
constexpr int kFillerPosition = 364;
inline const QString kFiller = QStringLiteral("111111222222333333444444555555");
constexpr double kPidFirmware = 14.0;
// The PID values have no `info` row; a value within the field's fixed range
// is kept, anything else becomes 20.
constexpr int kUncheckedDefault = 20;
struct UncheckedRange {
    int min = 0;
    int max = 100;
};
// The PID high full on is a signed offset of -3.0..3.0 oC, stored x10; the
// others are 0..100.
UncheckedRange uncheckedRange(int field);

enum class ValueKind {
    Checked,     // tested against its `info` row by store_checked
    Description, // six characters stored as they stand
    Unchecked,   // the PID values: the fixed rule of uncheckedRange()
};

struct RecordValue {
    int field = 0;    // store field of `setpoints`
    int infoRow = -1; // row of `info` in reply order; -1 for the PID values
    int position = 0; // first position in the (widened) upload record
    int width = 0;
    ValueKind kind = ValueKind::Checked;
};

// Width of the compressor type in the upload record: 6 from firmware 8 on and
// for 6.5 exactly, else 1.
int compressorTypeWidth(double version);

// The values that stand in the upload record of a wire channel (0..215), in
// order, with their positions in the record as widened by widenedRecord().
QList<RecordValue> uploadLayout(int wireChannel, double version);

// The received text with the filler of firmware below 14 put in at position
// 364 when the channel's record reaches that far; otherwise unchanged.
QString widenedRecord(const QString& received, int wireChannel, double version);

// A value's text cut from the (widened) record; short records give empty text.
QString valueText(const QString& record, const RecordValue& value);

// The wire channel at positions 1..6; -1 unless numeric and within 0..215.
int recordChannel(const QString& record);

// A value of an upload record made numeric as the upload does it (leading
// blanks and zeros go); text that is not a number is passed on as it is, so
// that the range test fails it.
QVariant uploadNumber(const QString& text);

// The stored values of a download record, in order: the store fields that go
// down for the wire channel. Fields 211..222 go for channel 1 whatever the
// firmware; 223..227 only from firmware 14 on, 225..227 up to wire 32.
QList<int> downloadFields(int wireChannel, double version);

// A stored value as decimal text: integral numbers without a decimal point.
QString storeText(const QVariant& value);

// The description as the download sends and keeps it: cut to 6 characters,
// or when shorter "Ch " and the channel number, blank filled to 6.
QString normalisedDescription(const QString& stored, int wireChannel);

// The download record: wire channel and a comma, then each value and a comma.
// `value(field)` gives the store's value of the channel's row.
QString downloadRecord(int wireChannel, double version,
                       const std::function<QVariant(int field)>& value);

} // namespace channel_record
