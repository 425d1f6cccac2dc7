#pragma once

#include <QDialog>

class QLabel;
class QPlainTextEdit;

// The about box: the version, and on request the versions of what the
// program runs on, for a service call.
class frmAbout_view : public QDialog {
    Q_OBJECT
public:
    explicit frmAbout_view(QWidget* parent = nullptr);
    QLabel* lblVersion = nullptr;
    QPlainTextEdit* sysInfo = nullptr;

    // The text of the "System Information" button.
    static QString systemInformation();

private:
    void cmdSysInfo_Click();
};
