#include "ctl/ctl_connect.h"

#include "directory/data_folder.h"
#include "directory/directory_engine.h"
#include "platform/tcp_line.h"
#include "platform/line_factory.h"
#include "platform/store_layout.h"

#include <QEventLoop>
#include <QFileInfo>
#include <QTimer>
#include <cstdio>

namespace ctl {

namespace {

// Long enough for a modem call (50 s without an answer, then the messages).
constexpr int kGiveUpMs = 120000;

} // namespace

QString selectedInstrument(const QString& dataDir)
{
    DataFolder folder(dataDir);
    if (!folder.ensure())
        return {};
    HeadlessOperator op;
    ccForm1_directory form(folder, op);
    if (!form.Form_Load())
        return {};
    const QString id = form.openId();
    form.Form_Unload();
    return id;
}

std::optional<DirectoryRow> directoryRow(const QString& dataDir, const QString& id)
{
    using namespace directory_table;
    const QString file = DataFolder(dataDir).directoryFile();
    std::unique_ptr<Store> dir = QFileInfo::exists(file) ? Store::open(file) : nullptr;
    std::unique_ptr<Recordset> rows = dir ? dir->openRecordset(TableName) : nullptr;
    for (bool more = rows && rows->MoveFirst(); more && !rows->atEOF(); more = rows->MoveNext()) {
        const QString rowId = rows->value(columnName(ID)).toString().trimmed();
        if (id.isEmpty() || rowId == id)
            return DirectoryRow{rowId, rows->value(columnName(glacinorphone)).toString().trimmed()};
    }
    return std::nullopt;
}

Operator::Answer ConnectionOperator::ask(const Message& message)
{
    if (m_address.isEmpty() || message.title != QLatin1String("Invalid Port"))
        return HeadlessOperator::ask(message);
    Message network = message;
    network.title = QStringLiteral("No Connection");
    network.lines = {QStringLiteral("Cannot connect to the network address %1,").arg(m_address)};
    if (!message.lines.isEmpty())
        network.lines.append(message.lines.last());
    return HeadlessOperator::ask(network);
}

Connection::Connection(const CtlOptions& options) : op(options.yes), m_options(options) {}

Connection::~Connection()
{
    if (m_engine)
        m_engine->hangUp();
}

int Connection::open(const QString& command)
{
    m_id = m_options.id;
    // A new data folder is made as at the workstation's first start, so that
    // every command finds the same demo instrument there.
    QString folderError;
    if (!DataFolder(m_options.dataDir).ensure(&folderError)) {
        std::fprintf(stderr, "q19ctl: the data folder %s cannot be used: %s\n", qPrintable(m_options.dataDir),
                     qPrintable(folderError));
        return ctl::Failure;
    }
    if (const std::optional<DirectoryRow> row = directoryRow(m_options.dataDir, m_id)) {
        m_id = row->id;
        m_phone = row->modemPhone;
    }
    if (m_id.isEmpty()) {
        std::fprintf(stderr, "q19ctl: no instrument: give --id ID\n");
        return Usage;
    }
    if (!DataFolder::isValidId(m_id)) {
        std::fprintf(stderr, "q19ctl: an instrument ID is a number from 1 to 99999\n");
        return Usage;
    }
    // Only a well-formed ID names a file, so no ID can reach outside the folder.
    const QString file = DataFolder(m_options.dataDir).instrumentFile(m_id);
    if (!file.isEmpty() && QFileInfo::exists(file)) {
        m_store = Store::open(file);
        if (m_store)
            m_info = m_store->openRecordset(kInfoTable);
    }

    // A data folder made by the workstation's demo names the built-in simulator as its port.
    auto lineFactory = [this](const QString& port) {
        return makeWorkstationLine(port, [this] { return m_engine && m_engine->modemSelected(); });
    };
    m_engine = std::make_unique<ccForm1_engine>(clock, op, m_settings, views, globals, lineFactory);
    ccForm1_engine& engine = *m_engine;
    engine.setInstrument(m_id, m_phone, m_info.get());
    engine.LoadPropertySettings();
    // Without stored settings the line is direct: a modem needs a number.
    if (!m_info)
        engine.Option2_Click(1);
    if (!m_options.port.isEmpty()) {
        QString error;
        if (!engine.setCommPort(m_options.port, &error)) {
            std::fprintf(stderr, "q19ctl: %s\n", error.toLocal8Bit().constData());
            return Failure;
        }
    }
    const bool modem = engine.modemSelected();
    if (modem && m_phone.isEmpty()) {
        std::fprintf(stderr, "q19ctl: instrument %s has no modem number in the directory\n",
                     m_id.toLocal8Bit().constData());
        return Failure;
    }

    if (TcpLine::looksLikeTcp(engine.CommPort()))
        op.setNetworkAddress(engine.CommPort());
    const qsizetype messagesBefore = op.messages().size();
    QObject::connect(&engine, &ccForm1_engine::identityAccepted, &engine, [this] { m_accepted = true; });
    progress(modem ? QStringLiteral("Dialling %1 on %2").arg(m_phone, engine.CommPort())
                   : QStringLiteral("Connecting on %1").arg(engine.CommPort()));
    if (modem)
        engine.dial_num_Click();
    else
        engine.Command3_Click();
    // A message ends the dialogue.
    const bool ended = waitFor([&] { return m_accepted || op.messages().size() > messagesBefore; }, kGiveUpMs);
    if (!ended) {
        std::fprintf(stderr, "q19ctl: %s: no answer in %d s\n", command.toLocal8Bit().constData(),
                     kGiveUpMs / 1000);
        return Failure;
    }
    return m_accepted && op.messages().size() == messagesBefore ? Ok : Failure;
}

bool Connection::waitFor(const std::function<bool()>& done, int ms)
{
    if (done())
        return true;
    QEventLoop loop;
    QTimer check;
    // The engines report by their state, not by one signal: look often.
    QObject::connect(&check, &QTimer::timeout, &loop, [&] {
        if (done())
            loop.quit();
    });
    check.start(10);
    QTimer giveUp;
    giveUp.setSingleShot(true);
    QObject::connect(&giveUp, &QTimer::timeout, &loop, &QEventLoop::quit);
    giveUp.start(ms);
    loop.exec();
    return done();
}

} // namespace ctl
