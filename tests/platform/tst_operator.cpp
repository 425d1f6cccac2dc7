#include "platform/operator.h"
#include "platform/settings.h"

#include <QtTest>

class TestOperator : public QObject {
    Q_OBJECT
private slots:
    void scriptedAnswersFromQueueThenAffirmative_data();
    void scriptedAnswersFromQueueThenAffirmative();
    void scriptedLetsEventsRunWhileAMessageStands();
    void headlessAnswersConfirmationsOnlyWhenTold_data();
    void headlessAnswersConfirmationsOnlyWhenTold();
    void messageTextForTerminals();
    void qtSettingsKeepValuesInTheirSection();
};

void TestOperator::scriptedAnswersFromQueueThenAffirmative_data()
{
    QTest::addColumn<int>("buttons");
    QTest::addColumn<int>("expectedDefault");
    QTest::newRow("ok") << int(Operator::Buttons::Ok) << int(Operator::Answer::Ok);
    QTest::newRow("ok-cancel") << int(Operator::Buttons::OkCancel) << int(Operator::Answer::Ok);
    QTest::newRow("yes-no") << int(Operator::Buttons::YesNo) << int(Operator::Answer::Yes);
    QTest::newRow("retry-cancel") << int(Operator::Buttons::RetryCancel) << int(Operator::Answer::Retry);
}

void TestOperator::scriptedAnswersFromQueueThenAffirmative()
{
    QFETCH(int, buttons);
    QFETCH(int, expectedDefault);
    ScriptedOperator op;
    op.queueAnswer(Operator::Answer::Cancel);
    const auto b = Operator::Buttons(buttons);
    QCOMPARE(op.message("First", {"a"}, Operator::Icon::Critical, b), Operator::Answer::Cancel);
    QCOMPARE(int(op.message("Second", {"b", "c"}, Operator::Icon::None, b)), expectedDefault);
    QCOMPARE(op.titles(), QStringList({"First", "Second"}));
    QCOMPARE(op.messages().first().icon, Operator::Icon::Critical);
    QCOMPARE(op.last().lines, QStringList({"b", "c"}));
    QCOMPARE(op.openFileName("Open", {}, {}), QString());
    op.queueFile("/tmp/x.db");
    QCOMPARE(op.openFileName("Open", {}, {}), QString("/tmp/x.db"));
}

void TestOperator::scriptedLetsEventsRunWhileAMessageStands()
{
    ScriptedOperator op;
    QStringList seen;
    op.setWhileShowing([&](const Operator::Message& m) {
        seen << m.title;
        if (m.title == "Outer")
            op.message("Inner", {});
    });
    op.message("Outer", {});
    QCOMPARE(seen, QStringList({"Outer", "Inner"}));
    QCOMPARE(op.titles(), QStringList({"Outer", "Inner"}));
}

void TestOperator::headlessAnswersConfirmationsOnlyWhenTold_data()
{
    QTest::addColumn<bool>("yes");
    QTest::addColumn<int>("buttons");
    QTest::addColumn<int>("answer");
    QTest::newRow("ok always") << false << int(Operator::Buttons::Ok) << int(Operator::Answer::Ok);
    QTest::newRow("ok-cancel without yes") << false << int(Operator::Buttons::OkCancel) << int(Operator::Answer::Cancel);
    QTest::newRow("ok-cancel with yes") << true << int(Operator::Buttons::OkCancel) << int(Operator::Answer::Ok);
    QTest::newRow("yes-no without yes") << false << int(Operator::Buttons::YesNo) << int(Operator::Answer::No);
    QTest::newRow("yes-no with yes") << true << int(Operator::Buttons::YesNo) << int(Operator::Answer::Yes);
}

void TestOperator::headlessAnswersConfirmationsOnlyWhenTold()
{
    QFETCH(bool, yes);
    QFETCH(int, buttons);
    QFETCH(int, answer);
    HeadlessOperator op(yes);
    QCOMPARE(int(op.message("Are you sure", {"Are you sure !,"}, Operator::Icon::Question,
                            Operator::Buttons(buttons))),
             answer);
    QCOMPARE(op.messages().size(), 1);
}

void TestOperator::messageTextForTerminals()
{
    Operator::Message m;
    m.title = "No Glacinor";
    m.lines = QStringList{"The Glacinor cannot be connected.", "Check all cables to the Glacinor."};
    QCOMPARE(m.toText(), QString("No Glacinor: The Glacinor cannot be connected. / Check all cables to the Glacinor."));
    Operator::Message bare;
    bare.title = "Busy";
    QCOMPARE(bare.toText(), QString("Busy:"));
}

void TestOperator::qtSettingsKeepValuesInTheirSection()
{
    QTemporaryDir dir;
    const QString file = dir.filePath("q19.ini");
    {
        QtSettings s(file);
        s.setValue("Settings", "9600,n,8,1");
        s.setValue("CommPort", 3);
    }
    QtSettings again(file);
    QCOMPARE(again.value("Settings").toString(), QString("9600,n,8,1"));
    QCOMPARE(again.value("CommPort").toInt(), 3);
    QCOMPARE(again.value("Missing", "x").toString(), QString("x"));
    QSettings raw(file, QSettings::IniFormat);
    QCOMPARE(raw.value("Properties/CommPort").toInt(), 3);
}

QTEST_GUILESS_MAIN(TestOperator)
#include "tst_operator.moc"
