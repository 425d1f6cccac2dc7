#pragma once

// The "status" reply (answer to "F"): fixed-width fields without separators,
// positions counted from 1. Read by frmstatus, frmstatusg and frmmultiprobes.

#include <QString>
#include <array>

// --- Helpers shared by every status layout ---------------------------------

namespace replyfield {

// Mid(text, pos, width) with pos counted from 1; empty past the end.
QString cut(const QString& reply, int pos, int width);
// The number a field reads as: blanks ignored anywhere, a sign, digits, one
// decimal point; reading stops at the first other character; empty is 0.
double val(const QString& text);
// A field turned into a number and back into text, so that " -1000" and
// "-1000 " both compare equal to "-1000" and an empty field becomes "0".
QString numberText(double value);
QString normalised(const QString& reply, int pos, int width = 6);
// A one-character flag: "1" means on.
bool flag(const QString& reply, int pos);
// Format(value, "#0.0") and Format(value, "#0"): halves round away from zero.
QString fixed1(double value);
QString fixed0(double value);

} // namespace replyfield

// Special values of a 6-wide field, compared as normalised text.
inline const QString kNotConnected = QStringLiteral("-1000");
inline const QString kOverRange = QStringLiteral("-1001");
inline const QString kNoSensor = QStringLiteral("-1002");
inline const QString kLoadShed = QStringLiteral("-1004");

// --- Layout ------------------------------------------------------------------

namespace status_layout {
constexpr int DateTimePos = 1;
constexpr int DateTimeWidth = 19;
constexpr int FieldWidth = 6;
constexpr int Channels = 200;       // channels with a value and an alarm flag
constexpr int OutputChannels = 100; // channels with outputs
constexpr int Suctions = 16;
constexpr int Pressures = 5;        // channels 196..200 as pressure boxes
constexpr int FirstPressureChannel = 196;

constexpr int valuePos(int n) { return 7 * n + 13; }      // n 1..200
constexpr int alarmPos(int n) { return 7 * n + 19; }      // n 1..200
constexpr int liquidPos(int n) { return 4 * n + 1416; }   // n 1..100
constexpr int fanPos(int n) { return 4 * n + 1417; }
constexpr int defrostPos(int n) { return 4 * n + 1418; }
constexpr int suctionOutPos(int n) { return 4 * n + 1419; }
constexpr int suctionPressurePos(int i) { return 6 * i + 1820; } // i 0..15
constexpr int pressureBoxPos(int k) { return 7 * k + 1385; }      // k 0..4
constexpr int pidPos(int n) { return 6 * n + 1910; }
constexpr int pidKind5Pos(int n) { return 6 * n + 2306; }
constexpr int fanKind5Pos(int n) { return 6 * n + 2498; }
// An associated channel m (zero-based, as the set point holds it) is read
// one place behind its own value field: the value of channel m + 1.
constexpr int assocValuePos(int m) { return 7 * m + 20; }

// Version gates.
constexpr double SuctionVersion = 8;
constexpr double PressureVersion = 8.8;
constexpr double PidVersion = 14;
} // namespace status_layout

struct StatusOutputs {
    bool liquid = false;
    bool fan = false;
    bool defrost = false;
    bool suction = false;
};

// One "status" reply cut into its fields. Numbers are kept as normalised
// text (see replyfield::normalised): the special values are compared on it.
struct StatusReply {
    QString dateTime;
    std::array<QString, status_layout::Channels + 1> value;    // [1..200]
    std::array<bool, status_layout::Channels + 1> alarm{};     // [1..200]
    std::array<StatusOutputs, status_layout::OutputChannels + 1> outputs{}; // [1..100]
    bool hasSuction = false;   // instrument version 8 or more
    std::array<QString, status_layout::Suctions> suction;
    bool hasPressures = false; // 8.8 or more
    std::array<QString, status_layout::Pressures> pressure;
    bool hasPid = false;       // 14 or more
    std::array<QString, status_layout::Channels + 1> pid;      // [1..200]
    std::array<QString, status_layout::Channels + 1> pidKind5; // [1..200]
    std::array<QString, status_layout::Channels + 1> fanKind5; // [1..200]
};

// version: the instrument's version as a number (0 when not known).
StatusReply decodeStatus(const QString& reply, double version);

// The value of an associated channel m (0..199) as the reply carries it.
QString assocValue(const QString& reply, int m);

// Words for a channel value in Temp and the assoc boxes: "Not Con",
// "Ovr Rge", "No Sen", "Ld Shd", else tenths as "#0.0".
QString channelValueText(const QString& normalised);
// TempP: "N-C", "O-R", else tenths as "#0.0" (-1002 and -1004 print as numbers).
QString pressureBoxText(const QString& normalised);
// suc: "N-C", "O-R", else the whole number as "#0".
QString suctionBoxText(const QString& normalised);
