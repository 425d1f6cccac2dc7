#include "status/presss_codec.h"

#include <QStringList>

using namespace presss_layout;
using replyfield::cut;
using replyfield::flag;
using replyfield::normalised;
using replyfield::val;

PresssReply decodePresss(const QString& reply, double version)
{
    PresssReply r;
    r.dateTime = cut(reply, DateTimePos, DateTimeWidth);
    for (int b = 0; b < Banks; ++b) {
        r.banks[b].suction = normalised(reply, suctionPos(b));
        r.banks[b].discharge = normalised(reply, dischargePos(b));
        r.banks[b].liquid = normalised(reply, liquidPos(b));
        r.banks[b].liquidPump = flag(reply, liquidPumpPos(b));
    }
    r.liquidLevel = normalised(reply, LiquidLevelPos);
    for (int i = 0; i < Compressors; ++i) {
        r.equalizer[i] = flag(reply, equalizerPos(i));
        CompressorRecord& rec = r.records[i];
        rec.number = int(val(cut(reply, recordNumberPos(i), 6)));
        rec.stages = int(val(cut(reply, recordStagesPos(i), 6)));
        rec.kind = int(val(cut(reply, recordKindPos(i), 6)));
        rec.running = val(cut(reply, recordRunningPos(i), 1)) != 0;
        rec.full = flag(reply, recordFullPos(i));
        r.hoursRun[i] = normalised(reply, hoursRunPos(i));
        r.compressorStep[i] = int(val(cut(reply, compressorStepPos(i), 6))) + 1;
    }
    for (int c = 0; c < Condensers; ++c) {
        for (int s = 0; s < CondenserStages; ++s)
            r.condenser[c][s] = flag(reply, condenserStagePos(c, s));
        r.hoursRunCondenser[c] = normalised(reply, hoursRunCondenserPos(c));
        r.condenserStep[c] = int(val(cut(reply, condenserStepPos(c), 6))) + 1;
    }
    r.hasTorvanel = version >= TorvanelVersion;
    if (r.hasTorvanel) {
        for (int j = 0; j < TorvanelFields; ++j)
            r.torvanel[j] = normalised(reply, torvanelFieldPos(j));
    }
    r.csData = cut(reply, DateTimePos, DateTimeWidth) + reply.mid(TorvanelDataPos - 1);
    return r;
}

QString presssPressureText(const QString& v)
{
    if (v == kNotConnected)
        return QStringLiteral("N-C");
    if (v == kOverRange)
        return QStringLiteral("O-R");
    return v;
}

QString liquidLevelText(const QString& v)
{
    if (v == kNotConnected)
        return QStringLiteral("N-C");
    if (v == kOverRange)
        return QStringLiteral("O-R");
    return v + QLatin1Char('%');
}

QString stepPercentText(int step)
{
    return replyfield::fixed0(step * 1.5625) + QStringLiteral(" %");
}

QString torvanelTemperatureText(const QString& v)
{
    if (v == kNotConnected)
        return QStringLiteral("N-C");
    if (v == kOverRange)
        return QStringLiteral("O-R");
    return replyfield::fixed1(val(v) / 10.0);
}

TorvanelBlock decodeTorvanelBlock(const QString& csData, int s)
{
    TorvanelBlock b;
    b.known = s >= 0 && s < Compressors && csData.size() >= blockPos(s) + BlockWidth - 1;
    if (!b.known)
        return b;
    for (int i = 0; i < BlockTemperatures; ++i)
        b.temperatures[i] = torvanelTemperatureText(normalised(csData, blockTemperaturePos(s, i)));
    for (int i = 0; i < BlockPressures; ++i)
        b.pressures[i] = presssPressureText(normalised(csData, blockPressurePos(s, i)));
    b.analogue1 = normalised(csData, blockAnalogue1Pos(s));
    b.analogue2 = normalised(csData, blockAnalogue2Pos(s));
    b.analogue3 = normalised(csData, blockAnalogue3Pos(s));
    for (int i = 0; i < BlockInputs; ++i)
        b.inputs[i] = flag(csData, blockInputPos(s, i));
    for (int i = 0; i < BlockFurtherInputs; ++i)
        b.furtherInputs[i] = flag(csData, blockFurtherInputPos(s, i));
    b.kind = int(val(cut(csData, blockFurtherInputPos(s, 0), 1)));
    return b;
}

std::array<bool, AlarmFlags> torvanelAlarmFlags(const QString& csAlarms, int s)
{
    std::array<bool, AlarmFlags> f{};
    for (int i = 0; i < AlarmFlags; ++i)
        f[i] = flag(csAlarms, alarmFlagPos(s, i));
    return f;
}

namespace {

QString buildTable(const QStringList& texts)
{
    QString t;
    for (const QString& s : texts)
        t += s.leftJustified(AlarmTextWidth, QLatin1Char(' '), true);
    return t;
}

} // namespace

const QString& torvanel_alarm_table_a()
{
    static const QString table = buildTable({
        QStringLiteral("Suction Temperature"), QStringLiteral("Discharge Temperature"),
        QStringLiteral("Oil Manifold Temperature"), QStringLiteral("Oil Seperator Temperature"),
        QStringLiteral("Intermediate/Econi'r Temp"), QStringLiteral("Spare Temperature 1"),
        QStringLiteral("Spare Temperature 2"), QStringLiteral("Spare Temperature 3"),
        QStringLiteral("Suction Pressure"), QStringLiteral("Discharge Pressure"),
        QStringLiteral("Oil Manifold Pressure"), QStringLiteral("Oil After Filter Pressure"),
        QStringLiteral("Intermediate/Eco Pressure"), QStringLiteral("Spare Pressure 1"),
        QStringLiteral("Spare Pressure 2"), QStringLiteral("Spare Pressure 3"),
        QStringLiteral("Remote Run"), QStringLiteral("Remote OFF"),
        QStringLiteral("Emergency Switch"), QStringLiteral("Full Load Switch"),
        QStringLiteral("Full Unload Switch"), QStringLiteral("Motor Auxilary"),
        QStringLiteral("Oil level Switch"), QStringLiteral("Auxilary 1"),
        QStringLiteral("Load Slide Pot"), QStringLiteral("Volume/Ratio Pot"),
        QStringLiteral("Current"), QStringLiteral("Torvanel Connected fail"),
        QStringLiteral("Glacinor Connected Fail"), QStringLiteral("Unload Start"),
        QStringLiteral("Oil Pressure pre Start"), QStringLiteral("Low Current Alarm"),
        QStringLiteral("Press Difference"), QStringLiteral("Oil Filter Pressure Diff"),
        QStringLiteral("Spare Unused 1"), QStringLiteral("Super Heat Allarm"),
        QStringLiteral("Spare Unused 2"), QStringLiteral("Oil Pressure Start Trys"),
        QStringLiteral("Spare Unused 3"), QStringLiteral("Spare Unused 4"),
    });
    return table;
}

const QString& torvanel_alarm_table_b()
{
    static const QString table = [] {
    QStringList texts = {
        QStringLiteral("Suction Temperature"), QStringLiteral("Discharge Temperature"),
        QStringLiteral("Oil Manifold Temperature"), QStringLiteral("Intermediate Temperature"),
        QStringLiteral("Suction Pressure"), QStringLiteral("Discharge Pressure"),
        QStringLiteral("Oil Manifold Pressure"), QStringLiteral("Intermediate Pressure"),
        QStringLiteral("Remote Run Switch"), QStringLiteral("Remote Off Switch"),
        QStringLiteral("Motor Auxillary"), QStringLiteral("Water Jacket Flow Fail"),
        QStringLiteral("Motor Current"), QStringLiteral("Emergency Switch"),
        QStringLiteral("Glacinor Connected Fail"), QStringLiteral("Torvanel Connected fail"),
        QStringLiteral("Press Difference"), QStringLiteral("Super Heat Allarm"),
    };
    while (texts.size() < AlarmTexts - 1)
        texts.append(QStringLiteral("Spare Unused"));
    texts.append(QStringLiteral("Other alarm's are active"));
    return buildTable(texts);
    }();
    return table;
}

QString torvanelAlarmText(int kind, int i)
{
    const QString& table = kind == 1 ? torvanel_alarm_table_b() : torvanel_alarm_table_a();
    return cut(table, AlarmTextWidth * i + 1, AlarmTextWidth);
}

QString torvanelAlarmWords(const QString& csAlarms, int s, int kind)
{
    const auto flags = torvanelAlarmFlags(csAlarms, s);
    QString words;
    bool any = false;
    for (int i = 0; i < AlarmFlags; ++i) {
        if (!flags[i])
            continue;
        any = true;
        words += torvanelAlarmText(kind, i) + QStringLiteral("\r\n");
    }
    return any ? words : QStringLiteral("No alarms are active");
}

QString torvanTemperature(const QString& csAlarms, int i)
{
    return torvanelTemperatureText(normalised(csAlarms, torvanTemperaturePos(i)));
}
