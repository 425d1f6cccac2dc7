#include "status/status_codec.h"

#include <cmath>

namespace replyfield {

QString cut(const QString& reply, int pos, int width)
{
    if (pos < 1 || width <= 0 || pos > reply.size())
        return {};
    return reply.mid(pos - 1, width);
}

double val(const QString& text)
{
    // Only the characters of a plain decimal number count; blanks inside a
    // field are skipped, as the instrument pads on either side.
    QString digits;
    bool sign = true;
    bool point = false;
    for (QChar c : text) {
        if (c == QLatin1Char(' ') || c == QLatin1Char('\t') || c == QLatin1Char('\r') || c == QLatin1Char('\n'))
            continue;
        if (sign && (c == QLatin1Char('-') || c == QLatin1Char('+'))) {
            digits += c;
            sign = false;
            continue;
        }
        sign = false;
        if (c.isDigit() && c.unicode() < 128) {
            digits += c;
        } else if (c == QLatin1Char('.') && !point) {
            point = true;
            digits += c;
        } else {
            break;
        }
    }
    bool ok = false;
    const double v = digits.toDouble(&ok);
    return ok ? v : 0.0;
}

QString numberText(double value)
{
    if (value == 0)
        return QStringLiteral("0");
    return QString::number(value, 'g', 15);
}

QString normalised(const QString& reply, int pos, int width)
{
    return numberText(val(cut(reply, pos, width)));
}

bool flag(const QString& reply, int pos)
{
    return cut(reply, pos, 1) == QLatin1String("1");
}

static double roundAway(double v, int decimals)
{
    const double scale = std::pow(10.0, decimals);
    // A tiny nudge keeps 0.15 (stored as 0.1499...) rounding as written.
    const double r = std::round(v * scale + (v >= 0 ? 1e-9 : -1e-9));
    return r / scale;
}

QString fixed1(double value)
{
    const double r = roundAway(value, 1);
    return QString::number(r == 0 ? 0.0 : r, 'f', 1);
}

QString fixed0(double value)
{
    const double r = roundAway(value, 0);
    return QString::number(r == 0 ? 0.0 : r, 'f', 0);
}

} // namespace replyfield

using namespace status_layout;
using replyfield::normalised;
using replyfield::flag;

StatusReply decodeStatus(const QString& reply, double version)
{
    StatusReply r;
    r.dateTime = replyfield::cut(reply, DateTimePos, DateTimeWidth);
    for (int n = 1; n <= Channels; ++n) {
        r.value[n] = normalised(reply, valuePos(n));
        r.alarm[n] = flag(reply, alarmPos(n));
        r.pid[n] = normalised(reply, pidPos(n));
        r.pidKind5[n] = normalised(reply, pidKind5Pos(n));
        r.fanKind5[n] = normalised(reply, fanKind5Pos(n));
    }
    for (int n = 1; n <= OutputChannels; ++n) {
        r.outputs[n] = {flag(reply, liquidPos(n)), flag(reply, fanPos(n)), flag(reply, defrostPos(n)),
                        flag(reply, suctionOutPos(n))};
    }
    r.hasSuction = version >= SuctionVersion;
    r.hasPressures = version >= PressureVersion;
    r.hasPid = version >= PidVersion;
    for (int i = 0; i < Suctions; ++i)
        r.suction[i] = normalised(reply, suctionPressurePos(i));
    for (int k = 0; k < Pressures; ++k)
        r.pressure[k] = normalised(reply, pressureBoxPos(k));
    return r;
}

QString assocValue(const QString& reply, int m)
{
    return normalised(reply, assocValuePos(m));
}

QString channelValueText(const QString& v)
{
    if (v == kNotConnected)
        return QStringLiteral("Not Con");
    if (v == kOverRange)
        return QStringLiteral("Ovr Rge");
    if (v == kNoSensor)
        return QStringLiteral("No Sen");
    if (v == kLoadShed)
        return QStringLiteral("Ld Shd");
    return replyfield::fixed1(replyfield::val(v) / 10.0);
}

QString pressureBoxText(const QString& v)
{
    if (v == kNotConnected)
        return QStringLiteral("N-C");
    if (v == kOverRange)
        return QStringLiteral("O-R");
    return replyfield::fixed1(replyfield::val(v) / 10.0);
}

QString suctionBoxText(const QString& v)
{
    if (v == kNotConnected)
        return QStringLiteral("N-C");
    if (v == kOverRange)
        return QStringLiteral("O-R");
    return replyfield::fixed0(replyfield::val(v));
}
