#pragma once

#include <QHash>
#include <QList>
#include <QWidget>

class frmstatus_engine;
class QSpinBox;
class QTimer;
class StatusCycle;
struct ControlState;

// Status views' shared drawing: the engine's controls applied to widgets of
// the same name, once per burst of changes, and stale values dimmed.
class StatusViewBase : public QWidget {
    Q_OBJECT
public:
    using QWidget::QWidget;

protected:
    // Widgets are found by objectName, the control's name.
    void bind(const ControlState& state, QWidget* w, bool data = false);
    // The interval spinner: only the operator's steps reach the cycle (and
    // its store); a stored interval above the spinner's own limit is shown
    // as it is, never cut.
    void bindInterval(StatusCycle& cycle, QSpinBox* spinner);
    // A tool tip with the unit of a data box, kept ahead of what the engine
    // or the stale state puts there.
    void unitTip(QWidget* w, const QString& tip);
    void scheduleRefresh();
    void refresh();
    // The stale state as the cycle tells it: dims the data widgets.
    virtual bool stale() const = 0;
    virtual QString ageText() const = 0;
    // After the states are applied.
    virtual void afterRefresh() {}

private:
    struct Binding {
        const ControlState* state;
        QWidget* widget;
        bool data;
    };
    QList<Binding> m_bindings;
    QList<std::pair<QWidget*, QString>> m_unitTips;
    QTimer* m_timer = nullptr;
    StatusCycle* m_cycle = nullptr;
    QSpinBox* m_interval = nullptr;
    bool m_refreshing = false;
};

// frmstatus: the temperature status of the selected channels on one tab,
// the channel selection on another. Owns nothing but widgets; the engine
// must outlive it (the shell's factory makes the view own the engine by
// parenting it to the view).
class frmstatus_view : public StatusViewBase {
    Q_OBJECT
public:
    explicit frmstatus_view(frmstatus_engine& engine, QWidget* parent = nullptr);

protected:
    bool stale() const override;
    QString ageText() const override;
    void afterRefresh() override;

private:
    frmstatus_engine& m_e;
    QList<QList<QWidget*>> m_rows;
    QList<std::pair<QWidget*, QWidget*>> m_sucLabels; // label, box
};
