// What the catalogue accepts: a function's range, and the upload's test of a
// value against its `info` row.

#include "setpoints/catalogue.h"

#include <cmath>

namespace catalogue {

Range rangeOf(const Function& f, bool bankIsTemperature, int controlType)
{
    Q_UNUSED(bankIsTemperature); // 59..62 keep the same integers in both forms
    if (f.unit == Unit::SecondsOrTenths && controlType == kSuperHeatControlKind)
        return {10, 200};
    return {f.min, f.max};
}

bool inRange(const Function& f, qint64 storeValue, bool bankIsTemperature, int controlType)
{
    if (!f.rangeChecked)
        return true;
    const Range r = rangeOf(f, bankIsTemperature, controlType);
    return storeValue >= r.min && storeValue <= r.max;
}

bool numericValue(const QVariant& value, double* out)
{
    double v = 0;
    bool ok = false;
    switch (value.typeId()) {
    case QMetaType::Int:
    case QMetaType::UInt:
    case QMetaType::LongLong:
    case QMetaType::ULongLong:
    case QMetaType::Short:
    case QMetaType::UShort:
    case QMetaType::Double:
    case QMetaType::Float:
        v = value.toDouble(&ok);
        break;
    case QMetaType::QString:
    case QMetaType::QByteArray: {
        const QString s = value.toString().trimmed();
        if (!s.isEmpty())
            v = s.toDouble(&ok);
        break;
    }
    default:
        break;
    }
    if (!ok || !std::isfinite(v))
        return false;
    if (out)
        *out = v;
    return true;
}

QVariant storeNumber(double value)
{
    constexpr double kLimit = 9.0e15; // exact in a double
    if (std::trunc(value) == value && std::fabs(value) < kLimit)
        return QVariant(qlonglong(value));
    return QVariant(value);
}

QVariant checkedValue(const QVariant& value, const QVariant& defaultValue, const QVariant& minimum,
                      const QVariant& maximum, int* invalid)
{
    double v = 0, lo = 0, hi = 0;
    if (numericValue(value, &v) && numericValue(minimum, &lo) && numericValue(maximum, &hi) && v >= lo
        && v <= hi)
        return storeNumber(v);
    if (invalid)
        *invalid = 1;
    return defaultValue;
}

} // namespace catalogue
