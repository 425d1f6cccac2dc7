#include "platform/widget_control_state.h"

#include <QtTest>
#include <QtWidgets>

class TestWidgetControlState : public QObject {
    Q_OBJECT
private slots:
    void textGoesWhereTheWidgetShowsIt();
    void coloursAreBlueGreenRed_data();
    void coloursAreBlueGreenRed();
    void buttonFaceRestoresTheStyle();
    void stateFlagsAndValue();
};

void TestWidgetControlState::textGoesWhereTheWidgetShowsIt()
{
    QWidget top;
    auto* label = new QLabel(&top);
    auto* edit = new QLineEdit(&top);
    auto* button = new QPushButton(&top);
    auto* group = new QGroupBox(&top);
    ControlState s;
    s.text = "Port Open";
    for (QWidget* w : {static_cast<QWidget*>(label), static_cast<QWidget*>(edit),
                       static_cast<QWidget*>(button), static_cast<QWidget*>(group)})
        applyControlState(s, w);
    QCOMPARE(label->text(), s.text);
    QCOMPARE(edit->text(), s.text);
    QCOMPARE(button->text(), s.text);
    QCOMPARE(group->title(), s.text);
}

void TestWidgetControlState::coloursAreBlueGreenRed_data()
{
    QTest::addColumn<uint>("bgr");
    QTest::addColumn<QColor>("expected");
    QTest::newRow("green") << 65280u << QColor(0, 255, 0);
    QTest::newRow("yellow") << 65535u << QColor(255, 255, 0);
    QTest::newRow("red") << 255u << QColor(255, 0, 0);
    QTest::newRow("port open") << 0x80FF80u << QColor(0x80, 0xFF, 0x80);
    QTest::newRow("port closed") << 0x8080FFu << QColor(0xFF, 0x80, 0x80);
}

void TestWidgetControlState::coloursAreBlueGreenRed()
{
    QFETCH(uint, bgr);
    QFETCH(QColor, expected);
    QLineEdit edit;
    ControlState s;
    s.backColor = bgr;
    applyControlState(s, &edit);
    QCOMPARE(edit.palette().color(QPalette::Base), expected);
    QCOMPARE(toQColor(bgr, nullptr), expected);
}

void TestWidgetControlState::buttonFaceRestoresTheStyle()
{
    QLabel label;
    const QColor native = label.palette().color(QPalette::Window);
    ControlState s;
    s.backColor = Colour::Green;
    applyControlState(s, &label);
    QCOMPARE(label.palette().color(QPalette::Window), QColor(0, 255, 0));
    s.backColor = Colour::ButtonFace;
    applyControlState(s, &label);
    QCOMPARE(label.palette().color(QPalette::Window), native);
    QVERIFY(!label.autoFillBackground());
}

void TestWidgetControlState::stateFlagsAndValue()
{
    QWidget top;
    auto* check = new QCheckBox(&top);
    auto* combo = new QComboBox(&top);
    combo->addItems({"1200", "2400", "9600"});
    top.show();
    ControlState s;
    s.enabled = false;
    s.visible = false;
    s.toolTip = "Redial timeout";
    s.value = true;
    applyControlState(s, check);
    QVERIFY(check->isChecked());
    QVERIFY(!check->isEnabled());
    QVERIFY(!check->isVisible());
    QCOMPARE(check->toolTip(), s.toolTip);
    s.visible = true;
    s.enabled = true;
    s.value = 2;
    applyControlState(s, combo);
    QCOMPARE(combo->currentText(), QString("9600"));
    QVERIFY(combo->isVisible());
}

QTEST_MAIN(TestWidgetControlState)
#include "tst_widget_control_state.moc"
