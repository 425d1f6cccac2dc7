#include "shell/help_view.h"

#include <QtTest>
#include <QtWidgets>

class TestHelp : public QObject {
    Q_OBJECT
private slots:
    void everyTopicTheProgramOpensHasAPage_data();
    void everyTopicTheProgramOpensHasAPage();
    void everyListedPageExistsAndSaysSomething();
    void unknownTopicOpensTheContentsAndSaysSo();
};

void TestHelp::everyTopicTheProgramOpensHasAPage_data()
{
    QTest::addColumn<QString>("topic");
    // The topics the program's views ask for by name.
    const QStringList asked{
        "Selecting Channels on the Computer", "1 Channels Connected", "6 Set Temperature",
        "18 Set point Times", "42 Daily Set Points", "10 High Temperature Alarm",
        "11 Low Temperature Alarm", "19 Set Defrosts", "49 Associated Channels",
        "2 Channels in each Bank", "44 Maximum Channels ON", "53 Print out Times",
        "30 Set Data Logging", "62 Compressor Set Point", "69 Liquid Pump Fail Set Point",
        "67 Condenser Set Point", "108 Automatic Reset High/Low Level", "14 High Pressure Alarm KPA",
        "Channel's Up/Down Load from Computer", "Temperature Standard ON/OFF",
        "Standard, PID, Variable and DX", "52 Manual Turn OFF", "48 Control 2 ON Delay (pump down time)",
        "Liquid Level Control", "Channel Status Commands", "Channel Status Selection",
        "Channel Status Detail", "Selecting Temperature Channels to Display",
        "Multi Probes Status Commands", "Channel Set Points", "All Set Point Function Numbers"};
    for (const QString& t : asked)
        QTest::newRow(qPrintable(t)) << t;
}

void TestHelp::everyTopicTheProgramOpensHasAPage()
{
    QFETCH(QString, topic);
    const QString page = HelpView::pageForTopic(topic);
    QVERIFY2(!page.isEmpty(), qPrintable(topic));
    HelpView w;
    w.show_help("q-19.hlp", topic);
    QCOMPARE(w.browser()->source().fileName(), page);
    QVERIFY(w.findChildren<QLabel*>().first()->isHidden());
}

void TestHelp::everyListedPageExistsAndSaysSomething()
{
    const QStringList topics = HelpView::topics();
    QVERIFY(topics.size() >= 31);
    for (const QString& t : topics) {
        QFile f(":/help/" + HelpView::pageForTopic(t));
        QVERIFY2(f.open(QIODevice::ReadOnly), qPrintable(t));
        QTextDocument doc;
        doc.setHtml(QString::fromUtf8(f.readAll()));
        QVERIFY2(doc.toPlainText().simplified().size() > 200, qPrintable(t));
    }
}

void TestHelp::unknownTopicOpensTheContentsAndSaysSo()
{
    HelpView w;
    w.show_help("q-19.chm", "No Such Topic");
    QCOMPARE(w.browser()->source().fileName(), QString("index.html"));
    QLabel* notice = w.findChildren<QLabel*>().first();
    QVERIFY(!notice->isHidden());
    QVERIFY(notice->text().contains("No Such Topic"));
}

QTEST_MAIN(TestHelp)
#include "tst_widget_help.moc"
