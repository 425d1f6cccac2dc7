// q19ctl status and q19ctl pressure: one status request, as the temperature
// and pressure views send it, and the decoded reply on stdout.

#include "ctl/ctl_command.h"
#include "ctl/ctl_connect.h"
#include "ctl/status_report.h"
#include "directory/data_folder.h"
#include "link/commands.h"
#include "setpoints/catalogue.h"
#include "setpoints/instrument_store.h"
#include "status/presss_codec.h"
#include "status/status_codec.h"
#include "status/status_cycle.h"

#include <QJsonDocument>
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

void print(const QString& text)
{
    std::fputs(text.toLocal8Bit().constData(), stdout);
    std::fflush(stdout);
}

QString jsonText(const QJsonObject& j)
{
    return QString::fromUtf8(QJsonDocument(j).toJson(QJsonDocument::Indented));
}

// One set point field of the first rows of the instrument's store, as the
// views read it to shape themselves; empty when the store cannot be read.
QList<int> setpointColumn(const CtlOptions& o, const QString& id, int field, int rows)
{
    QList<int> column;
    std::unique_ptr<InstrumentStore> store = InstrumentStore::open(DataFolder(o.dataDir).instrumentFile(id));
    for (int row = 0; store && row < rows; ++row)
        column.append(store->setpoint(row, field).toInt());
    return column;
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
    StatusReport report{c.id(), c.globals.instrument_version, c.globals.versionNumber(), catcher.status, {}};
    report.controlKinds = setpointColumn(o, c.id(), catalogue::kControlKindField, status_layout::Channels);
    print(o.json ? jsonText(statusJson(report)) : statusTable(report));
    return ctl::Ok;
}

// --- pressure -------------------------------------------------------------

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
        c.engine().Output(commands::torvanelRequest());
        if (!c.waitFor([&] { return !catcher.torvan.isEmpty(); }, wait))
            return noResponse(c.op);
    }
    PressureReport report{c.id(), c.globals.instrument_version, c.globals.versionNumber(), catcher.presss,
                          catcher.torvan, {}};
    report.condenserKinds = setpointColumn(o, c.id(), catalogue::kCondenserKindField, presss_layout::Condensers);
    print(o.json ? jsonText(pressureJson(report)) : pressureTable(report));
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
