// How the screen shows the catalogue's values, and reads them back.

#include "setpoints/catalogue.h"

#include <QRegularExpression>

namespace catalogue {

namespace {

QString format00(qint64 v)
{
    const QString digits = QString::number(v < 0 ? -v : v).rightJustified(2, QLatin1Char('0'));
    return v < 0 ? QLatin1Char('-') + digits : digits;
}

} // namespace

ScreenForm screenForm(const Function& f, bool bankIsTemperature, int controlType)
{
    switch (f.unit) {
    case Unit::Tenths: return ScreenForm::Tenths;
    case Unit::KpaOrTenths: return bankIsTemperature ? ScreenForm::Tenths : ScreenForm::AsIs;
    case Unit::SecondsOrTenths: return controlType == kSuperHeatControlKind ? ScreenForm::Tenths : ScreenForm::AsIs;
    case Unit::TimeOfDay: return ScreenForm::Time;
    case Unit::Flag: return ScreenForm::Check;
    case Unit::ListIndex: return ScreenForm::List;
    case Unit::Text: return ScreenForm::Text;
    case Unit::DayMask: return ScreenForm::Check;
    default: return ScreenForm::AsIs;
    }
}

QString toScreen(const Function& f, qint64 storeValue, bool bankIsTemperature, int controlType)
{
    switch (screenForm(f, bankIsTemperature, controlType)) {
    case ScreenForm::Tenths: return formatTenths(storeValue);
    case ScreenForm::Time: return hhmm(storeValue);
    default: return QString::number(storeValue);
    }
}

QString formatTenths(qint64 tenths)
{
    const qint64 a = tenths < 0 ? -tenths : tenths;
    const QString text = QStringLiteral("%1.%2").arg(a / 10).arg(a % 10);
    return tenths < 0 ? QLatin1Char('-') + text : text;
}

std::optional<qint64> parseTenths(const QString& text)
{
    double v = 0;
    if (!numericValue(text, &v))
        return std::nullopt;
    return qRound64(v * 10.0);
}

QString hhmm(qint64 minutes)
{
    return format00(minutes / 60) + QLatin1Char(':') + format00(minutes % 60);
}

std::optional<int> minutesOf(const QString& hhmmText)
{
    static const QRegularExpression re(QStringLiteral("^\\s*(\\d{1,4}):(\\d{2})\\s*$"));
    const QRegularExpressionMatch m = re.match(hhmmText);
    if (!m.hasMatch())
        return std::nullopt;
    const int mm = m.captured(2).toInt();
    if (mm > 59)
        return std::nullopt;
    return m.captured(1).toInt() * 60 + mm;
}

} // namespace catalogue
