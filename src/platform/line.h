#pragma once

#include <QByteArray>
#include <QObject>
#include <QString>
#include <optional>

// Port settings as the instrument's store keeps them: "9600,n,8,1".
struct LineSettings {
    int baud = 9600;
    QChar parity = QLatin1Char('n'); // e, m, n, o or s
    int dataBits = 8;
    QString stopBits = QStringLiteral("1"); // "1", "1.5" or "2"

    bool operator==(const LineSettings&) const = default;
    QString toText() const;
    // Cut from the end: stop bits behind the last comma (a "." means the
    // three-character form 1.5), then data bits, parity letter, speed.
    static std::optional<LineSettings> parse(const QString& text);
};

// Flow control, as the index of the option buttons: 0 None, 1 Xon/Xoff, 2 RTS, 3 Xon/RTS.
enum class Handshaking { None = 0, XonXoff = 1, Rts = 2, XonRts = 3 };

// The one line to the instrument or its modem. Bytes arrive through
// received(); the other things a serial port reports arrive through
// lineEvent() with the codes of the communications control, so that the
// receive handler is written once for every kind of line.
class Line : public QObject {
    Q_OBJECT
public:
    enum EventCode {
        Send = 1,
        Receive = 2,
        CtsChanged = 3,
        DsrChanged = 4,
        CdChanged = 5,
        Ring = 6,
        EndOfFile = 7,
        Break = 1001,
        CtsTimeout = 1002,
        DsrTimeout = 1003,
        Framing = 1004,
        Overrun = 1006,
        CdTimeout = 1007,
        ReceiveOverflow = 1008,
        Parity = 1009,
        TransmitFull = 1010,
        DcbError = 1011,
        // Not a code of the communications control: the device went away
        // under an open line (USB unplugged, pty master closed, the TCP peer
        // gone). The line is closed already when it is reported; the receive
        // handler ends the link as a hang-up does and keeps no error behind.
        LineLost = 9999,
    };
    Q_ENUM(EventCode)

    using QObject::QObject;
    ~Line() override = default;

    // What the port is: a device path, a COM name or host:port.
    virtual void setPortName(const QString& name) = 0;
    virtual QString portName() const = 0;
    // Applies at once when the line is open. False with the reason in *error.
    virtual bool setSettings(const LineSettings& settings, QString* error = nullptr) = 0;
    virtual LineSettings settings() const = 0;
    virtual void setHandshaking(Handshaking h) = 0;

    // PortOpen = True. False with a reason fit for the operator in *error.
    virtual bool open(QString* error = nullptr) = 0;
    // PortOpen = False. Harmless when closed.
    virtual void close() = 0;
    virtual bool isOpen() const = 0;

    // Output: writes the bytes at once. False when the line is closed or the
    // write failed; the bytes are then not sent.
    virtual bool write(const QByteArray& bytes) = 0;
    // InBufferCount = 0: drops what has arrived but has not been delivered.
    virtual void discardInput() = 0;

    // DTREnable. A pseudo-terminal refuses DTR; that is not an error.
    virtual void setDtr(bool on) = 0;
    virtual bool dtr() const = 0;

signals:
    // Event 2: a batch of bytes has arrived.
    void received(const QByteArray& bytes);
    // Every other event or error, with its code.
    void lineEvent(int code);
};
