// q19ctl setpoints upload|download|diff and q19ctl audit: the transfers of
// the channels view without windows, and the record of the writes.

#include "ctl/ctl_command.h"
#include "ctl/ctl_connect.h"
#include "directory/data_folder.h"
#include "link/ccform1_engine.h"
#include "platform/clock.h"
#include "platform/operator.h"
#include "platform/settings.h"
#include "platform/store.h"
#include "setpoints/audit_trail.h"
#include "setpoints/catalogue.h"
#include "setpoints/channel_record_codec.h"
#include "setpoints/channels_transfer_engine.h"
#include "setpoints/instrument_store.h"
#include "setpoints/upload_progress_engine.h"

#include <QEventLoop>
#include <QFile>
#include <QFileInfo>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QTemporaryDir>
#include <QTimer>
#include <cstdio>

namespace {

// Long enough for all 216 channels at the slowest line speed.
constexpr int kTransferCapMs = 60 * 60 * 1000;

void err(const QString& text)
{
    std::fprintf(stderr, "q19ctl: %s\n", text.toLocal8Bit().constData());
}

void out(const QString& text)
{
    std::fputs(text.toLocal8Bit().constData(), stdout);
    std::fflush(stdout);
}

// The directory row of the ID (else the first one) and its modem number.
QString instrumentId(const CtlOptions& o, QString* phone)
{
    // A new data folder is made as at the program's first start.
    DataFolder(o.dataDir).ensure();
    const std::optional<ctl::DirectoryRow> row = ctl::directoryRow(o.dataDir, o.id);
    if (!row)
        return o.id;
    if (phone)
        *phone = row->modemPhone;
    return row->id;
}

QString storePath(const CtlOptions& o, const QString& id)
{
    return DataFolder(o.dataDir).instrumentFile(id);
}

// One connection to the instrument with the channels view open on a store.
class Session {
public:
    explicit Session(const CtlOptions& o) : m_options(o), m_conn(o) {}

    ~Session()
    {
        m_conn.views.channels_open = false;
        m_conn.views.channels = nullptr;
    }

    HeadlessOperator& op() { return m_conn.op; }
    LinkGlobals& globals() { return m_conn.globals; }
    channels_transfer_engine& channels() { return *m_channels; }
    InstrumentStore& store() { return *m_store; }

    // Connects, then opens the instrument's store (or the one given) under
    // the channels view.
    int open(const QString& command, const QString& storeFile = {})
    {
        if (const int rc = m_conn.open(command))
            return rc;
        const QString path = storeFile.isEmpty() ? storePath(m_options, m_conn.id()) : storeFile;
        QString error;
        m_store = InstrumentStore::open(path, &error);
        if (!m_store) {
            err(QStringLiteral("%1: %2").arg(path, error));
            return ctl::Failure;
        }
        m_audit = AuditTrail::open(m_store->store(), m_conn.clock, &error);
        if (!m_audit) {
            err(QStringLiteral("no audit trail: %1").arg(error));
            return ctl::Failure;
        }
        m_channels = std::make_unique<channels_transfer_engine>(m_conn.engine(), m_conn.clock, m_conn.op,
                                                                m_conn.views, *m_store, m_upload);
        m_channels->setAuditTrail(m_audit.get());
        m_conn.views.channels = m_channels.get();
        m_conn.views.channels_open = true;
        ctl::progress(QStringLiteral("Connected: version %1").arg(m_conn.globals.instrument_version));
        return ctl::Ok;
    }

    // Runs a transfer to its end; true when it ended without a failure.
    bool transfer(const std::function<void()>& start, const QString& verb)
    {
        bool ok = false, ended = false;
        QObject::connect(m_channels.get(), &channels_transfer_engine::channelDone, m_channels.get(),
                         [verb](int channel) {
                             ctl::progress(QStringLiteral("Channel %1 of 216 %2").arg(channel).arg(verb));
                         });
        QObject::connect(m_channels.get(), &channels_transfer_engine::transferEnded, m_channels.get(),
                         [&](bool good) {
                             ok = good;
                             ended = true;
                         });
        start();
        if (m_channels->transferRunning())
            m_conn.waitFor(
                [&] {
                    // A line that closes ends the transfer at once.
                    if (!ended && m_channels->transferRunning() && !m_conn.engine().line().isOpen())
                        m_channels->lineLost();
                    return ended;
                },
                kTransferCapMs);
        QObject::disconnect(m_channels.get(), &channels_transfer_engine::transferEnded, nullptr, nullptr);
        QObject::disconnect(m_channels.get(), &channels_transfer_engine::channelDone, nullptr, nullptr);
        return ended && ok;
    }

    // Runs the event loop until done() holds.
    bool waitFor(const std::function<bool()>& done) { return m_conn.waitFor(done, kTransferCapMs); }

private:
    const CtlOptions& m_options;
    ctl::Connection m_conn;
    std::unique_ptr<InstrumentStore> m_store;
    std::unique_ptr<AuditTrail> m_audit;
    upload_progress_engine m_upload;
    std::unique_ptr<channels_transfer_engine> m_channels;
};

// --all or --channel N: 0 for all, the channel, or -1 when neither or both
// were given or the channel is not one.
int parseScope(const CtlOptions& o)
{
    const bool all = o.isSet(QStringLiteral("all"));
    if (o.isSet(QStringLiteral("channel")) == all)
        return -1;
    if (all)
        return 0;
    bool ok = false;
    const int n = o.value(QStringLiteral("channel")).toInt(&ok);
    return ok && n >= 1 && n <= catalogue::kChannels ? n : -1;
}

bool upload(Session& s, int channel)
{
    return s.transfer(
        [&] {
            if (channel == 0) {
                s.channels().uploadall_Click();
            } else {
                s.channels().setChannel(channel);
                s.channels().uploadchan_Click();
            }
        },
        QStringLiteral("uploaded"));
}

int differences(const CtlOptions& o, int channel)
{
    // The instrument's set points go into a scratch copy of the store; the
    // store itself is only read.
    QString phone;
    const QString id = instrumentId(o, &phone);
    if (id.isEmpty()) {
        err(QStringLiteral("no instrument: give --id ID"));
        return ctl::Usage;
    }
    QTemporaryDir scratchDir;
    const QString scratch = scratchDir.filePath(QStringLiteral("scratch.db"));
    if (!QFile::copy(storePath(o, id), scratch)) {
        err(QStringLiteral("cannot copy %1").arg(storePath(o, id)));
        return ctl::Failure;
    }
    QString error;
    std::unique_ptr<InstrumentStore> offline = InstrumentStore::open(storePath(o, id), &error);
    if (!offline) {
        err(error);
        return ctl::Failure;
    }
    Session s(o);
    if (const int rc = s.open(QStringLiteral("setpoints diff"), scratch))
        return rc;
    if (!upload(s, channel))
        return ctl::Failure;

    const double version = s.globals().versionNumber();
    QJsonArray rows;
    QString text;
    int count = 0;
    for (int wire = 0; wire < catalogue::kChannels; ++wire) {
        if (channel && wire != channel - 1)
            continue;
        for (int field : channel_record::downloadFields(wire, version)) {
            QString mine = channel_record::storeText(offline->setpoint(wire, field));
            const QString theirs = channel_record::storeText(s.store().setpoint(wire, field));
            if (field == catalogue::kDescriptionField)
                mine = channel_record::normalisedDescription(mine, wire);
            if (mine == theirs)
                continue;
            ++count;
            const QString label = catalogue::fieldLabel(field);
            rows.append(QJsonObject{{"channel", wire + 1}, {"field", field}, {"name", label},
                                    {"instrument", theirs}, {"store", mine}});
            text += QStringLiteral("channel %1 field %2 (%3): %4 -> %5\n")
                        .arg(wire + 1).arg(field).arg(label, theirs, mine);
        }
    }
    if (o.json)
        out(QString::fromUtf8(QJsonDocument(rows).toJson(QJsonDocument::Compact)) + QLatin1Char('\n'));
    else
        out(text.isEmpty() ? QStringLiteral("no differences\n") : text);
    ctl::progress(QStringLiteral("%1 values would change").arg(count));
    return ctl::Ok;
}

// Refuses a download of channels whose store rows never came from the
// instrument (they hold the template's values), unless forced.
bool mayDownload(const CtlOptions& o, int channel)
{
    const QString path = storePath(o, instrumentId(o, nullptr));
    std::unique_ptr<InstrumentStore> store = path.isEmpty() ? nullptr : InstrumentStore::open(path);
    if (!store)
        return true; // opening it for the transfer says why
    const QList<int> never = channels_transfer_engine::channelsNeverFilled(*store, channel);
    if (never.isEmpty())
        return true;
    for (const QString& line : channels_transfer_engine::neverFilledText(never))
        err(line);
    err(QStringLiteral("Upload from the Glacinor first, or give --force to download anyway."));
    return false;
}

int setpoints(const CtlOptions& o)
{
    const bool force = o.isSet(QStringLiteral("force"));
    const QString sub = o.args.value(0);
    const bool scoped = o.isSet(QStringLiteral("all")) || o.isSet(QStringLiteral("channel"));
    const int channel = parseScope(o);
    if ((sub != QLatin1String("upload") && sub != QLatin1String("download") && sub != QLatin1String("diff"))
        || o.args.size() != 1 || (channel < 0 && (sub != QLatin1String("diff") || scoped))) {
        return ctl::usageError(QStringLiteral("setpoints"),
                               QStringLiteral("give upload, download or diff, and --all or --channel N"));
    }
    if (sub == QLatin1String("diff"))
        return differences(o, qMax(0, channel));
    instrumentId(o, nullptr);

    Session s(o);
    if (sub == QLatin1String("download")) {
        if (!force && !mayDownload(o, channel))
            return ctl::Failure;
        const QString what = channel ? QStringLiteral("channel %1").arg(channel) : QStringLiteral("all channels");
        if (s.op().message(QStringLiteral("Download"),
                           {QStringLiteral("Are you sure !,"),
                            QStringLiteral("This will write the set points of %1 into the Glacinor.").arg(what)},
                           Operator::Icon::Question, Operator::Buttons::OkCancel)
            != Operator::Answer::Ok) {
            err(QStringLiteral("download cancelled: give --yes"));
            return ctl::Failure;
        }
    }
    if (const int rc = s.open(QStringLiteral("setpoints ") + sub))
        return rc;
    bool ok = false;
    if (sub == QLatin1String("upload")) {
        ok = upload(s, channel);
    } else {
        ok = s.transfer(
            [&] {
                if (channel == 0) {
                    s.channels().downloadall_Click();
                } else {
                    s.channels().setChannel(channel);
                    s.channels().downloadchan_Click();
                }
            },
            QStringLiteral("downloaded"));
    }
    if (!ok) {
        const channels_transfer_engine& c = s.channels();
        err(QStringLiteral("%1 failed: %2 of %3 channels %4")
                .arg(sub)
                .arg(c.channelsTransferred())
                .arg(c.channelsInTransfer())
                .arg(sub == QLatin1String("upload") ? QStringLiteral("stored, the rest of the store is as it was")
                                                    : QStringLiteral("taken by the Glacinor")));
    }
    return ok ? ctl::Ok : ctl::Failure;
}

int audit(const CtlOptions& o)
{
    if (!o.args.isEmpty()) {
        err(QStringLiteral("audit takes no arguments"));
        return ctl::Usage;
    }
    QString phone;
    const QString id = instrumentId(o, &phone);
    if (id.isEmpty()) {
        err(QStringLiteral("no instrument: give --id ID"));
        return ctl::Usage;
    }
    QString error;
    std::unique_ptr<InstrumentStore> store = InstrumentStore::open(storePath(o, id), &error);
    if (!store) {
        err(error);
        return ctl::Failure;
    }
    SystemClock clock;
    std::unique_ptr<AuditTrail> trail = AuditTrail::open(store->store(), clock, &error);
    if (!trail) {
        err(error);
        return ctl::Failure;
    }
    QJsonArray rows;
    QString text;
    for (const AuditEntry& e : trail->entries()) {
        const QString when = e.time.toString(QStringLiteral("yyyy-MM-dd hh:mm:ss"));
        const QString outcome = e.outcome.isEmpty() ? QStringLiteral("-") : e.outcome;
        rows.append(QJsonObject{{"time", when}, {"kind", e.kind}, {"function", e.function},
                                {"channel", e.channel}, {"subfunction", e.subfunction},
                                {"old", e.oldValue}, {"new", e.newValue}, {"outcome", outcome}});
        if (e.kind == QLatin1String("d"))
            text += QStringLiteral("%1 download channel %2: %3 [%4]\n").arg(when).arg(e.channel).arg(e.newValue, outcome);
        else
            text += QStringLiteral("%1 P%2 channel %3 sub %4: %5 -> %6 [%7]\n")
                        .arg(when).arg(e.function).arg(e.channel).arg(e.subfunction)
                        .arg(e.oldValue, e.newValue, outcome);
    }
    out(o.json ? QString::fromUtf8(QJsonDocument(rows).toJson(QJsonDocument::Compact)) + QLatin1Char('\n') : text);
    return ctl::Ok;
}

const ctl::Registration setpointsCommand(
    {QStringLiteral("setpoints"),
     QStringLiteral("upload (--all | --channel N) | download (--all | --channel N) [--force] | diff [--all | --channel N]"),
     QStringLiteral("upload the set points into the store, download the store into the instrument (channels "
                    "never uploaded or edited only with --force), or list what a download would change"),
     setpoints,
     {{QStringLiteral("all"), QStringLiteral("Every channel.")},
      {QStringLiteral("channel"), QStringLiteral("One channel, 1 to 216."), QStringLiteral("N")},
      {QStringLiteral("force"), QStringLiteral("Download channels that never came from the instrument.")}}});
const ctl::Registration auditCommand({QStringLiteral("audit"), QString(),
                                      QStringLiteral("list the writes sent to the instrument and their outcome"),
                                      audit});

} // namespace
