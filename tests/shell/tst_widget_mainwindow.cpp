#include "link/link_globals.h"
#include "shell/mdiform1_view.h"
#include "shell/frmabout_view.h"

#include <QtTest>
#include <QtWidgets>

class TestMainWindow : public QObject {
    Q_OBJECT
private slots:
    void initTestCase();
    void menusAndToolbarFollowTheEngine();
    void aRegisteredViewOpensMaximisedAndClosesBack();
    void aboutShowsVersionAndSystem();
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
    MDIForm1 w(views, g);
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
    MDIForm1 w(views, g);
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
    frmAbout about;
    QVERIFY(about.lblVersion->text().startsWith("Version "));
    const QString info = frmAbout::systemInformation();
    QVERIFY(info.contains("Qt: 6."));
    QVERIFY(info.contains(QRegularExpression("SQLite: 3\\.\\d+")));
}

QTEST_MAIN(TestMainWindow)
#include "tst_widget_mainwindow.moc"
