#pragma once

#include "status/status_base_view.h"

class frmstatusp_engine;

// frmstatusp: bank pressures, compressors and condensers, and the panel of
// one Torvanel in place of the compressors. The engine must outlive it.
class frmstatusp_view : public StatusViewBase {
    Q_OBJECT
public:
    explicit frmstatusp_view(frmstatusp_engine& engine, QWidget* parent = nullptr);

protected:
    void afterRefresh() override;

private:
    frmstatusp_engine& m_e;
    QList<QList<QWidget*>> m_compressorRows;
    QList<QList<QWidget*>> m_condenserRows;
    QWidget* m_plant = nullptr;
};
