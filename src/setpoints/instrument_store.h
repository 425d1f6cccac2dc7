#pragma once

// Typed access to an instrument's data base: the `setpoints` row of a channel
// and the cells of `info`, by position and ordinal as every view reads them.

#include "platform/store.h"

#include <QString>
#include <QVariant>
#include <memory>

namespace catalogue {
struct Function;
}

class InstrumentStore {
public:
    // Opens t-<id>.db (or gl.db). Null with the reason in *error when the file
    // is missing, not one of ours, or lacks a table, a row or a column that
    // the program addresses.
    static std::unique_ptr<InstrumentStore> open(const QString& path, QString* error = nullptr);

    InstrumentStore(const InstrumentStore&) = delete;
    InstrumentStore& operator=(const InstrumentStore&) = delete;

    Store& store() { return *m_store; }
    Recordset& setpointsTable() { return *m_setpoints; }
    Recordset& infoTable() { return *m_info; }

    // A cell of `setpoints`: the row is the wire channel (0..215). The
    // record sets' positions are put back afterwards.
    QVariant setpoint(int wireChannel, int field);
    bool setSetpoint(int wireChannel, int field, const QVariant& value);
    // A cell of `info` by row position and ordinal.
    QVariant info(int row, int field);
    bool setInfo(int row, int field, const QVariant& value);

    // A catalogue value of the 1-based channel on the screen: row 0 for a
    // global function. Null for a sub-function without a field.
    QVariant value(const catalogue::Function& f, int channel, int subfunction);
    bool setValue(const catalogue::Function& f, int channel, int subfunction, const QVariant& value);

private:
    InstrumentStore() = default;
    std::unique_ptr<Store> m_store;
    std::unique_ptr<Recordset> m_setpoints;
    std::unique_ptr<Recordset> m_info;
};

// Writes one value of an upload reply into the current row of `setpoints`
// (which must be in Edit), checked against the current row of `info`: the
// value if it is numeric and within `info` ordinals 3..4, else the default of
// ordinal 1 with invalid set to 1. Neither row moves and Update is not called.
// Returns what the store answered to the write.
bool store_checked(Recordset& setpoints, const Recordset& info, const QVariant& value, int field, int& invalid);
