#include "platform/serial_line.h"

#include <QFileInfo>

#ifdef Q_OS_UNIX
#include <poll.h>
#include <sys/stat.h>
#include <sys/sysmacros.h>
#include <unistd.h>
#endif

namespace {

// QSerialPort takes "ttyUSB0" as well as "/dev/ttyUSB0"; the messages show
// the path the operator would look for.
QString devicePath(const QString& name)
{
#ifdef Q_OS_UNIX
    if (!name.isEmpty() && !name.startsWith(QLatin1Char('/')))
        return QStringLiteral("/dev/") + name;
#endif
    return name;
}

bool isPseudoTerminalPath(const QString& path)
{
#ifdef Q_OS_LINUX
    const QString real = QFileInfo(path).canonicalFilePath();
    if (real.startsWith(QLatin1String("/dev/pts/")))
        return true;
    struct stat st {};
    if (::stat(QFile::encodeName(path).constData(), &st) != 0 || !S_ISCHR(st.st_mode))
        return false;
    // Unix98 pty slaves use majors 136 to 143.
    return major(st.st_rdev) >= 136 && major(st.st_rdev) <= 143;
#else
    Q_UNUSED(path);
    return false;
#endif
}

QSerialPort::Parity toParity(QChar letter)
{
    switch (letter.toLower().toLatin1()) {
    case 'e': return QSerialPort::EvenParity;
    case 'o': return QSerialPort::OddParity;
    case 'm': return QSerialPort::MarkParity;
    case 's': return QSerialPort::SpaceParity;
    default: return QSerialPort::NoParity;
    }
}

QSerialPort::StopBits toStopBits(const QString& stop)
{
    if (stop == QLatin1String("2"))
        return QSerialPort::TwoStop;
    if (stop == QLatin1String("1.5"))
        return QSerialPort::OneAndHalfStop;
    return QSerialPort::OneStop;
}

QSerialPort::FlowControl toFlow(Handshaking h)
{
    switch (h) {
    case Handshaking::XonXoff: return QSerialPort::SoftwareControl;
    // The port cannot do both at once; RTS/CTS is the one that protects
    // the receiver.
    case Handshaking::Rts:
    case Handshaking::XonRts: return QSerialPort::HardwareControl;
    case Handshaking::None: break;
    }
    return QSerialPort::NoFlowControl;
}

} // namespace

SerialLine::SerialLine(QObject* parent) : DeviceLine(parent)
{
    setDevice(m_port);
    m_pinTimer.setInterval(PinPollMs);
    connect(&m_port, &QSerialPort::errorOccurred, this, &SerialLine::onError);
    connect(&m_pinTimer, &QTimer::timeout, this, &SerialLine::pollPins);
}

SerialLine::~SerialLine()
{
    // Closing in the QSerialPort destructor would still signal into a
    // half-destroyed line.
    m_port.disconnect(this);
    close();
}

bool SerialLine::setSettings(const LineSettings& settings, QString* error)
{
    if (settings.dataBits < 5 || settings.dataBits > 8) {
        if (error)
            *error = tr("%1 data bits are not supported by this port").arg(settings.dataBits);
        return false;
    }
    m_settings = settings;
    return !isOpen() || applySettings(error);
}

void SerialLine::setHandshaking(Handshaking h)
{
    m_handshaking = h;
    if (isOpen())
        m_port.setFlowControl(toFlow(h));
}

bool SerialLine::applySettings(QString* error)
{
    // Each one on its own, so that a refused one does not keep the rest back.
    QString firstFailure;
    const auto apply = [&](bool done) {
        if (!done && firstFailure.isEmpty())
            firstFailure = m_port.errorString();
    };
    apply(m_port.setBaudRate(m_settings.baud));
    apply(m_port.setDataBits(QSerialPort::DataBits(m_settings.dataBits)));
    apply(m_port.setParity(toParity(m_settings.parity)));
    apply(m_port.setStopBits(toStopBits(m_settings.stopBits)));
    apply(m_port.setFlowControl(toFlow(m_handshaking)));
    const bool ok = firstFailure.isEmpty();
    // A pseudo-terminal has no wire: the kernel keeps it at 8 bits without
    // parity whatever is asked, so a refusal there changes nothing.
    if (!ok && m_isPty) {
        m_port.clearError();
        return true;
    }
    if (!ok && error)
        *error = tr("Cannot set %1 on %2: %3")
                     .arg(m_settings.toText(), devicePath(m_portName), firstFailure);
    return ok;
}

bool SerialLine::open(QString* error)
{
    if (isOpen())
        return true;
    const QString path = devicePath(m_portName);
    m_port.setPortName(m_portName);
    m_port.setBaudRate(m_settings.baud);
    m_port.setDataBits(QSerialPort::DataBits(m_settings.dataBits));
    m_port.setParity(toParity(m_settings.parity));
    m_port.setStopBits(toStopBits(m_settings.stopBits));
    m_port.setFlowControl(toFlow(m_handshaking));

    if (!m_port.open(QIODevice::ReadWrite)) {
        if (error) {
            switch (m_port.error()) {
            case QSerialPort::DeviceNotFoundError:
                *error = tr("No such port: %1").arg(path);
                break;
            case QSerialPort::PermissionError:
#ifdef Q_OS_UNIX
                // The port's lock file is taken before the device is looked
                // at, so a held lock reads as a permission error too.
                if (::access(QFile::encodeName(path).constData(), F_OK) != 0) {
                    *error = tr("No such port: %1").arg(path);
                    break;
                }
                if (::access(QFile::encodeName(path).constData(), R_OK | W_OK) == 0) {
                    *error = tr("Port %1 is in use by another program.").arg(path);
                    break;
                }
#endif
                *error = tr("Permission denied on %1: add your user to the dialout group "
                            "(sudo usermod -aG dialout $USER) and log in again.")
                             .arg(path);
                break;
            default:
                *error = tr("Cannot open %1: %2").arg(path, m_port.errorString());
                break;
            }
        }
        m_port.clearError();
        return false;
    }

    m_isPty = isPseudoTerminalPath(path);
    m_port.setDataTerminalReady(m_dtr);
    if (!m_isPty) {
        m_port.clearError();
        m_pins = m_port.pinoutSignals();
        if (m_port.error() == QSerialPort::NoError)
            m_pinTimer.start();
    }
    m_port.clearError();
    return true;
}

void SerialLine::closeDevice()
{
    m_pinTimer.stop();
    if (m_port.isOpen())
        m_port.close();
    m_port.clearError();
    m_isPty = false;
}

void SerialLine::setDtr(bool on)
{
    m_dtr = on;
    if (isOpen())
        m_port.setDataTerminalReady(on);
}

void SerialLine::onError(QSerialPort::SerialPortError error)
{
    switch (error) {
    case QSerialPort::ReadError:
        // A hang-up shows as a read of nothing, reported with whatever errno
        // was left over; ask the descriptor itself whether the device is gone.
        if (!isOpen() || !deviceGone())
            return;
        [[fallthrough]];
    case QSerialPort::ResourceError:
        // The port has stopped reading by now; the line is of no more use.
        if (isOpen())
            deviceLost();
        break;
    case QSerialPort::WriteError:
    case QSerialPort::TimeoutError:
        writeFailed();
        break;
    default:
        // Refused operations (DTR on a pty), read hiccups and the reset to
        // NoError are not events of the line.
        break;
    }
}

bool SerialLine::deviceGone() const
{
#ifdef Q_OS_UNIX
    pollfd p { int(m_port.handle()), POLLIN, 0 };
    if (::poll(&p, 1, 0) < 0)
        return true;
    return (p.revents & (POLLHUP | POLLERR | POLLNVAL)) != 0;
#else
    return m_port.error() == QSerialPort::ResourceError;
#endif
}

void SerialLine::pollPins()
{
    if (!isOpen()) {
        m_pinTimer.stop();
        return;
    }
    m_port.clearError();
    const QSerialPort::PinoutSignals now = m_port.pinoutSignals();
    if (m_port.error() != QSerialPort::NoError) {
        // The driver cannot report its pins; stop asking.
        m_pinTimer.stop();
        m_port.clearError();
        return;
    }
    const QSerialPort::PinoutSignals was = m_pins;
    m_pins = now;
    const auto changed = [&](QSerialPort::PinoutSignal s) { return bool(was & s) != bool(now & s); };
    if (changed(QSerialPort::ClearToSendSignal))
        emit lineEvent(CtsChanged);
    if (changed(QSerialPort::DataSetReadySignal))
        emit lineEvent(DsrChanged);
    if (changed(QSerialPort::DataCarrierDetectSignal))
        emit lineEvent(CdChanged);
    if ((now & QSerialPort::RingIndicatorSignal) && !(was & QSerialPort::RingIndicatorSignal))
        emit lineEvent(Ring);
}
