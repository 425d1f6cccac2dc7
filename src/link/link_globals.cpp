#include "link/link_globals.h"

#include <QRegularExpression>

bool isNumericText(const QString& text)
{
    static const QRegularExpression number(
        QStringLiteral("^\\s*[-+]?\\s*(\\d+\\.?\\d*|\\.\\d+)([eE][-+]?\\d+)?\\s*$"));
    return number.match(text).hasMatch();
}

double LinkGlobals::versionNumber() const
{
    if (!isNumericText(instrument_version))
        return 0;
    QString t = instrument_version;
    t.remove(QLatin1Char(' '));
    return t.toDouble();
}
