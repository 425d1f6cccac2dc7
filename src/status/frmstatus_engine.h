#pragma once

// frmstatus: the temperature status of up to 20 channels chosen by the
// operator, polled with "F" in the shared status cycle.

#include "link/open_views.h"
#include "platform/clock.h"
#include "platform/control_state.h"
#include "status/status_cycle.h"

#include <QObject>
#include <memory>

class Link;
class Operator;
class InstrumentStore;
class Printer;

class frmstatus_engine : public QObject, public TemperatureStatusView {
    Q_OBJECT
public:
    static constexpr int Rows = 20;
    static constexpr int Buttons = 200;
    static constexpr int Suctions = 16;
    static constexpr int Pressures = 5;
    static constexpr int NoAssoc = 215;
    static constexpr int PressureAssoc = 199; // above: a pressure input

    // Colours as the form sets them at load.
    static constexpr quint32 PaleRed = 0xC0C0FF;
    static constexpr quint32 FanOn = Colour::Green;
    static constexpr quint32 DefrostOn = Colour::Yellow;
    static constexpr quint32 Off = Colour::ButtonFace;
    static constexpr quint32 Selected = Colour::Green;

    // Registers itself in views.status; the shell sets status_open.
    frmstatus_engine(Link& link, Clock& clock, Operator& op, OpenViews& views, QObject* parent = nullptr);
    ~frmstatus_engine() override;

    // Opens the instrument's store at storePath and runs the form's load.
    // False after "Data Base Invalid" (dbase_error of the link is started).
    bool Form_Load(const QString& instrumentId, const QString& storePath);

    StatusCycle cycle;

    // --- controls, one index per display row unless stated ---
    ControlState chanframe[Rows], Temp[Rows], bank[Rows];
    ControlState assoc1[Rows], assoc2[Rows], assoc3[Rows];
    ControlState liquid[Rows], fans[Rows], defrost[Rows], suction[Rows], pid[Rows], alarm[Rows];
    ControlState suc[Suctions];
    ControlState TempP[Pressures];
    ControlState TempPLabel[Pressures];     // "Bank n" over the TempP boxes
    ControlState Command1[Buttons + 1];     // 1..200; [0] unused
    ControlState Command2, Cmdselchan, Cmdseldis, printgraph;
    Timer Timer2;                           // alarm blink

    // Kept in `info` (kInfoDescriptionsColumn): false shows channel numbers,
    // true descriptions.
    bool showDescriptions = true;
    // The channel shown in each display row (kept in `info`, kInfoShownChannelColumn).
    int rowChannel(int row) const { return m_rows[row]; }

    // Whether a click on a value can show the set point card.
    bool setPointCardAvailable() const { return m_views.setPointCard != nullptr; }

    // --- TemperatureStatusView ---
    void status_do() override;
    bool stopstatusEnabled() const override { return cycle.runningForOthers(); }
    void stopstatus_Click() override { cycle.stopstatus_Click(); }
    void redoBanks() override;

    // --- procedures ---
    void status_do(const QString& reply);
    void Command1_Click(int index);
    void Command2_Click();
    void Cmdselchan_Click();
    void Cmdseldis_Click();
    void Temp_Click(int index);
    // The report of the 20 rows as they show now.
    void printgraph_Click(Printer& Printer);

signals:
    void changed();

private:
    void Changechannels();
    void com_chan_visable();
    void chanBanks();
    void show_channel_rows();
    void clear_pid_fan_labels();
    void Timer2_Timer();
    void readRows();
    QString channelCaption(int channel);

    Link& m_link;
    Operator& m_op;
    OpenViews& m_views;
    std::unique_ptr<InstrumentStore> m_store;
    int m_rows[Rows] = {};
    // Set point fields read per channel at load: the status never changes them.
    struct ChannelConfig {
        bool inUse = true;
        QString number, description;
        int assoc[3] = {NoAssoc, NoAssoc, NoAssoc};
        int kind = 0;
    };
    std::vector<ChannelConfig> m_config;
    int m_bankSize[5] = {};
    int m_banksInUse = 0;
};
