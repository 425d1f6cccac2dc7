#include "shell/mdiform1_engine.h"

#include "link/link.h"
#include "link/link_globals.h"

namespace {
const QString kNotYet = QStringLiteral("Not available in this version of the workstation yet");
}

MDIForm1_engine::MDIForm1_engine(OpenViews& views, LinkGlobals& globals, ViewHost& host, QObject* parent)
    : QObject(parent), m_views(views), m_globals(globals), m_host(host)
{
    m_views.shell = this;
    for (const ToolInfo& t : toolbarCatalog()) {
        ControlState s;
        s.text = QString::fromLatin1(t.key);
        s.toolTip = QString::fromLatin1(t.toolTip);
        toolButtons.append(s);
    }
}

bool& MDIForm1_engine::flag(ViewId id)
{
    switch (id) {
    case ViewId::history:
        return m_views.history_open;
    case ViewId::alarm:
        return m_views.alarm_open;
    case ViewId::status:
        return m_views.status_open;
    case ViewId::channels:
        return m_views.channels_open;
    case ViewId::statusp:
        return m_views.statusp_open;
    case ViewId::power:
        return m_views.power_open;
    case ViewId::loadshed:
        return m_views.loadshed_open;
    case ViewId::statusg:
        return m_views.statusg_open;
    case ViewId::statuspg:
        return m_views.statuspg_open;
    case ViewId::front:
        return m_views.front_open;
    case ViewId::brumalet:
        return m_views.brumalet_open;
    case ViewId::multiprobes:
        break;
    }
    return m_views.multiprobes_open;
}

bool MDIForm1_engine::isOpen(ViewId id) const
{
    return const_cast<MDIForm1_engine*>(this)->flag(id);
}

int MDIForm1_engine::openView() const
{
    for (const ViewInfo& v : viewCatalog())
        if (isOpen(v.id))
            return int(v.id);
    return -1;
}

void MDIForm1_engine::MDIForm_Load()
{
    const auto p = m_notify.procedure();
    m_views.closeAll();
    m_globals.link_up = false;
    m_globals.smart_help_open = false;
    for (const ViewInfo& v : viewCatalog()) {
        const int i = int(v.id);
        const bool there = m_host.available(v.id);
        for (ControlState* item : {&mnuon[i], &mnuoff[i]}) {
            item->text = QString::fromLatin1(v.caption);
            item->value = false;
            item->enabled = there;
            item->toolTip = there ? QString() : kNotYet;
        }
        for (ControlState& b : toolButtons) {
            if (b.text == QLatin1String(v.toolKey) && !there) {
                b.enabled = false;
                b.toolTip = QString::fromLatin1(toolbarCatalog()[int(&b - toolButtons.data())].toolTip)
                            + QStringLiteral(" (") + kNotYet + QStringLiteral(")");
            }
        }
    }
}

void MDIForm1_engine::setChecks(ViewId id, bool on)
{
    mnuon[int(id)].value = on;
    mnuoff[int(id)].value = on;
}

void MDIForm1_engine::unloadView(ViewId id)
{
    m_host.unload(id);
    flag(id) = false;
    setChecks(id, false);
}

void MDIForm1_engine::close_others_for(ViewId id)
{
    for (ViewId other : closingOrder()) {
        if (other != id && flag(other))
            unloadView(other);
    }
    flag(id) = true;
    setChecks(id, true);
}

void MDIForm1_engine::mnuon_Click(ViewId id)
{
    const auto p = m_notify.procedure();
    if (!m_host.available(id))
        return;
    if (!flag(id)) {
        flag(id) = true;
        close_others_for(id);
        // A view whose data base fails says so in a box.
        m_notify.flush();
        m_host.load(id);
    }
    // The load may have failed and closed everything again (dbase_error).
    if (flag(id)) {
        m_host.maximise(id);
        setChecks(id, true);
    }
}

void MDIForm1_engine::mnuoff_Click(ViewId id)
{
    const auto p = m_notify.procedure();
    if (flag(id))
        m_host.unload(id);
    flag(id) = false;
    setChecks(id, false);
    if (!m_views.anyOpen())
        m_host.showConnectionForm();
}

void MDIForm1_engine::viewUnloaded(ViewId id)
{
    const auto p = m_notify.procedure();
    if (!flag(id))
        return;
    flag(id) = false;
    setChecks(id, false);
    if (!m_views.anyOpen())
        m_host.showConnectionForm();
}

void MDIForm1_engine::mnualloff_Click()
{
    const auto p = m_notify.procedure();
    m_globals.link_up = false;
    for (const ViewInfo& v : viewCatalog()) {
        if (flag(v.id))
            m_host.unload(v.id);
        flag(v.id) = false;
        setChecks(v.id, false);
    }
    if (m_link)
        m_link->hangUp();
    m_host.showConnectionForm();
}

void MDIForm1_engine::toolbar_ButtonClick(const QString& key)
{
    const auto p = m_notify.procedure();
    if (key == QLatin1String("tlbccform1on")) {
        mnualloff_Click();
        return;
    }
    if (key == QLatin1String("tlbwth")) {
        m_host.whatsThis();
        return;
    }
    if (key == QLatin1String("tlbContents")) {
        m_host.showHelpContents();
        return;
    }
    const int view = viewForToolKey(key);
    if (view >= 0)
        mnuon_Click(ViewId(view));
}

void MDIForm1_engine::mnuexit_Click()
{
    {
        const auto p = m_notify.procedure();
        for (ViewId id : exitOrder()) {
            if (flag(id))
                unloadView(id);
        }
    }
    emit quitRequested();
}

void MDIForm1_engine::setToolbarEnabled(bool on)
{
    const auto p = m_notify.procedure();
    Toolbar1.enabled = on;
}

void MDIForm1_engine::unloadUploadProgress()
{
    m_host.unloadUploadProgress();
}
