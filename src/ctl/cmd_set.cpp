// q19ctl set and q19ctl functions: one checked write of a set point, and the
// list of the functions it takes. Everything that can be checked without the
// instrument is checked before the line is opened: a modem call costs money.

#include "ctl/ctl_command.h"
#include "ctl/ctl_connect.h"
#include "directory/data_folder.h"
#include "platform/store.h"
#include "setpoints/audit_trail.h"
#include "setpoints/catalogue.h"
#include "setpoints/channels_transfer_engine.h"
#include "setpoints/instrument_store.h"
#include "setpoints/upload_progress_engine.h"
#include "setpoints/write_check.h"
#include "setpoints/write_path.h"

#include <QFileInfo>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <cstdio>

namespace {

constexpr int kEchoCapMs = 60 * 1000;

void err(const QString& text)
{
    std::fprintf(stderr, "q19ctl: %s\n", text.toLocal8Bit().constData());
}

void out(const QString& text)
{
    std::fputs(text.toUtf8().constData(), stdout);
    std::fflush(stdout);
}

// The directory's row of the ID (the first row without one); empty with the
// reason when there is none.
QString directoryId(const CtlOptions& o, QString* why)
{
    DataFolder(o.dataDir).ensure();
    if (const std::optional<ctl::DirectoryRow> row = ctl::directoryRow(o.dataDir, o.id))
        return row->id;
    *why = o.id.isEmpty() ? QStringLiteral("the directory holds no instrument: give --id ID")
                          : QStringLiteral("instrument %1 is not in the directory").arg(o.id);
    return {};
}

// A function by its number (as the instrument and this program count) or by its name.
std::optional<int> functionNumber(const QString& text)
{
    bool ok = false;
    const int n = text.toInt(&ok);
    if (ok)
        return n;
    if (const catalogue::Function* f = catalogue::findFunctionByName(text))
        return f->number;
    return std::nullopt;
}

// "Set Temperature 2", "Soft Defrost": what a write is called for the user.
QString valueName(int function, int subfunction)
{
    const catalogue::Function* f = catalogue::findFunction(function);
    if (f && f->field(subfunction) != catalogue::kNoField)
        return catalogue::fieldLabel(f->field(subfunction));
    for (const catalogue::UntaggedValue& u : catalogue::untaggedValues())
        if (u.function == function && u.subfunction == subfunction)
            return QString::fromLatin1(u.label);
    return QStringLiteral("Function %1.%2").arg(function).arg(subfunction);
}

struct Checked {
    int exit = ctl::Ok;
    bool send = false;
    QString before; // the value as the store shows it now
    QString unit;
};

// The write path's own checks against the store, before any line is opened.
Checked checkOffLine(const CtlOptions& o, const QString& id, int function, int channel, int sub,
                     const QString& value, HeadlessOperator& op)
{
    Checked r;
    const QString path = DataFolder(o.dataDir).instrumentFile(id);
    QString error;
    std::unique_ptr<InstrumentStore> store = InstrumentStore::open(path, &error);
    if (!store) {
        err(QStringLiteral("%1: %2").arg(path, error));
        r.exit = ctl::Failure;
        return r;
    }
    const write_check::Context c = write_command::checkContextOf(*store, function, channel, sub);
    r.before = write_command::shownValue(*store, function, channel, sub);
    if (const catalogue::Function* f = catalogue::findFunction(function))
        r.unit = write_check::screenUnit(*f, c.bankIsTemperature, c.controlType);
    const write_check::Verdict v = write_check::check(function, channel, sub, value, r.before, c);
    switch (v.outcome) {
    case write_check::Outcome::Accept:
        r.send = true;
        break;
    case write_check::Outcome::Unchanged:
        ctl::progress(QStringLiteral("%1: nothing sent").arg(v.summary));
        break;
    case write_check::Outcome::Refused:
        op.ask(v.message);
        err(v.summary);
        r.exit = ctl::Failure;
        break;
    case write_check::Outcome::Unknown:
        err(v.summary + QStringLiteral(" (q19ctl functions lists them)"));
        r.exit = ctl::Usage;
        break;
    }
    return r;
}

// Connects, opens the channels view on the store and writes through it.
int writeOnLine(const CtlOptions& o, int function, int channel, int sub, const QString& value,
                const Checked& checked)
{
    ctl::Connection conn(o);
    if (const int rc = conn.open(QStringLiteral("set")))
        return rc;
    const catalogue::Function* f = catalogue::findFunction(function);
    if (f && conn.globals.versionNumber() < f->minVersion) {
        err(QStringLiteral("%1 needs firmware %2 or later; the instrument has %3: nothing sent")
                .arg(QString::fromLatin1(f->name)).arg(f->minVersion).arg(conn.globals.instrument_version));
        return ctl::Failure;
    }
    QString error;
    std::unique_ptr<InstrumentStore> store =
        InstrumentStore::open(DataFolder(o.dataDir).instrumentFile(conn.id()), &error);
    std::unique_ptr<AuditTrail> audit = store ? AuditTrail::open(store->store(), conn.clock, &error) : nullptr;
    if (!audit) {
        err(error);
        return ctl::Failure;
    }
    upload_progress_engine upload;
    channels_transfer_engine channels(conn.engine(), conn.clock, conn.op, conn.views, *store, upload);
    channels.setAuditTrail(audit.get());
    conn.views.channels = &channels;
    conn.views.channels_open = true;
    WritePath& w = channels.writer;
    int result = -1;
    QObject::connect(&w, &WritePath::confirmed, &w, [&] { result = ctl::Ok; });
    QObject::connect(&w, &WritePath::abandoned, &w, [&] { result = ctl::Failure; });
    w.gotFocus(function, channel, sub);
    const QString before = w.oldvalue;
    if (w.writeValue(function, channel, sub, value, &error)) {
        ctl::progress(QStringLiteral("Sent, waiting for the echo %1").arg(w.sent_to_glacinor));
        conn.waitFor([&] { return result >= 0; }, kEchoCapMs);
    } else {
        // The store changed since the check: the write path has told why.
        result = error.isEmpty() ? ctl::Ok : ctl::Failure;
        if (!error.isEmpty())
            err(error);
    }
    conn.views.channels_open = false;
    conn.views.channels = nullptr;
    if (result == ctl::Ok && !w.sent_to_glacinor.isEmpty()) {
        const QString where = f && f->isGlobal() ? QString() : QStringLiteral(", channel %1").arg(channel);
        const QString unit = checked.unit.isEmpty() ? QString() : QLatin1Char(' ') + checked.unit;
        out(QStringLiteral("%1%2: %3 → %4%5, confirmed\n")
                .arg(valueName(function, sub), where, before,
                     write_command::shownValue(*store, function, channel, sub), unit));
    }
    return result < 0 ? ctl::Failure : result;
}

// "0-3", or "0, 2-5" where a check box serves a sub-function in between.
QString subfunctionList(const catalogue::Function& f)
{
    QStringList runs;
    for (int s = 0; s < int(f.fields.size()); ++s) {
        if (f.field(s) == catalogue::kNoField)
            continue;
        int e = s;
        while (f.field(e + 1) != catalogue::kNoField)
            ++e;
        runs << (e == s ? QString::number(s) : QStringLiteral("%1-%2").arg(s).arg(e));
        s = e;
    }
    return runs.join(QStringLiteral(", "));
}

// The values a function takes, as the screen shows them.
QString screenRange(const catalogue::Function& f)
{
    using U = catalogue::Unit;
    const auto span = [&](bool temperature, int controlType) {
        const catalogue::Range r = catalogue::rangeOf(f, temperature, controlType);
        const QString unit = write_check::screenUnit(f, temperature, controlType);
        const bool tenths = catalogue::screenForm(f, temperature, controlType) == catalogue::ScreenForm::Tenths;
        const auto show = [&](int v) { return tenths ? catalogue::formatTenths(v) : QString::number(v); };
        return QStringLiteral("%1 to %2%3").arg(show(r.min), show(r.max), unit.isEmpty() ? QString() : QLatin1Char(' ') + unit);
    };
    switch (f.unit) {
    case U::Text: return QStringLiteral("%1 characters").arg(catalogue::kDescriptionLength);
    case U::TimeOfDay: return QStringLiteral("00:00 to 23:59, rising within the group");
    case U::ListIndex: return QStringLiteral("list index %1 to %2").arg(f.min).arg(f.max);
    case U::DayMask: return QStringLiteral("1 to 15: bits of set points 1 to 4 in use");
    case U::KpaOrTenths: return span(false, 0) + QStringLiteral(", or in a temperature bank ") + span(true, 0);
    case U::SecondsOrTenths: return span(false, 0) + QStringLiteral(", or with control type 7 ") + span(false, 7);
    default: return f.rangeChecked ? span(false, 0) : QStringLiteral("any number");
    }
}

QString scopeText(const catalogue::Function& f)
{
    return f.isGlobal() ? QStringLiteral("global (channel 1 holds it)")
                        : QStringLiteral("channels 1-%1").arg(catalogue::lastChannel(f.scope));
}

int functions(const CtlOptions& o)
{
    if (!o.args.isEmpty()) {
        err(QStringLiteral("functions takes no arguments"));
        return ctl::Usage;
    }
    QJsonArray rows;
    QString text = QStringLiteral("Function numbers as on the wire; the front panel shows one higher.\n");
    for (const catalogue::Function& f : catalogue::functions()) {
        const QString name = QString::fromLatin1(f.name);
        rows.append(QJsonObject{{"function", f.number}, {"name", name}, {"subfunctions", subfunctionList(f)},
                                {"range", screenRange(f)}, {"channels", scopeText(f)}});
        text += QStringLiteral("%1  %2  sub %3  %4  %5\n")
                    .arg(f.number, 3).arg(name, -24).arg(subfunctionList(f), -6).arg(screenRange(f), scopeText(f));
    }
    text += QStringLiteral("Check boxes (0 or 1):\n");
    for (const catalogue::UntaggedValue& u : catalogue::untaggedValues()) {
        if (u.subfunction < 0 || u.field == catalogue::kNoField)
            continue;
        rows.append(QJsonObject{{"function", u.function}, {"name", QString::fromLatin1(u.label)},
                                {"subfunctions", QString::number(u.subfunction)}, {"range", "0 or 1"}});
        text += QStringLiteral("%1  %2  sub %3  %4\n")
                    .arg(u.function, 3).arg(QString::fromLatin1(u.label), -24).arg(u.subfunction, -6)
                    .arg(QString::fromLatin1(u.meaning));
    }
    out(o.json ? QString::fromUtf8(QJsonDocument(rows).toJson(QJsonDocument::Compact)) + QLatin1Char('\n') : text);
    return ctl::Ok;
}

int set(const CtlOptions& o)
{
    if (o.args.size() != 4) {
        err(QStringLiteral("usage: set FUNCTION CHANNEL SUBFUNCTION VALUE"));
        return ctl::Usage;
    }
    const std::optional<int> function = functionNumber(o.args[0]);
    if (!function) {
        err(QStringLiteral("no function is called \"%1\" (q19ctl functions lists them)").arg(o.args[0]));
        return ctl::Usage;
    }
    bool okChannel = false, okSub = false;
    const int channel = o.args[1].toInt(&okChannel);
    const int sub = o.args[2].toInt(&okSub);
    if (!okChannel || !okSub) {
        err(QStringLiteral("CHANNEL (1-216) and SUBFUNCTION are numbers"));
        return ctl::Usage;
    }
    QString why;
    const QString id = directoryId(o, &why);
    if (id.isEmpty()) {
        err(why);
        return ctl::Usage;
    }
    HeadlessOperator op(o.yes);
    const Checked checked = checkOffLine(o, id, *function, channel, sub, o.args[3], op);
    if (!checked.send)
        return checked.exit;
    CtlOptions withId = o;
    withId.id = id;
    return writeOnLine(withId, *function, channel, sub, o.args[3], checked);
}

const ctl::Registration setCommand(
    {QStringLiteral("set"), QStringLiteral("FUNCTION CHANNEL SUBFUNCTION VALUE"),
     QStringLiteral("write one set point to the store and the instrument, checked by its echo. FUNCTION is "
                    "the number on the wire, as `functions` lists it (the front panel shows one higher), or "
                    "its name; CHANNEL 1-216; VALUE in screen units (21.5, 08:30, a list index)"),
     set});
const ctl::Registration functionsCommand(
    {QStringLiteral("functions"), QString(),
     QStringLiteral("list the set point functions that set takes: number, name, sub-functions, range in "
                    "screen units, channels"),
     functions});

} // namespace
