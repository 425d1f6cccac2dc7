#include "status/status_base_view.h"

#include "platform/widget_control_state.h"
#include "status/status_cycle.h"

#include <QSignalBlocker>
#include <QSpinBox>

StatusViewBase::StatusViewBase(StatusCycle& cycle, QWidget* parent) : QWidget(parent), m_cycle(cycle), m_binder(this)
{
    m_binder.setStaleness([this] { return m_cycle.stale(); }, [this] { return m_cycle.ageText(); });
    m_binder.setAfterRefresh([this] { finishRefresh(); });
}

void StatusViewBase::bindInterval(QSpinBox* spinner)
{
    m_interval = spinner;
    spinner->setRange(StatusCycle::IntervalMin, StatusCycle::SpinnerMax);
    connect(spinner, &QSpinBox::valueChanged, this, [this](int value) {
        if (m_cycle.UpDown1.value.toInt() != value)
            m_cycle.UpDown1_Change(value);
    });
}

void StatusViewBase::unitTip(QWidget* w, const QString& tip)
{
    m_unitTips.append({w, tip});
    w->setToolTip(tip);
}

void StatusViewBase::finishRefresh()
{
    if (m_interval) {
        // Showing the engine's state is no step of the operator's.
        const QSignalBlocker quiet(m_interval);
        m_interval->setMaximum(qMax(int(StatusCycle::SpinnerMax), m_cycle.UpDown1.value.toInt()));
        applyControlState(m_cycle.UpDown1, m_interval);
    }
    for (const auto& [w, tip] : std::as_const(m_unitTips)) {
        const QString now = w->toolTip();
        if (!now.startsWith(tip))
            w->setToolTip(now.isEmpty() ? tip : tip + QLatin1Char('\n') + now);
    }
    afterRefresh();
}
