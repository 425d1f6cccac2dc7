#pragma once

#include "sim/sim_catalogue.h"
#include "sim/sim_logs.h"

#include <QByteArray>
#include <QDateTime>
#include <QList>
#include <QRandomGenerator>
#include <QVector>

#include <array>

namespace sim {

// The demo plant's inputs, by channel: rooms under control, sensors and
// pressure transducers. Every other channel is not connected.
inline bool isRoom(int channel) { return channel >= 1 && channel <= 30; }
inline bool isSensor(int channel) { return channel >= 101 && channel <= 110; }
inline bool isPressureInput(int channel) { return channel >= 196 && channel <= 210; }

// Special readings of an input, as every reply carries them.
enum Special { NotConnected = -1000, OverRange = -1001, NoSensor = -1002, Unused1003 = -1003, LoadShed = -1004 };

struct RoomState {
    double value = 0;    // tenths, or the channel's unit
    int special = 0;     // 0, or one of Special
    bool alarm = false;
    bool latched = false; // raised by hand: stays until the alarms are cleared
    double highFor = 0;  // seconds above the high limit
    double lowFor = 0;
    bool liquid = false, fan = false, defrost = false, suction = false;
    double defrostLeft = 0; // seconds
    int pidPercent = 0;
    int fanPercent = 0;
};

struct Compressor {
    int units = 0;     // capacity units it has
    int running = 0;   // units running
    double hours = 0;
    bool equalizer = false;
};

struct Condenser {
    int stages = 0; // 1..4, or 64 steps when variable
    int running = 0;
    double hours = 0;
};

struct Options {
    QByteArray version = "9.6";
    int id = 1;
    int resets = 0;
    quint32 seed = 1;
    int alarmCapacity = 200;
    int historyCapacity = 1000;
    int powerCapacity = 2000;
    QDateTime start;     // instrument clock at start; invalid: now
    int historyHours = 24; // plant run before start, to fill the logs
};

// Odd but possible replies, asked for by scenario lines so that tests can
// reach them. None is on by default.
struct Quirks {
    // Pressure, Torvanel and evaporator replies write their numbers as a
    // sign and zeros ("+00450", "-01000") instead of blanks and digits.
    bool zeroPadded = false;
    // Bank 1's pressures, the liquid level, Torvanel 1's temperatures and
    // pressures, the first Torvanel temperature and the evaporator's coil
    // and air temperatures read this special value (-1000 to -1004); 0 off.
    int special = 0;
    // The data log upload announces this many records fewer than it sends.
    int uncounted = 0;
    // The data log upload starts with a record that is zero throughout.
    bool zeroRecord = false;
    // The pressure reply carries compressors 1 and 2 in each other's place.
    bool compressorsSwapped = false;
    // Set by a kind forced from a scenario: a compressor kind above 9 is
    // written whole in the narrow field of the older channel record.
    bool wideKinds = false;
    // The Torvanel's kind, its first further input (1 reads table B); -1 none.
    std::array<int, 27> torvanelKind = [] { std::array<int, 27> k; k.fill(-1); return k; }();
};

// The instrument's memory and its plant. Time moves only by advance(), in
// plant milliseconds, so that tests and the --speed option drive it alike.
class InstrumentState {
public:
    explicit InstrumentState(const Options& options = {});

    const Options& options() const { return m_options; }
    QByteArray version() const { return m_version; }
    void setVersion(const QByteArray& v) { m_version = v; }
    double versionNumber() const { return sim::versionNumber(m_version); }
    int resets() const { return m_resets; }
    void countReset() { ++m_resets; }
    void setResets(int n) { m_resets = n; }

    QDateTime now() const { return QDateTime::fromMSecsSinceEpoch(m_nowMs); }
    void advance(qint64 ms);

    // The set point table, row by wire channel.
    int field(int wire, int field) const { return m_sp[wire][field]; }
    void setField(int wire, int field, int value) { m_sp[wire][field] = value; }
    QByteArray description(int wire) const { return m_desc[wire]; }
    void setDescription(int wire, const QByteArray& d);

    // A write as the "P" command carries it: the comma separated parts
    // behind "P" (function, channel, sub-function, width flag, value, group
    // size, further values), or a whole order for functions 65, 90 and 100.
    // acceptsWrite is false when the instrument has no such function for
    // that channel, or a value is not a whole number, is outside the
    // function's range or does not fit its field; applyWrite then changes
    // nothing. Both in sim_write.cpp.
    bool acceptsWrite(const QList<QByteArray>& parts) const;
    bool applyWrite(const QList<QByteArray>& parts);
    // Whether a field of the table can take a value of a downloaded record:
    // a whole number that fits the field, or for the description six
    // characters. Ranges are the business of single writes.
    bool fieldHolds(int field, const QByteArray& text) const;

    const RoomState& room(int channel) const { return m_rooms[channel - 1]; } // 1..216
    // The reading of a channel as the replies carry it: value or special.
    int reading(int channel) const;
    int banks() const { return qBound(1, m_sp[0][83], 5); }
    int suctionPressure(int bank) const { return int(m_suction[bank]); }
    int dischargePressure(int bank) const { return int(m_discharge[bank]); }
    int liquidPressure(int bank) const { return int(m_discharge[bank]) - 60; }
    bool liquidPump(int bank) const;
    int liquidLevel() const { return int(m_level); }
    const Compressor& compressor(int i) const { return m_comp[i]; }
    const Condenser& condenser(int i) const { return m_cond[i]; }
    int compressorCount() const;
    // The suction group (0..4) a compressor (0..26) belongs to.
    int compressorBank(int i) const;
    int condenserCount() const;
    bool torvanelAlarm(int s, int i) const;
    void setTorvanelAlarm(int s, int i, bool on);

    Quirks quirks;
    // Field 165 set as the front panel would, without the write checks.
    void forceCompressorKind(int row, int kind) { setCompressorKind(row, kind); }

    Log<AlarmRecord> alarms;
    Log<HistoryRecord> history;
    Log<PowerRecord> power;

    // Active alarms cleared; true when there were any, or any logged.
    bool clearAlarms();
    // An alarm raised by hand (control channel), logged like any other.
    void raiseAlarm(int channel);
    // Set when the plant logs an alarm; the line layer announces it.
    bool takeNewAlarm();

    // Brumalet scanners: channel -> kind (1 standard, 2 E).
    int brumaletKind(int channel) const;

private:
    void setCompressorKind(int row, int kind);
    void readClock();
    void seed();
    void seedChannel(int wire);
    void seedGlobals();
    void seedPlant();
    void step(double seconds);
    void minuteEvents();
    void logAlarm(int channel, int kind, int value);
    int activeSetPoint(int row) const;
    void stepPlantRoom(double dt);
    void roomAlarms(int wire, int setPoint, double dt);
    double noise(double amplitude);

    Options m_options;
    QByteArray m_version;
    int m_resets = 0;
    QRandomGenerator m_rng;
    // The clock as milliseconds, with the local minute of the day and day
    // of the week read once a minute: local time is dear to compute.
    qint64 m_nowMs = 0;
    int m_minuteOfDay = 0;
    int m_weekDay = 0; // Sunday 0
    qint64 m_carryMs = 0;
    std::array<std::array<int, Fields>, Channels> m_sp {};
    std::array<QByteArray, Channels> m_desc;
    std::array<RoomState, Channels> m_rooms;
    double m_suction[5] = {};
    double m_discharge[5] = {};
    double m_level = 60;
    double m_stageClock[5] = {};
    double m_condClock[5] = {};
    std::array<Compressor, 27> m_comp;
    std::array<Condenser, 12> m_cond;
    std::array<std::array<bool, 41>, 27> m_torvanel {};
    double m_energy = 0; // watt seconds of the running quarter hour
    double m_quarterSeconds = 0;
    bool m_newAlarm = false;
};

} // namespace sim
