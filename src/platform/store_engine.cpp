#include "platform/store_engine.h"

#include <QSqlDatabase>
#include <QSqlQuery>

QString storeEngineVersion()
{
    const QString name = QStringLiteral("q19_engine_version");
    QString version = QStringLiteral("unknown");
    {
        QSqlDatabase db = QSqlDatabase::addDatabase(QStringLiteral("QSQLITE"), name);
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
