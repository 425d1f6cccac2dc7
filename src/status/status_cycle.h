#pragma once

// The polling cycle shared by the five status views: the three buttons, the
// automatic tick, the retry, the watchdog, the no-reply wait of a manual
// request, the delayed first request and the exclusion between views. What
// differs from view to view is one row of StatusCycleParams; the views'
// engines own one StatusCycle each and call it from their parsers.

#include "platform/change_notifier.h"
#include "platform/clock.h"
#include "platform/control_state.h"

#include <QByteArray>
#include <QList>
#include <QObject>
#include <QString>
#include <functional>

class Link;
class Operator;
class Printer;
struct OpenViews;
class StatusCycleView;
class InstrumentStore;

enum class StatusViewKind { status, statusg, multiprobes, statusp, statuspg };

struct StatusCycleParams {
    struct Exclusion {
        StatusViewKind view;
        const char* firstLine;
    };
    StatusViewKind view;
    const char* letter;               // the request letter, sent with EOT
    int noReplyWait;                  // ms, multiplied by speed_factor
    int infoRow;                      // row of `info` whose field 7 keeps the interval
    bool retryTimer = false;          // Timer6 repeats an unanswered automatic request
    bool nowHidesText1 = false;       // Now hides Text1 (frmstatusp leaves it as it was)
    bool stopKeepsWatchdog = false;   // frmstatusp: Stop leaves Timer4 and Text1
    bool noReplyHandlerEmpty = false; // frmstatuspg: its no-reply event does nothing
    bool hasText2 = false;            // frmstatusp shows Text2 with Text1
    QList<Exclusion> exclusions; // checked in this order by every button

    static const StatusCycleParams& of(StatusViewKind view);
};

// Whether another status view is open, and its engine if it exists.
StatusCycleView* openStatusView(OpenViews& views, StatusViewKind kind);

class StatusCycle : public QObject {
    Q_OBJECT
public:
    static constexpr int WatchdogMs = 60000;
    static constexpr int FirstRequestDelayMs = 8000;
    static constexpr int FlashMs = 500;
    static constexpr int IntervalMin = 10;      // spinner and stored limits
    static constexpr int SpinnerMax = 30;
    static constexpr int StoredMax = 120;
    static constexpr int MaxTickMs = 65000;
    static constexpr quint32 FlashColour = Colour::Green;
    static constexpr quint32 DateTimeColour = 0xC0FFFF; // pale yellow
    static inline const QString CeasedText = QStringLiteral("COMMUNICATIONS HAVE CEASED");

    StatusCycle(StatusViewKind view, Link& link, Clock& clock, Operator& op, OpenViews& views,
                QObject* parent = nullptr);

    const StatusCycleParams& params() const { return m_params; }

    // The form's procedures and the cycle's share one notifier, so that a
    // click that runs both tells the views once.
    ChangeNotifier notify{[this] { emit changed(); }};

    // --- controls ---
    ControlState nowstatus, startstatus, stopstatus;
    ControlState Text1;     // "COMMUNICATIONS HAVE CEASED"
    ControlState Text2;     // its twin in frmstatusp
    ControlState Text10[3]; // 0 instrument id, 1 interval in seconds, 2 date and time
    ControlState UpDown1;   // value: the interval; limits IntervalMin..SpinnerMax

    // --- timers, by role (each view names them as the form does) ---
    Timer Timer1;   // automatic tick
    Timer noReply;  // Timer3 (Timer2 in frmstatusp)
    Timer Timer4;   // watchdog
    Timer Timer5;   // end of the flash of the date and time
    Timer Timer6;   // retry, where the view has one
    Timer Timer20;  // delayed first request

    bool status_manual_wait = false;
    bool loading = false;
    QString datain;

    // --- procedures ---
    void nowstatus_Click();
    void startstatus_Click();
    void stopstatus_Click();
    void send_status_request();
    // Form_Load's part: the interval from `info` (store may be null), then,
    // at its end, firstRequest().
    void loadInterval(InstrumentStore* store);
    void firstRequest();
    void UpDown1_Change(int value);

    // The parser's first steps: the no-reply wait ends and a manual request
    // is answered. datain and Text10(2) take the reply.
    void replyStarted(const QString& reply);
    // A manual request is answered: nowstatus comes back.
    void releaseManualWait();
    // The parser's last steps: the flash, the watchdog, the retry off.
    void replyFinished();
    // Restarts the watchdog only (the "torvan" reply).
    void restartWatchdog();

    // stopstatus.Enabled as other views read it. A view that is checking
    // the others does not count as running to them, so that two running
    // views that name each other do not stop each other without end: the
    // other one stops and this one runs on.
    bool runningForOthers() const { return stopstatus.enabled && !m_checking; }

    // Seconds in Text10(1).
    int intervalSeconds() const;

    // The head every status report starts with: the title, the instrument's
    // id, when it was printed and the instrument's date and time.
    void printHead(Printer& printer, const QString& title) const;
    static constexpr double ReportFontSize = 7;

    // --- stale data ---
    // True when a reply has come and the last one is older than two intervals.
    bool stale() const;
    // "Last reply 2 min 5 s ago" (empty before any reply).
    QString ageText() const;

    // Called at the end of Timer5's event (frmstatusp sends "t" from it).
    std::function<void()> afterFlash;
    // Called by the watchdog before it stops the view.
    std::function<void()> beforeCeased;

signals:
    // Once at the end of each procedure of the cycle.
    void changed();

private:
    bool excluded();
    void setCeased(bool shown);
    void firstRequestNow();
    void restart(Timer& t, int ms);
    void Timer1_Timer();
    void noReply_Timer();
    void Timer4_Timer();
    void Timer5_Timer();
    void Timer6_Timer();
    void Timer20_Timer();
    void staleTick();

    const StatusCycleParams& m_params;
    Link& m_link;
    Clock& m_clock;
    Operator& m_op;
    OpenViews& m_views;
    InstrumentStore* m_store = nullptr;
    Timer m_staleTimer;
    qint64 m_lastReply = -1;
    bool m_wasStale = false;
    QString m_lastAge;
    bool m_checking = false;
};
