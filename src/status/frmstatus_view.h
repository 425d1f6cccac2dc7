#pragma once

#include "status/status_base_view.h"

class frmstatus_engine;

// frmstatus: the temperature status of the selected channels on one tab,
// the channel selection on another. Owns nothing but widgets; the engine
// must outlive it (the shell's factory makes the view own the engine by
// parenting it to the view).
class frmstatus_view : public StatusViewBase {
    Q_OBJECT
public:
    explicit frmstatus_view(frmstatus_engine& engine, QWidget* parent = nullptr);

protected:
    void afterRefresh() override;

private:
    frmstatus_engine& m_e;
    QList<QList<QWidget*>> m_rows;
    QList<std::pair<QWidget*, QWidget*>> m_sucLabels; // label, box
};
