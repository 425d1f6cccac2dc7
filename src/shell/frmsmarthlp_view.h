#pragma once

#include <QWidget>

class frmsmarthlp_engine;
class QLabel;

// The hover help window: a small tool window with the help text and Cancel.
class frmsmarthlp : public QWidget {
    Q_OBJECT
public:
    explicit frmsmarthlp(frmsmarthlp_engine& engine, QWidget* parent = nullptr);

private:
    frmsmarthlp_engine& m_engine;
    QLabel* m_text;
};
