#include "setpoints/channel_record_codec.h"

#include "setpoints/catalogue.h"

#include <charconv>
#include <cmath>

namespace channel_record {

namespace {

// Which channels a run of values stands for. Each block stands inside the one
// before: the first block a channel fails ends its record.
enum class Block {
    All,
    Upto200,
    Upto100,
    Upto66,    // fields 223, 224 (firmware 14 and on)
    Upto32,    // fields 225..227 (firmware 14 and on)
    Upto27,
    Upto15,
    Upto12,
    Only1,
    Only1Above85, // firmware above 8.5
    Only1From87,  // firmware 8.7 and on
};

constexpr int kCompressorTypeField = 165;
constexpr int kPidFullOnField = 224;

struct Run {
    int firstField;
    int count;
    int width; // 0: the width of field 165
    Block block;
};

// The values of the record in reply order; fields of a run are consecutive.
constexpr Run kRuns[] = {
    {1, 1, 1, Block::All},
    {85, 1, 1, Block::All},
    {86, 4, 6, Block::All},
    {catalogue::kDescriptionField, 1, 6, Block::All},
    {90, 1, 1, Block::All},
    {91, 4, 6, Block::All},
    {14, 10, 6, Block::Upto200},
    {6, 4, 6, Block::Upto200},
    {54, 7, 6, Block::Upto200},
    {48, 3, 1, Block::Upto100},
    {44, 1, 1, Block::Upto100},
    {43, 1, 1, Block::Upto100},
    {52, 1, 1, Block::Upto100},
    {53, 1, 6, Block::Upto100},
    {2, 4, 6, Block::Upto100},
    {29, 14, 6, Block::Upto100},
    {51, 1, 1, Block::Upto100},
    {209, 1, 1, Block::Upto100},
    {26, 3, 6, Block::Upto100},
    {10, 1, 6, Block::Upto100},
    {11, 1, 1, Block::Upto100},
    {45, 1, 1, Block::Upto100},
    {95, 1, 6, Block::Upto100},
    {46, 1, 1, Block::Upto100},
    {98, 1, 1, Block::Upto100},
    {13, 1, 6, Block::Upto100},
    {210, 1, 6, Block::Upto100},
    {12, 1, 6, Block::Upto100},
    {223, 2, 6, Block::Upto66},
    {225, 3, 6, Block::Upto32},
    {168, 1, 6, Block::Upto27},
    {kCompressorTypeField, 1, 0, Block::Upto27},
    {166, 1, 6, Block::Upto27},
    {207, 1, 6, Block::Upto27},
    {167, 1, 6, Block::Upto27},
    {202, 4, 6, Block::Upto15},
    {170, 1, 6, Block::Upto12},
    {206, 1, 6, Block::Upto12},
    {169, 1, 1, Block::Upto12},
    {76, 2, 6, Block::Only1},
    {61, 15, 6, Block::Only1},
    {78, 5, 6, Block::Only1},
    {155, 10, 6, Block::Only1},
    {84, 1, 6, Block::Only1},
    {110, 20, 4, Block::Only1},
    {100, 10, 4, Block::Only1},
    {135, 10, 4, Block::Only1},
    {181, 10, 4, Block::Only1},
    {171, 10, 1, Block::Only1},
    {130, 5, 6, Block::Only1},
    {83, 1, 1, Block::Only1},
    {145, 10, 6, Block::Only1},
    {96, 2, 6, Block::Only1},
    {208, 1, 6, Block::Only1},
    {201, 1, 1, Block::Only1},
    {196, 5, 1, Block::Only1},
    {191, 5, 6, Block::Only1},
    {99, 1, 6, Block::Only1},
    {211, 2, 6, Block::Only1Above85},
    {213, 10, 1, Block::Only1From87},
};

bool isPidBlock(Block b) { return b == Block::Upto66 || b == Block::Upto32; }

// The upload's test of a block, by the 1-based channel.
bool uploadStands(Block b, int channel, double version)
{
    switch (b) {
    case Block::All: return true;
    case Block::Upto200: return channel <= 200;
    case Block::Upto100: return channel <= 100;
    case Block::Upto66: return channel <= 66;
    case Block::Upto32: return channel <= 32;
    case Block::Upto27: return channel <= 27;
    case Block::Upto15: return channel <= 15;
    case Block::Upto12: return channel <= 12;
    case Block::Only1: return channel == 1;
    case Block::Only1Above85: return channel == 1 && version > 8.5;
    case Block::Only1From87: return channel == 1 && version >= 8.7;
    }
    return false;
}

// The download's own tests, by the wire channel: fields 225..227 go for wire
// 32 as well, and channel 1 always takes the firmware-gated values.
bool downloadStands(Block b, int wire)
{
    switch (b) {
    case Block::All: return true;
    case Block::Upto200: return wire < 200;
    case Block::Upto100: return wire <= 99;
    case Block::Upto66: return wire < 66;
    case Block::Upto32: return wire <= 32;
    case Block::Upto27: return wire < 27;
    case Block::Upto15: return wire < 15;
    case Block::Upto12: return wire < 12;
    case Block::Only1:
    case Block::Only1Above85:
    case Block::Only1From87: return wire < 1;
    }
    return false;
}

bool sameVersion(double a, double b) { return std::abs(a - b) < 1e-9; }

} // namespace

int compressorTypeWidth(double version)
{
    return version >= 8.0 || sameVersion(version, 6.5) ? 6 : 1;
}

QList<RecordValue> uploadLayout(int wireChannel, double version)
{
    QList<RecordValue> out;
    const int channel = wireChannel + 1;
    const bool pid = version >= kPidFirmware;
    int position = kFirstValuePosition;
    int infoRow = 0;
    for (const Run& run : kRuns) {
        if (isPidBlock(run.block) && !pid) {
            // The filler holds their places; nothing is read from it.
            if (run.block == Block::Upto66)
                position += kFiller.size();
            continue;
        }
        if (!uploadStands(run.block, channel, version))
            break;
        const int width = run.width ? run.width : compressorTypeWidth(version);
        for (int i = 0; i < run.count; ++i) {
            RecordValue v;
            v.field = run.firstField + i;
            v.position = position;
            v.width = width;
            if (isPidBlock(run.block)) {
                v.kind = ValueKind::Unchecked;
            } else {
                v.infoRow = infoRow++;
                if (v.field == catalogue::kDescriptionField)
                    v.kind = ValueKind::Description;
            }
            out.append(v);
            position += width;
        }
    }
    return out;
}

UncheckedRange uncheckedRange(int field)
{
    if (field == kPidFullOnField)
        return {-30, 30};
    return {};
}

QString widenedRecord(const QString& received, int wireChannel, double version)
{
    if (version >= kPidFirmware || wireChannel + 1 > 100)
        return received;
    QString r = received;
    r.insert(qMin<qsizetype>(kFillerPosition - 1, r.size()), kFiller);
    return r;
}

QString valueText(const QString& record, const RecordValue& value)
{
    return record.mid(value.position - 1, value.width);
}

int recordChannel(const QString& record)
{
    double v = 0;
    if (!catalogue::numericValue(record.mid(kChannelPosition - 1, kChannelWidth), &v))
        return -1;
    if (v < 0 || v > catalogue::kChannels - 1 || v != std::floor(v))
        return -1;
    return int(v);
}

namespace {

// A plain decimal as the instrument sends it, read without the locale
// machinery of QString::toDouble (ten thousand values an upload). False
// sends anything else the long way.
bool plainNumber(const QString& text, double* out)
{
    const QStringView s = QStringView(text).trimmed();
    char buffer[32];
    if (s.isEmpty() || s.size() >= qsizetype(sizeof buffer))
        return false;
    for (qsizetype i = 0; i < s.size(); ++i) {
        const char16_t c = s[i].unicode();
        if (!((c >= u'0' && c <= u'9') || c == u'.' || c == u'-'))
            return false;
        buffer[i] = char(c);
    }
    const char* end = buffer + s.size();
    const auto [ptr, ec] = std::from_chars(buffer, end, *out);
    return ec == std::errc() && ptr == end && std::isfinite(*out);
}

} // namespace

QVariant uploadNumber(const QString& text)
{
    double v = 0;
    if (plainNumber(text, &v) || catalogue::numericValue(text, &v))
        return catalogue::storeNumber(v);
    return text;
}

QList<int> downloadFields(int wireChannel, double version)
{
    QList<int> out;
    const bool pid = version >= kPidFirmware;
    for (const Run& run : kRuns) {
        if (isPidBlock(run.block) && !pid)
            continue;
        if (!downloadStands(run.block, wireChannel))
            break;
        for (int i = 0; i < run.count; ++i)
            out.append(run.firstField + i);
        // Beyond wire 32 the record ends behind field 224.
        if (run.block == Block::Upto66 && wireChannel > 32)
            break;
    }
    return out;
}

QString storeText(const QVariant& value)
{
    if (!value.isValid() || value.isNull())
        return QString();
    switch (value.typeId()) {
    case QMetaType::Double:
    case QMetaType::Float: {
        const double d = value.toDouble();
        if (d == std::floor(d) && std::abs(d) < 1e15)
            return QString::number(qint64(d));
        return QString::number(d, 'g', 15);
    }
    case QMetaType::Bool:
        return value.toBool() ? QStringLiteral("1") : QStringLiteral("0");
    default:
        return value.toString();
    }
}

QString normalisedDescription(const QString& stored, int wireChannel)
{
    if (stored.size() > catalogue::kDescriptionLength)
        return stored.left(catalogue::kDescriptionLength);
    if (stored.size() < catalogue::kDescriptionLength)
        return (QStringLiteral("Ch ") + QString::number(wireChannel + 1))
            .leftJustified(catalogue::kDescriptionLength, QLatin1Char(' '), true);
    return stored;
}

QString downloadRecord(int wireChannel, double version, const std::function<QVariant(int field)>& value)
{
    QString r = QString::number(wireChannel) + QLatin1Char(',');
    for (int field : downloadFields(wireChannel, version)) {
        if (field == catalogue::kDescriptionField)
            r += value(field).toString();
        else
            r += storeText(value(field));
        r += QLatin1Char(',');
    }
    return r;
}

} // namespace channel_record
