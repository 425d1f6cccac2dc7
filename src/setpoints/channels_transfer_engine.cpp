#include "setpoints/channels_transfer_engine.h"

#include "link/commands.h"
#include "link/link.h"
#include "link/link_globals.h"
#include "setpoints/audit_trail.h"
#include "setpoints/catalogue.h"
#include "setpoints/channel_record_codec.h"
#include "setpoints/channel_sources.h"
#include "setpoints/instrument_schema.h"
#include "setpoints/instrument_store.h"

using channel_record::RecordValue;
using channel_record::ValueKind;

namespace {

constexpr int kLastWire = catalogue::kChannels - 1;
constexpr int kUploadRetries = 6;
constexpr int kDownloadTries = 6;
constexpr int kDownloadMismatches = 3;

QString uploadedLabel(int channel)
{
    return QStringLiteral("Channel %1 of 216 Channels Uploaded").arg(channel);
}

QString downloadedLabel(int channel)
{
    return QStringLiteral("Channel %1 of 216 Channels Downloaded").arg(channel);
}

void restart(Timer& t, int ms)
{
    t.stop();
    t.start(ms);
}

} // namespace

channels_transfer_engine::channels_transfer_engine(Link& link, Clock& clock, Operator& op, OpenViews& views,
                                                   InstrumentStore& store, UploadProgressView& upload,
                                                   QObject* parent)
    : QObject(parent), writer(commands::Sender::Channels, link, clock, op, views, store),
      command_prefix(commands::prefix(commands::Sender::Channels)), Timer5(clock), Timer6(clock),
      m_link(link), m_clock(clock), m_op(op), m_store(store), m_upload(upload)
{
    connect(&Timer5, &Timer::timeout, this, &channels_transfer_engine::Timer5_Timer);
    connect(&Timer6, &Timer::timeout, this, &channels_transfer_engine::Timer6_Timer);
    connect(&writer, &WritePath::changed, this, &channels_transfer_engine::changed);
    connect(&writer, &WritePath::confirmed, this, &channels_transfer_engine::confirmedWrite);
    QString error;
    m_sources = ChannelSources::open(m_store.store(), &error);
    if (!m_sources)
        qWarning("the channels' sources cannot be kept: %s", qPrintable(error));
    Recordset& sp = m_store.setpointsTable();
    if (sp.AbsolutePosition() < 0)
        sp.MoveFirst();
}

channels_transfer_engine::~channels_transfer_engine() = default;

void channels_transfer_engine::setAuditTrail(AuditTrail* audit)
{
    m_audit = audit;
    writer.setAuditTrail(audit);
}

void channels_transfer_engine::setChannel(int channel)
{
    m_store.setpointsTable().setAbsolutePosition(qBound(1, channel, catalogue::kChannels) - 1);
}

int channels_transfer_engine::channel()
{
    return m_store.setpointsTable().AbsolutePosition() + 1;
}

bool channels_transfer_engine::send(const QByteArray& body)
{
    return m_link.Output(commands::framed(commands::Sender::Channels, body));
}

void channels_transfer_engine::loadValidation()
{
    Recordset& info = m_store.infoTable();
    const QVariantList fallback = info.column(kInfoDefault);
    const QVariantList minimum = info.column(kInfoMinimum);
    const QVariantList maximum = info.column(kInfoMaximum);
    // Limits held as text are read as numbers once here, not for every value
    // of every record; a limit that is no number stays as it is and fails.
    const auto number = [](const QVariant& v) {
        double n = 0;
        return catalogue::numericValue(v, &n) ? QVariant(n) : v;
    };
    m_validation.clear();
    for (int row = 0; row < kInfoValidationRows && row < fallback.size(); ++row)
        m_validation.append({fallback[row], number(minimum.value(row)), number(maximum.value(row))});
}

void channels_transfer_engine::lineLost()
{
    if (!m_running)
        return;
    Timer6.stop();
    down_running = false;
    giveUp();
}

void channels_transfer_engine::confirmedWrite()
{
    // The write just confirmed is the newest entry of the trail; a global
    // value lives in row 0.
    if (!m_audit || !m_sources)
        return;
    const AuditEntry e = m_audit->last();
    if (e.kind == QLatin1String("P") && e.outcome == QLatin1String("X"))
        m_sources->mark(e.channel > 0 ? e.channel - 1 : 0, ChannelSources::Source::Edit);
}

QList<int> channels_transfer_engine::channelsNeverFilled(InstrumentStore& store, int channel)
{
    QList<int> wires;
    for (int wire = 0; wire < catalogue::kChannels; ++wire)
        if (channel == 0 || wire == channel - 1)
            wires.append(wire);
    QList<int> out;
    // A store whose marks cannot be read is treated as never filled.
    const std::unique_ptr<ChannelSources> sources = ChannelSources::open(store.store());
    for (int wire : sources ? sources->fromTemplate(wires) : wires)
        out.append(wire + 1);
    return out;
}

QStringList channels_transfer_engine::neverFilledText(const QList<int>& channels)
{
    if (channels.isEmpty())
        return {};
    const QString which = channels.size() == 1
                              ? QStringLiteral("Channel %1 has").arg(channels.first())
                              : QStringLiteral("%1 of 216 channels (%2) have")
                                    .arg(channels.size())
                                    .arg(ChannelSources::channelRuns(channels));
    return {QStringLiteral("%1 never been uploaded from the Glacinor or edited,").arg(which),
            QStringLiteral("the computer only holds the default set points for %1.")
                .arg(channels.size() == 1 ? QStringLiteral("it") : QStringLiteral("them"))};
}

int channels_transfer_engine::wireChannelOfRow()
{
    return m_store.setpointsTable().value(catalogue::kChannelNumberField).toInt() - 1;
}

void channels_transfer_engine::setButtons(bool enabled)
{
    uploadall.enabled = uploadchan.enabled = downloadall.enabled = downloadchan.enabled = enabled;
}

void channels_transfer_engine::setForms(bool enabled)
{
    forms_enabled = enabled;
}

// ---------------------------------------------------------------------------
// Upload

void channels_transfer_engine::uploadall_Click()
{
    uploading = true;
    writer.button_pressed = true;
    LinkGlobals& g = m_link.globals();
    if (!g.link_up)
        return;
    m_running = true;
    m_failed = false;
    m_transferred = 0;
    m_transferTotal = catalogue::kChannels;
    upload_retries = 0;
    upload_all = true;
    loadValidation();
    setForms(false);
    const bool sent = send("c");
    setButtons(false);
    m_upload.Show(QStringLiteral("Upload"), uploadedLabel(0),
                  QStringLiteral("Up Loading all Channels from the Glacinor"), 0);
    // The instrument takes longer for the first record.
    Timer5.start(g.speed_factor * 6000);
    Timer6.start(g.speed_factor * 5000);
    emit changed();
    if (!sent)
        lineLost();
}

void channels_transfer_engine::uploadchan_Click()
{
    uploading = true;
    writer.button_pressed = true;
    LinkGlobals& g = m_link.globals();
    if (!g.link_up)
        return;
    m_running = true;
    m_failed = false;
    m_transferred = 0;
    m_transferTotal = 1;
    upload_all = false;
    loadValidation();
    setForms(false);
    const int wire = wireChannelOfRow();
    const bool sent = send("a" + QByteArray::number(wire) + ',');
    sent_to_glacinor = QString::number(wire) + QLatin1Char(',');
    setButtons(false);
    Timer5.start(g.speed_factor * (wire == 0 ? 5000 : 4000));
    emit changed();
    if (!sent)
        lineLost();
}

void channels_transfer_engine::timeRepair(int field, int channel)
{
    const catalogue::TimeGroup* group = catalogue::timeGroupOf(field);
    if (!group)
        return;
    int index = 0;
    while (index < group->count && group->fields[std::size_t(index)] != field)
        ++index;
    if (index == 0)
        return;
    // The last defrost time is held against defrost time 5.
    const int against = field == 42 ? 39 : group->fields[std::size_t(index - 1)];
    Recordset& sp = m_store.setpointsTable();
    double now = 0, before = 0;
    if (!catalogue::numericValue(sp.value(field), &now) || !catalogue::numericValue(sp.value(against), &before)
        || now >= before)
        return;
    const QString name = QString::fromLatin1(group->name);
    const QString lower = name.left(1).toLower() + name.mid(1);
    const QString setTo = group->function == 17 ? name : lower;
    const int k = index + 1;
    // The message holds the transfer: no retry may ask for the next record
    // while this one is half stored.
    const bool retrying = Timer6.Enabled();
    Timer6.stop();
    m_op.message(QStringLiteral("Wrong Time Value"),
                 {QStringLiteral("%1 %2 was earlier than %3 %4,").arg(name).arg(k).arg(lower).arg(k - 1),
                  QStringLiteral("%1 %2 has been set to the same as %3 %4,").arg(name).arg(k).arg(setTo).arg(k - 1),
                  QStringLiteral("The Glacinor (Channel No. %1) must be updated and or changed to its correct time")
                      .arg(channel + 1)});
    sp.setValue(field, sp.value(against));
    if (retrying)
        Timer6.start(Timer6.Interval());
}

void channels_transfer_engine::sin_chan_up_load()
{
    return_string = m_link.test3Text();
    Timer5.stop();
    int invalid = 0;
    const int channel = channel_record::recordChannel(return_string);
    if (channel < 0) {
        channelInvalid();
        return;
    }
    const double version = m_link.globals().versionNumber();
    return_string = channel_record::widenedRecord(return_string, channel, version);

    Recordset& sp = m_store.setpointsTable();
    if (m_validation.isEmpty())
        loadValidation(); // a record nobody asked for
    saved_position = sp.AbsolutePosition();
    Store::Transaction tx(m_store.store());
    sp.setAbsolutePosition(channel);
    sp.Edit();
    for (const RecordValue& v : channel_record::uploadLayout(channel, version)) {
        const QString text = channel_record::valueText(return_string, v);
        switch (v.kind) {
        case ValueKind::Description:
            sp.setValue(v.field, text);
            break;
        case ValueKind::Unchecked: {
            double n = 0;
            const channel_record::UncheckedRange range = channel_record::uncheckedRange(v.field);
            const bool ok = catalogue::numericValue(text, &n) && n >= range.min && n <= range.max;
            sp.setValue(v.field, ok ? catalogue::storeNumber(n) : QVariant(channel_record::kUncheckedDefault));
            if (!ok)
                invalid = 1;
            break;
        }
        case ValueKind::Checked: {
            // As store_checked does it, against the row read at the start.
            const Validation c = m_validation.value(v.infoRow);
            sp.setValue(v.field, catalogue::checkedValue(channel_record::uploadNumber(text), c.fallback, c.minimum,
                                                         c.maximum, &invalid));
            break;
        }
        }
        // A time just repaired is not checked at once: the next value's
        // check catches it.
        bool justRepaired = false;
        if (catalogue::timeGroupOf(v.field)) {
            const QVariant before = sp.value(v.field);
            timeRepair(v.field, channel);
            justRepaired = sp.value(v.field) != before;
        }
        if (invalid == 1 && !justRepaired) {
            sp.CancelUpdate();
            invalidValue(channel, v.kind == ValueKind::Unchecked ? -1 - v.field : v.infoRow);
            return;
        }
    }
    sp.Update();
    if (m_sources)
        m_sources->mark(channel, ChannelSources::Source::Upload);
    tx.commit();
    ++m_transferred;
    emit channelDone(channel + 1);

    LinkGlobals& g = m_link.globals();
    if (upload_all) {
        if (channel < kLastWire) {
            Timer5.start(g.speed_factor * 4000);
            Timer6.start(g.speed_factor * 3000);
            upload_retries = 0;
            const bool sent = send("c");
            m_upload.setProgress(channel, uploadedLabel(channel + 1));
            m_upload.Show();
            sp.setAbsolutePosition(saved_position);
            emit changed();
            if (!sent)
                lineLost();
            return;
        }
        // The last record: nothing is to be asked for again.
        Timer6.stop();
        m_upload.Unload();
        setForms(true);
        finish(true);
        return;
    }
    Timer5.stop();
    setForms(true);
    sp.setAbsolutePosition(0);
    finish(true);
}

void channels_transfer_engine::invalidValue(int channel, int infoRow)
{
    QString name, fallback;
    if (infoRow >= 0) {
        name = m_store.info(infoRow, kInfoName).toString();
        fallback = channel_record::storeText(m_store.info(infoRow, kInfoDefault));
    } else {
        // Fields 223..227 have no `info` row: their rule is fixed.
        name = catalogue::fieldLabel(-1 - infoRow);
        fallback = QString::number(channel_record::kUncheckedDefault);
    }
    // Stopped before the message stands, so that no retry runs beneath it.
    Timer5.stop();
    Timer6.stop();
    m_op.message(QStringLiteral("Update Not Completed"),
                 {QStringLiteral("The value was not valid from the Glacinor,"),
                  QStringLiteral("The channel number was %1").arg(channel + 1),
                  QStringLiteral("The set point was %1,").arg(name),
                  QStringLiteral("The Default value of %1 was placed in this setpoint on the computer").arg(fallback),
                  QStringLiteral("Check the set point of this channel for its value, type or function "),
                  QStringLiteral("YOU MUST CHANGE THIS SET POINT ON THE GLACINOR OR THE COMPUTER SO THAT THE "
                                 "GLACINOR HAS A VALID VALUE FOR THAT SET POINT."),
                  QStringLiteral("If changing on the computer the set point may have to be done twice if the "
                                 "default value is the required value"),
                  QStringLiteral("ie. place any value into the glacinor then place the required value into the "
                                 "glacinor")},
                 Operator::Icon::Exclamation);
    Timer5.stop();
    Timer6.stop();
    setForms(true);
    m_upload.Unload();
    m_store.setpointsTable().setAbsolutePosition(0);
    finish(false);
}

void channels_transfer_engine::channelInvalid()
{
    Timer5.stop();
    Timer6.stop();
    m_op.message(QStringLiteral("Update Not Completed"),
                 {QStringLiteral("The Channel number was invalid,"), QStringLiteral("Redo the last command")},
                 Operator::Icon::Exclamation);
    setForms(true);
    m_upload.Unload();
    m_store.setpointsTable().setAbsolutePosition(0);
    finish(false);
}

void channels_transfer_engine::endOfTransfer()
{
    Recordset& sp = m_store.setpointsTable();
    const int back = saved_position;
    const QVariantList connected = sp.column(catalogue::kConnectedField);
    for (int row = 0; row < catalogue::kChannels && row < connected.size(); ++row)
        Command1_struck[std::size_t(row)] = connected[row].toInt() == 0;
    sp.setAbsolutePosition(back >= 0 ? back : 0);
    emit refillScreen();
    setButtons(true);
    m_op.beep();
}

void channels_transfer_engine::finish(bool ok)
{
    m_failed = m_failed || !ok;
    endOfTransfer();
    m_running = false;
    upload_all = false;
    emit changed();
    emit transferEnded(!m_failed);
}

void channels_transfer_engine::Timer6_Timer()
{
    Timer6.stop();
    ++upload_retries;
    if (upload_retries >= kUploadRetries)
        return; // Timer5 decides
    LinkGlobals& g = m_link.globals();
    // Half a record in the buffer would stand in front of the next one.
    m_link.emptyReceiveBuffer();
    const bool sent = send("c");
    Timer6.start(g.speed_factor * 3000);
    restart(Timer5, g.speed_factor * 5000);
    if (!sent)
        lineLost();
}

void channels_transfer_engine::giveUp()
{
    Timer5.stop();
    if (m_audit && m_auditEntry >= 0)
        m_audit->setOutcome(m_auditEntry, QStringLiteral("V"));
    m_auditEntry = -1;
    m_op.message(QStringLiteral("Comunications Failed"),
                 {QStringLiteral("The comunication with the Glacinor was not successful,"),
                  QStringLiteral("Re do the last command")},
                 Operator::Icon::Exclamation);
    m_link.emptyReceiveBuffer();
    m_downRows.clear();
    m_downFields.clear();
    setButtons(true);
    setForms(true);
    m_upload.Unload();
    m_running = false;
    m_failed = true;
    upload_all = false;
    emit changed();
    emit transferEnded(false);
}

void channels_transfer_engine::Timer5_Timer()
{
    if (!down_running) {
        giveUp();
        return;
    }
    ++down_timeouts;
    if (down_timeouts < kDownloadTries) {
        restart(Timer5, m_link.globals().speed_factor * 5000);
        if (!sendDownRecord(false))
            lineLost();
        return;
    }
    down_running = false;
    giveUp();
}

// ---------------------------------------------------------------------------
// Download

void channels_transfer_engine::sin_chan_down_load()
{
    Recordset& sp = m_store.setpointsTable();
    sp.setAbsolutePosition(down_channel);
    const double version = m_link.globals().versionNumber();
    QList<int> fields;
    QVariantList read;
    if (down_all && down_channel < m_downRows.size() && !m_downFields.at(down_channel).isEmpty()) {
        fields = m_downFields.at(down_channel);
        read = m_downRows.at(down_channel);
    } else {
        // Only the fields that go down are read, in one query.
        fields = channel_record::downloadFields(down_channel, version);
        if (!fields.contains(catalogue::kDescriptionField))
            fields.append(catalogue::kDescriptionField);
        read = sp.values(fields);
    }
    std::array<QVariant, catalogue::kSetpointFields> byField;
    for (qsizetype i = 0; i < fields.size() && i < read.size(); ++i)
        byField[std::size_t(fields[i])] = read[i];
    QVariant& description = byField[catalogue::kDescriptionField];
    const QString normal = channel_record::normalisedDescription(description.toString(), down_channel);
    if (normal != description.toString()) {
        Store::Transaction tx(m_store.store());
        sp.Edit();
        sp.setValue(catalogue::kDescriptionField, normal);
        sp.Update();
        tx.commit();
        description = normal;
        if (down_all && down_channel < m_downRows.size()) {
            const qsizetype at = m_downFields.at(down_channel).indexOf(catalogue::kDescriptionField);
            if (at >= 0)
                m_downRows[down_channel][at] = normal;
        }
    }
    down_record = channel_record::downloadRecord(down_channel, version,
                                                 [&byField](int field) { return byField[std::size_t(field)]; });
}

// A download of all channels reads its records at its start (the forms
// that could change them are locked meanwhile), one query for all channels
// of the same layout: the driver's work per query costs more than a record.
void channels_transfer_engine::readDownloadRows()
{
    const double version = m_link.globals().versionNumber();
    QHash<QList<int>, QList<int>> channelsByFields;
    for (int channel = 0; channel < catalogue::kChannels; ++channel) {
        QList<int> fields = channel_record::downloadFields(channel, version);
        if (!fields.contains(catalogue::kDescriptionField))
            fields.append(catalogue::kDescriptionField);
        channelsByFields[fields].append(channel);
    }
    m_downFields = QList<QList<int>>(catalogue::kChannels);
    m_downRows = QList<QVariantList>(catalogue::kChannels);
    for (auto it = channelsByFields.cbegin(); it != channelsByFields.cend(); ++it) {
        const QList<QVariantList> rows = m_store.setpointsTable().rows(it.value(), it.key());
        // On a failure each record is read as it goes down.
        for (qsizetype i = 0; i < rows.size(); ++i) {
            m_downFields[it.value().at(i)] = it.key();
            m_downRows[it.value().at(i)] = rows.at(i);
        }
    }
}

bool channels_transfer_engine::sendDownRecord(bool fresh)
{
    sin_chan_down_load();
    const bool sent = send("d" + down_record.toLatin1());
    sent_to_glacinor = down_record + QStringLiteral("downcheck");
    if (fresh && m_audit) {
        if (m_auditEntry >= 0)
            m_audit->setOutcome(m_auditEntry, QStringLiteral("V"));
        m_auditEntry = m_audit->begin(QStringLiteral("d"), -1, down_channel + 1, -1, QString(), down_record);
    }
    return sent;
}

void channels_transfer_engine::downloadall_Click()
{
    writer.button_pressed = true;
    down_running = true;
    LinkGlobals& g = m_link.globals();
    if (!g.link_up)
        return;
    m_running = true;
    m_failed = false;
    saved_position = m_store.setpointsTable().AbsolutePosition();
    m_transferred = 0;
    m_transferTotal = catalogue::kChannels;
    down_all = true;
    down_channel = 0;
    down_timeouts = 0;
    down_mismatches = 0;
    readDownloadRows();
    setForms(false);
    setButtons(false);
    m_upload.Show(QStringLiteral("Download"), downloadedLabel(1),
                  QStringLiteral("Down Loading all Channels to the Glacinor"), 0);
    const bool sent = sendDownRecord(true);
    Timer5.start(g.speed_factor * 5000);
    Timer6.stop();
    emit changed();
    if (!sent)
        lineLost();
}

void channels_transfer_engine::downloadchan_Click()
{
    writer.button_pressed = true;
    LinkGlobals& g = m_link.globals();
    if (!g.link_up)
        return;
    m_running = true;
    m_failed = false;
    saved_position = m_store.setpointsTable().AbsolutePosition();
    m_transferred = 0;
    m_transferTotal = 1;
    down_all = false;
    down_channel = wireChannelOfRow();
    setForms(false);
    setButtons(false);
    const bool sent = sendDownRecord(true);
    Timer5.start(g.speed_factor * (down_channel == 0 ? 5000 : 4000));
    emit changed();
    if (!sent)
        lineLost();
}

void channels_transfer_engine::down_check()
{
    return_string = m_link.test3Text();
    const bool same = return_string == sent_to_glacinor;
    const int sf = m_link.globals().speed_factor;
    if (down_all) {
        if (same) {
            m_link.Output(commands::downloadControl());
            down_mismatches = 0;
        } else if (++down_mismatches > kDownloadMismatches) {
            // Hand over to the time-out's count within a moment.
            restart(Timer5, sf * 200);
        } else {
            sendDownRecord(false);
            restart(Timer5, sf * (down_channel == 0 ? 5000 : 4000));
        }
    } else if (same) {
        m_link.Output(commands::downloadControl());
        m_op.beep();
    }
    if (same && m_audit && m_auditEntry >= 0) {
        m_audit->setOutcome(m_auditEntry, QStringLiteral("X"));
        m_auditEntry = -1;
    }
    emit changed();
}

void channels_transfer_engine::done_down()
{
    Recordset& sp = m_store.setpointsTable();
    ++m_transferred;
    if (down_all) {
        emit channelDone(down_channel + 1);
        ++down_channel;
        down_mismatches = 0;
        if (down_channel > kLastWire) {
            m_downRows.clear();
            m_downFields.clear();
            sp.setAbsolutePosition(saved_position >= 0 ? saved_position : 0);
            setButtons(true);
            Timer5.stop();
            setForms(true);
            m_upload.Unload();
            down_running = false;
            m_running = false;
            emit changed();
            emit transferEnded(!m_failed);
            return;
        }
        const bool sent = sendDownRecord(true);
        m_upload.setProgress(down_channel, downloadedLabel(down_channel + 1));
        restart(Timer5, m_link.globals().speed_factor * 4000);
        emit changed();
        if (!sent)
            lineLost();
        return;
    }
    emit channelDone(down_channel + 1);
    setButtons(true);
    Timer5.stop();
    setForms(true);
    sp.setAbsolutePosition(saved_position >= 0 ? saved_position : 0);
    m_running = false;
    emit changed();
    emit transferEnded(!m_failed);
}
