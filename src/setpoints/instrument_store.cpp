#include "setpoints/instrument_store.h"

#include "setpoints/catalogue.h"
#include "setpoints/instrument_schema.h"

namespace {

bool fail(QString* error, const QString& message)
{
    if (error)
        *error = message;
    return false;
}

bool validCell(int row, int rows, int field, int fields)
{
    return row >= 0 && row < rows && field >= 0 && field < fields;
}

} // namespace

std::unique_ptr<InstrumentStore> InstrumentStore::open(const QString& path, QString* error)
{
    std::unique_ptr<Store> store = Store::open(path, error);
    if (!store)
        return nullptr;
    for (const QString& table : instrumentTables()) {
        if (!store->hasTable(table)) {
            fail(error, QStringLiteral("%1 has no table \"%2\"").arg(path, table));
            return nullptr;
        }
    }
    std::unique_ptr<Recordset> setpoints = store->openRecordset(kSetpointsTable);
    std::unique_ptr<Recordset> info = store->openRecordset(kInfoTable);
    if (!setpoints || !info) {
        fail(error, store->lastError());
        return nullptr;
    }
    if (setpoints->RecordCount() != catalogue::kChannels || setpoints->fieldCount() < catalogue::kSetpointFields) {
        fail(error, QStringLiteral("The table \"setpoints\" of %1 needs %2 rows of %3 fields")
                        .arg(path)
                        .arg(catalogue::kChannels)
                        .arg(catalogue::kSetpointFields));
        return nullptr;
    }
    if (info->RecordCount() < kInfoRows || info->fieldCount() < kInfoColumns) {
        fail(error, QStringLiteral("The table \"info\" of %1 needs %2 rows of %3 fields")
                        .arg(path)
                        .arg(kInfoRows)
                        .arg(kInfoColumns));
        return nullptr;
    }
    std::unique_ptr<InstrumentStore> s(new InstrumentStore);
    s->m_store = std::move(store);
    s->m_setpoints = std::move(setpoints);
    s->m_info = std::move(info);
    s->m_setpoints->MoveFirst();
    s->m_info->MoveFirst();
    return s;
}

QVariant InstrumentStore::setpoint(int wireChannel, int field)
{
    if (!validCell(wireChannel, m_setpoints->RecordCount(), field, m_setpoints->fieldCount()))
        return {};
    return m_setpoints->cell(wireChannel, field);
}

bool InstrumentStore::setSetpoint(int wireChannel, int field, const QVariant& value)
{
    if (!validCell(wireChannel, m_setpoints->RecordCount(), field, m_setpoints->fieldCount()))
        return false;
    return m_setpoints->setCell(wireChannel, field, value);
}

QVariant InstrumentStore::info(int row, int field)
{
    if (!validCell(row, m_info->RecordCount(), field, m_info->fieldCount()))
        return {};
    return m_info->cell(row, field);
}

bool InstrumentStore::setInfo(int row, int field, const QVariant& value)
{
    if (!validCell(row, m_info->RecordCount(), field, m_info->fieldCount()))
        return false;
    return m_info->setCell(row, field, value);
}

QVariant InstrumentStore::value(const catalogue::Function& f, int channel, int subfunction)
{
    const int field = f.field(subfunction);
    if (field == catalogue::kNoField)
        return {};
    return setpoint(f.storeRow(channel), field);
}

bool InstrumentStore::setValue(const catalogue::Function& f, int channel, int subfunction, const QVariant& value)
{
    const int field = f.field(subfunction);
    if (field == catalogue::kNoField)
        return false;
    return setSetpoint(f.storeRow(channel), field, value);
}

bool store_checked(Recordset& setpoints, const Recordset& info, const QVariant& value, int field, int& invalid)
{
    const QVariant stored = catalogue::checkedValue(value, info.value(kInfoDefault), info.value(kInfoMinimum),
                                                    info.value(kInfoMaximum), &invalid);
    return setpoints.setValue(field, stored);
}
