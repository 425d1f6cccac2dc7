#include "platform/manual_clock.h"
#include "platform/operator.h"
#include "setpoints/instrument_schema.h"
#include "setpoints/instrument_store.h"
#include "status/frmstatus_engine.h"
#include "status/frmstatus_view.h"
#include "status/frmstatusp_engine.h"
#include "status/frmstatusp_view.h"
#include "status_test_support.h"

#include <QAbstractButton>
#include <QApplication>
#include <QLabel>
#include <QPrintPreviewDialog>
#include <QRegularExpression>
#include <QSpinBox>
#include <QTimer>
#include <QTemporaryDir>
#include <QTest>

class tst_status_views : public QObject {
    Q_OBJECT
private slots:
    void temperatureViewFollowsEngine();
    void pressureViewSwapsPanels();
    void openingKeepsStoredInterval_data();
    void openingKeepsStoredInterval();
    void unitsInHeadsAndTips_data();
    void unitsInHeadsAndTips();
    void suctionLabelsFollowTheirBoxes();
};

void tst_status_views::temperatureViewFollowsEngine()
{
    QTemporaryDir dir;
    const QString path = dir.filePath(QStringLiteral("t-7.db"));
    QVERIFY(createInstrumentTemplate(path));
    InstrumentStore::open(path)->setInfo(0, 7, 3);
    ManualClock clock;
    TestLink link(clock);
    ScriptedOperator op;
    OpenViews views;
    frmstatus_engine e(link, clock, op, views);
    QVERIFY(e.Form_Load(QStringLiteral("7"), path));
    frmstatus_view v(e);
    v.resize(1366, 768);
    v.show();
    auto* temp = v.findChild<QAbstractButton*>(QStringLiteral("Temp_0"));
    QVERIFY(temp);
    QVERIFY(!v.findChild<QWidget*>(QStringLiteral("chanframe_1"))->isVisible());
    e.status_do(ReplyText(2600, "status").num(7 * 3 + 13, 215).str());
    QTRY_COMPARE(temp->text(), QStringLiteral("21.5"));
    QVERIFY(temp->isEnabled());
    // No reply for more than two intervals: the value is dimmed with its age.
    clock.advance(21000);
    QTRY_VERIFY(!temp->isEnabled());
    QVERIFY(temp->toolTip().contains(QStringLiteral("21 s")));
    // A click on a channel button selects it into the first free row.
    v.findChild<QAbstractButton*>(QStringLiteral("Command1_9"))->click();
    QCOMPARE(e.rowChannel(1), 9);
    QTRY_VERIFY(v.findChild<QWidget*>(QStringLiteral("chanframe_1"))->isVisibleTo(&v));
    v.findChild<QAbstractButton*>(QStringLiteral("startstatus"))->click();
    QVERIFY(e.cycle.stopstatus.enabled);
    QTRY_VERIFY(v.findChild<QWidget*>(QStringLiteral("stopstatus"))->isEnabled());

    // The report opens in a preview, from which it goes to paper or a PDF file.
    auto* print = v.findChild<QAbstractButton*>(QStringLiteral("printgraph"));
    QVERIFY(print->isEnabled());
    QString previewTitle;
    QTimer::singleShot(0, this, [&] {
        if (auto* preview = qobject_cast<QPrintPreviewDialog*>(QApplication::activeModalWidget())) {
            previewTitle = preview->windowTitle();
            if (qEnvironmentVariableIsSet("Q19_REPORT_DIR")) {
                preview->resize(1000, 760);
                preview->grab().save(qEnvironmentVariable("Q19_REPORT_DIR") + QStringLiteral("/preview.png"));
            }
            preview->reject();
        }
    });
    print->click();
    QCOMPARE(previewTitle, QStringLiteral("Print Current Status"));
}

void tst_status_views::pressureViewSwapsPanels()
{
    QTemporaryDir dir;
    const QString path = dir.filePath(QStringLiteral("t-7.db"));
    QVERIFY(createInstrumentTemplate(path));
    ManualClock clock;
    TestLink link(clock);
    ScriptedOperator op;
    OpenViews views;
    frmstatusp_engine e(link, clock, op, views);
    QVERIFY(e.Form_Load(QStringLiteral("7"), path));
    frmstatusp_view v(e);
    v.resize(1366, 768);
    v.show();
    ReplyText t(1400, "presss");
    t.num(20, 350);
    e.statusp_do(t.str());
    QTRY_COMPARE(v.findChild<QLabel*>(QStringLiteral("suction_0"))->text(), QStringLiteral("350"));
    QVERIFY(!v.findChild<QWidget*>(QStringLiteral("Picture1"))->isVisible());
    v.findChild<QAbstractButton*>(QStringLiteral("dbaseload"))->click();
    QTRY_VERIFY(v.findChild<QWidget*>(QStringLiteral("Picture1"))->isVisible());
    QVERIFY(!v.findChild<QWidget*>(QStringLiteral("chanframe_0"))->isVisible());
    QCOMPARE(v.findChild<QAbstractButton*>(QStringLiteral("dbaseload"))->text(), QStringLiteral("Glacinor Status"));
}

void tst_status_views::openingKeepsStoredInterval_data()
{
    QTest::addColumn<bool>("pressure");
    QTest::addColumn<int>("stored");
    QTest::newRow("temperature, 60 beyond the spinner") << false << 60;
    QTest::newRow("temperature, 30 at the spinner's top") << false << 30;
    QTest::newRow("pressure, 31 just beyond the spinner") << true << 31;
    QTest::newRow("pressure, 120 at the stored limit") << true << 120;
}

// Opening a view shows the stored interval and writes nothing; only the
// operator's step on the spinner goes to the store.
void tst_status_views::openingKeepsStoredInterval()
{
    QFETCH(bool, pressure);
    QFETCH(int, stored);
    QTemporaryDir dir;
    const QString path = dir.filePath(QStringLiteral("t-7.db"));
    QVERIFY(createInstrumentTemplate(path));
    const int row = pressure ? kInfoPressureIntervalRow : kInfoTemperatureIntervalRow;
    const auto storedText = [&] { return InstrumentStore::open(path)->info(row, kInfoIntervalColumn).toString(); };
    QVERIFY(InstrumentStore::open(path)->setInfo(row, kInfoIntervalColumn, QString::number(stored)));
    ManualClock clock;
    TestLink link(clock);
    ScriptedOperator op;
    OpenViews views;
    frmstatus_engine temperature(link, clock, op, views);
    frmstatusp_engine pressureEngine(link, clock, op, views);
    std::unique_ptr<QWidget> v;
    if (pressure) {
        QVERIFY(pressureEngine.Form_Load(QStringLiteral("7"), path));
        v = std::make_unique<frmstatusp_view>(pressureEngine);
    } else {
        QVERIFY(temperature.Form_Load(QStringLiteral("7"), path));
        v = std::make_unique<frmstatus_view>(temperature);
    }
    v->show();
    QVERIFY(QTest::qWaitForWindowExposed(v.get()));
    auto* spinner = v->findChild<QSpinBox*>(QStringLiteral("UpDown1"));
    QVERIFY(spinner);
    QCOMPARE(storedText(), QString::number(stored));
    QCOMPARE(spinner->value(), stored);
    spinner->stepDown();
    QTRY_COMPARE(storedText(), QString::number(stored - 1));
}

void tst_status_views::unitsInHeadsAndTips_data()
{
    QTest::addColumn<bool>("pressure");
    QTest::addColumn<QString>("widget");
    QTest::addColumn<QString>("property"); // where the unit is shown
    QTest::addColumn<QString>("unit");
    QTest::newRow("channel value head") << false << "head_1" << "text" << "°C";
    QTest::newRow("associated channel head") << false << "head_5" << "text" << "°C";
    QTest::newRow("PID head") << false << "head_10" << "text" << "%";
    QTest::newRow("suction box tip") << false << "suc_4" << "toolTip" << "KPA";
    QTest::newRow("bank temperature head") << true << "bankHead_0" << "text" << "°C";
    QTest::newRow("bank discharge head") << true << "bankHead_2" << "text" << "KPA";
    QTest::newRow("bank liquid tip") << true << "liquid_3" << "toolTip" << "KPA";
    QTest::newRow("liquid level") << true << "levelBox" << "title" << "%";
    QTest::newRow("compressor run hours head") << true << "compHead_11" << "text" << "H";
}

void tst_status_views::unitsInHeadsAndTips()
{
    QFETCH(bool, pressure);
    QFETCH(QString, widget);
    QFETCH(QString, property);
    QFETCH(QString, unit);
    ManualClock clock;
    TestLink link(clock);
    ScriptedOperator op;
    OpenViews views;
    frmstatus_engine temperature(link, clock, op, views);
    frmstatusp_engine pressureEngine(link, clock, op, views);
    std::unique_ptr<QWidget> v;
    if (pressure)
        v = std::make_unique<frmstatusp_view>(pressureEngine);
    else
        v = std::make_unique<frmstatus_view>(temperature);
    QWidget* w = v->findChild<QWidget*>(widget);
    QVERIFY2(w, qPrintable(widget));
    const QStringList words = w->property(property.toLatin1()).toString().split(QRegularExpression("[ ,]+"));
    QVERIFY2(words.contains(unit), qPrintable(words.join(' ')));
}

// Each suction box is labelled, and the label is shown with its box only.
void tst_status_views::suctionLabelsFollowTheirBoxes()
{
    QTemporaryDir dir;
    const QString path = dir.filePath(QStringLiteral("t-7.db"));
    QVERIFY(createInstrumentTemplate(path));
    QVERIFY(InstrumentStore::open(path)->setSetpoint(0, 83, 1)); // one suction group
    ManualClock clock;
    TestLink link(clock);
    ScriptedOperator op;
    OpenViews views;
    frmstatus_engine e(link, clock, op, views);
    QVERIFY(e.Form_Load(QStringLiteral("7"), path));
    frmstatus_view v(e);
    v.show();
    for (int i : {0, 2, 3, 14, 15}) {
        auto* label = v.findChild<QLabel*>(QStringLiteral("sucLabel_%1").arg(i));
        QVERIFY(label);
        QCOMPARE(label->text(), QStringLiteral("Suc %1").arg(i + 1));
        QCOMPARE(label->isVisibleTo(&v), v.findChild<QWidget*>(QStringLiteral("suc_%1").arg(i))->isVisibleTo(&v));
    }
    QVERIFY(v.findChild<QLabel*>(QStringLiteral("sucLabel_15"))->isVisibleTo(&v));
    QVERIFY(!v.findChild<QLabel*>(QStringLiteral("sucLabel_3"))->isVisibleTo(&v));
}

QTEST_MAIN(tst_status_views)
#include "tst_status_views.moc"
