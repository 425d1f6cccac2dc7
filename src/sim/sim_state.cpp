#include "sim/sim_state.h"

#include <QtMath>

namespace sim {

namespace {

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
    const QDateTime from = start.addSecs(-qint64(options.historyHours) * 3600);
    m_nowMs = from.addMSecs(-from.time().msec()).toMSecsSinceEpoch();
    readClock();
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
    for (int w = 0; w < Channels; ++w)
        seedChannel(w);
    seedGlobals();
    seedPlant();
}

void InstrumentState::seedChannel(int w)
{
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

void InstrumentState::seedGlobals()
{
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
}

void InstrumentState::seedPlant()
{
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










void InstrumentState::setCompressorKind(int row, int kind)
{
    m_sp[row][165] = kind;
    m_comp[row].units = unitsOfKind(kind);
}

} // namespace sim
