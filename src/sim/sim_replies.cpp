#include "sim/sim_replies.h"

#include "sim/sim_text.h"

namespace sim {

namespace {

bool wideCompressorType(double v) { return v >= 8 || qFuzzyCompare(v, 6.5); }

// A staged compressor reports stages running less one; the kinds the
// pressure reply knows are 0/1 staged, 2 screw, 3 variable.
int wireKind(int storeKind)
{
    if (storeKind == 8)
        return 2;
    if (storeKind == 9 || storeKind == 10)
        return 3;
    return storeKind == 0 ? 0 : 1;
}

// Torvanel blocks of 96 characters: 4 temperatures, 4 pressures, an
// analogue value, 16 inputs, an analogue value, 8 inputs (the first the
// kind), an analogue value.
void putTorvanelData(Layout& r, const InstrumentState& s)
{
    const Quirks& q = s.quirks;
    const int comps = s.compressorCount();
    for (int t = 0; t * 96 < 216 * 6; ++t) {
        const int base = 96 * t + 1385;
        const bool fitted = t < comps && (s.field(t, 165) == 8 || s.field(t, 165) == 10);
        const Compressor& c = s.compressor(t);
        const int bank = s.compressorBank(t);
        const int temps[4] = {-50 + int(c.running) * 10, 700 + 50 * c.running, 450, 520};
        const int press[4] = {s.suctionPressure(bank), s.dischargePressure(bank), s.dischargePressure(bank) + 150, s.dischargePressure(bank) + 120};
        auto put = [&](int offset, const QByteArray& text) {
            if (base + offset + text.size() - 1 <= 1385 + 216 * 6 - 1)
                r.put(base + offset, text);
        };
        const bool odd = t == 0 && q.special;
        for (int i = 0; i < 4; ++i) {
            put(6 * i, r.number(odd ? q.special : fitted ? temps[i] : NotConnected, 6));
            put(24 + 6 * i, r.number(odd ? q.special : fitted ? press[i] : NotConnected, 6));
        }
        put(48, r.number(fitted ? 40 * c.running : NotConnected, 6));
        for (int i = 0; i < 16; ++i)
            put(54 + i, (fitted && ((i == 0 && c.running) || (i == 6 && c.running >= c.units))) ? "1" : "0");
        put(70, r.number(fitted ? 75 : NotConnected, 6));
        put(76, "      ");
        for (int i = 0; i < 8; ++i)
            put(82 + i, "0");
        if (t < 27 && q.torvanelKind[t] >= 0)
            put(82, QByteArray::number(q.torvanelKind[t] % 10));
        put(90, r.number(fitted ? 60 : NotConnected, 6));
    }
}

} // namespace

QByteArray identityReply(const QByteArray& version, int id, int resets, const QDateTime& time)
{
    QByteArray r = fixed(version, 7);
    r += QByteArray::number(id).rightJustified(5, '0', true);
    r += QByteArray::number(resets).rightJustified(5, '0', true);
    r += fixed(stamp(time), 22);
    r += "Glacinor";
    return r;
}

QByteArray statusReply(const InstrumentState& s)
{
    const double v = s.versionNumber();
    Layout r;
    r.put(1, stamp(s.now()));
    for (int n = 1; n <= 200; ++n) {
        r.putNum(7 * n + 13, s.reading(n), 6);
        r.putFlag(7 * n + 19, s.room(n).alarm);
    }
    for (int n = 1; n <= 100; ++n) {
        const RoomState& room = s.room(n);
        r.putFlag(4 * n + 1416, room.liquid);
        r.putFlag(4 * n + 1417, room.fan);
        r.putFlag(4 * n + 1418, room.defrost);
        r.putFlag(4 * n + 1419, room.suction);
    }
    if (v >= 8) {
        // Three suction headers a group; the last box is the plant's main header.
        for (int i = 0; i < 16; ++i) {
            const int b = i / 3;
            int value = NotConnected;
            if (i == 15)
                value = s.suctionPressure(0);
            else if (b < s.banks())
                value = s.suctionPressure(b) + (i % 3) * 5;
            r.putNum(6 * i + 1820, value, 6);
        }
    }
    if (v >= 14) {
        for (int n = 1; n <= 66; ++n)
            r.putNum(6 * n + 1910, s.field(n - 1, 209) == 4 ? s.room(n).pidPercent : 0, 6);
        for (int n = 1; n <= 32; ++n) {
            const bool evap = s.field(n - 1, 209) == 5;
            r.putNum(6 * n + 2306, evap ? s.room(n).pidPercent : 0, 6);
            r.putNum(6 * n + 2498, evap ? s.room(n).fanPercent : 0, 6);
        }
    }
    return r.text() + "status";
}

QByteArray pressureReply(const InstrumentState& s)
{
    const double v = s.versionNumber();
    // From version 6 the Torvanel data (216 fields of 6) close the reply.
    const Quirks& q = s.quirks;
    Layout r(v >= 6 ? 1384 + 216 * 6 : 1384);
    r.setZeroPadded(q.zeroPadded);
    r.put(1, stamp(s.now()));
    for (int b = 0; b < 5; ++b) {
        const bool used = b < s.banks();
        const bool odd = b == 0 && q.special;
        r.putNum(18 * b + 20, odd ? q.special : used ? s.suctionPressure(b) : NotConnected, 6);
        r.putNum(18 * b + 26, odd ? q.special : used ? s.dischargePressure(b) : NotConnected, 6);
        r.putNum(18 * b + 32, odd ? q.special : used ? s.liquidPressure(b) : NotConnected, 6);
    }
    r.putNum(110, q.special ? q.special : s.liquidLevel(), 6);
    const int comps = s.compressorCount();
    for (int i = 0; i < 27; ++i)
        r.putFlag(i + 116, i < comps && s.compressor(i).equalizer);
    for (int i = 0; i < 27; ++i) {
        // Swapped, compressor 1's record stands in place 2 and the other way.
        const int place = q.compressorsSwapped && i < 2 ? 1 - i : i;
        const int base = 27 * place;
        const bool used = i < comps;
        const Compressor& c = s.compressor(i);
        const int kind = wireKind(s.field(i, 165));
        r.putNum(base + 143, used ? i + 1 : 0, 6);
        r.putNum(base + 155, used && kind <= 1 ? qMax(0, c.running - 1) : 0, 6);
        r.putNum(base + 162, used ? kind : 0, 6);
        r.putFlag(base + 168, used && c.running > 0);
        r.putFlag(base + 169, used && kind == 2 && c.running >= c.units);
    }
    const int conds = s.condenserCount();
    for (int c = 0; c < 12; ++c) {
        const Condenser& k = s.condenser(c);
        const bool variable = k.stages == 64;
        for (int st = 0; st < 4; ++st)
            r.putFlag(4 * c + 872 + st, c < conds && (variable ? k.running > 0 && st == 0 : st < k.running));
    }
    for (int p = 0; p < 5; ++p)
        r.putFlag(p + 920, p < s.banks() && s.liquidPump(p));
    for (int i = 0; i < 27; ++i)
        r.putNum(6 * i + 990, i < comps ? int(s.compressor(i).hours) : 0, 6);
    // The hours of the last condenser share their last place with the first
    // compressor step, so they are kept to five places.
    for (int c = 0; c < 12; ++c)
        r.putNum(6 * c + 1152, c < conds ? int(s.condenser(c).hours) : 0, c == 11 ? 5 : 6);
    // Steps of variable compressors; from compressor 16 on the places are
    // those of the condenser steps, which are written last.
    for (int k = 0; k < 15; ++k) {
        const Compressor& c = s.compressor(k);
        const bool variable = k < comps && wireKind(s.field(k, 165)) == 3;
        r.putNum(6 * k + 1223, variable && c.running ? c.running * 16 - 1 : 0, 6);
    }
    for (int c = 0; c < 12; ++c) {
        const Condenser& k = s.condenser(c);
        r.putNum(6 * c + 1313, c < conds && k.stages == 64 ? k.running : 0, 6);
    }
    if (v >= 6)
        putTorvanelData(r, s);
    return r.text() + "presss";
}

QByteArray torvanelReply(const InstrumentState& s)
{
    Layout r;
    r.setZeroPadded(s.quirks.zeroPadded);
    r.put(1, stamp(s.now()));
    for (int t = 0; t < 27; ++t)
        for (int i = 0; i < 40; ++i)
            r.putFlag(40 * t + 20 + i, s.torvanelAlarm(t, i));
    if (s.versionNumber() >= 8.8)
        for (int i = 0; i < 5; ++i) {
            // Saturated suction temperature of each group, roughly.
            int value = i < s.banks() ? s.suctionPressure(i) / 3 - 400 : NotConnected;
            if (i == 0 && s.quirks.special)
                value = s.quirks.special;
            r.putNum(6 * i + 1100, value, 6);
        }
    return r.text() + "torvan";
}

namespace {

// Whether a block of the record stands for the channel; skip means that it
// is left out without ending the record.
enum class Gate { Stand, Skip, End };

Gate uploadGate(Block b, int n, double v)
{
    switch (b) {
    case Block::All: return Gate::Stand;
    case Block::Upto200: return n <= 200 ? Gate::Stand : Gate::End;
    case Block::Upto100: return n <= 100 ? Gate::Stand : Gate::End;
    case Block::Upto66: return v < 14 ? Gate::Skip : n <= 66 ? Gate::Stand : Gate::End;
    case Block::Upto32: return v < 14 ? Gate::Skip : n <= 32 ? Gate::Stand : Gate::End;
    case Block::Upto27: return n <= 27 ? Gate::Stand : Gate::End;
    case Block::Upto15: return n <= 15 ? Gate::Stand : Gate::End;
    case Block::Upto12: return n <= 12 ? Gate::Stand : Gate::End;
    case Block::Only1: return n == 1 ? Gate::Stand : Gate::End;
    case Block::Only1Above85: return n == 1 && v > 8.5 ? Gate::Stand : Gate::End;
    case Block::Only1From87: return n == 1 && v >= 8.7 ? Gate::Stand : Gate::End;
    }
    return Gate::End;
}

// The download record holds the firmware-gated values of channel 1 whatever
// the version; fields 225-227 go for wire 32 as well.
Gate downloadGate(Block b, int w, double v)
{
    switch (b) {
    case Block::All: return Gate::Stand;
    case Block::Upto200: return w < 200 ? Gate::Stand : Gate::End;
    case Block::Upto100: return w <= 99 ? Gate::Stand : Gate::End;
    case Block::Upto66: return v < 14 ? Gate::Skip : w < 66 ? Gate::Stand : Gate::End;
    case Block::Upto32: return v < 14 ? Gate::Skip : w <= 32 ? Gate::Stand : Gate::End;
    case Block::Upto27: return w < 27 ? Gate::Stand : Gate::End;
    case Block::Upto15: return w < 15 ? Gate::Stand : Gate::End;
    case Block::Upto12: return w < 12 ? Gate::Stand : Gate::End;
    case Block::Only1:
    case Block::Only1Above85:
    case Block::Only1From87: return w < 1 ? Gate::Stand : Gate::End;
    }
    return Gate::End;
}

} // namespace

QByteArray channelRecord(const InstrumentState& s, int wire)
{
    const double v = s.versionNumber();
    const int n = wire + 1;
    QByteArray r = num(wire, 6);
    for (const RecordItem& item : recordOrder()) {
        const Gate g = uploadGate(item.block, n, v);
        if (g == Gate::End)
            break;
        if (g == Gate::Skip)
            continue;
        if (item.field == DescriptionField) {
            r += fixed(s.description(wire), 6);
            continue;
        }
        const int width = item.width ? item.width : (wideCompressorType(v) ? 6 : 1);
        // A compressor kind above 9 does not fit the narrow field: the
        // instrument writes it whole, and the rest of the record moves on.
        if (item.width == 0 && width == 1 && s.field(wire, item.field) > 9 && s.quirks.wideKinds)
            r += QByteArray::number(s.field(wire, item.field));
        else
            r += num(s.field(wire, item.field), width);
    }
    return r + "schanupload";
}

bool takeDownloadRecord(InstrumentState& s, const QByteArray& record)
{
    const QList<QByteArray> parts = record.split(',');
    bool ok = false;
    const int wire = parts.value(0).toInt(&ok);
    if (!ok || wire < 0 || wire >= Channels || !record.endsWith(','))
        return false;
    const double v = s.versionNumber();
    QList<const RecordItem*> items;
    for (const RecordItem& item : recordOrder()) {
        const Gate g = downloadGate(item.block, wire, v);
        if (g == Gate::End)
            break;
        if (g == Gate::Skip)
            continue;
        items << &item;
    }
    // Above wire 32 the record ends behind fields 223 and 224.
    if (v >= 14 && wire > 32 && wire < 66) {
        QList<const RecordItem*> cut;
        for (const RecordItem* i : items) {
            cut << i;
            if (i->field == 224)
                break;
        }
        items = cut;
    }
    if (parts.size() != items.size() + 2)
        return false;
    // A record with a value the instrument cannot hold is not taken at all.
    QVector<int> values(items.size());
    for (int i = 0; i < items.size(); ++i) {
        if (!s.fieldHolds(items[i]->field, parts[i + 1]))
            return false;
        values[i] = parts[i + 1].toInt();
    }
    for (int i = 0; i < items.size(); ++i) {
        if (items[i]->field == DescriptionField)
            s.setDescription(wire, parts[i + 1]);
        else
            s.setField(wire, items[i]->field, values[i]);
    }
    return true;
}

QByteArray alarmRecord(const AlarmRecord& a, int count, bool more)
{
    QByteArray r = signedNum(a.channel, 6);
    r += fixed(a.description, 6);
    r += signedNum(count, 6);
    r += signedNum(a.kind, 6);
    r += signedNum(a.time.date().day(), 6);
    r += signedNum(a.time.date().month(), 6);
    r += signedNum(a.time.time().hour(), 6);
    r += signedNum(a.time.time().minute(), 6);
    r += signedNum(a.value, 6);
    r += more ? "1" : "0";
    return r + "almlog";
}

namespace {
QByteArray logStamp(const QDateTime& t)
{
    return t.toString(QStringLiteral("dd/MM/")).toLatin1() + signedNum(t.date().year(), 6)
        + t.toString(QStringLiteral("hh:mm")).toLatin1();
}
} // namespace

QByteArray historyRecord(const HistoryRecord& h, int count, bool more)
{
    QByteArray r = logStamp(h.time);
    r += signedNum(count, 6);
    QByteArray flags(224, '0');
    QByteArray values;
    for (int i = 0; i < h.values.size() && i < Channels; ++i) {
        if (h.values[i] == HistoryRecord::NotLogged)
            continue;
        flags[i] = '1';
        values += signedNum(h.values[i], 6);
    }
    r += flags + values + signedNum(more ? 0 : 1, 6);
    return r + "histy";
}

QByteArray zeroHistoryRecord(int count, bool more)
{
    QByteArray r = "00/00/" + signedNum(0, 6) + "00:00" + signedNum(count, 6);
    r += QByteArray(Channels, '1') + QByteArray(224 - Channels, '0');
    for (int i = 0; i < Channels; ++i)
        r += signedNum(0, 6);
    return r + signedNum(more ? 0 : 1, 6) + "histy";
}

QByteArray powerRecord(const PowerRecord& p, int count, bool more)
{
    QByteArray r = logStamp(p.end);
    r += signedNum(count, 6);
    r += signedNum(p.seconds, 6);
    r += signedNum(p.watts, 9);
    r += more ? "0" : "1";
    return r + "power";
}

QByteArray noDataReply(const QByteArray& token)
{
    return "no data log" + token;
}

QByteArray panelName(int number)
{
    static const char* const names[] = {
        "Chan's Connected", "Chan's Comp Bank", "Channels To Scan", "Set Scan YES/NO ", "Set Scan Time   ",
        "Set Temperature ", "Set Differential", "Diff'tial  Type ", "Soft Defrost Y/N", "High Alarm Temp ",
        "Low Alarm Temp  ", "Hi Tmp Alm Delay", "Lo Tmp Alm Delay", "High Alarm KPA  ", "Low Alarm  KPA  ",
        "Hi KPA Alm Delay", "Lo KPA Alm Delay", "Set Point Times ", "Set Defrost's   ", "Auto Def's Times",
        "Auto Defrost Y/N", "Do Man'l Defrost", "Comp'ors in Bank", "Compressor Type ", "Liq Low Lev Alm ",
        "Cond'ers in Bank", "Liquid Low Reset", "Unit Number ID  ", "Set Fans Control", "Set Data Logging",
        "4 Data Log Times", "P-ON Start Delay", "Cooling-Heating ", "Set Time & Date ", "4-20  Input Span",
        "Password YES/NO ", "Change Password ", "Set RS232 Port  ", "Liq Hi Lev Alarm", "Liq Hi Lev Reset",
        "Reset Max - Min ", "Daily Set Points", "Type of Control ", "Max Channels on ", "Min Channels on ",
        "CH.Turn on Delay", "LED Brightness  ", "Ctl No2 on Delay", "Associate Chan's", "Chan Description",
        "Long Term Store ", "Manual Turn OFF ", "Print-Out Times ", "4 Print Times   ", "Comp ON/OFF w Ch",
        "Fan Man 1 Day Wk", "Start-Start Time", "Comp Slow Load  ", "Comp Fast Load  ", "Fast Load Suc Pr",
        "Pump Down St Pnt", "Compre Set Point", "Compre Diff'tial", "Compres Rotation", "Compr Rotate Sel",
        "Compr Fixed Sel ", "Conden Set Point", "Conden Diff'tial", "Liq Pump Fail SP", "Liq Pump Reprime",
        "Comp Equal Sol'd", "Reset Cal Offset", "Cal Hi Values Ck", "Cal Lo Values Ck", "Calibrate Sensor",
        "Reset Data Log  ", "Ram Memory Check", "Test Displays   ", "Number of Resets", "Reset Password  ",
        "Default Par Set ", "Comp Stages Invt", "Comp Ct PRES-TMP", "Type Temp Sensor", "Do 4_20ma Offset",
        "Comp Unload Time", "Number of Banks ", "Key Select Delay", "Cond Load Time  ", "Cond Unload Time",
        "Conden Fixed Sel", "Condenser Type  ", "Print Data Log  ", "Print Max-Min   ", "Print Set Points",
        "Print Alarm Log ", "Print Now       ", "Printer Output  ", "On if in Defrost", "If in Defrost ON",
        "Load Shed Prio", "Load Shed Time  ", "Load Shed Const ", "Contract Rate   ", "Print Line Width",
        "Defrost/s Cancel", "Hi Lo Level Alms", "Auto Reset Hi Ll", "Auto Reset Time ", "Ld Shd Chan Only",
        "Ld Shd Pulse Del", "Print Power Used", "Chan Cont'l Type", "PidChDly,S-H Use", "Reset Comp Hours",
        "Reset Cond Hours", "Set RS485 Port  ", "Liq Lev Set Pnt ", "Liq Lev Diff'al ",
    };
    if (number < 1 || number > int(std::size(names)))
        return fixed("", 16);
    return fixed(names[number - 1], 16);
}

namespace {

bool isTenths(int function)
{
    switch (function) {
    case 5: case 6: case 9: case 10: case 35: case 36: case 79: case 83: case 121:
        return true;
    default:
        return false;
    }
}

// The function behind a panel number and the row it reads, or nullptr.
const Function* panelFunction(int number, int channel, int& row)
{
    const Function* f = function(number - 1);
    if (!f || f->fields.isEmpty() || f->fields[0] < 0)
        return nullptr;
    if (!f->global && (channel < f->firstChannel || channel > f->lastChannel))
        return nullptr;
    row = f->global ? 0 : channel - 1;
    return f;
}

} // namespace

void FrontPanel::press(InstrumentState& s, int key)
{
    auto wrap = [](int v, int lo, int hi) { return v < lo ? hi - (lo - v - 1) % (hi - lo + 1) : lo + (v - lo) % (hi - lo + 1); };
    switch (key) {
    case 1: number = wrap(number + 1, 1, 119); break;
    case 2: number = wrap(number - 1, 1, 119); break;
    case 3: channel = wrap(channel + 1, 1, Channels); break;
    case 4: channel = wrap(channel - 1, 1, Channels); break;
    case 5:
    case 6: {
        int row = 0;
        const Function* f = panelFunction(number, channel, row);
        if (f && f->number != 49)
            s.setField(row, f->fields[0], s.field(row, f->fields[0]) + (key == 5 ? 1 : -1));
        break;
    }
    case 7: number = wrap(number + 10, 1, 119); break;
    case 8: number = wrap(number - 10, 1, 119); break;
    case 9: channel = wrap(channel + 10, 1, Channels); break;
    case 10: channel = wrap(channel - 10, 1, Channels); break;
    case 11: number = 6, channel = 1; break;
    default: break;
    }
}

QByteArray frontReply(const InstrumentState& s, const FrontPanel& panel)
{
    const int width = s.versionNumber() >= 7 ? 20 : 16;
    int row = 0;
    const Function* f = panelFunction(panel.number, panel.channel, row);
    QByteArray value = "  ----  ";
    QByteArray line4 = "Not on this channel";
    if (f) {
        const int raw = s.field(row, f->fields[0]);
        if (f->number == 49) {
            value = fixed(s.description(row), 8);
        } else if (isTenths(f->number)) {
            value = QByteArray::number(raw / 10.0, 'f', 1);
        } else if (isTimeGroup(f->number)) {
            value = QStringLiteral("%1:%2").arg(raw / 60, 2, 10, QLatin1Char('0')).arg(raw % 60, 2, 10, QLatin1Char('0')).toLatin1();
        } else {
            value = QByteArray::number(raw);
        }
        value = value.rightJustified(8, ' ', true);
        line4 = "Value " + value.trimmed();
    }
    bool alarm = false, defrost = false, liquid = false, comp = false, cond = false;
    for (int n = 1; n <= 200; ++n) {
        alarm = alarm || s.room(n).alarm;
        defrost = defrost || s.room(n).defrost;
        liquid = liquid || s.room(n).liquid;
    }
    for (int i = 0; i < s.compressorCount(); ++i)
        comp = comp || s.compressor(i).running;
    for (int i = 0; i < s.condenserCount(); ++i)
        cond = cond || s.condenser(i).running;
    QByteArray r;
    r += fixed(panelName(panel.number).trimmed(), width);
    r += fixed("Function No. " + QByteArray::number(panel.number), width);
    r += fixed("Ch " + QByteArray::number(panel.channel) + " " + s.description(panel.channel - 1), width);
    r += fixed(line4, width);
    r += fixed(value, 8);
    r += num(panel.channel, 6);
    for (bool lamp : {alarm, defrost, liquid, comp, cond, true, true, false})
        r += lamp ? "1" : "0";
    return r + "tempfront";
}

QByteArray brumaletStartReply(int channel)
{
    return QByteArray::number(channel).rightJustified(3, '0') + "dxstart";
}

QByteArray brumaletReply(const InstrumentState& s, int channel)
{
    Layout r;
    r.setZeroPadded(s.quirks.zeroPadded);
    r.put(1, num(channel, 7));
    r.put(8, stamp(s.now()));
    const int kind = s.brumaletKind(channel);
    int room = channel >= 1 && channel <= Channels ? s.reading(channel) : NotConnected;
    if (s.quirks.special)
        room = s.quirks.special;
    const bool special = room <= NotConnected && room >= LoadShed;
    for (int i = 0; i < 27; ++i) {
        int value = 0;
        if (i <= 9 || (i >= 12 && i <= 14))
            value = special ? room : room - 40 + 15 * i; // coil and air temperatures
        else if (i == 17)
            value = NotConnected; // set value automatic
        else if (i == 21)
            value = 6; // R 404A
        else if (i == 16 || i == 26)
            value = NotConnected;
        else
            value = 10 * i;
        r.putNum(5 * i + 27, value, 5);
    }
    if (kind)
        r.putNum(147, kind, 5);
    else
        r.put(147, "-----");
    return r.text() + "evapfrst";
}

} // namespace sim
