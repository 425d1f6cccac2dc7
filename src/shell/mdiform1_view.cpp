#include "shell/mdiform1_view.h"

#include "shell/frmabout_view.h"
#include "shell/help_view.h"
#include "shell/widget_icons.h"

#include <QAction>
#include <QApplication>
#include <QCloseEvent>
#include <QHelpEvent>
#include <QMdiArea>
#include <QMdiSubWindow>
#include <QMenuBar>
#include <QPointer>
#include <QSettings>
#include <QToolBar>
#include <QWhatsThis>

MDIForm1_view::MDIForm1_view(OpenViews& views, LinkGlobals& globals, QWidget* parent)
    : QMainWindow(parent), m_views(views), m_engine(views, globals, *this)
{
    setObjectName(QStringLiteral("MDIForm1"));
    setWindowTitle(QStringLiteral("Glacinor Q-19"));
    setWindowIcon(q19Icon(QStringLiteral("app")));
    m_area = new QMdiArea(this);
    m_area->setObjectName(QStringLiteral("mdiArea"));
    m_area->setHorizontalScrollBarPolicy(Qt::ScrollBarAsNeeded);
    m_area->setVerticalScrollBarPolicy(Qt::ScrollBarAsNeeded);
    setCentralWidget(m_area);
    buildToolbar();
    buildMenus();
    connect(&m_engine, &MDIForm1_engine::changed, this, &MDIForm1_view::refresh);
    connect(&m_engine, &MDIForm1_engine::quitRequested, this, [this] {
        m_exiting = true;
        close();
    });

    QSettings settings;
    if (!restoreGeometry(settings.value(QStringLiteral("MainWindow/geometry")).toByteArray()))
        resize(1280, 760);
    restoreState(settings.value(QStringLiteral("MainWindow/state")).toByteArray());
    qApp->installEventFilter(this);
}

MDIForm1_view::~MDIForm1_view()
{
    // The views' windows go with the area after this object's members: they
    // must not report their unloading to an engine that has gone.
    m_exiting = true;
    for (QMdiSubWindow* sub : std::as_const(m_open))
        sub->disconnect(this);
}

void MDIForm1_view::buildToolbar()
{
    m_toolbar = addToolBar(QStringLiteral("Toolbar1"));
    m_toolbar->setObjectName(QStringLiteral("Toolbar1"));
    m_toolbar->setIconSize(QSize(32, 32));
    m_toolbar->setMovable(false);
    for (const ToolInfo& t : toolbarCatalog()) {
        const QString key = QString::fromLatin1(t.key);
        auto* a = m_toolbar->addAction(q19Icon(key), QString::fromLatin1(t.toolTip).replace("&&", "&"));
        a->setObjectName(key);
        connect(a, &QAction::triggered, this, [this, key] { m_engine.toolbar_ButtonClick(key); });
        m_tools.append(a);
        // A gap between the connection button, the set point views, the logs,
        // the live views and help, as the families go.
        if (key == "tlbccform1on" || key == "tlbfronton" || key == "tlbalarmon" || key == "tlbbrumaleton")
            m_toolbar->addSeparator();
    }
}

void MDIForm1_view::buildMenus()
{
    QMenu* view = menuBar()->addMenu(QStringLiteral("&View"));
    view->setObjectName(QStringLiteral("mnuview"));
    QMenu* close = menuBar()->addMenu(QStringLiteral("Close"));
    close->setObjectName(QStringLiteral("mnuclose"));
    for (const ViewInfo& v : viewCatalog()) {
        const ViewId id = v.id;
        auto* on = view->addAction(QString::fromLatin1(v.caption));
        on->setObjectName(QStringLiteral("mnu%1on").arg(QLatin1String(v.name)));
        on->setCheckable(true);
        connect(on, &QAction::triggered, this, [this, id] { m_engine.mnuon_Click(id); });
        m_on.append(on);
        auto* off = close->addAction(QString::fromLatin1(v.caption));
        off->setObjectName(QStringLiteral("mnu%1off").arg(QLatin1String(v.name)));
        off->setCheckable(true);
        connect(off, &QAction::triggered, this, [this, id] { m_engine.mnuoff_Click(id); });
        m_off.append(off);
    }
    close->addSeparator();
    auto* all = close->addAction(QStringLiteral("All"));
    all->setObjectName(QStringLiteral("mnualloff"));
    connect(all, &QAction::triggered, &m_engine, &MDIForm1_engine::mnualloff_Click);

    auto* exit = menuBar()->addAction(QStringLiteral("&Exit"));
    exit->setObjectName(QStringLiteral("mnuexit"));
    exit->setShortcut(QKeySequence::Quit);
    connect(exit, &QAction::triggered, &m_engine, &MDIForm1_engine::mnuexit_Click);
    addAction(exit); // the shortcut works while the menu bar item is a plain action

    QMenu* window = menuBar()->addMenu(QStringLiteral("Window"));
    window->setObjectName(QStringLiteral("mnuwindow"));
    connect(window->addAction(QStringLiteral("Cascade")), &QAction::triggered, m_area, &QMdiArea::cascadeSubWindows);
    connect(window->addAction(QStringLiteral("Tile Horizontal")), &QAction::triggered, m_area, &QMdiArea::tileSubWindows);
    connect(window->addAction(QStringLiteral("Tile Vertical")), &QAction::triggered, m_area, &QMdiArea::tileSubWindows);

    QMenu* helpMenu = menuBar()->addMenu(QStringLiteral("&Help"));
    helpMenu->setObjectName(QStringLiteral("mnuhelpmenu"));
    auto* contents = helpMenu->addAction(QStringLiteral("Glacinor Help"));
    contents->setObjectName(QStringLiteral("mnuhelp"));
    connect(contents, &QAction::triggered, this, [this] { help()->show_help(QStringLiteral("q-19.chm")); });
    auto* viewHelp = helpMenu->addAction(QStringLiteral("Help on this window"));
    viewHelp->setObjectName(QStringLiteral("mnuhelpview"));
    viewHelp->setShortcut(QKeySequence::HelpContents);
    viewHelp->setShortcutContext(Qt::ApplicationShortcut);
    connect(viewHelp, &QAction::triggered, this, &MDIForm1_view::showContextHelp);
    auto* whatsThisItem = helpMenu->addAction(QStringLiteral("Whats this help"));
    whatsThisItem->setObjectName(QStringLiteral("mnuwhatsthis"));
    whatsThisItem->setShortcut(QKeySequence::WhatsThis);
    connect(whatsThisItem, &QAction::triggered, this, &MDIForm1_view::whatsThis);
    auto* about = helpMenu->addAction(QStringLiteral("About Glacinor"));
    about->setObjectName(QStringLiteral("mnuabout"));
    connect(about, &QAction::triggered, this, &MDIForm1_view::mnuabout_Click);
}

void MDIForm1_view::refresh()
{
    for (int i = 0; i < kViewCount; ++i) {
        for (auto [action, state] : {std::pair{m_on[i], &m_engine.mnuon[i]}, std::pair{m_off[i], &m_engine.mnuoff[i]}}) {
            action->setChecked(state->value.toBool());
            action->setEnabled(state->enabled);
            action->setToolTip(state->toolTip);
        }
    }
    for (int i = 0; i < m_tools.size() && i < m_engine.toolButtons.size(); ++i) {
        m_tools[i]->setEnabled(m_engine.toolButtons[i].enabled);
        m_tools[i]->setToolTip(m_engine.toolButtons[i].toolTip.replace("&&", "&"));
    }
    m_toolbar->setEnabled(m_engine.Toolbar1.enabled);
    for (QMenu* m : menuBar()->findChildren<QMenu*>())
        m->setToolTipsVisible(true);
}

void MDIForm1_view::setConnectionForm(QWidget* ccForm1)
{
    m_connection = m_area->addSubWindow(ccForm1, Qt::SubWindow | Qt::WindowTitleHint);
    m_connection->setObjectName(QStringLiteral("ccForm1Window"));
    m_connection->setWindowTitle(ccForm1->windowTitle());
    m_connection->setWindowIcon(q19Icon(QStringLiteral("tlbccform1on")));
    showConnectionForm();
}

void MDIForm1_view::registerView(ViewId id, ViewFactory factory)
{
    m_factories.insert(int(id), std::move(factory));
}

HelpView* MDIForm1_view::help()
{
    if (!m_help)
        m_help = new HelpView(this);
    return m_help;
}

void MDIForm1_view::showContextHelp()
{
    QString topic = kConnectionHelpTopic;
    const QMdiSubWindow* front = m_area->activeSubWindow();
    for (auto it = m_open.cbegin(); it != m_open.cend(); ++it) {
        if (it.value() == front)
            topic = helpTopic(ViewId(it.key()));
    }
    help()->show_help(QStringLiteral("q-19.chm"), topic);
}

bool MDIForm1_view::eventFilter(QObject* watched, QEvent* event)
{
    if (event->type() != QEvent::WhatsThis && event->type() != QEvent::QueryWhatsThis)
        return QMainWindow::eventFilter(watched, event);
    auto* w = qobject_cast<QWidget*>(watched);
    if (!w || !w->whatsThis().isEmpty() || !isAncestorOf(w))
        return QMainWindow::eventFilter(watched, event);
    // A control without a text of its own is explained by its tool tip; one
    // without either passes the question on to its parent.
    const QString text = w->toolTip();
    if (text.isEmpty())
        return QMainWindow::eventFilter(watched, event);
    event->accept();
    if (event->type() == QEvent::WhatsThis)
        QWhatsThis::showText(static_cast<QHelpEvent*>(event)->globalPos(), text.toHtmlEscaped(), w);
    return true;
}

bool MDIForm1_view::available(ViewId id) const
{
    return m_factories.contains(int(id));
}

void MDIForm1_view::load(ViewId id)
{
    const auto f = m_factories.find(int(id));
    if (f == m_factories.end() || m_open.contains(int(id)))
        return;
    QWidget* w = (*f)(m_views);
    if (!w)
        return;
    QMdiSubWindow* sub = m_area->addSubWindow(w);
    sub->setAttribute(Qt::WA_DeleteOnClose);
    sub->setWindowTitle(QString::fromLatin1(viewInfo(id).caption));
    sub->setWindowIcon(q19Icon(QString::fromLatin1(viewInfo(id).toolKey)));
    m_open.insert(int(id), sub);
    // Closing by the window's own close box ends in the same state as the menu.
    connect(sub, &QObject::destroyed, this, [this, id] {
        if (m_open.remove(int(id)) && !m_exiting)
            m_engine.viewUnloaded(id);
    });
    sub->show();
}

void MDIForm1_view::unload(ViewId id)
{
    if (QMdiSubWindow* sub = m_open.take(int(id))) {
        sub->disconnect(this);
        delete sub;
    }
}

void MDIForm1_view::maximise(ViewId id)
{
    if (QMdiSubWindow* sub = m_open.value(int(id))) {
        sub->showMaximized();
        m_area->setActiveSubWindow(sub);
    }
}

void MDIForm1_view::showConnectionForm()
{
    if (!m_connection)
        return;
    m_connection->show();
    m_connection->showMaximized();
    m_area->setActiveSubWindow(m_connection);
}

void MDIForm1_view::unloadUploadProgress()
{
    if (m_uploadProgress) {
        m_uploadProgress->close();
        m_uploadProgress = nullptr;
    }
}

void MDIForm1_view::whatsThis()
{
    QWhatsThis::enterWhatsThisMode();
}

void MDIForm1_view::showHelpContents()
{
    help()->show_help(QStringLiteral("q-19.chm"));
}

void MDIForm1_view::mnuabout_Click()
{
    frmAbout_view about(this);
    about.exec();
}

void MDIForm1_view::closeEvent(QCloseEvent* event)
{
    if (!m_exiting) {
        m_exiting = true;
        m_engine.mnuexit_Click();
    }
    QSettings settings;
    settings.setValue(QStringLiteral("MainWindow/geometry"), saveGeometry());
    settings.setValue(QStringLiteral("MainWindow/state"), saveState());
    if (m_help)
        m_help->close();
    event->accept();
}
