// q19ctl identify: connect as the instrument's stored settings say, check its
// identity and print what it reports.

#include "ctl/ctl_command.h"
#include "directory/data_folder.h"
#include "link/ccform1_engine.h"
#include "platform/clock.h"
#include "platform/operator.h"
#include "platform/settings.h"
#include "platform/store.h"

#include <QCoreApplication>
#include <QEventLoop>
#include <QFileInfo>
#include <QJsonDocument>
#include <QJsonObject>
#include <QTimer>
#include <cstdio>

namespace {

// Long enough for a modem call (50 s without an answer, then the messages).
constexpr int kGiveUpMs = 120000;

struct Instrument {
    QString id;
    QString phone;
    std::unique_ptr<Store> store;
    std::unique_ptr<Recordset> info;
};

// The directory row of the ID (its modem number) and the instrument's info
// table, where the data folder has them.
Instrument findInstrument(const CtlOptions& o)
{
    Instrument inst;
    inst.id = o.id;
    const QString directory = o.dataDir + QStringLiteral("/q-19.db");
    if (QFileInfo::exists(directory)) {
        if (std::unique_ptr<Store> dir = Store::open(directory)) {
            if (std::unique_ptr<Recordset> rows = dir->openRecordset(QStringLiteral("Table1"))) {
                for (bool more = rows->MoveFirst(); more && !rows->atEOF(); more = rows->MoveNext()) {
                    const QString rowId = rows->value(QStringLiteral("ID")).toString().trimmed();
                    if (inst.id.isEmpty())
                        inst.id = rowId;
                    if (rowId == inst.id) {
                        inst.phone = rows->value(QStringLiteral("glacinorphone")).toString().trimmed();
                        break;
                    }
                }
            }
        }
    }
    // Only a well-formed ID names a file, so no ID can reach outside the folder.
    const QString file = DataFolder(o.dataDir).instrumentFile(inst.id);
    if (!file.isEmpty() && QFileInfo::exists(file)) {
        inst.store = Store::open(file);
        if (inst.store)
            inst.info = inst.store->openRecordset(QStringLiteral("info"));
    }
    return inst;
}

int identify(const CtlOptions& o)
{
    if (!o.args.isEmpty()) {
        std::fprintf(stderr, "q19ctl: identify takes no arguments\n");
        return ctl::Usage;
    }
    Instrument inst = findInstrument(o);
    if (inst.id.isEmpty()) {
        std::fprintf(stderr, "q19ctl: no instrument: give --id ID\n");
        return ctl::Usage;
    }
    if (!DataFolder::isValidId(inst.id)) {
        std::fprintf(stderr, "q19ctl: an instrument ID is a number from 1 to 99999\n");
        return ctl::Usage;
    }

    SystemClock clock;
    HeadlessOperator op(o.yes);
    MemorySettings settings; // the workstation's own settings are not touched from here
    OpenViews views;
    LinkGlobals globals;
    ccForm1_engine engine(clock, op, settings, views, globals);
    engine.setInstrument(inst.id, inst.phone, inst.info.get());
    engine.LoadPropertySettings();
    // Without stored settings the line is direct: a modem needs a number.
    if (!inst.info)
        engine.Option2_Click(1);
    if (!o.port.isEmpty()) {
        QString error;
        if (!engine.setCommPort(o.port, &error)) {
            std::fprintf(stderr, "q19ctl: %s\n", error.toLocal8Bit().constData());
            return ctl::Failure;
        }
    }
    const bool modem = engine.Option2[0].value.toBool();
    if (modem && inst.phone.isEmpty()) {
        std::fprintf(stderr, "q19ctl: instrument %s has no modem number in the directory\n",
                     inst.id.toLocal8Bit().constData());
        return ctl::Failure;
    }

    QEventLoop loop;
    bool accepted = false;
    bool ended = false;
    const qsizetype messagesBefore = op.messages().size();
    QObject::connect(&engine, &ccForm1_engine::identityAccepted, &loop, [&] {
        accepted = true;
        QTimer::singleShot(0, &loop, &QEventLoop::quit);
    });
    // A message ends the dialogue; let the procedure that showed it finish.
    QObject::connect(&engine, &ccForm1_engine::changed, &loop, [&] {
        if (op.messages().size() > messagesBefore)
            QTimer::singleShot(0, &loop, &QEventLoop::quit);
    });
    QTimer::singleShot(kGiveUpMs, &loop, [&] {
        ended = true;
        loop.quit();
    });

    ctl::progress(modem ? QStringLiteral("Dialling %1 on %2").arg(inst.phone, engine.CommPort())
                        : QStringLiteral("Connecting on %1").arg(engine.CommPort()));
    if (modem)
        engine.dial_num_Click();
    else
        engine.Command3_Click();
    if (!accepted && op.messages().size() == messagesBefore)
        loop.exec();

    if (ended && !accepted)
        std::fprintf(stderr, "q19ctl: no answer in %d s\n", kGiveUpMs / 1000);
    const bool ok = accepted && op.messages().size() == messagesBefore;
    if (accepted) {
        const QString version = engine.version.text.trimmed();
        const QString resets = engine.resets.text.trimmed();
        const QString time = engine.time.text.trimmed();
        QString out;
        if (o.json) {
            QJsonObject j{{"version", version}, {"id", inst.id}, {"resets", resets}, {"time", time}};
            out = QString::fromUtf8(QJsonDocument(j).toJson(QJsonDocument::Compact)) + '\n';
        } else {
            out = QStringLiteral("version: %1\nid: %2\nresets: %3\ntime: %4\n")
                      .arg(version, inst.id, resets, time);
        }
        std::fputs(out.toLocal8Bit().constData(), stdout);
        std::fflush(stdout);
    }
    engine.hangUp();
    return ok ? ctl::Ok : ctl::Failure;
}

const ctl::Registration registration({QStringLiteral("identify"), QString(),
                                       QStringLiteral("connect, check the identity and print version, "
                                                      "ID, resets and the instrument's time"),
                                       identify});

} // namespace
