#include "link/link_globals.h"
#include "shell/mdiform1_view.h"
#include "shell/frmabout_view.h"
#include "shell/help_view.h"

#include <QtTest>
#include <QtWidgets>

class TestMainWindow : public QObject {
    Q_OBJECT
private slots:
    void initTestCase();
    void menusAndToolbarFollowTheEngine();
    void aRegisteredViewOpensMaximisedAndClosesBack();
    void aboutShowsVersionAndSystem();
    void f1OpensThePageOfTheViewInFront_data();
    void f1OpensThePageOfTheViewInFront();
    void whatsThisShowsTheClickedControlsHelp();
};

void TestMainWindow::initTestCase()
{
    QCoreApplication::setOrganizationName("q19-tests");
    QStandardPaths::setTestModeEnabled(true);
}

void TestMainWindow::menusAndToolbarFollowTheEngine()
{
    OpenViews views;
    LinkGlobals g;
    MDIForm1_view w(views, g);
    w.engine().MDIForm_Load();
    w.show();
    auto* toolbar = w.findChild<QToolBar*>("Toolbar1");
    QVERIFY(toolbar);
    QStringList keys;
    for (QAction* a : toolbar->actions())
        if (!a->isSeparator())
            keys << a->objectName();
    QCOMPARE(keys.size(), 15);
    QCOMPARE(keys.first(), QString("tlbccform1on"));
    QCOMPARE(keys.last(), QString("tlbwth"));
    auto* status = w.findChild<QAction*>("mnustatuson");
    QVERIFY(status);
    QCOMPARE(status->text(), QString("Current Status Temperature"));
    // Nothing registered: the view cannot be opened and says why.
    QVERIFY(!status->isEnabled());
    QVERIFY(!status->toolTip().isEmpty());
    QVERIFY(w.findChild<QAction*>("tlbccform1on")->isEnabled());
}

void TestMainWindow::aRegisteredViewOpensMaximisedAndClosesBack()
{
    OpenViews views;
    LinkGlobals g;
    MDIForm1_view w(views, g);
    auto* cc = new QLabel("connection");
    cc->setObjectName("ccForm1");
    w.registerView(ViewId::alarm, [](OpenViews&) {
        auto* v = new QLabel("alarms");
        v->setObjectName("frmalarm");
        return v;
    });
    w.engine().MDIForm_Load();
    w.setConnectionForm(cc);
    w.show();
    w.findChild<QAction*>("mnualarmon")->trigger();
    QVERIFY(views.alarm_open);
    auto* area = w.findChild<QMdiArea*>();
    QVERIFY(area->activeSubWindow());
    QCOMPARE(area->activeSubWindow()->widget()->objectName(), QString("frmalarm"));
    QVERIFY(area->activeSubWindow()->isMaximized());
    QVERIFY(w.findChild<QAction*>("mnualarmoff")->isChecked());
    // Closed by its own window: the flag and the checks follow.
    area->activeSubWindow()->close();
    QTRY_VERIFY(!views.alarm_open);
    QVERIFY(!w.findChild<QAction*>("mnualarmon")->isChecked());
    QCOMPARE(area->activeSubWindow()->widget()->objectName(), QString("ccForm1"));
}

void TestMainWindow::aboutShowsVersionAndSystem()
{
    frmAbout_view about;
    QVERIFY(about.lblVersion->text().startsWith("Version "));
    const QString info = frmAbout_view::systemInformation();
    QVERIFY(info.contains("Qt: 6."));
    QVERIFY(info.contains(QRegularExpression("SQLite: 3\\.\\d+")));
}

void TestMainWindow::f1OpensThePageOfTheViewInFront_data()
{
    QTest::addColumn<QString>("menuItem"); // empty: no view open
    QTest::addColumn<QString>("page");
    QTest::newRow("connection form") << QString() << "connection-window.html";
    QTest::newRow("temperature status") << "mnustatuson" << "channel-status-commands.html";
    QTest::newRow("pressure status") << "mnustatuspon" << "current-status-pressure.html";
    QTest::newRow("alarms") << "mnualarmon" << "alarms.html";
}

void TestMainWindow::f1OpensThePageOfTheViewInFront()
{
    QFETCH(QString, menuItem);
    QFETCH(QString, page);
    OpenViews views;
    LinkGlobals g;
    MDIForm1_view w(views, g);
    for (ViewId id : {ViewId::status, ViewId::statusp, ViewId::alarm})
        w.registerView(id, [](OpenViews&) { return new QLabel("a view"); });
    w.engine().MDIForm_Load();
    w.setConnectionForm(new QLabel("connection"));
    w.show();
    QVERIFY(QTest::qWaitForWindowActive(&w));
    if (!menuItem.isEmpty())
        w.findChild<QAction*>(menuItem)->trigger();
    QTest::keyClick(&w, Qt::Key_F1);
    QCOMPARE(w.help()->browser()->source().fileName(), page);
}

void TestMainWindow::whatsThisShowsTheClickedControlsHelp()
{
    OpenViews views;
    LinkGlobals g;
    MDIForm1_view w(views, g);
    QPushButton* now = nullptr;
    QLabel* plain = nullptr;
    w.registerView(ViewId::status, [&](OpenViews&) {
        auto* v = new QWidget;
        auto* layout = new QVBoxLayout(v);
        now = new QPushButton("&Get Current Status Now", v);
        now->setToolTip("Upload the current status of the Glacinor NOW");
        plain = new QLabel("no help", v);
        layout->addWidget(now);
        layout->addWidget(plain);
        return v;
    });
    w.engine().MDIForm_Load();
    w.setConnectionForm(new QLabel("connection"));
    w.show();
    w.findChild<QAction*>("mnustatuson")->trigger();
    QVERIFY(now && plain);
    const auto ask = [](QWidget* control) {
        QHelpEvent query(QEvent::QueryWhatsThis, QPoint(2, 2), control->mapToGlobal(QPoint(2, 2)));
        QApplication::sendEvent(control, &query);
        QHelpEvent click(QEvent::WhatsThis, QPoint(2, 2), control->mapToGlobal(QPoint(2, 2)));
        QApplication::sendEvent(control, &click);
        return query.isAccepted() && click.isAccepted();
    };
    QVERIFY(ask(now));
    QWidget* shown = nullptr;
    for (QWidget* top : QApplication::topLevelWidgets())
        if (top->isVisible() && top != &w && top->windowType() == Qt::Popup)
            shown = top;
    QVERIFY(shown);
    QWhatsThis::hideText();
    // A control with neither text nor tool tip leaves the question to its parent.
    QVERIFY(!ask(plain));
}

QTEST_MAIN(TestMainWindow)
#include "tst_widget_mainwindow.moc"
