#include "directory/demo_store.h"

#include "setpoints/catalogue.h"
#include "setpoints/channel_record_codec.h"
#include "setpoints/instrument_store.h"
#include "sim/sim_replies.h"
#include "sim/sim_state.h"

namespace {

using channel_record::RecordValue;
using channel_record::ValueKind;

// One channel's record into the current row of setpoints (in Edit). False
// when a value is refused by its range.
bool storeRecord(Recordset& sp, Recordset& info, const QString& record, int wire, double version)
{
    int invalid = 0;
    for (const RecordValue& v : channel_record::uploadLayout(wire, version)) {
        const QString text = channel_record::valueText(record, v);
        switch (v.kind) {
        case ValueKind::Description:
            sp.setValue(v.field, text);
            break;
        case ValueKind::Unchecked: {
            double n = 0;
            const channel_record::UncheckedRange range = channel_record::uncheckedRange(v.field);
            if (!catalogue::numericValue(text, &n) || n < range.min || n > range.max)
                return false;
            sp.setValue(v.field, catalogue::storeNumber(n));
            break;
        }
        case ValueKind::Checked:
            info.setAbsolutePosition(v.infoRow);
            store_checked(sp, info, channel_record::uploadNumber(text), v.field, invalid);
            break;
        }
        if (invalid)
            return false;
    }
    return true;
}

} // namespace

bool fillDemoSetpoints(const QString& dbPath, QString* error)
{
    // The simulator as the built-in line starts it, without the day of plant
    // history it runs to fill its logs: the set points do not depend on it.
    sim::Options options;
    options.historyHours = 0;
    const sim::InstrumentState instrument(options);
    const double version = instrument.versionNumber();

    std::unique_ptr<InstrumentStore> store = InstrumentStore::open(dbPath, error);
    if (!store)
        return false;
    Recordset& sp = store->setpointsTable();
    Recordset& info = store->infoTable();
    Store::Transaction tx(store->store());
    for (int wire = 0; wire < sim::Channels; ++wire) {
        const QString record = channel_record::widenedRecord(
            QString::fromLatin1(sim::channelRecord(instrument, wire)), wire, version);
        sp.setAbsolutePosition(wire);
        sp.Edit();
        if (!storeRecord(sp, info, record, wire, version)) {
            sp.CancelUpdate();
            if (error)
                *error = QStringLiteral("The demo instrument's set points of channel %1 are out of range.")
                             .arg(wire + 1);
            return false;
        }
        if (!sp.Update()) {
            if (error)
                *error = sp.lastError();
            return false;
        }
    }
    if (!tx.commit()) {
        if (error)
            *error = store->store().lastError();
        return false;
    }
    sp.MoveFirst();
    return true;
}
