#pragma once

#include "platform/line.h"

#include <QProcess>
#include <functional>
#include <memory>

// The port "Simulator (built-in)": starts the instrument simulator as a child
// process on a pseudo-terminal and opens that terminal with the ordinary
// serial line, so that a demo goes through exactly the code a real
// instrument does. The simulator lives as long as this line object.
class BuiltinSimulatorLine : public Line {
    Q_OBJECT
public:
    static inline const QString PortName = QStringLiteral("Simulator (built-in)");

    // modemWanted says at each open whether the simulator is to sit behind a
    // modem (the operator chose the modem connection type).
    explicit BuiltinSimulatorLine(std::function<bool()> modemWanted = {}, QObject* parent = nullptr);
    ~BuiltinSimulatorLine() override;

    // Where the simulator program is: beside this program, or in the build tree.
    static QString simulatorProgram();

    void setPortName(const QString&) override {}
    QString portName() const override { return PortName; }
    bool setSettings(const LineSettings& settings, QString* error = nullptr) override;
    LineSettings settings() const override { return m_settings; }
    void setHandshaking(Handshaking h) override;

    bool open(QString* error = nullptr) override;
    void close() override;
    bool isOpen() const override;
    bool write(const QByteArray& bytes) override;
    void discardInput() override;
    void setDtr(bool on) override;
    bool dtr() const override { return m_dtr; }

    // The terminal the simulator serves on, while it runs.
    QString terminalPath() const { return m_terminal; }

private:
    bool startSimulator(QString* error);
    void stopSimulator();

    std::function<bool()> m_modemWanted;
    std::unique_ptr<QProcess> m_process;
    std::unique_ptr<Line> m_inner;
    QString m_terminal;
    bool m_withModem = false;
    LineSettings m_settings;
    Handshaking m_handshaking = Handshaking::None;
    bool m_dtr = false;
};
