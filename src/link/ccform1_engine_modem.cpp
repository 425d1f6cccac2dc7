// ccForm1's connection dialogue: the direct connect, the modem call with its
// redial, the modem test boxes, and the timers that watch them.
#include "link/ccform1_engine.h"

#include "link/ccform1_texts.h"
#include "link/commands.h"

using namespace ccform1;

// ---------------------------------------------------------------------------
// Direct line

void ccForm1_engine::Command3_Click()
{
    const auto p = m_notify.procedure();
    connecting = true;
    if (!portOpen()) {
        QString error;
        if (!openPort(&error)) {
            say(QStringLiteral("Invalid Port"), {QStringLiteral("This is an invalid port number,"),
                                                 QStringLiteral("Select a port that this computer uses."),
                                                 error});
            return;
        }
    }
    m_globals.link_up = true;
    Output(commands::connectDirect());
    setPortState(Text3[2], true);
    Label1[2].text = QStringLiteral("Connecting");
    Label1[2].visible = true;
    fraConnection.enabled = Frame4.enabled = Frame1.enabled = false;
    Command6.enabled = true;
    Command3.enabled = false;
    Timer8.setInterval(3000);
    Timer8.setEnabled(true);
}

void ccForm1_engine::Timer8_Timer()
{
    const auto p = m_notify.procedure();
    ++connect_tries;
    if (connect_tries < 5) {
        Timer8.stop();
        Command3_Click();
        return;
    }
    say(QStringLiteral("No Glacinor"), {QStringLiteral("The Glacinor cannot be connected."),
                                        QStringLiteral("Check all cables to the Glacinor.")});
    Timer8.stop();
    Command6_Click();
}

void ccForm1_engine::Command6_Click()
{
    const auto p = m_notify.procedure();
    setPortState(Text3[2], false);
    connecting = false;
    m_globals.link_up = false;
    sbrStatus[3].visible = false;
    if (portOpen())
        closePort();
    // Composed after the port is closed, so nothing reaches the line.
    if (!no_computer_link)
        Output(commands::disconnectDirect());
    else
        no_computer_link = false;
    Command6.enabled = false;
    Command3.enabled = true;
    Text3[1].text.clear();
    Timer1.stop();
    Timer2.stop();
    sbrStatus[2].text = QStringLiteral("Settings: ");
    fraConnection.enabled = Frame4.enabled = cboSpeed.enabled = cboPort.enabled = Frame1.enabled = true;
    Label1[2].visible = false;
    time.text = version.text = resets.text = kUnknown;
    connect_tries = 0;
    Timer8.stop();
}

// ---------------------------------------------------------------------------
// Modem

void ccForm1_engine::dial_num_Click()
{
    const auto p = m_notify.procedure();
    if (Text3[3].text == kPortOpen) {
        say(QStringLiteral("Port Busy"), {QStringLiteral("Port already open,"),
                                          QStringLiteral("Hang up on the current Glacinor and try again,")});
        return;
    }
    if (!portOpen()) {
        QString error;
        if (!openPort(&error)) {
            say(QStringLiteral("Invalid Port"), {QStringLiteral("Invalid port number,"),
                                                 QStringLiteral("Choose a different port number,"), error});
            return;
        }
        m_globals.link_up = true;
    }
    Text3[4].text = m_Text1_7;
    phone_number = Text3[4].text;
    cancel_dial.enabled = true;
    setPortState(Text3[3], true);
    m_globals.link_up = true;
    emptyBuffer();
    // The direct line never reaches here: its frame holds no dial button.
    if (Option2[0].value.toBool()) {
        Output(commands::modemDial(DialTone[0].value.toBool(), modem.text, phone_number));
        Timer1.setInterval(50000);
    }
    dial_num.enabled = false;
    Timer1.setEnabled(true);
    cancel_redial.enabled = false;
    cmdOK.enabled = false;
    sbrStatus[2].text = QStringLiteral("Settings: ") + m_line->settings().toText();
    dialled = true;
    Label1[2].text = QStringLiteral("Dialing");
    Label1[2].visible = true;
    Frame5.enabled = fraConnection.enabled = cboSpeed.enabled = cboPort.enabled = Frame1.enabled = false;
}

void ccForm1_engine::cancel_dial_Click()
{
    const auto p = m_notify.procedure();
    m_op.setBusy(true);
    dial_num.enabled = true;
    cancel_dial.enabled = false;
    setPortState(Text3[3], false);
    Text3[4].text.clear();
    m_globals.link_up = false;
    sbrStatus[3].visible = false;
    if (portOpen())
        m_globals.link_up = true;
    if (dialled) {
        // The modem needs its guard times: nothing may touch the line meanwhile.
        if (!m_globals.modem_online) {
            Output(commands::modemHangUp());
            no_computer_link = false;
            m_clock.sleep(200);
        } else {
            Output(commands::modemEscape());
            m_clock.sleep(2000);
            Output(commands::modemHangUp());
            m_clock.sleep(500);
            m_globals.modem_online = false;
        }
    }
    const bool dtr = m_line->dtr();
    m_line->setDtr(true);
    m_line->setDtr(false);
    m_line->setDtr(dtr);
    if (portOpen()) {
        closePort();
        m_globals.link_up = false;
        Timer1.stop();
        Timer2.stop();
    }
    ProgressBar1.visible = false;
    sbrStatus[2].text = QStringLiteral("Settings: ");
    if (!cancel_redial.enabled)
        cmdOK.enabled = true;
    Frame5.enabled = fraConnection.enabled = Frame3.enabled = cboSpeed.enabled = cboPort.enabled =
        Frame1.enabled = true;
    Label1[2].text.clear();
    time.text = version.text = resets.text = kUnknown;
    m_op.setBusy(false);
}

void ccForm1_engine::cancel_redial_Click()
{
    const auto p = m_notify.procedure();
    Timer2.stop();
    ProgressBar1.visible = false;
    cancel_redial.enabled = false;
    cmdOK.enabled = true;
    Timer8.stop();
}

// The modem test boxes talk to the modem on the port itself: it is opened
// for them when it is closed.
bool ccForm1_engine::startModemTest()
{
    modem_test = true;
    modem_text = modem.text;
    if (!portOpen()) {
        QString error;
        if (!openPort(&error)) {
            modem_test = false;
            say(QStringLiteral("Invalid Port"), {QStringLiteral("Invalid port number,"),
                                                 QStringLiteral("Choose a different port number,"), error});
            return false;
        }
        m_globals.link_up = true;
    }
    return true;
}

void ccForm1_engine::ModemGet_Click()
{
    const auto p = m_notify.procedure();
    if (!startModemTest())
        return;
    Output(commands::modemAskModulation());
    Timer6.setInterval(3000);
    Timer6.setEnabled(true);
}

void ccForm1_engine::ModemTest_Click()
{
    const auto p = m_notify.procedure();
    if (Timer6.Enabled()) {
        Timer6.stop();
        emptyBuffer();
        modem.text = modem_text;
    }
    if (!startModemTest())
        return;
    Output(commands::modemCommand(modem.text));
    modem.text.clear();
    Timer6.setInterval(3000);
    Timer6.setEnabled(true);
}

// ---------------------------------------------------------------------------
// Timers

void ccForm1_engine::Timer1_Timer()
{
    const auto p = m_notify.procedure();
    Timer1.stop();
    const QString second =
        QStringLiteral("Check that it is turned on and the cables are properly connected");
    if (Option2[0].value.toBool())
        say(QStringLiteral("No Modem"), {QStringLiteral("The modem has not responded"), second});
    else
        say(QStringLiteral("No Glacinor"), {QStringLiteral("The Glacinor has not responded"), second});
    cancel_dial_Click();
}

void ccForm1_engine::Timer2_Timer()
{
    const auto p = m_notify.procedure();
    ProgressBar1.value = ProgressBar1.value.toInt() + 1;
    if (ProgressBar1.value.toInt() == ProgressBar1_Max) {
        Timer2.stop();
        ProgressBar1.visible = false;
        ProgressBar1.value = ProgressBar1_Min;
        dial_num_Click();
    }
}

void ccForm1_engine::Timer3_Timer()
{
    const auto p = m_notify.procedure();
    sbrStatus[1].text = QStringLiteral("Status: ");
    Timer3.stop();
}

void ccForm1_engine::Timer4_Timer()
{
    const auto p = m_notify.procedure();
    Timer4.stop();
    cancel_dial_Click();
    cmdOK.enabled = false;
    Timer2.setEnabled(true);
    ProgressBar1.visible = true;
    cancel_redial.enabled = true;
    // The redial count runs beneath this message.
    say(QStringLiteral("No Glacinor"),
        {QStringLiteral("The Glacinor has not responded"),
         QStringLiteral("The program will hang up and try again in 30 seconds"),
         QStringLiteral("If there is still no response. Check the Glacinor")});
}

void ccForm1_engine::Timer5_Timer()
{
    const auto p = m_notify.procedure();
    Timer5.stop();
    cancel_dial_Click();
}

void ccForm1_engine::Timer6_Timer()
{
    const auto p = m_notify.procedure();
    Timer6.stop();
    modem_test = false;
    emptyBuffer();
    modem.text = modem_text;
    modem_text.clear();
    if (portOpen()) {
        closePort();
        // Left True with the port closed, as the form always did.
        m_globals.link_up = true;
    }
}

void ccForm1_engine::Timer9_Timer()
{
    const auto p = m_notify.procedure();
    Timer9.stop();
    Output(commands::identifyAfterCall());
}

void ccForm1_engine::WaitUd_Timer()
{
    // Never stops itself: harmless, and kept so.
    m_globals.status_request_wait = false;
}

void ccForm1_engine::dbase_error_Timer()
{
    const auto p = m_notify.procedure();
    dbase_error.stop();
    if (m_views.shell)
        m_views.shell->mnualloff_Click();
}
