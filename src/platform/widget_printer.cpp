#include "platform/widget_printer.h"

#include <QFile>
#include <QFontMetricsF>
#include <QPageLayout>
#include <QPdfWriter>
#include <QPrintPreviewDialog>
#include <QPrinter>

namespace {

// A margin that every printer can print within.
constexpr qreal kMarginMm = 10;
// A Tab column is Arial's average character width (xAvgCharWidth 904 of
// 2048 units): the reports were laid out in it, and the widest puts its last
// column at 164 of a portrait page.
constexpr qreal kColumnEm = 904.0 / 2048.0;
// The advance of a-z in Arial (Helvetica's widths), in ems. A face that is
// wider than that, standing in for a family the machine lacks, widens the
// columns by as much and a little more, so that a heading never runs into
// the next column.
constexpr qreal kArialLowercaseEm = 12.726;
const QString kLowercase = QStringLiteral("abcdefghijklmnopqrstuvwxyz");

void setMargins(QPagedPaintDevice& device)
{
    device.setPageSize(QPageSize(QPageSize::A4));
    device.setPageMargins(QMarginsF(kMarginMm, kMarginMm, kMarginMm, kMarginMm), QPageLayout::Millimeter);
}

} // namespace

WidgetPrinter::WidgetPrinter(QPagedPaintDevice& device) : m_device(device) {}

WidgetPrinter::~WidgetPrinter()
{
    if (m_painter.isActive())
        m_painter.end();
}

bool WidgetPrinter::begin()
{
    if (m_ended)
        return false;
    if (!m_begun) {
        m_begun = true;
        if (!m_painter.begin(&m_device))
            return false;
        applyFont();
    }
    return m_painter.isActive();
}

void WidgetPrinter::applyFont()
{
    m_qfont = QFont(m_font.family);
    m_qfont.setPointSizeF(m_font.size);
    m_qfont.setBold(m_font.bold);
    if (!m_painter.isActive())
        return;
    m_painter.setFont(m_qfont);
    // Metrics of the device, not of the screen: a printer has its own dots.
    const QFontMetricsF fm(m_qfont, &m_device);
    m_lineHeight = fm.lineSpacing();
    m_ascent = fm.ascent();
    const qreal em = m_font.size * m_device.logicalDpiX() / 72.0;
    const qreal widening = fm.horizontalAdvance(kLowercase) / (kArialLowercaseEm * em);
    m_column = kColumnEm * em * (widening > 1.005 ? widening * 1.02 : 1.0);
}

void WidgetPrinter::setFont(const Font& font)
{
    m_font = font;
    applyFont();
}

void WidgetPrinter::print(const QString& text)
{
    if (!begin())
        return;
    // A page that is full goes on on the next one, as the forms' printer does.
    if (m_y + m_lineHeight > m_device.height() && m_y > 0)
        newPage();
    m_painter.drawText(QPointF(m_x, m_y + m_ascent), text);
    m_x += QFontMetricsF(m_qfont, &m_device).horizontalAdvance(text);
}

void WidgetPrinter::tab(int column)
{
    if (!begin())
        return;
    const qreal at = (qMax(column, 1) - 1) * m_column;
    if (m_x > at)
        endLine();
    m_x = at;
}

void WidgetPrinter::endLine()
{
    if (!begin())
        return;
    m_x = 0;
    m_y += m_lineHeight;
}

void WidgetPrinter::newPage()
{
    if (!begin())
        return;
    m_device.newPage();
    ++m_pages;
    m_x = 0;
    m_y = 0;
}

void WidgetPrinter::endDoc()
{
    if (!begin())
        return;
    m_painter.end();
    m_ended = true;
}

bool printToPdf(const QString& path, const Report& report, QString* error)
{
    QFile probe(path);
    if (!probe.open(QIODevice::WriteOnly)) {
        if (error)
            *error = probe.errorString();
        return false;
    }
    probe.close();
    QPdfWriter pdf(path);
    pdf.setResolution(600);
    pdf.setCreator(QStringLiteral("q19"));
    setMargins(pdf);
    WidgetPrinter printer(pdf);
    report(printer);
    return true;
}

bool printToPrinter(const Report& report)
{
    QPrinter paper(QPrinter::HighResolution);
    if (!paper.isValid())
        return false;
    setMargins(paper);
    WidgetPrinter printer(paper);
    report(printer);
    return true;
}

void printPreview(QWidget* parent, const QString& title, const Report& report)
{
    QPrinter paper(QPrinter::HighResolution);
    setMargins(paper);
    QPrintPreviewDialog dialog(&paper, parent);
    dialog.setWindowTitle(title);
    QObject::connect(&dialog, &QPrintPreviewDialog::paintRequested, &dialog, [&](QPrinter* p) {
        WidgetPrinter printer(*p);
        report(printer);
    });
    dialog.exec();
}
