#pragma once

// The "presss" reply (answer to "T") and the "torvan" reply (answer to the
// Torvanel request "t"): plant room pressures, compressors, condensers and
// the data and alarm flags of the Torvanels fitted to screw compressors.

#include "status/status_codec.h"

#include <QString>
#include <array>

namespace presss_layout {
constexpr int DateTimePos = 1;
constexpr int DateTimeWidth = 19;
constexpr int Banks = 5;
constexpr int Compressors = 27;
constexpr int Condensers = 12;
constexpr int CondenserStages = 4;
constexpr int TorvanelFields = 216;
constexpr int MaxStep = 64;

constexpr int suctionPos(int b) { return 18 * b + 20; }   // b 0..4
constexpr int dischargePos(int b) { return 18 * b + 26; }
constexpr int liquidPos(int b) { return 18 * b + 32; }
constexpr int LiquidLevelPos = 110;
constexpr int equalizerPos(int i) { return i + 116; }     // i 0..26
// Compressor records, 27 wide, in the instrument's order (not by number).
constexpr int recordNumberPos(int r) { return 27 * r + 143; }
constexpr int recordStagesPos(int r) { return 27 * r + 155; }
constexpr int recordKindPos(int r) { return 27 * r + 162; }
constexpr int recordRunningPos(int r) { return 27 * r + 168; }
constexpr int recordFullPos(int r) { return 27 * r + 169; }
constexpr int condenserStagePos(int c, int s) { return 4 * c + 872 + s; } // s 0..3
constexpr int liquidPumpPos(int p) { return p + 920; }
constexpr int hoursRunPos(int i) { return 6 * i + 990; }
constexpr int hoursRunCondenserPos(int c) { return 6 * c + 1152; }
constexpr int compressorStepPos(int k) { return 6 * k + 1223; } // k = number - 1
constexpr int condenserStepPos(int c) { return 6 * c + 1313; }
constexpr int TorvanelDataPos = 1385;
constexpr int torvanelFieldPos(int j) { return 6 * j + TorvanelDataPos; }
constexpr double TorvanelVersion = 6;

// CsData: the date and time followed by the reply from TorvanelDataPos on,
// so that Torvanel s fills 96 characters from 96 s + 20.
constexpr int BlockWidth = 96;
constexpr int blockPos(int s) { return BlockWidth * s + 20; }
constexpr int BlockTemperatures = 4;
constexpr int BlockPressures = 4;
constexpr int BlockInputs = 16;
constexpr int BlockFurtherInputs = 8;
constexpr int blockTemperaturePos(int s, int i) { return blockPos(s) + 6 * i; }
constexpr int blockPressurePos(int s, int i) { return blockPos(s) + 24 + 6 * i; }
constexpr int blockAnalogue1Pos(int s) { return blockPos(s) + 48; }
constexpr int blockInputPos(int s, int i) { return blockPos(s) + 54 + i; }
constexpr int blockAnalogue2Pos(int s) { return blockPos(s) + 70; }
constexpr int blockFurtherInputPos(int s, int i) { return blockPos(s) + 82 + i; }
constexpr int blockAnalogue3Pos(int s) { return blockPos(s) + 90; }

// CsAlarms: the whole "torvan" reply.
constexpr int AlarmFlags = 41; // 0..40: the 41st is the next Torvanel's first
constexpr int AlarmTexts = 40;
constexpr int AlarmTextWidth = 25;
constexpr int alarmFlagPos(int s, int i) { return 40 * s + 20 + i; }
constexpr int TorvanTemperatures = 5;
constexpr int torvanTemperaturePos(int i) { return 6 * i + 1100; }
constexpr double TorvanelRequestVersion = 8;
constexpr double TorvanTemperatureVersion = 8.8;
} // namespace presss_layout

struct CompressorRecord {
    int number = 0;   // 1..27; 0: an empty record
    int stages = 0;   // stages running, staged compressors
    int kind = 0;     // 0 or 1 staged, 2 screw, 3 variable
    bool running = false;
    bool full = false; // fully loaded screw
};

struct PresssBank {
    QString suction;   // normalised numbers
    QString discharge;
    QString liquid;
    bool liquidPump = false;
};

struct PresssReply {
    QString dateTime;
    std::array<PresssBank, presss_layout::Banks> banks;
    QString liquidLevel;
    std::array<bool, presss_layout::Compressors> equalizer{};
    std::array<CompressorRecord, presss_layout::Compressors> records{};
    std::array<std::array<bool, presss_layout::CondenserStages>, presss_layout::Condensers> condenser{};
    std::array<QString, presss_layout::Compressors> hoursRun;
    std::array<QString, presss_layout::Condensers> hoursRunCondenser;
    // Steps as shown: the field plus 1, so 1..65.
    std::array<int, presss_layout::Compressors> compressorStep{};
    std::array<int, presss_layout::Condensers> condenserStep{};
    bool hasTorvanel = false; // version 6 or more
    std::array<QString, presss_layout::TorvanelFields> torvanel;
    QString csData;
};

PresssReply decodePresss(const QString& reply, double version);

// "N-C", "O-R", else the number as it stands (pressures are not divided).
QString presssPressureText(const QString& normalised);
// "N-C", "O-R", else the number & "%".
QString liquidLevelText(const QString& normalised);
// Format "##0 %" of step x 1.5625 / 100: step 64 is "100 %", step 1 "2 %".
QString stepPercentText(int step);

// One Torvanel's block out of CsData.
struct TorvanelBlock {
    bool known = false; // CsData holds data for this Torvanel
    std::array<QString, presss_layout::BlockTemperatures> temperatures; // words
    std::array<QString, presss_layout::BlockPressures> pressures;       // words
    QString analogue1, analogue2, analogue3;
    std::array<bool, presss_layout::BlockInputs> inputs{};
    std::array<bool, presss_layout::BlockFurtherInputs> furtherInputs{};
    int kind = 0; // the first further input: 1 for a recip, else screw
};
TorvanelBlock decodeTorvanelBlock(const QString& csData, int s);

// Temperature words of the Torvanel data: "N-C", "O-R", else tenths "#0.0".
QString torvanelTemperatureText(const QString& normalised);

// The 41 alarm flags of Torvanel s out of CsAlarms.
std::array<bool, presss_layout::AlarmFlags> torvanelAlarmFlags(const QString& csAlarms, int s);
// The two alarm tables, 40 texts of exactly 25 characters, entry i at
// 25 i + 1; kind 1 reads table B, every other kind table A.
const QString& torvanel_alarm_table_a();
const QString& torvanel_alarm_table_b();
// Entry i of the kind's table: 25 characters, empty for i = 40.
QString torvanelAlarmText(int kind, int i);
// The text of the alarm box: "No alarms are active", or each active
// alarm's 25 characters and a line end.
QString torvanelAlarmWords(const QString& csAlarms, int s, int kind);
// Temp(i) of the "torvan" reply, i 0..4, as words ("N-C", "O-R", "#0.0").
QString torvanTemperature(const QString& csAlarms, int i);
