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
    std::unique_ptr<Store> store = Store::open(makeTemplate());
    QVERIFY(store);
    QCOMPARE(store->userVersion(), kInstrumentSchemaVersion);
    QCOMPARE(store->openRecordset(kSetpointsTable)->RecordCount(), catalogue::kChannels);
    QCOMPARE(store->openRecordset(kInfoTable)->RecordCount(), kInfoRows);
    const QStringList history = store->columnNames(kHistoryTable);
    QCOMPARE(history.size(), 218);
    QCOMPARE(history.at(217), QStringLiteral("Ch 216"));
    QCOMPARE(store->columnNames(kAlarmLogTable),
             QStringList({"time", "channelnumber", "channeldiscription", "type", "value"}));
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
    QTest::addColumn<int>("column");
    QTest::addColumn<QVariant>("value");
    QTest::newRow("description has no limits") << true << 6 << kInfoMinimum << QVariant();
    QTest::newRow("load shed order") << true << 66 << kInfoMaximum << QVariant(216);
    QTest::newRow("number of banks") << true << 182 << kInfoField << QVariant(83);
    QTest::newRow("field 223, no row of its own") << true << 220 << kInfoDefault << QVariant(20);
    QTest::newRow("spare 47") << true << 226 << kInfoName << QVariant("Spare 47");
    QTest::newRow("port settings") << true << kInfoPortSettingsRow << kInfoConnectionColumn << QVariant("9600,n,8,1");
    QTest::newRow("direct connection") << true << kInfoConnectionTypeRow << kInfoConnectionColumn << QVariant("1");
    QTest::newRow("pressure interval") << true << kInfoPressureIntervalRow << kInfoIntervalColumn << QVariant(10);
    QTest::newRow("button captions") << true << kInfoChannelsDescriptionsRow << kInfoDescriptionsColumn << QVariant(0);
    QTest::newRow("no pointer channel") << true << kInfoPointerNameRow << kInfoGraphColumn
                                        << QVariant("No Channel Selected ");
    QTest::newRow("channel 216 number") << false << 215 << 0 << QVariant(216);
    QTest::newRow("description of 7") << false << 6 << 25 << QVariant("Ch 7  ");
    QTest::newRow("no 28th compressor") << false << 27 << 207 << QVariant(0);
    QTest::newRow("channels in bank 1") << false << 0 << 78 << QVariant(100);
}

void TestInstrumentSchema::seededCells()
{
    QFETCH(bool, inInfo);
    QFETCH(int, row);
    QFETCH(int, column);
    QFETCH(QVariant, value);
    auto store = InstrumentStore::open(makeTemplate());
    QVERIFY(store);
    const QVariant got = inInfo ? store->info(row, column) : store->setpoint(row, column);
    QCOMPARE(got.toString(), value.toString());
    QCOMPARE(got.isNull(), value.isNull());
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
    QCOMPARE(store->info(kInfoTemperatureIntervalRow, kInfoIntervalColumn).typeId(), int(QMetaType::LongLong));
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
    QTest::newRow("short record") << 40 << QVariant("") << QVariant(30) << 1;
    // info row 220 is field 223: 0..100, default 20.
    QTest::newRow("field 223 over") << 220 << QVariant(101) << QVariant(20) << 1;
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
