#include "platform/widget_printer.h"

#include <QApplication>
#include <QPdfWriter>
#include <QProcess>
#include <QStandardPaths>
#include <QTemporaryDir>
#include <QTest>

namespace {

// The text of a PDF as pdftotext reads it, pages separated by form feeds.
QString pdfText(const QString& pdf)
{
    QProcess text;
    text.start(QStandardPaths::findExecutable(QStringLiteral("pdftotext")),
               {QStringLiteral("-layout"), pdf, QStringLiteral("-")});
    text.waitForFinished(20000);
    return QString::fromUtf8(text.readAllStandardOutput());
}

} // namespace

class tst_widget_printer : public QObject {
    Q_OBJECT
private slots:
    void init();
    void longReportGoesOnToNewPagesLosingNoLine();
    void passedTabColumnGoesToTheNextLine();
    void unwritableFileIsReported();

private:
    QTemporaryDir m_dir;
};

void tst_widget_printer::init()
{
    if (QStandardPaths::findExecutable(QStringLiteral("pdftotext")).isEmpty())
        QSKIP("pdftotext is not installed");
}

void tst_widget_printer::longReportGoesOnToNewPagesLosingNoLine()
{
    const QString pdf = m_dir.filePath(QStringLiteral("long.pdf"));
    constexpr int kLines = 300;
    int pages = 0;
    QVERIFY(printToPdf(pdf, [&](Printer& p) {
        p.setFont({Printer::ReportFamily, 7, false});
        for (int i = 0; i < kLines; ++i)
            p.line(QStringLiteral("line %1").arg(i), {{20, QStringLiteral("end %1").arg(i)}});
        p.newPage();
        p.line(QStringLiteral("after the break"));
        p.endDoc();
        pages = static_cast<WidgetPrinter&>(p).pages();
    }));
    const QString text = pdfText(pdf);
    QVERIFY(pages > 2);
    QCOMPARE(text.count(QLatin1Char('\f')), pages);
    const QStringList lines = text.split(QLatin1Char('\n'));
    for (int i = 0; i < kLines; ++i)
        QCOMPARE(lines.filter(QRegularExpression(QStringLiteral("^\\f?line %1\\s+end %1$").arg(i))).size(), 1);
    // The explicit break starts a page of its own.
    QVERIFY(text.section(QLatin1Char('\f'), pages - 1, pages - 1).trimmed() == QLatin1String("after the break"));
}

void tst_widget_printer::passedTabColumnGoesToTheNextLine()
{
    const QString pdf = m_dir.filePath(QStringLiteral("tab.pdf"));
    QVERIFY(printToPdf(pdf, [](Printer& p) {
        p.setFont({Printer::ReportFamily, 10, true});
        p.line(QStringLiteral("a text that runs well past column ten"), {{10, QStringLiteral("next")}});
        p.line(QStringLiteral("short"), {{30, QStringLiteral("same")}});
        p.endDoc();
    }));
    QStringList lines = pdfText(pdf).split(QLatin1Char('\n'));
    lines.removeAll(QString());
    QCOMPARE(lines.value(0).trimmed(), QStringLiteral("a text that runs well past column ten"));
    QCOMPARE(lines.value(1).trimmed(), QStringLiteral("next"));
    QCOMPARE(lines.value(2).simplified(), QStringLiteral("short same"));
}

void tst_widget_printer::unwritableFileIsReported()
{
    QString error;
    bool ran = false;
    QVERIFY(!printToPdf(m_dir.filePath(QStringLiteral("no/such/folder/report.pdf")), [&](Printer&) { ran = true; },
                        &error));
    QVERIFY(!error.isEmpty());
    QVERIFY(!ran);
}

QTEST_MAIN(tst_widget_printer)
#include "tst_widget_printer.moc"
