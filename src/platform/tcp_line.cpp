#include "platform/tcp_line.h"

#include <QRegularExpression>

TcpLine::TcpLine(QObject* parent) : DeviceLine(parent)
{
    setDevice(m_socket);
    // The far end closing the connection is the line going away.
    connect(&m_socket, &QTcpSocket::disconnected, this, &TcpLine::deviceLost);
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

bool TcpLine::isOpen() const
{
    return m_socket.state() == QAbstractSocket::ConnectedState;
}
