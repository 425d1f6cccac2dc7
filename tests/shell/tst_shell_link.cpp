#include "link/ccform1_engine.h"
#include "link/link_globals.h"
#include "platform/fake_line.h"
#include "platform/manual_clock.h"
#include "platform/operator.h"
#include "platform/settings.h"
#include "shell/frmsmarthlp_engine.h"
#include "shell/mdiform1_engine.h"

#include <QtTest>

namespace {

// A host whose views are nothing but their flags; a view can be told to
// fail its data base as it loads.
class Host : public ViewHost {
public:
    std::function<void(ViewId)> onLoad;
    bool connectionFormShown = false;
    bool available(ViewId) const override { return true; }
    void load(ViewId id) override
    {
        if (onLoad)
            onLoad(id);
    }
    void unload(ViewId) override {}
    void maximise(ViewId) override {}
    void showConnectionForm() override { connectionFormShown = true; }
    void unloadUploadProgress() override {}
    void whatsThis() override {}
    void showHelpContents() override {}
};

struct Rig {
    ManualClock clock;
    ScriptedOperator op;
    MemorySettings settings;
    OpenViews views;
    LinkGlobals globals;
    Host host;
    FakeLine* line = nullptr;
    ccForm1_engine link{clock, op, settings, views, globals, [this](const QString&) {
                            auto l = std::make_unique<FakeLine>();
                            line = l.get();
                            return l;
                        }};
    MDIForm1_engine shell{views, globals, host};
    Rig()
    {
        shell.setLink(&link);
        shell.MDIForm_Load();
        link.setInstrument(QStringLiteral("12"), QStringLiteral("5551234"), nullptr);
    }
};

} // namespace

class TestShellLink : public QObject {
    Q_OBJECT
private slots:
    void allOffHangsUpTheModemLine();
    void allOffClosesADirectLineWithoutSending();
    void exitSendsNoHangUp();
    void viewFailingItsDataBaseClosesEverythingASecondLater();
    void smartHelpStandsThenGoes();
};

void TestShellLink::allOffHangsUpTheModemLine()
{
    Rig r;
    r.link.Option2_Click(0);
    r.link.dial_num_Click();
    QVERIFY(r.line);
    r.line->deliver("CONNECT 9600\r\n");
    QVERIFY(r.globals.modem_online);
    r.shell.mnuon_Click(ViewId::status);
    r.line->clearWrites();
    const qint64 slept = r.clock.sleptMs();
    r.shell.toolbar_ButtonClick(QStringLiteral("tlbccform1on"));
    // Escape, the modem's guard time, hang up, and the line closed.
    QCOMPARE(r.line->writes(), QList<QByteArray>({"+++", "ATH0\r\n"}));
    QCOMPARE(r.clock.sleptMs() - slept, qint64(2500));
    QVERIFY(!r.line->isOpen());
    QVERIFY(!r.globals.link_up);
    QVERIFY(!r.views.status_open);
    QVERIFY(r.host.connectionFormShown);
}

void TestShellLink::allOffClosesADirectLineWithoutSending()
{
    Rig r;
    r.link.Option2_Click(1);
    r.link.Command3_Click();
    QVERIFY(r.line && r.line->isOpen());
    r.line->clearWrites();
    r.shell.mnualloff_Click();
    QVERIFY(r.line->writes().isEmpty());
    QVERIFY(!r.line->isOpen());
}

void TestShellLink::exitSendsNoHangUp()
{
    Rig r;
    r.link.Option2_Click(0);
    r.link.dial_num_Click();
    r.line->deliver("CONNECT 9600\r\n");
    r.line->clearWrites();
    r.shell.mnuexit_Click();
    QVERIFY(r.line->writes().isEmpty());
    QVERIFY(r.line->isOpen());
}

void TestShellLink::viewFailingItsDataBaseClosesEverythingASecondLater()
{
    Rig r;
    r.host.onLoad = [&](ViewId) {
        r.op.message(QStringLiteral("Data Base Invalid"), {});
        r.link.startDbaseError();
    };
    r.shell.mnuon_Click(ViewId::history);
    QVERIFY(r.views.history_open);
    r.clock.advance(999);
    QVERIFY(r.views.history_open);
    r.clock.advance(1);
    QVERIFY(!r.views.anyOpen());
    QVERIFY(r.host.connectionFormShown);
    // It fires once, not every second after.
    r.host.connectionFormShown = false;
    r.clock.advance(5000);
    QVERIFY(!r.host.connectionFormShown);
}

void TestShellLink::smartHelpStandsThenGoes()
{
    ManualClock clock;
    LinkGlobals g;
    frmsmarthlp_engine help(clock, g);
    QSignalSpy gone(&help, &frmsmarthlp_engine::unloadRequested);
    help.Form_Load();
    QVERIFY(g.smart_help_open);
    help.explain(QStringLiteral("Set temperature of the room"));
    QCOMPARE(help.text, QString("Set temperature of the room"));
    clock.advance(frmsmarthlp_engine::StandMs - 1);
    QVERIFY(g.smart_help_open);
    clock.advance(1);
    QVERIFY(!g.smart_help_open);
    QCOMPARE(gone.count(), 1);
    help.explain(QStringLiteral("ignored once closed"));
    QCOMPARE(help.text, QString("Set temperature of the room"));
    clock.advance(60000);
    QCOMPARE(gone.count(), 1);
}

QTEST_GUILESS_MAIN(TestShellLink)
#include "tst_shell_link.moc"
