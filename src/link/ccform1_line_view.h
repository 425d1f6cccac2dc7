#pragma once

#include <QWidget>

class ccForm1_engine;
class QComboBox;
class QLabel;

// The connection part of ccForm1: port settings, connection type, the direct
// and modem frames, the link's state and the instrument's identity. It only
// shows the engine's controls and passes clicks on; the main window places it
// beside the instrument directory.
class ccForm1_line_view : public QWidget {
    Q_OBJECT
public:
    explicit ccForm1_line_view(ccForm1_engine& engine, QWidget* parent = nullptr);

    // Shows every control as the engine has it.
    void refresh();

private:
    void build();
    void fillCombo(QComboBox* box, const QStringList& items);
    void fillPorts();

    ccForm1_engine& m_engine;
    QList<QPair<const void*, QWidget*>> m_bound;
    QComboBox* m_cboPort = nullptr;
    QComboBox* m_cboSpeed = nullptr;
    QComboBox* m_cboParity = nullptr;
    QComboBox* m_cboDataBits = nullptr;
    QComboBox* m_cboStopBits = nullptr;
    QLabel* m_portDescription = nullptr;
};
