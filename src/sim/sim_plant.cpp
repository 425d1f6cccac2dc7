// The demo plant: rooms that cool and defrost as their set points say,
// suction groups and condensers that stage to hold their pressures, and the
// minute's events that fill the data and power logs.

#include "sim/sim_state.h"

#include <QtMath>

namespace sim {

namespace {
constexpr double StepSeconds = 5.0;
} // namespace

double InstrumentState::noise(double amplitude)
{
    return (m_rng.generateDouble() * 2 - 1) * amplitude;
}

int InstrumentState::activeSetPoint(int row) const
{
    const auto& f = m_sp[row];
    const int day = m_weekDay;
    const int mask = f[54 + day] & 15;
    const int minute = m_minuteOfDay;
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

void InstrumentState::readClock()
{
    const QDateTime t = now();
    m_minuteOfDay = t.time().hour() * 60 + t.time().minute();
    m_weekDay = t.date().dayOfWeek() % 7;
}

void InstrumentState::advance(qint64 ms)
{
    m_carryMs += ms;
    const qint64 stepMs = qint64(StepSeconds * 1000);
    while (m_carryMs >= stepMs) {
        m_carryMs -= stepMs;
        const qint64 minuteBefore = m_nowMs / 60000;
        m_nowMs += stepMs;
        const bool newMinute = m_nowMs / 60000 != minuteBefore;
        if (newMinute)
            readClock();
        step(StepSeconds);
        if (newMinute)
            minuteEvents();
    }
}

void InstrumentState::stepPlantRoom(double dt)
{
    const int minute = m_minuteOfDay;
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
        roomAlarms(w, idx, dt);
    }
}

void InstrumentState::roomAlarms(int w, int idx, double dt)
{
    const int n = w + 1;
    auto& r = m_rooms[w];
    const auto& f = m_sp[w];
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
    const int minute = m_minuteOfDay;
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
    rec.time = now();
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
        p.end = now();
        p.seconds = int(qRound(m_quarterSeconds));
        p.watts = int(m_energy / m_quarterSeconds);
        power.add(p);
        m_energy = 0;
        m_quarterSeconds = 0;
    }
}

} // namespace sim
