#include "link/ccform1_engine.h"

#include "link/commands.h"
#include "platform/line_factory.h"
#include "platform/store.h"

#include <QDir>
#include <QFileInfo>
#include <QHash>
#include <QSerialPortInfo>

using commands::Token;
using commands::tokenText;

namespace {

const QString kPortOpen = QStringLiteral("Port Open");
const QString kPortClosed = QStringLiteral("Port Closed");
const QString kUnknown = QStringLiteral("????");
const QString kDefaultSettings = QStringLiteral("9600,n,8,1");
constexpr int kInfoField = 41;

// Rows of the instrument's info table (field 41) that hold the connection.
enum InfoRow { RowSettings = 2, RowPort = 3, RowType = 4, RowDialTone = 5, RowModem = 6, RowFlow = 7 };

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

QString parityName(QChar letter)
{
    switch (letter.toLower().unicode()) {
    case 'e': return QStringLiteral("Even");
    case 'm': return QStringLiteral("Mark");
    case 'o': return QStringLiteral("Odd");
    case 's': return QStringLiteral("Space");
    default: return QStringLiteral("None");
    }
}

} // namespace

const QStringList ccForm1_engine::optFlowCaptions = {
    QStringLiteral("None"), QStringLiteral("Xon/Xoff"), QStringLiteral("RTS"), QStringLiteral("Xon/RTS")};

// Emits changed() once when the outermost procedure ends.
class ccForm1_engine::Procedure {
public:
    explicit Procedure(ccForm1_engine& e) : m_e(e) { ++m_e.m_depth; }
    ~Procedure()
    {
        if (--m_e.m_depth == 0)
            emit m_e.changed();
    }

private:
    ccForm1_engine& m_e;
};

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
    Procedure p(*this);
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

bool ccForm1_engine::setCommPort(const QString& name, QString* error)
{
    if (m_line && name == m_commPort)
        return true;
    const bool wasOpen = m_line && m_line->isOpen();
    LineSettings settings;
    Handshaking flow = Handshaking::None;
    if (m_line) {
        settings = m_line->settings();
        m_line->close();
    }
    for (int i = 0; i < 4; ++i)
        if (optFlow[i].value.toBool())
            flow = Handshaking(i);
    std::unique_ptr<Line> fresh = m_factory(name);
    fresh->setPortName(name);
    fresh->setSettings(settings);
    fresh->setHandshaking(flow);
    if (wasOpen && !fresh->open(error))
        return false;
    if (m_line)
        m_line->disconnect(this);
    m_line = std::move(fresh);
    m_commPort = name;
    connectLine();
    return true;
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
    Procedure p(*this);
    if (Text3[3].text == kPortOpen)
        cancel_dial_Click();
    else if (Text3[2].text == kPortOpen)
        Command6_Click();
}

QList<ccForm1_engine::PortEntry> ccForm1_engine::availablePorts()
{
    // A USB adapter's ttyUSB number changes between boots; its by-id name does not.
    QHash<QString, QString> stableName;
    const QDir byId(QStringLiteral("/dev/serial/by-id"));
    for (const QFileInfo& link : byId.entryInfoList(QDir::System | QDir::Files | QDir::NoDotAndDotDot))
        stableName.insert(link.canonicalFilePath(), link.absoluteFilePath());

    QList<PortEntry> ports;
    for (const QSerialPortInfo& info : QSerialPortInfo::availablePorts()) {
        PortEntry e;
        e.name = stableName.value(info.systemLocation(), info.systemLocation());
        QStringList about;
        if (!info.description().isEmpty())
            about << info.description();
        if (!info.manufacturer().isEmpty() && info.manufacturer() != info.description())
            about << info.manufacturer();
        if (e.name != info.systemLocation())
            about << info.systemLocation();
        e.description = about.join(QStringLiteral(", "));
        ports.append(e);
    }
    return ports;
}

void ccForm1_engine::selectPort(const QString& name)
{
    int index = -1;
    for (int i = 0; i < cboPortItems.size(); ++i)
        if (cboPortItems[i].name == name)
            index = i;
    if (index < 0 && !name.isEmpty()) {
        // A typed path or host:port stays in the list for the session.
        cboPortItems.append(PortEntry{name, {}});
        index = int(cboPortItems.size()) - 1;
    }
    cboPort.value = index;
    cboPort.text = name;
}

// ---------------------------------------------------------------------------
// Settings

QVariant ccForm1_engine::infoCell(int row) const
{
    if (!m_info)
        return {};
    return m_info->cell(row, kInfoField);
}

void ccForm1_engine::setInfoCell(int row, const QVariant& value)
{
    if (m_info)
        m_info->setCell(row, kInfoField, value);
}

QString ccForm1_engine::composedSettings() const
{
    const QString parity = cboParity.text.trimmed();
    return cboSpeed.text.trimmed() + QLatin1Char(',') + parity.left(1).toLower() + QLatin1Char(',')
        + cboDataBits.text.trimmed() + QLatin1Char(',') + cboStopBits.text.trimmed();
}

void ccForm1_engine::LoadPropertySettings()
{
    Procedure p(*this);
    cboPortItems = availablePorts();
    cboSpeedItems = QStringList{"110",   "300",   "600",   "1200",  "2400",   "4800",
                                "9600",  "14400", "19200", "28800", "38400",  "56000",
                                "57600", "115200", "128000", "256000"};
    cboDataBitsItems = QStringList{"4", "5", "6", "7", "8"};
    cboDataBits.toolTip = QStringLiteral("Number of data bits (must be 8)");
    // The box keeps its list sorted.
    cboParityItems = QStringList{"Even", "Mark", "None", "Odd", "Space"};
    cboStopBitsItems = QStringList{"1", "1.5", "2"};

    // Each row that is empty or unreadable gets the form's own default,
    // written back: a new instrument does not inherit the port of the last one.
    // Row 2: the port settings text.
    const QString text = infoCell(RowSettings).toString().trimmed();
    std::optional<LineSettings> ls = LineSettings::parse(text);
    if (!ls) {
        ls = LineSettings::parse(kDefaultSettings);
        setInfoCell(RowSettings, kDefaultSettings);
    }
    int speedIndex = int(cboSpeedItems.indexOf(QString::number(ls->baud)));
    if (speedIndex < 0)
        speedIndex = 6;
    cboSpeed.value = speedIndex;
    cboSpeed.text = cboSpeedItems[speedIndex];
    cboParity.text = parityName(ls->parity);
    cboParity.value = int(cboParityItems.indexOf(cboParity.text));
    cboDataBits.text = QString::number(ls->dataBits);
    cboDataBits.value = int(cboDataBitsItems.indexOf(cboDataBits.text));
    cboStopBits.text = ls->stopBits;
    cboStopBits.value = int(cboStopBitsItems.indexOf(cboStopBits.text));

    // Row 7: flow control.
    bool ok = false;
    int flow = infoCell(RowFlow).toInt(&ok);
    if (!ok || flow < 0 || flow > 3) {
        flow = 0;
        setInfoCell(RowFlow, flow);
    }
    for (int i = 0; i < 4; ++i)
        optFlow[i].value = i == flow;

    // Row 3: the port. A bare number is the port number of older files.
    QString port = infoCell(RowPort).toString().trimmed();
    bool numeric = false;
    const int number = port.toInt(&numeric);
    if (numeric && number > 0) {
#ifdef Q_OS_WIN
        port = QStringLiteral("COM%1").arg(number);
#else
        port = QStringLiteral("/dev/ttyS%1").arg(number - 1);
#endif
    }
    if (port.isEmpty()) {
        // Port 1: the first this machine has.
        port = cboPortItems.isEmpty() ? QStringLiteral("/dev/ttyS0") : cboPortItems.first().name;
        setInfoCell(RowPort, port);
    }
    selectPort(port);
    setCommPort(port);
    m_line->setSettings(*ls);
    m_line->setHandshaking(Handshaking(flow));

    // Rows 4 to 6: connection type, dial tone, modem text.
    int type = infoCell(RowType).toInt(&ok);
    if (!ok || (type != 0 && type != 1)) {
        type = 0;
        setInfoCell(RowType, 0);
    }
    applyConnectionType(type);
    int tone = infoCell(RowDialTone).toInt(&ok);
    if (!ok || (tone != 0 && tone != 1)) {
        tone = 0;
        setInfoCell(RowDialTone, 0);
    }
    DialTone[0].value = tone == 0;
    DialTone[1].value = tone == 1;
    modem.text = infoCell(RowModem).toString();

    cboSpeed_Click(speedIndex);
}

void ccForm1_engine::cboSpeed_Click(int listIndex)
{
    Procedure p(*this);
    cboSpeed.value = listIndex;
    cboSpeed.text = cboSpeedItems.value(listIndex);
    if (listIndex < 4 || listIndex >= 7) {
        say(QStringLiteral("Baud Rate to Slow"),
            {QStringLiteral("The baud rate must be between 2400 and 9600 inclusive.")});
        cboSpeed.value = 6;
        cboSpeed.text = cboSpeedItems.value(6);
        cmdOK_Click();
    }
    switch (cboSpeed.value.toInt()) {
    case 0:
    case 1:
    case 2: m_globals.speed_factor = 13; break;
    case 3: m_globals.speed_factor = 8; break;
    case 4: m_globals.speed_factor = 4; break;
    case 5: m_globals.speed_factor = 2; break;
    default: m_globals.speed_factor = 1; break;
    }
}

void ccForm1_engine::cboPort_Click(int listIndex)
{
    Procedure p(*this);
    if (listIndex < 0 || listIndex >= cboPortItems.size())
        return;
    cboPort.value = listIndex;
    cboPort.text = cboPortItems[listIndex].name;
}

void ccForm1_engine::cboPort_Change(const QString& text)
{
    Procedure p(*this);
    cboPort.text = text.trimmed();
    cboPort.value = -1;
    for (int i = 0; i < cboPortItems.size(); ++i)
        if (cboPortItems[i].name == cboPort.text)
            cboPort.value = i;
}

void ccForm1_engine::cboParity_Click(int listIndex)
{
    Procedure p(*this);
    cboParity.value = listIndex;
    cboParity.text = cboParityItems.value(listIndex);
}

void ccForm1_engine::cboDataBits_Click(int listIndex)
{
    Procedure p(*this);
    cboDataBits.value = listIndex;
    cboDataBits.text = cboDataBitsItems.value(listIndex);
}

void ccForm1_engine::cboStopBits_Click(int listIndex)
{
    Procedure p(*this);
    cboStopBits.value = listIndex;
    cboStopBits.text = cboStopBitsItems.value(listIndex);
}

void ccForm1_engine::optFlow_Click(int index)
{
    Procedure p(*this);
    for (int i = 0; i < 4; ++i)
        optFlow[i].value = i == index;
}

void ccForm1_engine::cmdOK_Click()
{
    Procedure p(*this);
    // 1. Another port: reopen on it if the old one was open.
    const QString chosen = cboPort.text.trimmed();
    if (!chosen.isEmpty() && chosen != m_commPort) {
        const bool wasOpen = portOpen();
        if (wasOpen) {
            closePort();
            m_globals.link_up = false;
        }
        const QString previous = m_commPort;
        QString error;
        if (!setCommPort(chosen, &error)) {
            say(QStringLiteral("Port Settings"), {error}, Operator::Icon::Exclamation);
            selectPort(m_commPort);
            return;
        }
        if (wasOpen) {
            if (!openPort(&error)) {
                const QString old = previous;
                setCommPort(old);
                selectPort(old);
                say(QStringLiteral("Port Settings"), {error}, Operator::Icon::Exclamation);
                return;
            }
            m_globals.link_up = true;
        }
    }

    // 2. The settings text.
    const QString text = composedSettings();
    const std::optional<LineSettings> ls = LineSettings::parse(text);
    QString error;
    if (!ls || !m_line->setSettings(*ls, &error)) {
        say(QStringLiteral("Port Settings"),
            {error.isEmpty() ? QStringLiteral("Invalid port settings: %1").arg(text) : error},
            Operator::Icon::Exclamation);
        return;
    }
    int flow = 0;
    for (int i = 0; i < 4; ++i)
        if (optFlow[i].value.toBool())
            flow = i;
    m_line->setHandshaking(Handshaking(flow));

    // 3. The workstation's settings store.
    m_settings.setValue(QStringLiteral("Settings"), text);
    m_settings.setValue(QStringLiteral("CommPort"), m_commPort);
    m_settings.setValue(QStringLiteral("Handshaking"), flow);
    m_settings.setValue(QStringLiteral("Echo"), false);

    // 4. The instrument's own rows.
    setInfoCell(RowSettings, text);
    setInfoCell(RowPort, m_commPort);
    setInfoCell(RowType, Option2[1].value.toBool() ? 1 : 0);
    setInfoCell(RowDialTone, DialTone[1].value.toBool() ? 1 : 0);
    setInfoCell(RowModem, modem.text);
    setInfoCell(RowFlow, flow);
}

void ccForm1_engine::applyConnectionType(int index)
{
    const bool direct = index == 1;
    Option2[0].value = !direct;
    Option2[1].value = direct;
    Frame9.enabled = direct;
    Frame8.enabled = !direct;
    FrameDial.visible = !direct;
    m_globals.reply_wait_ms = direct ? 4000 : 7000;
}

void ccForm1_engine::Option2_Click(int index)
{
    if (m_option2Busy)
        return;
    Procedure p(*this);
    if (Text3[2].text == kPortOpen || Text3[3].text == kPortOpen) {
        // The option springs back: the engine's values were never changed.
        say(QStringLiteral("Port Open"), {QStringLiteral("You must close the Port that is open"),
                                          QStringLiteral("before selecting a new connection type.")});
        return;
    }
    m_option2Busy = true;
    applyConnectionType(index);
    m_option2Busy = false;
    setInfoCell(RowType, index == 1 ? 1 : 0);
}

void ccForm1_engine::DialTone_Click(int index)
{
    Procedure p(*this);
    DialTone[0].value = index == 0;
    DialTone[1].value = index == 1;
    setInfoCell(RowDialTone, index);
}

void ccForm1_engine::modem_Change(const QString& text)
{
    Procedure p(*this);
    modem.text = text;
}

void ccForm1_engine::ModemSave_Click()
{
    Procedure p(*this);
    setInfoCell(RowModem, modem.text);
}

// ---------------------------------------------------------------------------
// Helpers

Operator::Answer ccForm1_engine::say(const QString& title, const QStringList& lines,
                                     Operator::Icon icon, Operator::Buttons buttons)
{
    // The box lets other events run: what they change must show, and their
    // procedures must report their own ends meanwhile.
    emit changed();
    const int depth = m_depth;
    m_depth = 0;
    const Operator::Answer a = m_op.message(title, lines, icon, buttons);
    m_depth = depth;
    return a;
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
    Procedure p(*this);
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

void ccForm1_engine::reply_do()
{
    Procedure p(*this);
    const auto has = [this](Token t) { return test3.contains(tokenText(t)); };
    OpenViews& v = m_views;

    if (has(Token::NoDialtone)) {
        cancel_dial_Click();
        say(QStringLiteral("No Dial Tone"), {QStringLiteral("There was no dial tone detected."),
                                             QStringLiteral("Make sure the phone line is connected")});
    } else if (has(Token::Busy)) {
        cancel_dial_Click();
        cmdOK.enabled = false;
        say(QStringLiteral("Busy"),
            {QStringLiteral("The number dialed is busy."),
             QStringLiteral("The program will hang up the phone and"),
             QStringLiteral("try again in 30 seconds after this message is acknowlaged."),
             QStringLiteral("To cancel Press Cancel Re-Dial")});
        // The count starts once the operator has acknowledged.
        Timer2.setEnabled(true);
        cancel_redial.enabled = true;
        ProgressBar1.visible = true;
    } else if (has(Token::NoCarrier)) {
        dialled = false;
        cancel_dial_Click();
        say(QStringLiteral("Busy"), {QStringLiteral("No carrier signal."),
                                     QStringLiteral("Check the modem at the other end.")});
    } else if (has(Token::Connect) && Text3[3].text == kPortOpen) {
        modemConnect();
        return;
    } else if (has(Token::Glacinor)) {
        identityReply();
        return;
    } else if (has(Token::Sret) && (v.channels_open || v.loadshed_open)) {
        if (v.channels_open) {
            if (v.channels)
                v.channels->ret_handel();
        } else if (v.loadshed) {
            v.loadshed->ret_handel();
        }
    } else if (has(Token::Schanupload)) {
        if (v.channels_open && v.channels)
            v.channels->sin_chan_up_load();
    } else if (has(Token::Downcheck)) {
        if (v.channels_open && v.channels)
            v.channels->down_check();
    } else if (has(Token::Donedown)) {
        if (v.channels_open && v.channels)
            v.channels->done_down();
    } else if (has(Token::Reset) && !connecting) {
        instrumentReset();
    } else if (has(Token::Dlres)) {
        say(QStringLiteral("Data Log Reset"), {QStringLiteral("The Data Log has been reset")});
        if (v.history)
            v.history->stopTimer3();
    } else if (has(Token::Histy)) {
        if (v.history_open && v.history)
            v.history->history_do();
    } else if (has(Token::Plres)) {
        say(QStringLiteral("Data Log Reset"),
            {QStringLiteral("The Power Used Data Log has been reset")});
        if (v.power)
            v.power->stopTimer3();
    } else if (has(Token::Power)) {
        if (v.power_open && v.power)
            v.power->power_do();
    } else if (has(Token::Status)) {
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
    } else if (has(Token::Presss)) {
        if (v.statusp_open) {
            if (v.statusp)
                v.statusp->statusp_do();
        } else if (v.statuspg_open) {
            if (v.statuspg)
                v.statuspg->statuspg_do();
        }
    } else if (has(Token::Torvan)) {
        if (m_globals.versionNumber() >= 8 && v.statusp_open && v.statusp)
            v.statusp->statuspa_do();
    } else if (has(Token::Realarms)) {
        if (v.alarm)
            v.alarm->stopTimer2();
        say(QStringLiteral("Alarm Log Reset"),
            {QStringLiteral("The Alarm or Alarms have been reset"),
             QStringLiteral("Check current status or reload alarms for verification.")});
    } else if (has(Token::Noalarms)) {
        if (v.alarm)
            v.alarm->stopTimer2();
        say(QStringLiteral("No Alarms"), {QStringLiteral("There were no alarms logged to reset")});
    } else if (has(Token::Almlog)) {
        if (v.alarm_open && v.alarm)
            v.alarm->alarm_do(test3);
    } else if (has(Token::AlmNew)) {
        newAlarm();
    } else if (has(Token::Nocomp)) {
        noComputerLink();
        return;
    } else if (has(Token::Tempfront)) {
        // A closed front panel leaves the text in the buffer.
        if (!v.front_open || !v.front)
            return;
        v.front->Front_do(test3);
    } else if (has(Token::Dxstart)) {
        if (!v.brumalet_open || !v.brumalet)
            return;
        v.brumalet->start_do(test3);
    } else if (has(Token::Evapfrst)) {
        if (!v.brumalet_open || !v.brumalet)
            return;
        v.brumalet->status_do(test3);
    } else {
        // No token yet: the text waits for the next arrival.
        return;
    }
    // Behind the parser: what it wrote is out, whatever arrived meanwhile is dropped.
    emptyBuffer();
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

// ---------------------------------------------------------------------------
// Direct line

void ccForm1_engine::Command3_Click()
{
    Procedure p(*this);
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
    Procedure p(*this);
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
    Procedure p(*this);
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
    Procedure p(*this);
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
    Procedure p(*this);
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
    Procedure p(*this);
    Timer2.stop();
    ProgressBar1.visible = false;
    cancel_redial.enabled = false;
    cmdOK.enabled = true;
    Timer8.stop();
}

void ccForm1_engine::ModemGet_Click()
{
    Procedure p(*this);
    modem_test = true;
    modem_text = modem.text;
    if (!portOpen()) {
        QString error;
        if (!openPort(&error)) {
            modem_test = false;
            say(QStringLiteral("Invalid Port"), {QStringLiteral("Invalid port number,"),
                                                 QStringLiteral("Choose a different port number,"), error});
            return;
        }
        m_globals.link_up = true;
    }
    Output(commands::modemAskModulation());
    Timer6.setInterval(3000);
    Timer6.setEnabled(true);
}

void ccForm1_engine::ModemTest_Click()
{
    Procedure p(*this);
    if (Timer6.Enabled()) {
        Timer6.stop();
        emptyBuffer();
        modem.text = modem_text;
    }
    modem_test = true;
    modem_text = modem.text;
    if (!portOpen()) {
        QString error;
        if (!openPort(&error)) {
            modem_test = false;
            say(QStringLiteral("Invalid Port"), {QStringLiteral("Invalid port number,"),
                                                 QStringLiteral("Choose a different port number,"), error});
            return;
        }
        m_globals.link_up = true;
    }
    Output(commands::modemCommand(modem.text));
    modem.text.clear();
    Timer6.setInterval(3000);
    Timer6.setEnabled(true);
}

// ---------------------------------------------------------------------------
// Timers

void ccForm1_engine::Timer1_Timer()
{
    Procedure p(*this);
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
    Procedure p(*this);
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
    Procedure p(*this);
    sbrStatus[1].text = QStringLiteral("Status: ");
    Timer3.stop();
}

void ccForm1_engine::Timer4_Timer()
{
    Procedure p(*this);
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
    Procedure p(*this);
    Timer5.stop();
    cancel_dial_Click();
}

void ccForm1_engine::Timer6_Timer()
{
    Procedure p(*this);
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
    Procedure p(*this);
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
    Procedure p(*this);
    dbase_error.stop();
    if (m_views.shell)
        m_views.shell->mnualloff_Click();
}
