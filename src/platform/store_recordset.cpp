#include "platform/store.h"

#include "platform/store_sqlite.h"
#include "platform/store_values.h"

#include <QHash>
#include <QSqlDatabase>
#include <QSqlError>
#include <QSqlQuery>

using namespace store_detail;

namespace {

const QString NoCurrentRecord = QStringLiteral("No current record");
const QString StoreClosed = QStringLiteral("The data base is closed");

} // namespace

// Prepared once per set: a transfer writes hundreds of wide rows, a log tens
// of thousands.
struct Recordset::Statements {
    explicit Statements(const QSqlDatabase& db) : select(db), insert(db), remove(db), db(db) {}
    QSqlQuery select;
    QSqlQuery insert;
    QSqlQuery remove;
    bool selectReady = false;
    bool insertReady = false;
    bool removeReady = false;
    // Keyed by the fields written, so that an edit writes only what changed.
    QHash<QList<int>, QSqlQuery> updates;
    // One field of one row, by ordinal.
    QHash<int, QSqlQuery> cells;
    // Some fields of one row, keyed by the fields read.
    QHash<QList<int>, QSqlQuery> partial;
    QSqlDatabase db;
    // Values are bound by name: the driver builds a text key for every
    // positional bind, which costs more than the write itself on a wide row.
    QStringList names;
    const QString rowName = QStringLiteral(":rid");
    const QString& name(int ordinal) const { return names.at(ordinal); }
};

Recordset::Recordset(Store& store, QString table, QList<Store::Column> columns, QString orderBy)
    : m_store(&store), m_table(std::move(table)), m_orderBy(std::move(orderBy))
{
    for (const Store::Column& c : columns) {
        m_fields.append(c.name);
        m_types.append(c.type);
    }
    m_sql = std::make_unique<Statements>(QSqlDatabase::database(store.connectionName(), false));
    m_sql->names.reserve(m_fields.size());
    for (int i = 0; i < m_fields.size(); ++i)
        m_sql->names.append(QStringLiteral(":f%1").arg(i));
    store.m_recordsets.append(this);
}

Recordset::~Recordset()
{
    if (m_store)
        m_store->m_recordsets.removeOne(this);
}

void Recordset::detach()
{
    m_sql.reset();
    m_store = nullptr;
}

bool Recordset::fail(const QString& message) const
{
    m_lastError = message;
    return false;
}

bool Recordset::load()
{
    if (!m_sql)
        return fail(StoreClosed);
    QSqlQuery q(m_sql->db);
    q.setForwardOnly(true);
    QString sql = QStringLiteral("SELECT %1 FROM %2 ORDER BY ").arg(sqlite::RowId, quoted(m_table));
    if (!m_orderBy.isEmpty())
        sql += quoted(m_orderBy) + QLatin1String(", ");
    sql += sqlite::RowId;
    if (!q.exec(sql))
        return fail(errorText(q.lastError()));
    QList<qint64> ids;
    while (q.next())
        ids.append(q.value(0).toLongLong());
    m_rowIds = std::move(ids);
    m_currentLoaded = false;
    return true;
}

bool Recordset::hasCurrent() const
{
    return !m_deleted && !m_bothEnds && m_pos >= 0 && m_pos < RecordCount();
}

bool Recordset::atBOF() const
{
    return !m_deleted && (m_bothEnds || m_pos < 0 || m_rowIds.isEmpty());
}

bool Recordset::atEOF() const
{
    return !m_deleted && (m_bothEnds || m_pos >= RecordCount() || m_rowIds.isEmpty());
}

int Recordset::AbsolutePosition() const
{
    return hasCurrent() ? m_pos : -1;
}

void Recordset::leaveEditing()
{
    m_mode = Mode::None;
    m_buffer.clear();
    m_dirty.clear();
}

// Moving discards a pending Edit/AddNew, as the desktop engines do.
void Recordset::moved()
{
    leaveEditing();
    m_deleted = false;
    m_bothEnds = false;
    m_currentLoaded = false;
}

bool Recordset::setAbsolutePosition(int position)
{
    if (position < 0 || position >= RecordCount())
        return fail(QStringLiteral("Position %1 is out of range").arg(position));
    moved();
    m_pos = position;
    return true;
}

bool Recordset::MoveFirst()
{
    moved();
    if (m_rowIds.isEmpty()) {
        m_pos = -1;
        return fail(NoCurrentRecord);
    }
    m_pos = 0;
    return true;
}

bool Recordset::MoveLast()
{
    moved();
    if (m_rowIds.isEmpty()) {
        m_pos = -1;
        return fail(NoCurrentRecord);
    }
    m_pos = RecordCount() - 1;
    return true;
}

bool Recordset::MoveNext()
{
    if (m_deleted) {
        // The deleted record's place now holds the one that followed it.
        const int next = qMin(m_pos, RecordCount());
        moved();
        m_pos = next;
        return true;
    }
    if (atEOF())
        return fail(NoCurrentRecord);
    moved();
    ++m_pos;
    return true;
}

bool Recordset::MovePrevious()
{
    if (m_deleted) {
        const int previous = qMin(m_pos, RecordCount()) - 1;
        moved();
        m_pos = previous;
        return true;
    }
    if (atBOF())
        return fail(NoCurrentRecord);
    moved();
    m_pos = qMin(m_pos, RecordCount()) - 1;
    return true;
}

bool Recordset::fetchRow(qint64 rowId, QVariantList* values) const
{
    if (!m_sql)
        return fail(StoreClosed);
    QSqlQuery& q = m_sql->select;
    if (!m_sql->selectReady) {
        QStringList cols;
        for (const QString& f : m_fields)
            cols.append(quoted(f));
        q.setForwardOnly(true);
        if (!q.prepare(QStringLiteral("SELECT %1 FROM %2 WHERE %3 = :rid")
                           .arg(cols.join(QLatin1String(", ")), quoted(m_table), sqlite::RowId)))
            return fail(errorText(q.lastError()));
        m_sql->selectReady = true;
    }
    q.bindValue(m_sql->rowName, rowId);
    if (!q.exec())
        return fail(errorText(q.lastError()));
    if (!q.next()) {
        q.finish();
        return fail(QStringLiteral("The record has been deleted"));
    }
    values->clear();
    values->reserve(m_fields.size());
    for (int i = 0; i < m_fields.size(); ++i)
        values->append(q.isNull(i) ? QVariant() : fromStored(m_types.at(i), q.value(i)));
    // A pending read would hold up a rollback.
    q.finish();
    return true;
}

bool Recordset::loadCurrent() const
{
    if (m_currentLoaded)
        return true;
    m_current.clear();
    if (!hasCurrent())
        return fail(NoCurrentRecord);
    if (!fetchRow(m_rowIds.at(m_pos), &m_current))
        return false;
    m_currentLoaded = true;
    return true;
}

QVariant Recordset::value(int ordinal) const
{
    if (ordinal < 0 || ordinal >= fieldCount()) {
        fail(QStringLiteral("There is no field %1").arg(ordinal));
        return QVariant();
    }
    if (m_mode != Mode::None && m_dirty.at(ordinal))
        return fromStored(m_types.at(ordinal), m_buffer.at(ordinal));
    if (m_mode == Mode::AddNew || !loadCurrent())
        return QVariant();
    return m_current.at(ordinal);
}

QVariantList Recordset::values() const
{
    QVariantList out;
    out.reserve(fieldCount());
    for (int i = 0; i < fieldCount(); ++i)
        out.append(value(i));
    return out;
}

QVariantList Recordset::values(const QList<int>& ordinals) const
{
    QVariantList out;
    out.reserve(ordinals.size());
    const bool fresh = m_currentLoaded || m_mode == Mode::AddNew || !m_sql || !hasCurrent();
    for (int o : ordinals)
        if (o < 0 || o >= fieldCount())
            return fail(QStringLiteral("There is no field %1").arg(o)), QVariantList();
    if (fresh) {
        for (int o : ordinals)
            out.append(value(o));
        return out;
    }
    auto it = m_sql->partial.find(ordinals);
    if (it == m_sql->partial.end()) {
        // Records have few layouts; a runaway cache is cut back, not grown.
        if (m_sql->partial.size() > 64)
            m_sql->partial.clear();
        QStringList cols;
        for (int o : ordinals)
            cols.append(quoted(m_fields.at(o)));
        QSqlQuery q(m_sql->db);
        q.setForwardOnly(true);
        if (!q.prepare(QStringLiteral("SELECT %1 FROM %2 WHERE %3 = :rid")
                           .arg(cols.join(QLatin1String(", ")), quoted(m_table), sqlite::RowId)))
            return fail(errorText(q.lastError())), QVariantList();
        it = m_sql->partial.insert(ordinals, q);
    }
    QSqlQuery& q = it.value();
    q.bindValue(m_sql->rowName, m_rowIds.at(m_pos));
    if (!q.exec())
        return fail(errorText(q.lastError())), QVariantList();
    if (!q.next()) {
        q.finish();
        return fail(QStringLiteral("The record has been deleted")), QVariantList();
    }
    for (int i = 0; i < ordinals.size(); ++i) {
        const int o = ordinals.at(i);
        if (m_mode != Mode::None && m_dirty.at(o))
            out.append(fromStored(m_types.at(o), m_buffer.at(o)));
        else
            out.append(q.isNull(i) ? QVariant() : fromStored(m_types.at(o), q.value(i)));
    }
    q.finish();
    return out;
}

QVariantList Recordset::column(int ordinal)
{
    if (ordinal < 0 || ordinal >= fieldCount())
        return fail(QStringLiteral("There is no field %1").arg(ordinal)), QVariantList();
    if (!m_sql)
        return fail(StoreClosed), QVariantList();
    QSqlQuery q(m_sql->db);
    q.setForwardOnly(true);
    if (!q.exec(QStringLiteral("SELECT %1, %2 FROM %3").arg(sqlite::RowId, quoted(m_fields.at(ordinal)), quoted(m_table))))
        return fail(errorText(q.lastError())), QVariantList();
    QHash<qint64, QVariant> byRow;
    byRow.reserve(m_rowIds.size());
    while (q.next())
        byRow.insert(q.value(0).toLongLong(), q.isNull(1) ? QVariant() : fromStored(m_types.at(ordinal), q.value(1)));
    QVariantList out;
    out.reserve(m_rowIds.size());
    for (qint64 id : m_rowIds)
        out.append(byRow.value(id));
    return out;
}

QList<QVariantList> Recordset::rows(const QList<int>& positions, const QList<int>& ordinals)
{
    for (int o : ordinals)
        if (o < 0 || o >= fieldCount())
            return fail(QStringLiteral("There is no field %1").arg(o)), QList<QVariantList>();
    QStringList ids;
    for (int p : positions) {
        if (p < 0 || p >= RecordCount())
            return fail(QStringLiteral("Position %1 is out of range").arg(p)), QList<QVariantList>();
        ids.append(QString::number(m_rowIds.at(p)));
    }
    if (!m_sql)
        return fail(StoreClosed), QList<QVariantList>();
    QStringList cols{sqlite::RowId};
    for (int o : ordinals)
        cols.append(quoted(m_fields.at(o)));
    QSqlQuery q(m_sql->db);
    q.setForwardOnly(true);
    // The row numbers are the set's own integers, written into the text.
    if (!q.exec(QStringLiteral("SELECT %1 FROM %2 WHERE %3 IN (%4)")
                    .arg(cols.join(QLatin1String(", ")), quoted(m_table), sqlite::RowId,
                         ids.join(QLatin1String(", ")))))
        return fail(errorText(q.lastError())), QList<QVariantList>();
    QHash<qint64, QVariantList> byRow;
    byRow.reserve(positions.size());
    while (q.next()) {
        QVariantList row;
        row.reserve(ordinals.size());
        for (int i = 0; i < ordinals.size(); ++i)
            row.append(fromStored(m_types.at(ordinals.at(i)), q.value(i + 1)));
        byRow.insert(q.value(0).toLongLong(), row);
    }
    QList<QVariantList> out;
    out.reserve(positions.size());
    for (int p : positions)
        out.append(byRow.value(m_rowIds.at(p), QVariantList(ordinals.size())));
    return out;
}

bool Recordset::Edit()
{
    if (!hasCurrent())
        return fail(NoCurrentRecord);
    if (!m_sql)
        return fail(StoreClosed);
    leaveEditing();
    // The record is read when a value of it is asked for: an edit that
    // writes a record through never reads its few hundred fields. A record
    // deleted meanwhile is refused by Update.
    m_mode = Mode::Edit;
    m_buffer = QVariantList(fieldCount());
    m_dirty = QList<bool>(fieldCount(), false);
    return true;
}

bool Recordset::AddNew()
{
    if (!m_sql)
        return fail(StoreClosed);
    leaveEditing();
    m_mode = Mode::AddNew;
    m_buffer = QVariantList(fieldCount());
    m_dirty = QList<bool>(fieldCount(), false);
    return true;
}

bool Recordset::setValue(int ordinal, const QVariant& value)
{
    if (m_mode == Mode::None)
        return fail(QStringLiteral("Update without AddNew or Edit"));
    if (ordinal < 0 || ordinal >= fieldCount())
        return fail(QStringLiteral("There is no field %1").arg(ordinal));
    QVariant stored;
    if (!toStored(m_types.at(ordinal), value, &stored))
        return fail(QStringLiteral("%1 cannot hold %2").arg(m_fields.at(ordinal), value.toString()));
    m_buffer[ordinal] = stored;
    m_dirty[ordinal] = true;
    return true;
}

bool Recordset::writeRow(qint64 rowId, const QList<int>& ordinals, const QVariantList& stored)
{
    if (!m_sql)
        return fail(StoreClosed);
    auto it = m_sql->updates.find(ordinals);
    if (it == m_sql->updates.end()) {
        // Edits follow few patterns beyond one field at a time; a runaway
        // cache is cut back, not grown.
        if (m_sql->updates.size() > fieldCount() + 64)
            m_sql->updates.clear();
        QStringList sets;
        for (int o : ordinals)
            sets.append(quoted(m_fields.at(o)) + QLatin1String(" = ") + m_sql->name(o));
        QSqlQuery q(m_sql->db);
        if (!q.prepare(QStringLiteral("UPDATE %1 SET %2 WHERE %3 = :rid")
                           .arg(quoted(m_table), sets.join(QLatin1String(", ")), sqlite::RowId)))
            return fail(errorText(q.lastError()));
        it = m_sql->updates.insert(ordinals, q);
    }
    QSqlQuery& q = it.value();
    for (int i = 0; i < stored.size(); ++i)
        q.bindValue(m_sql->name(ordinals.at(i)), stored.at(i));
    q.bindValue(m_sql->rowName, rowId);
    if (!q.exec())
        return fail(errorText(q.lastError()));
    if (q.numRowsAffected() != 1)
        return fail(QStringLiteral("The record has been deleted"));
    if (hasCurrent() && m_rowIds.at(m_pos) == rowId)
        m_currentLoaded = false;
    return true;
}

bool Recordset::Update()
{
    if (m_mode == Mode::None)
        return fail(QStringLiteral("Update without AddNew or Edit"));
    if (!m_sql)
        return fail(StoreClosed);
    if (m_mode == Mode::Edit) {
        if (!hasCurrent())
            return fail(NoCurrentRecord);
        QList<int> ordinals;
        QVariantList stored;
        for (int i = 0; i < fieldCount(); ++i) {
            if (m_dirty.at(i)) {
                ordinals.append(i);
                stored.append(m_buffer.at(i));
            }
        }
        if (!ordinals.isEmpty() && !writeRow(m_rowIds.at(m_pos), ordinals, stored))
            return false;
        leaveEditing();
        return true;
    }

    QSqlQuery& q = m_sql->insert;
    if (!m_sql->insertReady) {
        QStringList cols;
        for (const QString& f : m_fields)
            cols.append(quoted(f));
        if (!q.prepare(QStringLiteral("INSERT INTO %1 (%2) VALUES (%3)")
                           .arg(quoted(m_table), cols.join(QLatin1String(", ")), m_sql->names.join(QLatin1String(", ")))))
            return fail(errorText(q.lastError()));
        m_sql->insertReady = true;
    }
    for (int i = 0; i < fieldCount(); ++i)
        q.bindValue(m_sql->name(i), m_dirty.at(i) ? m_buffer.at(i) : QVariant());
    if (!q.exec())
        return fail(errorText(q.lastError()));
    const int before = RecordCount();
    m_rowIds.append(q.lastInsertId().toLongLong());
    // The current record stays what it was; a set that was empty stays at
    // both ends, one that was at EOF stays at EOF.
    if (!m_deleted) {
        if (before == 0) {
            m_bothEnds = true;
            m_pos = -1;
        } else if (m_pos >= before) {
            m_pos = RecordCount();
        }
    }
    leaveEditing();
    return true;
}

void Recordset::CancelUpdate()
{
    leaveEditing();
}

bool Recordset::Delete()
{
    if (m_deleted)
        return fail(QStringLiteral("The record has been deleted"));
    if (!hasCurrent())
        return fail(NoCurrentRecord);
    if (!m_sql)
        return fail(StoreClosed);
    leaveEditing();
    QSqlQuery& q = m_sql->remove;
    if (!m_sql->removeReady) {
        if (!q.prepare(QStringLiteral("DELETE FROM %1 WHERE %2 = :rid").arg(quoted(m_table), sqlite::RowId)))
            return fail(errorText(q.lastError()));
        m_sql->removeReady = true;
    }
    const qint64 id = m_rowIds.at(m_pos);
    q.bindValue(m_sql->rowName, id);
    if (!q.exec())
        return fail(errorText(q.lastError()));
    m_rowIds.removeAt(m_pos);
    m_deleted = true;
    m_currentLoaded = false;
    m_current.clear();
    return true;
}

bool Recordset::Requery()
{
    const bool wasBOF = atBOF() && !m_rowIds.isEmpty() && !m_bothEnds;
    const bool wasEOF = atEOF() && !m_rowIds.isEmpty() && !m_bothEnds;
    const qint64 currentId = hasCurrent() ? m_rowIds.at(m_pos) : -1;
    const int oldPos = m_pos;
    const bool wasDeleted = m_deleted;
    if (!load())
        return false;
    moved();
    const int n = RecordCount();
    if (n == 0) {
        m_pos = -1;
    } else if (currentId >= 0 && m_rowIds.contains(currentId)) {
        m_pos = int(m_rowIds.indexOf(currentId));
    } else if (wasBOF && !wasDeleted) {
        m_pos = -1;
    } else if (wasEOF && !wasDeleted) {
        m_pos = n;
    } else {
        m_pos = qBound(0, oldPos, n - 1);
    }
    return true;
}

QVariant Recordset::cell(int row, int ordinal)
{
    if (row < 0 || row >= RecordCount() || ordinal < 0 || ordinal >= fieldCount()) {
        fail(QStringLiteral("There is no cell %1, %2").arg(row).arg(ordinal));
        return QVariant();
    }
    if (!m_sql) {
        fail(StoreClosed);
        return QVariant();
    }
    // Read from the file every time, as a move there and back would: other
    // connections write the same rows. The current record and a pending edit
    // stay as they are.
    auto it = m_sql->cells.find(ordinal);
    if (it == m_sql->cells.end()) {
        QSqlQuery q(m_sql->db);
        q.setForwardOnly(true);
        if (!q.prepare(QStringLiteral("SELECT %1 FROM %2 WHERE %3 = :rid")
                           .arg(quoted(m_fields.at(ordinal)), quoted(m_table), sqlite::RowId))) {
            fail(errorText(q.lastError()));
            return QVariant();
        }
        it = m_sql->cells.insert(ordinal, q);
    }
    QSqlQuery& q = it.value();
    q.bindValue(m_sql->rowName, m_rowIds.at(row));
    if (!q.exec()) {
        fail(errorText(q.lastError()));
        return QVariant();
    }
    QVariant v;
    if (q.next())
        v = q.isNull(0) ? QVariant() : fromStored(m_types.at(ordinal), q.value(0));
    else
        fail(QStringLiteral("The record has been deleted"));
    q.finish();
    return v;
}

bool Recordset::setCell(int row, int ordinal, const QVariant& value)
{
    if (m_mode != Mode::None)
        return fail(QStringLiteral("Finish the pending AddNew or Edit first"));
    if (row < 0 || row >= RecordCount())
        return fail(QStringLiteral("Position %1 is out of range").arg(row));
    if (ordinal < 0 || ordinal >= fieldCount())
        return fail(QStringLiteral("There is no field %1").arg(ordinal));
    QVariant stored;
    if (!toStored(m_types.at(ordinal), value, &stored))
        return fail(QStringLiteral("%1 cannot hold %2").arg(m_fields.at(ordinal), value.toString()));
    return writeRow(m_rowIds.at(row), {ordinal}, {stored});
}
