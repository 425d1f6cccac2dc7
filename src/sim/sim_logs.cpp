// The instrument's alarm log and its active alarms.

#include "sim/sim_state.h"

namespace sim {

void InstrumentState::logAlarm(int channel, int kind, int value)
{
    AlarmRecord a;
    a.channel = channel;
    a.description = channel >= 1 && channel <= Channels ? m_desc[channel - 1] : QByteArray("Input ");
    a.kind = kind;
    a.time = now();
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

} // namespace sim
