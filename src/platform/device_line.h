#pragma once

#include "platform/line.h"

class QIODevice;

// What every line over a QIODevice does alike: keeps the form's settings,
// writes at once, hands arrivals on from the event loop, discards input by
// one rule, and turns a vanished device into LineLost.
//
// Arrivals are delivered from the event loop rather than from inside the
// device's readyRead: the device does not signal again while its signal
// runs, so bytes arriving while the receiver stands in a message box would
// wait unseen and be discarded behind the box.
//
// Settings, handshaking and DTR are only kept here; a line whose device
// takes them (a serial port) applies them itself.
class DeviceLine : public Line {
    Q_OBJECT
public:
    void setPortName(const QString& name) override { m_portName = name; }
    QString portName() const override { return m_portName; }
    bool setSettings(const LineSettings& settings, QString* error = nullptr) override;
    LineSettings settings() const override { return m_settings; }
    void setHandshaking(Handshaking h) override { m_handshaking = h; }
    Handshaking handshaking() const { return m_handshaking; }
    void setDtr(bool on) override { m_dtr = on; }
    bool dtr() const override { return m_dtr; }

    // Our own close is not an event.
    void close() final;
    bool write(const QByteArray& bytes) final;
    // What the program holds and what waits below it goes, unless something
    // was written since the last arrival: then it can only be the answer to
    // that write. On a real line no answer comes back within the moment
    // between a write and the discard behind it, but a pseudo-terminal or a
    // serial server answers at once, and that answer must stay.
    void discardInput() final;

protected:
    using Line::Line;
    // The subclass's device, once it is constructed.
    void setDevice(QIODevice& device);

    // Closes the device; harmless when it is closed.
    virtual void closeDevice() = 0;
    // Pushes written bytes out now, as the communications control's Output does.
    virtual void flushOutput() = 0;
    // Drops what waits below the device's own buffer (a serial driver's queue).
    virtual void dropWaitingInput() {}

    // Hands on what has arrived.
    void deliverArrived();
    // The device went away under the open line: what came before the loss
    // is still the instrument's; unless the receiver has ended the link on
    // it, the line closes and reports LineLost.
    void deviceLost();
    // A write the device could not complete (event 1010).
    void writeFailed() { emit lineEvent(TransmitFull); }

    QString m_portName;
    LineSettings m_settings;
    Handshaking m_handshaking = Handshaking::None;
    // The communications control starts with DTR enabled, and a modem needs
    // it to listen.
    bool m_dtr = true;

private:
    void onReadyRead();

    QIODevice* m_device = nullptr;
    bool m_wroteSinceArrival = false;
    bool m_deliveryQueued = false;
    bool m_closing = false;
    int m_closes = 0;
};
