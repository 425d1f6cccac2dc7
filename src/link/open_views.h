#pragma once

#include <QString>

// Which view is open, and for each open view the procedures other forms call
// on it. The main window's engine owns the table and keeps it true as views
// open and close; the dispatcher (reply_do), the exclusion rule of the status
// cycle and the write path read it. A view that is not open has no engine:
// its pointer is null and a reply for it is dropped.
//
// Parsers read the receive buffer through Link::test3Text() unless they take
// the text as an argument (the views that keep a copy in datain/data_in).
// Each runs to its end inside reply_do and may write the next command.

// A view whose set point writes are checked by their echo ("sret").
class EchoView {
public:
    virtual ~EchoView() = default;
    virtual void ret_handel() = 0;
};

// channels: echo, channel upload and download.
class ChannelsView : public EchoView {
public:
    virtual void sin_chan_up_load() = 0; // "schanupload"
    virtual void down_check() = 0;       // "downcheck"
    virtual void done_down() = 0;        // "donedown"
    // Disables the write timer (the form's Timer5) after an instrument reset.
    virtual void stopTimer5() = 0;
};

// frmhistory and frmpower: one log parser and a no-reply timer Timer3 that
// the log-reset replies ("dlres", "plres") stop.
class LogView {
public:
    virtual ~LogView() = default;
    virtual void stopTimer3() = 0;
};
class HistoryView : public LogView {
public:
    virtual void history_do() = 0; // "histy"
};
class PowerView : public LogView {
public:
    virtual void power_do() = 0; // "power"
};

// Every polling view: its automatic cycle runs while stopstatus is Enabled.
class StatusCycleView {
public:
    virtual ~StatusCycleView() = default;
    virtual bool stopstatusEnabled() const = 0;
    virtual void stopstatus_Click() = 0;
};
// frmstatus, frmstatusg, frmmultiprobes: "status".
class TemperatureStatusView : public StatusCycleView {
public:
    virtual void status_do() = 0;
    // The channels of each bank were written: read them again and show them.
    virtual void redoBanks() {}
};
// frmstatusp: "presss" and "torvan".
class PressureStatusView : public StatusCycleView {
public:
    virtual void statusp_do() = 0;
    virtual void statuspa_do() = 0;
};
// frmstatuspg: "presss".
class PressureGraphicView : public StatusCycleView {
public:
    virtual void statuspg_do() = 0;
};

// frmalarm.
class AlarmView {
public:
    virtual ~AlarmView() = default;
    virtual void alarm_do(const QString& datain) = 0; // "almlog"
    virtual void uploadnew_Click() = 0;               // asks for the new alarms
    virtual void stopTimer2() = 0;                    // "realarms", "noalarms"
    virtual void showMaximised() = 0;                 // shown, WindowState 2
};

// frmfront: "tempfront".
class FrontView {
public:
    virtual ~FrontView() = default;
    virtual void Front_do(const QString& data_in) = 0;
};

// frmbrumalet: "dxstart" and "evapfrst".
class BrumaletView {
public:
    virtual ~BrumaletView() = default;
    virtual void start_do(const QString& datain) = 0;
    virtual void status_do(const QString& datain) = 0;
};

// The small progress form `upload` that the channel transfers show.
class UploadProgressView {
public:
    virtual ~UploadProgressView() = default;
    // Loads (if needed) and shows the form with its texts.
    virtual void Show(const QString& title, const QString& label1, const QString& label2, int progress) = 0;
    // Shows it again as it stands.
    virtual void Show() = 0;
    virtual void setProgress(int value, const QString& label1) = 0;
    virtual void Unload() = 0;
};

// The set point card, reached from a channel's value in the status views.
class SetPointCardView {
public:
    virtual ~SetPointCardView() = default;
    // Unloads an open card and shows the card of this channel.
    virtual void showChannel(int channel) = 0;
};

// MDIForm1 and the forms it owns that the line side touches.
class ShellView {
public:
    virtual ~ShellView() = default;
    virtual void mnualarmon_Click() = 0;      // opens frmalarm
    virtual void mnualloff_Click() = 0;       // closes all views (dbase_error)
    virtual void setToolbarEnabled(bool on) = 0; // Toolbar1.Enabled
    virtual void unloadUploadProgress() = 0;  // unloads the upload progress form
};

struct OpenViews {
    bool history_open = false;
    bool alarm_open = false;
    bool status_open = false;
    bool channels_open = false;
    bool statusp_open = false;
    bool power_open = false;
    bool loadshed_open = false;
    bool statusg_open = false;
    bool statuspg_open = false;
    bool front_open = false;
    bool brumalet_open = false;
    bool multiprobes_open = false;

    // The engines of the open views; null while a view does not exist.
    HistoryView* history = nullptr;
    AlarmView* alarm = nullptr;
    TemperatureStatusView* status = nullptr;
    ChannelsView* channels = nullptr;
    PressureStatusView* statusp = nullptr;
    PowerView* power = nullptr;
    EchoView* loadshed = nullptr;
    TemperatureStatusView* statusg = nullptr;
    PressureGraphicView* statuspg = nullptr;
    FrontView* front = nullptr;
    BrumaletView* brumalet = nullptr;
    TemperatureStatusView* multiprobes = nullptr;

    ShellView* shell = nullptr;
    // Whoever can show the card; null while the program has none.
    SetPointCardView* setPointCard = nullptr;

    bool anyOpen() const;
    // Every flag False (the pointers stay: their owner clears them as views unload).
    void closeAll();
};
