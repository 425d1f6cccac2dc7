#pragma once

// The set point catalogue: the one place where a function number of the
// instrument, its store fields in `setpoints`, its range, unit and screen form
// are tied together. The template, the upload, the download, the write path,
// the editor, the verification and the set point card all read it; none of
// them keeps a copy of a field number or a range of its own.
//
// Words used throughout:
// - function: the number on the wire (the panel shows it one higher);
// - sub-function: 0-based index of a value inside a function;
// - store field: the ordinal of the value's column in `setpoints` (0..227);
// - channel: 1..216 as the operator sees it; the wire channel and the store
//   row are the channel less 1;
// - store units: the integer on the wire and in the store (tenths of a degree,
//   whole KPA, minutes after midnight, ...); only the screen converts.
//
// The rows stand in catalogue_table.cpp; lookups, field names and tags in
// catalogue.cpp; entry rules in catalogue_rules.cpp; screen forms in
// catalogue_format.cpp.

#include <QString>
#include <QVariant>
#include <array>
#include <optional>
#include <span>

namespace catalogue {

constexpr int kChannels = 216;
constexpr int kSetpointFields = 228; // ordinals 0..227
constexpr int kNoField = -1;

// The store fields that code outside the catalogue reads or writes, by name;
// nothing else in the program writes a field's number. Where a function has
// one value for each bank, the name is that of bank 1 and bank b is b - 1
// fields further.
constexpr int kChannelNumberField = 0;   // channel number 1..216
constexpr int kConnectedField = 1;       // function 0, sub-function 0
constexpr int kChannelTextField = 24;    // "Ch n", read by the status views
constexpr int kDescriptionField = 25;    // 6 characters of text (function 49)
constexpr int kAssociatedChannelField = 26; // the first of three (function 48)
constexpr int kSpareField = 47;          // touched by no form
constexpr int kChannelBankField = 78;    // channels in a bank (function 1)
constexpr int kBanksInUseField = 83;     // 1..5 (function 86)
constexpr int kLoadShedOrderField = 95;  // row n: channel turned off at priority n+1
constexpr int kCompressorBankField = 155; // compressors in a bank (function 22)
constexpr int kCondenserBankField = 160;  // condensers in a bank (function 25)
constexpr int kCompressorKindField = 165; // compressor type (function 23)
constexpr int kEqualizerField = 167;      // equalizer solenoid seconds (function 70)
constexpr int kCondenserKindField = 169;  // condenser type (function 91); above 4 variable
constexpr int kCondenserOrderField = 206; // row r: condenser at order place r+1
constexpr int kCompressorOrderField = 207; // row r: compressor at order place r+1
constexpr int kControlKindField = 209;    // channel control type (function 112)
constexpr int kBankKindField = 218;       // 0 pressure, 1 temperature (function 82)
constexpr int kPidFullOnField = 224;      // PID high full on (function 83)
constexpr int kDescriptionLength = 6;
constexpr int kBanks = 5;
// The control type (kControlKindField) under which function 113 is a super
// heat in tenths of a degree instead of a delay in seconds.
constexpr int kSuperHeatControlKind = 7;

// The channels a function exists for.
enum class Scope {
    Global,      // row 0 only, written with channel 0
    All,         // channels 1..216
    Alarm,       // 1..200
    Control,     // 1..100
    Analogue66,  // 1..66 (firmware 14 and above)
    Pid32,       // 1..32 (firmware 14 and above)
    Compressor,  // 1..27
    Pressure,    // 1..15
    Condenser,   // 1..12
};

// Last channel (1-based) of a scope; Global counts as channel 1.
int lastChannel(Scope scope);

// What the integer in the store means.
enum class Unit {
    Plain,          // a number with no unit named
    Tenths,         // temperature or differential, degrees x10
    Kpa,            // pressure, whole KPA
    KpaOrTenths,    // 59..62: KPA in a Pressure bank, tenths in a Temperature bank
    SecondsOrTenths, // 113: tenths if the channel's control type is 7, else seconds
    TimeOfDay,      // minutes after midnight
    Minutes,
    Seconds,
    Percent,        // liquid level
    Count,          // channels, compressors, condensers or banks
    Watts,
    Flag,           // 0 or 1, a check box
    ListIndex,      // index into the control's list, from 0
    DayMask,        // bits 0..3: set points 1..4 of function 5 in use that day
    Text,           // the description
};

// How the screen shows a value.
enum class ScreenForm {
    AsIs,   // the integer as it stands
    Tenths, // value / 10 in format "#0.0"
    Time,   // hhmm()
    Check,  // check box
    List,   // the list's text at the index
    Text,   // as it stands
};

using Fields = std::array<short, 8>;
constexpr Fields kNoFields{kNoField, kNoField, kNoField, kNoField, kNoField, kNoField, kNoField, kNoField};

// One numbered function of the instrument that the editor has a control for.
// A row names what differs from the defaults below.
struct Function {
    int number = 0;        // on the wire
    const char* name = ""; // front panel's name for number + 1, or the editor's role
    bool panelNamed = true; // false where the panel shows another thing at number + 1
    int group = 1;         // values of the function on the wire (1, 3, 4, 5, 6, 7, 8)
    int width = 0;         // width flag, sent unchanged in the P command
    Scope scope = Scope::Global;
    Fields fields = kNoFields; // store field by sub-function; kNoField where
                               // the sub-function has no tagged control
    int min = 0, max = 0;  // valid range in store units (inclusive)
    Unit unit = Unit::Plain;
    bool rangeChecked = true; // false: the editor takes any number
    int minVersion = 0;    // firmware that has the function (0: all)
    int defaultValue = 0;  // template value and the default of its `info` rows
    // Times of day that rise with their index: how the upload's messages
    // name one of them ("Print time"). Null for every other function.
    const char* timeName = nullptr;

    int panelNumber() const { return number + 1; }
    int fieldCount() const;           // tagged store fields
    int field(int subfunction) const; // kNoField when there is none
    int subfunctionOf(int field) const; // -1 when the field is not this function's
    bool isGlobal() const { return scope == Scope::Global; }
    // Whether the 1-based channel has this function (global: channel 1 only
    // holds it, but every channel shows it).
    bool appliesTo(int channel) const;
    // Store row of the value for the 1-based channel on the screen.
    int storeRow(int channel) const { return isGlobal() ? 0 : channel - 1; }
    // Channel number on the wire for a write from this channel.
    int wireChannel(int channel) const { return isGlobal() ? 0 : channel - 1; }
};

// Values that a check box or a button serves; they have no editor tag.
struct UntaggedValue {
    int function = 0;
    int subfunction = 0; // -1: a list of order places
    int field = kNoField; // kNoField: a pure command (cancel defrost)
    bool rowZero = false; // the value lives in row 0 and goes with channel 0
    const char* label = "";
    const char* meaning = "";
    int defaultValue = 0; // template value
};

// A group of times of day that must rise with its index: the functions that
// carry a timeName, seen as their fields.
struct TimeGroup {
    int function = 0;
    const char* name = "";
    Fields fields = kNoFields;
    int count = 0;
};

// The upload record of a channel: runs of consecutive store fields in the
// order the instrument sends them. Each run stands in the record only for the
// channels (and firmware) of its block; a channel that fails a block's test
// ends its record there.
enum class RecordBlock {
    All,
    Upto200,
    Upto100,
    Pid66,       // channels 1..66, firmware 14 and on; no `info` rows
    Pid32,       // channels 1..32, firmware 14 and on; no `info` rows
    Upto27,
    Upto15,
    Upto12,
    Only1,
    Only1Above85, // firmware above 8.5
    Only1From87,  // firmware 8.7 and on
};
struct RecordRun {
    short first = 0;
    short count = 1;
    short width = 6; // characters a value; 0: the compressor type's, by firmware
    RecordBlock block = RecordBlock::All;
};
// Whether the run's values take `info` rows (and so are checked by them).
constexpr bool hasInfoRows(RecordBlock b) { return b != RecordBlock::Pid66 && b != RecordBlock::Pid32; }

// The tables.
std::span<const Function> functions();
std::span<const UntaggedValue> untaggedValues();
std::span<const TimeGroup> timeGroups();
std::span<const RecordRun> recordRuns();

// Lookups. Null when there is no such thing.
const Function* findFunction(int number);
// By name, as a person types it: case, blanks and punctuation do not count
// ("set differential" is "Set Differential", "diff'tial type" is function 7);
// a beginning that fits one name alone will do. Null when none or several fit.
const Function* findFunctionByName(const QString& name);
// The tagged function that owns a store field, with the sub-function.
struct FieldOwner {
    const Function* function = nullptr;   // tagged owner, if any
    const UntaggedValue* untagged = nullptr; // else the check box's value
    int subfunction = -1;
};
FieldOwner findField(int field);
const TimeGroup* timeGroupOf(int field);

// Readable name of a store field, built from the catalogue: "Set Temperature 2",
// "Chan Description", "Channel Number". Used for info names and column names.
QString fieldLabel(int field);
// Lower-case identifier for a column: "f002_set_temperature_1".
QString fieldColumnName(int field);

// The upload record's values that take `info` rows, in order: entry i is the
// store field of `info` row i.
std::span<const short> replyOrderFields();
// The `info` row of a store field in reply order, -1 if none.
int replyRowOf(int field);

// Editor tags: 9 digits binding a control to the catalogue. Characters 1-3
// function, 4 sub-function, 5 width flag, 6-8 store field, 9 group size:
// "005210044" is function 5, sub-function 2, width 1, field 4, group 4.
struct Tag {
    int function = 0;
    int subfunction = 0;
    int width = 0;
    int field = 0;
    int group = 0;
    bool operator==(const Tag&) const = default;
};
// Empty when a part does not fit its digits.
QString encodeTag(const Tag& tag);
// Null unless exactly 9 digits.
std::optional<Tag> decodeTag(const QString& text);
// The tag of a function's sub-function, null when it has no tagged field.
std::optional<Tag> tagFor(int function, int subfunction);
// The catalogue entry a tag names; null when the tag disagrees with the
// catalogue (function, field, width or group).
const Function* functionOfTag(const Tag& tag);

// --- Entry rules --------------------------------------------------------

// Range of a function; 113 depends on the channel's control type (function
// 112); 59..62 keep their range whatever the bank measures.
struct Range {
    int min;
    int max;
};
Range rangeOf(const Function& f, bool bankIsTemperature = false, int controlType = 0);
bool inRange(const Function& f, qint64 storeValue, bool bankIsTemperature = false,
             int controlType = 0);

// "Is numeric" as the store and the upload test it: a number, or text that
// reads as a finite decimal number after trimming blanks. The number in *out.
bool numericValue(const QVariant& value, double* out = nullptr);
// A number as the store keeps it: integral values as integers.
QVariant storeNumber(double value);
// The checking rule of an upload value against its `info` row: the value when
// it is numeric and within [minimum, maximum], else the default with *invalid
// set to 1. A limit that is not numeric fails the check.
QVariant checkedValue(const QVariant& value, const QVariant& defaultValue,
                      const QVariant& minimum, const QVariant& maximum, int* invalid);

// --- Screen forms ---------------------------------------------------------

// How the screen shows a function's value; 59..62 and 113 depend on the
// channel's bank (Comp Ct PRES-TMP is 1) or its control type.
ScreenForm screenForm(const Function& f, bool bankIsTemperature = false, int controlType = 0);
// Store value as the screen shows it.
QString toScreen(const Function& f, qint64 storeValue, bool bankIsTemperature = false,
                 int controlType = 0);

// "#0.0" of a value kept in tenths: 215 -> "21.5", -5 -> "-0.5".
QString formatTenths(qint64 tenths);
// Screen text of a decimal back into tenths, rounded to the nearest tenth.
std::optional<qint64> parseTenths(const QString& text);
// Minutes after midnight as "hh:mm", each part in format "00": 485 -> "08:05".
QString hhmm(qint64 minutes);
// "hh:mm" back to minutes; null unless two numbers separated by one ":".
std::optional<int> minutesOf(const QString& hhmmText);

} // namespace catalogue
