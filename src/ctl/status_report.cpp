#include "ctl/status_report.h"

#include "status/presss_codec.h"
#include "status/status_codec.h"

#include <QJsonArray>
#include <algorithm>

namespace {

constexpr int VariableCondenserKind = 4;

double raw(const QString& normalised)
{
    return replyfield::val(normalised);
}

QString onOff(bool on)
{
    return on ? QStringLiteral("ON") : QStringLiteral("OFF");
}

// What the view's PID and fan boxes show for a channel: nothing for a
// channel without PID, "PID" alone for kinds -3 and 7, the percentage of
// its kind otherwise (kind 4 reads it at one place, kind 5 at another,
// with the fan's).
struct PidReading {
    bool shown = false;
    QString pid; // empty: no percentage
    QString fan;
};

PidReading pidReading(const StatusReport& report, const StatusReply& r, int n)
{
    if (!r.hasPid || n > report.controlKinds.size())
        return {};
    switch (report.controlKinds.at(n - 1)) {
    case -3:
    case 7:
        return {true, {}, {}};
    case 4:
        return {true, r.pid[n], {}};
    case 5:
        return {true, r.pidKind5[n], r.fanKind5[n]};
    }
    return {};
}

QString pidText(const PidReading& p)
{
    if (!p.shown)
        return {};
    QString t = p.pid.isEmpty() ? QStringLiteral("PID") : QStringLiteral("PID %1 %").arg(p.pid);
    if (!p.fan.isEmpty())
        t += QStringLiteral("  Fan %1 %").arg(p.fan);
    return t;
}

StatusReply decoded(const StatusReport& report)
{
    return decodeStatus(report.reply, report.versionNumber);
}

} // namespace

QString statusTable(const StatusReport& report)
{
    using namespace status_layout;
    const StatusReply r = decoded(report);
    QString t = QStringLiteral("Glacinor ID %1   Date and Time %2\n\n").arg(report.id, r.dateTime);
    t += QStringLiteral("%1  %2 %3  %4  Liquid  Fans  Defrost  Suction%5\n")
             .arg(QStringLiteral("Chan"))
             .arg(QStringLiteral("Value"), -10)
             .arg(QStringLiteral("Raw"), 6)
             .arg(QStringLiteral("Alarm"), -5)
             .arg(r.hasPid ? QStringLiteral("  PID") : QString());
    for (int n = 1; n <= Channels; ++n) {
        QString line = QStringLiteral("%1  %2 %3  %4")
                           .arg(n, 4)
                           .arg(channelValueText(r.value[n]), -10)
                           .arg(r.value[n], 6)
                           .arg(r.alarm[n] ? QStringLiteral("YES") : QStringLiteral("NO"), -5);
        if (n <= OutputChannels) {
            const StatusOutputs& o = r.outputs[n];
            line += QStringLiteral("  %1  %2  %3  %4")
                        .arg(onOff(o.liquid), -6)
                        .arg(onOff(o.fan), -4)
                        .arg(onOff(o.defrost), -7)
                        .arg(onOff(o.suction), -7);
        }
        const QString pid = pidText(pidReading(report, r, n));
        if (!pid.isEmpty())
            line += QString(n <= OutputChannels ? 2 : 35, QLatin1Char(' ')) + pid;
        t += line + QLatin1Char('\n');
    }
    t += QStringLiteral("\nSuction pressures:");
    for (int i = 0; i < Suctions; ++i)
        t += QLatin1Char(' ') + (r.hasSuction ? suctionBoxText(r.suction[i]) : QStringLiteral("N/A"));
    t += QStringLiteral("\nPressures (channels %1 to %2):").arg(FirstPressureChannel).arg(Channels);
    for (int k = 0; k < Pressures; ++k)
        t += QLatin1Char(' ') + (r.hasPressures ? pressureBoxText(r.pressure[k]) : QStringLiteral("N/A"));
    return t + QLatin1Char('\n');
}

QJsonObject statusJson(const StatusReport& report)
{
    using namespace status_layout;
    const StatusReply r = decoded(report);
    QJsonArray channels;
    for (int n = 1; n <= Channels; ++n) {
        QJsonObject c{{"number", n},
                      {"value", channelValueText(r.value[n])},
                      {"raw", raw(r.value[n])},
                      {"alarm", r.alarm[n]}};
        if (n <= OutputChannels) {
            const StatusOutputs& o = r.outputs[n];
            c.insert("outputs", QJsonObject{{"liquid", o.liquid},
                                            {"fan", o.fan},
                                            {"defrost", o.defrost},
                                            {"suction", o.suction}});
        }
        const PidReading p = pidReading(report, r, n);
        if (p.shown)
            c.insert("pid", p.pid.isEmpty() ? QJsonValue() : QJsonValue(raw(p.pid)));
        if (!p.fan.isEmpty())
            c.insert("fanPercent", raw(p.fan));
        channels.append(c);
    }
    QJsonObject j{{"id", report.id}, {"version", report.version}, {"dateTime", r.dateTime}, {"channels", channels}};
    if (r.hasSuction) {
        QJsonArray suction;
        for (int i = 0; i < Suctions; ++i)
            suction.append(QJsonObject{{"group", i + 1}, {"value", suctionBoxText(r.suction[i])},
                                       {"raw", raw(r.suction[i])}});
        j.insert("suction", suction);
    }
    if (r.hasPressures) {
        QJsonArray pressures;
        for (int k = 0; k < Pressures; ++k)
            pressures.append(QJsonObject{{"channel", FirstPressureChannel + k},
                                         {"value", pressureBoxText(r.pressure[k])},
                                         {"raw", raw(r.pressure[k])}});
        j.insert("pressures", pressures);
    }
    return j;
}

namespace {

// --- pressure -------------------------------------------------------------

QString kindText(int kind)
{
    switch (kind) {
    case 0:
    case 1:
        return QStringLiteral("staged");
    case 2:
        return QStringLiteral("screw");
    case 3:
        return QStringLiteral("variable");
    }
    return QString::number(kind);
}

// The non-empty compressor records in the order of their numbers.
QList<CompressorRecord> compressors(const PresssReply& r)
{
    QList<CompressorRecord> list;
    for (const CompressorRecord& rec : r.records) {
        if (rec.number >= 1 && rec.number <= presss_layout::Compressors)
            list.append(rec);
    }
    std::stable_sort(list.begin(), list.end(),
                     [](const CompressorRecord& a, const CompressorRecord& b) { return a.number < b.number; });
    return list;
}

// What a running compressor does now, as the view words it.
QString loadText(const PresssReply& r, const CompressorRecord& c)
{
    if (!c.running)
        return QStringLiteral("stopped");
    switch (c.kind) {
    case 2:
        return c.full ? QStringLiteral("Fully") : QStringLiteral("Not fully");
    case 3: {
        const int step = r.compressorStep[c.number - 1];
        return QStringLiteral("Step %1 %2").arg(step).arg(stepPercentText(step));
    }
    default:
        return QStringLiteral("%1 stage(s)").arg(qBound(0, c.stages + 1, 7));
    }
}

struct TorvanelAlarms {
    int number;
    QStringList alarms;
};

QList<TorvanelAlarms> torvanelAlarms(const PresssReply& r, const QString& torvan)
{
    QList<TorvanelAlarms> list;
    if (torvan.isEmpty())
        return list;
    for (int s = 0; s < presss_layout::Compressors; ++s) {
        const auto flags = torvanelAlarmFlags(torvan, s);
        const int kind = decodeTorvanelBlock(r.csData, s).kind;
        TorvanelAlarms t{s + 1, {}};
        for (int i = 0; i < presss_layout::AlarmFlags; ++i) {
            const QString text = torvanelAlarmText(kind, i).trimmed();
            if (flags[i] && !text.isEmpty())
                t.alarms.append(text);
        }
        if (!t.alarms.isEmpty())
            list.append(t);
    }
    return list;
}

// A condenser as the view shows it: the stages its kind has, and for the
// variable kind the step. A field of 64 reads as step 65 and shows as step
// 0, as the field of 0 does.
struct CondenserReading {
    bool variable = false;
    int stages = presss_layout::CondenserStages; // shown stage boxes
    QString step, percent;                      // variable only
};

CondenserReading condenserReading(const PressureReport& report, const PresssReply& r, int c)
{
    const int kind = c < report.condenserKinds.size() ? report.condenserKinds.at(c) : -1;
    CondenserReading reading;
    if (kind >= 0 && kind <= 3)
        reading.stages = kind + 1;
    if (kind != VariableCondenserKind)
        return reading;
    reading.variable = true;
    const int step = r.condenserStep[c];
    const bool zero = step == 1 || step == presss_layout::MaxStep + 1;
    reading.step = QStringLiteral("Step %1").arg(zero ? 0 : step);
    reading.percent = zero ? QStringLiteral("0 %") : stepPercentText(step);
    return reading;
}

// The bank temperatures of the "torvan" reply, from version 8.8.
bool hasBankTemperatures(const PressureReport& report)
{
    return !report.torvan.isEmpty()
        && report.versionNumber >= presss_layout::TorvanTemperatureVersion;
}

PresssReply decoded(const PressureReport& report)
{
    return decodePresss(report.presss, report.versionNumber);
}

} // namespace

QString pressureTable(const PressureReport& report)
{
    using namespace presss_layout;
    const PresssReply r = decoded(report);
    const bool temps = hasBankTemperatures(report);
    QString t = QStringLiteral("Glacinor ID %1   Date and Time %2\n\n").arg(report.id, r.dateTime);
    t += QStringLiteral("Bank  %1Suction  Discharge  Liquid  Liquid Pump\n")
             .arg(temps ? QStringLiteral("Temp     ") : QString());
    for (int b = 0; b < Banks; ++b) {
        const PresssBank& k = r.banks[b];
        t += QStringLiteral("%1  %2%3  %4  %5  %6\n")
                 .arg(b + 1, 4)
                 .arg(temps ? QStringLiteral("%1  ").arg(torvanTemperature(report.torvan, b), 7) : QString())
                 .arg(presssPressureText(k.suction), 7)
                 .arg(presssPressureText(k.discharge), 9)
                 .arg(presssPressureText(k.liquid), 6)
                 .arg(onOff(k.liquidPump));
    }
    t += QStringLiteral("Liquid level: %1\n\n").arg(liquidLevelText(r.liquidLevel));
    t += QStringLiteral("Comp  Kind      Running  Load            Equal'z  Hours Run\n");
    for (const CompressorRecord& c : compressors(r)) {
        t += QStringLiteral("%1  %2  %3  %4  %5  %6 H\n")
                 .arg(c.number, 4)
                 .arg(kindText(c.kind), -8)
                 .arg(c.running ? QStringLiteral("YES") : QStringLiteral("NO"), -7)
                 .arg(loadText(r, c), -14)
                 .arg(onOff(r.equalizer[c.number - 1]), -7)
                 .arg(raw(r.hoursRun[c.number - 1]));
    }
    t += QStringLiteral("\nCond  Stage 1  Stage 2  Stage 3  Stage 4  Step             Hours Run\n");
    for (int c = 0; c < Condensers; ++c) {
        const CondenserReading reading = condenserReading(report, r, c);
        t += QStringLiteral("%1").arg(c + 1, 4);
        for (int s = 0; s < CondenserStages; ++s)
            t += QStringLiteral("  %1").arg(s < reading.stages ? onOff(r.condenser[c][s]) : QStringLiteral("-"), -7);
        const QString step = reading.variable ? reading.step + QStringLiteral(" ") + reading.percent
                                              : QStringLiteral("-");
        t += QStringLiteral("  %1  %2 H\n").arg(step, -15).arg(raw(r.hoursRunCondenser[c]));
    }
    if (!report.torvan.isEmpty()) {
        const QList<TorvanelAlarms> alarms = torvanelAlarms(r, report.torvan);
        t += QStringLiteral("\nTorvanel alarms:%1\n").arg(alarms.isEmpty() ? QStringLiteral(" none") : QString());
        for (const TorvanelAlarms& a : alarms)
            t += QStringLiteral("  Torvanel No. %1: %2\n").arg(a.number).arg(a.alarms.join(QStringLiteral(", ")));
    }
    return t;
}

QJsonObject pressureJson(const PressureReport& report)
{
    using namespace presss_layout;
    const PresssReply r = decoded(report);
    const auto pressure = [](const QString& n) {
        return QJsonObject{{"value", presssPressureText(n)}, {"raw", raw(n)}};
    };
    const bool temps = hasBankTemperatures(report);
    QJsonArray banks;
    for (int b = 0; b < Banks; ++b) {
        const PresssBank& k = r.banks[b];
        QJsonObject bank{{"bank", b + 1},
                         {"suction", pressure(k.suction)},
                         {"discharge", pressure(k.discharge)},
                         {"liquid", pressure(k.liquid)},
                         {"liquidPump", k.liquidPump}};
        if (temps)
            bank.insert("temperature",
                        QJsonObject{{"value", torvanTemperature(report.torvan, b)},
                                    {"raw", raw(replyfield::normalised(report.torvan, torvanTemperaturePos(b)))}});
        banks.append(bank);
    }
    QJsonArray comps;
    for (const CompressorRecord& c : compressors(r)) {
        QJsonObject j{{"number", c.number},
                      {"kind", kindText(c.kind)},
                      {"running", c.running},
                      {"stages", c.stages},
                      {"equalizer", r.equalizer[c.number - 1]},
                      {"hoursRun", raw(r.hoursRun[c.number - 1])}};
        if (c.kind == 2)
            j.insert("fullyLoaded", c.full);
        if (c.kind == 3) {
            j.insert("step", r.compressorStep[c.number - 1]);
            j.insert("percent", stepPercentText(r.compressorStep[c.number - 1]));
        }
        comps.append(j);
    }
    QJsonArray conds;
    for (int c = 0; c < Condensers; ++c) {
        const CondenserReading reading = condenserReading(report, r, c);
        QJsonArray stages;
        for (int s = 0; s < reading.stages; ++s)
            stages.append(r.condenser[c][s]);
        QJsonObject cond{{"number", c + 1}, {"stages", stages}, {"hoursRun", raw(r.hoursRunCondenser[c])}};
        if (reading.variable) {
            cond.insert("step", reading.step);
            cond.insert("percent", reading.percent);
        }
        conds.append(cond);
    }
    QJsonObject j{{"id", report.id},
                  {"version", report.version},
                  {"dateTime", r.dateTime},
                  {"banks", banks},
                  {"liquidLevel", QJsonObject{{"value", liquidLevelText(r.liquidLevel)}, {"raw", raw(r.liquidLevel)}}},
                  {"compressors", comps},
                  {"condensers", conds}};
    if (!report.torvan.isEmpty()) {
        QJsonArray torvanels;
        for (const TorvanelAlarms& a : torvanelAlarms(r, report.torvan))
            torvanels.append(QJsonObject{{"number", a.number}, {"alarms", QJsonArray::fromStringList(a.alarms)}});
        j.insert("torvanelAlarms", torvanels);
    }
    return j;
}
