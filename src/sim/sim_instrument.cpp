#include "sim/sim_instrument.h"

namespace sim {

namespace {
constexpr char Eot = 4;

bool hasTwoByteKeys(double version)
{
    for (double v : {8.9, 9.1, 9.6, 9.8})
        if (qFuzzyCompare(version, v))
            return true;
    return false;
}
} // namespace

Instrument::Instrument(const Options& options, const Settings& settings, QObject* parent)
    : QObject(parent), m_state(options), m_settings(settings),
      m_out([this](const QByteArray& bytes) { emit transmit(bytes); })
{
}

void Instrument::start()
{
    // Its modem hears the greeting; on a direct line the workstation does.
    if (!m_settings.modem || m_modem == ModemState::Online)
        send("AT&FE0");
}

void Instrument::reset()
{
    m_state.countReset();
    m_parse = Parse::Start;
    m_body.clear();
    m_channelCursor = 0;
    m_pendingWrite.reset();
    m_pendingDownload.reset();
    m_chain = LogKind::None;
    m_chainRecords.clear();
    m_out.clear();
    start();
}

void Instrument::dropLine(int deafMs)
{
    if (m_settings.modem) {
        if (m_modem != ModemState::Command) {
            m_modem = ModemState::Command;
            modemSay("NO CARRIER");
        }
    } else {
        m_deafUntil = m_now + deafMs;
    }
    emit lineDropped();
}

bool Instrument::lineUp() const
{
    return !m_settings.modem || m_modem == ModemState::Online;
}

void Instrument::advance(qint64 realMs)
{
    m_now += realMs;
    m_plantCarry += realMs * m_settings.speed;
    const qint64 plantMs = qint64(m_plantCarry);
    m_plantCarry -= plantMs;
    m_state.advance(plantMs);

    if (m_escapeAt >= 0 && m_now >= m_escapeAt) {
        m_escapeAt = -1;
        m_plus = 0;
        m_modem = ModemState::OnlineCommand;
        modemSay("OK");
    }
    if (m_state.takeNewAlarm() && !m_faults.nocomp)
        m_out.unasked("alm-new", m_now);
    pump();
}

void Instrument::pump()
{
    // Behind a modem without a call nothing of the instrument gets through.
    if (!lineUp()) {
        m_out.clear();
        return;
    }
    // Never in the middle of a command or of a log upload.
    const bool idle = m_parse == Parse::Start && m_chain == LogKind::None;
    m_out.quietMs = m_settings.quietMs;
    m_out.pump(m_now, idle, m_faults.batchBytes, m_faults.batchGapMs);
}

void Instrument::send(const QByteArray& bytes)
{
    if (bytes.isEmpty() || !lineUp())
        return;
    m_out.reply(bytes, m_now, m_faults.delayMs);
    pump();
}

void Instrument::receive(const QByteArray& bytes)
{
    if (m_deafUntil >= 0 && m_now < m_deafUntil)
        return;
    m_out.heard(m_now);
    if (m_settings.modem)
        modemBytes(bytes);
    else
        for (char c : bytes)
            instrumentByte(c);
    pump();
}

// ---------------------------------------------------------------- modem

void Instrument::modemSay(const QByteArray& text)
{
    // A result code goes out whatever the call's state.
    emit transmit("\r\n" + text + "\r\n");
}

void Instrument::modemBytes(const QByteArray& bytes)
{
    const qint64 silence = m_now - m_lastRx;
    m_lastRx = m_now;
    if (m_modem != ModemState::Online) {
        for (char c : bytes) {
            if (c == '\r') {
                modemLine(m_modemLine.trimmed());
                m_modemLine.clear();
            } else if (c != '\n') {
                m_modemLine += c;
            }
        }
        return;
    }
    // Escape: a guard time of silence, "+++", and a guard time again.
    QByteArray data = bytes;
    if (m_plus > 0 || (silence >= m_settings.guardMs && data.startsWith('+'))) {
        int i = 0;
        while (i < data.size() && data[i] == '+' && m_plus < 3)
            ++m_plus, ++i;
        if (i == data.size()) {
            m_escapeAt = m_plus == 3 ? m_now + m_settings.guardMs : -1;
            return;
        }
        // Not an escape after all: the plus signs were data.
        data = QByteArray(m_plus, '+') + data.mid(i);
        m_plus = 0;
        m_escapeAt = -1;
    }
    for (char c : data)
        instrumentByte(c);
}

void Instrument::modemLine(const QByteArray& raw)
{
    // Whatever stands before the attention code is noise to the modem.
    const int at = int(raw.toUpper().indexOf("AT"));
    if (at < 0)
        return;
    const QByteArray line = raw.mid(at).toUpper();
    if (line.contains("X4"))
        m_x4 = true;
    else if (line.contains("X0"))
        m_x4 = false;
    // The dial command: "DT" or "DP", or "D" and a digit (not "&D2", which
    // the operator's modem text may hold).
    int d = int(line.indexOf("DT", 2));
    if (d < 0)
        d = int(line.indexOf("DP", 2));
    for (int i = 2; d < 0 && i + 1 < line.size(); ++i)
        if (line[i] == 'D' && line[i - 1] != '&' && QChar::fromLatin1(line[i + 1]).isDigit())
            d = i;
    if (d >= 0 && m_modem == ModemState::Command) {
        QByteArray result = m_faults.dial.isEmpty() ? QByteArray("CONNECT")
                                                    : m_faults.dial.value(qMin(m_dials, int(m_faults.dial.size()) - 1));
        ++m_dials;
        // Without X4 the modem neither hears the dial tone nor the busy tone.
        if (!m_x4 && (result == "BUSY" || result == "NO DIALTONE"))
            result = "NO CARRIER";
        if (result == "CONNECT") {
            m_modem = ModemState::Online;
            m_lastRx = m_now;
            m_parse = Parse::Start;
            m_body.clear();
            modemSay("CONNECT 9600");
        } else {
            modemSay(result);
        }
        return;
    }
    if (line.startsWith("ATH")) {
        m_modem = ModemState::Command;
        modemSay("OK");
        return;
    }
    if (line.startsWith("ATO") && m_modem == ModemState::OnlineCommand) {
        m_modem = ModemState::Online;
        m_lastRx = m_now;
        modemSay("CONNECT 9600");
        return;
    }
    if (line == "AT+MS?") {
        emit transmit("\r\n+MS: 11,1,300,9600,300,9600\r\n");
        modemSay("OK");
        return;
    }
    modemSay("OK");
}

// ----------------------------------------------------------- instrument

void Instrument::instrumentByte(char ch)
{
    const auto c = static_cast<unsigned char>(ch);
    switch (m_parse) {
    case Parse::KeyCode:
        // Key codes "1" to "?" are the indexes 1 to 15; anything else is 0.
        m_parse = Parse::Start;
        m_counts["key"]++;
        key(c >= '1' && c <= '?' ? c - '0' : 0);
        return;
    case Parse::Body:
        if (c == Eot) {
            m_parse = Parse::Start;
            command(m_body);
            m_body.clear();
        } else if (c == '\r' || c == '\n') {
            // No command holds a line end: this was meant for a modem.
            m_parse = Parse::Start;
            m_body.clear();
        } else {
            m_body += ch;
        }
        return;
    case Parse::Start:
        break;
    }
    if (c == 'Z')
        return; // the prefix means nothing
    if (c == Eot) {
        command(QByteArray());
        return;
    }
    // A version reads its keys in one form only: "g"/"h" and a key code, or
    // one byte from 164 on. The other form is noise to it.
    const bool twoByteKeys = hasTwoByteKeys(m_state.versionNumber());
    if (c >= 164 && c < 164 + 16 && !twoByteKeys) {
        m_counts["key"]++;
        key(c - 164);
        return;
    }
    switch (c) {
    case 'K':
    case 'X':
    case 'V':
    case 'e':
        single(char(c));
        return;
    case 'g':
    case 'h':
        if (twoByteKeys)
            m_parse = Parse::KeyCode;
        return;
    case 'C': case 'F': case 'T': case 't': case 'J': case 'c': case 'a': case 'd': case 'P':
    case 'D': case 'b': case 'E': case 'S': case 'U': case 'Q': case 's': case 'u': case 'q':
        m_parse = Parse::Body;
        m_body = QByteArray(1, ch);
        return;
    default:
        return; // noise
    }
}

bool Instrument::counted(const QByteArray& kind, const QHash<QByteArray, QSet<int>>& faults)
{
    const int n = m_seen.value(kind);
    const int any = m_seen.value("any");
    return faults.value(kind).contains(n) || faults.value("any").contains(any);
}

void Instrument::reply(const QByteArray& kind, const QByteArray& text)
{
    m_seen[kind]++;
    m_seen["any"]++;
    if (counted(kind, m_faults.drop))
        return;
    send(m_faults.nocomp ? QByteArray("nocomp") : text);
}

void Instrument::echo(const QByteArray& kind, QByteArray text)
{
    m_seen[kind]++;
    m_seen["any"]++;
    if (counted(kind, m_faults.drop))
        return;
    if (counted(kind, m_faults.garble)) {
        for (char& c : text)
            if (c >= '0' && c <= '9') {
                c = c == '9' ? '8' : char(c + 1);
                break;
            }
    }
    send(m_faults.nocomp ? QByteArray("nocomp") : text);
}

void Instrument::single(char letter)
{
    const QByteArray kind(1, letter);
    m_counts[kind]++;
    m_channelCursor = 0;
    switch (letter) {
    case 'K': {
        const QByteArray version = m_faults.wrongVersion.value_or(m_state.version());
        const int id = m_faults.wrongId.value_or(m_settings.id);
        reply(kind, identityReply(version, id, m_state.resets(), m_state.now()));
        break;
    }
    case 'X':
        if (m_pendingWrite)
            m_state.applyWrite(*m_pendingWrite);
        m_pendingWrite.reset();
        break;
    case 'V':
        // Whatever dialogue was under way is given up.
        m_pendingWrite.reset();
        m_pendingDownload.reset();
        m_chain = LogKind::None;
        m_chainRecords.clear();
        break;
    case 'e':
        if (m_pendingDownload) {
            const bool taken = takeDownloadRecord(m_state, *m_pendingDownload);
            m_pendingDownload.reset();
            if (taken)
                reply(kind, "donedown");
        }
        break;
    default:
        break;
    }
}

void Instrument::key(int index)
{
    m_channelCursor = 0;
    m_front.press(m_state, index);
    reply("key", frontReply(m_state, m_front));
}

void Instrument::command(const QByteArray& body)
{
    if (body.isEmpty()) {
        m_counts["EOT"]++;
        if (m_chain != LogKind::None)
            nextInChain();
        return;
    }
    const char letter = body[0];
    const QByteArray args = body.mid(1);
    const QByteArray kind = body == "CONNECTK" ? body : QByteArray(1, letter);
    m_counts[kind]++;
    // "c" walks the channels from the first; any other command ends the walk.
    if (letter != 'c')
        m_channelCursor = 0;
    // A new command ends an upload that was still under way.
    if (m_chain != LogKind::None && letter != 'D' && letter != 'b' && letter != 'S' && letter != 'U'
        && letter != 's' && letter != 'u')
        endChain();
    const double v = m_state.versionNumber();
    switch (letter) {
    case 'C':
        if (body == "CONNECTK") {
            const QByteArray version = m_faults.wrongVersion.value_or(m_state.version());
            const int id = m_faults.wrongId.value_or(m_settings.id);
            reply(kind, identityReply(version, id, m_state.resets(), m_state.now()));
        }
        return;
    case 'F':
        reply(kind, statusReply(m_state));
        return;
    case 'T':
        reply(kind, pressureReply(m_state));
        return;
    case 't':
        if (v >= 8)
            reply(kind, torvanelReply(m_state));
        return;
    case 'J':
        brumaletRequest(kind, args);
        return;
    case 'c':
        reply(kind, channelRecord(m_state, m_channelCursor));
        m_channelCursor = (m_channelCursor + 1) % Channels;
        return;
    case 'a': {
        bool ok = false;
        const int wire = args.left(args.indexOf(',')).toInt(&ok);
        if (ok && wire >= 0 && wire < Channels)
            reply(kind, channelRecord(m_state, wire));
        return;
    }
    case 'd':
        m_pendingDownload = args;
        echo(kind, args + "downcheck");
        return;
    case 'P':
        writeRequest(kind, args);
        return;
    default:
        logCommand(letter, kind);
        return;
    }
}

void Instrument::brumaletRequest(const QByteArray& kind, const QByteArray& args)
{
    bool ok = false;
    const int channel = args.toInt(&ok);
    if (!ok)
        return;
    reply(kind, brumaletStartReply(channel));
    // The reading takes its time and then goes out like an unasked
    // message: it holds back no other reply.
    if (!m_faults.nocomp)
        m_out.unasked(brumaletReply(m_state, channel), m_now, m_settings.brumaletDelayMs);
}

void Instrument::writeRequest(const QByteArray& kind, const QByteArray& args)
{
    QByteArray parts = args;
    if (parts.endsWith(','))
        parts.chop(1);
    // What the instrument cannot hold it does not echo: the sender's
    // wait runs out and it breaks the dialogue off.
    m_pendingWrite.reset();
    if (!m_state.acceptsWrite(parts.split(',')))
        return;
    m_pendingWrite = parts.split(',');
    echo(kind, parts + ",sret");
}

// The logs: uploads of the alarm, data and power logs, and their clearing.
void Instrument::logCommand(char letter, const QByteArray& kind)
{
    switch (letter) {
    case 'D':
    case 'b':
        startChain(LogKind::Alarm, letter == 'b');
        return;
    case 'S':
    case 'U':
        startChain(LogKind::History, letter == 'U');
        return;
    case 's':
    case 'u':
        startChain(LogKind::Power, letter == 'u');
        return;
    case 'E':
        reply(kind, m_state.clearAlarms() ? "realarms" : "noalarms");
        return;
    case 'Q':
        m_state.history.clear();
        reply(kind, "dlres");
        return;
    case 'q':
        m_state.power.clear();
        reply(kind, "plres");
        return;
    default:
        return;
    }
}

void Instrument::startChain(LogKind kind, bool onlyNew)
{
    m_chain = LogKind::None;
    m_chainRecords.clear();
    m_chainPos = 0;
    QByteArray token, letter;
    // extra: records sent in front of the log's own; announcedLess: how
    // many fewer the count announces than are sent.
    auto take = [&](auto& log, auto encode, int extra = 0, int announcedLess = 0) {
        const int from = onlyNew ? log.firstNew : 0;
        const int sent = int(log.records.size()) - from + extra;
        const int count = qMax(0, sent - announcedLess);
        if (extra)
            m_chainRecords << zeroHistoryRecord(count, sent > 1);
        for (int i = from; i < log.records.size(); ++i)
            m_chainRecords << encode(log.records[i], count, i + 1 < log.records.size());
        m_chainEnd = log.dropped + log.records.size();
    };
    switch (kind) {
    case LogKind::Alarm:
        take(m_state.alarms, alarmRecord);
        token = "almlog", letter = onlyNew ? "b" : "D";
        break;
    case LogKind::History:
        take(m_state.history, historyRecord, m_state.quirks.zeroRecord ? 1 : 0, m_state.quirks.uncounted);
        token = "histy", letter = onlyNew ? "U" : "S";
        break;
    case LogKind::Power:
        take(m_state.power, powerRecord);
        token = "power", letter = onlyNew ? "u" : "s";
        break;
    case LogKind::None:
        return;
    }
    if (m_chainRecords.isEmpty()) {
        reply(letter, noDataReply(token));
        return;
    }
    m_chain = kind;
    reply(letter, m_chainRecords.first());
    if (m_chainRecords.size() == 1)
        endChain();
}

void Instrument::nextInChain()
{
    ++m_chainPos;
    if (m_chainPos >= m_chainRecords.size()) {
        endChain();
        return;
    }
    reply("EOT", m_chainRecords[m_chainPos]);
    if (m_chainPos + 1 == m_chainRecords.size())
        endChain();
}

void Instrument::endChain()
{
    // The last record has gone out: what was sent is no longer new.
    const bool complete = m_chainPos + 1 >= m_chainRecords.size();
    if (complete) {
        switch (m_chain) {
        case LogKind::Alarm: m_state.alarms.markSent(m_chainEnd); break;
        case LogKind::History: m_state.history.markSent(m_chainEnd); break;
        case LogKind::Power: m_state.power.markSent(m_chainEnd); break;
        case LogKind::None: break;
        }
    }
    m_chain = LogKind::None;
    m_chainRecords.clear();
    m_chainPos = 0;
}

} // namespace sim
