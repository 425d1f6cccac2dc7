#pragma once

#include <QWidget>

class frmsmarthlp_engine;
class QLabel;

// The hover help window: a small tool window with the help text and Cancel.
class frmsmarthlp_view : public QWidget {
    Q_OBJECT
public:
    explicit frmsmarthlp_view(frmsmarthlp_engine& engine, QWidget* parent = nullptr);

private:
    frmsmarthlp_engine& m_engine;
    QLabel* m_text;
};
