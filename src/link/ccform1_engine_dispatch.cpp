// ccForm1's receive dispatcher: the ordered token table and the replies the
// form handles itself (modem results, the identity, resets, alarms).
#include "link/ccform1_engine.h"

#include "link/ccform1_texts.h"
#include "link/commands.h"

using namespace ccform1;
using commands::Token;
using commands::tokenText;

// The table is searched in order and the first token test3 holds wins,
// wherever it stands in the text. A guard that does not hold passes the
// text on to the later tokens. A handler answers whether the buffer is
// emptied behind it: a parser has written what it wrote, and whatever
// arrived meanwhile is dropped.
using E = ccForm1_engine;

const QList<ccForm1_engine::Route> ccForm1_engine::s_routes = {
    {Token::NoDialtone, nullptr, [](E& e) {
         e.cancel_dial_Click();
         e.say(QStringLiteral("No Dial Tone"), {QStringLiteral("There was no dial tone detected."),
                                                QStringLiteral("Make sure the phone line is connected")});
         return true;
     }},
    {Token::Busy, nullptr, [](E& e) {
         e.cancel_dial_Click();
         e.cmdOK.enabled = false;
         e.say(QStringLiteral("Busy"),
               {QStringLiteral("The number dialed is busy."),
                QStringLiteral("The program will hang up the phone and"),
                QStringLiteral("try again in 30 seconds after this message is acknowlaged."),
                QStringLiteral("To cancel Press Cancel Re-Dial")});
         // The count starts once the operator has acknowledged.
         e.Timer2.setEnabled(true);
         e.cancel_redial.enabled = true;
         e.ProgressBar1.visible = true;
         return true;
     }},
    {Token::NoCarrier, nullptr, [](E& e) {
         e.dialled = false;
         e.cancel_dial_Click();
         e.say(QStringLiteral("Busy"), {QStringLiteral("No carrier signal."),
                                        QStringLiteral("Check the modem at the other end.")});
         return true;
     }},
    {Token::Connect, [](const E& e) { return e.Text3[3].text == kPortOpen; },
     [](E& e) {
         e.modemConnect();
         return false;
     }},
    {Token::Glacinor, nullptr, [](E& e) {
         e.identityReply();
         return false;
     }},
    {Token::Sret, [](const E& e) { return e.m_views.channels_open || e.m_views.loadshed_open; },
     [](E& e) {
         OpenViews& v = e.m_views;
         if (v.channels_open) {
             if (v.channels)
                 v.channels->ret_handel();
         } else if (v.loadshed) {
             v.loadshed->ret_handel();
         }
         return true;
     }},
    {Token::Schanupload, nullptr, [](E& e) {
         if (e.m_views.channels_open && e.m_views.channels)
             e.m_views.channels->sin_chan_up_load();
         return true;
     }},
    {Token::Downcheck, nullptr, [](E& e) {
         if (e.m_views.channels_open && e.m_views.channels)
             e.m_views.channels->down_check();
         return true;
     }},
    {Token::Donedown, nullptr, [](E& e) {
         if (e.m_views.channels_open && e.m_views.channels)
             e.m_views.channels->done_down();
         return true;
     }},
    {Token::Reset, [](const E& e) { return !e.connecting; },
     [](E& e) {
         e.instrumentReset();
         return true;
     }},
    {Token::Dlres, nullptr, [](E& e) {
         e.say(QStringLiteral("Data Log Reset"), {QStringLiteral("The Data Log has been reset")});
         if (e.m_views.history)
             e.m_views.history->stopTimer3();
         return true;
     }},
    {Token::Histy, nullptr, [](E& e) {
         if (e.m_views.history_open && e.m_views.history)
             e.m_views.history->history_do();
         return true;
     }},
    {Token::Plres, nullptr, [](E& e) {
         e.say(QStringLiteral("Data Log Reset"),
               {QStringLiteral("The Power Used Data Log has been reset")});
         if (e.m_views.power)
             e.m_views.power->stopTimer3();
         return true;
     }},
    {Token::Power, nullptr, [](E& e) {
         if (e.m_views.power_open && e.m_views.power)
             e.m_views.power->power_do();
         return true;
     }},
    {Token::Status, nullptr, [](E& e) {
         OpenViews& v = e.m_views;
         if (v.status_open) {
             if (v.status)
                 v.status->status_do();
         } else if (v.statusg_open) {
             if (v.statusg)
                 v.statusg->status_do();
         } else if (v.multiprobes_open) {
             if (v.multiprobes)
                 v.multiprobes->status_do();
         }
         return true;
     }},
    {Token::Presss, nullptr, [](E& e) {
         OpenViews& v = e.m_views;
         if (v.statusp_open) {
             if (v.statusp)
                 v.statusp->statusp_do();
         } else if (v.statuspg_open) {
             if (v.statuspg)
                 v.statuspg->statuspg_do();
         }
         return true;
     }},
    {Token::Torvan, nullptr, [](E& e) {
         OpenViews& v = e.m_views;
         if (e.m_globals.versionNumber() >= 8 && v.statusp_open && v.statusp)
             v.statusp->statuspa_do();
         return true;
     }},
    {Token::Realarms, nullptr, [](E& e) {
         if (e.m_views.alarm)
             e.m_views.alarm->stopTimer2();
         e.say(QStringLiteral("Alarm Log Reset"),
               {QStringLiteral("The Alarm or Alarms have been reset"),
                QStringLiteral("Check current status or reload alarms for verification.")});
         return true;
     }},
    {Token::Noalarms, nullptr, [](E& e) {
         if (e.m_views.alarm)
             e.m_views.alarm->stopTimer2();
         e.say(QStringLiteral("No Alarms"), {QStringLiteral("There were no alarms logged to reset")});
         return true;
     }},
    {Token::Almlog, nullptr, [](E& e) {
         if (e.m_views.alarm_open && e.m_views.alarm)
             e.m_views.alarm->alarm_do(e.test3);
         return true;
     }},
    {Token::AlmNew, nullptr, [](E& e) {
         e.newAlarm();
         return true;
     }},
    {Token::Nocomp, nullptr, [](E& e) {
         e.noComputerLink();
         return false;
     }},
    // A closed view leaves its text in the buffer.
    {Token::Tempfront, nullptr, [](E& e) {
         if (!e.m_views.front_open || !e.m_views.front)
             return false;
         e.m_views.front->Front_do(e.test3);
         return true;
     }},
    {Token::Dxstart, nullptr, [](E& e) {
         if (!e.m_views.brumalet_open || !e.m_views.brumalet)
             return false;
         e.m_views.brumalet->start_do(e.test3);
         return true;
     }},
    {Token::Evapfrst, nullptr, [](E& e) {
         if (!e.m_views.brumalet_open || !e.m_views.brumalet)
             return false;
         e.m_views.brumalet->status_do(e.test3);
         return true;
     }},
};

QList<commands::Token> ccForm1_engine::dispatchOrder()
{
    QList<Token> order;
    for (const Route& r : s_routes)
        order.append(r.token);
    return order;
}

void ccForm1_engine::reply_do()
{
    const auto p = m_notify.procedure();
    for (const Route& r : s_routes) {
        if (!test3.contains(tokenText(r.token)) || (r.when && !r.when(*this)))
            continue;
        if (r.run(*this))
            emptyBuffer();
        return;
    }
    // No token yet: the text waits for the next arrival.
}

void ccForm1_engine::modemConnect()
{
    Timer9.setInterval(2000);
    Timer9.setEnabled(true);
    Label1[13].text = QStringLiteral("Connected To");
    Timer4.setInterval(40000);
    Timer4.setEnabled(true);
    emptyBuffer();
    sbrStatus[3].visible = true;
    m_globals.modem_online = true;
}

void ccForm1_engine::badIdentity(const QString& title, const QStringList& lines, Operator::Icon icon)
{
    Timer8.stop();
    say(title, lines, icon);
    if (modemMode())
        cancel_dial_Click();
    else
        Command6_Click();
    emptyBuffer();
}

void ccForm1_engine::identityReply()
{
    Timer9.stop();
    // Whatever stands in front of the identity (echo, prefix, modem noise) falls away.
    if (test3.size() > 47)
        test3 = test3.right(47);
    if (modemMode())
        Timer4.stop();

    const QString versionField = test3.mid(0, 3);
    if (!isNumericText(versionField)) {
        badIdentity(QStringLiteral("Invalid Version Number"),
                    {QStringLiteral("The Glacinor Version Number is invalid,"),
                     QStringLiteral("The Program will disconnect/hang up, try again.")},
                    Operator::Icon::Critical);
        return;
    }
    m_globals.instrument_version = versionField.trimmed();
    if (!modemMode())
        sbrStatus[3].visible = true;

    const QString idField = test3.mid(7, 5);
    if (!isNumericText(idField)) {
        badIdentity(QStringLiteral("Invalid ID Number"),
                    {QStringLiteral("The Glacinor ID number is invalid,"),
                     QStringLiteral("The Program will disconnect/hang up, try again.")},
                    Operator::Icon::Critical);
        return;
    }
    // Compared as numbers: "00012" is instrument 12.
    const double id = QString(idField).remove(QLatin1Char(' ')).toDouble();
    const bool selectedIsNumber = isNumericText(m_Text1_0);
    const double selected = QString(m_Text1_0).remove(QLatin1Char(' ')).toDouble();
    if (!selectedIsNumber || id != selected) {
        badIdentity(QStringLiteral("Wrong ID"),
                    {QStringLiteral("The Glacinor ID does not match the Glacinor Unit ID"),
                     QStringLiteral("Check ID numbers, The program will hang up on this Glacinor")},
                    Operator::Icon::None);
        if (!modemMode()) {
            Command6.enabled = false;
            Command3.enabled = true;
        }
        return;
    }

    Label1[13].text = QStringLiteral("Connected To");
    Label1[13].visible = true;
    Label1[2].visible = false;
    Text3[4].text = QStringLiteral("ID No. ") + m_Text1_0;
    version.text = test3.mid(0, 7);
    resets.text = test3.mid(12, 5);
    time.text = test3.mid(17, 22);
    emptyBuffer();
    if (modemMode()) {
        sbrStatus[3].visible = true;
    } else {
        Timer8.stop();
        Command6.enabled = true;
        Command3.enabled = false;
        connecting = false;
    }
    emit identityAccepted();
}

void ccForm1_engine::instrumentReset()
{
    emptyBuffer();
    Command6_Click();
    say(QStringLiteral("No Response"), {QStringLiteral("The Glacinor did not respond or was reset."),
                                        QStringLiteral("The program will hang up on this Glacinor")});
    if (m_views.shell)
        m_views.shell->setToolbarEnabled(true);
    emptyBuffer();
    if (m_views.channels_open && m_views.channels)
        m_views.channels->stopTimer5();
    if (m_views.shell)
        m_views.shell->unloadUploadProgress();
    if (Text3[3].text == kPortOpen)
        cancel_dial_Click();
    else if (Text3[2].text == kPortOpen)
        Command6_Click();
}

void ccForm1_engine::newAlarm()
{
    OpenViews& v = m_views;
    // Only the temperature status cycle holds an unasked alarm back.
    if (v.status_open && v.status && v.status->stopstatusEnabled()) {
        say(QStringLiteral("Alarm Active"),
            {QStringLiteral("An Alarm was received while the Current Status is operating."),
             QStringLiteral("Stop the current status from running and load new alarms if required.")});
        return;
    }
    if (v.alarm_open && v.alarm)
        v.alarm->showMaximised();
    else if (v.shell)
        v.shell->mnualarmon_Click();
    if (v.alarm)
        v.alarm->uploadnew_Click();
}

void ccForm1_engine::noComputerLink()
{
    no_computer_link = true;
    say(QStringLiteral("Glacinor Invaild"),
        {QStringLiteral("The Glacinor is not configured for computer communications,"),
         QStringLiteral("Contact the manufacturer for software upgrades.")});
    emptyBuffer();
    if (Option2[0].value.toBool())
        cancel_dial_Click();
    else
        Command6_Click();
}
