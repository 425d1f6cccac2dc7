#pragma once

#include "platform/device_line.h"

#include <QSerialPort>
#include <QTimer>

// The line over a serial device: /dev/ttyUSB0, /dev/ttyS0, a pseudo-terminal
// /dev/pts/N, or COM3 on Windows.
//
// Port errors become the event codes of the communications control: a
// write failure or time-out is 1010. Qt 6 no longer reports framing, parity
// or break conditions, so 1004, 1009 and 1001 do not occur here; the receive
// handler ignores those three anyway.
// A device that goes away under the open line (USB unplugged, pty master
// closed) closes the line and is reported as LineLost. Operations the device
// does not support (DTR on a pty, 1.5 stop bits) are not events, and on a
// pty, which has no wire, refused settings are not errors either.
//
// The port has no signal for its input pins, so while a real device is open
// they are read every 200 ms and changes of CTS, DSR and CD become events 3,
// 4 and 5, and a rising ring indicator event 6. Pseudo-terminals have no
// pins and are not polled.
class SerialLine : public DeviceLine {
    Q_OBJECT
public:
    explicit SerialLine(QObject* parent = nullptr);
    ~SerialLine() override;

    bool setSettings(const LineSettings& settings, QString* error = nullptr) override;
    void setHandshaking(Handshaking h) override;

    bool open(QString* error = nullptr) override;
    bool isOpen() const override { return m_port.isOpen(); }

    void setDtr(bool on) override;

    // True while the open device is a pseudo-terminal.
    bool isPseudoTerminal() const { return m_isPty; }

    static constexpr int PinPollMs = 200;

private:
    void closeDevice() override;
    void flushOutput() override { m_port.flush(); }
    void dropWaitingInput() override { m_port.clear(QSerialPort::Input); }
    void onError(QSerialPort::SerialPortError error);
    void pollPins();
    bool applySettings(QString* error);
    bool deviceGone() const;

    QSerialPort m_port;
    QTimer m_pinTimer;
    bool m_isPty = false;
    QSerialPort::PinoutSignals m_pins;
};
