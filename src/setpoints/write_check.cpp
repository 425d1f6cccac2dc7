#include "setpoints/write_check.h"

#include "setpoints/catalogue.h"
#include "setpoints/write_path.h"

#include <QRegularExpression>

namespace write_check {

namespace {

constexpr int kLastMinute = 24 * 60 - 1;
constexpr int kDayMaskFunction = 41;
constexpr int kAllSetPoints = 15;

using catalogue::Scope;

Verdict unknown(const QString& why)
{
    Verdict v;
    v.outcome = Outcome::Unknown;
    v.summary = why;
    return v;
}

Verdict refused(const QString& title, const QStringList& lines, const QString& why)
{
    Verdict v;
    v.outcome = Outcome::Refused;
    v.message = {title, lines, Operator::Icon::Exclamation};
    v.summary = why;
    return v;
}

Verdict notANumber(const QString& text, const QString& what)
{
    return refused(QStringLiteral("Invalid Value"),
                   {QStringLiteral("Not a valid number, Enter a valid number"),
                    QStringLiteral("The old value will be used.")},
                   QStringLiteral("\"%1\" is not %2").arg(text, what));
}

Verdict outOfRange(const QString& value, const QString& low, const QString& high, const QString& unit)
{
    const QString suffix = unit.isEmpty() ? QString() : QLatin1Char(' ') + unit;
    return refused(QStringLiteral("Invalid Value"),
                   {QStringLiteral("Value Out of Range,"), QStringLiteral("Enter a Value Between %1 and %2").arg(low, high)},
                   QStringLiteral("%1 is outside %2 to %3%4").arg(value, low, high, suffix));
}

Verdict accepted(const QVariant& stored)
{
    Verdict v;
    v.outcome = Outcome::Accept;
    v.stored = stored;
    return v;
}

Verdict unchanged(const QString& screen)
{
    Verdict v;
    v.outcome = Outcome::Unchanged;
    v.summary = QStringLiteral("the value is already %1").arg(screen);
    return v;
}

std::optional<qint64> wholeNumber(const QString& text)
{
    static const QRegularExpression re(QStringLiteral("^[+-]?\\d{1,9}$"));
    if (!re.match(text).hasMatch())
        return std::nullopt;
    return text.toLongLong();
}

// A decimal as the screen takes it: nothing finer than a tenth.
std::optional<qint64> tenthsOf(const QString& text)
{
    static const QRegularExpression re(QStringLiteral("^[+-]?(\\d{1,8}(\\.\\d*)?|\\.\\d+)$"));
    if (!re.match(text).hasMatch())
        return std::nullopt;
    const qsizetype point = text.indexOf(QLatin1Char('.'));
    if (point >= 0)
        for (QChar c : text.mid(point + 2))
            if (c != QLatin1Char('0'))
                return std::nullopt;
    return catalogue::parseTenths(text);
}

// The class whose channels alone have the function, with its line of the
// message; the editor offers such a value on any channel and refuses it late.
const char* classLine(Scope scope)
{
    switch (scope) {
    case Scope::Pressure: return "Must only use channel (pressure channels) numbers 1 to 15 inclusive,";
    case Scope::Compressor: return "Must only use channel (compressor) numbers 1 to 27 inclusive,";
    case Scope::Condenser: return "Must only use channel (condenser) numbers 1 to 12 inclusive,";
    default: return nullptr;
    }
}

const char* className(Scope scope)
{
    switch (scope) {
    case Scope::Pressure: return "a pressure channel";
    case Scope::Compressor: return "a compressor";
    default: return "a condenser";
    }
}

Verdict checkBox(int function, const QString& text, const QString& oldvalue)
{
    const std::optional<qint64> v = wholeNumber(text);
    if (!v)
        return notANumber(text, QStringLiteral("a whole number"));
    if (function == kDayMaskFunction) {
        if (*v == 0)
            return refused(QStringLiteral("Invalid Selection"),
                           {QStringLiteral("Must Select,"), QStringLiteral("at Least one Set Point")},
                           QStringLiteral("a day needs at least one of the four set points"));
        if (*v < 0 || *v > kAllSetPoints)
            return outOfRange(text, QStringLiteral("1"), QString::number(kAllSetPoints), {});
    } else if (*v != 0 && *v != 1) {
        return outOfRange(text, QStringLiteral("0"), QStringLiteral("1"), {});
    }
    if (wholeNumber(oldvalue.trimmed()) == v)
        return unchanged(QString::number(*v));
    return accepted(qlonglong(*v));
}

Verdict timeOfDay(const QString& text, const QString& oldvalue, const Context& c)
{
    const std::optional<int> minutes = catalogue::minutesOf(text);
    if (!minutes)
        return notANumber(text, QStringLiteral("a time hh:mm"));
    // The times of a group rise with their index: each lies between its neighbours.
    const int low = c.previousTime.value_or(0);
    const int high = c.nextTime.value_or(kLastMinute);
    if (*minutes < low || *minutes > high || *minutes > kLastMinute)
        return outOfRange(catalogue::hhmm(*minutes), catalogue::hhmm(low), catalogue::hhmm(high), {});
    if (catalogue::minutesOf(oldvalue) == minutes)
        return unchanged(catalogue::hhmm(*minutes));
    return accepted(*minutes);
}

} // namespace

QString screenUnit(const catalogue::Function& f, bool bankIsTemperature, int controlType)
{
    using U = catalogue::Unit;
    switch (f.unit) {
    case U::Tenths: return QStringLiteral("oC");
    case U::Kpa: return QStringLiteral("KPA");
    case U::KpaOrTenths: return bankIsTemperature ? QStringLiteral("oC") : QStringLiteral("KPA");
    case U::SecondsOrTenths:
        return controlType == catalogue::kSuperHeatControlKind ? QStringLiteral("oC") : QStringLiteral("seconds");
    case U::Minutes: return QStringLiteral("minutes");
    case U::Seconds: return QStringLiteral("seconds");
    case U::Percent: return QStringLiteral("%");
    case U::Watts: return QStringLiteral("watts");
    default: return {};
    }
}

QString screenText(const catalogue::Function& f, const QVariant& stored, bool bankIsTemperature, int controlType)
{
    double v = 0;
    if (f.unit == catalogue::Unit::Text || !catalogue::numericValue(stored, &v))
        return stored.toString();
    return catalogue::toScreen(f, qRound64(v), bankIsTemperature, controlType);
}

Verdict check(int function, int channel, int subfunction, const QString& typed, const QString& oldvalue,
              const Context& c)
{
    if (channel < 1 || channel > catalogue::kChannels)
        return unknown(QStringLiteral("channel %1 is not 1 to %2").arg(channel).arg(catalogue::kChannels));
    const QString text = typed.trimmed();
    if (write_command::checkBoxOf(function, subfunction) >= 0)
        return checkBox(function, text, oldvalue);

    const catalogue::Function* f = catalogue::findFunction(function);
    if (!f)
        return unknown(QStringLiteral("there is no function %1").arg(function));
    const QString name = QString::fromLatin1(f->name);
    if (f->field(subfunction) == catalogue::kNoField)
        return unknown(QStringLiteral("%1 (function %2) has no sub-function %3").arg(name).arg(function).arg(subfunction));
    const char* lateClass = classLine(f->scope);
    if (!lateClass && !f->appliesTo(channel))
        return unknown(QStringLiteral("channel %1 has no %2: it is kept for channels 1 to %3")
                           .arg(channel).arg(name).arg(catalogue::lastChannel(f->scope)));

    Verdict v;
    const catalogue::ScreenForm form = catalogue::screenForm(*f, c.bankIsTemperature, c.controlType);
    const QString unit = screenUnit(*f, c.bankIsTemperature, c.controlType);
    const catalogue::Range r = catalogue::rangeOf(*f, c.bankIsTemperature, c.controlType);
    if (f->unit == catalogue::Unit::Text) {
        // The description box refuses the comma as it is typed.
        if (typed.contains(QLatin1Char(',')))
            return refused(QStringLiteral("Invalid Character"),
                           {QStringLiteral("Not a valid entry,"),
                            QStringLiteral("You cannot use the \",\" character or the ENTER key")},
                           QStringLiteral("a description cannot hold \",\""));
        if (typed.isEmpty())
            return unknown(QStringLiteral("an empty description keeps the old one"));
        v = typed == oldvalue ? unchanged(typed) : accepted(typed);
    } else if (form == catalogue::ScreenForm::Time) {
        v = timeOfDay(text, oldvalue, c);
    } else if (form == catalogue::ScreenForm::Tenths) {
        const std::optional<qint64> tenths = tenthsOf(text);
        if (!tenths)
            return notANumber(text, QStringLiteral("a number with at most one decimal place"));
        if (*tenths < r.min || *tenths > r.max)
            return outOfRange(catalogue::formatTenths(*tenths), catalogue::formatTenths(r.min),
                              catalogue::formatTenths(r.max), unit);
        const std::optional<qint64> before = tenthsOf(oldvalue.trimmed());
        v = before == tenths ? unchanged(catalogue::formatTenths(*tenths)) : accepted(qlonglong(*tenths));
    } else {
        const std::optional<qint64> n = wholeNumber(text);
        if (!n)
            return notANumber(text, QStringLiteral("a whole number"));
        if (f->rangeChecked && (*n < r.min || *n > r.max))
            return outOfRange(QString::number(*n), QString::number(r.min), QString::number(r.max), unit);
        v = wholeNumber(oldvalue.trimmed()) == n ? unchanged(QString::number(*n)) : accepted(qlonglong(*n));
    }
    if (v.outcome != Outcome::Accept)
        return v;
    // The class of the channel is told after the value itself passed.
    if (lateClass && !f->appliesTo(channel))
        return refused(QStringLiteral("Invalid Channel No."),
                       {QStringLiteral("No change was made to set points"), QString::fromLatin1(lateClass)},
                       QStringLiteral("channel %1 is not %2 (1 to %3)")
                           .arg(channel).arg(QString::fromLatin1(className(f->scope)))
                           .arg(catalogue::lastChannel(f->scope)));
    return v;
}

} // namespace write_check
