// The instrument's side of a set point write: what it takes and what it
// refuses. A refused write gets no echo, so the sender's wait runs out.

#include "sim/sim_state.h"

#include <QHash>

#include <optional>

namespace sim {

namespace {

struct Range {
    int low;
    int high;
};

// The limits the instrument keeps for each function, in its own units.
// Functions not listed are held only by the width of their field.
const QHash<int, Range>& ranges()
{
    static const QHash<int, Range> map {
        {0, {0, 1}}, {1, {0, 100}}, {5, {-500, 1500}}, {6, {2, 100}}, {7, {0, 2}}, {8, {0, 1}},
        {9, {-500, 1500}}, {10, {-500, 1500}}, {11, {0, 120}}, {12, {0, 120}}, {13, {-100, 4000}},
        {14, {-100, 4000}}, {15, {0, 120}}, {16, {0, 120}}, {17, {0, 1439}}, {18, {0, 120}},
        {19, {0, 1439}}, {22, {0, 27}}, {23, {0, 99}}, {24, {0, 100}}, {25, {0, 12}}, {26, {0, 100}},
        {29, {0, 5}}, {30, {0, 1439}}, {35, {2, 100}}, {36, {0, 100}}, {38, {0, 100}}, {39, {0, 100}},
        {41, {1, 15}}, {42, {0, 3}}, {43, {1, 100}}, {44, {0, 100}}, {45, {0, 120}}, {47, {0, 240}},
        {48, {0, 216}}, {52, {0, 5}}, {53, {0, 1439}}, {54, {0, 2}}, {55, {0, 7}}, {56, {0, 30}},
        {57, {0, 900}}, {58, {0, 100}}, {59, {-500, 1000}}, {60, {-500, 1000}}, {61, {-500, 1000}},
        {62, {10, 100}}, {63, {0, 1}}, {66, {0, 2000}}, {67, {1, 400}}, {68, {0, 2000}}, {69, {0, 2000}},
        {70, {0, 30}}, {79, {0, 100}}, {82, {0, 1}}, {83, {-30, 30}}, {85, {0, 300}}, {86, {1, 5}},
        {88, {1, 300}}, {89, {1, 300}}, {98, {0, 1}}, {99, {0, 1}}, {101, {1, 300}}, {102, {0, 30000}},
        {103, {0, 30000}}, {106, {0, 1}}, {108, {0, 120}}, {109, {0, 1}}, {110, {0, 30000}},
        {112, {0, 7}}, {117, {0, 100}}, {118, {4, 40}}, {121, {2, 100}}, {150, {0, 1}},
    };
    return map;
}

// A whole number as the instrument reads it: a sign and digits, nothing else.
std::optional<int> whole(const QByteArray& text)
{
    const int digitsFrom = text.startsWith('-') || text.startsWith('+') ? 1 : 0;
    if (text.size() <= digitsFrom || text.size() > 9)
        return std::nullopt;
    for (int i = digitsFrom; i < text.size(); ++i)
        if (text[i] < '0' || text[i] > '9')
            return std::nullopt;
    return text.toInt();
}

// Characters a field of the channel record has, by the version.
int fieldWidth(int field, double version)
{
    for (const RecordItem& item : recordOrder())
        if (item.field == field)
            return item.width ? item.width : (version >= 8 || qFuzzyCompare(version, 6.5) ? 6 : 1);
    return 6;
}

bool fits(int value, int field, double version)
{
    return QByteArray::number(value).size() <= fieldWidth(field, version);
}

struct Assignment {
    int row;
    int field;
    int value;
};

// What a write would change, or nothing when the instrument refuses it.
struct Write {
    int number = 0;
    int row = 0;
    QList<Assignment> set;
    std::optional<QByteArray> description;
};

std::optional<Write> orderWrite(const QList<QByteArray>& parts, int number, int field, int places, Range range, double v)
{
    if (parts.size() != places + 1)
        return std::nullopt;
    Write w;
    w.number = number;
    for (int i = 0; i < places; ++i) {
        const auto value = whole(parts[i + 1]);
        if (!value || *value < range.low || *value > range.high || !fits(*value, field, v))
            return std::nullopt;
        w.set.append({i, field, *value});
    }
    return w;
}

std::optional<Write> parseWrite(const InstrumentState& s, const QList<QByteArray>& parts)
{
    const double v = s.versionNumber();
    const auto number = parts.isEmpty() ? std::nullopt : whole(parts[0]);
    if (!number)
        return std::nullopt;
    if (*number == 65)
        return orderWrite(parts, 65, 207, 27, {0, 27}, v);
    if (*number == 90)
        return orderWrite(parts, 90, 206, 12, {0, 12}, v);
    if (*number == 100)
        return orderWrite(parts, 100, 95, 100, {0, 216}, v);
    // Function, channel, sub-function, width flag, value; the group size
    // and further values follow for all but some of the channel switches.
    if (parts.size() < 5)
        return std::nullopt;
    const auto wire = whole(parts[1]);
    const auto sub = whole(parts[2]);
    if (!wire || !sub || *wire < 0 || *wire >= Channels)
        return std::nullopt;
    Write w;
    w.number = *number;
    if (*number == 150) {
        const auto value = whole(parts[4]);
        if (!value || *value < 0 || *value > 1)
            return std::nullopt;
        w.row = *wire;
        return w;
    }
    const Function* f = function(*number);
    if (!f || *sub < 0 || *sub >= f->fields.size() || f->fields[*sub] < 0)
        return std::nullopt;
    if (!f->global && (*wire + 1 < f->firstChannel || *wire + 1 > f->lastChannel))
        return std::nullopt;
    w.row = f->global ? 0 : *wire;
    if (*number == 49) {
        // Six characters, blanks and all.
        if (parts[4].size() != 6)
            return std::nullopt;
        w.description = parts[4];
        return w;
    }
    Range range = ranges().value(*number, {-99999, 999999});
    if (*number == 18 && *sub == 1)
        range = {0, 1};
    if (*number == 113)
        range = s.field(w.row, 209) == 7 ? Range {10, 200} : Range {1, 600};
    QList<QByteArray> values {parts[4]};
    int fieldFrom = *sub;
    if (isTimeGroup(*number)) {
        // Every time of the group, in rising order.
        const auto size = parts.size() > 5 ? whole(parts[5]) : std::nullopt;
        if (!size || *size != f->fields.size() || parts.size() != 5 + *size)
            return std::nullopt;
        values += parts.mid(6, *size - 1);
        fieldFrom = 0;
    }
    int previous = range.low;
    for (int i = 0; i < values.size(); ++i) {
        const auto value = whole(values[i]);
        const int field = f->fields[fieldFrom + i];
        if (!value || *value < range.low || *value > range.high || *value < previous)
            return std::nullopt;
        // Associated channels: the wire names the channel, the table keeps
        // it zero-based.
        const int stored = *number == 48 ? *value - 1 : *value;
        if (!fits(stored, field, v))
            return std::nullopt;
        if (isTimeGroup(*number))
            previous = *value;
        w.set.append({w.row, field, stored});
    }
    return w;
}

} // namespace

bool InstrumentState::acceptsWrite(const QList<QByteArray>& parts) const
{
    return parseWrite(*this, parts).has_value();
}

bool InstrumentState::fieldHolds(int field, const QByteArray& text) const
{
    if (field == DescriptionField)
        return text.size() == 6;
    const auto value = whole(text);
    return value && fits(*value, field, versionNumber());
}

bool InstrumentState::applyWrite(const QList<QByteArray>& parts)
{
    const std::optional<Write> w = parseWrite(*this, parts);
    if (!w)
        return false;
    if (w->number == 150) {
        m_rooms[w->row].defrostLeft = 0;
        m_rooms[w->row].defrost = false;
        m_sp[w->row][44] = 0;
        return true;
    }
    if (w->description)
        setDescription(w->row, *w->description);
    for (const Assignment& a : w->set) {
        if (a.field == 165)
            setCompressorKind(a.row, a.value);
        else
            m_sp[a.row][a.field] = a.value;
    }
    if (w->number == 0 && w->set.size() == 1 && w->set.first().field == 44 && w->set.first().value == 1
        && m_rooms[w->row].defrostLeft <= 0)
        m_rooms[w->row].defrostLeft = qMax(1, m_sp[w->row][29]) * 60.0;
    return true;
}

} // namespace sim
