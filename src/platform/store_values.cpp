#include "platform/store_values.h"

#include <QDateTime>

namespace store_detail {

const QString DateTimeFormat = QStringLiteral("yyyy-MM-ddTHH:mm:ss");

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

} // namespace store_detail
