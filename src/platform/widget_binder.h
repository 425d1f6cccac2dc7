#pragma once

#include "platform/control_state.h"

#include <QList>
#include <QObject>
#include <functional>

class QTimer;
class QWidget;

// Ties an engine's control states to the view's widgets and redraws them
// all at once, a moment after the engine last said it changed: replies
// arrive in batches and timers fire in bursts, and a view fed byte by byte
// must not repaint per byte. Every view binds its controls through one.
class WidgetBinder : public QObject {
    Q_OBJECT
public:
    explicit WidgetBinder(QObject* parent = nullptr);

    // A data control shows a measured value: it is dimmed while the data is old.
    void bind(const ControlState& state, QWidget* widget, bool data = false);
    // Hooks of the view: whether the data is old and why (the dimmed widgets'
    // tool tip), and what to do after the states are applied.
    void setStaleness(std::function<bool()> stale, std::function<QString()> why);
    void setAfterRefresh(std::function<void()> after);

    // Connect the engine's changed() here.
    void scheduleRefresh();
    // Applies every state now (a view's first show, a test).
    void refresh();

private:
    struct Binding {
        const ControlState* state;
        QWidget* widget;
        bool data;
    };
    QList<Binding> m_bindings;
    std::function<bool()> m_stale;
    std::function<QString()> m_why;
    std::function<void()> m_after;
    QTimer* m_timer;
};
