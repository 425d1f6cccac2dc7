#include "status/status_cycle.h"

#include "link/commands.h"
#include "link/link.h"
#include "link/link_globals.h"
#include "link/open_views.h"
#include "platform/operator.h"
#include "platform/printer.h"
#include "setpoints/instrument_schema.h"
#include "setpoints/instrument_store.h"
#include "status/status_codec.h"

#include <QScopeGuard>

namespace {

using K = StatusViewKind;

const char* const kPressureActive = "Current Pressure Status is active,";
const char* const kTempGraphicActive = "Current Temp graphic Status is active,";
const char* const kTemperatureActive = "Current Temperature Status is active,";

// The exclusion lists are not symmetrical on purpose: nobody checks
// frmmultiprobes or frmstatuspg, so those two may poll beside a third view.
const StatusCycleParams kTable[] = {
    {.view = K::status, .letter = "F", .noReplyWait = 4000, .infoRow = kInfoTemperatureIntervalRow,
     .retryTimer = true, .nowHidesText1 = true,
     .exclusions = {{K::statusp, kPressureActive}, {K::statusg, kTempGraphicActive}}},
    {.view = K::statusg, .letter = "F", .noReplyWait = 4000, .infoRow = kInfoTemperatureIntervalRow,
     .retryTimer = true, .nowHidesText1 = true,
     .exclusions = {{K::statusp, kPressureActive}, {K::status, kTemperatureActive}}},
    {.view = K::multiprobes, .letter = "F", .noReplyWait = 5000, .infoRow = kInfoTemperatureIntervalRow,
     .retryTimer = true, .nowHidesText1 = true,
     .exclusions = {{K::statusp, kPressureActive}, {K::statusg, kTempGraphicActive}}},
    {.view = K::statusp, .letter = "T", .noReplyWait = 3000, .infoRow = kInfoPressureIntervalRow,
     .stopKeepsWatchdog = true, .hasText2 = true,
     .exclusions = {{K::status, kTemperatureActive}, {K::statusg, kTempGraphicActive}}},
    {.view = K::statuspg, .letter = "T", .noReplyWait = 4000, .infoRow = kInfoPressureIntervalRow,
     .nowHidesText1 = true, .noReplyHandlerEmpty = true,
     .exclusions = {{K::statusp, kPressureActive},
                    {K::status, kTemperatureActive},
                    {K::statusg, "Current Temperature Status Graphic is active,"}}},
};

} // namespace

const StatusCycleParams& StatusCycleParams::of(StatusViewKind view)
{
    for (const StatusCycleParams& p : kTable) {
        if (p.view == view)
            return p;
    }
    return kTable[0];
}

StatusCycleView* openStatusView(OpenViews& v, StatusViewKind kind)
{
    switch (kind) {
    case K::status:
        return v.status_open ? v.status : nullptr;
    case K::statusg:
        return v.statusg_open ? v.statusg : nullptr;
    case K::multiprobes:
        return v.multiprobes_open ? v.multiprobes : nullptr;
    case K::statusp:
        return v.statusp_open ? v.statusp : nullptr;
    case K::statuspg:
        return v.statuspg_open ? v.statuspg : nullptr;
    }
    return nullptr;
}

StatusCycle::StatusCycle(StatusViewKind view, Link& link, Clock& clock, Operator& op, OpenViews& views,
                         QObject* parent)
    : QObject(parent), Timer1(clock, 10000), noReply(clock, StatusCycleParams::of(view).noReplyWait),
      Timer4(clock, 20000), Timer5(clock, FlashMs), Timer6(clock, 4000), Timer20(clock, FirstRequestDelayMs),
      m_params(StatusCycleParams::of(view)), m_link(link), m_clock(clock), m_op(op), m_views(views),
      m_staleTimer(clock, 1000)
{
    nowstatus.text = QStringLiteral("&Get Current Status Now");
    nowstatus.toolTip = QStringLiteral("Upload the current status of the Glacinor NOW");
    startstatus.text = QStringLiteral("Start Updateing Current Status");
    startstatus.toolTip =
        QStringLiteral("Start automatic uloading current data from the Glacinor at the set intervals");
    stopstatus.text = QStringLiteral("Stop Updating Current Status");
    stopstatus.enabled = false;
    for (ControlState* t : {&Text1, &Text2}) {
        t->text = CeasedText;
        t->visible = false;
        t->foreColor = Colour::Red;
    }
    Text10[1].text = QString::number(IntervalMin);
    Text10[2].backColor = DateTimeColour;
    UpDown1.value = IntervalMin;
    UpDown1.toolTip = QStringLiteral("The time in seconds between updates from the Glacinor");

    connect(&Timer1, &Timer::timeout, this, &StatusCycle::Timer1_Timer);
    connect(&noReply, &Timer::timeout, this, &StatusCycle::noReply_Timer);
    connect(&Timer4, &Timer::timeout, this, &StatusCycle::Timer4_Timer);
    connect(&Timer5, &Timer::timeout, this, &StatusCycle::Timer5_Timer);
    connect(&Timer6, &Timer::timeout, this, &StatusCycle::Timer6_Timer);
    connect(&Timer20, &Timer::timeout, this, &StatusCycle::Timer20_Timer);
    connect(&m_staleTimer, &Timer::timeout, this, &StatusCycle::staleTick);
    m_staleTimer.setEnabled(true);
}

void StatusCycle::restart(Timer& t, int ms)
{
    t.setEnabled(false);
    t.setInterval(ms);
    t.setEnabled(true);
}

int StatusCycle::intervalSeconds() const
{
    return int(replyfield::val(Text10[1].text));
}

bool StatusCycle::excluded()
{
    m_checking = true;
    const auto done = qScopeGuard([this] { m_checking = false; });
    for (const StatusCycleParams::Exclusion& e : m_params.exclusions) {
        StatusCycleView* other = openStatusView(m_views, e.view);
        if (other && other->stopstatusEnabled()) {
            other->stopstatus_Click();
            notify.flush();
            m_op.message(QStringLiteral("Current Status Active"),
                         {QString::fromLatin1(e.firstLine),
                          QStringLiteral("It will be stopped to allow other proceedures.")});
            return true;
        }
    }
    return false;
}

void StatusCycle::setCeased(bool shown)
{
    Text1.visible = shown;
    if (m_params.hasText2)
        Text2.visible = shown;
}

void StatusCycle::send_status_request()
{
    if (m_link.globals().link_up)
        m_link.Output(commands::unprefixed(m_params.letter));
    // The timers run as if the request went out, so that the watchdog ends a
    // cycle whose line has gone.
    m_link.startWaitUd();
}

void StatusCycle::nowstatus_Click()
{
    const auto p = notify.procedure();
    if (excluded())
        return;
    if (m_params.nowHidesText1)
        setCeased(false);
    send_status_request();
    nowstatus.enabled = false;
    restart(noReply, m_link.globals().speed_factor * m_params.noReplyWait);
    status_manual_wait = true;
}

void StatusCycle::startstatus_Click()
{
    const auto p = notify.procedure();
    if (excluded())
        return;
    Timer1.setEnabled(false);
    // While a manual request is unanswered the buttons change but no tick is
    // armed: the cycle stays idle until Stop.
    if (nowstatus.enabled) {
        const int ms = qMin(intervalSeconds() * 1000, MaxTickMs);
        Timer1.setInterval(ms);
        Timer1.setEnabled(true);
        Text10[1].text = QString::number(ms / 1000);
        restart(Timer4, WatchdogMs);
        setCeased(false);
    }
    stopstatus.enabled = true;
    startstatus.enabled = false;
    nowstatus.enabled = false;
}

void StatusCycle::stopstatus_Click()
{
    const auto p = notify.procedure();
    if (excluded())
        return;
    if (m_params.stopKeepsWatchdog) {
        Timer1.setEnabled(false);
    } else {
        setCeased(false);
        Timer4.setEnabled(false);
        Timer1.setEnabled(false);
        if (m_params.retryTimer)
            Timer6.setEnabled(false);
    }
    stopstatus.enabled = false;
    startstatus.enabled = true;
    nowstatus.enabled = true;
}

void StatusCycle::Timer1_Timer()
{
    const auto p = notify.procedure();
    restart(Timer1, intervalSeconds() * 1000);
    send_status_request();
    nowstatus.enabled = false;
    if (m_params.retryTimer)
        restart(Timer6, m_link.globals().reply_wait_ms);
}

void StatusCycle::Timer6_Timer()
{
    const auto p = notify.procedure();
    if (!m_params.retryTimer)
        return;
    // No count: it asks until a reply comes or the watchdog ends the cycle.
    restart(Timer6, m_link.globals().reply_wait_ms);
    restart(Timer1, intervalSeconds() * 1000);
    send_status_request();
    nowstatus.enabled = false;
}

void StatusCycle::noReply_Timer()
{
    if (m_params.noReplyHandlerEmpty)
        return;
    const auto p = notify.procedure();
    noReply.setEnabled(false);
    notify.flush();
    m_op.message(QStringLiteral("No Response"),
                 {QStringLiteral("The Glacinor failed to respond,"), QStringLiteral("Re do the last command.")});
    nowstatus.enabled = true;
    status_manual_wait = false;
}

void StatusCycle::Timer4_Timer()
{
    const auto p = notify.procedure();
    Timer4.setEnabled(false);
    if (beforeCeased)
        beforeCeased();
    stopstatus_Click();
    setCeased(true);
}

void StatusCycle::Timer5_Timer()
{
    const auto p = notify.procedure();
    Timer5.setEnabled(false);
    Text10[2].backColor = DateTimeColour;
    if (afterFlash)
        afterFlash();
}

void StatusCycle::Timer20_Timer()
{
    const auto p = notify.procedure();
    Timer20.setEnabled(false);
    firstRequestNow();
}

void StatusCycle::firstRequestNow()
{
    nowstatus_Click();
    nowstatus.enabled = true;
    status_manual_wait = false;
    restart(Timer4, WatchdogMs);
    setCeased(false);
}

void StatusCycle::loadInterval(InstrumentStore* store)
{
    const auto p = notify.procedure();
    m_store = store;
    loading = true;
    int seconds = IntervalMin;
    if (store) {
        const QVariant stored = store->info(m_params.infoRow, kInfoIntervalColumn);
        const int v = int(replyfield::val(stored.toString()));
        // The stored limit is wider than the spinner's on purpose.
        if (v < IntervalMin || v > StoredMax)
            store->setInfo(m_params.infoRow, kInfoIntervalColumn, QString::number(IntervalMin));
        else
            seconds = v;
    }
    Text10[1].text = QString::number(seconds);
    UpDown1.value = seconds;
    loading = false;
}

void StatusCycle::firstRequest()
{
    const auto p = notify.procedure();
    const LinkGlobals& g = m_link.globals();
    startstatus.enabled = g.link_up;
    nowstatus.enabled = g.link_up;
    stopstatus.enabled = false;
    if (!g.link_up)
        return;
    if (!g.status_request_wait) {
        firstRequestNow();
    } else {
        // Another view has just asked: its reply must come first.
        Timer20.setInterval(FirstRequestDelayMs);
        Timer20.setEnabled(true);
    }
}

void StatusCycle::UpDown1_Change(int value)
{
    const auto p = notify.procedure();
    UpDown1.value = value;
    Text10[1].text = QString::number(value);
    if (!loading && m_store)
        m_store->setInfo(m_params.infoRow, kInfoIntervalColumn, Text10[1].text);
}

void StatusCycle::replyStarted(const QString& reply)
{
    noReply.setEnabled(false);
    releaseManualWait();
    datain = reply;
    Text10[2].text = replyfield::cut(reply, 1, 19);
}

void StatusCycle::releaseManualWait()
{
    if (status_manual_wait) {
        status_manual_wait = false;
        nowstatus.enabled = true;
    }
}

void StatusCycle::replyFinished()
{
    Text10[2].backColor = FlashColour;
    Timer5.setEnabled(true);
    restart(Timer4, WatchdogMs);
    Timer6.setEnabled(false);
    m_lastReply = m_clock.elapsedMs();
    m_wasStale = false;
    m_lastAge.clear();
}

void StatusCycle::restartWatchdog()
{
    restart(Timer4, WatchdogMs);
    m_lastReply = m_clock.elapsedMs();
    m_wasStale = false;
}

bool StatusCycle::stale() const
{
    if (m_lastReply < 0)
        return false;
    const qint64 limit = 2LL * qMax(intervalSeconds(), 1) * 1000;
    return m_clock.elapsedMs() - m_lastReply > limit;
}

QString StatusCycle::ageText() const
{
    if (m_lastReply < 0)
        return {};
    const qint64 s = (m_clock.elapsedMs() - m_lastReply) / 1000;
    QString age;
    if (s >= 3600)
        age = QStringLiteral("%1 h %2 min").arg(s / 3600).arg((s % 3600) / 60);
    else if (s >= 60)
        age = QStringLiteral("%1 min %2 s").arg(s / 60).arg(s % 60);
    else
        age = QStringLiteral("%1 s").arg(s);
    return QStringLiteral("Not current: the last reply came %1 ago").arg(age);
}

// Tells only when what the views show of the age has changed.
void StatusCycle::staleTick()
{
    const bool now = stale();
    if (!now && !m_wasStale)
        return;
    const QString age = now ? ageText() : QString();
    if (now == m_wasStale && age == m_lastAge)
        return;
    const auto p = notify.procedure();
    m_wasStale = now;
    m_lastAge = age;
}

void StatusCycle::printHead(Printer& printer, const QString& title) const
{
    printer.setFont({Printer::ReportFamily, ReportFontSize, false});
    printer.line(title);
    printer.endLine();
    printer.line(QStringLiteral("Glacinor ID  ") + Text10[0].text);
    printer.endLine();
    const QDateTime now = m_clock.now();
    printer.line(QStringLiteral("Printed at  ") + now.toString(QStringLiteral("dd/MM/yyyy")) + QStringLiteral("   ") +
                 now.toString(QStringLiteral("hh:mm:ss")) + QStringLiteral("      Glacinor Date and Time  ") +
                 Text10[2].text);
    printer.endLine();
}
