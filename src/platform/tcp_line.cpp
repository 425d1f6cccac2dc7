#include "platform/tcp_line.h"

#include <QRegularExpression>

TcpLine::TcpLine(QObject* parent) : Line(parent)
{
    connect(&m_socket, &QTcpSocket::readyRead, this, &TcpLine::onReadyRead);
    connect(&m_socket, &QTcpSocket::disconnected, this, &TcpLine::onDisconnected);
}

TcpLine::~TcpLine()
{
    m_socket.disconnect(this);
    m_socket.abort();
}

bool TcpLine::splitAddress(const QString& name, QString* host, quint16* port)
{
    // A host holds no slashes or spaces (those are paths); a bare IPv6
    // address must be bracketed so that its last colon is not taken for
    // the port.
    static const QRegularExpression re(
        QStringLiteral(R"(^(?:\[([0-9A-Fa-f:.]+)\]|([^\s:/\\\[\]]+)):(\d{1,5})$)"));
    const QRegularExpressionMatch m = re.match(name.trimmed());
    if (!m.hasMatch())
        return false;
    const int p = m.captured(3).toInt();
    if (p < 1 || p > 65535)
        return false;
    if (host)
        *host = m.captured(1).isEmpty() ? m.captured(2) : m.captured(1);
    if (port)
        *port = quint16(p);
    return true;
}

bool TcpLine::looksLikeTcp(const QString& name)
{
    return splitAddress(name, nullptr, nullptr);
}

bool TcpLine::setSettings(const LineSettings& settings, QString*)
{
    m_settings = settings;
    return true;
}

bool TcpLine::open(QString* error)
{
    if (isOpen())
        return true;
    QString host;
    quint16 port = 0;
    if (!splitAddress(m_portName, &host, &port)) {
        if (error)
            *error = tr("Not a host:port address: %1").arg(m_portName);
        return false;
    }
    m_socket.abort();
    m_socket.connectToHost(host, port);
    if (m_socket.waitForConnected(ConnectTimeoutMs)) {
        // Commands are a few bytes each; do not hold them back.
        m_socket.setSocketOption(QAbstractSocket::LowDelayOption, 1);
        return true;
    }
    if (error) {
        switch (m_socket.error()) {
        case QAbstractSocket::ConnectionRefusedError:
            *error = tr("Connection refused by %1").arg(m_portName);
            break;
        case QAbstractSocket::HostNotFoundError:
            *error = tr("Host not found: %1").arg(host);
            break;
        case QAbstractSocket::SocketTimeoutError:
            *error = tr("No answer from %1 within %2 seconds")
                         .arg(m_portName)
                         .arg(ConnectTimeoutMs / 1000);
            break;
        default:
            *error = tr("Cannot connect to %1: %2").arg(m_portName, m_socket.errorString());
            break;
        }
    }
    m_socket.abort();
    return false;
}

void TcpLine::close()
{
    ++m_closes;
    m_closing = true;
    m_socket.abort();
    m_closing = false;
}

bool TcpLine::isOpen() const
{
    return m_socket.state() == QAbstractSocket::ConnectedState;
}

bool TcpLine::write(const QByteArray& bytes)
{
    if (!isOpen())
        return false;
    if (m_socket.write(bytes) != bytes.size())
        return false;
    m_socket.flush();
    m_wroteSinceArrival = true;
    return true;
}

void TcpLine::discardInput()
{
    // As on a serial line: once something was written since the last
    // arrival, what waits is the answer to it and stays. A closed socket has
    // nothing to give (and Qt warns about the read).
    if (!m_wroteSinceArrival && m_socket.isOpen())
        m_socket.readAll();
}

void TcpLine::onReadyRead()
{
    // From the event loop, as on a serial line: the socket does not signal
    // again while its signal runs.
    if (m_deliveryQueued)
        return;
    m_deliveryQueued = true;
    QMetaObject::invokeMethod(this, &TcpLine::deliverArrived, Qt::QueuedConnection);
}

void TcpLine::deliverArrived()
{
    m_deliveryQueued = false;
    m_wroteSinceArrival = false;
    const QByteArray bytes = m_socket.readAll();
    if (!bytes.isEmpty())
        emit received(bytes);
}

void TcpLine::onDisconnected()
{
    if (m_closing)
        return;
    // The last reply before the hang-up still belongs to the instrument; it
    // may itself end the link, and then nothing more is to be reported.
    const int closes = m_closes;
    deliverArrived();
    if (m_closes != closes)
        return;
    close();
    emit lineEvent(LineLost);
}
