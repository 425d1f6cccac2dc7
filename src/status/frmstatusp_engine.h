#pragma once

// frmstatusp: pressures of up to 5 banks, the liquid level, 27 compressors,
// 12 condensers and the panel of one Torvanel, polled with "T" (and "t" for
// the Torvanels' alarms from version 8) in the shared status cycle.

#include "link/open_views.h"
#include "platform/clock.h"
#include "platform/control_state.h"
#include "status/presss_codec.h"
#include "status/status_cycle.h"

#include <QObject>
#include <memory>

class Link;
class Operator;
class InstrumentStore;
class Printer;

class frmstatusp_engine : public QObject, public PressureStatusView {
    Q_OBJECT
public:
    static constexpr int Banks = presss_layout::Banks;
    static constexpr int Compressors = presss_layout::Compressors;
    static constexpr int Condensers = presss_layout::Condensers;
    static constexpr int Stages = 8;
    static constexpr int CondenserStages = 4;
    static constexpr int PanelBoxes = 35; // Text3 and Label10

    // Places of the Torvanel panel in Text3 (and its label in Label10).
    static constexpr int PanelTemperature = 0; // 0..3
    static constexpr int PanelPressure = 4;    // 4..7
    static constexpr int PanelAnalogue = 8;    // 8..10
    static constexpr int PanelKind = 22;
    static constexpr int PanelRunning = 23;
    static constexpr int PanelAlarm = 24;
    // Input i of 16 and further input j of 8 (j 1..7; 0 is the kind).
    static int panelInput(int i) { return i < 11 ? 11 + i : 25 + (i - 11); }
    static int panelFurtherInput(int j) { return j == 1 ? PanelRunning : j == 2 ? PanelAlarm : 27 + j; }

    static constexpr quint32 StageOn = 0x8080FF;
    static constexpr quint32 StepOn = Colour::Green;
    static constexpr quint32 LoadedOn = Colour::Yellow;
    static constexpr quint32 Off = Colour::ButtonFace;
    static constexpr quint32 AlarmPale = 0xC0FFFF;
    static constexpr quint32 AlarmBlink = 0xFF80FF;

    static inline const QString CsDataInitial = QStringLiteral("CsData");
    static inline const QString CsAlarmsInitial = QStringLiteral("CsAlarms");
    static inline const QString NoAlarms = QStringLiteral("No alarms are active");
    static inline const QString VariableCondenser = QStringLiteral("Var Stg 1");

    // Registers itself in views.statusp; the shell sets statusp_open.
    frmstatusp_engine(Link& link, Clock& clock, Operator& op, OpenViews& views, QObject* parent = nullptr);
    ~frmstatusp_engine() override;

    // Opens the instrument's store and runs the form's load. False after
    // "Data Base Invalid" (dbase_error of the link is started).
    bool Form_Load(const QString& instrumentId, const QString& storePath);

    StatusCycle cycle;
    Timer& Timer2; // the no-reply wait of a manual request
    Timer Timer3;  // blink of the Torvanel's alarm box

    // --- controls ---
    ControlState suction[Banks], discharge[Banks], liquid[Banks], liquidpump[Banks], Temp[Banks], Label2[Banks];
    ControlState liquidlevel[1];
    ControlState chanframe[Compressors], bank[Compressors], equal[Compressors], hours_run[Compressors];
    ControlState stage1[Compressors], stage2[Compressors], stage3[Compressors], stage4[Compressors];
    ControlState stage5[Compressors], stage6[Compressors], stage7[Compressors], stage8[Compressors];
    ControlState chanframec[Condensers], bankc[Condensers], hours_runc[Condensers];
    ControlState stage1c[Condensers], stage2c[Condensers], stage3c[Condensers], stage4c[Condensers];
    ControlState CompSelect[Compressors];
    ControlState Text3[PanelBoxes], Label10[PanelBoxes];
    ControlState Alm, Label4, Picture1, dbaseload, printgraph;

    // Stage k (1..8) of compressor i; condenser stage k (1..4) of c.
    ControlState& stage(int k, int i);
    ControlState& stagec(int k, int c);

    QString CsData = CsDataInitial;
    QString CsAlarms = CsAlarmsInitial;
    int selected = 0; // the Torvanel shown, 0..26
    std::array<QString, presss_layout::TorvanelFields> torvanel;

    // --- PressureStatusView ---
    void statusp_do() override;
    void statuspa_do() override;
    bool stopstatusEnabled() const override { return cycle.runningForOthers(); }
    void stopstatus_Click() override { cycle.stopstatus_Click(); }

    // --- procedures ---
    void statusp_do(const QString& reply);
    void statuspa_do(const QString& reply);
    void CompSelect_Click(int index);
    void dbaseload_Click();
    // The report of the banks and of the compressors and condensers shown.
    void printgraph_Click(Printer& Printer);

signals:
    void changed();

private:
    void chanBanks();
    void stages();
    void send_torvanel_request();
    void show_torvanel_data();
    void show_alarm_words();
    void Timer3_Timer();
    void afterFlash();
    void labelPanel(int kind);
    QVariant setpoint(int row, int field);

    Link& m_link;
    Operator& m_op;
    OpenViews& m_views;
    std::unique_ptr<InstrumentStore> m_store;
    bool m_blinkPhase = false;
};
