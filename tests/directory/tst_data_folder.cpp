#include "directory/data_folder.h"
#include "setpoints/instrument_store.h"
#include "setpoints/instrument_schema.h"

#include <QtTest>

class TestDataFolder : public QObject {
    Q_OBJECT
private slots:
    void craftedIdsNameNoFile_data();
    void craftedIdsNameNoFile();
    void firstStartCreatesFolderWithDemoInstrument();
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
