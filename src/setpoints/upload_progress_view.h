#pragma once

#include <QWidget>

class QLabel;
class QProgressBar;
class upload_progress_engine;

// The `upload` progress form: draws what its engine holds.
class upload_progress_view : public QWidget {
    Q_OBJECT
public:
    explicit upload_progress_view(upload_progress_engine& engine, QWidget* parent = nullptr);

private:
    upload_progress_engine& m_engine;
    QLabel* m_label1;
    QLabel* m_label2;
    QProgressBar* m_bar;
};
