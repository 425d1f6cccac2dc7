#include "setpoints/catalogue.h"
#include "setpoints/instrument_schema.h"
#include "setpoints/instrument_store.h"

#include <QtTest>

class TestInstrumentSchema : public QObject {
    Q_OBJECT
private slots:
    void initTestCase();
    void init();
    void templateHoldsTheFiveTables();
    void validationRowsInReplyOrder_data();
    void validationRowsInReplyOrder();
    void freshTemplatePassesItsOwnValidation();
    void seededCells_data();
    void seededCells();
    void numbersReadBackAsNumbers();
    void existingFileIsNeverOverwritten();
    void brokenOrForeignFilesAreRefused_data();
    void brokenOrForeignFilesAreRefused();
    void storeCheckedKeepsRowsAndFlagsInvalidValues_data();
    void storeCheckedKeepsRowsAndFlagsInvalidValues();
    void typedCellsAndGlobalRow();

private:
    QString makeTemplate();
    QTemporaryDir m_templateDir;
    std::unique_ptr<QTemporaryDir> m_dir;
};

// One template for all, each test works on a copy of it, as an instrument's
// data base is made.
void TestInstrumentSchema::initTestCase()
{
    QString error;
    QVERIFY2(createInstrumentTemplate(m_templateDir.filePath(QStringLiteral("gl.db")), &error), qPrintable(error));
}

void TestInstrumentSchema::init()
{
    m_dir = std::make_unique<QTemporaryDir>();
    QVERIFY(m_dir->isValid());
}

QString TestInstrumentSchema::makeTemplate()
{
    const QString path = m_dir->filePath(QStringLiteral("t-1.db"));
    if (!QFile::exists(path))
        QFile::copy(m_templateDir.filePath(QStringLiteral("gl.db")), path);
    return path;
}

void TestInstrumentSchema::templateHoldsTheFiveTables()
{
    const QString path = makeTemplate();
    std::unique_ptr<Store> store = Store::open(path);
    QVERIFY(store);
    QCOMPARE(store->userVersion(), kInstrumentSchemaVersion);
    for (const QString& table : {QStringLiteral("setpoints"), QStringLiteral("info"), QStringLiteral("History"),
                                 QStringLiteral("Power"), QStringLiteral("Alarm Log")})
        QVERIFY2(store->hasTable(table), qPrintable(table));

    auto setpoints = store->openRecordset(QStringLiteral("setpoints"));
    QCOMPARE(setpoints->RecordCount(), 216);
    QVERIFY(setpoints->fieldCount() >= 228);
    auto info = store->openRecordset(QStringLiteral("info"));
    QCOMPARE(info->RecordCount(), 227);
    QVERIFY(info->fieldCount() >= 66);

    const QStringList history = store->columnNames(QStringLiteral("History"));
    QCOMPARE(history.size(), 218);
    QCOMPARE(history.at(2), QStringLiteral("Ch 1"));
    QCOMPARE(history.at(217), QStringLiteral("Ch 216"));
    QCOMPARE(store->columnNames(QStringLiteral("Power")).size(), 4);
    QCOMPARE(store->columnNames(QStringLiteral("Alarm Log")),
             QStringList({"time", "channelnumber", "channeldiscription", "type", "value"}));
    QCOMPARE(store->openRecordset(QStringLiteral("History"))->RecordCount(), 0);
}

void TestInstrumentSchema::validationRowsInReplyOrder_data()
{
    QTest::addColumn<int>("row");
    QTest::addColumn<QString>("name");
    QTest::addColumn<int>("field");
    QTest::addColumn<QVariant>("min");
    QTest::addColumn<QVariant>("max");
    QTest::addColumn<QVariant>("defaultValue");
    QTest::newRow("connected") << 0 << "Channel Connected" << 1 << QVariant(0) << QVariant(1) << QVariant(1);
    QTest::newRow("print time 4") << 5 << "4 Print Times 4" << 89 << QVariant(0) << QVariant(1439) << QVariant(0);
    QTest::newRow("description") << 6 << "Chan Description" << 25 << QVariant() << QVariant() << QVariant();
    QTest::newRow("high alarm 1") << 12 << "High Alarm Temp 1" << 14 << QVariant(-500) << QVariant(1500) << QVariant(80);
    QTest::newRow("low delay") << 21 << "Lo Tmp Alm Delay" << 23 << QVariant(0) << QVariant(120) << QVariant(30);
    QTest::newRow("fans flag") << 45 << "Fans Suction 1st Delay" << 30 << QVariant(0) << QVariant(1) << QVariant(0);
    QTest::newRow("load shed order") << 66 << "Load Shed Order" << 95 << QVariant(0) << QVariant(216) << QVariant(0);
    QTest::newRow("compressor order") << 75 << "Compressor Order" << 207 << QVariant(0) << QVariant(27) << QVariant(0);
    QTest::newRow("banks") << 182 << "Number of Banks" << 83 << QVariant(1) << QVariant(5) << QVariant(1);
    QTest::newRow("last reply value") << 219 << "Comp Ct PRES-TMP 5" << 222 << QVariant(0) << QVariant(1) << QVariant(0);
    QTest::newRow("field 223") << 220 << "PID Differential" << 223 << QVariant(0) << QVariant(100) << QVariant(20);
    QTest::newRow("field 227") << 224 << "Third PID Value" << 227 << QVariant(0) << QVariant(100) << QVariant(20);
    QTest::newRow("channel number") << 225 << "Channel Number" << 0 << QVariant(1) << QVariant(216) << QVariant(1);
    QTest::newRow("spare") << 226 << "Spare 47" << 47 << QVariant(-99999) << QVariant(999999) << QVariant(0);
}

void TestInstrumentSchema::validationRowsInReplyOrder()
{
    QFETCH(int, row);
    QFETCH(QString, name);
    QFETCH(int, field);
    QFETCH(QVariant, min);
    QFETCH(QVariant, max);
    QFETCH(QVariant, defaultValue);
    auto store = InstrumentStore::open(makeTemplate());
    QVERIFY(store);
    QCOMPARE(store->info(row, kInfoName).toString(), name);
    QCOMPARE(store->info(row, kInfoField).toInt(), field);
    QCOMPARE(store->info(row, kInfoMinimum).toString(), min.toString());
    QCOMPARE(store->info(row, kInfoMaximum).toString(), max.toString());
    QCOMPARE(store->info(row, kInfoDefault).toString(), defaultValue.toString());
    QCOMPARE(store->info(row, kInfoMinimum).isNull(), min.isNull());
}

void TestInstrumentSchema::freshTemplatePassesItsOwnValidation()
{
    auto store = InstrumentStore::open(makeTemplate());
    QVERIFY(store);
    const auto order = catalogue::replyOrderFields();
    for (int i = 0; i < kInfoValidationRows; ++i) {
        const int field = store->info(i, kInfoField).toInt();
        if (i < int(order.size()))
            QCOMPARE(field, int(order[std::size_t(i)]));
        if (i == 6)
            continue;
        int invalid = 0;
        const QVariant def = store->info(i, kInfoDefault);
        catalogue::checkedValue(def, def, store->info(i, kInfoMinimum), store->info(i, kInfoMaximum), &invalid);
        QVERIFY2(!invalid, qPrintable(QStringLiteral("default of info row %1").arg(i)));
        for (int ch = 0; ch < catalogue::kChannels; ++ch) {
            const QVariant v = store->setpoint(ch, field);
            catalogue::checkedValue(v, def, store->info(i, kInfoMinimum), store->info(i, kInfoMaximum), &invalid);
            if (invalid)
                QFAIL(qPrintable(QStringLiteral("row %1 field %2 holds %3").arg(ch).arg(field).arg(v.toString())));
        }
    }
}

void TestInstrumentSchema::seededCells_data()
{
    QTest::addColumn<bool>("inInfo");
    QTest::addColumn<int>("row");
    QTest::addColumn<int>("field");
    QTest::addColumn<QVariant>("value");
    QTest::newRow("port settings") << true << 2 << 41 << QVariant("9600,n,8,1");
    QTest::newRow("direct connection") << true << 4 << 41 << QVariant("1");
    QTest::newRow("flow control") << true << 7 << 41 << QVariant("0");
    QTest::newRow("temperature interval") << true << 29 << 7 << QVariant(10);
    QTest::newRow("pressure interval") << true << 30 << 7 << QVariant(10);
    QTest::newRow("button captions") << true << 4 << 40 << QVariant(0);
    QTest::newRow("no pointer channel") << true << 35 << 8 << QVariant("No Channel Selected ");
    QTest::newRow("channel 1 number") << false << 0 << 0 << QVariant(1);
    QTest::newRow("channel 216 number") << false << 215 << 0 << QVariant(216);
    QTest::newRow("channel text") << false << 6 << 24 << QVariant("Ch 7");
    QTest::newRow("description of 7") << false << 6 << 25 << QVariant("Ch 7  ");
    QTest::newRow("description of 100") << false << 99 << 25 << QVariant("Ch 100");
    QTest::newRow("last compressor place") << false << 26 << 207 << QVariant(27);
    QTest::newRow("no 28th compressor") << false << 27 << 207 << QVariant(0);
    QTest::newRow("last condenser place") << false << 11 << 206 << QVariant(12);
    QTest::newRow("fields 223 to 227") << false << 0 << 226 << QVariant(20);
}

void TestInstrumentSchema::seededCells()
{
    QFETCH(bool, inInfo);
    QFETCH(int, row);
    QFETCH(int, field);
    QFETCH(QVariant, value);
    auto store = InstrumentStore::open(makeTemplate());
    QVERIFY(store);
    const QVariant got = inInfo ? store->info(row, field) : store->setpoint(row, field);
    QCOMPARE(got.toString(), value.toString());
}

void TestInstrumentSchema::numbersReadBackAsNumbers()
{
    const QString path = makeTemplate();
    {
        auto store = InstrumentStore::open(path);
        QVERIFY(store);
        QVERIFY(store->setSetpoint(3, 2, QStringLiteral("215")));
        QVERIFY(store->setSetpoint(3, catalogue::kDescriptionField, QStringLiteral("000012")));
        auto history = store->store().openRecordset(kHistoryTable);
        QVERIFY(history->AddNew());
        QVERIFY(history->setValue(2, QStringLiteral("12.5")));
        QVERIFY(history->setValue(3, -1000));
        QVERIFY(history->Update());
    }
    auto store = InstrumentStore::open(path);
    const QVariant v = store->setpoint(3, 2);
    QCOMPARE(v.typeId(), int(QMetaType::LongLong));
    QCOMPARE(v.toInt(), 215);
    QCOMPARE(store->setpoint(3, catalogue::kDescriptionField).toString(), QStringLiteral("000012"));
    QCOMPARE(store->info(29, 7).typeId(), int(QMetaType::LongLong));
    auto history = store->store().openRecordset(kHistoryTable);
    QVERIFY(history->MoveFirst());
    QCOMPARE(history->value(2).toDouble(), 12.5);
    QCOMPARE(history->value(3).toInt(), -1000);
}

void TestInstrumentSchema::existingFileIsNeverOverwritten()
{
    const QString path = m_dir->filePath(QStringLiteral("t-3.db"));
    QFile f(path);
    QVERIFY(f.open(QIODevice::WriteOnly));
    f.write("keep me");
    f.close();
    QString error;
    QVERIFY(!createInstrumentTemplate(path, &error));
    QVERIFY(!error.isEmpty());
    QVERIFY(f.open(QIODevice::ReadOnly));
    QCOMPARE(f.readAll(), QByteArray("keep me"));
}

void TestInstrumentSchema::brokenOrForeignFilesAreRefused_data()
{
    QTest::addColumn<QString>("kind");
    QTest::newRow("missing") << "missing";
    QTest::newRow("text file") << "text";
    QTest::newRow("no Alarm Log") << "table";
    QTest::newRow("setpoints short of rows") << "rows";
}

void TestInstrumentSchema::brokenOrForeignFilesAreRefused()
{
    QFETCH(QString, kind);
    QString path = m_dir->filePath(QStringLiteral("t-2.db"));
    if (kind == QLatin1String("text")) {
        QFile f(path);
        QVERIFY(f.open(QIODevice::WriteOnly));
        f.write(QByteArray(4096, 'x'));
    } else if (kind == QLatin1String("table")) {
        auto store = Store::create(path, kInstrumentSchemaVersion);
        QVERIFY(store->createTable(kSetpointsTable, setpointsColumns()));
        QVERIFY(store->createTable(kInfoTable, infoColumns()));
        QVERIFY(store->createTable(kHistoryTable, historyColumns()));
        QVERIFY(store->createTable(kPowerTable, powerColumns()));
    } else if (kind == QLatin1String("rows")) {
        path = makeTemplate();
        auto store = Store::open(path);
        auto rs = store->openRecordset(kSetpointsTable);
        QVERIFY(rs->MoveLast());
        QVERIFY(rs->Delete());
    }
    QString error;
    QVERIFY(!InstrumentStore::open(path, &error));
    QVERIFY(!error.isEmpty());
}

void TestInstrumentSchema::storeCheckedKeepsRowsAndFlagsInvalidValues_data()
{
    QTest::addColumn<int>("infoRow");
    QTest::addColumn<QVariant>("value");
    QTest::addColumn<QVariant>("stored");
    QTest::addColumn<int>("invalid");
    // info row 40 is set point 1 (field 2), -500..1500, default 30.
    QTest::newRow("padded number") << 40 << QVariant("  -500") << QVariant(-500) << 0;
    QTest::newRow("at maximum") << 40 << QVariant("1500") << QVariant(1500) << 0;
    QTest::newRow("over maximum") << 40 << QVariant("1501") << QVariant(30) << 1;
    QTest::newRow("garbage") << 40 << QVariant("1$0") << QVariant(30) << 1;
    QTest::newRow("short record") << 40 << QVariant("") << QVariant(30) << 1;
    // info row 220 is field 223: 0..100, default 20.
    QTest::newRow("field 223 over") << 220 << QVariant(101) << QVariant(20) << 1;
    QTest::newRow("field 223 at zero") << 220 << QVariant(0) << QVariant(0) << 0;
}

void TestInstrumentSchema::storeCheckedKeepsRowsAndFlagsInvalidValues()
{
    QFETCH(int, infoRow);
    QFETCH(QVariant, value);
    QFETCH(QVariant, stored);
    QFETCH(int, invalid);
    auto store = InstrumentStore::open(makeTemplate());
    QVERIFY(store);
    Recordset& setpoints = store->setpointsTable();
    Recordset& info = store->infoTable();
    QVERIFY(setpoints.setAbsolutePosition(3));
    QVERIFY(info.setAbsolutePosition(infoRow));
    const int field = info.value(kInfoField).toInt();
    const QVariant before = setpoints.value(field);
    QVERIFY(setpoints.Edit());
    int flagged = 0;
    QVERIFY(store_checked(setpoints, info, value, field, flagged));
    QCOMPARE(flagged, invalid);
    QCOMPARE(setpoints.value(field).toString(), stored.toString());
    QCOMPARE(setpoints.AbsolutePosition(), 3);
    QCOMPARE(info.AbsolutePosition(), infoRow);
    QVERIFY(setpoints.editing());
    setpoints.CancelUpdate();
    QCOMPARE(store->setpoint(3, field), before);
}

void TestInstrumentSchema::typedCellsAndGlobalRow()
{
    auto store = InstrumentStore::open(makeTemplate());
    QVERIFY(store);
    QVERIFY(store->setpointsTable().setAbsolutePosition(50));
    const catalogue::Function* compSetPoint = catalogue::findFunction(61);
    const catalogue::Function* setTemp = catalogue::findFunction(5);
    QVERIFY(store->setValue(*compSetPoint, 120, 2, 250));
    QVERIFY(store->setValue(*setTemp, 120, 3, -180));
    QCOMPARE(store->setpoint(0, 102).toInt(), 250);
    QCOMPARE(store->setpoint(119, 5).toInt(), -180);
    QCOMPARE(store->value(*compSetPoint, 7, 2).toInt(), 250);
    QCOMPARE(store->setpointsTable().AbsolutePosition(), 50);
    QVERIFY(store->value(*catalogue::findFunction(18), 1, 1).isNull());

    QVERIFY(store->setInfo(226, 65, QStringLiteral("x")));
    QCOMPARE(store->info(226, 65).toString(), QStringLiteral("x"));
    QVERIFY(!store->setInfo(227, 0, 1));
    QVERIFY(!store->setSetpoint(216, 1, 1));
    QVERIFY(!store->setSetpoint(0, 228, 1));
    QVERIFY(store->setpoint(-1, 1).isNull());
}

QTEST_GUILESS_MAIN(TestInstrumentSchema)
#include "tst_instrument_schema.moc"
