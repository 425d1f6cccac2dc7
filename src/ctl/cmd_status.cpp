// q19ctl status and q19ctl pressure: one status request, as the temperature
// and pressure views send it, and the decoded reply on stdout.

#include "ctl/ctl_command.h"
#include "ctl/ctl_connect.h"
#include "link/commands.h"
#include "status/presss_codec.h"
#include "status/status_codec.h"
#include "status/status_cycle.h"

#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <algorithm>
#include <cstdio>

namespace {

// Takes the reply the dispatcher hands to an open status view.
class ReplyCatcher : public TemperatureStatusView, public PressureStatusView {
public:
    explicit ReplyCatcher(Link& link) : m_link(link) {}
    bool stopstatusEnabled() const override { return false; }
    void stopstatus_Click() override {}
    void status_do() override { status = m_link.test3Text(); }
    void statusp_do() override { presss = m_link.test3Text(); }
    void statuspa_do() override { torvan = m_link.test3Text(); }

    QString status, presss, torvan;

private:
    Link& m_link;
};

double raw(const QString& normalised)
{
    return replyfield::val(normalised);
}

QString onOff(bool on)
{
    return on ? QStringLiteral("ON") : QStringLiteral("OFF");
}

void print(const QString& text)
{
    std::fputs(text.toLocal8Bit().constData(), stdout);
    std::fflush(stdout);
}

QString jsonText(const QJsonObject& j)
{
    return QString::fromUtf8(QJsonDocument(j).toJson(QJsonDocument::Indented));
}

// The view's no-reply wait: the line's speed factor times the view's own.
int noReplyWait(ctl::Connection& c, StatusViewKind view)
{
    return c.globals.speed_factor * StatusCycleParams::of(view).noReplyWait;
}

int noResponse(Operator& op)
{
    // The same message the view shows when its manual request goes unanswered.
    op.message(QStringLiteral("No Response"), {QStringLiteral("The Glacinor failed to respond,"),
                                             QStringLiteral("Re do the last command.")});
    return ctl::Failure;
}

// --- status ---------------------------------------------------------------

QString statusTable(const QString& id, const StatusReply& r)
{
    using namespace status_layout;
    QString t = QStringLiteral("Glacinor ID %1   Date and Time %2\n\n").arg(id, r.dateTime);
    t += QStringLiteral("%1  %2 %3  %4  Liquid  Fans  Defrost  Suction%5\n")
             .arg(QStringLiteral("Chan"))
             .arg(QStringLiteral("Value"), -10)
             .arg(QStringLiteral("Raw"), 6)
             .arg(QStringLiteral("Alarm"), -5)
             .arg(r.hasPid ? QStringLiteral("  PID") : QString());
    for (int n = 1; n <= Channels; ++n) {
        t += QStringLiteral("%1  %2 %3  %4")
                 .arg(n, 4)
                 .arg(channelValueText(r.value[n]), -10)
                 .arg(r.value[n], 6)
                 .arg(r.alarm[n] ? QStringLiteral("YES") : QStringLiteral("NO"), -5);
        if (n <= OutputChannels) {
            const StatusOutputs& o = r.outputs[n];
            t += QStringLiteral("  %1  %2  %3  %4")
                     .arg(onOff(o.liquid), -6)
                     .arg(onOff(o.fan), -4)
                     .arg(onOff(o.defrost), -7)
                     .arg(onOff(o.suction), -7);
            if (r.hasPid)
                t += QStringLiteral("  %1 %").arg(r.pid[n]);
        }
        t += QLatin1Char('\n');
    }
    t += QStringLiteral("\nSuction pressures:");
    for (int i = 0; i < Suctions; ++i)
        t += QLatin1Char(' ') + (r.hasSuction ? suctionBoxText(r.suction[i]) : QStringLiteral("N/A"));
    t += QStringLiteral("\nPressures (channels %1 to %2):").arg(FirstPressureChannel).arg(Channels);
    for (int k = 0; k < Pressures; ++k)
        t += QLatin1Char(' ') + (r.hasPressures ? pressureBoxText(r.pressure[k]) : QStringLiteral("N/A"));
    return t + QLatin1Char('\n');
}

QJsonObject statusJson(const QString& id, const QString& version, const StatusReply& r)
{
    using namespace status_layout;
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
            if (r.hasPid)
                c.insert("pid", raw(r.pid[n]));
        }
        channels.append(c);
    }
    QJsonObject j{{"id", id}, {"version", version}, {"dateTime", r.dateTime}, {"channels", channels}};
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

int status(const CtlOptions& o)
{
    if (!o.args.isEmpty()) {
        std::fprintf(stderr, "q19ctl: status takes no arguments\n");
        return ctl::Usage;
    }
    ctl::Connection c(o);
    if (const int rc = c.open(QStringLiteral("status")); rc != ctl::Ok)
        return rc;
    ReplyCatcher catcher(c.engine());
    c.views.status = &catcher;
    c.views.status_open = true;
    c.engine().Output(commands::statusRequest());
    if (!c.waitFor([&] { return !catcher.status.isEmpty(); }, noReplyWait(c, StatusViewKind::status)))
        return noResponse(c.op);
    const StatusReply r = decodeStatus(catcher.status, c.globals.versionNumber());
    print(o.json ? jsonText(statusJson(c.id(), c.globals.instrument_version, r)) : statusTable(c.id(), r));
    return ctl::Ok;
}

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

QString pressureTable(const QString& id, const PresssReply& r, const QString& torvan)
{
    using namespace presss_layout;
    QString t = QStringLiteral("Glacinor ID %1   Date and Time %2\n\n").arg(id, r.dateTime);
    t += QStringLiteral("Bank  Suction  Discharge  Liquid  Liquid Pump\n");
    for (int b = 0; b < Banks; ++b) {
        const PresssBank& k = r.banks[b];
        t += QStringLiteral("%1  %2  %3  %4  %5\n")
                 .arg(b + 1, 4)
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
    t += QStringLiteral("\nCond  Stage 1  Stage 2  Stage 3  Stage 4  Step  Hours Run\n");
    for (int c = 0; c < Condensers; ++c) {
        t += QStringLiteral("%1").arg(c + 1, 4);
        for (bool on : r.condenser[c])
            t += QStringLiteral("  %1").arg(onOff(on), -7);
        t += QStringLiteral("  %1  %2 H\n").arg(r.condenserStep[c], 4).arg(raw(r.hoursRunCondenser[c]));
    }
    if (!torvan.isEmpty()) {
        const QList<TorvanelAlarms> alarms = torvanelAlarms(r, torvan);
        t += QStringLiteral("\nTorvanel alarms:%1\n").arg(alarms.isEmpty() ? QStringLiteral(" none") : QString());
        for (const TorvanelAlarms& a : alarms)
            t += QStringLiteral("  Torvanel No. %1: %2\n").arg(a.number).arg(a.alarms.join(QStringLiteral(", ")));
    }
    return t;
}

QJsonObject pressureJson(const QString& id, const QString& version, const PresssReply& r, const QString& torvan)
{
    using namespace presss_layout;
    const auto pressure = [](const QString& n) {
        return QJsonObject{{"value", presssPressureText(n)}, {"raw", raw(n)}};
    };
    QJsonArray banks;
    for (int b = 0; b < Banks; ++b) {
        const PresssBank& k = r.banks[b];
        banks.append(QJsonObject{{"bank", b + 1},
                                 {"suction", pressure(k.suction)},
                                 {"discharge", pressure(k.discharge)},
                                 {"liquid", pressure(k.liquid)},
                                 {"liquidPump", k.liquidPump}});
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
        QJsonArray stages;
        for (bool on : r.condenser[c])
            stages.append(on);
        conds.append(QJsonObject{{"number", c + 1},
                                 {"stages", stages},
                                 {"step", r.condenserStep[c]},
                                 {"hoursRun", raw(r.hoursRunCondenser[c])}});
    }
    QJsonObject j{{"id", id},
                  {"version", version},
                  {"dateTime", r.dateTime},
                  {"banks", banks},
                  {"liquidLevel", QJsonObject{{"value", liquidLevelText(r.liquidLevel)}, {"raw", raw(r.liquidLevel)}}},
                  {"compressors", comps},
                  {"condensers", conds}};
    if (!torvan.isEmpty()) {
        QJsonArray torvanels;
        for (const TorvanelAlarms& a : torvanelAlarms(r, torvan))
            torvanels.append(QJsonObject{{"number", a.number}, {"alarms", QJsonArray::fromStringList(a.alarms)}});
        j.insert("torvanelAlarms", torvanels);
    }
    return j;
}

int pressure(const CtlOptions& o)
{
    if (!o.args.isEmpty()) {
        std::fprintf(stderr, "q19ctl: pressure takes no arguments\n");
        return ctl::Usage;
    }
    ctl::Connection c(o);
    if (const int rc = c.open(QStringLiteral("pressure")); rc != ctl::Ok)
        return rc;
    ReplyCatcher catcher(c.engine());
    c.views.statusp = &catcher;
    c.views.statusp_open = true;
    const int wait = noReplyWait(c, StatusViewKind::statusp);
    c.engine().Output(commands::pressureRequest());
    if (!c.waitFor([&] { return !catcher.presss.isEmpty(); }, wait))
        return noResponse(c.op);
    // From version 8 the Torvanels' alarms follow, as the view asks for them
    // after each reply.
    const bool torvanels = c.globals.versionNumber() >= presss_layout::TorvanelRequestVersion;
    if (torvanels) {
        c.engine().Output(commands::framed(commands::Sender::StatusP, "t"));
        if (!c.waitFor([&] { return !catcher.torvan.isEmpty(); }, wait))
            return noResponse(c.op);
    }
    const PresssReply r = decodePresss(catcher.presss, c.globals.versionNumber());
    print(o.json ? jsonText(pressureJson(c.id(), c.globals.instrument_version, r, catcher.torvan))
                 : pressureTable(c.id(), r, catcher.torvan));
    return ctl::Ok;
}

const ctl::Registration statusRegistration({QStringLiteral("status"), QString(),
                                             QStringLiteral("ask once for the temperature status and print "
                                                            "every channel, the suction and pressure inputs"),
                                             status});
const ctl::Registration pressureRegistration({QStringLiteral("pressure"), QString(),
                                               QStringLiteral("ask once for the pressure status and print the "
                                                              "banks, compressors, condensers and Torvanel alarms"),
                                               pressure});

} // namespace
