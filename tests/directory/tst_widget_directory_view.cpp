#include "directory/directory_engine.h"
#include "directory/directory_view.h"
#include "platform/operator.h"

#include <QComboBox>
#include <QLabel>
#include <QLineEdit>
#include <QPushButton>
#include <QRadioButton>
#include <QtTest>

class TestDirectoryView : public QObject {
    Q_OBJECT
private slots:
    void widgetsFollowTheEngine();
};

void TestDirectoryView::widgetsFollowTheEngine()
{
    QTemporaryDir tmp;
    DataFolder folder(tmp.path());
    QVERIFY(folder.ensure());
    ScriptedOperator op;
    ccForm1_directory engine(folder, op);
    QVERIFY(engine.Form_Load());
    DirectoryView view(engine);
    view.show();

    auto* combo = view.findChild<QComboBox*>("DBCombo1");
    auto* id = view.findChild<QLineEdit*>("Text1_0");
    auto* name = view.findChild<QLineEdit*>("Text1_1");
    auto* caption = view.findChild<QLabel*>("Data1");
    QVERIFY(combo && id && name && caption && view.findChild<QLineEdit*>("Text1_7"));
    QVERIFY(!view.findChild<QLineEdit*>("Text1_5"));
    QCOMPARE(combo->currentText(), "Demo Cold Store");
    QCOMPARE(caption->text(), "Record: 1 of 1");
    QVERIFY(id->isReadOnly());

    view.findChild<QPushButton*>("Command1")->click();
    QVERIFY(!id->isReadOnly() && !combo->isEnabled());
    QVERIFY(view.findChild<QPushButton*>("Command4")->isEnabled());
    QTest::keyClicks(id, "7");
    QTest::keyClicks(name, "Annex");
    view.findChild<QPushButton*>("Command4")->click();
    QCOMPARE(op.titles(), QStringList({"Mandatory"}));
    QCOMPARE(combo->count(), 2);
    QCOMPARE(combo->currentText(), "Annex");
    QVERIFY(id->isReadOnly() && combo->isEnabled());

    view.findChild<QRadioButton*>("Option1_0")->click();
    QCOMPARE(combo->itemText(1), "7");
    emit combo->activated(1);
    QCOMPARE(view.findChild<QLineEdit*>("Text5")->text(), "7");
    QCOMPARE(caption->text(), "Record: 2 of 2");
}

QTEST_MAIN(TestDirectoryView)
#include "tst_widget_directory_view.moc"
