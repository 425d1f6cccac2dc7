#include "platform/widget_control_state.h"

#include <QAbstractButton>
#include <QAbstractSlider>
#include <QAbstractSpinBox>
#include <QApplication>
#include <QComboBox>
#include <QDoubleSpinBox>
#include <QGroupBox>
#include <QLabel>
#include <QLineEdit>
#include <QPlainTextEdit>
#include <QProgressBar>
#include <QSpinBox>
#include <QTextEdit>

QColor toQColor(quint32 colour, const QWidget* widget)
{
    if (!Colour::isSystem(colour)) {
        const quint32 rgb = Colour::toRgb(colour);
        return QColor::fromRgb(int((rgb >> 16) & 0xFF), int((rgb >> 8) & 0xFF), int(rgb & 0xFF));
    }
    const QPalette pal = widget ? QApplication::palette(widget) : QApplication::palette();
    switch (colour) {
    case Colour::Window:
        return pal.color(QPalette::Base);
    case Colour::WindowText:
        return pal.color(QPalette::Text);
    case Colour::ButtonText:
        return pal.color(QPalette::ButtonText);
    case Colour::ButtonFace:
    default:
        return pal.color(QPalette::Button);
    }
}

namespace {

void applyText(const QString& text, QWidget* w)
{
    if (auto* label = qobject_cast<QLabel*>(w)) {
        if (label->text() != text)
            label->setText(text);
    } else if (auto* edit = qobject_cast<QLineEdit*>(w)) {
        if (edit->text() != text)
            edit->setText(text);
    } else if (auto* plain = qobject_cast<QPlainTextEdit*>(w)) {
        if (plain->toPlainText() != text) {
            plain->setPlainText(text);
            plain->moveCursor(QTextCursor::End);
        }
    } else if (auto* rich = qobject_cast<QTextEdit*>(w)) {
        if (rich->toPlainText() != text)
            rich->setPlainText(text);
    } else if (auto* button = qobject_cast<QAbstractButton*>(w)) {
        if (button->text() != text)
            button->setText(text);
    } else if (auto* group = qobject_cast<QGroupBox*>(w)) {
        if (group->title() != text)
            group->setTitle(text);
    } else if (auto* combo = qobject_cast<QComboBox*>(w)) {
        if (combo->isEditable() && combo->currentText() != text)
            combo->setEditText(text);
    }
}

void applyValue(const QVariant& value, QWidget* w)
{
    if (!value.isValid())
        return;
    if (auto* button = qobject_cast<QAbstractButton*>(w)) {
        if (button->isCheckable() && button->isChecked() != value.toBool())
            button->setChecked(value.toBool());
    } else if (auto* combo = qobject_cast<QComboBox*>(w)) {
        if (combo->currentIndex() != value.toInt())
            combo->setCurrentIndex(value.toInt());
    } else if (auto* bar = qobject_cast<QProgressBar*>(w)) {
        bar->setValue(value.toInt());
    } else if (auto* spin = qobject_cast<QSpinBox*>(w)) {
        if (spin->value() != value.toInt())
            spin->setValue(value.toInt());
    } else if (auto* dspin = qobject_cast<QDoubleSpinBox*>(w)) {
        dspin->setValue(value.toDouble());
    } else if (auto* slider = qobject_cast<QAbstractSlider*>(w)) {
        if (slider->value() != value.toInt())
            slider->setValue(value.toInt());
    }
}

void applyColours(const ControlState& s, QWidget* w)
{
    // Default colours leave the style alone, so that untouched controls look native.
    const bool defaultBack = s.backColor == Colour::ButtonFace || s.backColor == Colour::Window;
    const bool defaultFore = s.foreColor == Colour::ButtonText || s.foreColor == Colour::WindowText;
    if (defaultBack && defaultFore) {
        if (w->property("q19_coloured").toBool()) {
            w->setPalette(QPalette());
            w->setAutoFillBackground(false);
            w->setProperty("q19_coloured", false);
        }
        return;
    }
    QPalette pal = QApplication::palette(w);
    const QColor back = toQColor(s.backColor, w);
    const QColor fore = toQColor(s.foreColor, w);
    for (QPalette::ColorGroup g : {QPalette::Active, QPalette::Inactive}) {
        pal.setColor(g, QPalette::Window, back);
        pal.setColor(g, QPalette::Base, back);
        pal.setColor(g, QPalette::Button, back);
        pal.setColor(g, QPalette::WindowText, fore);
        pal.setColor(g, QPalette::Text, fore);
        pal.setColor(g, QPalette::ButtonText, fore);
    }
    w->setPalette(pal);
    w->setAutoFillBackground(true);
    w->setProperty("q19_coloured", true);
}

} // namespace

void applyControlState(const ControlState& state, QWidget* widget)
{
    if (!widget)
        return;
    applyText(state.text, widget);
    applyValue(state.value, widget);
    applyColours(state, widget);
    if (widget->isEnabled() != state.enabled)
        widget->setEnabled(state.enabled);
    if (widget->toolTip() != state.toolTip)
        widget->setToolTip(state.toolTip);
    if (widget->isVisibleTo(widget->parentWidget()) != state.visible || !widget->parentWidget())
        widget->setVisible(state.visible);
}
