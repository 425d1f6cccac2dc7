#include "platform/line.h"

#include <QStringList>

QString LineSettings::toText() const
{
    return QString::number(baud) + QLatin1Char(',') + parity + QLatin1Char(',')
        + QString::number(dataBits) + QLatin1Char(',') + stopBits;
}

std::optional<LineSettings> LineSettings::parse(const QString& text)
{
    // Cut from the end, so the speed is whatever stands before the parity.
    const int stopComma = text.lastIndexOf(QLatin1Char(','));
    if (stopComma < 0)
        return std::nullopt;
    const int bitsComma = text.lastIndexOf(QLatin1Char(','), stopComma - 1);
    if (bitsComma < 0)
        return std::nullopt;
    const int parityComma = text.lastIndexOf(QLatin1Char(','), bitsComma - 1);
    if (parityComma < 0)
        return std::nullopt;

    const QString stop = text.mid(stopComma + 1).trimmed();
    const QString bits = text.mid(bitsComma + 1, stopComma - bitsComma - 1).trimmed();
    const QString parity = text.mid(parityComma + 1, bitsComma - parityComma - 1).trimmed();
    const QString speed = text.left(parityComma).trimmed();

    LineSettings s;
    bool ok = false;
    s.baud = speed.toInt(&ok);
    if (!ok || s.baud <= 0)
        return std::nullopt;

    // Only the first letter counts: "Even" and "e" are the same.
    if (parity.isEmpty() || !QStringLiteral("emnos").contains(parity.at(0).toLower()))
        return std::nullopt;
    s.parity = parity.at(0).toLower();

    s.dataBits = bits.toInt(&ok);
    if (!ok || s.dataBits < 4 || s.dataBits > 8)
        return std::nullopt;

    if (stop.contains(QLatin1Char('.'))) {
        if (stop.toDouble(&ok) != 1.5 || !ok)
            return std::nullopt;
        s.stopBits = QStringLiteral("1.5");
    } else if (stop == QLatin1String("1") || stop == QLatin1String("2")) {
        s.stopBits = stop;
    } else {
        return std::nullopt;
    }
    return s;
}
