#pragma once

#include "platform/device_line.h"

#include <QTcpSocket>

// The line over TCP: a serial device server or the simulator, named
// "host:port" ("[::1]:4001" for IPv6). Settings, handshaking and DTR are
// kept for the form but do not reach the wire; the server owns the real
// port. The far end closing the connection is the line going away: the
// line closes and reports LineLost.
class TcpLine : public DeviceLine {
    Q_OBJECT
public:
    explicit TcpLine(QObject* parent = nullptr);
    ~TcpLine() override;

    // host:port with a port of 1 to 65535; "COM3" and paths are not.
    static bool looksLikeTcp(const QString& name);
    // Splits host:port; false when the name does not look like TCP.
    static bool splitAddress(const QString& name, QString* host, quint16* port);

    // Connects and waits up to ConnectTimeoutMs, so that opening is as
    // immediate as on a serial port.
    bool open(QString* error = nullptr) override;
    bool isOpen() const override;

    static constexpr int ConnectTimeoutMs = 3000;

private:
    void closeDevice() override { m_socket.abort(); }
    void flushOutput() override { m_socket.flush(); }

    QTcpSocket m_socket;
};
