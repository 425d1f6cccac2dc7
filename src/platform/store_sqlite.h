#pragma once

// The store's SQL dialect: everything particular to SQLite. A store on
// another server replaces these two files and nothing else.

#include "platform/store.h"

#include <QSqlDatabase>
#include <QSqlError>
#include <QStringList>

namespace store_detail {

// An identifier as SQL text, quoted.
QString quoted(const QString& identifier);
// The server's own words for an error when it has them.
QString errorText(const QSqlError& e);

namespace sqlite {

extern const QString Driver;
// The engine's own row number; rows keep insertion order by it.
extern const QString RowId;

// A data base file starts with this header; anything else (a text file, a
// file cut short before its first page) is refused before the driver sees it.
bool hasDatabaseHeader(const QString& path);
void setConnectOptions(QSqlDatabase& db);
// Runs one statement; the first value of its first row in *first.
bool exec(QSqlDatabase& db, const QString& sql, QString* error, QVariant* first = nullptr);
// Reads the schema, so that a damaged or truncated file fails here.
bool readable(QSqlDatabase& db, QString* error);
bool configure(QSqlDatabase& db, QString* error);
bool applicationId(QSqlDatabase& db, int* id, QString* error);
bool setApplicationId(QSqlDatabase& db, qint32 id, QString* error);
bool userVersion(QSqlDatabase& db, int* v, QString* error);
bool setUserVersion(QSqlDatabase& db, int v, QString* error);
QString declaredType(Store::ColumnType type);
// The columns of a table in ordinal order; empty when there is no such table.
QList<Store::Column> columns(QSqlDatabase& db, const QString& table);
bool integrityCheck(QSqlDatabase& db, QStringList* findings, QString* error);
bool vacuumInto(QSqlDatabase& db, const QString& target, QString* error);
// The engine's version, from a connection of its own.
QString engineVersion();

} // namespace sqlite
} // namespace store_detail
