// The set point transfers against q19sim on a pseudo-terminal: the real
// SerialLine, the real dispatcher, the real store.

#include "link/ccform1_engine.h"
#include "setpoints/audit_trail.h"
#include "setpoints/catalogue.h"
#include "setpoints/channel_record_codec.h"
#include "setpoints/channels_transfer_engine.h"
#include "setpoints/instrument_schema.h"
#include "setpoints/instrument_store.h"
#include "setpoints/upload_progress_engine.h"

#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QProcess>
#include <QRegularExpression>
#include <QSignalSpy>
#include <QTemporaryDir>
#include <QtTest>

namespace {

struct Sim {
    QProcess process;
    QString path;

    bool start(const QString& version)
    {
        process.setProgram(QStringLiteral(Q19SIM_PATH));
        process.setArguments({"--pty", "--id", "1", "--version", version});
        process.start();
        if (!process.waitForStarted(5000))
            return false;
        for (int i = 0; i < 50 && !process.canReadLine(); ++i)
            process.waitForReadyRead(100);
        path = QString::fromLocal8Bit(process.readLine()).trimmed();
        // A real instrument answers after a few milliseconds; an instant answer
        // would race the dispatcher's discard of the input behind each reply.
        control("delay = 3");
        return path.startsWith(QLatin1Char('/'));
    }
    void control(const QByteArray& line)
    {
        process.write(line + '\n');
        process.waitForBytesWritten(1000);
        QVERIFY(QTest::qWaitFor([&] { return process.readAllStandardError().contains("ok: "); }, 5000));
    }
    ~Sim()
    {
        process.kill();
        process.waitForFinished(2000);
    }
};

// The workstation: a line, a store and the channels view open on it.
struct Workstation {
    SystemClock clock;
    ScriptedOperator op;
    MemorySettings settings;
    OpenViews views;
    LinkGlobals globals;
    std::unique_ptr<InstrumentStore> store;
    std::unique_ptr<AuditTrail> audit;
    std::unique_ptr<ccForm1_engine> link;
    upload_progress_engine upload;
    std::unique_ptr<channels_transfer_engine> channels;

    bool open(const QString& dbPath, const QString& port)
    {
        if (!createInstrumentTemplate(dbPath) || !(store = InstrumentStore::open(dbPath)))
            return false;
        audit = AuditTrail::open(store->store(), clock);
        link = std::make_unique<ccForm1_engine>(clock, op, settings, views, globals);
        link->setInstrument(QStringLiteral("1"), QString(), nullptr);
        link->setCommPort(port);
        link->Option2_Click(1);
        channels = std::make_unique<channels_transfer_engine>(*link, clock, op, views, *store, upload);
        channels->setAuditTrail(audit.get());
        views.channels = channels.get();
        views.channels_open = true;
        QSignalSpy accepted(link.get(), &ccForm1_engine::identityAccepted);
        link->Command3_Click();
        return accepted.wait(5000);
    }
    ~Workstation()
    {
        views.channels_open = false;
        views.channels = nullptr;
        if (link)
            link->Command6_Click();
    }
    bool run(const std::function<void()>& start, int ms = 60000)
    {
        QSignalSpy ended(channels.get(), &channels_transfer_engine::transferEnded);
        start();
        if (ended.isEmpty() && !ended.wait(ms))
            return false;
        return ended.first().first().toBool();
    }
};

QString cell(InstrumentStore& s, int wire, int field)
{
    return channel_record::storeText(s.setpoint(wire, field));
}

} // namespace

class TestE2ESetpoints : public QObject {
    Q_OBJECT
private slots:
    void uploadChangeDownloadUploadAgain_data();
    void uploadChangeDownloadUploadAgain();
#ifdef Q19CTL_PATH
    void ctlUploadSetDiffDownloadAudit_data();
    void ctlUploadSetDiffDownloadAudit();
    void ctlDownloadsOnlyWhatCameFromTheInstrument();
    void ctlUploadCutOffSaysHowFarItGot();
#endif
};

void TestE2ESetpoints::uploadChangeDownloadUploadAgain_data()
{
    QTest::addColumn<QString>("version");
    QTest::newRow("7") << "7";
    QTest::newRow("14") << "14";
}

void TestE2ESetpoints::uploadChangeDownloadUploadAgain()
{
    QFETCH(QString, version);
    Sim sim;
    QVERIFY(sim.start(version));
    QTemporaryDir dir;
    Workstation ws;
    QVERIFY(ws.open(dir.filePath(QStringLiteral("t-1.db")), sim.path));
    QCOMPARE(ws.globals.instrument_version, version);

    QVERIFY2(ws.run([&] { ws.channels->uploadall_Click(); }), qPrintable(ws.op.last().toText()));
    QVERIFY2(ws.op.messages().isEmpty(), qPrintable(ws.op.last().toText()));

    // Change values of several kinds and places, then send everything down.
    const double v = version.toDouble();
    struct Change {
        int wire, field;
        QVariant value;
    };
    QList<Change> changes = {{0, 2, 55},     {3, 14, 120},          {99, 53, 33},
                             {150, 19, -200}, {215, 25, "Dock16"},   {0, 83, 2},
                             {26, 166, 7},    {11, 169, 2},          {6, 25, QString()}};
    if (v >= 14)
        changes.append({31, 227, 42});
    for (const Change& c : changes)
        QVERIFY(ws.store->setSetpoint(c.wire, c.field, c.value));
    QVERIFY2(ws.run([&] { ws.channels->downloadall_Click(); }), qPrintable(ws.op.last().toText()));
    QCOMPARE(cell(*ws.store, 6, 25), QStringLiteral("Ch 7  "));

    // A second workstation's copy, uploaded afresh, holds what went down.
    QTemporaryDir dir2;
    Workstation again;
    ws.link->Command6_Click();
    QVERIFY(again.open(dir2.filePath(QStringLiteral("t-1.db")), sim.path));
    QVERIFY(again.run([&] { again.channels->uploadall_Click(); }));
    for (int wire = 0; wire < catalogue::kChannels; ++wire)
        for (const channel_record::RecordValue& rv : channel_record::uploadLayout(wire, v))
            QVERIFY2(cell(*again.store, wire, rv.field) == cell(*ws.store, wire, rv.field),
                     qPrintable(QStringLiteral("wire %1 field %2: %3 against %4")
                                    .arg(wire).arg(rv.field)
                                    .arg(cell(*again.store, wire, rv.field), cell(*ws.store, wire, rv.field))));
    for (const Change& c : changes)
        if (c.field != 25)
            QCOMPARE(cell(*again.store, c.wire, c.field), channel_record::storeText(c.value));
    QCOMPARE(cell(*again.store, 215, 25), QStringLiteral("Dock16"));
}

#ifdef Q19CTL_PATH
namespace {

struct CtlRun {
    int exitCode = -1;
    QString out;
    QString err;
};

CtlRun ctl(const QString& dataDir, const QString& port, const QStringList& args)
{
    QProcess p;
    p.start(QStringLiteral(Q19CTL_PATH), QStringList{"--data-dir", dataDir, "--id", "1", "--port", port} + args);
    p.waitForFinished(120000);
    return {p.exitCode(), QString::fromLocal8Bit(p.readAllStandardOutput()),
            QString::fromLocal8Bit(p.readAllStandardError())};
}

} // namespace

void TestE2ESetpoints::ctlUploadSetDiffDownloadAudit_data()
{
    QTest::addColumn<QString>("version");
    QTest::newRow("7") << "7";
    QTest::newRow("14") << "14";
}

void TestE2ESetpoints::ctlUploadSetDiffDownloadAudit()
{
    QFETCH(QString, version);
    Sim sim;
    QVERIFY(sim.start(version));
    QTemporaryDir data; // a new data folder holds the demo instrument 1

    CtlRun r = ctl(data.path(), sim.path, {"setpoints", "upload", "--all"});
    QVERIFY2(r.exitCode == 0, qPrintable(r.err.right(400)));
    QVERIFY(r.err.contains(QStringLiteral("Channel 216 of 216 uploaded")));
    r = ctl(data.path(), sim.path, {"setpoints", "diff"});
    QCOMPARE(r.out, QStringLiteral("no differences\n"));

    r = ctl(data.path(), sim.path, {"set", "5", "4", "1", "-18.5"});
    QVERIFY2(r.exitCode == 0, qPrintable(r.err));
    QVERIFY2(r.out.startsWith(QStringLiteral("Set Temperature 2, channel 4: "))
                 && r.out.endsWith(QStringLiteral(" → -18.5 oC, confirmed\n")),
             qPrintable(r.out));
    r = ctl(data.path(), sim.path, {"set", "5", "4", "1", "abc"});
    QCOMPARE(r.exitCode, 1);
    // A wrong echo: "V" breaks the write off; the store keeps the value.
    sim.control("garble = P:2");
    r = ctl(data.path(), sim.path, {"set", "47", "4", "0", "77"});
    QCOMPARE(r.exitCode, 1);
    QVERIFY(r.err.contains(QStringLiteral("Update Not Completed: The value was not updated to the Glacinor,")));
    r = ctl(data.path(), sim.path, {"setpoints", "diff", "--channel", "4"});
    QVERIFY2(r.out.startsWith(QStringLiteral("channel 4 field 53 (")) && r.out.endsWith(QStringLiteral(" -> 77\n")),
             qPrintable(r.out));

    r = ctl(data.path(), sim.path, {"setpoints", "download", "--all"});
    QCOMPARE(r.exitCode, 1);
    r = ctl(data.path(), sim.path, {"setpoints", "download", "--all", "--yes"});
    QVERIFY2(r.exitCode == 0, qPrintable(r.err.right(400)));
    r = ctl(data.path(), sim.path, {"setpoints", "diff", "--channel", "4"});
    QCOMPARE(r.out, QStringLiteral("no differences\n"));

    r = ctl(data.path(), sim.path, {"--json", "audit"});
    QCOMPARE(r.exitCode, 0);
    const QJsonArray rows = QJsonDocument::fromJson(r.out.toUtf8()).array();
    QCOMPARE(rows.size(), 2 + 216);
    QCOMPARE(rows[0].toObject().value("kind").toString(), QStringLiteral("P"));
    QCOMPARE(rows[0].toObject().value("new").toString(), QStringLiteral("-185"));
    QCOMPARE(rows[0].toObject().value("outcome").toString(), QStringLiteral("X"));
    QCOMPARE(rows[1].toObject().value("function").toInt(), 47);
    QCOMPARE(rows[1].toObject().value("outcome").toString(), QStringLiteral("V"));
    QCOMPARE(rows[217].toObject().value("channel").toInt(), 216);
    QCOMPARE(rows[217].toObject().value("outcome").toString(), QStringLiteral("X"));
}
void TestE2ESetpoints::ctlDownloadsOnlyWhatCameFromTheInstrument()
{
    Sim sim;
    QVERIFY(sim.start(QStringLiteral("14")));
    QTemporaryDir data; // a new data folder: its store holds the template's values

    CtlRun r = ctl(data.path(), sim.path, {"setpoints", "download", "--channel", "1", "--yes"});
    QCOMPARE(r.exitCode, 1);
    QVERIFY2(r.err.contains(QStringLiteral("Channel 1 has never been uploaded from the Glacinor or edited,")),
             qPrintable(r.err));
    QVERIFY2(!r.err.contains(QStringLiteral("Connecting")), qPrintable(r.err)); // refused before the line opens
    r = ctl(data.path(), sim.path, {"setpoints", "upload", "--channel", "1"});
    QVERIFY2(r.exitCode == 0, qPrintable(r.err));
    r = ctl(data.path(), sim.path, {"setpoints", "download", "--channel", "1", "--yes"});
    QVERIFY2(r.exitCode == 0, qPrintable(r.err));
    r = ctl(data.path(), sim.path, {"setpoints", "download", "--all", "--yes"});
    QCOMPARE(r.exitCode, 1);
    QVERIFY2(r.err.contains(QStringLiteral("215 of 216 channels (2-216) have never been uploaded")), qPrintable(r.err));
    r = ctl(data.path(), sim.path, {"setpoints", "download", "--channel", "2", "--force", "--yes"});
    QVERIFY2(r.exitCode == 0, qPrintable(r.err));
}

void TestE2ESetpoints::ctlUploadCutOffSaysHowFarItGot()
{
    Sim sim;
    QVERIFY(sim.start(QStringLiteral("14")));
    sim.control("delay = 20"); // slow enough to be cut off in the middle
    QTemporaryDir data;
    QProcess p;
    p.setReadChannel(QProcess::StandardError);
    p.start(QStringLiteral(Q19CTL_PATH), QStringList{"--data-dir", data.path(), "--id", "1", "--port", sim.path,
                                                     "setpoints", "upload", "--all"});
    QString err;
    while (!err.contains(QStringLiteral("Channel 20 of 216 uploaded")) && p.waitForReadyRead(20000))
        err += QString::fromLocal8Bit(p.readAllStandardError());
    sim.process.kill();
    sim.process.waitForFinished(2000);
    QVERIFY(p.waitForFinished(60000));
    err += QString::fromLocal8Bit(p.readAllStandardError());
    QCOMPARE(p.exitCode(), 1);
    const QRegularExpressionMatch m =
        QRegularExpression(QStringLiteral("upload failed: (\\d+) of 216 channels stored")).match(err);
    QVERIFY2(m.hasMatch(), qPrintable(err.right(400)));
    const int stored = m.captured(1).toInt();
    QVERIFY2(stored >= 20 && stored < 216, qPrintable(err.right(400)));
    QVERIFY2(!err.contains(QStringLiteral("QIODevice")), qPrintable(err.right(400)));
    // The channels stored are the ones marked as coming from the instrument; the others are untouched.
    std::unique_ptr<InstrumentStore> store = InstrumentStore::open(data.filePath(QStringLiteral("t-1.db")));
    QVERIFY(store);
    QCOMPARE(channels_transfer_engine::channelsNeverFilled(*store, 0).size(), 216 - stored);
    QVERIFY(channels_transfer_engine::channelsNeverFilled(*store, stored).isEmpty());
    QCOMPARE(channels_transfer_engine::channelsNeverFilled(*store, stored + 1), QList<int>{stored + 1});
}
#endif

QTEST_MAIN(TestE2ESetpoints)
#include "tst_e2e_setpoints.moc"
