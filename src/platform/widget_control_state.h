#pragma once

#include "platform/control_state.h"

#include <QColor>

class QWidget;

// Turns a colour number of the program (24-bit BGR, or a system colour with
// the high bit set) into the colour the widget's style uses for it.
QColor toQColor(quint32 colour, const QWidget* widget);

// Shows an engine's control state on its widget: text or caption, colours,
// enabled, visible, tool tip and value, by the kind of widget. Views call
// this for every control after the engine says it changed.
void applyControlState(const ControlState& state, QWidget* widget);
