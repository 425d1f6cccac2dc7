#include "ctl/status_report.h"

#include <QJsonArray>
#include <QtTest>

namespace {

// A reply of blanks with fields written at the given positions (from 1).
QString reply(int length, const QList<QPair<int, QString>>& fields, const QString& token)
{
    QString text(length, QLatin1Char(' '));
    text.replace(0, 19, QStringLiteral("05/01/2026 00:10:00"));
    for (const auto& [pos, field] : fields)
        text.replace(pos - 1, field.size(), field);
    return text + token;
}

} // namespace

class TestStatusReport : public QObject {
    Q_OBJECT
private slots:
    void pidFollowsTheControlKind_data();
    void pidFollowsTheControlKind();
    void bankTemperaturesFromTorvan_data();
    void bankTemperaturesFromTorvan();
    void condenserStepByKind_data();
    void condenserStepByKind();
};

// Fields of channel 3 at its kind 4 place (1928) and kind 5 places (2324,
// 2516), and of channel 150 at 2810: each kind must read its own.
void TestStatusReport::pidFollowsTheControlKind_data()
{
    QTest::addColumn<double>("version");
    QTest::addColumn<int>("channel");
    QTest::addColumn<int>("kind");
    QTest::addColumn<QString>("pid");  // "-": no pid key; "null": PID without a figure
    QTest::addColumn<QString>("fan");  // "-": no fan figure
    QTest::addColumn<QString>("line"); // the start of the channel's table line

    QTest::newRow("kind 4 reads 6n+1910") << 14.0 << 3 << 4 << "42" << "-" << "   3  ";
    QTest::newRow("kind 5 reads 6n+2306 and the fan") << 14.0 << 3 << 5 << "77" << "55" << "   3  ";
    QTest::newRow("kind 7 has PID without a figure") << 14.0 << 3 << 7 << "null" << "-" << "   3  ";
    QTest::newRow("kind -3 likewise") << 14.0 << 3 << -3 << "null" << "-" << "   3  ";
    QTest::newRow("kind 0 has no PID") << 14.0 << 3 << 0 << "-" << "-" << "   3  ";
    QTest::newRow("kind 6 has no PID") << 14.0 << 3 << 6 << "-" << "-" << "   3  ";
    QTest::newRow("below version 14 none") << 13.9 << 3 << 4 << "-" << "-" << "   3  ";
    QTest::newRow("a channel past 100 too") << 14.0 << 150 << 4 << "12" << "-" << " 150  ";
}

void TestStatusReport::pidFollowsTheControlKind()
{
    QFETCH(double, version);
    QFETCH(int, channel);
    QFETCH(int, kind);
    QFETCH(QString, pid);
    QFETCH(QString, fan);
    QFETCH(QString, line);

    StatusReport report;
    report.id = QStringLiteral("12");
    report.version = QString::number(version);
    report.versionNumber = version;
    report.reply = reply(3400,
                         {{1928, QStringLiteral("    42")}, {2324, QStringLiteral("    77")},
                          {2516, QStringLiteral("    55")}, {2810, QStringLiteral("    12")}},
                         QStringLiteral("status"));
    report.controlKinds = QList<int>(200, 0);
    report.controlKinds[channel - 1] = kind;

    const QJsonObject c = statusJson(report)["channels"].toArray().at(channel - 1).toObject();
    QCOMPARE(c["number"].toInt(), channel);
    if (pid == QLatin1String("-"))
        QVERIFY(!c.contains("pid"));
    else if (pid == QLatin1String("null"))
        QVERIFY(c.contains("pid") && c["pid"].isNull());
    else
        QCOMPARE(c["pid"].toDouble(), pid.toDouble());
    if (fan == QLatin1String("-"))
        QVERIFY(!c.contains("fanPercent"));
    else
        QCOMPARE(c["fanPercent"].toDouble(), fan.toDouble());

    // No other channel shows a PID.
    int withPid = 0;
    for (const QJsonValue& v : statusJson(report)["channels"].toArray())
        withPid += v.toObject().contains("pid");
    QCOMPARE(withPid, pid == QLatin1String("-") ? 0 : 1);

    const QStringList lines = statusTable(report).split(QLatin1Char('\n'));
    const auto it = std::find_if(lines.begin(), lines.end(), [&](const QString& l) { return l.startsWith(line); });
    QVERIFY(it != lines.end());
    const QString expected = pid == QLatin1String("-") ? QString()
        : pid == QLatin1String("null")                 ? QStringLiteral("  PID")
                                                       : QStringLiteral("  PID %1 %").arg(pid);
    if (expected.isEmpty())
        QVERIFY2(!it->contains(QLatin1String("PID")), qPrintable(*it));
    else
        QVERIFY2(it->contains(expected + (fan == QLatin1String("-") ? QString() : "  Fan " + fan + " %")),
                 qPrintable(*it));
}

void TestStatusReport::bankTemperaturesFromTorvan_data()
{
    QTest::addColumn<double>("version");
    QTest::addColumn<QStringList>("temperatures"); // banks 1..5; empty: none shown

    QTest::newRow("8.8 shows them") << 8.8 << QStringList{"-12.3", "4.0", "N-C", "O-R", "0.0"};
    QTest::newRow("14 shows them") << 14.0 << QStringList{"-12.3", "4.0", "N-C", "O-R", "0.0"};
    QTest::newRow("8.7 has none") << 8.7 << QStringList{};
}

void TestStatusReport::bankTemperaturesFromTorvan()
{
    QFETCH(double, version);
    QFETCH(QStringList, temperatures);

    PressureReport report;
    report.id = QStringLiteral("12");
    report.versionNumber = version;
    report.presss = reply(1400, {}, QStringLiteral("presss"));
    report.torvan = reply(1130,
                          {{1100, QStringLiteral("  -123")}, {1106, QStringLiteral("40    ")},
                           {1112, QStringLiteral(" -1000")}, {1118, QStringLiteral(" -1001")}},
                          QStringLiteral("torvan"));
    const QJsonArray banks = pressureJson(report)["banks"].toArray();
    QCOMPARE(banks.size(), 5);
    const QString table = pressureTable(report);
    QCOMPARE(table.contains(QLatin1String("Bank  Temp")), !temperatures.isEmpty());
    for (int b = 0; b < banks.size(); ++b) {
        const QJsonObject bank = banks.at(b).toObject();
        if (temperatures.isEmpty()) {
            QVERIFY(!bank.contains("temperature"));
            continue;
        }
        QCOMPARE(bank["temperature"].toObject()["value"].toString(), temperatures.at(b));
        const QString row = table.section(QLatin1Char('\n'), 3 + b, 3 + b);
        QVERIFY2(row.startsWith(QStringLiteral("%1  ").arg(b + 1, 4)) && row.contains(temperatures.at(b)),
                 qPrintable(row));
    }
}

// Condenser 2: its stage flags at 876..879, its step field at 1319.
void TestStatusReport::condenserStepByKind_data()
{
    QTest::addColumn<int>("kind");
    QTest::addColumn<QString>("stepField");
    QTest::addColumn<QString>("step");    // "-": not a variable condenser
    QTest::addColumn<QString>("percent");
    QTest::addColumn<int>("stages");

    QTest::newRow("variable, field 31") << 4 << "    31" << "Step 32" << "50 %" << 4;
    QTest::newRow("variable, field 63 is the top") << 4 << "    63" << "Step 64" << "100 %" << 4;
    QTest::newRow("variable, field 0 is step 0") << 4 << "     0" << "Step 0" << "0 %" << 4;
    QTest::newRow("variable, field 64 shows step 0") << 4 << "    64" << "Step 0" << "0 %" << 4;
    QTest::newRow("two stages, no step") << 1 << "    31" << "-" << "-" << 2;
    QTest::newRow("four stages, no step") << 3 << "    31" << "-" << "-" << 4;
    QTest::newRow("one stage, no step") << 0 << "    31" << "-" << "-" << 1;
}

void TestStatusReport::condenserStepByKind()
{
    QFETCH(int, kind);
    QFETCH(QString, stepField);
    QFETCH(QString, step);
    QFETCH(QString, percent);
    QFETCH(int, stages);

    PressureReport report;
    report.id = QStringLiteral("12");
    report.versionNumber = 9.6;
    report.presss = reply(1400, {{876, QStringLiteral("1011")}, {1319, stepField}}, QStringLiteral("presss"));
    report.condenserKinds = QList<int>(12, 0);
    report.condenserKinds[1] = kind;

    const QJsonObject c = pressureJson(report)["condensers"].toArray().at(1).toObject();
    QCOMPARE(c["number"].toInt(), 2);
    const QJsonArray flags = c["stages"].toArray();
    QCOMPARE(flags.size(), stages);
    const QList<bool> expected{true, false, true, true};
    for (int s = 0; s < stages; ++s)
        QCOMPARE(flags.at(s).toBool(), expected.at(s));
    const QString table = pressureTable(report);
    const QString row = table.section(QStringLiteral("Cond  "), 1).section(QLatin1Char('\n'), 2, 2);
    QVERIFY2(row.startsWith(QLatin1String("   2  ON ")), qPrintable(row));
    if (step == QLatin1String("-")) {
        QVERIFY(!c.contains("step"));
        QVERIFY2(!row.contains(QLatin1String("Step")), qPrintable(row));
    } else {
        QCOMPARE(c["step"].toString(), step);
        QCOMPARE(c["percent"].toString(), percent);
        QVERIFY2(row.contains(step + QLatin1Char(' ') + percent), qPrintable(row));
    }
}

QTEST_GUILESS_MAIN(TestStatusReport)
#include "tst_status_report.moc"
