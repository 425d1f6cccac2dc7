#include "setpoints/instrument_schema.h"

#include "setpoints/catalogue.h"

#include <QFile>
#include <QFileInfo>
#include <functional>

using catalogue::kChannels;
using catalogue::kSetpointFields;

namespace {

using Type = Store::ColumnType;

// Bank 1 starts with every temperature channel; the others are empty.
const int kChannelsInBank1 = catalogue::lastChannel(catalogue::Scope::Control);

QString paddedDescription(int channel)
{
    return QStringLiteral("Ch %1").arg(channel).leftJustified(catalogue::kDescriptionLength, QLatin1Char(' '));
}

// Default of a field regardless of the row: the catalogue's, and 0 where
// the catalogue names no value.
QVariant fieldDefault(int field)
{
    const catalogue::FieldOwner owner = catalogue::findField(field);
    if (owner.function)
        return owner.function->defaultValue;
    if (owner.untagged)
        return owner.untagged->defaultValue;
    return 0;
}

struct Limits {
    QVariant min, max;
};

Limits fieldLimits(int field)
{
    switch (field) {
    case catalogue::kLoadShedOrderField: return {0, kChannels};
    case catalogue::kCompressorOrderField: return {0, catalogue::lastChannel(catalogue::Scope::Compressor)};
    case catalogue::kCondenserOrderField: return {0, catalogue::lastChannel(catalogue::Scope::Condenser)};
    default: break;
    }
    const catalogue::FieldOwner owner = catalogue::findField(field);
    if (owner.function)
        return {owner.function->min, owner.function->max};
    return {0, 1}; // the check boxes' flags
}

bool within(int ordinal, int first, int count)
{
    return ordinal >= first && ordinal < first + count;
}

QString infoColumnName(int ordinal)
{
    switch (ordinal) {
    case kInfoName: return QStringLiteral("name");
    case kInfoDefault: return QStringLiteral("default_value");
    case kInfoField: return QStringLiteral("field");
    case kInfoMinimum: return QStringLiteral("minimum");
    case kInfoMaximum: return QStringLiteral("maximum");
    case kInfoShownChannelColumn: return QStringLiteral("view_channel");
    case kInfoGraphColumn: return QStringLiteral("graph");
    case kInfoGraphCaptionColumn: return QStringLiteral("graph_caption");
    case kInfoRoomChannelColumn: return QStringLiteral("room_channel");
    case kInfoBrumaletColumn: return QStringLiteral("brumalet_interval");
    case kInfoHeadingColumn: return QStringLiteral("report_heading");
    case kInfoDescriptionsColumn: return QStringLiteral("show_descriptions");
    case kInfoConnectionColumn: return QStringLiteral("connection");
    case kInfoTabNameColumn: return QStringLiteral("tab_name");
    case kInfoKindForeColumn: return QStringLiteral("kind_fore_colour");
    case kInfoKindBackColumn: return QStringLiteral("kind_back_colour");
    default: break;
    }
    if (within(ordinal, kInfoFirstProbeColumn, kInfoProbes))
        return QStringLiteral("room_probe_%1").arg(ordinal - kInfoFirstProbeColumn + 1, 2, 10, QLatin1Char('0'));
    static const char* const pane[info_pane::Columns] = {"tab",   "name",   "in_use", "channel",
                                                         "index", "colour", "room"};
    if (within(ordinal, kInfoPaneFirstColumn, info_pane::Columns))
        return QStringLiteral("pane_") + QLatin1String(pane[ordinal - kInfoPaneFirstColumn]);
    if (within(ordinal, kInfoPlantPaneFirstColumn, info_pane::Columns))
        return QStringLiteral("plant_pane_") + QLatin1String(pane[ordinal - kInfoPlantPaneFirstColumn]);
    if (within(ordinal, kInfoPlantTagFirstColumn, kInfoPlantTags))
        return QStringLiteral("plant_tag_%1").arg(ordinal - kInfoPlantTagFirstColumn + kInfoPlantFirstTag);
    return QStringLiteral("spare_%1").arg(ordinal, 2, 10, QLatin1Char('0'));
}

// The store turns what an Integer column is given into a whole number and
// refuses words, so every column that may hold a word, a decimal or a mix of
// both (the graph settings of column 8) is Text; the others read back as numbers.
bool infoColumnIsNumeric(int ordinal)
{
    switch (ordinal) {
    case kInfoDefault:
    case kInfoField:
    case kInfoMinimum:
    case kInfoMaximum:
    case kInfoShownChannelColumn:
    case kInfoRoomChannelColumn:
    case kInfoBrumaletColumn:
    case kInfoDescriptionsColumn:
    case kInfoKindForeColumn:
    case kInfoKindBackColumn:
        return true;
    default:
        break;
    }
    for (int pane : {kInfoPaneFirstColumn, kInfoPlantPaneFirstColumn})
        for (int c : {info_pane::Tab, info_pane::Index, info_pane::Colour})
            if (ordinal == pane + c)
                return true;
    return within(ordinal, kInfoFirstProbeColumn, kInfoProbes);
}

// Colours of the ten indicator kinds (blue, green, red order): fore, back.
constexpr int kKindBack[kInfoKinds] = {65280,    65535, 255,      16711680, 16776960,
                                       16711935, 33023, 12632256, 8421504,  16777215};

bool fail(QString* error, const QString& message)
{
    if (error)
        *error = message;
    return false;
}

bool fillTable(Store& store, const QString& table, int rows, const std::function<QVariantList(int)>& rowValues,
               QString* error)
{
    std::unique_ptr<Recordset> rs = store.openRecordset(table);
    if (!rs)
        return fail(error, store.lastError());
    for (int row = 0; row < rows; ++row) {
        if (!rs->AddNew())
            return fail(error, rs->lastError());
        const QVariantList values = rowValues(row);
        for (int c = 0; c < values.size(); ++c) {
            const QVariant& v = values.at(c);
            if (v.isValid() && !rs->setValue(c, v))
                return fail(error, rs->lastError());
        }
        if (!rs->Update())
            return fail(error, rs->lastError());
    }
    return true;
}

} // namespace

QStringList instrumentTables()
{
    return {kSetpointsTable, kInfoTable, kHistoryTable, kPowerTable, kAlarmLogTable};
}

QList<Store::Column> setpointsColumns()
{
    QList<Store::Column> columns;
    for (int field = 0; field < kSetpointFields; ++field) {
        const bool text = field == catalogue::kDescriptionField || field == catalogue::kChannelTextField;
        columns.append({catalogue::fieldColumnName(field), text ? Type::Text : Type::Integer});
    }
    return columns;
}

QList<Store::Column> infoColumns()
{
    QList<Store::Column> columns;
    for (int c = 0; c < kInfoColumns; ++c)
        columns.append({infoColumnName(c), infoColumnIsNumeric(c) ? Type::Integer : Type::Text});
    return columns;
}

QList<Store::Column> historyColumns()
{
    // Channel values are "12.5" or -1000 alike: both read back as numbers.
    QList<Store::Column> columns{{QStringLiteral("date"), Type::Text}, {QStringLiteral("time base"), Type::Integer}};
    for (int ch = 1; ch <= kHistoryChannels; ++ch)
        columns.append({QStringLiteral("Ch %1").arg(ch), Type::Double});
    return columns;
}

QList<Store::Column> powerColumns()
{
    return {{QStringLiteral("date"), Type::Text},
            {QStringLiteral("time base"), Type::Integer},
            {QStringLiteral("seconds"), Type::Integer},
            {QStringLiteral("watts"), Type::Double}};
}

QList<Store::Column> alarmLogColumns()
{
    return {{QStringLiteral("time"), Type::Text},
            {QStringLiteral("channelnumber"), Type::Text},
            {QStringLiteral("channeldiscription"), Type::Text},
            {QStringLiteral("type"), Type::Text},
            {QStringLiteral("value"), Type::Text}};
}

QList<InfoValidationRow> infoValidationRows()
{
    QList<InfoValidationRow> rows;
    for (short field : catalogue::replyOrderFields()) {
        if (field == catalogue::kDescriptionField) {
            rows.append({catalogue::fieldLabel(field), {}, field, {}, {}});
            continue;
        }
        const Limits l = fieldLimits(field);
        rows.append({catalogue::fieldLabel(field), fieldDefault(field), field, l.min, l.max});
    }
    // Fields that the upload checks without a row of their own.
    for (const catalogue::RecordRun& run : catalogue::recordRuns())
        if (!catalogue::hasInfoRows(run.block))
            for (int field = run.first; field < run.first + run.count; ++field)
                rows.append({catalogue::fieldLabel(field), 20, field, 0, 100});
    rows.append({catalogue::fieldLabel(catalogue::kChannelNumberField), 1, catalogue::kChannelNumberField, 1, kChannels});
    // Any number at all, as the start delay takes.
    const catalogue::Function* anyNumber = catalogue::findFunction(31);
    rows.append({catalogue::fieldLabel(catalogue::kSpareField), 0, catalogue::kSpareField, anyNumber->min,
                 anyNumber->max});
    Q_ASSERT(rows.size() == kInfoValidationRows);
    return rows;
}

QVariant templateSetpoint(int row, int field)
{
    const int channel = row + 1;
    switch (field) {
    case catalogue::kChannelNumberField: return channel;
    case catalogue::kChannelTextField: return QStringLiteral("Ch %1").arg(channel);
    case catalogue::kDescriptionField: return paddedDescription(channel);
    case catalogue::kCompressorOrderField:
        return row < catalogue::lastChannel(catalogue::Scope::Compressor) ? channel : 0;
    case catalogue::kCondenserOrderField:
        return row < catalogue::lastChannel(catalogue::Scope::Condenser) ? channel : 0;
    case catalogue::kChannelBankField: return kChannelsInBank1;
    default: return fieldDefault(field);
    }
}

namespace {

// The template's line: 9600 baud, port 1, a direct line without flow control.
QVariant connectionCell(int row)
{
    switch (row) {
    case kInfoPortSettingsRow: return QStringLiteral("9600,n,8,1");
    case kInfoPortRow: return 1;
    case kInfoConnectionTypeRow: return 1;
    case kInfoDialToneRow: return 0;
    // Sits between "ATX4" and "DT": verbose result codes, which are the
    // words the dispatcher looks for.
    case kInfoModemTextRow: return QStringLiteral("V1");
    case kInfoFlowControlRow: return 0;
    default: return {};
    }
}

// The graph's settings: legend on, the rest off, no pointer channel.
QVariant graphSettingCell(int row)
{
    switch (row) {
    case kInfoLegendRow: return 1;
    case kInfoPointerNameRow: return QStringLiteral("No Channel Selected ");
    case kInfoDataPointsRow:
    case kInfoDateMarkerRow:
    case kInfoValueMarkerRow:
    case kInfoPointerChannelRow:
    case kInfoLastMaximumRow:
    case kInfoLastMinimumRow:
        return 0;
    default: return {};
    }
}

} // namespace

QVariantList templateInfoRow(int row)
{
    QVariantList v(kInfoColumns);
    static const QList<InfoValidationRow> validation = infoValidationRows();
    if (row < validation.size()) {
        const InfoValidationRow& r = validation.at(row);
        v[kInfoName] = r.name;
        v[kInfoDefault] = r.defaultValue;
        v[kInfoField] = r.field;
        v[kInfoMinimum] = r.minimum;
        v[kInfoMaximum] = r.maximum;
    }
    if (row < kInfoChosenChannels) {
        v[kInfoShownChannelColumn] = 0; // status display rows: empty
        v[kInfoGraphColumn] = 0;        // graph channels: none
        v[kInfoGraphCaptionColumn] = QString();
        v[kInfoRoomChannelColumn] = 0;  // room panels: none
    } else if (const QVariant graph = graphSettingCell(row); graph.isValid()) {
        v[kInfoGraphColumn] = graph;
    }
    if (row < kInfoPaneRows) {
        for (int c = 0; c < kInfoProbes; ++c)
            v[kInfoFirstProbeColumn + c] = 0; // probes of a room: free
        v[kInfoPaneFirstColumn + info_pane::InUse] = QStringLiteral("0");
        v[kInfoPlantPaneFirstColumn + info_pane::InUse] = QStringLiteral("0");
    }
    if (row < kInfoKinds) {
        v[kInfoKindForeColumn] = 0;
        v[kInfoKindBackColumn] = kKindBack[row];
    }
    if (row < kInfoTabs)
        v[kInfoTabNameColumn] = QStringLiteral("Not Set");
    if (row < kInfoHeadingLines)
        v[kInfoHeadingColumn] = row == 0 ? QStringLiteral("Company Name") : QString();
    if (row == kInfoBrumaletRow)
        v[kInfoBrumaletColumn] = 30; // seconds between updates
    if (row == kInfoStatusDescriptionsRow)
        v[kInfoDescriptionsColumn] = 1;
    if (row == kInfoChannelsDescriptionsRow)
        v[kInfoDescriptionsColumn] = 0;
    if (const QVariant line = connectionCell(row); line.isValid())
        v[kInfoConnectionColumn] = line;
    if (row == kInfoTemperatureIntervalRow || row == kInfoPressureIntervalRow)
        v[kInfoIntervalColumn] = 10;
    return v;
}

bool createInstrumentTemplate(const QString& path, QString* error)
{
    if (QFileInfo::exists(path))
        return fail(error, QStringLiteral("%1 already exists").arg(path));
    std::unique_ptr<Store> store = Store::create(path, kInstrumentSchemaVersion, error);
    if (!store)
        return false;

    QString why;
    bool ok = false;
    {
        Store::Transaction tx(*store);
        ok = store->createTable(kSetpointsTable, setpointsColumns())
             && store->createTable(kInfoTable, infoColumns())
             && store->createTable(kHistoryTable, historyColumns())
             && store->createTable(kPowerTable, powerColumns())
             && store->createTable(kAlarmLogTable, alarmLogColumns());
        if (!ok)
            why = store->lastError();
        const auto setpointsRow = [](int row) {
            QVariantList values;
            for (int field = 0; field < kSetpointFields; ++field)
                values.append(templateSetpoint(row, field));
            return values;
        };
        ok = ok && fillTable(*store, kSetpointsTable, kChannels, setpointsRow, &why);
        ok = ok && fillTable(*store, kInfoTable, kInfoRows, templateInfoRow, &why);
        if (ok && !tx.commit()) {
            ok = false;
            why = store->lastError();
        }
    }
    if (ok)
        return true;
    store.reset();
    for (const char* suffix : {"", "-wal", "-shm", "-journal"})
        QFile::remove(path + QLatin1String(suffix));
    return fail(error, why.isEmpty() ? QStringLiteral("The data base could not be written") : why);
}
