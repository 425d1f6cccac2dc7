#pragma once

// The record of every write that leaves the workstation for the instrument:
// single set point writes (P commands) and channel downloads. It lives in the
// instrument's own data base, table "Audit Trail", so that the history of a
// plant's configuration travels with its copy of the set points.

#include <QDateTime>
#include <QList>
#include <QString>
#include <QVariant>
#include <memory>

class Store;
class Recordset;
class Clock;

inline const QString kAuditTable = QStringLiteral("Audit Trail");

struct AuditEntry {
    QDateTime time;
    QString kind;     // "P" for a set point write, "d" for a channel download
    int function = -1; // -1: none (a download carries all of a channel's values)
    int channel = 0;   // the operator's channel, 1..216; 0 for a global value
    int subfunction = -1;
    QString oldValue;
    QString newValue;  // the value as it went on the wire (a download: its record)
    QString outcome;   // "X" confirmed, "V" abandoned, empty while under way
};

class AuditTrail {
public:
    // Creates the table in the store when it is not there yet. Null (with the
    // reason in *error) when the store refuses.
    static std::unique_ptr<AuditTrail> open(Store& store, Clock& clock, QString* error = nullptr);
    ~AuditTrail();

    // A write as it goes out; returns its entry number for setOutcome().
    int begin(const QString& kind, int function, int channel, int subfunction,
              const QString& oldValue, const QString& newValue);
    // "X" when the instrument confirmed, "V" when the write was abandoned.
    bool setOutcome(int entry, const QString& outcome);
    QList<AuditEntry> entries();
    // The newest entry; its kind is empty when there is none.
    AuditEntry last();

private:
    AuditTrail(Store& store, Clock& clock, std::unique_ptr<Recordset> rows);
    AuditEntry current() const;
    Store& m_store;
    Clock& m_clock;
    std::unique_ptr<Recordset> m_rows;
};
