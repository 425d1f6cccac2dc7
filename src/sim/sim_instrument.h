#pragma once

#include "sim/sim_outbox.h"
#include "sim/sim_replies.h"
#include "sim/sim_state.h"

#include <QByteArray>
#include <QHash>
#include <QList>
#include <QObject>
#include <QSet>

#include <optional>

namespace sim {

// What can be made to go wrong, from a scenario file or the control channel.
struct Faults {
    // Command kind ("F", "P", "CONNECTK", "EOT", "any", ...) -> the ordinal
    // numbers (from 1) of the commands of that kind whose reply is lost.
    QHash<QByteArray, QSet<int>> drop;
    // The same for echoes ("P", "d") that come back with a digit changed.
    QHash<QByteArray, QSet<int>> garble;
    int delayMs = 0;      // every reply waits this long
    int batchBytes = 0;   // replies go out in pieces of this size...
    int batchGapMs = 0;   // ...with this gap between them
    bool nocomp = false;  // the instrument has no computer link
    std::optional<int> wrongId;
    std::optional<QByteArray> wrongVersion;
    // Results of successive dials: "CONNECT", "BUSY", "NO CARRIER",
    // "NO DIALTONE". The last one stands for all later dials.
    QList<QByteArray> dial {"CONNECT"};
};

// Sets a fault or option from a "key = value" line; also the control
// channel's commands. Returns an error text, empty when understood.
class Instrument;
QString applyScenarioLine(Instrument& instrument, const QString& line);

// A whole Q-19 as seen from its serial line, optionally behind a Hayes
// modem. Bytes from the line go to receive(); replies leave by transmit().
// Time is given by advance() in real milliseconds; the plant runs speed
// times faster.
class Instrument : public QObject {
    Q_OBJECT
public:
    struct Settings {
        int id = 1;
        bool modem = false;
        double speed = 1;
        int brumaletDelayMs = 2500;
        int guardMs = 1000;
        // Silence the line keeps around an unasked message.
        int quietMs = 100;
    };

    Instrument(const Options& options, const Settings& settings, QObject* parent = nullptr);

    InstrumentState& state() { return m_state; }
    Faults& faults() { return m_faults; }
    Settings& settings() { return m_settings; }
    FrontPanel& frontPanel() { return m_front; }

    // The greeting of a start: "AT&FE0" to the modem or the line.
    void start();
    void receive(const QByteArray& bytes);
    void advance(qint64 realMs);
    // The real time (on advance()'s clock) at which a reply waiting for its
    // delay falls due; -1 when none is waiting.
    qint64 nextDue() const { return lineUp() ? m_out.nextDue() : -1; }
    // Restarts: counts a reset, forgets every dialogue, greets again.
    void reset();
    // Loses the line: the modem reports "NO CARRIER"; a direct line goes
    // deaf for the given time.
    void dropLine(int deafMs = 10000);
    bool modemOnline() const { return m_modem == ModemState::Online; }
    int commandCount(const QByteArray& kind) const { return m_counts.value(kind); }

signals:
    void transmit(const QByteArray& bytes);
    void lineDropped();

private:
    enum class ModemState { Command, Online, OnlineCommand };
    enum class Parse { Start, Body, KeyCode };
    enum class LogKind { None, Alarm, History, Power };

    void instrumentByte(char c);
    void command(const QByteArray& body);
    void brumaletRequest(const QByteArray& kind, const QByteArray& args);
    void writeRequest(const QByteArray& kind, const QByteArray& args);
    void logCommand(char letter, const QByteArray& kind);
    void key(int index);
    void single(char letter);
    void modemBytes(const QByteArray& bytes);
    void modemLine(const QByteArray& line);
    void modemSay(const QByteArray& text);
    void reply(const QByteArray& kind, const QByteArray& text);
    void echo(const QByteArray& kind, QByteArray text);
    void send(const QByteArray& bytes);
    void pump();
    bool lineUp() const;
    void startChain(LogKind kind, bool onlyNew);
    void nextInChain();
    void endChain();
    bool counted(const QByteArray& kind, const QHash<QByteArray, QSet<int>>& faults);

    InstrumentState m_state;
    Settings m_settings;
    Faults m_faults;
    FrontPanel m_front;

    qint64 m_now = 0;
    double m_plantCarry = 0;
    qint64 m_deafUntil = -1;
    Outbox m_out;

    Parse m_parse = Parse::Start;
    QByteArray m_body;
    QHash<QByteArray, int> m_counts;
    QHash<QByteArray, int> m_seen; // per kind, for drop and garble

    int m_channelCursor = 0;
    std::optional<QList<QByteArray>> m_pendingWrite;
    std::optional<QByteArray> m_pendingDownload;

    LogKind m_chain = LogKind::None;
    QList<QByteArray> m_chainRecords; // encoded when the upload is asked for
    int m_chainPos = 0;
    qint64 m_chainEnd = 0;

    ModemState m_modem = ModemState::Command;
    QByteArray m_modemLine;
    bool m_x4 = true;
    int m_dials = 0;
    qint64 m_lastRx = -1000000;
    int m_plus = 0;
    qint64 m_escapeAt = -1;
};

} // namespace sim
