#include "link/ccform1_engine.h"
#include "link/ccform1_line_view.h"
#include "platform/fake_line.h"
#include "platform/manual_clock.h"

#include <QComboBox>
#include <QLineEdit>
#include <QPushButton>
#include <QRadioButton>
#include <QtTest>

class TestCcForm1LineView : public QObject {
    Q_OBJECT
private slots:
    void clicksReachTheEngineAndStateComesBack();
};

void TestCcForm1LineView::clicksReachTheEngineAndStateComesBack()
{
    ManualClock clock;
    ScriptedOperator op;
    MemorySettings settings;
    OpenViews views;
    LinkGlobals globals;
    FakeLine* line = nullptr;
    ccForm1_engine engine(clock, op, settings, views, globals, [&](const QString& name) {
        auto l = std::make_unique<FakeLine>();
        l->setPortName(name);
        line = l.get();
        return std::unique_ptr<Line>(std::move(l));
    });
    engine.setInstrument(QStringLiteral("12"), QString(), nullptr);
    ccForm1_line_view view(engine);
    view.show();

    auto* direct = view.findChild<QRadioButton*>(QStringLiteral("Option2_1"));
    auto* connect = view.findChild<QPushButton*>(QStringLiteral("Command3"));
    auto* disconnect = view.findChild<QPushButton*>(QStringLiteral("Command6"));
    auto* state = view.findChild<QLineEdit*>(QStringLiteral("Text3_2"));
    auto* speed = view.findChild<QComboBox*>(QStringLiteral("cboSpeed"));
    QVERIFY(direct && connect && disconnect && state && speed);
    QCOMPARE(speed->currentText(), QStringLiteral("9600"));

    direct->click();
    QVERIFY(engine.Frame9.enabled);
    QVERIFY(connect->isEnabled() && !disconnect->isEnabled());
    // The redraw follows a moment later, once per burst of changes.
    connect->click();
    QTRY_COMPARE(state->text(), QStringLiteral("Port Open"));
    QVERIFY(!connect->isEnabled() && disconnect->isEnabled());
    QCOMPARE(line->writes().size(), 1);

    // A refused change of type springs back on the screen too.
    auto* modemOption = view.findChild<QRadioButton*>(QStringLiteral("Option2_0"));
    modemOption->click();
    QVERIFY(!modemOption->isChecked() && direct->isChecked());

    disconnect->click();
    QTRY_COMPARE(state->text(), QStringLiteral("Port Closed"));
}

QTEST_MAIN(TestCcForm1LineView)
#include "tst_widget_ccform1_line_view.moc"
