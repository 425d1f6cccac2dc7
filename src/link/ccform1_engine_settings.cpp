// ccForm1's port settings: the settings boxes, the connection type and the
// instrument's info rows that keep them.
#include "link/ccform1_engine.h"

#include "link/ccform1_texts.h"
#include "platform/store.h"
#include "platform/store_layout.h"

using namespace ccform1;

namespace {

const QString kDefaultSettings = QStringLiteral("9600,n,8,1");

// Rows of the instrument's `info` table that hold the connection.
enum InfoRow {
    RowSettings = kInfoPortSettingsRow,
    RowPort = kInfoPortRow,
    RowType = kInfoConnectionTypeRow,
    RowDialTone = kInfoDialToneRow,
    RowModem = kInfoModemTextRow,
    RowFlow = kInfoFlowControlRow,
};

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
    return m_info->cell(row, kInfoConnectionColumn);
}

void ccForm1_engine::setInfoCell(int row, const QVariant& value)
{
    if (m_info)
        m_info->setCell(row, kInfoConnectionColumn, value);
}

QString ccForm1_engine::composedSettings() const
{
    const QString parity = cboParity.text.trimmed();
    return cboSpeed.text.trimmed() + QLatin1Char(',') + parity.left(1).toLower() + QLatin1Char(',')
        + cboDataBits.text.trimmed() + QLatin1Char(',') + cboStopBits.text.trimmed();
}

// Row 3: the port. A bare number is the port number of older files; an
// empty row gets port 1, the first this machine has.
QString ccForm1_engine::storedPort()
{
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
        port = cboPortItems.isEmpty() ? QStringLiteral("/dev/ttyS0") : cboPortItems.first().name;
        setInfoCell(RowPort, port);
    }
    return port;
}

void ccForm1_engine::LoadPropertySettings()
{
    const auto p = m_notify.procedure();
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

    const QString port = storedPort();
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

void ccForm1_engine::instrumentOpened()
{
    const auto p = m_notify.procedure();
    no_computer_link = false;
    LoadPropertySettings();
}

void ccForm1_engine::setDialAllowed(bool allowed)
{
    const auto p = m_notify.procedure();
    dial_num.enabled = allowed;
}

void ccForm1_engine::cboSpeed_Click(int listIndex)
{
    const auto p = m_notify.procedure();
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
    const auto p = m_notify.procedure();
    if (listIndex < 0 || listIndex >= cboPortItems.size())
        return;
    cboPort.value = listIndex;
    cboPort.text = cboPortItems[listIndex].name;
}

void ccForm1_engine::cboPort_Change(const QString& text)
{
    const auto p = m_notify.procedure();
    cboPort.text = text.trimmed();
    cboPort.value = -1;
    for (int i = 0; i < cboPortItems.size(); ++i)
        if (cboPortItems[i].name == cboPort.text)
            cboPort.value = i;
}

void ccForm1_engine::cboParity_Click(int listIndex)
{
    const auto p = m_notify.procedure();
    cboParity.value = listIndex;
    cboParity.text = cboParityItems.value(listIndex);
}

void ccForm1_engine::cboDataBits_Click(int listIndex)
{
    const auto p = m_notify.procedure();
    cboDataBits.value = listIndex;
    cboDataBits.text = cboDataBitsItems.value(listIndex);
}

void ccForm1_engine::cboStopBits_Click(int listIndex)
{
    const auto p = m_notify.procedure();
    cboStopBits.value = listIndex;
    cboStopBits.text = cboStopBitsItems.value(listIndex);
}

void ccForm1_engine::optFlow_Click(int index)
{
    const auto p = m_notify.procedure();
    for (int i = 0; i < 4; ++i)
        optFlow[i].value = i == index;
}

void ccForm1_engine::cmdOK_Click()
{
    const auto p = m_notify.procedure();
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
    const auto p = m_notify.procedure();
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
    const auto p = m_notify.procedure();
    DialTone[0].value = index == 0;
    DialTone[1].value = index == 1;
    setInfoCell(RowDialTone, index);
}

void ccForm1_engine::modem_Change(const QString& text)
{
    const auto p = m_notify.procedure();
    modem.text = text;
}

void ccForm1_engine::ModemSave_Click()
{
    const auto p = m_notify.procedure();
    setInfoCell(RowModem, modem.text);
}
