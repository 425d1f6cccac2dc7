#include "sim/sim_state.h"

#include <QtMath>

namespace sim {

namespace {

constexpr double StepSeconds = 5.0;

bool isRoom(int channel) { return channel >= 1 && channel <= 30; }
bool isSensor(int channel) { return channel >= 101 && channel <= 110; }
bool isPressureInput(int channel) { return channel >= 196 && channel <= 210; }

// Capacity units of a compressor of a kind: the stages of a staged one, the
// unloaded and loaded halves of a screw, quarters of a variable one.
int unitsOfKind(int kind)
{
    if (kind >= 0 && kind <= 6)
        return kind + 1;
    if (kind == 7)
        return 8;
    if (kind == 9 || kind == 10)
        return 4;
    return 2;
}

} // namespace

InstrumentState::InstrumentState(const Options& options)
    : m_options(options), m_version(options.version), m_resets(options.resets), m_rng(options.seed)
{
    alarms.capacity = options.alarmCapacity;
    history.capacity = options.historyCapacity;
    power.capacity = options.powerCapacity;
    const QDateTime start = options.start.isValid() ? options.start : QDateTime::currentDateTime();
    m_now = start.addSecs(-qint64(options.historyHours) * 3600);
    m_now = m_now.addMSecs(-m_now.time().msec());
    seed();
    // Let the plant run up to the start so that the logs hold a past.
    advance(qint64(options.historyHours) * 3600 * 1000);
    m_newAlarm = false;
}

void InstrumentState::setDescription(int wire, const QByteArray& d)
{
    m_desc[wire] = d.leftJustified(6, ' ', true);
}

void InstrumentState::seed()
{
    for (int w = 0; w < Channels; ++w) {
        const int n = w + 1;
        auto& f = m_sp[w];
        f[0] = n;
        f[1] = (isRoom(n) || isSensor(n) || isPressureInput(n)) ? 1 : 0;
        f[85] = 0;
        f[86] = 0, f[87] = 360, f[88] = 720, f[89] = 1080;
        f[90] = f[1] ? 2 : 0;
        f[91] = 0, f[92] = 360, f[93] = 720, f[94] = 1080;
        if (isRoom(n))
            setDescription(w, QStringLiteral("Room%1").arg(n, 2, 10, QLatin1Char('0')).toLatin1());
        else if (isSensor(n))
            setDescription(w, QStringLiteral("Sens%1").arg(n - 100, 2, 10, QLatin1Char('0')).toLatin1());
        else if (isPressureInput(n))
            setDescription(w, QStringLiteral("Pres%1").arg(n - 195, 2, 10, QLatin1Char('0')).toLatin1());
        else
            setDescription(w, "Ch " + QByteArray::number(n));
        // Bank 1 holds the freezers, bank 2 the chill rooms.
        const int sp = n <= 20 ? -220 : 30;
        if (n <= 200) {
            const int hi = isRoom(n) ? sp + 60 : 400;
            const int lo = isRoom(n) ? sp - 60 : -300;
            for (int i = 0; i < 4; ++i)
                f[14 + i] = hi, f[19 + i] = lo, f[6 + i] = 0;
            f[18] = 30, f[23] = 30;
            for (int d = 0; d < 7; ++d)
                f[54 + d] = 1;
        }
        if (n <= 100) {
            f[48] = 1, f[49] = 1, f[50] = 1, f[44] = 0, f[43] = 1, f[52] = 0, f[53] = 0;
            f[2] = sp, f[3] = sp + 10, f[4] = sp - 10, f[5] = sp;
            f[29] = 20, f[30] = 1, f[31] = 5, f[32] = 2, f[33] = 0, f[34] = 0;
            const int base = (n * 17) % 360;
            for (int i = 0; i < 8; ++i)
                f[35 + i] = base + 360 * qMin(i, 3);
            f[51] = 0, f[209] = 0;
            f[26] = f[27] = f[28] = 215;
            f[10] = 20, f[11] = 0, f[45] = 0, f[95] = 0, f[46] = 0, f[98] = 0, f[13] = 0, f[210] = 30, f[12] = 0;
            f[223] = 20, f[224] = 0, f[225] = 20, f[226] = 10, f[227] = 10;
        }
        if (n <= 27) {
            // 2-stage, screw, 1-stage, variable; 2-stage, 1-stage, screw
            // with variable drive. Both screws carry a Torvanel.
            static const int kinds[] = {1, 8, 0, 9, 1, 0, 10};
            f[168] = 20;
            f[165] = n <= 7 ? kinds[n - 1] : 0;
            f[166] = 10, f[207] = n, f[167] = (n == 1 || n == 3) ? 5 : 0;
        }
        if (n <= 15)
            f[202] = 1500, f[203] = -50, f[204] = 10, f[205] = 10;
        if (n <= 12) {
            static const int kinds[] = {1, 0, 4, 2};
            f[170] = 30, f[206] = n, f[169] = n <= 4 ? kinds[n - 1] : 0;
        }
    }
    // Room 2 watches a sensor and a pressure input; rooms 3 and 4 run PID
    // and evaporator control.
    m_sp[1][26] = 100, m_sp[1][27] = 195;
    m_sp[2][209] = 4;
    m_sp[3][209] = 5;
    auto& g = m_sp[0];
    g[76] = 90, g[77] = 80;
    for (int b = 0; b < 5; ++b) {
        g[61 + b] = 100, g[66 + b] = 0, g[71 + b] = 5;
        g[110 + b] = 60, g[115 + b] = 10, g[120 + b] = 250, g[125 + b] = 150;
        g[100 + b] = b == 0 ? 120 : 300, g[105 + b] = 40;
        g[135 + b] = 1200, g[140 + b] = 150, g[181 + b] = 300, g[186 + b] = 350;
        g[171 + b] = 0, g[176 + b] = 0, g[130 + b] = 30, g[145 + b] = 60, g[150 + b] = 60;
        g[196 + b] = 0, g[191 + b] = 10, g[213 + b] = 0, g[218 + b] = 0;
    }
    g[78] = 20, g[79] = 10, g[80] = g[81] = g[82] = 0;
    g[155] = 4, g[156] = 3, g[157] = g[158] = g[159] = 0;
    g[160] = 2, g[161] = 2, g[162] = g[163] = g[164] = 0;
    g[84] = 10, g[83] = 2, g[96] = 30, g[97] = 100, g[208] = 250, g[201] = 0, g[99] = 50;
    g[211] = 60, g[212] = 10;

    for (int c = 0; c < Channels; ++c) {
        auto& r = m_rooms[c];
        const int n = c + 1;
        if (isRoom(n))
            r.value = m_sp[c][2] + noise(10);
        else if (isSensor(n))
            r.value = 120 + noise(50);
        else if (isPressureInput(n))
            r.value = n <= 200 ? 3000 + noise(500) : 800 + noise(100);
    }
    // A few inputs that read a special value.
    m_rooms[106].special = OverRange;
    m_rooms[107].special = NoSensor;
    m_rooms[108].special = LoadShed;
    for (int b = 0; b < 5; ++b) {
        m_suction[b] = m_sp[0][100 + b] + 30;
        m_discharge[b] = 1100;
    }
    for (int i = 0; i < 27; ++i) {
        m_comp[i].units = unitsOfKind(m_sp[i][165]);
        m_comp[i].hours = 1000 + m_rng.bounded(9000);
    }
    for (int i = 0; i < 12; ++i) {
        m_cond[i].stages = m_sp[i][169] == 4 ? 64 : qBound(1, m_sp[i][169] + 1, 4);
        m_cond[i].hours = 500 + m_rng.bounded(5000);
    }
    // The screw compressor's Torvanel reports its oil level switch.
    m_torvanel[1][22] = true;
}

double InstrumentState::noise(double amplitude)
{
    return (m_rng.generateDouble() * 2 - 1) * amplitude;
}

int InstrumentState::reading(int channel) const
{
    const int w = channel - 1;
    if (w < 0 || w >= Channels)
        return NotConnected;
    if (!m_sp[w][1])
        return NotConnected;
    if (m_rooms[w].special)
        return m_rooms[w].special;
    return int(qRound(m_rooms[w].value));
}

int InstrumentState::compressorCount() const
{
    int n = 0;
    for (int b = 0; b < 5; ++b)
        n += m_sp[0][155 + b];
    return qMin(n, 27);
}

int InstrumentState::compressorBank(int i) const
{
    int end = 0;
    for (int b = 0; b < 5; ++b) {
        end += m_sp[0][155 + b];
        if (i < end)
            return b;
    }
    return 0;
}

int InstrumentState::condenserCount() const
{
    int n = 0;
    for (int b = 0; b < 5; ++b)
        n += m_sp[0][160 + b];
    return qMin(n, 12);
}

bool InstrumentState::liquidPump(int bank) const
{
    int first = 0;
    for (int b = 0; b < bank; ++b)
        first += m_sp[0][155 + b];
    for (int i = first; i < qMin(27, first + m_sp[0][155 + bank]); ++i)
        if (m_comp[i].running)
            return true;
    return false;
}

bool InstrumentState::torvanelAlarm(int s, int i) const
{
    return s >= 0 && s < 27 && i >= 0 && i <= 40 && m_torvanel[s][i];
}

void InstrumentState::setTorvanelAlarm(int s, int i, bool on)
{
    if (s >= 0 && s < 27 && i >= 0 && i <= 40)
        m_torvanel[s][i] = on;
}

int InstrumentState::brumaletKind(int channel) const
{
    if (channel == 5)
        return 1;
    if (channel == 6)
        return 2;
    return 0;
}

int InstrumentState::activeSetPoint(int row) const
{
    const auto& f = m_sp[row];
    const int day = m_now.date().dayOfWeek() % 7; // Sunday 0
    const int mask = f[54 + day] & 15;
    const int minute = m_now.time().hour() * 60 + m_now.time().minute();
    int chosen = -1;
    for (int i = 0; i < 4; ++i)
        if ((mask & (1 << i)) && f[6 + i] <= minute)
            chosen = i;
    if (chosen < 0)
        for (int i = 0; i < 4; ++i)
            if (mask & (1 << i)) {
                chosen = i;
                break;
            }
    return chosen < 0 ? 0 : chosen;
}

void InstrumentState::advance(qint64 ms)
{
    m_carryMs += ms;
    const qint64 stepMs = qint64(StepSeconds * 1000);
    while (m_carryMs >= stepMs) {
        m_carryMs -= stepMs;
        const qint64 minuteBefore = m_now.toSecsSinceEpoch() / 60;
        m_now = m_now.addMSecs(stepMs);
        step(StepSeconds);
        if (m_now.toSecsSinceEpoch() / 60 != minuteBefore)
            minuteEvents();
    }
}

void InstrumentState::stepPlantRoom(double dt)
{
    const int minute = m_now.time().hour() * 60 + m_now.time().minute();
    for (int w = 0; w < Channels; ++w) {
        const int n = w + 1;
        auto& r = m_rooms[w];
        const auto& f = m_sp[w];
        if (isSensor(n)) {
            r.value = 120 + 80 * qSin((minute + n * 40) * M_PI / 720.0) + noise(3);
        } else if (isPressureInput(n)) {
            // 196-200 read tenths, the inputs from 201 on whole KPA.
            const double level = n <= 200 ? 3000 : 800;
            r.value += (level - r.value) * dt / 600 + noise(n <= 200 ? 20 : 5);
        }
        if (n > 100 || !f[1])
            continue;
        const int idx = activeSetPoint(w);
        const double sp = f[2 + idx];
        const double diff = qMax(2, f[10]);
        double on = sp + diff / 2, off = sp - diff / 2;
        if (f[11] == 1)
            on = sp + diff, off = sp;
        else if (f[11] == 2)
            on = sp, off = sp - diff;
        const bool cooling = f[48] == 1;
        const bool control = f[50] == 1;
        if (r.defrostLeft > 0) {
            r.defrostLeft -= dt;
            r.defrost = true;
            r.liquid = false;
            if (r.defrostLeft <= 0) {
                r.defrost = false;
                m_sp[w][44] = 0;
            }
        } else if (!control) {
            r.liquid = false;
        } else if (cooling) {
            if (r.value >= on)
                r.liquid = true;
            else if (r.value <= off)
                r.liquid = false;
        } else {
            if (r.value <= sp - diff / 2)
                r.liquid = true;
            else if (r.value >= sp + diff / 2)
                r.liquid = false;
        }
        r.suction = r.liquid;
        r.fan = !r.defrost && (f[49] == 0 || r.liquid);
        const double ambient = 180;
        double target = ambient;
        double tau = 3600;
        if (r.defrost)
            target = 150, tau = 900;
        else if (r.liquid)
            target = cooling ? sp - 150 : sp + 150, tau = 1200;
        // Room 7's door stands open from 10:00 to 11:00 every day: more
        // heat than the coil can take, and an alarm after its delay.
        if (n == 7 && minute >= 600 && minute < 660)
            target = 250, tau = 400;
        r.value += (target - r.value) * dt / tau + noise(0.3);
        r.pidPercent = r.liquid ? qBound(0, int(50 + (r.value - sp) * 5), 100) : 0;
        r.fanPercent = r.fan ? qBound(20, int(60 + (r.value - sp) * 3), 100) : 0;

        // Alarms after their delays, not while defrosting.
        const int hi = f[14 + idx], lo = f[19 + idx];
        if (!r.defrost && r.value > hi)
            r.highFor += dt;
        else
            r.highFor = 0;
        if (!r.defrost && r.value < lo)
            r.lowFor += dt;
        else
            r.lowFor = 0;
        const bool high = r.highFor > f[18] * 60.0;
        const bool low = r.lowFor > f[23] * 60.0;
        if ((high || low) && !r.alarm) {
            r.alarm = true;
            logAlarm(n, high ? 1 : 2, reading(n));
        } else if (!high && !low && r.highFor == 0 && r.lowFor == 0) {
            r.alarm = r.latched;
        }
    }
}

void InstrumentState::step(double dt)
{
    stepPlantRoom(dt);

    // Suction groups: the rooms of a bank load it, its compressors stage
    // to hold the compressor set point.
    const auto& g = m_sp[0];
    int firstRoom = 1, firstComp = 0, firstCond = 0;
    double watts = 2000;
    for (int b = 0; b < 5; ++b) {
        const int rooms = g[78 + b], comps = qMin(g[155 + b], 27 - firstComp), conds = qMin(g[160 + b], 12 - firstCond);
        int load = 0, connected = 0;
        for (int n = firstRoom; n < firstRoom + rooms && n <= 100; ++n) {
            if (!m_sp[n - 1][1])
                continue;
            ++connected;
            load += m_rooms[n - 1].liquid ? 1 : 0;
        }
        int total = 0, running = 0;
        for (int i = firstComp; i < firstComp + comps; ++i)
            total += m_comp[i].units, running += m_comp[i].running;
        const double loadFrac = connected ? double(load) / connected : 0;
        const double capFrac = total ? double(running) / total : 0;
        m_suction[b] += (2.0 * (loadFrac + 0.15) - 2.5 * capFrac) * dt;
        m_suction[b] = qBound(-50.0, m_suction[b], 1500.0);
        m_stageClock[b] += dt;
        if (m_stageClock[b] >= 20) {
            m_stageClock[b] = 0;
            const double sp = g[100 + b], diff = qMax(10, g[105 + b]);
            int demand = running;
            if (m_suction[b] > sp + diff / 2 && demand < total)
                ++demand;
            else if (m_suction[b] < sp - diff / 2 && demand > 0)
                --demand;
            for (int i = firstComp; i < firstComp + comps; ++i) {
                m_comp[i].running = qMin(demand, m_comp[i].units);
                demand -= m_comp[i].running;
            }
        }
        int condTotal = 0, condRunning = 0;
        for (int i = firstCond; i < firstCond + conds; ++i)
            condTotal += m_cond[i].stages, condRunning += m_cond[i].running;
        const double heat = total ? double(running) / total : 0;
        const double cool = condTotal ? double(condRunning) / condTotal : 0;
        m_discharge[b] += (4.0 * heat - 4.0 * cool + (800 - m_discharge[b]) / 300.0) * dt;
        m_discharge[b] = qBound(0.0, m_discharge[b], 2500.0);
        m_condClock[b] += dt;
        if (m_condClock[b] >= 15) {
            m_condClock[b] = 0;
            const double sp = g[135 + b], diff = qMax(10, g[140 + b]);
            for (int i = firstCond; i < firstCond + conds; ++i) {
                auto& c = m_cond[i];
                const int stepSize = c.stages == 64 ? 8 : 1;
                if (m_discharge[b] > sp + diff / 2 && c.running < c.stages) {
                    c.running = qMin(c.stages, c.running + stepSize);
                    break;
                }
                if (m_discharge[b] < sp - diff / 2 && c.running > 0) {
                    c.running = qMax(0, c.running - stepSize);
                    break;
                }
            }
        }
        for (int i = firstComp; i < firstComp + comps; ++i) {
            m_comp[i].equalizer = m_sp[i][167] != 0 && m_comp[i].running == 0 && running > 0;
            if (m_comp[i].running)
                m_comp[i].hours += dt / 3600.0;
            watts += 3500.0 * m_comp[i].running;
        }
        for (int i = firstCond; i < firstCond + conds; ++i) {
            if (m_cond[i].running)
                m_cond[i].hours += dt / 3600.0;
            watts += 800.0 * m_cond[i].running / (m_cond[i].stages == 64 ? 16 : 1);
        }
        firstRoom += rooms, firstComp += comps, firstCond += conds;
    }
    m_level += (60 - m_level) * dt / 1800 + noise(0.2);
    m_energy += watts * dt;
    m_quarterSeconds += dt;
}

void InstrumentState::minuteEvents()
{
    const QTime t = m_now.time();
    const int minute = t.hour() * 60 + t.minute();
    // Defrosts at their times.
    for (int w = 0; w < 100; ++w) {
        auto& f = m_sp[w];
        if (!f[1])
            continue;
        bool due = f[44] == 1 && m_rooms[w].defrostLeft <= 0;
        if (f[43] == 1)
            for (int i = 0; i < 8; ++i)
                if (f[35 + i] == minute)
                    due = true;
        if (due && m_rooms[w].defrostLeft <= 0) {
            m_rooms[w].defrostLeft = qMax(1, f[29]) * 60.0;
            m_rooms[w].defrost = true;
            m_rooms[w].liquid = m_rooms[w].suction = m_rooms[w].fan = false;
        }
    }
    // Data log: schedule 1 at the four times, 2 hourly, 3 every 30, 4 every
    // 15, 5 every 5 minutes.
    HistoryRecord rec;
    rec.time = m_now;
    rec.values.fill(HistoryRecord::NotLogged, Channels);
    bool any = false;
    for (int w = 0; w < Channels; ++w) {
        const auto& f = m_sp[w];
        bool due = false;
        switch (f[90]) {
        case 1:
            due = minute == f[91] || minute == f[92] || minute == f[93] || minute == f[94];
            break;
        case 2: due = minute % 60 == 0; break;
        case 3: due = minute % 30 == 0; break;
        case 4: due = minute % 15 == 0; break;
        case 5: due = minute % 5 == 0; break;
        default: break;
        }
        if (due) {
            rec.values[w] = reading(w + 1);
            any = true;
        }
    }
    if (any)
        history.add(rec);
    // The power meter's quarter hours.
    if (minute % 15 == 0 && m_quarterSeconds > 0) {
        PowerRecord p;
        p.end = m_now;
        p.seconds = int(qRound(m_quarterSeconds));
        p.watts = int(m_energy / m_quarterSeconds);
        power.add(p);
        m_energy = 0;
        m_quarterSeconds = 0;
    }
}

void InstrumentState::logAlarm(int channel, int kind, int value)
{
    AlarmRecord a;
    a.channel = channel;
    a.description = channel >= 1 && channel <= Channels ? m_desc[channel - 1] : QByteArray("Input ");
    a.kind = kind;
    a.time = m_now;
    a.value = value;
    alarms.add(a);
    m_newAlarm = true;
}

void InstrumentState::raiseAlarm(int channel)
{
    if (channel >= 1 && channel <= 200)
        m_rooms[channel - 1].alarm = m_rooms[channel - 1].latched = true;
    logAlarm(channel, 1, channel <= Channels ? reading(channel) : 1);
}

bool InstrumentState::takeNewAlarm()
{
    const bool was = m_newAlarm;
    m_newAlarm = false;
    return was;
}

bool InstrumentState::clearAlarms()
{
    bool any = !alarms.records.isEmpty();
    for (auto& r : m_rooms) {
        any = any || r.alarm;
        r.alarm = r.latched = false;
        r.highFor = r.lowFor = 0;
    }
    alarms.clear();
    return any;
}

void InstrumentState::setCompressorKind(int row, int kind)
{
    m_sp[row][165] = kind;
    m_comp[row].units = unitsOfKind(kind);
}

} // namespace sim
