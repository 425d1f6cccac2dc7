#pragma once

#include "platform/widget_binder.h"

#include <QList>
#include <QWidget>

class QSpinBox;
class StatusCycle;

// What the status views draw alike: the engine's controls bound to widgets
// of the same name (objectName = the control's name), redrawn once per burst
// of changes with stale values dimmed, the interval spinner and the unit
// tips of the data boxes.
class StatusViewBase : public QWidget {
    Q_OBJECT
public:
    StatusViewBase(StatusCycle& cycle, QWidget* parent);

protected:
    void bind(const ControlState& state, QWidget* w, bool data = false) { m_binder.bind(state, w, data); }
    // Only the operator's steps reach the cycle (and its store); a stored
    // interval above the spinner's own limit is shown as it is, never cut.
    void bindInterval(QSpinBox* spinner);
    // A tool tip with the unit of a data box, kept ahead of what the engine
    // or the stale state puts there.
    void unitTip(QWidget* w, const QString& tip);
    // Connect the engine's changed() here.
    void scheduleRefresh() { m_binder.scheduleRefresh(); }
    void refresh() { m_binder.refresh(); }
    // After the states are applied.
    virtual void afterRefresh() {}

private:
    void finishRefresh();

    StatusCycle& m_cycle;
    WidgetBinder m_binder;
    QList<std::pair<QWidget*, QString>> m_unitTips;
    QSpinBox* m_interval = nullptr;
};
