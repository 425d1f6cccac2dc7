#include "platform/printer.h"

#include <QTest>

// Steps of a report: "p:text" prints, "t:N" tabs to column N, "e" ends the
// line, "n" breaks the page.
class tst_printer : public QObject {
    Q_OBJECT
private slots:
    void layout_data();
    void layout();
    void callsAreRecorded();
};

void tst_printer::layout_data()
{
    QTest::addColumn<QStringList>("steps");
    QTest::addColumn<QStringList>("lines");
    QTest::newRow("tab pads to its column") << QStringList{"p:ab", "t:6", "p:c", "e"} << QStringList{"ab   c"};
    QTest::newRow("tab at the column it is in stays")
        << QStringList{"p:abcd", "t:5", "p:e", "e"} << QStringList{"abcde"};
    QTest::newRow("a passed column is on the next line")
        << QStringList{"p:abcdef", "t:3", "p:x", "e"} << QStringList{"abcdef", "  x"};
    QTest::newRow("tab on a fresh line") << QStringList{"t:4", "p:x", "e"} << QStringList{"   x"};
    QTest::newRow("blank lines") << QStringList{"p:a", "e", "e", "p:b", "e"} << QStringList{"a", "", "b"};
    QTest::newRow("page break") << QStringList{"p:a", "e", "n", "p:b", "e"} << QStringList{"a", "\f", "b"};
    QTest::newRow("text without a line end")
        << QStringList{"p:a", "t:3", "p:b"} << QStringList{"a b"};
}

void tst_printer::layout()
{
    QFETCH(QStringList, steps);
    QFETCH(QStringList, lines);
    RecordingPrinter p;
    for (const QString& s : steps) {
        if (s.startsWith(QLatin1String("p:")))
            p.print(s.mid(2));
        else if (s.startsWith(QLatin1String("t:")))
            p.tab(s.mid(2).toInt());
        else if (s == QLatin1String("e"))
            p.endLine();
        else if (s == QLatin1String("n"))
            p.newPage();
    }
    QCOMPARE(p.lines(), lines);
}

void tst_printer::callsAreRecorded()
{
    using K = RecordingPrinter::Kind;
    RecordingPrinter p;
    const Printer::Font bold{Printer::ReportFamily, 7, true};
    p.setFont(bold);
    p.line(QStringLiteral("Chan No."), {{13, QStringLiteral("Bank No.")}});
    p.endDoc();
    QList<K> kinds;
    for (const RecordingPrinter::Call& c : p.calls())
        kinds << c.kind;
    QCOMPARE(kinds, (QList<K>{K::Font, K::Text, K::Tab, K::Text, K::EndLine, K::EndDoc}));
    QCOMPARE(p.calls()[2].column, 13);
    QCOMPARE(p.calls()[3].font, bold);
    QVERIFY(p.ended());
}

QTEST_GUILESS_MAIN(tst_printer)
#include "tst_printer.moc"
