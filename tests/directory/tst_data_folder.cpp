#include "directory/data_folder.h"
#include "setpoints/instrument_store.h"
#include "setpoints/channel_record_codec.h"
#include "setpoints/instrument_schema.h"
#include "sim/sim_state.h"

#include <QtTest>

class TestDataFolder : public QObject {
    Q_OBJECT
private slots:
    void craftedIdsNameNoFile_data();
    void craftedIdsNameNoFile();
    void firstStartCreatesFolderWithDemoInstrument();
    void demoStoreHoldsSimulatorSetpoints();
    void demoComesBack_data();
    void demoComesBack();
    void locationFromOptionOrXdg_data();
    void locationFromOptionOrXdg();
};

void TestDataFolder::craftedIdsNameNoFile_data()
{
    QTest::addColumn<QString>("id");
    QTest::addColumn<bool>("valid");
    QTest::newRow("parent") << "../x" << false;
    QTest::newRow("slash") << "1/2" << false;
    QTest::newRow("negative") << "-3" << false;
    QTest::newRow("six digits") << "123456" << false;
    QTest::newRow("exponent") << "1e3" << false;
    QTest::newRow("leading blank") << " 7" << false;
    QTest::newRow("trailing blank") << "7 " << false;
    QTest::newRow("leading zero") << "007" << false;
    QTest::newRow("zero") << "0" << false;
    QTest::newRow("empty") << "" << false;
    QTest::newRow("wildcard") << "1*" << false;
    QTest::newRow("newline") << "1\n2" << false;
    QTest::newRow("arabic-indic digit") << QString::fromUtf8("\u0661") << false;
    QTest::newRow("one") << "1" << true;
    QTest::newRow("five digits") << "99999" << true;
}

void TestDataFolder::craftedIdsNameNoFile()
{
    QFETCH(QString, id);
    QFETCH(bool, valid);
    QTemporaryDir tmp;
    const DataFolder folder(tmp.path());
    QCOMPARE(DataFolder::isValidId(id), valid);
    const QStringList names = {folder.instrumentFile(id), folder.backupFile(id), folder.layoutFile(0, id),
                               folder.layoutFile(9, id)};
    for (const QString& name : names) {
        if (!valid) {
            QVERIFY2(name.isEmpty(), qPrintable(name));
            continue;
        }
        QCOMPARE(QFileInfo(name).absolutePath(), folder.path());
    }
    if (valid) {
        QCOMPARE(QFileInfo(folder.instrumentFile(id)).fileName(), "t-" + id + ".db");
        QCOMPARE(QFileInfo(folder.backupFile(id)).fileName(), "t-" + id + ".bak");
        QCOMPARE(QFileInfo(folder.layoutFile(9, id)).fileName(), "s9-" + id + ".slf");
        QVERIFY(folder.layoutFile(10, id).isEmpty());
    }
}

void TestDataFolder::firstStartCreatesFolderWithDemoInstrument()
{
    QTemporaryDir tmp;
    const QString path = tmp.filePath("share/q19");
    DataFolder folder(path);
    QString error;
    QVERIFY2(folder.ensure(&error), qPrintable(error));

    {
        auto dir = Store::open(folder.directoryFile(), &error);
        QVERIFY2(dir, qPrintable(error));
        auto rows = dir->openRecordset(Table1::TableName);
        QVERIFY(rows);
        QCOMPARE(rows->RecordCount(), 1);
        rows->MoveFirst();
        QCOMPARE(rows->value(Table1::ID).toString(), "1");
        QCOMPARE(rows->value(Table1::Name).toString(), "Demo Cold Store");
        QCOMPARE(dir->columnNames(Table1::TableName),
                 QStringList({"ID", "Name", "Address", "townstate", "phoneno", "glacinorphone"}));
    }
    auto demo = InstrumentStore::open(folder.instrumentFile("1"), &error);
    QVERIFY2(demo, qPrintable(error));
    QCOMPARE(demo->info(kInfoPortRow, kInfoConnectionColumn).toString(), "Simulator (built-in)");
    QCOMPARE(demo->info(kInfoConnectionTypeRow, kInfoConnectionColumn).toString(), "1");
    QVERIFY(InstrumentStore::open(folder.templateFile(), &error));
    for (int n = 0; n < DataFolder::LayoutCount; ++n) {
        QFile layout(folder.layoutTemplate(n));
        QVERIFY(layout.open(QIODevice::ReadOnly));
        QCOMPARE(layout.readAll(), QByteArray("Q19 layout 1\n"));
        QVERIFY(QFileInfo::exists(folder.layoutFile(n, "1")));
    }
    // Nothing beside the folder.
    QCOMPARE(QDir(tmp.path()).entryList(QDir::AllEntries | QDir::NoDotAndDotDot), QStringList({"share"}));
    QCOMPARE(QDir(tmp.filePath("share")).entryList(QDir::AllEntries | QDir::NoDotAndDotDot), QStringList({"q19"}));

    // A later start makes only what is missing.
    QVERIFY(demo->setInfo(kInfoPortRow, kInfoConnectionColumn, "/dev/ttyUSB0"));
    demo.reset();
    QFile::remove(folder.layoutTemplate(4));
    QVERIFY(DataFolder(path).ensure());
    QCOMPARE(InstrumentStore::open(folder.instrumentFile("1"))->info(kInfoPortRow, kInfoConnectionColumn).toString(),
             "/dev/ttyUSB0");
    QVERIFY(QFileInfo::exists(folder.layoutTemplate(4)));
}

// The demo's first start: its store holds what the simulator behind it holds,
// so the views show compressors and descriptions before any upload.
void TestDataFolder::demoStoreHoldsSimulatorSetpoints()
{
    QTemporaryDir tmp;
    DataFolder folder(tmp.path());
    QString error;
    QVERIFY2(folder.ensure(&error), qPrintable(error));
    auto store = InstrumentStore::open(folder.instrumentFile("1"), &error);
    QVERIFY2(store, qPrintable(error));
    sim::Options options;
    options.historyHours = 0;
    const sim::InstrumentState instrument(options);
    int compared = 0;
    for (int wire = 0; wire < sim::Channels; ++wire) {
        QCOMPARE(store->setpoint(wire, sim::DescriptionField).toString(),
                 QString::fromLatin1(instrument.description(wire)));
        for (int field : channel_record::downloadFields(wire, instrument.versionNumber())) {
            if (field == sim::DescriptionField)
                continue;
            QVERIFY2(store->setpoint(wire, field).toDouble() == instrument.field(wire, field),
                     qPrintable(QStringLiteral("channel %1 field %2").arg(wire + 1).arg(field)));
            ++compared;
        }
    }
    QVERIFY2(compared > 216 * 20, qPrintable(QString::number(compared)));
    // Some of the plant is configured: a store of template values would not show it.
    QVERIFY(store->setpoint(0, 83).toInt() >= 1);
}

void TestDataFolder::demoComesBack_data()
{
    QTest::addColumn<QString>("damage");
    QTest::newRow("data base deleted") << "db";
    QTest::newRow("row deleted") << "row";
    QTest::newRow("row and files deleted") << "row+db";
    QTest::newRow("line changed") << "port";
    QTest::newRow("reset") << "reset";
}

// q19 --demo always finds its instrument on the built-in simulator; the
// operator's other instrument stays unless the demo is reset.
void TestDataFolder::demoComesBack()
{
    QFETCH(QString, damage);
    QTemporaryDir tmp;
    DataFolder folder(tmp.path());
    QString error;
    QVERIFY2(folder.ensureDemo(&error), qPrintable(error));
    {
        auto dir = Store::open(folder.directoryFile());
        auto rows = dir->openRecordset(Table1::TableName);
        QVERIFY(rows->AddNew() && rows->setValue(Table1::ID, 2) && rows->setValue(Table1::Name, "Other")
                && rows->Update());
        if (damage.startsWith("row")) {
            QVERIFY(rows->MoveFirst());
            while (rows->value(Table1::ID).toString() != "1")
                QVERIFY(rows->MoveNext());
            QVERIFY(rows->Delete());
        }
    }
    QVERIFY(DataFolder::copyReplacing(folder.templateFile(), folder.instrumentFile("2")));
    QFile foreign(tmp.filePath("notes.txt"));
    QVERIFY(foreign.open(QIODevice::WriteOnly));
    foreign.close();
    if (damage.endsWith("db"))
        QVERIFY(DataFolder::removeDataBase(folder.instrumentFile("1")));
    if (damage == "port")
        QVERIFY(InstrumentStore::open(folder.instrumentFile("1"))->setInfo(kInfoPortRow, kInfoConnectionColumn,
                                                                          "/dev/ttyS0"));
    if (damage == "reset")
        QVERIFY2(folder.removeProgramFiles(&error), qPrintable(error));

    QVERIFY2(folder.ensureDemo(&error), qPrintable(error));
    QStringList ids;
    {
        auto dir = Store::open(folder.directoryFile());
        auto rows = dir->openRecordset(Table1::TableName);
        for (int i = 0; i < rows->RecordCount(); ++i) {
            rows->setAbsolutePosition(i);
            ids << rows->value(Table1::ID).toString();
        }
    }
    ids.sort();
    QCOMPARE(ids, damage == "reset" ? QStringList({"1"}) : QStringList({"1", "2"}));
    QCOMPARE(QFileInfo::exists(folder.instrumentFile("2")), damage != "reset");
    QVERIFY(foreign.exists());
    auto demo = InstrumentStore::open(folder.instrumentFile("1"), &error);
    QVERIFY2(demo, qPrintable(error));
    QCOMPARE(demo->info(kInfoPortRow, kInfoConnectionColumn).toString(), "Simulator (built-in)");
    QVERIFY(demo->setpoint(0, 83).toInt() >= 1);
}

void TestDataFolder::locationFromOptionOrXdg_data()
{
    QTest::addColumn<QStringList>("arguments");
    QTest::addColumn<QString>("expected"); // relative to the temporary folder
    QTest::newRow("separate") << QStringList({"q19ctl", "--data-dir", "@/d", "directory", "list"}) << "d";
    QTest::newRow("joined") << QStringList({"q19", "--data-dir=@/e"}) << "e";
    QTest::newRow("xdg") << QStringList({"q19", "--demo"}) << "xdg/q19";
}

void TestDataFolder::locationFromOptionOrXdg()
{
    QFETCH(QStringList, arguments);
    QFETCH(QString, expected);
    QTemporaryDir tmp;
    arguments.replaceInStrings("@", tmp.path());
    qputenv("XDG_DATA_HOME", tmp.filePath("xdg").toLocal8Bit());
    QCOMPARE(DataFolder::location(DataFolder::dataDirOption(arguments)), tmp.filePath(expected));
}

QTEST_GUILESS_MAIN(TestDataFolder)
#include "tst_data_folder.moc"
