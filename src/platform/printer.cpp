#include "platform/printer.h"

void Printer::line(const QString& first, const QList<QPair<int, QString>>& columns)
{
    print(first);
    for (const auto& [column, text] : columns) {
        tab(column);
        print(text);
    }
    endLine();
}

QString& RecordingPrinter::current()
{
    if (!m_open) {
        m_lines.append(QString());
        m_open = true;
    }
    return m_lines.last();
}

void RecordingPrinter::setFont(const Font& font)
{
    m_font = font;
    m_calls.append({Kind::Font, {}, 0, font});
}

void RecordingPrinter::print(const QString& text)
{
    m_calls.append({Kind::Text, text, 0, m_font});
    current() += text;
}

void RecordingPrinter::tab(int column)
{
    m_calls.append({Kind::Tab, {}, column, m_font});
    const int at = qMax(column, 1) - 1;
    if (current().size() > at) {
        endLine();
        m_calls.removeLast();
    }
    QString& l = current();
    l += QString(at - l.size(), QLatin1Char(' '));
}

void RecordingPrinter::endLine()
{
    m_calls.append({Kind::EndLine, {}, 0, m_font});
    current();
    m_open = false;
}

void RecordingPrinter::newPage()
{
    m_calls.append({Kind::NewPage, {}, 0, m_font});
    m_lines.append(QStringLiteral("\f"));
    m_open = false;
}

void RecordingPrinter::endDoc()
{
    m_calls.append({Kind::EndDoc, {}, 0, m_font});
    m_open = false;
    m_ended = true;
}
