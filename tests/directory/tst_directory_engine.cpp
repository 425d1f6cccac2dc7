#include "directory/directory_engine.h"
#include "platform/operator.h"
#include "setpoints/instrument_schema.h"
#include "setpoints/instrument_store.h"

#include <QtTest>

namespace {

using Answer = Operator::Answer;
using Box = ccForm1_directory;

struct Fixture {
    QTemporaryDir tmp;
    DataFolder folder{tmp.path()};
    ScriptedOperator op;
    std::unique_ptr<ccForm1_directory> form;

    Fixture() { QVERIFY(folder.ensure()); }
    bool load()
    {
        form = std::make_unique<ccForm1_directory>(folder, op);
        return form->Form_Load();
    }
    bool add(const QString& id, const QString& name, const QString& phone = {})
    {
        form->Command1_Click();
        form->Text1_Change(Box::IdBox, id);
        form->Text1_Change(Box::NameBox, name);
        form->Text1_Change(Box::ModemPhoneBox, phone);
        return form->Command4_Click();
    }
    QStringList ids() const
    {
        QStringList out;
        for (const QStringList& row : form->rows())
            out << row.at(Table1::ID);
        return out;
    }
    // Journals of the open data bases come and go; they are not files of the folder.
    QStringList files(const QString& filter) const
    {
        QStringList names = QDir(folder.path()).entryList({filter}, QDir::Files);
        names.removeIf([](const QString& n) { return n.endsWith("-wal") || n.endsWith("-shm"); });
        return names;
    }
};

QStringList layouts(const QString& id)
{
    QStringList out;
    for (int n = 0; n < DataFolder::LayoutCount; ++n)
        out << QStringLiteral("s%1-%2.slf").arg(n).arg(id);
    return out;
}

} // namespace

class TestDirectoryEngine : public QObject {
    Q_OBJECT
private slots:
    void freshFolderOpensWithDemoRowSelected();
    void startUpDropsRowsWhoseDataBaseIsGone_data();
    void startUpDropsRowsWhoseDataBaseIsGone();
    void startUpWithoutAnyDataBaseEnds();
    void addUpdateRefusalsAndFiles_data();
    void addUpdateRefusalsAndFiles();
    void addLocksAndUnlocksControls();
    void deleteRemovesRowAndOnlyItsFiles_data();
    void deleteRemovesRowAndOnlyItsFiles();
    void compactKeepsEveryRowAndLeavesBak();
    void sortAndSelectionFollowTheList();
    void editedBoxesAreWrittenWhenTheRowIsLeft();
};

void TestDirectoryEngine::freshFolderOpensWithDemoRowSelected()
{
    Fixture f;
    f.form = std::make_unique<ccForm1_directory>(f.folder, f.op);
    QSignalSpy selected(f.form.get(), &ccForm1_directory::instrumentSelected);
    QSignalSpy reload(f.form.get(), &ccForm1_directory::propertySettingsWanted);
    QVERIFY(f.form->Form_Load());
    QVERIFY(f.op.messages().isEmpty());
    QCOMPARE(f.form->Text1[Box::IdBox].text, "1");
    QCOMPARE(f.form->DBCombo1.text, "Demo Cold Store");
    QCOMPARE(f.form->Data1.text, "Record: 1 of 1");
    QCOMPARE(selected.size(), 1);
    QCOMPARE(selected.last().at(0).toString(), "1");
    auto* info = selected.last().at(2).value<Recordset*>();
    QVERIFY(info && info == f.form->info());
    QCOMPARE(info->RecordCount(), kInfoRows);
    QCOMPARE(reload.size(), 1);
}

void TestDirectoryEngine::startUpDropsRowsWhoseDataBaseIsGone_data()
{
    QTest::addColumn<qlonglong>("id");
    QTest::addColumn<bool>("crafted"); // written into the directory by another tool
    QTest::newRow("file removed") << 2LL << false;
    QTest::newRow("negative id") << -3LL << true;
    QTest::newRow("six digit id") << 123456LL << true;
    QTest::newRow("zero id") << 0LL << true;
}

void TestDirectoryEngine::startUpDropsRowsWhoseDataBaseIsGone()
{
    QFETCH(qlonglong, id);
    QFETCH(bool, crafted);
    Fixture f;
    QVERIFY(f.load());
    QVERIFY(f.add("3", "Beta"));
    if (!crafted)
        QVERIFY(f.add(QString::number(id), "Alpha"));
    f.form.reset();
    if (crafted) {
        auto dir = Store::open(f.folder.directoryFile());
        auto rows = dir->openRecordset(Table1::TableName);
        QVERIFY(rows->AddNew() && rows->setValue(Table1::ID, id) && rows->setValue(Table1::Name, "Alpha")
                && rows->Update());
    } else {
        QVERIFY(QFile::remove(f.folder.instrumentFile(QString::number(id))));
    }
    f.op.clear();
    const QStringList files = f.files("*");

    QVERIFY(f.load());
    QCOMPARE(f.op.messages().size(), 1);
    QCOMPARE(f.op.last().toText(), "No DataBase: This database does not exist, / "
                                   "The program will delete this entry and select the next one.");
    QCOMPARE(f.ids(), QStringList({"3", "1"})); // by name: Beta, Demo Cold Store
    QCOMPARE(f.form->openId(), "3");
    QCOMPARE(f.form->Data1.text, "Record: 1 of 2");
    QCOMPARE(f.files("*"), files);
}

void TestDirectoryEngine::startUpWithoutAnyDataBaseEnds()
{
    Fixture f;
    QVERIFY(f.load());
    QVERIFY(f.add("2", "Alpha"));
    f.form.reset();
    QVERIFY(QFile::remove(f.folder.instrumentFile("1")));
    QVERIFY(QFile::remove(f.folder.instrumentFile("2")));
    f.op.clear();
    QVERIFY(!f.load());
    QCOMPARE(f.op.titles(), QStringList({"No DataBase", "No DataBase", "No Records"}));
    QCOMPARE(f.op.last().lines, QStringList({"Their are no records in the data base,",
                                             "You must re install the software."}));
}

void TestDirectoryEngine::addUpdateRefusalsAndFiles_data()
{
    QTest::addColumn<QString>("id");
    QTest::addColumn<QString>("name");
    QTest::addColumn<QString>("refusal"); // empty when the row is added
    const QString duplicate = "Duplicate ID Number: You have entered a Glacinor ID number or Last Name / "
                              "that already exists. Re enter the correct data";
    QTest::newRow("new") << "42" << "Freezer Hall" << QString();
    QTest::newRow("five digits") << "99999" << "Far" << QString();
    QTest::newRow("zero") << "0" << "Zero" << "ID Number 0: You must not have a 0 value / for the Glacinor ID";
    QTest::newRow("same id") << "1" << "Other" << duplicate;
    QTest::newRow("same name other case") << "7" << "DEMO COLD STORE" << duplicate;
    QTest::newRow("text id") << "abc" << "Text" << "Q-19: Unexpected Error: The Glacinor ID must be a number from 1 to 99999";
    QTest::newRow("path id") << "../x" << "Path" << "Q-19: Unexpected Error: The Glacinor ID must be a number from 1 to 99999";
    QTest::newRow("six digits") << "123456" << "Big" << "Q-19: Unexpected Error: The Glacinor ID must be a number from 1 to 99999";
    const QString noName = "Mandatory: You must enter a \"Name\" / for the Glacinor. Re enter the correct data";
    QTest::newRow("empty name") << "14" << "" << noName;
    QTest::newRow("blank name") << "14" << "   " << noName;
    QTest::newRow("same name with blanks") << "7" << " Demo Cold Store " << duplicate;
}

void TestDirectoryEngine::addUpdateRefusalsAndFiles()
{
    QFETCH(QString, id);
    QFETCH(QString, name);
    QFETCH(QString, refusal);
    Fixture f;
    QVERIFY(f.load());
    const QStringList before = f.files("*");
    const bool added = f.add(id, name);
    QCOMPARE(added, refusal.isEmpty());
    QCOMPARE(f.op.messages().first().toText(),
             "Mandatory: You must press either \"UPDATE\" or \"CANCEL\", / once parameters have been entered and "
             "not exit the program. / You can edit all parameters except \"Glacinor ID\" and \"Name\" at any time.");
    QCOMPARE(f.op.messages().first().icon, Operator::Icon::Critical);
    if (!added) {
        QCOMPARE(f.op.messages().size(), 2);
        QCOMPARE(f.op.last().toText(), refusal);
        QVERIFY(f.form->adding);
        QVERIFY(f.form->Command4.enabled);
        QCOMPARE(f.files("*"), before);
        // Cancel leaves the directory and the folder as they were.
        f.form->Command5_Click();
        QCOMPARE(f.ids(), QStringList({"1"}));
        QCOMPARE(f.files("*"), before);
        QCOMPARE(f.form->Text5.text, "1");
        QVERIFY(!f.form->adding && f.form->Text1_Locked[Box::IdBox] && f.form->Command1.enabled);
        return;
    }
    QCOMPARE(f.op.messages().size(), 1);
    QVERIFY(!f.form->adding);
    QCOMPARE(f.form->Text1[Box::IdBox].text, id);
    QCOMPARE(f.form->DBCombo1.text, name);
    QVERIFY(InstrumentStore::open(f.folder.instrumentFile(id)));
    for (const QString& layout : layouts(id))
        QVERIFY2(QFileInfo::exists(f.folder.path() + "/" + layout), qPrintable(layout));
    // Kept in the directory: a new form finds it.
    f.form.reset();
    QVERIFY(f.load());
    QCOMPARE(f.form->indexOfId(id) >= 0, true);
}

void TestDirectoryEngine::addLocksAndUnlocksControls()
{
    Fixture f;
    QVERIFY(f.load());
    QSignalSpy addingSpy(f.form.get(), &ccForm1_directory::addingChanged);
    QVERIFY(f.form->Text1_Locked[Box::IdBox]);
    f.form->Text1_Change(Box::NameBox, "typed while locked");
    QCOMPARE(f.form->Text1[Box::NameBox].text, "Demo Cold Store");

    f.form->Command1_Click();
    QCOMPARE(addingSpy.size(), 1);
    for (const ControlState* c : {&f.form->Command1, &f.form->Command2, &f.form->Command8, &f.form->DBCombo1,
                                  &f.form->Data1, &f.form->Option1[0], &f.form->Option1[1], &f.form->Text5})
        QVERIFY(!c->enabled);
    QVERIFY(f.form->Command4.enabled && f.form->Command5.enabled);
    QVERIFY(!f.form->Text1_Locked[Box::IdBox] && !f.form->Text1_Locked[Box::NameBox]);
    QCOMPARE(f.form->Data1.text, "Record: 0 of 1");
    const QString openBefore = f.form->openId();
    f.form->DBCombo1_Click(0); // no data base is opened while a row is typed
    QCOMPARE(f.form->openId(), openBefore);

    // The 0 refusal keeps the adding mode; the next Update still adds.
    f.form->Text1_Change(Box::IdBox, "0");
    QVERIFY(!f.form->Command4_Click());
    QVERIFY(f.form->adding);
    f.form->Text1_Change(Box::IdBox, "5");
    f.form->Text1_Change(Box::NameBox, "Five");
    QVERIFY(f.form->Command4_Click());
    QCOMPARE(f.ids(), QStringList({"1", "5"}));
    QCOMPARE(addingSpy.last().at(0).toBool(), false);
    QVERIFY(f.form->Command1.enabled && !f.form->Command4.enabled && f.form->Text1_Locked[Box::NameBox]);
}

void TestDirectoryEngine::deleteRemovesRowAndOnlyItsFiles_data()
{
    QTest::addColumn<int>("answer");
    QTest::addColumn<bool>("onlyOneRow");
    QTest::addColumn<QStringList>("titles");
    QTest::addColumn<QString>("connected"); // the instrument the line is up to
    QTest::newRow("yes") << int(Answer::Yes) << false << QStringList({"Delete Glacinor"}) << QString();
    QTest::newRow("no") << int(Answer::No) << false << QStringList({"Delete Glacinor"}) << QString();
    QTest::newRow("last row") << int(Answer::Yes) << true << QStringList({"Delete Glacinor", "Can't Delete"})
                              << QString();
    QTest::newRow("connected to it") << int(Answer::Yes) << false << QStringList({"Can't Delete"}) << "1";
    QTest::newRow("connected to another") << int(Answer::Yes) << false << QStringList({"Delete Glacinor"}) << "11";
}

void TestDirectoryEngine::deleteRemovesRowAndOnlyItsFiles()
{
    QFETCH(int, answer);
    QFETCH(bool, onlyOneRow);
    QFETCH(QStringList, titles);
    QFETCH(QString, connected);
    Fixture f;
    QVERIFY(f.load());
    f.form->setConnectedInstrument([connected] { return connected; });
    if (!onlyOneRow)
        QVERIFY(f.add("11", "Eleven"));
    QSignalSpy reload(f.form.get(), &ccForm1_directory::propertySettingsWanted);
    f.form->DBCombo1_Click(f.form->indexOfId("1"));
    QCOMPARE(f.form->openId(), "1");
    f.op.clear();
    f.op.queueAnswer(Answer(answer));
    const bool deleted = f.form->Command2_Click();
    QCOMPARE(f.op.titles(), titles);
    const bool isConnected = connected == "1";
    if (!isConnected)
        QCOMPARE(f.op.messages().first().lines,
                 QStringList({"Are you sure, this will permanatly delete this record and data base for this Glacinor",
                              "and delete the associated control and log file"}));
    QCOMPARE(deleted, answer == int(Answer::Yes) && !onlyOneRow && !isConnected);
    if (onlyOneRow)
        QCOMPARE(f.op.last().lines, QStringList({"There is only one record left,",
                                                 "You must add a new one then delete the one not required."}));
    QCOMPARE(QFileInfo::exists(f.folder.instrumentFile("1")), !deleted);
    QCOMPARE(f.files("s*-1.slf").size(), deleted ? 0 : DataFolder::LayoutCount);
    QCOMPARE(reload.size(), deleted ? 1 : 0);
    if (deleted) {
        QCOMPARE(f.ids(), QStringList({"11"}));
        QCOMPARE(f.files("s*-11.slf"), layouts("11"));
        QCOMPARE(f.form->Text5.text, "11");
        QCOMPARE(f.form->openId(), "11"); // the settings are read from the row now shown
        QVERIFY(f.form->info());
    }
}

void TestDirectoryEngine::compactKeepsEveryRowAndLeavesBak()
{
    Fixture f;
    QVERIFY(f.load());
    QSignalSpy selected(f.form.get(), &ccForm1_directory::instrumentSelected);
    {
        auto store = InstrumentStore::open(f.folder.instrumentFile("1"));
        auto log = store->store().openRecordset(kAlarmLogTable);
        Store::Transaction tx(store->store());
        for (int i = 0; i < 300; ++i) {
            QVERIFY(log->AddNew() && log->setValue(1, i) && log->Update());
        }
        QVERIFY(tx.commit());
        QVERIFY(store->setInfo(kInfoModemTextRow, kInfoConnectionColumn, "&F"));
    }
    auto counts = [&](const QString& path) {
        QList<int> out;
        auto store = Store::open(path);
        for (const QString& table : instrumentTables())
            out << store->openRecordset(table)->RecordCount();
        return out;
    };
    const QList<int> before = counts(f.folder.instrumentFile("1"));

    for (int round = 0; round < 2; ++round) {
        f.op.clear();
        QVERIFY(f.form->Command8_Click());
        QCOMPARE(f.op.last().toText(), "Done Compact: Name = Demo Cold Store / Glacinor ID No. = 1");
        QVERIFY(QFileInfo::exists(f.folder.backupFile("1")));
        QCOMPARE(counts(f.folder.instrumentFile("1")), before);
        QCOMPARE(counts(f.folder.backupFile("1")), before);
    }
    // The line side drops the closed info and gets the new one.
    QVERIFY(selected.size() >= 2);
    QCOMPARE(selected.at(0).at(2).value<Recordset*>(), nullptr);
    QVERIFY(selected.last().at(2).value<Recordset*>() == f.form->info());
    QCOMPARE(f.form->info()->cell(kInfoModemTextRow, kInfoConnectionColumn).toString(), "&F");
}

void TestDirectoryEngine::sortAndSelectionFollowTheList()
{
    Fixture f;
    QVERIFY(f.load());
    QVERIFY(f.add("10", "Zulu", "555 0110"));
    QVERIFY(f.add("2", "Alpha", "555 0102"));
    f.form->Option1_Click(0);
    QCOMPARE(f.form->DBCombo1_List, QStringList({"1", "2", "10"}));
    QCOMPARE(f.form->Data1.text, "Record: 1 of 3");
    f.form->Option1_Click(1);
    QCOMPARE(f.form->DBCombo1_List, QStringList({"Alpha", "Demo Cold Store", "Zulu"}));

    QSignalSpy selected(f.form.get(), &ccForm1_directory::instrumentSelected);
    f.form->DBCombo1_Click(2);
    QCOMPARE(f.form->Data1.text, "Record: 3 of 3");
    QCOMPARE(f.form->Text5.text, "10");
    QCOMPARE(f.form->openId(), "10");
    QCOMPARE(selected.last().at(0).toString(), "10");
    QCOMPARE(selected.last().at(1).toString(), "555 0110");
    QVERIFY(selected.last().at(2).value<Recordset*>() == f.form->info());
}

void TestDirectoryEngine::editedBoxesAreWrittenWhenTheRowIsLeft()
{
    Fixture f;
    QVERIFY(f.load());
    QVERIFY(f.add("2", "Alpha"));
    f.form->DBCombo1_Click(f.form->indexOfId("1"));
    QSignalSpy selected(f.form.get(), &ccForm1_directory::instrumentSelected);
    f.form->Text1_Change(Box::ModemPhoneBox, "0800 123");
    f.form->Text1_Change(Box::AddressBox, "1 Quay St");
    QCOMPARE(selected.last().at(1).toString(), "0800 123");
    f.form->DBCombo1_Click(f.form->indexOfId("2"));
    const QStringList demo = f.form->rows().at(f.form->indexOfId("1"));
    QCOMPARE(demo.at(Table1::glacinorphone), "0800 123");
    QCOMPARE(demo.at(Table1::Address), "1 Quay St");
    QCOMPARE(f.form->Text1[Box::AddressBox].text, "");
}

QTEST_GUILESS_MAIN(TestDirectoryEngine)
#include "tst_directory_engine.moc"
