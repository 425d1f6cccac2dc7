#include "setpoints/channel_record_codec.h"

#include "setpoints/catalogue.h"

#include <charconv>
#include <cmath>

namespace channel_record {

namespace {

using Block = catalogue::RecordBlock;

// The PID values of firmware 14: no `info` rows, a filler in older records.
bool isPidBlock(Block b) { return !catalogue::hasInfoRows(b); }

// The upload's test of a block, by the 1-based channel.
bool uploadStands(Block b, int channel, double version)
{
    switch (b) {
    case Block::All: return true;
    case Block::Upto200: return channel <= 200;
    case Block::Upto100: return channel <= 100;
    case Block::Pid66: return channel <= 66;
    case Block::Pid32: return channel <= 32;
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
    case Block::Pid66: return wire < 66;
    case Block::Pid32: return wire <= 32;
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
    for (const catalogue::RecordRun& run : catalogue::recordRuns()) {
        if (isPidBlock(run.block) && !pid) {
            // The filler holds their places; nothing is read from it.
            if (run.block == Block::Pid66)
                position += kFiller.size();
            continue;
        }
        if (!uploadStands(run.block, channel, version))
            break;
        const int width = run.width ? run.width : compressorTypeWidth(version);
        for (int i = 0; i < run.count; ++i) {
            RecordValue v;
            v.field = run.first + i;
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
    if (field == catalogue::kPidFullOnField)
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
    for (const catalogue::RecordRun& run : catalogue::recordRuns()) {
        if (isPidBlock(run.block) && !pid)
            continue;
        if (!downloadStands(run.block, wireChannel))
            break;
        for (int i = 0; i < run.count; ++i)
            out.append(run.first + i);
        // Beyond wire 32 the record ends behind the PID high full on.
        if (run.block == Block::Pid66 && wireChannel > 32)
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
