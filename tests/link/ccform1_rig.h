#pragma once

// The engine of ccForm1 on a fake line and a manual clock, with a distinct
// view double per form, shared by the dispatch and the connection tests.
#include "link/ccform1_engine.h"
#include "platform/fake_line.h"
#include "platform/manual_clock.h"
#include "platform/store.h"

#include <QtTest>

namespace ccform1_test {

// A view double that plays any role and logs "<form>.<procedure>". Each
// view gets its own, so a reply given to the wrong view shows in the log.
struct Double : ChannelsView, HistoryView, PowerView, TemperatureStatusView, PressureStatusView,
                PressureGraphicView, AlarmView, FrontView, BrumaletView, ShellView {
    QStringList* log = nullptr;
    QString form;
    bool cycleRunning = false;
    OpenViews* table = nullptr;
    void rec(const QString& what) { *log << form + QLatin1Char('.') + what; }
    void ret_handel() override { rec("ret_handel"); }
    void sin_chan_up_load() override { rec("sin_chan_up_load"); }
    void down_check() override { rec("down_check"); }
    void done_down() override { rec("done_down"); }
    void stopTimer5() override { rec("Timer5"); }
    void stopTimer3() override { rec("Timer3"); }
    void history_do() override { rec("history_do"); }
    void power_do() override { rec("power_do"); }
    bool stopstatusEnabled() const override { return cycleRunning; }
    void stopstatus_Click() override { rec("stopstatus_Click"); }
    void status_do() override { rec("status_do"); }
    void statusp_do() override { rec("statusp_do"); }
    void statuspa_do() override { rec("statuspa_do"); }
    void statuspg_do() override { rec("statuspg_do"); }
    void alarm_do(const QString& d) override { rec("alarm_do:" + d); }
    void uploadnew_Click() override { rec("uploadnew_Click"); }
    void stopTimer2() override { rec("Timer2"); }
    void showMaximised() override { rec("showMaximised"); }
    void Front_do(const QString&) override { rec("Front_do"); }
    void start_do(const QString&) override { rec("start_do"); }
    void status_do(const QString&) override { rec("status_do"); }
    void mnualarmon_Click() override
    {
        rec("mnualarmon_Click");
        table->alarm_open = true;
    }
    void mnualloff_Click() override { rec("mnualloff_Click"); }
    void setToolbarEnabled(bool) override { rec("Toolbar1"); }
    void unloadUploadProgress() override { rec("unload upload"); }
};

struct Views {
    QStringList calls;
    Double channels, loadshed, history, power, status, statusg, multiprobes, statusp, statuspg,
        alarm, front, brumalet, shell;

    void plugInto(OpenViews& t)
    {
        const std::pair<Double*, const char*> forms[] = {
            {&channels, "channels"},       {&loadshed, "frmloadshed"}, {&history, "frmhistory"},
            {&power, "frmpower"},          {&status, "frmstatus"},     {&statusg, "frmstatusg"},
            {&multiprobes, "frmmultiprobes"}, {&statusp, "frmstatusp"}, {&statuspg, "frmstatuspg"},
            {&alarm, "frmalarm"},          {&front, "frmfront"},       {&brumalet, "frmbrumalet"},
            {&shell, "MDIForm1"}};
        for (const auto& [d, form] : forms) {
            d->log = &calls;
            d->form = QString::fromLatin1(form);
            d->table = &t;
        }
        t.channels = &channels;
        t.loadshed = static_cast<ChannelsView*>(&loadshed);
        t.history = &history;
        t.power = &power;
        t.status = &status;
        t.statusg = &statusg;
        t.multiprobes = &multiprobes;
        t.statusp = &statusp;
        t.statuspg = &statuspg;
        t.alarm = &alarm;
        t.front = &front;
        t.brumalet = &brumalet;
        t.shell = &shell;
    }
};

// An info table of an instrument's store with field 41 holding the given rows.
inline std::unique_ptr<Recordset> infoTable(Store& store, const QStringList& field41)
{
    QList<Store::Column> columns;
    for (int c = 0; c < 42; ++c)
        columns.append({QStringLiteral("f%1").arg(c), Store::ColumnType::Text});
    if (!store.createTable("info", columns))
        return nullptr;
    std::unique_ptr<Recordset> info = store.openRecordset("info");
    for (const QString& v : field41)
        if (!info->AddNew() || !info->setValue(41, v.isEmpty() ? QVariant() : QVariant(v))
            || !info->Update())
            return nullptr;
    return info;
}

// Flags of the open views, for data rows.
enum Open {
    History = 1, Alarm = 2, Status = 4, Channels = 8, StatusP = 16, Power = 32, LoadShed = 64,
    StatusG = 128, StatusPG = 256, Front = 512, Brumalet = 1024, MultiProbes = 2048,
};

struct Rig {
    ManualClock clock;
    ScriptedOperator op;
    MemorySettings settings;
    OpenViews table;
    LinkGlobals globals;
    Views views;
    FakeLine* line = nullptr;
    int linesMade = 0;
    std::unique_ptr<ccForm1_engine> engine;

    explicit Rig(bool direct = true)
    {
        views.plugInto(table);
        engine = std::make_unique<ccForm1_engine>(
            clock, op, settings, table, globals, [this](const QString& name) {
                auto l = std::make_unique<FakeLine>();
                l->setPortName(name);
                line = l.get();
                ++linesMade;
                return std::unique_ptr<Line>(std::move(l));
            });
        engine->setInstrument(QStringLiteral("12"), QStringLiteral("5551234"), nullptr);
        engine->Option2_Click(direct ? 1 : 0);
    }
    void open(int mask)
    {
        bool OpenViews::*flags[] = {&OpenViews::history_open, &OpenViews::alarm_open, &OpenViews::status_open,
            &OpenViews::channels_open, &OpenViews::statusp_open, &OpenViews::power_open, &OpenViews::loadshed_open,
            &OpenViews::statusg_open, &OpenViews::statuspg_open, &OpenViews::front_open, &OpenViews::brumalet_open,
            &OpenViews::multiprobes_open};
        for (int bit = 0; bit < 12; ++bit)
            table.*flags[bit] = mask & (1 << bit);
    }
    // A modem call that the modem has answered with CONNECT.
    void dialAndConnect()
    {
        engine->dial_num_Click();
        line->deliver("\r\nCONNECT 9600\r\n");
    }
};

inline QByteArray identity(const QByteArray& version, const QByteArray& id)
{
    return version.leftJustified(7, ' ') + id + "00003" + "05/01/2026 08:00:00   " + "Glacinor";
}

} // namespace ccform1_test

using namespace ccform1_test;
