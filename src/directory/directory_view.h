#pragma once

#include <QWidget>

class ccForm1_directory;
class QButtonGroup;
class QComboBox;
class QLabel;
class QLineEdit;
class QPushButton;
class QRadioButton;

// The directory part of ccForm1: the instrument list, the boxes of the
// current row and the Add/Update/Cancel/Delete/Compact buttons. It shows the
// engine's controls and passes every click and keystroke to it; the main
// window places it beside the line part.
class DirectoryView : public QWidget {
    Q_OBJECT
public:
    explicit DirectoryView(ccForm1_directory& engine, QWidget* parent = nullptr);

    // Shows the engine's controls again.
    void refresh();

private:
    ccForm1_directory& m_engine;
    QComboBox* m_DBCombo1;
    QLabel* m_Data1;
    QLineEdit* m_Text5;
    QLineEdit* m_Text1[8] = {};
    QRadioButton* m_Option1[2];
    QPushButton* m_Command1;
    QPushButton* m_Command2;
    QPushButton* m_Command4;
    QPushButton* m_Command5;
    QPushButton* m_Command8;
};
