#include "platform/store.h"

#include "platform/store_sqlite.h"

#include <QFile>
#include <QFileInfo>
#include <QSqlDatabase>
#include <QSqlError>
#include <QSqlQuery>
#include <atomic>

using namespace store_detail;

namespace {

QString nextConnectionName()
{
    static std::atomic<quint64> counter{0};
    return QStringLiteral("q19.store.%1").arg(++counter);
}

} // namespace

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
    if (!sqlite::userVersion(db, &v, &error)) {
        m_lastError = error;
        return -1;
    }
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
