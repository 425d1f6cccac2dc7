#include "platform/widget_binder.h"

#include "platform/widget_control_state.h"

#include <QTimer>
#include <QWidget>

namespace {
// Long enough to gather one reply's batches, short enough to look immediate.
constexpr int kRedrawDelayMs = 20;
} // namespace

WidgetBinder::WidgetBinder(QObject* parent) : QObject(parent), m_timer(new QTimer(this))
{
    m_timer->setSingleShot(true);
    m_timer->setInterval(kRedrawDelayMs);
    connect(m_timer, &QTimer::timeout, this, &WidgetBinder::refresh);
}

void WidgetBinder::bind(const ControlState& state, QWidget* widget, bool data)
{
    m_bindings.append({&state, widget, data});
}

void WidgetBinder::setStaleness(std::function<bool()> stale, std::function<QString()> why)
{
    m_stale = std::move(stale);
    m_why = std::move(why);
}

void WidgetBinder::setAfterRefresh(std::function<void()> after) { m_after = std::move(after); }

void WidgetBinder::scheduleRefresh()
{
    if (!m_timer->isActive())
        m_timer->start();
}

void WidgetBinder::refresh()
{
    m_timer->stop();
    const bool old = m_stale && m_stale();
    const QString why = old && m_why ? m_why() : QString();
    for (const Binding& b : m_bindings) {
        applyControlState(*b.state, b.widget);
        if (b.data && old) {
            b.widget->setEnabled(false);
            b.widget->setToolTip(why);
        }
    }
    if (m_after)
        m_after();
}
