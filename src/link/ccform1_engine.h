#pragma once

#include "link/commands.h"
#include "link/link.h"
#include "link/link_globals.h"
#include "link/open_views.h"
#include "platform/clock.h"
#include "platform/control_state.h"
#include "platform/change_notifier.h"
#include "platform/line.h"
#include "platform/operator.h"
#include "platform/settings.h"

#include <QObject>
#include <QStringList>
#include <functional>
#include <memory>

class Recordset;

// The line side of the connection form ccForm1: the port and its settings,
// the receive buffer test3 and its dispatcher reply_do, the direct connect,
// the modem call with its redial, and the modem test boxes. The directory
// side of the same form selects the instrument through setInstrument().
class ccForm1_engine : public QObject, public Link {
    Q_OBJECT
public:
    using LineFactory = std::function<std::unique_ptr<Line>(const QString& portName)>;

    // A port the machine has, as the port list shows it.
    struct PortEntry {
        QString name;        // what the line opens: a device path or host:port
        QString description; // the adapter's own description, if any
    };

    // The factory makes the line for a port name (makeLine by default).
    ccForm1_engine(Clock& clock, Operator& op, Settings& settings, OpenViews& views,
                   LinkGlobals& globals, LineFactory factory = {}, QObject* parent = nullptr);
    ~ccForm1_engine() override;

    // The selected directory row: its ID (Text1(0)), the number the modem
    // dials (Text1(7)) and its info table, or null when there is none.
    void setInstrument(const QString& id, const QString& phone, Recordset* info);
    QString instrumentId() const { return m_Text1_0; }
    // The directory opened an instrument: its port settings, and no refusal
    // of an instrument before it stands in the way of the next connect.
    void instrumentOpened();
    // No call may start while a new instrument is half typed in.
    void setDialAllowed(bool allowed);
    // The operator chose the modem connection type.
    bool modemSelected() const { return Option2[0].value.toBool(); }

    // --- Link ---
    bool Output(const QByteArray& bytes) override;
    void discardInput() override;
    void emptyReceiveBuffer() override { emptyBuffer(); }
    QString test3Text() const override { return test3; }
    LinkGlobals& globals() override { return m_globals; }
    void startWaitUd() override;
    void startDbaseError() override;
    void hangUp() override;

    // The line in use (it is replaced when the port changes).
    Line& line() { return *m_line; }
    // CommPort: the name of the port the line opens.
    QString CommPort() const { return m_commPort; }
    // Makes the line for another port without storing it anywhere (a port
    // given on a command line). A line that is open is closed first.
    bool setCommPort(const QString& name, QString* error = nullptr);

    // Serial ports of this machine: their stable /dev/serial/by-id name where
    // there is one, else the device path, with the adapter's description.
    static QList<PortEntry> availablePorts();

    // --- procedures of the form ---
    void LoadPropertySettings();
    void cboSpeed_Click(int listIndex);
    void cboPort_Click(int listIndex);
    // A port typed into the box: a device path or host:port.
    void cboPort_Change(const QString& text);
    void cboParity_Click(int listIndex);
    void cboDataBits_Click(int listIndex);
    void cboStopBits_Click(int listIndex);
    void optFlow_Click(int index);
    void cmdOK_Click();
    void Option2_Click(int index);
    void Command3_Click();
    void Command6_Click();
    void dial_num_Click();
    void cancel_dial_Click();
    void cancel_redial_Click();
    void ModemGet_Click();
    void ModemTest_Click();
    void ModemSave_Click();
    void DialTone_Click(int index);
    void modem_Change(const QString& text);

    // The port's event handler; the line's signals arrive here.
    void MSComm1_OnComm(int commEvent, const QByteArray& input = {});
    // Appends arrived text to the box through the line filter.
    void show_received(QString& box, QString data);
    // Hands test3 to the first entry of dispatchOrder() whose token it holds.
    void reply_do();
    // The tokens reply_do looks for, first to last.
    static QList<commands::Token> dispatchOrder();

    // --- controls the logic reads or writes ---
    ControlState cboPort, cboSpeed, cboParity, cboDataBits, cboStopBits, optFlow[4], cmdOK;
    ControlState fraConnection; // port settings
    ControlState Frame4;        // connection type
    ControlState Frame1;        // the instrument directory (drawn by the directory side)
    ControlState Frame3;        // the modem box and its buttons
    ControlState Frame5;        // dial tone options
    ControlState Frame8;        // "Modem Connect": Enabled in modem mode
    ControlState Frame9;        // "Direct Connect": Enabled in direct mode
    ControlState FrameDial;     // shown in modem mode only
    ControlState Option2[2];    // 0 modem, 1 direct
    ControlState DialTone[2];   // 0 waits for the dial tone (ATX4), 1 does not (ATX0)
    ControlState Command3, Command6;
    ControlState dial_num, cancel_dial, cancel_redial, ProgressBar1;
    ControlState modem, ModemGet, ModemSave, ModemTest;
    ControlState Text3[5];      // 1 (cleared), 2 direct state, 3 modem state, 4 ID or number
    ControlState Label1[14];    // 2 "Connecting"/"Dialing", 13 "Connected To"
    ControlState version, resets, time;
    ControlState sbrStatus[4];  // panels 1 "Status", 2 "Settings", 3 the line's state

    static constexpr int ProgressBar1_Min = 0;
    static constexpr int ProgressBar1_Max = 30;

    QList<PortEntry> cboPortItems;
    QStringList cboSpeedItems, cboParityItems, cboDataBitsItems, cboStopBitsItems;
    static const QStringList optFlowCaptions;

    Timer Timer1, Timer2, Timer3, Timer4, Timer5, Timer6, Timer7, Timer8, Timer9;
    Timer WaitUd, dbase_error;

    // --- variables of the form ---
    QString test3;
    bool comm_fault = false;
    QString event_message;
    QString error_message;
    bool modem_test = false;
    bool no_computer_link = false;
    int connect_tries = 0;
    bool connecting = false;
    bool dialled = false;
    QString modem_text;
    QString phone_number;

    static constexpr quint32 PortOpenColour = 0x80FF80;
    static constexpr quint32 PortClosedColour = 0x8080FF;

signals:
    // Once at the end of each procedure, and before a message box stands.
    void changed();
    // The identity reply was accepted: the link is up.
    void identityAccepted();

private:
    // One entry of the dispatch table: the token, a guard (null: always),
    // and the handler, which says whether test3 is emptied behind it.
    struct Route {
        commands::Token token;
        bool (*when)(const ccForm1_engine&);
        bool (*run)(ccForm1_engine&);
    };
    static const QList<Route> s_routes;

    void connectLine();
    bool openPort(QString* error);
    void closePort();
    bool portOpen() const;
    bool startModemTest();
    bool modemMode() const { return Frame8.enabled; }
    Operator::Answer say(const QString& title, const QStringList& lines,
                         Operator::Icon icon = Operator::Icon::None,
                         Operator::Buttons buttons = Operator::Buttons::Ok);
    void emptyBuffer();
    void setPortState(ControlState& box, bool open);
    void applyConnectionType(int index);
    void selectPort(const QString& name);
    QString storedPort();
    QString composedSettings() const;
    QVariant infoCell(int row) const;
    void setInfoCell(int row, const QVariant& value);
    void commsError();
    void lineLost();
    void modemConnect();
    void identityReply();
    void instrumentReset();
    void newAlarm();
    void noComputerLink();
    void badIdentity(const QString& title, const QStringList& lines, Operator::Icon icon);

    void Timer1_Timer();
    void Timer2_Timer();
    void Timer3_Timer();
    void Timer4_Timer();
    void Timer5_Timer();
    void Timer6_Timer();
    void Timer8_Timer();
    void Timer9_Timer();
    void WaitUd_Timer();
    void dbase_error_Timer();

    Clock& m_clock;
    Operator& m_op;
    Settings& m_settings;
    OpenViews& m_views;
    LinkGlobals& m_globals;
    LineFactory m_factory;
    std::unique_ptr<Line> m_line;
    QString m_commPort;
    QString m_Text1_0;
    QString m_Text1_7;
    Recordset* m_info = nullptr;
    bool m_option2Busy = false;
    ChangeNotifier m_notify{[this] { emit changed(); }};
};
