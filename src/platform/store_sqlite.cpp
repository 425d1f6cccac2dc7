#include "platform/store_sqlite.h"

#include <QFile>
#include <QSqlQuery>

namespace store_detail {

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

bool exec(QSqlDatabase& db, const QString& sql, QString* error, QVariant* first)
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

static bool readInt(QSqlDatabase& db, const char* pragma, int* value, QString* error)
{
    QVariant v;
    if (!exec(db, QStringLiteral("PRAGMA %1").arg(QLatin1String(pragma)), error, &v))
        return false;
    *value = v.toInt();
    return true;
}

static bool writeInt(QSqlDatabase& db, const char* pragma, qint32 value, QString* error)
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

static Store::ColumnType columnType(const QString& declared)
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


QString engineVersion()
{
    const QString name = QStringLiteral("q19_engine_version");
    QString version = QStringLiteral("unknown");
    {
        QSqlDatabase db = QSqlDatabase::addDatabase(Driver, name);
        db.setDatabaseName(QStringLiteral(":memory:"));
        if (db.open()) {
            QSqlQuery q(db);
            if (q.exec(QStringLiteral("SELECT sqlite_version()")) && q.next())
                version = q.value(0).toString();
        }
        db.close();
    }
    QSqlDatabase::removeDatabase(name);
    return version;
}

} // namespace sqlite
} // namespace store_detail
