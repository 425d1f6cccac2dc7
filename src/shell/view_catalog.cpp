#include "shell/view_catalog.h"

const QList<ViewInfo>& viewCatalog()
{
    static const QList<ViewInfo> views{
        {ViewId::history, "history", "frmhistory", "Temp/Press Data Logged", "tlbhistoryon"},
        {ViewId::alarm, "alarm", "frmalarm", "Alarms", "tlbalarmon"},
        {ViewId::status, "status", "frmstatus", "Current Status Temperature", "tlbstatuson"},
        {ViewId::channels, "channels", "channels", "Set Points", "tlbchannelson"},
        {ViewId::statusp, "statusp", "frmstatusp", "Current Status Pressure", "tlbstatuspon"},
        {ViewId::power, "power", "frmpower", "Power Used Data Logged", "tlbpoweron"},
        {ViewId::loadshed, "loadshed", "frmloadshed", "Set Load Shedding", "tlbloadshedon"},
        {ViewId::statusg, "statusg", "frmstatusg", "Current Status Temp Graphic", "tlbstatusgon"},
        {ViewId::statuspg, "statuspg", "frmstatuspg", "Current Status Press Graphic", "tlbstatuspgon"},
        {ViewId::front, "front", "frmfront", "Glacinor Front Panel", "tlbfronton"},
        {ViewId::brumalet, "brumalet", "frmbrumalet", "Current Brumalet's Data", "tlbbrumaleton"},
        {ViewId::multiprobes, "multiprobes", "frmmultiprobes", "Current Status Multi Probes", "tlbmultiprobeson"},
    };
    return views;
}

const ViewInfo& viewInfo(ViewId id)
{
    return viewCatalog()[int(id)];
}

const QList<ToolInfo>& toolbarCatalog()
{
    static const QList<ToolInfo> tools{
        {"tlbccform1on", "Disconnect Glacinor && return to selection window."},
        {"tlbchannelson", "Open all set points (not load shedding) window"},
        {"tlbloadshedon", "Open load shedding set points"},
        {"tlbfronton", "Open Glacinor front panel for setting functions."},
        {"tlbhistoryon", "Open  temperature/pressure data logged"},
        {"tlbpoweron", "Open power used data logged"},
        {"tlbalarmon", "Open alarms logged"},
        {"tlbstatuson", "Open current temperatures & status."},
        {"tlbstatusgon", "Open current temperatures & status graphic."},
        {"tlbmultiprobeson", "Open multi probes per room window"},
        {"tlbstatuspon", "Open compressor/condenser and pressures status"},
        {"tlbstatuspgon", "Open compressor/condenser/pressures status graphic"},
        {"tlbbrumaleton", "Individual Brumalet Data"},
        {"tlbContents", "Open room contents"},
        {"tlbwth", "Whats this help"},
    };
    return tools;
}

int viewForToolKey(const QString& key)
{
    for (const ViewInfo& v : viewCatalog())
        if (key == QLatin1String(v.toolKey))
            return int(v.id);
    return -1;
}

const QList<ViewId>& closingOrder()
{
    static const QList<ViewId> order{ViewId::front,   ViewId::power,   ViewId::statuspg, ViewId::statusp,
                                     ViewId::status,  ViewId::history, ViewId::alarm,    ViewId::statusg,
                                     ViewId::brumalet, ViewId::loadshed, ViewId::channels, ViewId::multiprobes};
    return order;
}

const QList<ViewId>& exitOrder()
{
    static const QList<ViewId> order{ViewId::history, ViewId::alarm,   ViewId::status,   ViewId::channels,
                                     ViewId::power,   ViewId::statusp, ViewId::loadshed, ViewId::statusg,
                                     ViewId::statuspg, ViewId::front,  ViewId::brumalet, ViewId::multiprobes};
    return order;
}

QString helpTopic(ViewId id)
{
    switch (id) {
    case ViewId::history:
        return QStringLiteral("Temp/Press Data Logged");
    case ViewId::alarm:
        return QStringLiteral("Alarms");
    case ViewId::status:
        return QStringLiteral("Channel Status Commands");
    case ViewId::channels:
        return QStringLiteral("Channel Set Points");
    case ViewId::statusp:
        return QStringLiteral("Current Status Pressure");
    case ViewId::power:
        return QStringLiteral("Power Used Data Logged");
    case ViewId::loadshed:
        return QStringLiteral("Set Load Shedding");
    case ViewId::statusg:
        return QStringLiteral("Current Status Temp Graphic");
    case ViewId::statuspg:
        return QStringLiteral("Current Status Press Graphic");
    case ViewId::front:
        return QStringLiteral("Glacinor Front Panel");
    case ViewId::brumalet:
        return QStringLiteral("Current Brumalet's Data");
    case ViewId::multiprobes:
        return QStringLiteral("Multi Probes Status Commands");
    }
    return kConnectionHelpTopic;
}
