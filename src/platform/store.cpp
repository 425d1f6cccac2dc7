#include "platform/store.h"

#include <QDateTime>
#include <QFile>
#include <QFileInfo>
#include <QHash>
#include <QSqlDatabase>
#include <QSqlError>
#include <QSqlQuery>
#include <QSqlRecord>
#include <atomic>

namespace {

QString quoted(const QString& identifier)
{
    QString s = identifier;
    s.replace(QLatin1Char('"'), QLatin1String("\"\""));
    return QLatin1Char('"') + s + QLatin1Char('"');
}

QString errorText(const QSqlError& e)
{
    const QString db = e.databaseText();
    return db.isEmpty() ? e.text() : db;
}

const QString DateTimeFormat = QStringLiteral("yyyy-MM-ddTHH:mm:ss");

// ---------------------------------------------------------------------------
// Everything below up to the end of this block is particular to SQLite. A
// store on another server replaces this block and nothing else.
namespace sqlite {

const QString Driver = QStringLiteral("QSQLITE");
// The engine's own row number; rows keep insertion order by it.
const QString RowId = QStringLiteral("rowid");

// A data base file starts with this header; anything else (a text file, a
// file cut short before its first page) is refused before the driver sees it.
bool hasDatabaseHeader(const QString& path)
{
    QFile f(path);
    if (!f.open(QIODevice::ReadOnly))
        return false;
    static const QByteArray magic("SQLite format 3\0", 16);
    const QByteArray head = f.read(100);
    return head.size() == 100 && head.startsWith(magic);
}

void setConnectOptions(QSqlDatabase& db)
{
    // Views keep their own connections on the same file.
    db.setConnectOptions(QStringLiteral("QSQLITE_BUSY_TIMEOUT=5000"));
}

bool exec(QSqlDatabase& db, const QString& sql, QString* error, QVariant* first = nullptr)
{
    QSqlQuery q(db);
    if (!q.exec(sql)) {
        if (error)
            *error = errorText(q.lastError());
        return false;
    }
    if (first)
        *first = q.next() ? q.value(0) : QVariant();
    return true;
}

// Reads the schema, so that a damaged or truncated file fails here.
bool readable(QSqlDatabase& db, QString* error)
{
    return exec(db, QStringLiteral("SELECT count(*) FROM sqlite_master"), error);
}

bool configure(QSqlDatabase& db, QString* error)
{
    // Readers never block the writer, and a commit costs no full sync: a power
    // cut may lose the last commits but never corrupts the file.
    QVariant mode;
    if (!exec(db, QStringLiteral("PRAGMA journal_mode=WAL"), error, &mode))
        return false;
    // A file system without shared memory keeps the rollback journal; the
    // store is still safe, only slower, so that is not refused.
    return exec(db, QStringLiteral("PRAGMA synchronous=NORMAL"), error);
}

bool readInt(QSqlDatabase& db, const char* pragma, int* value, QString* error)
{
    QVariant v;
    if (!exec(db, QStringLiteral("PRAGMA %1").arg(QLatin1String(pragma)), error, &v))
        return false;
    *value = v.toInt();
    return true;
}

bool writeInt(QSqlDatabase& db, const char* pragma, qint32 value, QString* error)
{
    return exec(db, QStringLiteral("PRAGMA %1 = %2").arg(QLatin1String(pragma)).arg(value), error);
}

bool applicationId(QSqlDatabase& db, int* id, QString* error)
{
    return readInt(db, "application_id", id, error);
}
bool setApplicationId(QSqlDatabase& db, qint32 id, QString* error)
{
    return writeInt(db, "application_id", id, error);
}
bool userVersion(QSqlDatabase& db, int* v, QString* error)
{
    return readInt(db, "user_version", v, error);
}
bool setUserVersion(QSqlDatabase& db, int v, QString* error)
{
    return writeInt(db, "user_version", v, error);
}

QString declaredType(Store::ColumnType type)
{
    switch (type) {
    case Store::ColumnType::Integer: return QStringLiteral("INTEGER");
    case Store::ColumnType::Double: return QStringLiteral("DOUBLE PRECISION");
    case Store::ColumnType::Text: return QStringLiteral("TEXT");
    case Store::ColumnType::DateTime: return QStringLiteral("TIMESTAMP");
    case Store::ColumnType::Boolean: return QStringLiteral("BOOLEAN");
    }
    return QStringLiteral("TEXT");
}

Store::ColumnType columnType(const QString& declared)
{
    const QString t = declared.toUpper();
    if (t.contains(QLatin1String("BOOL")))
        return Store::ColumnType::Boolean;
    if (t.contains(QLatin1String("INT")))
        return Store::ColumnType::Integer;
    if (t.contains(QLatin1String("DATE")) || t.contains(QLatin1String("TIME")))
        return Store::ColumnType::DateTime;
    if (t.contains(QLatin1String("REAL")) || t.contains(QLatin1String("DOUB"))
        || t.contains(QLatin1String("FLOA")) || t.contains(QLatin1String("NUM")))
        return Store::ColumnType::Double;
    return Store::ColumnType::Text;
}

// The columns of a table in ordinal order; empty when there is no such table.
QList<Store::Column> columns(QSqlDatabase& db, const QString& table)
{
    QList<Store::Column> result;
    QSqlQuery q(db);
    if (!q.exec(QStringLiteral("PRAGMA table_info(%1)").arg(quoted(table))))
        return result;
    while (q.next())
        result.append({q.value(1).toString(), columnType(q.value(2).toString())});
    return result;
}

bool integrityCheck(QSqlDatabase& db, QStringList* findings, QString* error)
{
    QSqlQuery q(db);
    if (!q.exec(QStringLiteral("PRAGMA integrity_check"))) {
        *error = errorText(q.lastError());
        return false;
    }
    while (q.next())
        findings->append(q.value(0).toString());
    return true;
}

bool vacuumInto(QSqlDatabase& db, const QString& target, QString* error)
{
    QSqlQuery q(db);
    if (!q.prepare(QStringLiteral("VACUUM INTO ?"))) {
        *error = errorText(q.lastError());
        return false;
    }
    q.addBindValue(target);
    if (!q.exec()) {
        *error = errorText(q.lastError());
        return false;
    }
    return true;
}

} // namespace sqlite
// ---------------------------------------------------------------------------

QString nextConnectionName()
{
    static std::atomic<quint64> counter{0};
    return QStringLiteral("q19.store.%1").arg(++counter);
}

// Turns a value given by the program into what the column holds in the file.
// False when it cannot be one.
bool toStored(Store::ColumnType type, const QVariant& in, QVariant* out)
{
    *out = QVariant();
    if (isNull(in))
        return true;
    bool ok = false;
    switch (type) {
    case Store::ColumnType::Integer: {
        qlonglong n = in.toLongLong(&ok);
        if (!ok) {
            const double d = in.toDouble(&ok);
            if (ok)
                n = qRound64(d);
        }
        if (ok)
            *out = n;
        return ok;
    }
    case Store::ColumnType::Double: {
        const double d = in.toDouble(&ok);
        if (ok)
            *out = d;
        return ok;
    }
    case Store::ColumnType::Text: {
        if (!in.canConvert<QString>())
            return false;
        QString s = in.toString();
        // A null QString is text all the same, and must not turn into Null.
        if (s.isNull())
            s = QLatin1String("");
        *out = s;
        return true;
    }
    case Store::ColumnType::DateTime: {
        QDateTime dt;
        if (in.typeId() == QMetaType::QDateTime) {
            dt = in.toDateTime();
            if (!dt.isValid())
                return true; // no time at all is Null
        } else if (in.typeId() == QMetaType::QDate) {
            dt = in.toDate().startOfDay();
        } else if (in.canConvert<QString>()) {
            dt = QDateTime::fromString(in.toString().trimmed(), Qt::ISODate);
        }
        if (!dt.isValid())
            return false;
        *out = dt.toString(DateTimeFormat);
        return true;
    }
    case Store::ColumnType::Boolean:
        *out = qlonglong(in.toBool() ? 1 : 0);
        return true;
    }
    return false;
}

// Turns what the file holds into the value the program reads. A value the
// column cannot hold (a damaged file, a foreign writer) comes back as it is,
// so that verification can see it.
QVariant fromStored(Store::ColumnType type, const QVariant& raw)
{
    if (isNull(raw))
        return QVariant();
    const int id = raw.typeId();
    const bool number = id == QMetaType::LongLong || id == QMetaType::Int || id == QMetaType::Double;
    switch (type) {
    case Store::ColumnType::Integer:
        return raw;
    case Store::ColumnType::Double:
        return number ? QVariant(raw.toDouble()) : raw;
    case Store::ColumnType::Text:
        return QVariant(raw.toString());
    case Store::ColumnType::DateTime: {
        const QDateTime dt = QDateTime::fromString(raw.toString(), Qt::ISODate);
        return dt.isValid() ? QVariant(dt) : raw;
    }
    case Store::ColumnType::Boolean:
        return number ? QVariant(raw.toLongLong() != 0) : raw;
    }
    return raw;
}

const QString NoCurrentRecord = QStringLiteral("No current record");
const QString StoreClosed = QStringLiteral("The data base is closed");

} // namespace

// ===========================================================================
// Store

Store::Store(QString path, QString connection)
    : m_path(std::move(path)), m_connection(std::move(connection))
{
}

Store::~Store()
{
    for (Recordset* rs : std::as_const(m_recordsets))
        rs->detach();
    m_recordsets.clear();
    {
        QSqlDatabase db = QSqlDatabase::database(m_connection, false);
        if (db.isOpen() && m_txDepth > 0)
            db.rollback();
        db.close();
    }
    QSqlDatabase::removeDatabase(m_connection);
}

bool Store::configure()
{
    QSqlDatabase db = QSqlDatabase::database(m_connection, false);
    QString error;
    if (!sqlite::configure(db, &error)) {
        m_lastError = error;
        return false;
    }
    return true;
}

static void setError(QString* error, const QString& text)
{
    if (error)
        *error = text;
}

std::unique_ptr<Store> Store::connectTo(const QString& path)
{
    const QString connection = nextConnectionName();
    {
        QSqlDatabase db = QSqlDatabase::addDatabase(sqlite::Driver, connection);
        db.setDatabaseName(path);
        sqlite::setConnectOptions(db);
        db.open();
    }
    return std::unique_ptr<Store>(new Store(path, connection));
}

std::unique_ptr<Store> Store::open(const QString& path, QString* error)
{
    const QString name = QFileInfo(path).fileName();
    if (!QFileInfo(path).isFile()) {
        setError(error, QStringLiteral("The data base %1 does not exist.").arg(path));
        return nullptr;
    }
    if (!sqlite::hasDatabaseHeader(path)) {
        setError(error, QStringLiteral("%1 is not a data base, or it is damaged.").arg(name));
        return nullptr;
    }
    std::unique_ptr<Store> store = connectTo(path);
    QSqlDatabase db = QSqlDatabase::database(store->connectionName(), false);
    if (!db.isOpen()) {
        setError(error, QStringLiteral("%1 cannot be opened: %2").arg(name, errorText(db.lastError())));
        return nullptr;
    }
    QString why;
    int appId = 0;
    if (!sqlite::readable(db, &why) || !sqlite::applicationId(db, &appId, &why)) {
        setError(error, QStringLiteral("%1 is not a data base, or it is damaged: %2").arg(name, why));
        return nullptr;
    }
    // Checked before anything is written, so that a stranger's file is left as it was.
    if (appId != 0 && appId != ApplicationId) {
        setError(error, QStringLiteral("%1 belongs to another program.").arg(name));
        return nullptr;
    }
    if (!store->configure()) {
        setError(error, QStringLiteral("%1 cannot be opened: %2").arg(name, store->lastError()));
        return nullptr;
    }
    return store;
}

std::unique_ptr<Store> Store::create(const QString& path, int userVersion, QString* error)
{
    if (QFileInfo::exists(path)) {
        setError(error, QStringLiteral("%1 already exists.").arg(path));
        return nullptr;
    }
    std::unique_ptr<Store> store = connectTo(path);
    QSqlDatabase db = QSqlDatabase::database(store->connectionName(), false);
    QString why;
    bool ok = db.isOpen();
    if (!ok)
        why = errorText(db.lastError());
    ok = ok && sqlite::setApplicationId(db, ApplicationId, &why)
         && sqlite::setUserVersion(db, userVersion, &why) && sqlite::configure(db, &why);
    if (!ok) {
        setError(error, QStringLiteral("%1 cannot be created: %2").arg(path, why));
        db = QSqlDatabase();
        store.reset();
        // Leave nothing half made behind.
        for (const char* suffix : {"", "-wal", "-shm", "-journal"})
            QFile::remove(path + QLatin1String(suffix));
        return nullptr;
    }
    return store;
}

int Store::userVersion() const
{
    QSqlDatabase db = QSqlDatabase::database(m_connection, false);
    int v = 0;
    QString error;
    if (!sqlite::userVersion(db, &v, &error))
        m_lastError = error;
    return v;
}

bool Store::setUserVersion(int v)
{
    QSqlDatabase db = QSqlDatabase::database(m_connection, false);
    QString error;
    if (!sqlite::setUserVersion(db, v, &error)) {
        m_lastError = error;
        return false;
    }
    return true;
}

bool Store::createTable(const QString& table, const QList<Column>& columns)
{
    if (table.isEmpty() || columns.isEmpty()) {
        m_lastError = QStringLiteral("A table needs a name and at least one column");
        return false;
    }
    QStringList defs;
    for (const Column& c : columns)
        defs.append(quoted(c.name) + QLatin1Char(' ') + sqlite::declaredType(c.type));
    QSqlDatabase db = QSqlDatabase::database(m_connection, false);
    QSqlQuery q(db);
    if (!q.exec(QStringLiteral("CREATE TABLE %1 (%2)").arg(quoted(table), defs.join(QLatin1String(", "))))) {
        m_lastError = errorText(q.lastError());
        return false;
    }
    return true;
}

bool Store::hasTable(const QString& table) const
{
    return tables().contains(table, Qt::CaseInsensitive);
}

QStringList Store::tables() const
{
    return QSqlDatabase::database(m_connection, false).tables(QSql::Tables);
}

QStringList Store::columnNames(const QString& table) const
{
    QSqlDatabase db = QSqlDatabase::database(m_connection, false);
    QStringList names;
    for (const Column& c : sqlite::columns(db, table))
        names.append(c.name);
    return names;
}

bool Store::deleteAll(const QString& table)
{
    QSqlDatabase db = QSqlDatabase::database(m_connection, false);
    QSqlQuery q(db);
    if (!q.exec(QStringLiteral("DELETE FROM %1").arg(quoted(table)))) {
        m_lastError = errorText(q.lastError());
        return false;
    }
    return true;
}

std::unique_ptr<Recordset> Store::openRecordset(const QString& table, const QString& orderBy)
{
    QSqlDatabase db = QSqlDatabase::database(m_connection, false);
    const QList<Column> cols = sqlite::columns(db, table);
    if (cols.isEmpty()) {
        m_lastError = QStringLiteral("There is no table %1").arg(table);
        return nullptr;
    }
    QString order;
    if (!orderBy.isEmpty()) {
        for (const Column& c : cols) {
            if (c.name.compare(orderBy, Qt::CaseInsensitive) == 0)
                order = c.name;
        }
        if (order.isEmpty()) {
            m_lastError = QStringLiteral("There is no field %1 in %2").arg(orderBy, table);
            return nullptr;
        }
    }
    std::unique_ptr<Recordset> rs(new Recordset(*this, table, cols, order));
    if (!rs->load()) {
        m_lastError = rs->lastError();
        return nullptr;
    }
    // Opened on the first record, as the algorithms expect.
    rs->m_pos = rs->m_rowIds.isEmpty() ? -1 : 0;
    return rs;
}

bool Store::beginTransaction()
{
    if (m_txDepth == 0) {
        QSqlDatabase db = QSqlDatabase::database(m_connection, false);
        if (!db.transaction()) {
            m_lastError = errorText(db.lastError());
            return false;
        }
        m_txDoomed = false;
    }
    ++m_txDepth;
    return true;
}

bool Store::commit()
{
    if (m_txDepth == 0) {
        m_lastError = QStringLiteral("No transaction is open");
        return false;
    }
    if (m_txDepth > 1) {
        --m_txDepth;
        return true;
    }
    if (m_txDoomed) {
        rollback();
        m_lastError = QStringLiteral("An inner transaction was rolled back; nothing was written");
        return false;
    }
    QSqlDatabase db = QSqlDatabase::database(m_connection, false);
    if (!db.commit()) {
        // Still open: the caller rolls back.
        m_lastError = errorText(db.lastError());
        return false;
    }
    m_txDepth = 0;
    return true;
}

bool Store::rollback()
{
    if (m_txDepth == 0) {
        m_lastError = QStringLiteral("No transaction is open");
        return false;
    }
    if (m_txDepth > 1) {
        --m_txDepth;
        m_txDoomed = true;
        return true;
    }
    QSqlDatabase db = QSqlDatabase::database(m_connection, false);
    const bool ok = db.rollback();
    if (!ok)
        m_lastError = errorText(db.lastError());
    m_txDepth = 0;
    m_txDoomed = false;
    // Rows added inside are gone again; the open sets must not point at them.
    requeryAll();
    return ok;
}

void Store::requeryAll()
{
    for (Recordset* rs : std::as_const(m_recordsets))
        rs->Requery();
}

Store::Transaction::Transaction(Store& store) : m_store(store)
{
    m_done = !m_store.beginTransaction();
}

Store::Transaction::~Transaction()
{
    if (!m_done)
        m_store.rollback();
}

bool Store::Transaction::commit()
{
    if (m_done) {
        m_store.setLastError(QStringLiteral("The transaction is not open"));
        return false;
    }
    const int depth = m_store.m_txDepth;
    const bool ok = m_store.commit();
    // A failed outermost commit leaves the transaction open for the rollback.
    m_done = ok || m_store.m_txDepth < depth;
    return ok;
}

bool Store::integrityCheck(QString* report)
{
    QSqlDatabase db = QSqlDatabase::database(m_connection, false);
    QStringList findings;
    QString error;
    if (!sqlite::integrityCheck(db, &findings, &error)) {
        m_lastError = error;
        if (report)
            *report = error;
        return false;
    }
    if (report)
        *report = findings.join(QLatin1Char('\n'));
    return findings == QStringList{QStringLiteral("ok")};
}

bool Store::compactInto(const QString& target)
{
    if (QFileInfo::exists(target)) {
        m_lastError = QStringLiteral("%1 already exists").arg(target);
        return false;
    }
    if (m_txDepth > 0) {
        m_lastError = QStringLiteral("A compact cannot run inside a transaction");
        return false;
    }
    QSqlDatabase db = QSqlDatabase::database(m_connection, false);
    QString error;
    if (!sqlite::vacuumInto(db, target, &error)) {
        m_lastError = error;
        return false;
    }
    return true;
}

// ===========================================================================
// Recordset

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
