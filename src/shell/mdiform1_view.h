#pragma once

#include "shell/mdiform1_engine.h"

#include <QHash>
#include <QMainWindow>
#include <functional>

class QMdiArea;
class QMdiSubWindow;
class QAction;
class QToolBar;
class HelpView;

// Makes one view: its engine (registered in the routing table by the
// factory) and its window. The window owns the engine; deleting the window
// unloads the view.
using ViewFactory = std::function<QWidget*(OpenViews& views)>;

// The main window: the connection form and at most one view, the "&View",
// "Close", "Window" and help menus, and the toolbar.
class MDIForm1_view : public QMainWindow, public ViewHost {
    Q_OBJECT
public:
    MDIForm1_view(OpenViews& views, LinkGlobals& globals, QWidget* parent = nullptr);
    ~MDIForm1_view() override;

    MDIForm1_engine& engine() { return m_engine; }
    // The connection form, shown whenever no view is open.
    void setConnectionForm(QWidget* ccForm1);
    void registerView(ViewId id, ViewFactory factory);
    HelpView* help();
    // F1: the help page of the view in front, or of the connection form.
    void showContextHelp();

    // ViewHost
    bool available(ViewId id) const override;
    void load(ViewId id) override;
    void unload(ViewId id) override;
    void maximise(ViewId id) override;
    void showConnectionForm() override;
    void unloadUploadProgress() override;
    void whatsThis() override;
    void showHelpContents() override;

    // The upload progress form registers itself here while it stands.
    void setUploadProgress(QWidget* w) { m_uploadProgress = w; }

protected:
    void closeEvent(QCloseEvent* event) override;
    // In "Whats this" mode a click on a control shows its help: its own
    // text, else its tool tip.
    bool eventFilter(QObject* watched, QEvent* event) override;

private:
    void buildMenus();
    void buildToolbar();
    void refresh();
    void mnuabout_Click();

    OpenViews& m_views;
    MDIForm1_engine m_engine;
    QMdiArea* m_area = nullptr;
    QMdiSubWindow* m_connection = nullptr;
    QToolBar* m_toolbar = nullptr;
    QHash<int, ViewFactory> m_factories;
    QHash<int, QMdiSubWindow*> m_open;
    QList<QAction*> m_on;
    QList<QAction*> m_off;
    QList<QAction*> m_tools;
    HelpView* m_help = nullptr;
    QWidget* m_uploadProgress = nullptr;
    bool m_exiting = false;
};
