// ccForm1's engine: construction, the Link the views use, and receiving.
// Port settings, the modem dialogue, the dispatch table and port discovery
// live in ccform1_engine_*.cpp.
#include "link/ccform1_engine.h"

#include "link/ccform1_texts.h"
#include "link/commands.h"
#include "platform/line_factory.h"

#include <QHash>

using namespace ccform1;

namespace {

// Codes of the line events that have a text, and the slot it goes to.
struct EventText {
    bool isEvent; // event_message, else error_message
    const char* text;
};
const QHash<int, EventText>& eventTexts()
{
    static const QHash<int, EventText> texts = {
        {Line::CtsChanged, {true, "Change in CTS Detected"}},
        {Line::DsrChanged, {true, "Change in DSR Detected"}},
        {Line::CdChanged, {true, "Change in CD Detected"}},
        {Line::Ring, {true, "The Phone is Ringing"}},
        {Line::EndOfFile, {true, "End of File Detected"}},
        {Line::CtsTimeout, {false, "CTS Timeout"}},
        {Line::DsrTimeout, {false, "DSR Timeout"}},
        {Line::CdTimeout, {false, "Carrier Detect Timeout"}},
        {Line::ReceiveOverflow, {false, "Receive Buffer Overflow"}},
        {Line::TransmitFull, {false, "Transmit Buffer Full"}},
        {Line::DcbError, {false, "Error retrieving DCB"}},
    };
    return texts;
}

bool silentEvent(int code)
{
    return code == Line::Send || code == Line::Break || code == Line::Framing
        || code == Line::Overrun || code == Line::Parity;
}

} // namespace

ccForm1_engine::ccForm1_engine(Clock& clock, Operator& op, Settings& settings, OpenViews& views,
                               LinkGlobals& globals, LineFactory factory, QObject* parent)
    : QObject(parent),
      Timer1(clock, 30000), Timer2(clock, 1000), Timer3(clock, 2000), Timer4(clock, 40000),
      Timer5(clock, 2000), Timer6(clock, 3000), Timer7(clock, 3000), Timer8(clock, 4000),
      Timer9(clock, 2000), WaitUd(clock, 8000), dbase_error(clock, 1000),
      m_clock(clock), m_op(op), m_settings(settings), m_views(views), m_globals(globals),
      m_factory(factory ? std::move(factory) : LineFactory(makeLine))
{
    connect(&Timer1, &Timer::timeout, this, &ccForm1_engine::Timer1_Timer);
    connect(&Timer2, &Timer::timeout, this, &ccForm1_engine::Timer2_Timer);
    connect(&Timer3, &Timer::timeout, this, &ccForm1_engine::Timer3_Timer);
    connect(&Timer4, &Timer::timeout, this, &ccForm1_engine::Timer4_Timer);
    connect(&Timer5, &Timer::timeout, this, &ccForm1_engine::Timer5_Timer);
    connect(&Timer6, &Timer::timeout, this, &ccForm1_engine::Timer6_Timer);
    connect(&Timer8, &Timer::timeout, this, &ccForm1_engine::Timer8_Timer);
    connect(&Timer9, &Timer::timeout, this, &ccForm1_engine::Timer9_Timer);
    connect(&WaitUd, &Timer::timeout, this, &ccForm1_engine::WaitUd_Timer);
    connect(&dbase_error, &Timer::timeout, this, &ccForm1_engine::dbase_error_Timer);

    // The form as it is loaded.
    cmdOK.text = QStringLiteral("OK");
    fraConnection.text = QStringLiteral("Port Settings");
    Frame4.text = QStringLiteral("Connection Type");
    Frame3.text = QStringLiteral("Modem");
    Frame5.text = QStringLiteral("Dial Tone");
    Frame8.text = QStringLiteral("Modem Connect");
    Frame9.text = QStringLiteral("Direct Connect");
    Option2[0].text = QStringLiteral("Modem");
    Option2[1].text = QStringLiteral("Direct");
    DialTone[0].text = QStringLiteral("Wait for dial tone");
    DialTone[1].text = QStringLiteral("Blind dial");
    DialTone[0].value = true;
    DialTone[1].value = false;
    for (int i = 0; i < 4; ++i) {
        optFlow[i].text = optFlowCaptions[i];
        optFlow[i].value = i == 0;
    }
    Command3.text = QStringLiteral("Connect");
    Command6.text = QStringLiteral("Dis Connect");
    Command6.enabled = false;
    dial_num.text = QStringLiteral("&Dial Glacinor");
    cancel_dial.text = QStringLiteral("Hang Up");
    cancel_dial.enabled = false;
    cancel_redial.text = QStringLiteral("Cancel Re-Dial");
    cancel_redial.enabled = false;
    ProgressBar1.visible = false;
    ProgressBar1.value = ProgressBar1_Min;
    ProgressBar1.toolTip = QStringLiteral("Redial timeout");
    ModemGet.text = QStringLiteral("Show");
    ModemSave.text = QStringLiteral("Save");
    ModemTest.text = QStringLiteral("Send");
    setPortState(Text3[2], false);
    setPortState(Text3[3], false);
    Label1[2].visible = false;
    Label1[13].visible = false;
    version.text = resets.text = time.text = kUnknown;
    sbrStatus[1].text = QStringLiteral("Status: ");
    sbrStatus[2].text = QStringLiteral("Settings: ");
    sbrStatus[3].text = QStringLiteral("Connected");
    sbrStatus[3].visible = false;

    m_globals.modem_online = false;
    m_globals.reply_wait_ms = 7000;

    LoadPropertySettings();
}

ccForm1_engine::~ccForm1_engine()
{
    if (m_line)
        m_line->close();
}

void ccForm1_engine::setInstrument(const QString& id, const QString& phone, Recordset* info)
{
    const auto p = m_notify.procedure();
    m_Text1_0 = id;
    m_Text1_7 = phone;
    m_info = info;
}

// ---------------------------------------------------------------------------
// The port

void ccForm1_engine::connectLine()
{
    connect(m_line.get(), &Line::received, this,
            [this](const QByteArray& bytes) { MSComm1_OnComm(Line::Receive, bytes); });
    connect(m_line.get(), &Line::lineEvent, this, [this](int code) { MSComm1_OnComm(code); });
}

bool ccForm1_engine::openPort(QString* error)
{
    return m_line->open(error);
}

void ccForm1_engine::closePort()
{
    m_line->close();
}

bool ccForm1_engine::portOpen() const
{
    return m_line && m_line->isOpen();
}

bool ccForm1_engine::Output(const QByteArray& bytes)
{
    return m_line && m_line->write(bytes);
}

void ccForm1_engine::discardInput()
{
    if (m_line)
        m_line->discardInput();
}

void ccForm1_engine::startWaitUd()
{
    m_globals.status_request_wait = true;
    WaitUd.start(8000);
}

void ccForm1_engine::startDbaseError()
{
    dbase_error.setEnabled(true);
}

void ccForm1_engine::hangUp()
{
    const auto p = m_notify.procedure();
    if (Text3[3].text == kPortOpen)
        cancel_dial_Click();
    else if (Text3[2].text == kPortOpen)
        Command6_Click();
}

// ---------------------------------------------------------------------------
// Helpers

Operator::Answer ccForm1_engine::say(const QString& title, const QStringList& lines,
                                     Operator::Icon icon, Operator::Buttons buttons)
{
    // The box lets other events run: what they change must show, and their
    // procedures must report their own ends meanwhile.
    const auto box = m_notify.box();
    return m_op.message(title, lines, icon, buttons);
}

void ccForm1_engine::emptyBuffer()
{
    discardInput();
    test3.clear();
}

void ccForm1_engine::setPortState(ControlState& box, bool open)
{
    box.text = open ? kPortOpen : kPortClosed;
    box.backColor = open ? PortOpenColour : PortClosedColour;
}

// ---------------------------------------------------------------------------
// Receiving

void ccForm1_engine::MSComm1_OnComm(int commEvent, const QByteArray& input)
{
    const auto p = m_notify.procedure();
    // Bytes become characters one to one.
    const QString text = QString::fromLatin1(input);
    if (modem_test) {
        show_received(test3, text);
        modem.text = modem_text;
        return;
    }
    if (commEvent == Line::LineLost) {
        lineLost();
        return;
    }
    if (commEvent == Line::Receive) {
        show_received(test3, text);
        Timer1.stop();
        reply_do();
        comm_fault = false;
    } else if (!silentEvent(commEvent)) {
        const auto it = eventTexts().constFind(commEvent);
        if (it == eventTexts().cend())
            error_message = QStringLiteral("Unknown error or event");
        else if (it->isEvent)
            event_message = QString::fromLatin1(it->text);
        else
            error_message = QString::fromLatin1(it->text);
    }
    // Neither slot is ever emptied: an event message, once set, is shown again
    // on every later event and hides any error for the rest of the run.
    if (!event_message.isEmpty()) {
        sbrStatus[1].text = QStringLiteral("Status: ") + event_message;
        Timer3.stop();
        Timer3.setEnabled(true);
        comm_fault = false;
    } else if (!error_message.isEmpty()) {
        commsError();
    }
}

void ccForm1_engine::commsError()
{
    sbrStatus[1].text = QStringLiteral("Status: ") + error_message;
    comm_fault = true;
    m_op.beep();
    // Both answers do the same.
    say(QStringLiteral("Click Cancel to quit, OK to ignore."),
        {error_message, QStringLiteral("Check communication setup")}, Operator::Icon::None,
        Operator::Buttons::OkCancel);
    setPortState(Text3[2], false);
    Command6.enabled = false;
    Command3.enabled = true;
    Text3[1].text.clear();
    Timer1.stop();
    Timer2.stop();
    fraConnection.enabled = Frame4.enabled = cboSpeed.enabled = cboPort.enabled = Frame1.enabled = true;
    Label1[2].visible = false;
    if (m_globals.link_up) {
        m_globals.link_up = false;
        closePort();
        sbrStatus[3].visible = false;
    }
    Timer3.setEnabled(true);
}

void ccForm1_engine::lineLost()
{
    // The device or the connection is gone and the line closed already. It
    // ends as a hang-up ends, and unlike a port error it is not kept in
    // error_message, where it would close every later connect of the run.
    const QString text = QStringLiteral("Unknown error or event");
    sbrStatus[1].text = QStringLiteral("Status: ") + text;
    m_op.beep();
    say(QStringLiteral("Click Cancel to quit, OK to ignore."),
        {text, QStringLiteral("Check communication setup")}, Operator::Icon::None,
        Operator::Buttons::OkCancel);
    if (Text3[3].text == kPortOpen || Text3[2].text == kPortOpen) {
        hangUp();
    } else {
        m_globals.link_up = false;
        sbrStatus[3].visible = false;
    }
    Timer3.setEnabled(true);
}

void ccForm1_engine::show_received(QString& box, QString data)
{
    if (box.size() > 16000)
        box = box.mid(4096);
    bool replaceLast = false;
    for (qsizetype i = data.indexOf(QChar(8)); i >= 0; i = data.indexOf(QChar(8))) {
        if (i == 0) {
            replaceLast = !box.isEmpty();
            data.remove(0, 1);
        } else {
            data.remove(i - 1, 2);
        }
    }
    data.remove(QChar(10));
    data.replace(QChar(13), QStringLiteral("\r\n"));
    if (replaceLast)
        box.chop(1);
    box += data;
    modem_text += data;
}
