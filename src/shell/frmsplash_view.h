#pragma once

#include <QWidget>

class QLabel;

// The window shown while the connection form loads its directory and the
// selected instrument's data base.
class frmSplash_view : public QWidget {
    Q_OBJECT
public:
    explicit frmSplash_view(QWidget* parent = nullptr);
    QLabel* lblVersion = nullptr;
};
