#pragma once

// The print model the reports are written in, as the forms print: a font,
// text at the current position, Tab(column) to a column of the line, line
// ends, page breaks and the end of the document. The widget layer draws it
// with QPainter on a printer or a PDF file; RecordingPrinter keeps it for
// tests.

#include <QList>
#include <QString>
#include <QStringList>

class Printer {
public:
    // The reports were laid out in Arial. Liberation Sans has Arial's metrics
    // and is installed with the program, so a report lays out the same on every
    // machine; a family the machine lacks would be replaced by a wider face.
    static inline const QString ReportFamily = QStringLiteral("Liberation Sans");

    struct Font {
        QString family = ReportFamily;
        double size = 10;
        bool bold = false;
        bool operator==(const Font&) const = default;
    };

    virtual ~Printer() = default;

    virtual void setFont(const Font& font) = 0;
    // Text at the current position; the position moves behind it.
    virtual void print(const QString& text) = 0;
    // Tab(column): the next text starts at this column, counted from 1 in
    // average character widths of the font. A column already passed is
    // reached on the next line, as the forms' printer does.
    virtual void tab(int column) = 0;
    virtual void endLine() = 0;
    virtual void newPage() = 0;
    // EndDoc: the document goes to the printer (or file).
    virtual void endDoc() = 0;

    // Print "a"; Tab(13); "b" ...: text, then (column, text) pairs, then a line end.
    void line(const QString& first, const QList<QPair<int, QString>>& columns = {});
};

// Records every call, and lays the text out in characters: a tab pads with
// blanks, so lines() reads as the page would in a fixed-pitch font.
class RecordingPrinter : public Printer {
public:
    enum class Kind { Font, Text, Tab, EndLine, NewPage, EndDoc };
    struct Call {
        Kind kind;
        QString text;
        int column = 0;
        Font font;
    };

    void setFont(const Font& font) override;
    void print(const QString& text) override;
    void tab(int column) override;
    void endLine() override;
    void newPage() override;
    void endDoc() override;

    const QList<Call>& calls() const { return m_calls; }
    // Lines of every page so far, pages separated by a "\f" line.
    const QStringList& lines() const { return m_lines; }
    Font font() const { return m_font; }
    bool ended() const { return m_ended; }

private:
    QString& current();
    QList<Call> m_calls;
    QStringList m_lines;
    bool m_open = false; // the last line takes more text
    Font m_font;
    bool m_ended = false;
};
