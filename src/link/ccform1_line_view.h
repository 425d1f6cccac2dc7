#pragma once

#include "platform/widget_binder.h"

#include <QWidget>

class ccForm1_engine;
struct ControlState;
class QComboBox;
class QGroupBox;
class QLabel;
class QLayout;
class QPushButton;
class QVBoxLayout;

// The connection part of ccForm1: port settings, connection type, the direct
// and modem frames, the link's state and the instrument's identity. It only
// shows the engine's controls and passes clicks on; the main window places it
// beside the instrument directory.
class ccForm1_line_view : public QWidget {
    Q_OBJECT
public:
    explicit ccForm1_line_view(ccForm1_engine& engine, QWidget* parent = nullptr);

    // Shows every control as the engine has it now, not at the next redraw.
    void refresh();

private:
    QWidget* buildSettings();
    void buildConnection(QVBoxLayout* column);
    QWidget* buildState();
    QLayout* buildStatusRow();
    QPushButton* button(ControlState& state, const char* name, void (ccForm1_engine::*click)());
    QGroupBox* group(ControlState& state, const char* name);
    // True when a list was filled anew.
    bool fillLists();
    bool fillCombo(QComboBox* box, const QStringList& items);
    bool fillPorts();

    ccForm1_engine& m_engine;
    WidgetBinder m_binder;
    QComboBox* m_cboPort = nullptr;
    QComboBox* m_cboSpeed = nullptr;
    QComboBox* m_cboParity = nullptr;
    QComboBox* m_cboDataBits = nullptr;
    QComboBox* m_cboStopBits = nullptr;
    QLabel* m_portDescription = nullptr;
};
