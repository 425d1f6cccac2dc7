#pragma once

#include "link/open_views.h"
#include "platform/change_notifier.h"
#include "platform/control_state.h"
#include "shell/view_catalog.h"

#include <QObject>
#include <array>

struct LinkGlobals;
class Link;

// What the main window's engine asks of the windows: load and unload a view
// (its engine and its window), bring a form to the front. The widget side
// implements it; tests use a recording one.
class ViewHost {
public:
    virtual ~ViewHost() = default;
    // Whether this build has the view at all.
    virtual bool available(ViewId id) const = 0;
    // Makes the view's engine and window and registers the engine in the
    // routing table. A view whose data base fails shows its own message and
    // starts dbase_error; load still returns.
    virtual void load(ViewId id) = 0;
    // Destroys them and clears the view's engine pointer in the routing table.
    virtual void unload(ViewId id) = 0;
    virtual void maximise(ViewId id) = 0;
    // ccForm1 made visible and maximised.
    virtual void showConnectionForm() = 0;
    virtual void unloadUploadProgress() = 0;
    // The maximised form enters What's This mode.
    virtual void whatsThis() = 0;
    virtual void showHelpContents() = 0;
};

// The main window without pixels: which view is open, the menus' checks,
// opening one view closes the others, closing the last brings the
// connection form back, and the clean exit.
class MDIForm1_engine : public QObject, public ShellView {
    Q_OBJECT
public:
    MDIForm1_engine(OpenViews& views, LinkGlobals& globals, ViewHost& host, QObject* parent = nullptr);

    // The line side, for the hang-up of mnualloff_Click; null before it exists.
    void setLink(Link* link) { m_link = link; }

    // The "&View" items (checked when open) and the "Close" items, by view.
    std::array<ControlState, kViewCount> mnuon;
    std::array<ControlState, kViewCount> mnuoff;
    ControlState Toolbar1;
    // The toolbar's buttons in the toolbar's order.
    QList<ControlState> toolButtons;

    void MDIForm_Load();

    // mnuhistoryon_Click ... mnumultiprobeson_Click.
    void mnuon_Click(ViewId id);
    // mnuhistoryoff_Click ... mnumultiprobesoff_Click.
    void mnuoff_Click(ViewId id);
    // A view closed by its own window: its boolean and menu items follow.
    void viewUnloaded(ViewId id);
    void toolbar_ButtonClick(const QString& key);

    void mnustatusgon_Click() { mnuon_Click(ViewId::statusg); }
    void mnustatuspgon_Click() { mnuon_Click(ViewId::statuspg); }
    void mnustatusgoff_Click() { mnuoff_Click(ViewId::statusg); }
    void mnustatuspgoff_Click() { mnuoff_Click(ViewId::statuspg); }

    // Exit: every view unloaded, in the exit order, and no hang-up string:
    // the operator hangs up first.
    void mnuexit_Click();

    bool isOpen(ViewId id) const;
    // The one open view, or -1.
    int openView() const;

    // ShellView, for the line side.
    void mnualarmon_Click() override { mnuon_Click(ViewId::alarm); }
    void mnualloff_Click() override;
    void setToolbarEnabled(bool on) override;
    void unloadUploadProgress() override;

signals:
    void changed();
    void quitRequested();

private:
    bool& flag(ViewId id);
    void close_others_for(ViewId id);
    void setChecks(ViewId id, bool on);
    void unloadView(ViewId id);

    OpenViews& m_views;
    LinkGlobals& m_globals;
    ViewHost& m_host;
    Link* m_link = nullptr;
    ChangeNotifier m_notify{[this] { emit changed(); }};
};
