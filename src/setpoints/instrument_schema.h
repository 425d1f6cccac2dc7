#pragma once

// The tables of an instrument's data base (gl.db, and t-<id>.db which is a
// copy of it), generated from the set point catalogue so that the template
// and the program cannot disagree about a field, a range or a row of `info`.

#include "platform/store.h"
#include "platform/store_layout.h"

#include <QList>
#include <QString>
#include <QVariant>

constexpr int kInstrumentSchemaVersion = 1;

inline const QString kSetpointsTable = QStringLiteral("setpoints");
inline const QString kHistoryTable = QStringLiteral("History");
inline const QString kPowerTable = QStringLiteral("Power");
inline const QString kAlarmLogTable = QStringLiteral("Alarm Log");

constexpr int kHistoryChannels = 216;

QStringList instrumentTables();
QList<Store::Column> setpointsColumns();
QList<Store::Column> infoColumns();
QList<Store::Column> historyColumns();
QList<Store::Column> powerColumns();
QList<Store::Column> alarmLogColumns();

// One row of `info` in its validation role (columns 0..4). The first 220 rows
// follow the upload record; then fields 223..227 (default 20, 0..100), the
// channel number and the spare field 47, so that every row names a field.
// The description row (6) has no limits.
struct InfoValidationRow {
    QString name;
    QVariant defaultValue;
    int field = 0;
    QVariant minimum;
    QVariant maximum;
};
QList<InfoValidationRow> infoValidationRows();

// The template's value of a `setpoints` cell (row = wire channel).
QVariant templateSetpoint(int row, int field);
// The template's whole `info` row, kInfoColumns values (Null where unused).
QVariantList templateInfoRow(int row);

// Writes a new instrument data base with the five tables and the seeded rows
// of `setpoints` and `info`, in one transaction, stamped with
// kInstrumentSchemaVersion. The file must not exist; on failure nothing is
// left behind and the reason is in *error.
bool createInstrumentTemplate(const QString& path, QString* error = nullptr);
