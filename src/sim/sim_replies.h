#pragma once

#include "sim/sim_state.h"

#include <QByteArray>

namespace sim {

// The instrument's replies, each ending in its token and nothing behind it.

// 47 characters: version (7), ID (5), resets (5), date and time (22), "Glacinor".
QByteArray identityReply(const QByteArray& version, int id, int resets, const QDateTime& time);
QByteArray statusReply(const InstrumentState& s);
QByteArray pressureReply(const InstrumentState& s);
QByteArray torvanelReply(const InstrumentState& s);
// The record of one channel as "c" and "a" bring it, by the instrument's version.
QByteArray channelRecord(const InstrumentState& s, int wire);
// The values of a "d" record into the set point table. The record is the
// text behind "d", starting with the wire channel. False when it does not
// hold what the version expects for that channel.
bool takeDownloadRecord(InstrumentState& s, const QByteArray& record);

QByteArray alarmRecord(const AlarmRecord& a, int count, bool more);
QByteArray historyRecord(const HistoryRecord& h, int count, bool more);
// A data log record of zeros throughout: date, time and every channel.
QByteArray zeroHistoryRecord(int count, bool more);
QByteArray powerRecord(const PowerRecord& p, int count, bool more);
// What an empty log answers: "no data log" and the log's token.
QByteArray noDataReply(const QByteArray& token);

struct FrontPanel {
    int number = 6;  // panel number of the function shown, 1..119
    int channel = 1; // 1..216
    // Applies a key, index 0..15. 0 changes nothing and brings the panel.
    void press(InstrumentState& s, int key);
};
QByteArray frontReply(const InstrumentState& s, const FrontPanel& panel);
// The panel's name of a number, 16 characters.
QByteArray panelName(int number);

QByteArray brumaletStartReply(int channel);
QByteArray brumaletReply(const InstrumentState& s, int channel);

} // namespace sim
