#pragma once

// The print model drawn with QPainter on a paged device: a QPrinter (paper,
// or the pages of a print preview) or a QPdfWriter.

#include "platform/printer.h"

#include <QFont>
#include <QPainter>
#include <functional>

class QPagedPaintDevice;
class QWidget;

class WidgetPrinter : public Printer {
public:
    // The device must outlive the printer; painting starts at the first call.
    explicit WidgetPrinter(QPagedPaintDevice& device);
    ~WidgetPrinter() override;

    void setFont(const Font& font) override;
    void print(const QString& text) override;
    void tab(int column) override;
    void endLine() override;
    void newPage() override;
    void endDoc() override;

    int pages() const { return m_pages; }

private:
    bool begin();
    void applyFont();

    QPagedPaintDevice& m_device;
    QPainter m_painter;
    bool m_begun = false;
    bool m_ended = false;
    Font m_font;
    QFont m_qfont;
    qreal m_x = 0;
    qreal m_y = 0; // top of the current line
    qreal m_lineHeight = 0;
    qreal m_ascent = 0;
    qreal m_column = 0; // width of one Tab column
    int m_pages = 1;
};

// A report is a procedure that prints on a Printer.
using Report = std::function<void(Printer&)>;

// The report into a PDF file; false (with the reason) when it cannot be written.
bool printToPdf(const QString& path, const Report& report, QString* error = nullptr);
// The report on paper, on the system's default printer.
bool printToPrinter(const Report& report);
// The report in a print preview, from which it can go to a printer or a PDF file.
void printPreview(QWidget* parent, const QString& title, const Report& report);
