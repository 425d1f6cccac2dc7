#pragma once

#include "platform/line.h"

#include <QTcpSocket>

// The line over TCP: a serial device server or the simulator, named
// "host:port" ("[::1]:4001" for IPv6). Settings, handshaking and DTR are
// kept for the form but do not reach the wire; the server owns the real
// port. The far end closing the connection is the line going away: the
// line closes and reports LineLost.
class TcpLine : public Line {
    Q_OBJECT
public:
    explicit TcpLine(QObject* parent = nullptr);
    ~TcpLine() override;

    // host:port with a port of 1 to 65535; "COM3" and paths are not.
    static bool looksLikeTcp(const QString& name);
    // Splits host:port; false when the name does not look like TCP.
    static bool splitAddress(const QString& name, QString* host, quint16* port);

    void setPortName(const QString& name) override { m_portName = name; }
    QString portName() const override { return m_portName; }
    bool setSettings(const LineSettings& settings, QString* error = nullptr) override;
    LineSettings settings() const override { return m_settings; }
    void setHandshaking(Handshaking h) override { m_handshaking = h; }
    Handshaking handshaking() const { return m_handshaking; }

    // Connects and waits up to ConnectTimeoutMs, so that opening is as
    // immediate as on a serial port.
    bool open(QString* error = nullptr) override;
    void close() override;
    bool isOpen() const override;

    bool write(const QByteArray& bytes) override;
    // Drops what the socket holds; bytes still in transit arrive later, as
    // they would a moment after the discard on a serial line.
    void discardInput() override;

    void setDtr(bool on) override { m_dtr = on; }
    bool dtr() const override { return m_dtr; }

    static constexpr int ConnectTimeoutMs = 3000;

private:
    void onReadyRead();
    void deliverArrived();
    void onDisconnected();

    QTcpSocket m_socket;
    QString m_portName;
    LineSettings m_settings;
    Handshaking m_handshaking = Handshaking::None;
    bool m_dtr = true;
    bool m_closing = false;
    bool m_wroteSinceArrival = false;
    bool m_deliveryQueued = false;
    int m_closes = 0;
};
