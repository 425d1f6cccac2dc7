#include "platform/store.h"

#include <QDateTime>
#include <QFile>
#include <QSqlDatabase>
#include <QSqlQuery>
#include <QTemporaryDir>
#include <QtTest>

namespace {

const QString Log = QStringLiteral("Alarm Log");

const QList<Store::Column> LogColumns = {
    {QStringLiteral("Ch 1"), Store::ColumnType::Integer},
    {QStringLiteral("Name"), Store::ColumnType::Text},
    {QStringLiteral("When"), Store::ColumnType::DateTime},
    {QStringLiteral("On"), Store::ColumnType::Boolean},
    {QStringLiteral("Temp"), Store::ColumnType::Double},
};

// Reads the file past the adapter, as any SQLite tool would.
QVariant rawQuery(const QString& path, const QString& sql)
{
    QVariant result;
    {
        QSqlDatabase db = QSqlDatabase::addDatabase(QStringLiteral("QSQLITE"), QStringLiteral("raw"));
        db.setDatabaseName(path);
        if (db.open()) {
            QSqlQuery q(db);
            if (q.exec(sql) && q.next())
                result = q.value(0);
        }
        db.close();
    }
    QSqlDatabase::removeDatabase(QStringLiteral("raw"));
    return result;
}

} // namespace

class TestStore : public QObject {
    Q_OBJECT

private slots:
    // A connection left in use or a driver complaint is a fault here.
    void init() { QTest::failOnWarning(QRegularExpression(QStringLiteral("."))); }
    void positioning_data();
    void positioning();
    void deleteWhileLooping_data();
    void deleteWhileLooping();
    void valueRoundTrip_data();
    void valueRoundTrip();
    void orderedKeepsInsertionOrderOnTies();
    void cellPutsPositionBack();
    void partialReadsSeeThePendingEdit_data();
    void partialReadsSeeThePendingEdit();
    void openRefuses_data();
    void openRefuses();
    void createStampsTheFile();
    void transactionScopes_data();
    void transactionScopes();
    void compactKeepsEveryRow();
    void recordsetOutlivingItsStore();

private:
    std::unique_ptr<Store> makeLog(int rows);
    QTemporaryDir m_dir;
    int m_files = 0;
};

// A fresh file with the log table and rows whose "Ch 1" is 0, 10, 20, ...
std::unique_ptr<Store> TestStore::makeLog(int rows)
{
    auto store = Store::create(m_dir.filePath(QStringLiteral("t-%1.db").arg(++m_files)), 1);
    if (!store || !store->createTable(Log, LogColumns))
        return nullptr;
    auto rs = store->openRecordset(Log);
    for (int i = 0; i < rows; ++i) {
        rs->AddNew();
        rs->setValue(QStringLiteral("Ch 1"), i * 10);
        rs->Update();
    }
    return store;
}

void TestStore::positioning_data()
{
    QTest::addColumn<int>("rows");
    QTest::addColumn<QString>("ops");
    QTest::addColumn<bool>("lastOk");
    QTest::addColumn<int>("position");
    QTest::addColumn<bool>("bof");
    QTest::addColumn<bool>("eof");
    QTest::addColumn<int>("count");
    QTest::addColumn<QVariant>("ch1");

    const QVariant null;
    // ops: F L N P = MoveFirst/Last/Next/Previous, D Delete, E Edit,
    // A AddNew with "Ch 1" = 99 then Update, S<n> setAbsolutePosition(n).
    QTest::newRow("opens on the first record") << 3 << "" << true << 0 << false << false << 3 << QVariant(0);
    QTest::newRow("next from the last reaches EOF") << 3 << "L N" << true << -1 << false << true << 3 << null;
    QTest::newRow("next at EOF refused") << 3 << "L N N" << false << -1 << false << true << 3 << null;
    QTest::newRow("previous from the first reaches BOF") << 3 << "F P" << true << -1 << true << false << 3 << null;
    QTest::newRow("previous at BOF refused") << 3 << "F P P" << false << -1 << true << false << 3 << null;
    QTest::newRow("previous from EOF is the last") << 3 << "L N P" << true << 2 << false << false << 3 << QVariant(20);
    QTest::newRow("deleted record has no position") << 3 << "S1 D" << true << -1 << false << false << 2 << null;
    QTest::newRow("edit of a deleted record refused") << 3 << "S1 D E" << false << -1 << false << false << 2 << null;
    QTest::newRow("delete twice refused") << 3 << "S1 D D" << false << -1 << false << false << 2 << null;
    QTest::newRow("next after delete is the follower") << 3 << "S1 D N" << true << 1 << false << false << 2 << QVariant(20);
    QTest::newRow("previous after delete is the one before") << 3 << "S1 D P" << true << 0 << false << false << 2 << QVariant(0);
    QTest::newRow("delete last then next reaches EOF") << 3 << "L D N" << true << -1 << false << true << 2 << null;
    QTest::newRow("delete first then previous reaches BOF") << 3 << "F D P" << true << -1 << true << false << 2 << null;
    QTest::newRow("delete the only record then next") << 1 << "D N" << true << -1 << true << true << 0 << null;
    QTest::newRow("addnew keeps the current record") << 3 << "S1 A" << true << 1 << false << false << 4 << QVariant(10);
    QTest::newRow("added record is the last") << 3 << "A L" << true << 3 << false << false << 4 << QVariant(99);
    QTest::newRow("addnew at EOF stays at EOF") << 3 << "L N A" << true << -1 << false << true << 4 << null;
    QTest::newRow("previous from EOF after addnew") << 3 << "L N A P" << true << 3 << false << false << 4 << QVariant(99);
    QTest::newRow("addnew after delete, next is the new one") << 3 << "L D A N" << true << 2 << false << false << 3 << QVariant(99);
    QTest::newRow("empty set is at both ends") << 0 << "" << true << -1 << true << true << 0 << null;
    QTest::newRow("first on empty set refused") << 0 << "F" << false << -1 << true << true << 0 << null;
    QTest::newRow("last on empty set refused") << 0 << "L" << false << -1 << true << true << 0 << null;
    QTest::newRow("addnew on empty set stays at both ends") << 0 << "A" << true << -1 << true << true << 1 << null;
    QTest::newRow("addnew on empty set then next refused") << 0 << "A N" << false << -1 << true << true << 1 << null;
    QTest::newRow("addnew on empty set then first") << 0 << "A F" << true << 0 << false << false << 1 << QVariant(99);
    QTest::newRow("absolute position past the end refused") << 3 << "S1 S3" << false << 1 << false << false << 3 << QVariant(10);
    QTest::newRow("absolute position below zero refused") << 3 << "S2 S-1" << false << 2 << false << false << 3 << QVariant(20);
}

void TestStore::positioning()
{
    QFETCH(int, rows);
    QFETCH(QString, ops);
    QFETCH(bool, lastOk);
    QFETCH(int, position);
    QFETCH(bool, bof);
    QFETCH(bool, eof);
    QFETCH(int, count);
    QFETCH(QVariant, ch1);

    auto store = makeLog(rows);
    QVERIFY(store);
    auto rs = store->openRecordset(Log);
    QVERIFY(rs);
    bool ok = true;
    for (const QString& op : ops.split(QLatin1Char(' '), Qt::SkipEmptyParts)) {
        switch (op.at(0).toLatin1()) {
        case 'F': ok = rs->MoveFirst(); break;
        case 'L': ok = rs->MoveLast(); break;
        case 'N': ok = rs->MoveNext(); break;
        case 'P': ok = rs->MovePrevious(); break;
        case 'D': ok = rs->Delete(); break;
        case 'E': ok = rs->Edit(); break;
        case 'S': ok = rs->setAbsolutePosition(op.mid(1).toInt()); break;
        case 'A':
            ok = rs->AddNew() && rs->setValue(0, 99) && rs->Update();
            break;
        default: QFAIL("unknown op");
        }
    }
    QCOMPARE(ok, lastOk);
    if (!ok)
        QVERIFY(!rs->lastError().isEmpty());
    QCOMPARE(rs->AbsolutePosition(), position);
    QCOMPARE(rs->atBOF(), bof);
    QCOMPARE(rs->atEOF(), eof);
    QCOMPARE(rs->RecordCount(), count);
    const QVariant got = rs->value(QStringLiteral("Ch 1"));
    QCOMPARE(isNull(got), isNull(ch1));
    if (!isNull(ch1))
        QCOMPARE(got.toInt(), ch1.toInt());

    // The file agrees with the set.
    auto reread = store->openRecordset(Log);
    QCOMPARE(reread->RecordCount(), count);
}

void TestStore::deleteWhileLooping_data()
{
    QTest::addColumn<QList<int>>("doomed");
    QTest::newRow("none") << QList<int>{};
    QTest::newRow("first") << QList<int>{0};
    QTest::newRow("last") << QList<int>{40};
    QTest::newRow("every other") << QList<int>{10, 30};
    QTest::newRow("neighbours") << QList<int>{10, 20};
    QTest::newRow("the tail") << QList<int>{30, 40};
    QTest::newRow("all") << QList<int>{0, 10, 20, 30, 40};
}

void TestStore::deleteWhileLooping()
{
    QFETCH(QList<int>, doomed);
    auto store = makeLog(5);
    QVERIFY(store);
    auto rs = store->openRecordset(Log);
    int visits = 0;
    rs->MoveFirst();
    while (!rs->atEOF()) {
        ++visits;
        if (doomed.contains(rs->value(0).toInt()))
            QVERIFY(rs->Delete());
        QVERIFY(rs->MoveNext());
        QVERIFY(visits <= 5);
    }
    QCOMPARE(visits, 5);

    QList<int> left;
    auto reread = store->openRecordset(Log);
    for (int row = 0; row < reread->RecordCount(); ++row)
        left.append(reread->cell(row, 0).toInt());
    QList<int> expected;
    for (int v : {0, 10, 20, 30, 40})
        if (!doomed.contains(v))
            expected.append(v);
    QCOMPARE(left, expected);
}

void TestStore::valueRoundTrip_data()
{
    QTest::addColumn<QString>("field");
    QTest::addColumn<QVariant>("written");
    QTest::addColumn<QVariant>("expected");

    const QDateTime when(QDate(2024, 2, 29), QTime(23, 59, 58));
    QTest::newRow("text empty stays text") << "Name" << QVariant(QString("")) << QVariant(QString(""));
    QTest::newRow("text of a null string is empty text") << "Name" << QVariant(QString()) << QVariant(QString(""));
    QTest::newRow("text null") << "Name" << QVariant() << QVariant();
    QTest::newRow("text from a number") << "Name" << QVariant(12) << QVariant(QString("12"));
    QTest::newRow("integer") << "Ch 1" << QVariant(-42) << QVariant(qlonglong(-42));
    QTest::newRow("integer zero is not null") << "Ch 1" << QVariant(0) << QVariant(qlonglong(0));
    QTest::newRow("integer from text") << "Ch 1" << QVariant(QString("17")) << QVariant(qlonglong(17));
    QTest::newRow("integer null") << "Ch 1" << QVariant() << QVariant();
    QTest::newRow("double") << "Temp" << QVariant(-18.25) << QVariant(-18.25);
    QTest::newRow("double from integer") << "Temp" << QVariant(3) << QVariant(3.0);
    QTest::newRow("date time") << "When" << QVariant(when) << QVariant(when);
    QTest::newRow("date time from text") << "When" << QVariant(QString("2024-02-29T23:59:58")) << QVariant(when);
    QTest::newRow("date time null") << "When" << QVariant() << QVariant();
    QTest::newRow("boolean true") << "On" << QVariant(true) << QVariant(true);
    QTest::newRow("boolean false") << "On" << QVariant(false) << QVariant(false);
}

void TestStore::valueRoundTrip()
{
    QFETCH(QString, field);
    QFETCH(QVariant, written);
    QFETCH(QVariant, expected);

    QString path;
    {
        auto store = makeLog(1);
        QVERIFY(store);
        path = store->path();
        auto rs = store->openRecordset(Log);
        // Start from a value, so that writing Null has something to clear.
        QVERIFY(rs->Edit());
        QVERIFY(rs->setValue(field, field == "When" ? QVariant(QDateTime::currentDateTime()) : QVariant(5)));
        QVERIFY(rs->Update());
        QVERIFY(rs->Edit());
        QVERIFY(rs->setValue(field, written));
        QVERIFY(rs->Update());
    }
    auto store = Store::open(path);
    QVERIFY(store);
    const QVariant got = store->openRecordset(Log)->value(field);
    QCOMPARE(isNull(got), isNull(expected));
    if (!isNull(expected)) {
        QCOMPARE(got.metaType(), expected.metaType());
        QCOMPARE(got, expected);
    }
}

void TestStore::orderedKeepsInsertionOrderOnTies()
{
    auto store = makeLog(0);
    QVERIFY(store);
    auto rs = store->openRecordset(Log);
    const QList<QPair<int, QString>> rows = {{30, "a"}, {10, "b"}, {20, "c"}, {10, "d"}, {30, "e"}};
    for (const auto& [ch, name] : rows) {
        rs->AddNew();
        rs->setValue(0, ch);
        rs->setValue(1, name);
        QVERIFY(rs->Update());
    }
    auto ordered = store->openRecordset(Log, QStringLiteral("Ch 1"));
    QVERIFY(ordered);
    QStringList names;
    for (ordered->MoveFirst(); !ordered->atEOF(); ordered->MoveNext())
        names.append(ordered->value(1).toString());
    QCOMPARE(names, QStringList({"b", "d", "c", "a", "e"}));
    QVERIFY(!store->openRecordset(Log, QStringLiteral("No Such")));
}

void TestStore::cellPutsPositionBack()
{
    auto store = makeLog(4);
    QVERIFY(store);
    auto rs = store->openRecordset(Log);
    QVERIFY(rs->setAbsolutePosition(1));
    QCOMPARE(rs->cell(3, 0).toInt(), 30);
    QVERIFY(rs->setCell(3, 0, 33));
    QCOMPARE(rs->cell(3, 0).toInt(), 33);
    QVERIFY(rs->setCell(1, 0, 11));
    QCOMPARE(rs->AbsolutePosition(), 1);
    QCOMPARE(rs->value(0).toInt(), 11);
    QVERIFY(!rs->setCell(4, 0, 1));
    QVERIFY(!rs->setValue(0, 1)); // outside Edit/AddNew
    QVERIFY(rs->Edit());
    QVERIFY(rs->setValue(0, 12));
    rs->CancelUpdate();
    QCOMPARE(rs->value(0).toInt(), 11);
    QVERIFY(rs->setAbsolutePosition(3));
    QCOMPARE(rs->value(0).toInt(), 33);
}

namespace {
QList<int> ints(const QVariantList& values)
{
    QList<int> out;
    for (const QVariant& v : values)
        out << v.toInt();
    return out;
}
} // namespace

void TestStore::partialReadsSeeThePendingEdit_data()
{
    QTest::addColumn<bool>("ordered"); // by "Temp", which runs against the insertion order
    QTest::addColumn<bool>("editing");
    QTest::newRow("as inserted") << false << false;
    QTest::newRow("as inserted, in Edit") << false << true;
    QTest::newRow("ordered, in Edit") << true << true;
}

void TestStore::partialReadsSeeThePendingEdit()
{
    QFETCH(bool, ordered);
    QFETCH(bool, editing);
    auto store = makeLog(4); // "Ch 1" (ordinal 0) runs 0, 10, 20, 30
    QVERIFY(store);
    {
        auto w = store->openRecordset(Log);
        for (int row = 0; row < 4; ++row)
            QVERIFY(w->setCell(row, 4, 3 - row));
    }
    auto rs = store->openRecordset(Log, ordered ? QStringLiteral("Temp") : QString());
    QVERIFY(rs);
    QCOMPARE(ints(rs->column(0)), ordered ? (QList<int>{30, 20, 10, 0}) : (QList<int>{0, 10, 20, 30}));
    QVERIFY(rs->setAbsolutePosition(1));
    if (editing) {
        QVERIFY(rs->Edit());
        QVERIFY(rs->setValue(4, 7));
        QVERIFY(rs->setValue(0, 99));
    }
    const int ch1 = ordered ? 20 : 10;
    const int temp = ordered ? 1 : 2;
    QCOMPARE(ints(rs->values({4, 0})), (QList<int>{editing ? 7 : temp, editing ? 99 : ch1}));
    if (editing) {
        QVERIFY(rs->Update());
        QCOMPARE(ints(rs->values({0, 4})), (QList<int>{99, 7}));
        QCOMPARE(ints(rs->column(0)).value(1), 99);
    }
    // Several records in one read come in the order asked for, by position.
    const QList<QVariantList> some = rs->rows({3, 1}, {0, 1});
    QCOMPARE(some.size(), 2);
    QCOMPARE(some[0].value(0).toInt(), ordered ? 0 : 30);
    QCOMPARE(some[1].value(0).toInt(), editing ? 99 : ch1);
    QCOMPARE(some[1].size(), 2);
    QVERIFY(isNull(some[1].value(1))); // no name was ever written
}

void TestStore::openRefuses_data()
{
    QTest::addColumn<QString>("kind");
    QTest::addColumn<QString>("reason");
    QTest::newRow("missing file") << "missing" << "does not exist";
    QTest::newRow("text file") << "text" << "not a data base";
    QTest::newRow("empty file") << "empty" << "not a data base";
    QTest::newRow("truncated file") << "truncated" << "damaged";
    QTest::newRow("another program's file") << "foreign" << "another program";
}

void TestStore::openRefuses()
{
    QFETCH(QString, kind);
    QFETCH(QString, reason);
    const QString path = m_dir.filePath(QStringLiteral("refused-%1.db").arg(kind));
    if (kind == "text" || kind == "empty") {
        QFile f(path);
        QVERIFY(f.open(QIODevice::WriteOnly));
        if (kind == "text")
            f.write(QByteArray("ID,Name\n1,Cold room\n").repeated(20));
    } else if (kind == "truncated") {
        {
            auto store = Store::create(path, 1);
            QVERIFY(store && store->createTable(Log, LogColumns));
            auto rs = store->openRecordset(Log);
            for (int i = 0; i < 400; ++i) {
                rs->AddNew();
                rs->setValue(1, QString(100, QLatin1Char('x')));
                rs->Update();
            }
        }
        QFile f(path);
        QVERIFY(f.size() > 8192);
        QVERIFY(f.resize(f.size() / 2));
    } else if (kind == "foreign") {
        rawQuery(path, QStringLiteral("PRAGMA application_id = 1234"));
    }
    QByteArray before;
    if (QFile f(path); f.open(QIODevice::ReadOnly))
        before = f.readAll();

    QString error;
    QVERIFY(!Store::open(path, &error));
    QVERIFY2(error.contains(reason), qPrintable(error));
    // Refused files are left exactly as they were, and none is made.
    QCOMPARE(QFile::exists(path), kind != "missing");
    if (QFile f(path); f.open(QIODevice::ReadOnly))
        QCOMPARE(f.readAll(), before);
}

void TestStore::createStampsTheFile()
{
    const QString path = m_dir.filePath(QStringLiteral("stamped.db"));
    {
        auto store = Store::create(path, 7);
        QVERIFY(store);
        QVERIFY(store->createTable(Log, LogColumns));
        QCOMPARE(store->columnNames(Log), QStringList({"Ch 1", "Name", "When", "On", "Temp"}));
    }
    QCOMPARE(rawQuery(path, "PRAGMA application_id").toInt(), Store::ApplicationId);
    QCOMPARE(rawQuery(path, "PRAGMA journal_mode").toString(), QStringLiteral("wal"));
    auto store = Store::open(path);
    QVERIFY(store);
    QCOMPARE(store->userVersion(), 7);
    QVERIFY(store->hasTable("alarm log"));
    QVERIFY(store->setUserVersion(8));
    QCOMPARE(store->userVersion(), 8);

    QString error;
    QVERIFY(!Store::create(path, 1, &error));
    QVERIFY(!error.isEmpty());
}

void TestStore::transactionScopes_data()
{
    QTest::addColumn<bool>("innerCommits");
    QTest::addColumn<bool>("outerCommits");
    QTest::addColumn<bool>("outerResult");
    QTest::addColumn<int>("rowsKept");
    QTest::newRow("both commit") << true << true << true << 2;
    QTest::newRow("outer scope left without commit") << true << false << false << 0;
    QTest::newRow("inner scope left without commit") << false << true << false << 0;
}

void TestStore::transactionScopes()
{
    QFETCH(bool, innerCommits);
    QFETCH(bool, outerCommits);
    QFETCH(bool, outerResult);
    QFETCH(int, rowsKept);

    auto store = makeLog(0);
    QVERIFY(store);
    auto rs = store->openRecordset(Log);
    bool result = false;
    {
        Store::Transaction outer(*store);
        QVERIFY(rs->AddNew() && rs->Update());
        {
            Store::Transaction inner(*store);
            QVERIFY(rs->AddNew() && rs->Update());
            if (innerCommits)
                QVERIFY(inner.commit());
        }
        QVERIFY(store->inTransaction());
        if (outerCommits)
            result = outer.commit();
    }
    QCOMPARE(result, outerResult);
    QVERIFY(!store->inTransaction());
    QCOMPARE(rs->RecordCount(), rowsKept);
    QCOMPARE(store->openRecordset(Log)->RecordCount(), rowsKept);
}

void TestStore::compactKeepsEveryRow()
{
    auto store = makeLog(300);
    QVERIFY(store);
    QVERIFY(store->setUserVersion(3));
    auto rs = store->openRecordset(Log);
    for (rs->MoveFirst(); !rs->atEOF(); rs->MoveNext())
        if (rs->value(0).toInt() % 30 == 0)
            rs->Delete();
    const QString target = m_dir.filePath(QStringLiteral("compact.bak"));
    QVERIFY2(store->compactInto(target), qPrintable(store->lastError()));
    QVERIFY(!store->compactInto(target));

    auto copy = Store::open(target);
    QVERIFY(copy);
    QVERIFY(copy->integrityCheck());
    QCOMPARE(copy->userVersion(), 3);
    auto kept = copy->openRecordset(Log);
    QCOMPARE(kept->RecordCount(), 200);
    for (int row = 0; row < kept->RecordCount(); ++row)
        QCOMPARE(kept->cell(row, 0), rs->cell(row, 0));
}

void TestStore::recordsetOutlivingItsStore()
{
    auto store = makeLog(2);
    QVERIFY(store);
    auto rs = store->openRecordset(Log);
    store.reset();
    QVERIFY(!rs->Edit());
    QVERIFY(!rs->AddNew());
    QVERIFY(isNull(rs->cell(1, 0)));
}

QTEST_GUILESS_MAIN(TestStore)
#include "tst_store.moc"
