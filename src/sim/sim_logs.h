#pragma once

#include <QByteArray>
#include <QDateTime>
#include <QList>
#include <QVector>

namespace sim {

// The records of the instrument's three logs.
struct AlarmRecord {
    int channel = 0; // 1..264: 1-200 rooms, 201-215 pressures, 216 liquid level, 217-264 digital
    QByteArray description;
    int kind = 0; // 1 high, 2 low
    QDateTime time;
    int value = 0;
};

struct HistoryRecord {
    QDateTime time;
    QVector<int> values; // 216 entries; a channel not logged holds NotLogged
    static constexpr int NotLogged = -99999;
};

struct PowerRecord {
    QDateTime end;
    int seconds = 900;
    int watts = 0;
};

// A log of the instrument: a ring of the last capacity records and the
// mark of what has already gone up the line.
template <typename T>
struct Log {
    QList<T> records;
    int firstNew = 0;
    int capacity = 500;
    qint64 dropped = 0; // records that fell off the front, ever
    void add(const T& r)
    {
        records.append(r);
        while (records.size() > capacity) {
            records.removeFirst();
            firstNew = qMax(0, firstNew - 1);
            ++dropped;
        }
    }
    void clear()
    {
        dropped += records.size();
        records.clear();
        firstNew = 0;
    }
    // Everything up to end (counted as dropped + index) has gone up the line.
    void markSent(qint64 end) { firstNew = int(qBound<qint64>(firstNew, end - dropped, records.size())); }
    int newCount() const { return int(records.size()) - firstNew; }
};

} // namespace sim
