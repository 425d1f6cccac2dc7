// The rows of the catalogue: the functions the editor has a control for, the
// values that check boxes and buttons serve, and the upload record. Every
// other table of the catalogue is derived from these.

#include "setpoints/catalogue.h"

namespace catalogue {

namespace {

template <typename... T>
constexpr Fields list(T... values)
{
    Fields a = kNoFields;
    const short v[] = {short(values)...};
    for (std::size_t i = 0; i < sizeof...(values); ++i)
        a[i] = v[i];
    return a;
}

constexpr Fields run(int first, int count)
{
    Fields a = kNoFields;
    for (int i = 0; i < count; ++i)
        a[std::size_t(i)] = short(first + i);
    return a;
}

constexpr int kAnyLow = -99999; // a six-character field holds no more
constexpr int kAnyHigh = 999999;

using S = Scope;
using U = Unit;
using B = RecordBlock;

// Ranges are in store units; a row names only what differs from the defaults.
constexpr Function kFunctions[] = {
    {.number = 1, .name = "Chan's Comp Bank", .group = 5, .scope = S::Global, .fields = run(kChannelBankField, 5),
     .min = 0, .max = 100, .unit = U::Count},
    {.number = 5, .name = "Set Temperature", .group = 4, .width = 1, .scope = S::Control, .fields = run(2, 4),
     .min = -500, .max = 1500, .unit = U::Tenths, .defaultValue = 30},
    {.number = 6, .name = "Set Differential", .scope = S::Control, .fields = list(10), .min = 2, .max = 100,
     .unit = U::Tenths, .defaultValue = 20},
    {.number = 7, .name = "Diff'tial  Type", .scope = S::Control, .fields = list(11), .min = 0, .max = 2,
     .unit = U::ListIndex},
    {.number = 8, .name = "Soft Defrost Y/N", .scope = S::Control, .fields = list(12), .min = 0, .max = 1,
     .unit = U::Flag},
    {.number = 9, .name = "High Alarm Temp", .group = 4, .width = 1, .scope = S::Alarm, .fields = run(14, 4),
     .min = -500, .max = 1500, .unit = U::Tenths, .defaultValue = 80},
    {.number = 10, .name = "Low Alarm Temp", .group = 4, .width = 1, .scope = S::Alarm, .fields = run(19, 4),
     .min = -500, .max = 1500, .unit = U::Tenths, .defaultValue = -20},
    {.number = 11, .name = "Hi Tmp Alm Delay", .scope = S::Alarm, .fields = list(18), .min = 0, .max = 120,
     .unit = U::Minutes, .defaultValue = 30},
    {.number = 12, .name = "Lo Tmp Alm Delay", .scope = S::Alarm, .fields = list(23), .min = 0, .max = 120,
     .unit = U::Minutes, .defaultValue = 30},
    {.number = 13, .name = "High Alarm KPA", .width = 1, .scope = S::Pressure, .fields = list(202),
     .min = -100, .max = 4000, .unit = U::Kpa, .defaultValue = 2000},
    {.number = 14, .name = "Low Alarm  KPA", .width = 1, .scope = S::Pressure, .fields = list(203),
     .min = -100, .max = 4000, .unit = U::Kpa},
    {.number = 15, .name = "Hi KPA Alm Delay", .scope = S::Pressure, .fields = list(204), .min = 0, .max = 120,
     .unit = U::Minutes, .defaultValue = 10},
    {.number = 16, .name = "Lo KPA Alm Delay", .scope = S::Pressure, .fields = list(205), .min = 0, .max = 120,
     .unit = U::Minutes, .defaultValue = 10},
    {.number = 17, .name = "Set Point Times", .group = 4, .width = 1, .scope = S::Alarm, .fields = run(6, 4),
     .min = 0, .max = 1439, .unit = U::TimeOfDay, .timeName = "Set point time"},
    // Sub-function 1 is the fans-and-suction flag, served by a check box.
    {.number = 18, .name = "Set Defrost's", .group = 6, .scope = S::Control,
     .fields = list(29, kNoField, 31, 32, 33, 34), .min = 0, .max = 120, .unit = U::Minutes, .defaultValue = 20},
    {.number = 19, .name = "Auto Def's Times", .group = 8, .width = 1, .scope = S::Control, .fields = run(35, 8),
     .min = 0, .max = 1439, .unit = U::TimeOfDay, .timeName = "Defrost time"},
    {.number = 22, .name = "Comp'ors in Bank", .group = 5, .scope = S::Global,
     .fields = run(kCompressorBankField, 5), .min = 0, .max = 27, .unit = U::Count},
    {.number = 23, .name = "Compressor Type", .scope = S::Compressor, .fields = list(kCompressorKindField),
     .min = 0, .max = 10, .unit = U::ListIndex},
    {.number = 24, .name = "Liq Low Lev Alm", .width = 1, .scope = S::Global, .fields = list(168),
     .min = 0, .max = 100, .unit = U::Percent, .defaultValue = 20},
    {.number = 25, .name = "Cond'ers in Bank", .group = 5, .scope = S::Global,
     .fields = run(kCondenserBankField, 5), .min = 0, .max = 12, .unit = U::Count},
    {.number = 26, .name = "Liquid Low Reset", .width = 1, .scope = S::Global, .fields = list(170),
     .min = 0, .max = 100, .unit = U::Percent, .defaultValue = 30},
    {.number = 29, .name = "Set Data Logging", .scope = S::All, .fields = list(90), .min = 0, .max = 5,
     .unit = U::ListIndex},
    {.number = 30, .name = "4 Data Log Times", .group = 4, .width = 1, .scope = S::All, .fields = run(91, 4),
     .min = 0, .max = 1439, .unit = U::TimeOfDay, .timeName = "Data log time"},
    {.number = 31, .name = "P-ON Start Delay", .width = 1, .scope = S::Global, .fields = list(84),
     .min = kAnyLow, .max = kAnyHigh, .unit = U::Plain, .rangeChecked = false},
    {.number = 35, .name = "Evaporator Differential", .panelNamed = false, .scope = S::Pid32, .fields = list(225),
     .min = 2, .max = 100, .unit = U::Tenths, .minVersion = 14, .defaultValue = 20},
    {.number = 36, .name = "Fan Speed Offset", .panelNamed = false, .scope = S::Pid32, .fields = list(226),
     .min = 0, .max = 100, .unit = U::Tenths, .minVersion = 14, .defaultValue = 20},
    {.number = 38, .name = "Liq Hi Lev Alarm", .width = 1, .scope = S::Global, .fields = list(76),
     .min = 0, .max = 100, .unit = U::Percent, .defaultValue = 80},
    {.number = 39, .name = "Liq Hi Lev Reset", .scope = S::Global, .fields = list(77), .min = 0, .max = 100,
     .unit = U::Percent, .defaultValue = 70},
    // An uploaded 0 is kept (shown as no set point in use); the editor's
    // check boxes refuse to clear the last one.
    {.number = 41, .name = "Daily Set Points", .group = 7, .scope = S::Alarm, .fields = run(54, 7),
     .min = 0, .max = 15, .unit = U::DayMask, .defaultValue = 1},
    {.number = 42, .name = "Type of Control", .scope = S::Control, .fields = list(51), .min = 0, .max = 3,
     .unit = U::ListIndex},
    {.number = 43, .name = "Max Channels on", .group = 5, .width = 1, .scope = S::Global, .fields = run(61, 5),
     .min = 1, .max = 100, .unit = U::Count, .defaultValue = 100},
    {.number = 44, .name = "Min Channels on", .group = 5, .width = 1, .scope = S::Global, .fields = run(66, 5),
     .min = 0, .max = 100, .unit = U::Count},
    {.number = 45, .name = "CH.Turn on Delay", .group = 5, .width = 1, .scope = S::Global, .fields = run(71, 5),
     .min = 0, .max = 120, .unit = U::Plain},
    {.number = 47, .name = "Ctl No2 on Delay", .scope = S::Control, .fields = list(53), .min = 0, .max = 240,
     .unit = U::Plain},
    // The list index is the channel less 1; 215 stands for none.
    {.number = 48, .name = "Associate Chan's", .group = 3, .scope = S::Control,
     .fields = run(kAssociatedChannelField, 3), .min = 0, .max = 215, .unit = U::ListIndex, .defaultValue = 215},
    {.number = 49, .name = "Chan Description", .group = 6, .scope = S::All, .fields = list(kDescriptionField),
     .min = 0, .max = 0, .unit = U::Text, .rangeChecked = false},
    {.number = 52, .name = "Print-Out Times", .scope = S::All, .fields = list(85), .min = 0, .max = 5,
     .unit = U::ListIndex},
    {.number = 53, .name = "4 Print Times", .group = 4, .width = 1, .scope = S::All, .fields = run(86, 4),
     .min = 0, .max = 1439, .unit = U::TimeOfDay, .timeName = "Print time"},
    {.number = 54, .name = "Comp ON/OFF w Ch", .group = 5, .scope = S::Global, .fields = run(213, 5),
     .min = 0, .max = 2, .unit = U::ListIndex},
    {.number = 55, .name = "Fan Man 1 Day Wk", .scope = S::Control, .fields = list(13), .min = 0, .max = 7,
     .unit = U::ListIndex},
    {.number = 56, .name = "Start-Start Time", .width = 1, .scope = S::Compressor, .fields = list(166),
     .min = 0, .max = 30, .unit = U::Plain, .defaultValue = 10},
    {.number = 57, .name = "Comp Slow Load", .group = 5, .width = 1, .scope = S::Global, .fields = run(110, 5),
     .min = 0, .max = 900, .unit = U::Seconds, .defaultValue = 60},
    {.number = 58, .name = "Comp Fast Load", .group = 5, .width = 1, .scope = S::Global, .fields = run(115, 5),
     .min = 0, .max = 100, .unit = U::Seconds, .defaultValue = 10},
    // 59..62: the same integers serve as KPA and as tenths of a degree.
    {.number = 59, .name = "Fast Load Suc Pr", .group = 5, .width = 1, .scope = S::Global, .fields = run(120, 5),
     .min = -500, .max = 1000, .unit = U::KpaOrTenths, .defaultValue = 100},
    {.number = 60, .name = "Pump Down St Pnt", .group = 5, .width = 1, .scope = S::Global, .fields = run(125, 5),
     .min = -500, .max = 1000, .unit = U::KpaOrTenths, .defaultValue = 50},
    {.number = 61, .name = "Compre Set Point", .group = 5, .width = 1, .scope = S::Global, .fields = run(100, 5),
     .min = -500, .max = 1000, .unit = U::KpaOrTenths, .defaultValue = 100},
    {.number = 62, .name = "Compre Diff'tial", .group = 5, .width = 1, .scope = S::Global, .fields = run(105, 5),
     .min = 10, .max = 100, .unit = U::KpaOrTenths, .defaultValue = 20},
    {.number = 63, .name = "Compres Rotation", .group = 5, .scope = S::Global, .fields = run(171, 5),
     .min = 0, .max = 1, .unit = U::ListIndex},
    {.number = 64, .name = "Compr Rotate Sel", .group = 5, .scope = S::Global, .fields = run(176, 5),
     .min = 0, .max = 9, .unit = U::ListIndex},
    {.number = 66, .name = "Conden Set Point", .group = 5, .width = 1, .scope = S::Global, .fields = run(135, 5),
     .min = 0, .max = 2000, .unit = U::Kpa, .defaultValue = 1000},
    {.number = 67, .name = "Conden Diff'tial", .group = 5, .width = 1, .scope = S::Global, .fields = run(140, 5),
     .min = 1, .max = 400, .unit = U::Kpa, .defaultValue = 100},
    {.number = 68, .name = "Liq Pump Fail SP", .group = 5, .width = 1, .scope = S::Global, .fields = run(181, 5),
     .min = 0, .max = 2000, .unit = U::Plain, .defaultValue = 100},
    {.number = 69, .name = "Liq Pump Reprime", .group = 5, .width = 1, .scope = S::Global, .fields = run(186, 5),
     .min = 0, .max = 2000, .unit = U::Plain, .defaultValue = 200},
    {.number = 70, .name = "Comp Equal Sol'd", .scope = S::Compressor, .fields = list(kEqualizerField),
     .min = 0, .max = 30, .unit = U::Seconds},
    {.number = 79, .name = "Third PID Value", .panelNamed = false, .scope = S::Pid32, .fields = list(227),
     .min = 0, .max = 100, .unit = U::Tenths, .minVersion = 14, .defaultValue = 20},
    {.number = 82, .name = "Comp Ct PRES-TMP", .group = 5, .scope = S::Global, .fields = run(kBankKindField, 5),
     .min = 0, .max = 1, .unit = U::ListIndex},
    {.number = 83, .name = "PID High Full On", .panelNamed = false, .scope = S::Analogue66,
     .fields = list(kPidFullOnField), .min = -30, .max = 30, .unit = U::Tenths, .minVersion = 14,
     .defaultValue = 20},
    {.number = 85, .name = "Comp Unload Time", .group = 5, .width = 1, .scope = S::Global, .fields = run(130, 5),
     .min = 0, .max = 300, .unit = U::Seconds, .defaultValue = 30},
    {.number = 86, .name = "Number of Banks", .scope = S::Global, .fields = list(kBanksInUseField),
     .min = 1, .max = kBanks, .unit = U::Count, .defaultValue = 1},
    {.number = 88, .name = "Cond Load Time", .group = 5, .width = 1, .scope = S::Global, .fields = run(145, 5),
     .min = 1, .max = 300, .unit = U::Seconds, .defaultValue = 30},
    {.number = 89, .name = "Cond Unload Time", .group = 5, .width = 1, .scope = S::Global, .fields = run(150, 5),
     .min = 1, .max = 300, .unit = U::Seconds, .defaultValue = 30},
    // Kinds above 4 all read as Variable, so the instrument may send them.
    {.number = 91, .name = "Condenser Type", .scope = S::Condenser, .fields = list(kCondenserKindField),
     .min = 0, .max = 9, .unit = U::ListIndex},
    {.number = 101, .name = "Load Shed Time", .width = 1, .scope = S::Global, .fields = list(96),
     .min = 1, .max = 300, .unit = U::Seconds, .defaultValue = 30},
    {.number = 102, .name = "Load Shed Const", .width = 1, .scope = S::Global, .fields = list(97),
     .min = 0, .max = 30000, .unit = U::Watts, .defaultValue = 1000},
    {.number = 103, .name = "Contract Rate", .width = 1, .scope = S::Global, .fields = list(208),
     .min = 0, .max = 30000, .unit = U::Plain},
    {.number = 107, .name = "Auto Reset Hi Ll", .group = 5, .scope = S::Global, .fields = run(196, 5),
     .min = 0, .max = 1, .unit = U::ListIndex},
    {.number = 108, .name = "Auto Reset Time", .group = 5, .scope = S::Global, .fields = run(191, 5),
     .min = 0, .max = 120, .unit = U::Minutes},
    {.number = 110, .name = "Ld Shd Pulse Del", .width = 1, .scope = S::Global, .fields = list(99),
     .min = 0, .max = 30000, .unit = U::Plain},
    {.number = 112, .name = "Chan Cont'l Type", .scope = S::Control, .fields = list(kControlKindField),
     .min = 0, .max = 7, .unit = U::ListIndex},
    // Seconds 1..600, or with control type 7 tenths 10..200 (1.0..20.0 oC).
    {.number = 113, .name = "PidChDly,S-H Use", .width = 1, .scope = S::Control, .fields = list(210),
     .min = 1, .max = 600, .unit = U::SecondsOrTenths, .defaultValue = 60},
    {.number = 117, .name = "Liq Lev Set Pnt", .width = 1, .scope = S::Global, .fields = list(211),
     .min = 0, .max = 100, .unit = U::Percent, .defaultValue = 50},
    {.number = 118, .name = "Liq Lev Diff'al", .width = 1, .scope = S::Global, .fields = list(212),
     .min = 4, .max = 40, .unit = U::Percent, .defaultValue = 10},
    {.number = 121, .name = "PID Differential", .panelNamed = false, .scope = S::Analogue66, .fields = list(223),
     .min = 2, .max = 100, .unit = U::Tenths, .minVersion = 14, .defaultValue = 20},
};

constexpr UntaggedValue kUntagged[] = {
    {.function = 0, .subfunction = 0, .field = kConnectedField, .label = "Channel Connected",
     .meaning = "channel connected: 1 connected, 0 not connected", .defaultValue = 1},
    {.function = 0, .subfunction = 2, .field = 48, .label = "Cooling", .meaning = "0 heating, 1 cooling",
     .defaultValue = 1},
    {.function = 0, .subfunction = 3, .field = 49, .label = "Fans Automatic",
     .meaning = "0 fans continuous, 1 fans automatic", .defaultValue = 1},
    {.function = 0, .subfunction = 4, .field = 50, .label = "Control On",
     .meaning = "0 control off, 1 control on (automatic)", .defaultValue = 1},
    {.function = 0, .subfunction = 5, .field = 44, .label = "Manual Defrost", .meaning = "manual defrost"},
    {.function = 0, .subfunction = 6, .field = 43, .label = "Auto Defrost", .meaning = "automatic defrost: 1 on"},
    {.function = 0, .subfunction = 7, .field = 52, .label = "Long Term Store", .meaning = "long term store: 1 on"},
    {.function = 8, .subfunction = 0, .field = 12, .label = "Soft Defrost", .meaning = "soft defrost: 1 on"},
    {.function = 18, .subfunction = 1, .field = 30, .label = "Fans Suction 1st Delay",
     .meaning = "fans and suction in the first defrost delay: 1 on"},
    {.function = 98, .subfunction = 0, .field = 45, .label = "On If In Defrost",
     .meaning = "on if others are in defrost"},
    {.function = 99, .subfunction = 0, .field = 46, .label = "If In Defrost On", .meaning = "if in defrost others on"},
    {.function = 106, .subfunction = 0, .field = 201, .rowZero = true, .label = "Level Alarms On",
     .meaning = "high and low level alarms on (digital inputs only)"},
    {.function = 109, .subfunction = 0, .field = 98, .label = "Load Shed Only",
     .meaning = "channel for load shedding only"},
    {.function = 150, .subfunction = 0, .field = kNoField, .label = "Cancel Defrost", .meaning = "cancel defrost"},
    {.function = 65, .subfunction = -1, .field = kCompressorOrderField, .label = "Compressor Order",
     .meaning = "compressor order: 27 places, rows 0 to 26"},
    {.function = 90, .subfunction = -1, .field = kCondenserOrderField, .label = "Condenser Order",
     .meaning = "condenser order: 12 places, rows 0 to 11"},
};

// The upload record of a channel behind its wire channel (positions 1..6).
constexpr RecordRun kRecord[] = {
    {.first = kConnectedField, .width = 1, .block = B::All},
    {.first = 85, .width = 1, .block = B::All},
    {.first = 86, .count = 4, .width = 6, .block = B::All},
    {.first = kDescriptionField, .width = 6, .block = B::All},
    {.first = 90, .width = 1, .block = B::All},
    {.first = 91, .count = 4, .width = 6, .block = B::All},
    // High alarms 1-4 and their delay, low alarms 1-4 and theirs.
    {.first = 14, .count = 10, .width = 6, .block = B::Upto200},
    {.first = 6, .count = 4, .width = 6, .block = B::Upto200},
    {.first = 54, .count = 7, .width = 6, .block = B::Upto200},
    // Function 0's flags: heating, fans, control; then manual and automatic
    // defrost and long term store.
    {.first = 48, .count = 3, .width = 1, .block = B::Upto100},
    {.first = 44, .width = 1, .block = B::Upto100},
    {.first = 43, .width = 1, .block = B::Upto100},
    {.first = 52, .width = 1, .block = B::Upto100},
    {.first = 53, .width = 6, .block = B::Upto100},
    {.first = 2, .count = 4, .width = 6, .block = B::Upto100},
    // The defrost delays with the fans flag, then the eight defrost times.
    {.first = 29, .count = 14, .width = 6, .block = B::Upto100},
    {.first = 51, .width = 1, .block = B::Upto100},
    {.first = kControlKindField, .width = 1, .block = B::Upto100},
    {.first = kAssociatedChannelField, .count = 3, .width = 6, .block = B::Upto100},
    {.first = 10, .width = 6, .block = B::Upto100},
    {.first = 11, .width = 1, .block = B::Upto100},
    {.first = 45, .width = 1, .block = B::Upto100},
    {.first = kLoadShedOrderField, .width = 6, .block = B::Upto100},
    {.first = 46, .width = 1, .block = B::Upto100},
    {.first = 98, .width = 1, .block = B::Upto100},
    {.first = 13, .width = 6, .block = B::Upto100},
    {.first = 210, .width = 6, .block = B::Upto100},
    {.first = 12, .width = 6, .block = B::Upto100},
    {.first = 223, .count = 2, .width = 6, .block = B::Pid66},
    {.first = 225, .count = 3, .width = 6, .block = B::Pid32},
    {.first = 168, .width = 6, .block = B::Upto27},
    {.first = kCompressorKindField, .width = 0, .block = B::Upto27},
    {.first = 166, .width = 6, .block = B::Upto27},
    {.first = kCompressorOrderField, .width = 6, .block = B::Upto27},
    {.first = kEqualizerField, .width = 6, .block = B::Upto27},
    {.first = 202, .count = 4, .width = 6, .block = B::Upto15},
    {.first = 170, .width = 6, .block = B::Upto12},
    {.first = kCondenserOrderField, .width = 6, .block = B::Upto12},
    {.first = kCondenserKindField, .width = 1, .block = B::Upto12},
    {.first = 76, .count = 2, .width = 6, .block = B::Only1},
    // Bank maxima, minima and turn on delays.
    {.first = 61, .count = 15, .width = 6, .block = B::Only1},
    {.first = kChannelBankField, .count = 5, .width = 6, .block = B::Only1},
    // Compressors, then condensers in the banks.
    {.first = kCompressorBankField, .count = 10, .width = 6, .block = B::Only1},
    {.first = 84, .width = 6, .block = B::Only1},
    // Slow and fast load times, fast load and pump down pressures; then the
    // compressor, condenser and liquid pump set points with their differentials.
    {.first = 110, .count = 20, .width = 4, .block = B::Only1},
    {.first = 100, .count = 10, .width = 4, .block = B::Only1},
    {.first = 135, .count = 10, .width = 4, .block = B::Only1},
    {.first = 181, .count = 10, .width = 4, .block = B::Only1},
    // Rotation, then rotation order select.
    {.first = 171, .count = 10, .width = 1, .block = B::Only1},
    {.first = 130, .count = 5, .width = 6, .block = B::Only1},
    {.first = kBanksInUseField, .width = 1, .block = B::Only1},
    {.first = 145, .count = 10, .width = 6, .block = B::Only1},
    {.first = 96, .count = 2, .width = 6, .block = B::Only1},
    {.first = 208, .width = 6, .block = B::Only1},
    {.first = 201, .width = 1, .block = B::Only1},
    {.first = 196, .count = 5, .width = 1, .block = B::Only1},
    {.first = 191, .count = 5, .width = 6, .block = B::Only1},
    {.first = 99, .width = 6, .block = B::Only1},
    {.first = 211, .count = 2, .width = 6, .block = B::Only1Above85},
    // Compressors with rooms, then control by pressure or temperature.
    {.first = 213, .count = 10, .width = 1, .block = B::Only1From87},
};

// --- Derived tables -----------------------------------------------------------

constexpr std::size_t timeGroupCount()
{
    std::size_t n = 0;
    for (const Function& f : kFunctions)
        n += f.timeName != nullptr;
    return n;
}

constexpr std::array<TimeGroup, timeGroupCount()> makeTimeGroups()
{
    std::array<TimeGroup, timeGroupCount()> groups{};
    std::size_t i = 0;
    for (const Function& f : kFunctions) {
        if (!f.timeName)
            continue;
        int count = 0;
        while (count < int(f.fields.size()) && f.fields[std::size_t(count)] != kNoField)
            ++count;
        groups[i++] = {.function = f.number, .name = f.timeName, .fields = f.fields, .count = count};
    }
    return groups;
}
constexpr auto kTimeGroups = makeTimeGroups();

constexpr int replyCount()
{
    int n = 0;
    for (const RecordRun& r : kRecord)
        if (hasInfoRows(r.block))
            n += r.count;
    return n;
}
static_assert(replyCount() == 220, "the upload record holds 220 checked values");

constexpr std::array<short, replyCount()> makeReplyOrder()
{
    std::array<short, replyCount()> a{};
    std::size_t i = 0;
    for (const RecordRun& r : kRecord)
        if (hasInfoRows(r.block))
            for (int k = 0; k < r.count; ++k)
                a[i++] = short(r.first + k);
    return a;
}
constexpr auto kReplyOrder = makeReplyOrder();

} // namespace

std::span<const Function> functions() { return kFunctions; }
std::span<const UntaggedValue> untaggedValues() { return kUntagged; }
std::span<const TimeGroup> timeGroups() { return kTimeGroups; }
std::span<const RecordRun> recordRuns() { return kRecord; }
std::span<const short> replyOrderFields() { return kReplyOrder; }

} // namespace catalogue
