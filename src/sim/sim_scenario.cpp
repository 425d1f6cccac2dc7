#include "sim/sim_instrument.h"

#include <QStringList>

namespace sim {

namespace {

// "F:3,5" -> kind F, ordinals 3 and 5.
bool parseNth(const QString& value, QHash<QByteArray, QSet<int>>& into)
{
    const int colon = value.indexOf(QLatin1Char(':'));
    if (colon <= 0)
        return false;
    const QByteArray kind = value.left(colon).trimmed().toLatin1();
    QSet<int> set;
    for (const QString& part : value.mid(colon + 1).split(QLatin1Char(','), Qt::SkipEmptyParts)) {
        bool ok = false;
        const int n = part.trimmed().toInt(&ok);
        if (!ok || n < 1)
            return false;
        set.insert(n);
    }
    into[kind].unite(set);
    return true;
}

QByteArray dialResult(QString word)
{
    word = word.trimmed().toUpper().remove(QLatin1Char(' ')).remove(QLatin1Char('_'));
    if (word == QLatin1String("CONNECT"))
        return "CONNECT";
    if (word == QLatin1String("BUSY"))
        return "BUSY";
    if (word == QLatin1String("NOCARRIER"))
        return "NO CARRIER";
    if (word == QLatin1String("NODIALTONE"))
        return "NO DIALTONE";
    return {};
}

bool onOff(const QString& value, bool& ok)
{
    const QString v = value.toLower();
    ok = v.isEmpty() || v == QLatin1String("1") || v == QLatin1String("on") || v == QLatin1String("0") || v == QLatin1String("off");
    return v.isEmpty() || v == QLatin1String("1") || v == QLatin1String("on");
}

// "N:K" with N from first to last.
bool pair(const QString& value, int first, int last, int& n, int& k)
{
    const QStringList p = value.split(QLatin1Char(':'));
    bool ok1 = false, ok2 = false;
    n = p.value(0).toInt(&ok1);
    k = p.value(1).toInt(&ok2);
    return p.size() == 2 && ok1 && ok2 && n >= first && n <= last;
}

// The keys of the odd replies; false when the key is not one of them.
bool applyQuirk(InstrumentState& s, const QString& key, const QString& value, bool& ok)
{
    Quirks& q = s.quirks;
    int n = 0, k = 0;
    if (key == QLatin1String("zero_padded")) {
        q.zeroPadded = onOff(value, ok);
    } else if (key == QLatin1String("special")) {
        n = value.toLower() == QLatin1String("off") ? 0 : value.toInt(&ok);
        ok = ok && (n == 0 || (n <= NotConnected && n >= LoadShed));
        if (ok)
            q.special = n;
    } else if (key == QLatin1String("uncounted")) {
        n = value.toInt(&ok);
        ok = ok && n >= 0;
        if (ok)
            q.uncounted = n;
    } else if (key == QLatin1String("zero_record")) {
        q.zeroRecord = onOff(value, ok);
    } else if (key == QLatin1String("compressors_swapped")) {
        q.compressorsSwapped = onOff(value, ok);
    } else if (key == QLatin1String("torvanel_kind")) {
        ok = pair(value, 1, 27, n, k) && k >= -1 && k <= 9;
        if (ok)
            q.torvanelKind[n - 1] = k;
    } else if (key == QLatin1String("compressor_kind")) {
        ok = pair(value, 1, 27, n, k) && k >= 0 && k <= 99;
        if (ok) {
            s.forceCompressorKind(n - 1, k);
            q.wideKinds = true;
        }
    } else {
        return false;
    }
    return true;
}

// The instrument itself: what it reports and how fast it lives.
bool applySetting(Instrument& instrument, const QString& key, const QString& value, bool& ok)
{
    auto number = [&]() { return value.toInt(&ok); };
    if (key == QLatin1String("version")) {
        if (value.isEmpty())
            ok = false;
        else
            instrument.state().setVersion(value.toLatin1());
    } else if (key == QLatin1String("id")) {
        const int n = number();
        if (ok)
            instrument.settings().id = n;
    } else if (key == QLatin1String("resets")) {
        const int n = number();
        if (ok)
            instrument.state().setResets(n);
    } else if (key == QLatin1String("speed")) {
        const double s = value.toDouble(&ok);
        if (ok && s > 0)
            instrument.settings().speed = s;
        else
            ok = false;
    } else if (key == QLatin1String("brumalet_delay")) {
        const int n = number();
        if (ok)
            instrument.settings().brumaletDelayMs = qMax(0, n);
    } else {
        return false;
    }
    return true;
}

// The faults of the line, switched on and off.
bool applyFault(Instrument& instrument, const QString& key, const QString& value, bool& ok, QString* error)
{
    Faults& f = instrument.faults();
    auto flag = [&]() { return value.isEmpty() || value == QLatin1String("1") || value.toLower() == QLatin1String("on") || value.toLower() == QLatin1String("yes"); };
    auto number = [&]() { return value.toInt(&ok); };
    if (key == QLatin1String("dial")) {
        QList<QByteArray> results;
        for (const QString& w : value.split(QLatin1Char(','), Qt::SkipEmptyParts)) {
            const QByteArray r = dialResult(w);
            if (r.isEmpty()) {
                *error = QStringLiteral("error: unknown dial result '%1'").arg(w.trimmed());
                return true;
            }
            results << r;
        }
        if (results.isEmpty())
            ok = false;
        else
            f.dial = results;
    } else if (key == QLatin1String("drop")) {
        ok = parseNth(value, f.drop);
    } else if (key == QLatin1String("garble")) {
        ok = parseNth(value, f.garble);
    } else if (key == QLatin1String("delay")) {
        const int n = number();
        if (ok)
            f.delayMs = qMax(0, n);
    } else if (key == QLatin1String("batch")) {
        const QStringList p = value.split(QLatin1Char(':'));
        f.batchBytes = p.value(0).toInt(&ok);
        if (ok && p.size() > 1)
            f.batchGapMs = p.value(1).toInt(&ok);
    } else if (key == QLatin1String("nocomp")) {
        f.nocomp = flag();
    } else if (key == QLatin1String("wrong_id")) {
        if (value.toLower() == QLatin1String("off"))
            f.wrongId.reset();
        else {
            const int n = number();
            if (ok)
                f.wrongId = n;
        }
    } else if (key == QLatin1String("wrong_version")) {
        if (value.toLower() == QLatin1String("off"))
            f.wrongVersion.reset();
        else if (value.isEmpty())
            ok = false;
        else
            f.wrongVersion = value.toLatin1();
    } else if (key == QLatin1String("clear_faults")) {
        f = Faults();
        instrument.state().quirks = Quirks();
    } else {
        return false;
    }
    return true;
}

// What happens to the instrument now, as a control command asks.
bool applyControl(Instrument& instrument, const QString& key, const QString& value, bool& ok)
{
    auto number = [&]() { return value.toInt(&ok); };
    if (key == QLatin1String("reset")) {
        instrument.reset();
    } else if (key == QLatin1String("drop_line")) {
        instrument.dropLine(value.isEmpty() ? 10000 : number());
    } else if (key == QLatin1String("alarm")) {
        const int ch = number();
        if (ok && ch >= 1 && ch <= 264)
            instrument.state().raiseAlarm(ch);
        else
            ok = false;
    } else if (key == QLatin1String("torvanel_alarm")) {
        const QStringList p = value.split(QLatin1Char(':'));
        bool ok2 = false;
        const int s = p.value(0).toInt(&ok);
        const int i = p.value(1).toInt(&ok2);
        ok = ok && ok2 && p.size() >= 2;
        if (ok)
            instrument.state().setTorvanelAlarm(s, i, p.value(2, QStringLiteral("1")) != QLatin1String("0"));
    } else {
        return false;
    }
    return true;
}

} // namespace

QString applyScenarioLine(Instrument& instrument, const QString& rawLine)
{
    QString line = rawLine.trimmed();
    if (line.isEmpty() || line.startsWith(QLatin1Char('#')))
        return {};
    QString key, value;
    const int eq = line.indexOf(QLatin1Char('='));
    if (eq >= 0) {
        key = line.left(eq).trimmed();
        value = line.mid(eq + 1).trimmed();
    } else {
        const int sp = line.indexOf(QLatin1Char(' '));
        key = sp < 0 ? line : line.left(sp);
        value = sp < 0 ? QString() : line.mid(sp + 1).trimmed();
    }
    key = key.toLower().replace(QLatin1Char('-'), QLatin1Char('_'));
    bool ok = true;
    QString error;
    if (applySetting(instrument, key, value, ok) || applyFault(instrument, key, value, ok, &error)
        || applyControl(instrument, key, value, ok)) {
        if (!error.isEmpty())
            return error;
    } else if (applyQuirk(instrument.state(), key, value, ok)) {
        // one of the odd replies
    } else {
        return QStringLiteral("error: unknown key '%1'").arg(key);
    }
    return ok ? QString() : QStringLiteral("error: bad value for %1: '%2'").arg(key, value);
}

} // namespace sim
