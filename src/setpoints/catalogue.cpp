#include "setpoints/catalogue.h"

#include <QRegularExpression>
#include <cmath>

namespace catalogue {

namespace {

using Fields = std::array<short, 8>;

template <typename... T>
constexpr Fields list(T... values)
{
    Fields a{kNoField, kNoField, kNoField, kNoField, kNoField, kNoField, kNoField, kNoField};
    const short v[] = {short(values)...};
    for (std::size_t i = 0; i < sizeof...(values); ++i)
        a[i] = v[i];
    return a;
}

constexpr Fields run(int first, int count)
{
    Fields a{kNoField, kNoField, kNoField, kNoField, kNoField, kNoField, kNoField, kNoField};
    for (int i = 0; i < count; ++i)
        a[std::size_t(i)] = short(first + i);
    return a;
}

constexpr int kAnyLow = -99999;  // a six-character field holds no more
constexpr int kAnyHigh = 999999;

using S = Scope;
using U = Unit;

// Function, name, panel names it, group, width, scope, store fields by
// sub-function, min, max (store units), unit, editor checks the range,
// first firmware, default.
constexpr Function kFunctions[] = {
    {1, "Chan's Comp Bank", true, 5, 0, S::Global, run(78, 5), 0, 100, U::Count, true, 0, 0},
    {5, "Set Temperature", true, 4, 1, S::Control, run(2, 4), -500, 1500, U::Tenths, true, 0, 30},
    {6, "Set Differential", true, 1, 0, S::Control, list(10), 2, 100, U::Tenths, true, 0, 20},
    {7, "Diff'tial  Type", true, 1, 0, S::Control, list(11), 0, 2, U::ListIndex, true, 0, 0},
    {8, "Soft Defrost Y/N", true, 1, 0, S::Control, list(12), 0, 1, U::Flag, true, 0, 0},
    {9, "High Alarm Temp", true, 4, 1, S::Alarm, run(14, 4), -500, 1500, U::Tenths, true, 0, 80},
    {10, "Low Alarm Temp", true, 4, 1, S::Alarm, run(19, 4), -500, 1500, U::Tenths, true, 0, -20},
    {11, "Hi Tmp Alm Delay", true, 1, 0, S::Alarm, list(18), 0, 120, U::Minutes, true, 0, 30},
    {12, "Lo Tmp Alm Delay", true, 1, 0, S::Alarm, list(23), 0, 120, U::Minutes, true, 0, 30},
    {13, "High Alarm KPA", true, 1, 1, S::Pressure, list(202), -100, 4000, U::Kpa, true, 0, 2000},
    {14, "Low Alarm  KPA", true, 1, 1, S::Pressure, list(203), -100, 4000, U::Kpa, true, 0, 0},
    {15, "Hi KPA Alm Delay", true, 1, 0, S::Pressure, list(204), 0, 120, U::Minutes, true, 0, 10},
    {16, "Lo KPA Alm Delay", true, 1, 0, S::Pressure, list(205), 0, 120, U::Minutes, true, 0, 10},
    {17, "Set Point Times", true, 4, 1, S::Alarm, run(6, 4), 0, 1439, U::TimeOfDay, true, 0, 0},
    // Sub-function 1 is the fans-and-suction flag, served by a check box.
    {18, "Set Defrost's", true, 6, 0, S::Control, list(29, kNoField, 31, 32, 33, 34), 0, 120,
     U::Minutes, true, 0, 20},
    {19, "Auto Def's Times", true, 8, 1, S::Control, run(35, 8), 0, 1439, U::TimeOfDay, true, 0, 0},
    {22, "Comp'ors in Bank", true, 5, 0, S::Global, run(155, 5), 0, 27, U::Count, true, 0, 0},
    {23, "Compressor Type", true, 1, 0, S::Compressor, list(165), 0, 10, U::ListIndex, true, 0, 0},
    {24, "Liq Low Lev Alm", true, 1, 1, S::Global, list(168), 0, 100, U::Percent, true, 0, 20},
    {25, "Cond'ers in Bank", true, 5, 0, S::Global, run(160, 5), 0, 12, U::Count, true, 0, 0},
    {26, "Liquid Low Reset", true, 1, 1, S::Global, list(170), 0, 100, U::Percent, true, 0, 30},
    {29, "Set Data Logging", true, 1, 0, S::All, list(90), 0, 5, U::ListIndex, true, 0, 0},
    {30, "4 Data Log Times", true, 4, 1, S::All, run(91, 4), 0, 1439, U::TimeOfDay, true, 0, 0},
    {31, "P-ON Start Delay", true, 1, 1, S::Global, list(84), kAnyLow, kAnyHigh, U::Plain, false, 0, 0},
    {35, "Evaporator Differential", false, 1, 0, S::Pid32, list(225), 2, 100, U::Tenths, true, 14, 20},
    {36, "Fan Speed Offset", false, 1, 0, S::Pid32, list(226), 0, 100, U::Tenths, true, 14, 20},
    {38, "Liq Hi Lev Alarm", true, 1, 1, S::Global, list(76), 0, 100, U::Percent, true, 0, 80},
    {39, "Liq Hi Lev Reset", true, 1, 0, S::Global, list(77), 0, 100, U::Percent, true, 0, 70},
    // An uploaded 0 is kept (shown as no set point in use); the editor's
    // check boxes refuse to clear the last one.
    {41, "Daily Set Points", true, 7, 0, S::Alarm, run(54, 7), 0, 15, U::DayMask, true, 0, 1},
    {42, "Type of Control", true, 1, 0, S::Control, list(51), 0, 3, U::ListIndex, true, 0, 0},
    {43, "Max Channels on", true, 5, 1, S::Global, run(61, 5), 1, 100, U::Count, true, 0, 100},
    {44, "Min Channels on", true, 5, 1, S::Global, run(66, 5), 0, 100, U::Count, true, 0, 0},
    {45, "CH.Turn on Delay", true, 5, 1, S::Global, run(71, 5), 0, 120, U::Plain, true, 0, 0},
    {47, "Ctl No2 on Delay", true, 1, 0, S::Control, list(53), 0, 240, U::Plain, true, 0, 0},
    // The list index is the channel less 1; 215 stands for none.
    {48, "Associate Chan's", true, 3, 0, S::Control, run(26, 3), 0, 215, U::ListIndex, true, 0, 215},
    {49, "Chan Description", true, 6, 0, S::All, list(kDescriptionField), 0, 0, U::Text, false, 0, 0},
    {52, "Print-Out Times", true, 1, 0, S::All, list(85), 0, 5, U::ListIndex, true, 0, 0},
    {53, "4 Print Times", true, 4, 1, S::All, run(86, 4), 0, 1439, U::TimeOfDay, true, 0, 0},
    {54, "Comp ON/OFF w Ch", true, 5, 0, S::Global, run(213, 5), 0, 2, U::ListIndex, true, 0, 0},
    {55, "Fan Man 1 Day Wk", true, 1, 0, S::Control, list(13), 0, 7, U::ListIndex, true, 0, 0},
    {56, "Start-Start Time", true, 1, 1, S::Compressor, list(166), 0, 30, U::Plain, true, 0, 10},
    {57, "Comp Slow Load", true, 5, 1, S::Global, run(110, 5), 0, 900, U::Seconds, true, 0, 60},
    {58, "Comp Fast Load", true, 5, 1, S::Global, run(115, 5), 0, 100, U::Seconds, true, 0, 10},
    // 59..62: the same integers serve as KPA and as tenths of a degree.
    {59, "Fast Load Suc Pr", true, 5, 1, S::Global, run(120, 5), -500, 1000, U::KpaOrTenths, true, 0, 100},
    {60, "Pump Down St Pnt", true, 5, 1, S::Global, run(125, 5), -500, 1000, U::KpaOrTenths, true, 0, 50},
    {61, "Compre Set Point", true, 5, 1, S::Global, run(100, 5), -500, 1000, U::KpaOrTenths, true, 0, 100},
    {62, "Compre Diff'tial", true, 5, 1, S::Global, run(105, 5), 10, 100, U::KpaOrTenths, true, 0, 20},
    {63, "Compres Rotation", true, 5, 0, S::Global, run(171, 5), 0, 1, U::ListIndex, true, 0, 0},
    {64, "Compr Rotate Sel", true, 5, 0, S::Global, run(176, 5), 0, 9, U::ListIndex, true, 0, 0},
    {66, "Conden Set Point", true, 5, 1, S::Global, run(135, 5), 0, 2000, U::Kpa, true, 0, 1000},
    {67, "Conden Diff'tial", true, 5, 1, S::Global, run(140, 5), 1, 400, U::Kpa, true, 0, 100},
    {68, "Liq Pump Fail SP", true, 5, 1, S::Global, run(181, 5), 0, 2000, U::Plain, true, 0, 100},
    {69, "Liq Pump Reprime", true, 5, 1, S::Global, run(186, 5), 0, 2000, U::Plain, true, 0, 200},
    {70, "Comp Equal Sol'd", true, 1, 0, S::Compressor, list(167), 0, 30, U::Seconds, true, 0, 0},
    {79, "Third PID Value", false, 1, 0, S::Pid32, list(227), 0, 100, U::Tenths, true, 14, 20},
    {82, "Comp Ct PRES-TMP", true, 5, 0, S::Global, run(218, 5), 0, 1, U::ListIndex, true, 0, 0},
    {83, "PID High Full On", false, 1, 0, S::Analogue66, list(224), -30, 30, U::Tenths, true, 14, 20},
    {85, "Comp Unload Time", true, 5, 1, S::Global, run(130, 5), 0, 300, U::Seconds, true, 0, 30},
    {86, "Number of Banks", true, 1, 0, S::Global, list(83), 1, 5, U::Count, true, 0, 1},
    {88, "Cond Load Time", true, 5, 1, S::Global, run(145, 5), 1, 300, U::Seconds, true, 0, 30},
    {89, "Cond Unload Time", true, 5, 1, S::Global, run(150, 5), 1, 300, U::Seconds, true, 0, 30},
    // Kinds above 4 all read as Variable, so the instrument may send them.
    {91, "Condenser Type", true, 1, 0, S::Condenser, list(169), 0, 9, U::ListIndex, true, 0, 0},
    {101, "Load Shed Time", true, 1, 1, S::Global, list(96), 1, 300, U::Seconds, true, 0, 30},
    {102, "Load Shed Const", true, 1, 1, S::Global, list(97), 0, 30000, U::Watts, true, 0, 1000},
    {103, "Contract Rate", true, 1, 1, S::Global, list(208), 0, 30000, U::Plain, true, 0, 0},
    {107, "Auto Reset Hi Ll", true, 5, 0, S::Global, run(196, 5), 0, 1, U::ListIndex, true, 0, 0},
    {108, "Auto Reset Time", true, 5, 0, S::Global, run(191, 5), 0, 120, U::Minutes, true, 0, 0},
    {110, "Ld Shd Pulse Del", true, 1, 1, S::Global, list(99), 0, 30000, U::Plain, true, 0, 0},
    {112, "Chan Cont'l Type", true, 1, 0, S::Control, list(209), 0, 7, U::ListIndex, true, 0, 0},
    // Seconds 1..600, or with control type 7 tenths 10..200 (1.0..20.0 oC).
    {113, "PidChDly,S-H Use", true, 1, 1, S::Control, list(210), 1, 600, U::SecondsOrTenths, true, 0, 60},
    {117, "Liq Lev Set Pnt", true, 1, 1, S::Global, list(211), 0, 100, U::Percent, true, 0, 50},
    {118, "Liq Lev Diff'al", true, 1, 1, S::Global, list(212), 4, 40, U::Percent, true, 0, 10},
    {121, "PID Differential", false, 1, 0, S::Analogue66, list(223), 2, 100, U::Tenths, true, 14, 20},
};

constexpr UntaggedValue kUntagged[] = {
    {0, 0, kConnectedField, false, "Channel Connected", "channel connected: 1 connected, 0 not connected", 1},
    {0, 2, 48, false, "Cooling", "0 heating, 1 cooling", 1},
    {0, 3, 49, false, "Fans Automatic", "0 fans continuous, 1 fans automatic", 1},
    {0, 4, 50, false, "Control On", "0 control off, 1 control on (automatic)", 1},
    {0, 5, 44, false, "Manual Defrost", "manual defrost", 0},
    {0, 6, 43, false, "Auto Defrost", "automatic defrost: 1 on", 0},
    {0, 7, 52, false, "Long Term Store", "long term store: 1 on", 0},
    {8, 0, 12, false, "Soft Defrost", "soft defrost: 1 on", 0},
    {18, 1, 30, false, "Fans Suction 1st Delay", "fans and suction in the first defrost delay: 1 on", 0},
    {98, 0, 45, false, "On If In Defrost", "on if others are in defrost", 0},
    {99, 0, 46, false, "If In Defrost On", "if in defrost others on", 0},
    {106, 0, 201, true, "Level Alarms On", "high and low level alarms on (digital inputs only)", 0},
    {109, 0, 98, false, "Load Shed Only", "channel for load shedding only", 0},
    {150, 0, kNoField, false, "Cancel Defrost", "cancel defrost", 0},
    {65, -1, kCompressorOrderField, false, "Compressor Order", "compressor order: 27 places, rows 0 to 26", 0},
    {90, -1, kCondenserOrderField, false, "Condenser Order", "condenser order: 12 places, rows 0 to 11", 0},
};

constexpr TimeGroup kTimeGroups[] = {
    {17, "Set point time", run(6, 4), 4},
    {30, "Data log time", run(91, 4), 4},
    {53, "Print time", run(86, 4), 4},
    {19, "Defrost time", run(35, 8), 8},
};

constexpr int kGlobal[] = {1,  22, 24, 25, 26, 31, 38, 39, 43, 44,  45,  54,  57,  58,  59,  60,  61, 62,
                           63, 64, 66, 67, 68, 69, 82, 85, 86, 88, 89, 101, 102, 103, 107, 108, 110, 117, 118};

// The upload record's values as runs of store fields, in reply order.
struct Run {
    short first;
    short count;
};
constexpr Run kReplyRuns[] = {
    {1, 1},    {85, 1},   {86, 4},   {25, 1},   {90, 1},   {91, 4},   {14, 10},  {6, 4},    {54, 7},
    {48, 3},   {44, 1},   {43, 1},   {52, 1},   {53, 1},   {2, 4},    {29, 14},  {51, 1},   {209, 1},
    {26, 3},   {10, 1},   {11, 1},   {45, 1},   {95, 1},   {46, 1},   {98, 1},   {13, 1},   {210, 1},
    {12, 1},   {168, 1},  {165, 1},  {166, 1},  {207, 1},  {167, 1},  {202, 4},  {170, 1},  {206, 1},
    {169, 1},  {76, 2},   {61, 15},  {78, 5},   {155, 10}, {84, 1},   {110, 20}, {100, 10}, {135, 10},
    {181, 10}, {171, 10}, {130, 5},  {83, 1},   {145, 10}, {96, 2},   {208, 1},  {201, 1},  {196, 5},
    {191, 5},  {99, 1},   {211, 2},  {213, 10},
};

constexpr int replyCount()
{
    int n = 0;
    for (const Run& r : kReplyRuns)
        n += r.count;
    return n;
}
constexpr int kReplyValues = replyCount();
static_assert(kReplyValues == 220, "the upload record holds 220 checked values");

constexpr std::array<short, kReplyValues> makeReplyOrder()
{
    std::array<short, kReplyValues> a{};
    std::size_t i = 0;
    for (const Run& r : kReplyRuns)
        for (int k = 0; k < r.count; ++k)
            a[i++] = short(r.first + k);
    return a;
}
constexpr auto kReplyOrder = makeReplyOrder();

QString format00(qint64 v)
{
    const QString digits = QString::number(v < 0 ? -v : v).rightJustified(2, QLatin1Char('0'));
    return v < 0 ? QLatin1Char('-') + digits : digits;
}

} // namespace

int lastChannel(Scope scope)
{
    switch (scope) {
    case Scope::Global: return 1;
    case Scope::All: return kChannels;
    case Scope::Alarm: return 200;
    case Scope::Control: return 100;
    case Scope::Analogue66: return 66;
    case Scope::Pid32: return 32;
    case Scope::Compressor: return 27;
    case Scope::Pressure: return 15;
    case Scope::Condenser: return 12;
    }
    return 0;
}

int Function::fieldCount() const
{
    int n = 0;
    for (short f : fields)
        n += f != kNoField;
    return n;
}

int Function::field(int subfunction) const
{
    if (subfunction < 0 || subfunction >= int(fields.size()))
        return kNoField;
    return fields[std::size_t(subfunction)];
}

int Function::subfunctionOf(int storeField) const
{
    if (storeField == kNoField)
        return -1;
    for (std::size_t i = 0; i < fields.size(); ++i)
        if (fields[i] == storeField)
            return int(i);
    return -1;
}

bool Function::appliesTo(int channel) const
{
    return channel >= 1 && channel <= (isGlobal() ? kChannels : lastChannel(scope));
}

std::span<const Function> functions() { return kFunctions; }
std::span<const UntaggedValue> untaggedValues() { return kUntagged; }
std::span<const TimeGroup> timeGroups() { return kTimeGroups; }
std::span<const int> globalFunctions() { return kGlobal; }
std::span<const short> replyOrderFields() { return kReplyOrder; }

const Function* findFunction(int number)
{
    for (const Function& f : kFunctions)
        if (f.number == number)
            return &f;
    return nullptr;
}

namespace {

QString nameKey(const QString& name)
{
    QString key;
    for (QChar c : name)
        if (c.isLetterOrNumber())
            key += c.toLower();
    return key;
}

} // namespace

const Function* findFunctionByName(const QString& name)
{
    const QString key = nameKey(name);
    if (key.isEmpty())
        return nullptr;
    const Function* begins = nullptr;
    int beginning = 0;
    for (const Function& f : kFunctions) {
        const QString k = nameKey(QString::fromLatin1(f.name));
        if (k == key)
            return &f;
        if (k.startsWith(key)) {
            begins = &f;
            ++beginning;
        }
    }
    return beginning == 1 ? begins : nullptr;
}

FieldOwner findField(int field)
{
    FieldOwner owner;
    if (field == kNoField)
        return owner;
    for (const Function& f : kFunctions) {
        const int sub = f.subfunctionOf(field);
        if (sub >= 0) {
            owner.function = &f;
            owner.subfunction = sub;
            return owner;
        }
    }
    for (const UntaggedValue& u : kUntagged) {
        if (u.field == field) {
            owner.untagged = &u;
            owner.subfunction = u.subfunction;
            return owner;
        }
    }
    return owner;
}

const TimeGroup* timeGroupOf(int field)
{
    for (const TimeGroup& g : kTimeGroups)
        for (int i = 0; i < g.count; ++i)
            if (g.fields[std::size_t(i)] == field)
                return &g;
    return nullptr;
}

bool isGlobalFunction(int number)
{
    for (int n : kGlobal)
        if (n == number)
            return true;
    return number == 106;
}

int replyRowOf(int field)
{
    for (std::size_t i = 0; i < kReplyOrder.size(); ++i)
        if (kReplyOrder[i] == field)
            return int(i);
    return -1;
}

QString fieldLabel(int field)
{
    switch (field) {
    case kChannelNumberField: return QStringLiteral("Channel Number");
    case kChannelTextField: return QStringLiteral("Channel Text");
    case kLoadShedOrderField: return QStringLiteral("Load Shed Order");
    default: break;
    }
    const FieldOwner owner = findField(field);
    if (owner.function) {
        const QString name = QString::fromLatin1(owner.function->name);
        if (owner.function->fieldCount() > 1)
            return name + QLatin1Char(' ') + QString::number(owner.subfunction + 1);
        return name;
    }
    if (owner.untagged)
        return QString::fromLatin1(owner.untagged->label);
    return QStringLiteral("Spare %1").arg(field);
}

QString fieldColumnName(int field)
{
    QString base;
    bool gap = false;
    for (QChar c : fieldLabel(field).toLower()) {
        if (c.isLetterOrNumber()) {
            if (gap && !base.isEmpty())
                base += QLatin1Char('_');
            base += c;
            gap = false;
        } else {
            gap = true;
        }
    }
    return QStringLiteral("f%1_").arg(field, 3, 10, QLatin1Char('0')) + base;
}

Range rangeOf(const Function& f, bool bankIsTemperature, int controlType)
{
    Q_UNUSED(bankIsTemperature); // 59..62 keep the same integers in both forms
    if (f.unit == Unit::SecondsOrTenths && controlType == 7)
        return {10, 200};
    return {f.min, f.max};
}

ScreenForm screenForm(const Function& f, bool bankIsTemperature, int controlType)
{
    switch (f.unit) {
    case Unit::Tenths: return ScreenForm::Tenths;
    case Unit::KpaOrTenths: return bankIsTemperature ? ScreenForm::Tenths : ScreenForm::AsIs;
    case Unit::SecondsOrTenths: return controlType == 7 ? ScreenForm::Tenths : ScreenForm::AsIs;
    case Unit::TimeOfDay: return ScreenForm::Time;
    case Unit::Flag: return ScreenForm::Check;
    case Unit::ListIndex: return ScreenForm::List;
    case Unit::Text: return ScreenForm::Text;
    case Unit::DayMask: return ScreenForm::Check;
    default: return ScreenForm::AsIs;
    }
}

bool inRange(const Function& f, qint64 storeValue, bool bankIsTemperature, int controlType)
{
    if (!f.rangeChecked)
        return true;
    const Range r = rangeOf(f, bankIsTemperature, controlType);
    return storeValue >= r.min && storeValue <= r.max;
}

QString toScreen(const Function& f, qint64 storeValue, bool bankIsTemperature, int controlType)
{
    switch (screenForm(f, bankIsTemperature, controlType)) {
    case ScreenForm::Tenths: return formatTenths(storeValue);
    case ScreenForm::Time: return hhmm(storeValue);
    default: return QString::number(storeValue);
    }
}

QString formatTenths(qint64 tenths)
{
    const qint64 a = tenths < 0 ? -tenths : tenths;
    const QString text = QStringLiteral("%1.%2").arg(a / 10).arg(a % 10);
    return tenths < 0 ? QLatin1Char('-') + text : text;
}

std::optional<qint64> parseTenths(const QString& text)
{
    double v = 0;
    if (!numericValue(text, &v))
        return std::nullopt;
    return qRound64(v * 10.0);
}

QString hhmm(qint64 minutes)
{
    return format00(minutes / 60) + QLatin1Char(':') + format00(minutes % 60);
}

std::optional<int> minutesOf(const QString& hhmmText)
{
    static const QRegularExpression re(QStringLiteral("^\\s*(\\d{1,4}):(\\d{2})\\s*$"));
    const QRegularExpressionMatch m = re.match(hhmmText);
    if (!m.hasMatch())
        return std::nullopt;
    const int mm = m.captured(2).toInt();
    if (mm > 59)
        return std::nullopt;
    return m.captured(1).toInt() * 60 + mm;
}

QString encodeTag(const Tag& t)
{
    auto fits = [](int v, int max) { return v >= 0 && v <= max; };
    if (!fits(t.function, 999) || !fits(t.subfunction, 9) || !fits(t.width, 9) || !fits(t.field, 999)
        || !fits(t.group, 9))
        return {};
    return QStringLiteral("%1%2%3%4%5")
        .arg(t.function, 3, 10, QLatin1Char('0'))
        .arg(t.subfunction)
        .arg(t.width)
        .arg(t.field, 3, 10, QLatin1Char('0'))
        .arg(t.group);
}

std::optional<Tag> decodeTag(const QString& text)
{
    if (text.size() != 9)
        return std::nullopt;
    for (QChar c : text)
        if (c < QLatin1Char('0') || c > QLatin1Char('9'))
            return std::nullopt;
    Tag t;
    t.function = text.left(3).toInt();
    t.subfunction = text.mid(3, 1).toInt();
    t.width = text.mid(4, 1).toInt();
    t.field = text.mid(5, 3).toInt();
    t.group = text.mid(8, 1).toInt();
    return t;
}

std::optional<Tag> tagFor(int function, int subfunction)
{
    const Function* f = findFunction(function);
    if (!f || f->field(subfunction) == kNoField)
        return std::nullopt;
    return Tag{f->number, subfunction, f->width, f->field(subfunction), f->group};
}

const Function* functionOfTag(const Tag& tag)
{
    const Function* f = findFunction(tag.function);
    if (!f || f->field(tag.subfunction) == kNoField || f->field(tag.subfunction) != tag.field
        || f->width != tag.width || f->group != tag.group)
        return nullptr;
    return f;
}

bool numericValue(const QVariant& value, double* out)
{
    double v = 0;
    bool ok = false;
    switch (value.typeId()) {
    case QMetaType::Int:
    case QMetaType::UInt:
    case QMetaType::LongLong:
    case QMetaType::ULongLong:
    case QMetaType::Short:
    case QMetaType::UShort:
    case QMetaType::Double:
    case QMetaType::Float:
        v = value.toDouble(&ok);
        break;
    case QMetaType::QString:
    case QMetaType::QByteArray: {
        const QString s = value.toString().trimmed();
        if (!s.isEmpty())
            v = s.toDouble(&ok);
        break;
    }
    default:
        break;
    }
    if (!ok || !std::isfinite(v))
        return false;
    if (out)
        *out = v;
    return true;
}

QVariant storeNumber(double value)
{
    constexpr double kLimit = 9.0e15; // exact in a double
    if (std::trunc(value) == value && std::fabs(value) < kLimit)
        return QVariant(qlonglong(value));
    return QVariant(value);
}

QVariant checkedValue(const QVariant& value, const QVariant& defaultValue, const QVariant& minimum,
                      const QVariant& maximum, int* invalid)
{
    double v = 0, lo = 0, hi = 0;
    if (numericValue(value, &v) && numericValue(minimum, &lo) && numericValue(maximum, &hi) && v >= lo
        && v <= hi)
        return storeNumber(v);
    if (invalid)
        *invalid = 1;
    return defaultValue;
}

} // namespace catalogue
