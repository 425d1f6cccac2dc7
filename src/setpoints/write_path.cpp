#include "setpoints/write_path.h"

#include "link/link.h"
#include "link/link_globals.h"
#include "link/open_views.h"
#include "setpoints/audit_trail.h"
#include "setpoints/catalogue.h"
#include "setpoints/channel_record_codec.h"
#include "setpoints/instrument_store.h"

#include <cmath>

using namespace write_command;

namespace write_command {

QByteArray pBody(int function, int channel, int subfunction, int width, const QStringList& values,
                 int group)
{
    QByteArray b = "P" + QByteArray::number(function) + ',' + QByteArray::number(channel) + ','
                   + QByteArray::number(subfunction) + ',' + QByteArray::number(width) + ',';
    b += values.value(0).toLatin1() + ',' + QByteArray::number(group) + ',';
    for (int i = 1; i < values.size(); ++i)
        b += values.at(i).toLatin1() + ',';
    return b;
}

QString pEcho(const QByteArray& body)
{
    QByteArray e = body.startsWith('P') ? body.mid(1) : body;
    if (e.endsWith(','))
        e.chop(1);
    return QString::fromLatin1(e) + QStringLiteral(",sret");
}

QByteArray pCommand(const QByteArray& prefix, const QByteArray& body)
{
    return commands::framed(prefix, body);
}

QByteArray checkBoxBody(int index, int channel, int value, int subfunction, int group)
{
    const QByteArray ch = QByteArray::number(channel);
    const QByteArray v = QByteArray::number(value);
    switch (index) {
    case 0: return "P0," + ch + ",0,0," + v + ',';
    case 2: case 3: case 4: case 6: case 7:
        return "P0," + ch + ',' + QByteArray::number(index) + ",0," + v + ',';
    case 5: return "P0," + ch + ",5,0," + v + ",1,";
    case 8: return "P18," + ch + ",1,0," + v + ",1,";
    case 1: return "P98," + ch + ",0,0," + v + ",1,";
    case 9: return "P99," + ch + ",0,0," + v + ",1,";
    case 10: return "P150," + ch + ",0,0," + v + ",1,";
    case 39: return "P109," + ch + ",0,0," + v + ",1,";
    case 40: return "P106," + ch + ",0,0," + v + ",1,";
    case 41: return "P8," + ch + ",0,0," + v + ",1,";
    default:
        break;
    }
    // The day boxes keep the function's leading zero on the wire.
    if (index >= 11 && index <= 38)
        return "P041," + ch + ',' + QByteArray::number(subfunction) + ",0," + v + ','
               + QByteArray::number(group) + ',';
    return {};
}

int checkBoxOf(int function, int subfunction)
{
    switch (function) {
    case 0:
        return subfunction == 0 || (subfunction >= 2 && subfunction <= 7) ? subfunction : -1;
    case 8: return subfunction == 0 ? 41 : -1;
    case 18: return subfunction == 1 ? 8 : -1;
    case 98: return subfunction == 0 ? 1 : -1;
    case 99: return subfunction == 0 ? 9 : -1;
    case 150: return subfunction == 0 ? 10 : -1;
    case 109: return subfunction == 0 ? 39 : -1;
    case 106: return subfunction == 0 ? 40 : -1;
    case 41: return subfunction >= 0 && subfunction <= 6 ? 11 + 4 * subfunction : -1;
    default: return -1;
    }
}

} // namespace write_command

namespace {

constexpr int kEchoWaitMs = 1000;
constexpr int kBlankTime = 600;
constexpr int kChannelsInBank = 1;
constexpr int kCompressorsInBank = 22;
constexpr int kCondensersInBank = 25;

int fieldOfCheckBox(int function, int subfunction)
{
    if (function == 41)
        return catalogue::findFunction(41)->field(subfunction);
    for (const catalogue::UntaggedValue& u : catalogue::untaggedValues())
        if (u.function == function && u.subfunction == subfunction)
            return u.field;
    return catalogue::kNoField;
}

} // namespace

WritePath::WritePath(commands::Sender sender, Link& link, Clock& clock, Operator& op, OpenViews& views,
                     InstrumentStore& store, QObject* parent)
    : QObject(parent), command_prefix(commands::prefix(sender)), Timer1(clock), Timer2(clock),
      Timer4(clock), m_link(link), m_clock(clock), m_op(op), m_views(views), m_store(store)
{
    connect(&Timer1, &Timer::timeout, this, [this] { noEcho(Timer1); });
    connect(&Timer2, &Timer::timeout, this, [this] { noEcho(Timer2); });
    connect(&Timer4, &Timer::timeout, this, [this] { noEcho(Timer4); });
}

bool WritePath::lostFocusGate()
{
    if (filling_screen)
        return false;
    for (bool* flag : {&skip_lost_focus, &button_pressed, &status_stopped}) {
        if (*flag) {
            *flag = false;
            return false;
        }
    }
    if (update_pending) {
        update_pending = false;
        return false;
    }
    if (stopRunningStatus()) {
        status_stopped = true;
        emit changed();
        return false;
    }
    if (no_send) {
        no_send = false;
        return false;
    }
    return true;
}

bool WritePath::stopRunningStatus()
{
    struct Candidate {
        bool open;
        StatusCycleView* view;
        const char* line;
    };
    const Candidate candidates[] = {
        {m_views.status_open, m_views.status, "Current Temperature Status is active,"},
        {m_views.statusp_open, m_views.statusp, "Current Pressure Status is active,"},
        {m_views.statusg_open, m_views.statusg, "Current Temperature Graphic Status is active,"},
        {m_views.statuspg_open, m_views.statuspg, "Current Pressure Status Graphic is active,"},
    };
    for (const Candidate& c : candidates) {
        if (!c.open || !c.view || !c.view->stopstatusEnabled())
            continue;
        // The instrument serves one dialogue at a time: its status replies
        // would mix with the echo.
        c.view->stopstatus_Click();
        m_op.message(QStringLiteral("Current Status Active"),
                     {QString::fromLatin1(c.line), QStringLiteral("It will be stopped to allow other proceedures.")});
        return true;
    }
    return false;
}

QString WritePath::storedText(int row, int field)
{
    return channel_record::storeText(m_store.setpoint(row, field));
}

void WritePath::send(const Write& w)
{
    {
        Store::Transaction tx(m_store.store());
        for (const auto& [field, value] : w.fields)
            m_store.setSetpoint(w.storeRow, field, value);
        tx.commit();
    }
    update_pending = true;
    LinkGlobals& g = m_link.globals();
    if (g.link_up) {
        m_link.Output(pCommand(command_prefix, w.body));
        sent_to_glacinor = pEcho(w.body);
        Timer& t = w.kind == KindCheck || w.kind == KindManualDefrost || w.kind == KindCancelDefrost
                       ? Timer1
                       : w.kind == KindText2 ? Timer2 : Timer4;
        t.stop();
        t.start(g.speed_factor * kEchoWaitMs);
        if (m_audit)
            m_auditEntry = m_audit->begin(QStringLiteral("P"), w.function,
                                          w.global ? 0 : w.channel + 1,
                                          w.subfunction, w.oldValue, w.newValue);
    }
    write_control_kind = w.kind;
    write_control_index = w.index;
    emit changed();
}

std::optional<WritePath::Write> WritePath::compose(int function, int channel, int subfunction,
                                                   const QString& screenText, QString* error)
{
    auto fail = [error](const QString& why) -> std::optional<Write> {
        if (error)
            *error = why;
        return std::nullopt;
    };
    if (channel < 1 || channel > catalogue::kChannels)
        return fail(QStringLiteral("channel %1 is not 1 to 216").arg(channel));
    const QString text = screenText.trimmed();
    const int wire = channel - 1;
    Write w;
    w.function = function;
    w.subfunction = subfunction;

    const int box = checkBoxOf(function, subfunction);
    if (box >= 0) {
        double v = 0;
        if (!catalogue::numericValue(text, &v) || v != std::floor(v))
            return fail(QStringLiteral("Not a valid number, Enter a valid number"));
        const int value = int(v);
        w.kind = box == 5 ? KindManualDefrost : box == 10 ? KindCancelDefrost : KindCheck;
        w.index = box;
        const int field = fieldOfCheckBox(function, subfunction);
        if (box == 40) {
            // The level alarms flag lives in row 0 and goes with row 0's channel.
            w.global = true;
            w.storeRow = 0;
            w.channel = m_store.setpoint(0, catalogue::kChannelNumberField).toInt() - 1;
        } else {
            w.storeRow = wire;
            w.channel = wire;
        }
        if (field != catalogue::kNoField) {
            w.fields.append({field, value});
            w.oldValue = storedText(w.storeRow, field);
        }
        w.newValue = QString::number(value);
        w.body = checkBoxBody(box, w.channel, value, subfunction, 7);
        return w;
    }

    const catalogue::Function* f = catalogue::findFunction(function);
    if (!f)
        return fail(QStringLiteral("there is no function %1").arg(function));
    const int field = f->field(subfunction);
    if (field == catalogue::kNoField)
        return fail(QStringLiteral("function %1 has no sub-function %2").arg(function).arg(subfunction));
    if (!f->appliesTo(channel))
        return fail(QStringLiteral("channel %1 has no function %2").arg(channel).arg(function));
    w.global = f->isGlobal();
    w.storeRow = f->storeRow(channel);
    w.channel = f->wireChannel(channel);
    w.oldValue = storedText(w.storeRow, field);
    const bool bankIsTemperature =
        f->unit == catalogue::Unit::KpaOrTenths
        && m_store.setpoint(0, catalogue::kBankKindField + subfunction).toInt() == 1;
    const int controlType = m_store.setpoint(wire, catalogue::kControlKindField).toInt();
    const catalogue::ScreenForm form = catalogue::screenForm(*f, bankIsTemperature, controlType);
    const QString notNumber = QStringLiteral("Not a valid number, Enter a valid number");
    QStringList values;
    QVariant stored;

    if (f->unit == catalogue::Unit::Text) {
        if (screenText.isEmpty())
            return fail(QStringLiteral("an empty description keeps the old one"));
        QString d = screenText;
        if (d.contains(QLatin1Char(',')))
            return fail(QStringLiteral("You cannot use the \",\" character or the ENTER key"));
        if (d.size() < catalogue::kDescriptionLength) {
            d = d.leftJustified(catalogue::kDescriptionLength, QLatin1Char(' '));
            description_fault = 2;
        } else if (d.size() > catalogue::kDescriptionLength) {
            d = d.left(catalogue::kDescriptionLength);
            description_fault = 1;
        }
        stored = d;
        values << d;
        w.kind = KindText1;
        w.index = 81;
    } else if (form == catalogue::ScreenForm::Time) {
        const std::optional<int> minutes = catalogue::minutesOf(text);
        if (!minutes)
            return fail(notNumber);
        stored = *minutes;
        // A time group goes down whole, whichever time was edited.
        for (int i = 0; i < f->group; ++i)
            values << (i == subfunction ? QString::number(*minutes)
                                        : storedText(w.storeRow, f->field(i)));
        w.kind = KindText2;
        w.index = subfunction;
    } else if (form == catalogue::ScreenForm::Tenths) {
        const std::optional<qint64> tenths = catalogue::parseTenths(text);
        if (!tenths)
            return fail(notNumber);
        stored = *tenths;
        values << QString::number(*tenths);
        w.kind = KindText2;
        w.index = subfunction;
    } else if (form == catalogue::ScreenForm::List) {
        double v = 0;
        if (!catalogue::numericValue(text, &v) || v != std::floor(v))
            return fail(notNumber);
        stored = qint64(v);
        // The store holds the list index; the instrument counts the
        // associated channels' list from 1.
        values << QString::number(function == 48 ? qint64(v) + 1 : qint64(v));
        w.kind = KindCombo1;
        w.index = subfunction;
    } else {
        double v = 0;
        if (!catalogue::numericValue(text, &v))
            return fail(notNumber);
        stored = catalogue::storeNumber(v);
        values << channel_record::storeText(stored);
        const bool text2 = f->unit == catalogue::Unit::KpaOrTenths || f->unit == catalogue::Unit::SecondsOrTenths;
        w.kind = function == 22 ? KindCompressorBank
                 : function == 25 ? KindCondenserBank
                 : text2          ? KindText2
                                  : KindText1;
        w.index = subfunction;
    }
    w.fields.append({field, stored});
    w.newValue = values.join(QLatin1Char(','));
    w.body = pBody(function, w.channel, subfunction, f->width, values, f->group);
    return w;
}

QString write_command::shownValue(InstrumentStore& store, int function, int channel, int subfunction)
{
    if (channel < 1 || channel > catalogue::kChannels)
        return {};
    if (const int box = checkBoxOf(function, subfunction); box >= 0) {
        const int field = fieldOfCheckBox(function, subfunction);
        return field == catalogue::kNoField
                   ? QStringLiteral("0")
                   : channel_record::storeText(store.setpoint(box == 40 ? 0 : channel - 1, field));
    }
    const catalogue::Function* f = catalogue::findFunction(function);
    if (!f || f->field(subfunction) == catalogue::kNoField)
        return {};
    const write_check::Context c = checkContextOf(store, function, channel, subfunction);
    return write_check::screenText(*f, store.setpoint(f->storeRow(channel), f->field(subfunction)),
                                   c.bankIsTemperature, c.controlType);
}

write_check::Context write_command::checkContextOf(InstrumentStore& store, int function, int channel,
                                                   int subfunction)
{
    write_check::Context c;
    const catalogue::Function* f = catalogue::findFunction(function);
    if (!f || channel < 1 || channel > catalogue::kChannels)
        return c;
    c.bankIsTemperature = f->unit == catalogue::Unit::KpaOrTenths
                          && store.setpoint(0, catalogue::kBankKindField + subfunction).toInt() == 1;
    c.controlType = store.setpoint(channel - 1, catalogue::kControlKindField).toInt();
    if (f->unit == catalogue::Unit::TimeOfDay) {
        auto timeAt = [&](int sub) -> std::optional<int> {
            if (sub < 0 || sub >= f->group)
                return std::nullopt;
            double v = 0;
            // A blank time reads 10:00.
            if (!catalogue::numericValue(store.setpoint(f->storeRow(channel), f->field(sub)), &v))
                return kBlankTime;
            return int(v);
        };
        c.previousTime = timeAt(subfunction - 1);
        c.nextTime = timeAt(subfunction + 1);
    }
    return c;
}

void WritePath::gotFocus(int function, int channel, int subfunction)
{
    oldvalue = shownValue(m_store, function, channel, subfunction);
}

bool WritePath::writeValue(int function, int channel, int subfunction, const QString& screenText,
                           QString* error)
{
    if (error)
        error->clear();
    if (!lostFocusGate()) {
        if (error)
            *error = status_stopped ? QStringLiteral("a running status view was stopped first")
                                    : QStringLiteral("another write is under way");
        return false;
    }
    description_fault = 0;
    const write_check::Verdict verdict = write_check::check(function, channel, subfunction, screenText, oldvalue,
                                                            checkContextOf(m_store, function, channel, subfunction));
    if (verdict.outcome != write_check::Outcome::Accept) {
        if (error)
            *error = verdict.outcome == write_check::Outcome::Unchanged ? QString() : verdict.summary;
        if (verdict.outcome == write_check::Outcome::Refused)
            m_op.ask(verdict.message);
        return false;
    }
    QString why;
    const std::optional<Write> w = compose(function, channel, subfunction, screenText, &why);
    if (!w) {
        description_fault = 0;
        if (error)
            *error = why;
        return false;
    }
    send(*w);
    effects(function);
    return true;
}

void WritePath::effects(int function)
{
    // The order places follow the banks' counts: a new count makes the old
    // order meaningless, so the natural order stands until the operator
    // picks a new one.
    if (function == kCompressorsInBank)
        resetOrder(catalogue::kCompressorOrderField, catalogue::lastChannel(catalogue::Scope::Compressor));
    else if (function == kCondensersInBank)
        resetOrder(catalogue::kCondenserOrderField, catalogue::lastChannel(catalogue::Scope::Condenser));
    else if (function == kChannelsInBank && m_views.status_open && m_views.status)
        m_views.status->redoBanks();
}

void WritePath::resetOrder(int field, int places)
{
    Store::Transaction tx(m_store.store());
    for (int row = 0; row < places; ++row)
        m_store.setSetpoint(row, field, row + 1);
    tx.commit();
}

void WritePath::ret_handel()
{
    return_string = m_link.test3Text();
    const int sf = m_link.globals().speed_factor;
    if (return_string == sent_to_glacinor) {
        m_link.Output(commands::acceptWrite());
        if (m_audit && m_auditEntry >= 0)
            m_audit->setOutcome(m_auditEntry, QStringLiteral("X"));
        m_auditEntry = -1;
        emit confirmed(write_control_kind, write_control_index);
        if (write_control_kind == KindCompressorBank || write_control_kind == KindCondenserBank)
            orderResetMessage(write_control_kind == KindCompressorBank);
        Timer1.stop();
    } else {
        // The failure path follows shortly.
        Timer1.stop();
        Timer1.start(sf * kEchoWaitMs);
    }
    Timer2.stop();
    Timer4.stop();
    update_pending = false;
    if (description_fault == 1) {
        m_op.message(QStringLiteral("To Many Characters"),
                     {QStringLiteral("Not a valid entry,"),
                      QStringLiteral("You must only put 6 characters into the Channel Discription,"),
                      QStringLiteral("The first 6 only will be placed in.")});
    } else if (description_fault == 2) {
        m_op.message(QStringLiteral("To Few Characters"),
                     {QStringLiteral("Not a valid entry,"),
                      QStringLiteral("You must put 6 characters into the Channel Discription,"),
                      QStringLiteral("Use the Space character to fill in for 6 characters."),
                      QStringLiteral("The Glacinor channel number will be placed in for Channel Discription.")});
    }
    description_fault = 0;
    emit changed();
}

void WritePath::orderResetMessage(bool compressors)
{
    const QString what = compressors ? QStringLiteral("compressor") : QStringLiteral("condenser");
    m_op.message(compressors ? QStringLiteral("Compressor Reset") : QStringLiteral("Condenser Reset"),
                 {QStringLiteral("The %1 order of all banks have been reset,").arg(what),
                  QStringLiteral("Re do %1 order for required banks,").arg(what),
                  QStringLiteral("and update to the Glacinor when finished.")});
}

void WritePath::noEcho(Timer& timer)
{
    timer.stop();
    if (m_link.globals().link_up)
        m_link.Output(commands::breakOff());
    update_pending = false;
    if (m_audit && m_auditEntry >= 0)
        m_audit->setOutcome(m_auditEntry, QStringLiteral("V"));
    m_auditEntry = -1;
    m_op.message(QStringLiteral("Update Not Completed"),
                 {QStringLiteral("The value was not updated to the Glacinor,"),
                  QStringLiteral("Re do the last set point")},
                 Operator::Icon::Exclamation);
    emit abandoned(write_control_kind, write_control_index);
    emit changed();
}
