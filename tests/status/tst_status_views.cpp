#include "status/frmstatus_engine.h"
#include "status/frmstatus_view.h"
#include "status/frmstatusp_engine.h"
#include "status/frmstatusp_view.h"
#include "status_test_support.h"

#include <QAbstractButton>
#include <QApplication>
#include <QLabel>
#include <QPrintPreviewDialog>
#include <QSpinBox>
#include <QTest>
#include <QTimer>

using Rig = StatusRig;

class tst_status_views : public QObject {
    Q_OBJECT
private slots:
    void temperatureViewFollowsEngine();
    void pressureViewSwapsPanels();
    void openingKeepsStoredInterval_data();
    void openingKeepsStoredInterval();
    void suctionLabelsFollowTheirBoxes();
};

void tst_status_views::temperatureViewFollowsEngine()
{
    Rig r;
    r.select({3});
    frmstatus_engine e(r.link, r.clock, r.op, r.views);
    QVERIFY(e.Form_Load(QStringLiteral("7"), r.path));
    frmstatus_view v(e);
    v.resize(1366, 768);
    v.show();
    auto* temp = v.findChild<QAbstractButton*>(QStringLiteral("Temp_0"));
    QVERIFY(temp);
    QVERIFY(!v.findChild<QWidget*>(QStringLiteral("chanframe_1"))->isVisible());
    e.status_do(ReplyText(2600, "status").num(7 * 3 + 13, 215).str());
    QTRY_COMPARE(temp->text(), QStringLiteral("21.5"));
    QVERIFY(temp->isEnabled());
    // No reply for more than two intervals: the value is dimmed with its age,
    // under the unit a box's tip names.
    r.clock.advance(21000);
    QTRY_VERIFY(!temp->isEnabled());
    QVERIFY(temp->toolTip().contains(QStringLiteral("21 s")));
    const QStringList sucTip = v.findChild<QWidget*>(QStringLiteral("suc_0"))->toolTip().split(QLatin1Char('\n'));
    QCOMPARE(sucTip.size(), 2);
    QVERIFY(sucTip[0].endsWith(QStringLiteral("in KPA")) && sucTip[1].contains(QStringLiteral("21 s")));
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
            preview->reject();
        }
    });
    print->click();
    QCOMPARE(previewTitle, QStringLiteral("Print Current Status"));
}

void tst_status_views::pressureViewSwapsPanels()
{
    Rig r;
    frmstatusp_engine e(r.link, r.clock, r.op, r.views);
    QVERIFY(e.Form_Load(QStringLiteral("7"), r.path));
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
    QTest::newRow("pressure, 120 at the stored limit") << true << 120;
}

// Opening a view shows the stored interval and writes nothing; only the
// operator's step on the spinner goes to the store.
void tst_status_views::openingKeepsStoredInterval()
{
    QFETCH(bool, pressure);
    QFETCH(int, stored);
    Rig r;
    const int row = pressure ? kInfoPressureIntervalRow : kInfoTemperatureIntervalRow;
    const auto storedText = [&] { return r.store->info(row, kInfoIntervalColumn).toString(); };
    QVERIFY(r.store->setInfo(row, kInfoIntervalColumn, QString::number(stored)));
    frmstatus_engine temperature(r.link, r.clock, r.op, r.views);
    frmstatusp_engine pressureEngine(r.link, r.clock, r.op, r.views);
    std::unique_ptr<QWidget> v;
    if (pressure) {
        QVERIFY(pressureEngine.Form_Load(QStringLiteral("7"), r.path));
        v = std::make_unique<frmstatusp_view>(pressureEngine);
    } else {
        QVERIFY(temperature.Form_Load(QStringLiteral("7"), r.path));
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

// Each suction box is labelled, and the label is shown with its box only.
void tst_status_views::suctionLabelsFollowTheirBoxes()
{
    Rig r;
    QVERIFY(r.store->setSetpoint(0, 83, 1)); // one suction group
    frmstatus_engine e(r.link, r.clock, r.op, r.views);
    QVERIFY(e.Form_Load(QStringLiteral("7"), r.path));
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
