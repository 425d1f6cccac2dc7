#include "link/link.h"
#include "link/link_globals.h"
#include "shell/mdiform1_engine.h"

#include <QtTest>

namespace {

// Records what the engine asks of the windows.
class RecordingHost : public ViewHost {
public:
    QSet<int> built{int(ViewId::status), int(ViewId::alarm), int(ViewId::channels), int(ViewId::statusp)};
    QStringList calls;
    std::function<void(ViewId)> onLoad;

    bool available(ViewId id) const override { return built.contains(int(id)); }
    void load(ViewId id) override
    {
        calls << QStringLiteral("load %1").arg(viewInfo(id).name);
        if (onLoad)
            onLoad(id);
    }
    void unload(ViewId id) override { calls << QStringLiteral("unload %1").arg(viewInfo(id).name); }
    void maximise(ViewId id) override { calls << QStringLiteral("max %1").arg(viewInfo(id).name); }
    void showConnectionForm() override { calls << QStringLiteral("ccForm1"); }
    void unloadUploadProgress() override { calls << QStringLiteral("unload upload"); }
    void whatsThis() override { calls << QStringLiteral("whatsthis"); }
    void showHelpContents() override { calls << QStringLiteral("help"); }
};

class RecordingLink : public Link {
public:
    LinkGlobals g;
    int hangUps = 0;
    bool Output(const QByteArray&) override { return true; }
    void discardInput() override {}
    void emptyReceiveBuffer() override {}
    QString test3Text() const override { return {}; }
    LinkGlobals& globals() override { return g; }
    void startWaitUd() override {}
    void startDbaseError() override {}
    void hangUp() override { ++hangUps; }
};

int openCount(const OpenViews& v)
{
    return int(v.history_open) + v.alarm_open + v.status_open + v.channels_open + v.statusp_open + v.power_open
           + v.loadshed_open + v.statusg_open + v.statuspg_open + v.front_open + v.brumalet_open + v.multiprobes_open;
}

} // namespace

class TestMDIForm1 : public QObject {
    Q_OBJECT
private slots:
    void openingAViewClosesTheOthers_data();
    void openingAViewClosesTheOthers();
    void openingTheOpenViewOnlyMaximisesIt();
    void closingTheLastViewBringsTheConnectionFormBack();
    void viewClosedByItsOwnWindowClearsItsFlag();
    void allOffClosesEverythingAndHangsUp();
    void failingLoadLeavesNothingOpen();
    void viewsNotBuiltAreDisabledWithAReason();
    void exitUnloadsInOrderWithoutHangingUp();
    void toolbarKeysRoute();
};

void TestMDIForm1::openingAViewClosesTheOthers_data()
{
    QTest::addColumn<int>("first");
    QTest::addColumn<int>("second");
    QTest::newRow("status then alarm") << int(ViewId::status) << int(ViewId::alarm);
    QTest::newRow("channels then statusp") << int(ViewId::channels) << int(ViewId::statusp);
    QTest::newRow("alarm then status") << int(ViewId::alarm) << int(ViewId::status);
}

void TestMDIForm1::openingAViewClosesTheOthers()
{
    QFETCH(int, first);
    QFETCH(int, second);
    OpenViews views;
    LinkGlobals g;
    RecordingHost host;
    MDIForm1_engine engine(views, g, host);
    engine.MDIForm_Load();
    engine.mnuon_Click(ViewId(first));
    engine.mnuon_Click(ViewId(second));
    QCOMPARE(openCount(views), 1);
    QCOMPARE(engine.openView(), second);
    QVERIFY(engine.mnuon[second].value.toBool());
    QVERIFY(engine.mnuoff[second].value.toBool());
    QVERIFY(!engine.mnuon[first].value.toBool());
    QVERIFY(!engine.mnuoff[first].value.toBool());
    const QString a = viewInfo(ViewId(first)).name, b = viewInfo(ViewId(second)).name;
    // The old view goes before the new one is made, so two never stand at once.
    QCOMPARE(host.calls, QStringList({"load " + a, "max " + a, "unload " + a, "load " + b, "max " + b}));
}

void TestMDIForm1::openingTheOpenViewOnlyMaximisesIt()
{
    OpenViews views;
    LinkGlobals g;
    RecordingHost host;
    MDIForm1_engine engine(views, g, host);
    engine.MDIForm_Load();
    engine.mnuon_Click(ViewId::status);
    host.calls.clear();
    engine.mnuon_Click(ViewId::status);
    QCOMPARE(host.calls, QStringList({"max status"}));
    QVERIFY(views.status_open);
}

void TestMDIForm1::closingTheLastViewBringsTheConnectionFormBack()
{
    OpenViews views;
    LinkGlobals g;
    RecordingHost host;
    MDIForm1_engine engine(views, g, host);
    engine.MDIForm_Load();
    engine.mnuon_Click(ViewId::channels);
    host.calls.clear();
    engine.mnuoff_Click(ViewId::channels);
    QCOMPARE(host.calls, QStringList({"unload channels", "ccForm1"}));
    QCOMPARE(openCount(views), 0);
    QVERIFY(!engine.mnuon[int(ViewId::channels)].value.toBool());
}

void TestMDIForm1::viewClosedByItsOwnWindowClearsItsFlag()
{
    OpenViews views;
    LinkGlobals g;
    RecordingHost host;
    MDIForm1_engine engine(views, g, host);
    engine.MDIForm_Load();
    engine.mnuon_Click(ViewId::alarm);
    host.calls.clear();
    engine.viewUnloaded(ViewId::alarm);
    QVERIFY(!views.alarm_open);
    QVERIFY(!engine.mnuoff[int(ViewId::alarm)].value.toBool());
    QCOMPARE(host.calls, QStringList({"ccForm1"}));
}

void TestMDIForm1::allOffClosesEverythingAndHangsUp()
{
    OpenViews views;
    RecordingLink link;
    RecordingHost host;
    MDIForm1_engine engine(views, link.g, host);
    engine.setLink(&link);
    engine.MDIForm_Load();
    link.g.link_up = true;
    engine.mnuon_Click(ViewId::statusp);
    host.calls.clear();
    engine.toolbar_ButtonClick("tlbccform1on");
    QCOMPARE(openCount(views), 0);
    QVERIFY(!link.g.link_up);
    QCOMPARE(link.hangUps, 1);
    QCOMPARE(host.calls, QStringList({"unload statusp", "ccForm1"}));
}

void TestMDIForm1::failingLoadLeavesNothingOpen()
{
    // A view whose data base fails starts dbase_error, which a second later
    // closes everything; here the close comes at once from inside the load.
    OpenViews views;
    LinkGlobals g;
    RecordingHost host;
    MDIForm1_engine engine(views, g, host);
    engine.MDIForm_Load();
    host.onLoad = [&](ViewId) { engine.mnualloff_Click(); };
    engine.mnuon_Click(ViewId::status);
    QCOMPARE(openCount(views), 0);
    QVERIFY(!host.calls.contains("max status"));
    QVERIFY(!engine.mnuon[int(ViewId::status)].value.toBool());
}

void TestMDIForm1::viewsNotBuiltAreDisabledWithAReason()
{
    OpenViews views;
    LinkGlobals g;
    RecordingHost host;
    MDIForm1_engine engine(views, g, host);
    engine.MDIForm_Load();
    const int front = int(ViewId::front);
    QVERIFY(!engine.mnuon[front].enabled);
    QVERIFY(!engine.mnuon[front].toolTip.isEmpty());
    QVERIFY(engine.mnuon[int(ViewId::status)].enabled);
    QCOMPARE(engine.mnuon[front].text, QString("Glacinor Front Panel"));
    engine.mnuon_Click(ViewId::front);
    QVERIFY(!views.front_open);
    QVERIFY(host.calls.isEmpty());
    int disabledTools = 0;
    for (const ControlState& b : engine.toolButtons)
        disabledTools += b.enabled ? 0 : 1;
    QCOMPARE(disabledTools, kViewCount - int(host.built.size()));
}

void TestMDIForm1::exitUnloadsInOrderWithoutHangingUp()
{
    OpenViews views;
    RecordingLink link;
    RecordingHost host;
    MDIForm1_engine engine(views, link.g, host);
    engine.setLink(&link);
    engine.MDIForm_Load();
    engine.mnuon_Click(ViewId::channels);
    QSignalSpy quit(&engine, &MDIForm1_engine::quitRequested);
    host.calls.clear();
    engine.mnuexit_Click();
    QCOMPARE(host.calls, QStringList({"unload channels"}));
    QCOMPARE(link.hangUps, 0);
    QCOMPARE(quit.count(), 1);
}

void TestMDIForm1::toolbarKeysRoute()
{
    OpenViews views;
    LinkGlobals g;
    RecordingHost host;
    MDIForm1_engine engine(views, g, host);
    engine.MDIForm_Load();
    engine.toolbar_ButtonClick("tlbstatuson");
    engine.toolbar_ButtonClick("tlbwth");
    engine.toolbar_ButtonClick("tlbContents");
    QVERIFY(views.status_open);
    QCOMPARE(host.calls.mid(2), QStringList({"whatsthis", "help"}));
    views.shell->mnualarmon_Click();
    QVERIFY(views.alarm_open && !views.status_open);
}

QTEST_GUILESS_MAIN(TestMDIForm1)
#include "tst_mdiform1.moc"
