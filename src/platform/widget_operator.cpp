#include "platform/widget_operator.h"

#include "platform/widget_control_state.h"

#include <QApplication>
#include <QColorDialog>
#include <QFileDialog>
#include <QFontDialog>
#include <QMessageBox>

namespace {

QMessageBox::StandardButtons buttonsOf(Operator::Buttons b)
{
    switch (b) {
    case Operator::Buttons::Ok:
        return QMessageBox::Ok;
    case Operator::Buttons::OkCancel:
        return QMessageBox::Ok | QMessageBox::Cancel;
    case Operator::Buttons::YesNo:
        return QMessageBox::Yes | QMessageBox::No;
    case Operator::Buttons::YesNoCancel:
        return QMessageBox::Yes | QMessageBox::No | QMessageBox::Cancel;
    case Operator::Buttons::RetryCancel:
        return QMessageBox::Retry | QMessageBox::Cancel;
    case Operator::Buttons::AbortRetryIgnore:
        return QMessageBox::Abort | QMessageBox::Retry | QMessageBox::Ignore;
    }
    return QMessageBox::Ok;
}

QMessageBox::Icon iconOf(Operator::Icon i)
{
    switch (i) {
    case Operator::Icon::Information:
        return QMessageBox::Information;
    case Operator::Icon::Exclamation:
        return QMessageBox::Warning;
    case Operator::Icon::Critical:
        return QMessageBox::Critical;
    case Operator::Icon::Question:
        return QMessageBox::Question;
    case Operator::Icon::None:
        break;
    }
    return QMessageBox::NoIcon;
}

Operator::Answer answerOf(int button)
{
    switch (button) {
    case QMessageBox::Cancel:
        return Operator::Answer::Cancel;
    case QMessageBox::Yes:
        return Operator::Answer::Yes;
    case QMessageBox::No:
        return Operator::Answer::No;
    case QMessageBox::Retry:
        return Operator::Answer::Retry;
    case QMessageBox::Abort:
        return Operator::Answer::Abort;
    case QMessageBox::Ignore:
        return Operator::Answer::Ignore;
    default:
        return Operator::Answer::Ok;
    }
}

} // namespace

Operator::Answer WidgetOperator::ask(const Message& message)
{
    QMessageBox box(iconOf(message.icon), message.title, message.lines.join(QLatin1Char('\n')),
                    buttonsOf(message.buttons), m_parent);
    // A pointer left busy by the caller would hide that the box wants an answer.
    const bool busy = QApplication::overrideCursor() != nullptr;
    if (busy)
        QApplication::setOverrideCursor(Qt::ArrowCursor);
    const int result = box.exec();
    if (busy)
        QApplication::restoreOverrideCursor();
    // Closing the box with the window's close button means "back out".
    if (result == QMessageBox::Escape || result == 0)
        return negative(message.buttons);
    return answerOf(result);
}

QString WidgetOperator::openFileName(const QString& caption, const QString& dir, const QString& filter)
{
    return QFileDialog::getOpenFileName(m_parent, caption, dir, filter);
}

QString WidgetOperator::saveFileName(const QString& caption, const QString& dir, const QString& filter)
{
    return QFileDialog::getSaveFileName(m_parent, caption, dir, filter);
}

std::optional<quint32> WidgetOperator::chooseColour(quint32 initial)
{
    const QColor c = QColorDialog::getColor(toQColor(initial, m_parent), m_parent);
    if (!c.isValid())
        return std::nullopt;
    return Colour::fromRgb((quint32(c.red()) << 16) | (quint32(c.green()) << 8) | quint32(c.blue()));
}

std::optional<Operator::FontChoice> WidgetOperator::chooseFont(const FontChoice& initial)
{
    QFont start(initial.family);
    start.setPointSizeF(initial.pointSize > 0 ? initial.pointSize : 10);
    start.setBold(initial.bold);
    start.setItalic(initial.italic);
    bool ok = false;
    const QFont f = QFontDialog::getFont(&ok, start, m_parent);
    if (!ok)
        return std::nullopt;
    return FontChoice{f.family(), f.pointSizeF(), f.bold(), f.italic()};
}

void WidgetOperator::beep()
{
    QApplication::beep();
}

void WidgetOperator::setBusy(bool busy)
{
    if (busy)
        QApplication::setOverrideCursor(Qt::WaitCursor);
    else
        QApplication::restoreOverrideCursor();
}
