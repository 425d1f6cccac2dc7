#include "link/ccform1_line_view.h"

#include "link/ccform1_engine.h"

#include <QButtonGroup>
#include <QComboBox>
#include <QFormLayout>
#include <QGridLayout>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QLabel>
#include <QLineEdit>
#include <QProgressBar>
#include <QPushButton>
#include <QRadioButton>
#include <QVBoxLayout>

namespace {

QString arrayName(const char* name, int index)
{
    return QStringLiteral("%1_%2").arg(QLatin1String(name)).arg(index);
}

QLineEdit* readOnlyBox(const QString& name)
{
    auto* box = new QLineEdit;
    box->setObjectName(name);
    box->setReadOnly(true);
    box->setFocusPolicy(Qt::NoFocus);
    return box;
}

} // namespace

ccForm1_line_view::ccForm1_line_view(ccForm1_engine& engine, QWidget* parent)
    : QWidget(parent), m_engine(engine)
{
    setObjectName(QStringLiteral("ccForm1_line"));
    auto* left = new QVBoxLayout;
    left->addWidget(buildSettings());
    left->addStretch();
    auto* right = new QVBoxLayout;
    buildConnection(right);
    right->addWidget(buildState());
    right->addStretch();
    auto* columns = new QHBoxLayout;
    columns->addLayout(left, 1);
    columns->addLayout(right, 1);
    auto* top = new QVBoxLayout(this);
    top->addLayout(columns, 1);
    top->addLayout(buildStatusRow());

    m_binder.setAfterRefresh([this] {
        // A list filled anew has lost its selection: show the states again.
        if (fillLists()) {
            m_binder.refresh();
            return;
        }
        // An editable box shows the port's name, also one typed and not listed.
        if (m_cboPort->currentText() != m_engine.cboPort.text && !m_cboPort->lineEdit()->hasFocus())
            m_cboPort->setEditText(m_engine.cboPort.text);
    });
    connect(&m_engine, &ccForm1_engine::changed, &m_binder, &WidgetBinder::scheduleRefresh);
    fillLists();
    refresh();
}

void ccForm1_line_view::refresh() { m_binder.refresh(); }

QPushButton* ccForm1_line_view::button(ControlState& state, const char* name, void (ccForm1_engine::*click)())
{
    auto* b = new QPushButton(state.text);
    b->setObjectName(QLatin1String(name));
    connect(b, &QPushButton::clicked, &m_engine, click);
    m_binder.bind(state, b);
    return b;
}

QGroupBox* ccForm1_line_view::group(ControlState& state, const char* name)
{
    auto* g = new QGroupBox(state.text);
    g->setObjectName(QLatin1String(name));
    m_binder.bind(state, g);
    return g;
}

QWidget* ccForm1_line_view::buildSettings()
{
    ccForm1_engine& e = m_engine;
    const auto bind = [this](const ControlState& state, QWidget* w) { m_binder.bind(state, w); };
    QGroupBox* fraConnection = group(e.fraConnection, "fraConnection");
    auto* settingsForm = new QFormLayout(fraConnection);
    m_cboPort = new QComboBox;
    m_cboPort->setObjectName(QStringLiteral("cboPort"));
    m_cboPort->setEditable(true);
    m_cboPort->setInsertPolicy(QComboBox::NoInsert);
    m_cboPort->setToolTip(tr("A serial device, or host:port for a serial server on the network"));
    bind(e.cboPort, m_cboPort);
    connect(m_cboPort, &QComboBox::activated, &e, &ccForm1_engine::cboPort_Click);
    connect(m_cboPort->lineEdit(), &QLineEdit::textEdited, &e, &ccForm1_engine::cboPort_Change);
    m_portDescription = new QLabel;
    m_portDescription->setObjectName(QStringLiteral("portDescription"));
    m_portDescription->setWordWrap(true);
    auto combo = [&](QComboBox*& box, ControlState& state, const char* name,
                     void (ccForm1_engine::*click)(int)) {
        box = new QComboBox;
        box->setObjectName(QLatin1String(name));
        bind(state, box);
        connect(box, &QComboBox::activated, &e, click);
    };
    combo(m_cboSpeed, e.cboSpeed, "cboSpeed", &ccForm1_engine::cboSpeed_Click);
    combo(m_cboParity, e.cboParity, "cboParity", &ccForm1_engine::cboParity_Click);
    combo(m_cboDataBits, e.cboDataBits, "cboDataBits", &ccForm1_engine::cboDataBits_Click);
    combo(m_cboStopBits, e.cboStopBits, "cboStopBits", &ccForm1_engine::cboStopBits_Click);
    settingsForm->addRow(tr("Port"), m_cboPort);
    settingsForm->addRow(QString(), m_portDescription);
    settingsForm->addRow(tr("Baud Rate"), m_cboSpeed);
    settingsForm->addRow(tr("Parity"), m_cboParity);
    settingsForm->addRow(tr("Data Bits"), m_cboDataBits);
    settingsForm->addRow(tr("Stop Bits"), m_cboStopBits);
    auto* flowBox = new QGroupBox(tr("Flow Control"));
    auto* flowLayout = new QHBoxLayout(flowBox);
    for (int i = 0; i < 4; ++i) {
        auto* r = new QRadioButton(e.optFlow[i].text);
        r->setObjectName(arrayName("optFlow", i));
        bind(e.optFlow[i], r);
        connect(r, &QRadioButton::clicked, &e, [&e, i] { e.optFlow_Click(i); });
        flowLayout->addWidget(r);
    }
    settingsForm->addRow(flowBox);
    settingsForm->addRow(button(e.cmdOK, "cmdOK", &ccForm1_engine::cmdOK_Click));
    return fraConnection;
}

void ccForm1_line_view::buildConnection(QVBoxLayout* column)
{
    ccForm1_engine& e = m_engine;
    const auto bind = [this](const ControlState& state, QWidget* w) { m_binder.bind(state, w); };
    // Connection type. The options are not exclusive by themselves: the
    // engine decides, and may refuse the change.
    QGroupBox* frame4 = group(e.Frame4, "Frame4");
    auto* typeLayout = new QHBoxLayout(frame4);
    for (int i = 0; i < 2; ++i) {
        auto* r = new QRadioButton(e.Option2[i].text);
        r->setObjectName(arrayName("Option2", i));
        r->setAutoExclusive(false);
        bind(e.Option2[i], r);
        // A refused change springs back at once.
        connect(r, &QRadioButton::clicked, this, [this, i] {
            m_engine.Option2_Click(i);
            refresh();
        });
        typeLayout->addWidget(r);
    }

    // Direct line.
    QGroupBox* frame9 = group(e.Frame9, "Frame9");
    auto* directLayout = new QHBoxLayout(frame9);
    directLayout->addWidget(button(e.Command3, "Command3", &ccForm1_engine::Command3_Click));
    directLayout->addWidget(button(e.Command6, "Command6", &ccForm1_engine::Command6_Click));

    // Modem call.
    QGroupBox* frame8 = group(e.Frame8, "Frame8");
    auto* modemLayout = new QGridLayout(frame8);
    modemLayout->addWidget(button(e.dial_num, "dial_num", &ccForm1_engine::dial_num_Click), 0, 0);
    modemLayout->addWidget(button(e.cancel_dial, "cancel_dial", &ccForm1_engine::cancel_dial_Click), 0, 1);
    modemLayout->addWidget(button(e.cancel_redial, "cancel_redial", &ccForm1_engine::cancel_redial_Click), 0, 2);
    auto* bar = new QProgressBar;
    bar->setObjectName(QStringLiteral("ProgressBar1"));
    bar->setRange(ccForm1_engine::ProgressBar1_Min, ccForm1_engine::ProgressBar1_Max);
    bar->setTextVisible(false);
    bind(e.ProgressBar1, bar);
    modemLayout->addWidget(bar, 1, 0, 1, 3);

    auto* frameDial = new QWidget;
    frameDial->setObjectName(QStringLiteral("FrameDial"));
    bind(e.FrameDial, frameDial);
    auto* dialLayout = new QHBoxLayout(frameDial);
    dialLayout->setContentsMargins(0, 0, 0, 0);
    QGroupBox* frame5 = group(e.Frame5, "Frame5");
    auto* toneLayout = new QVBoxLayout(frame5);
    auto* toneGroup = new QButtonGroup(this);
    for (int i = 0; i < 2; ++i) {
        auto* r = new QRadioButton(e.DialTone[i].text);
        r->setObjectName(arrayName("DialTone", i));
        toneGroup->addButton(r, i);
        bind(e.DialTone[i], r);
        connect(r, &QRadioButton::clicked, &e, [&e, i] { e.DialTone_Click(i); });
        toneLayout->addWidget(r);
    }
    QGroupBox* frame3 = group(e.Frame3, "Frame3");
    auto* testLayout = new QGridLayout(frame3);
    auto* modemBox = new QLineEdit;
    modemBox->setObjectName(QStringLiteral("modem"));
    modemBox->setToolTip(tr("Text for the modem; Send passes it behind AT"));
    bind(e.modem, modemBox);
    connect(modemBox, &QLineEdit::textEdited, &e, &ccForm1_engine::modem_Change);
    testLayout->addWidget(modemBox, 0, 0, 1, 3);
    testLayout->addWidget(button(e.ModemGet, "ModemGet", &ccForm1_engine::ModemGet_Click), 1, 0);
    testLayout->addWidget(button(e.ModemSave, "ModemSave", &ccForm1_engine::ModemSave_Click), 1, 1);
    testLayout->addWidget(button(e.ModemTest, "ModemTest", &ccForm1_engine::ModemTest_Click), 1, 2);
    dialLayout->addWidget(frame5);
    dialLayout->addWidget(frame3, 1);

    column->addWidget(frame4);
    column->addWidget(frame9);
    column->addWidget(frame8);
    column->addWidget(frameDial);
}

QWidget* ccForm1_line_view::buildState()
{
    ccForm1_engine& e = m_engine;
    const auto bind = [this](const ControlState& state, QWidget* w) { m_binder.bind(state, w); };
    // State of the link and the instrument's identity.
    auto* stateBox = new QGroupBox(tr("Link"));
    auto* stateForm = new QFormLayout(stateBox);
    auto addBox = [&](ControlState& state, const QString& name, const QString& caption) {
        QLineEdit* box = readOnlyBox(name);
        bind(state, box);
        stateForm->addRow(caption, box);
    };
    addBox(e.Text3[2], arrayName("Text3", 2), tr("Direct"));
    addBox(e.Text3[3], arrayName("Text3", 3), tr("Modem"));
    addBox(e.Text3[4], arrayName("Text3", 4), QString());
    addBox(e.Text3[1], arrayName("Text3", 1), QString());
    auto* labels = new QHBoxLayout;
    for (int i : {2, 13}) {
        auto* l = new QLabel;
        l->setObjectName(arrayName("Label1", i));
        QFont f = l->font();
        f.setBold(true);
        l->setFont(f);
        bind(e.Label1[i], l);
        labels->addWidget(l);
    }
    labels->addStretch();
    stateForm->addRow(labels);
    addBox(e.version, QStringLiteral("version"), tr("Version"));
    addBox(e.resets, QStringLiteral("resets"), tr("Resets"));
    addBox(e.time, QStringLiteral("time"), tr("Time"));
    return stateBox;
}

QLayout* ccForm1_line_view::buildStatusRow()
{
    auto* statusRow = new QHBoxLayout;
    for (int i = 1; i <= 3; ++i) {
        auto* l = new QLabel;
        l->setObjectName(arrayName("sbrStatus", i));
        l->setFrameStyle(QFrame::Panel | QFrame::Sunken);
        m_binder.bind(m_engine.sbrStatus[i], l);
        statusRow->addWidget(l, i == 3 ? 0 : 1);
    }
    return statusRow;
}

bool ccForm1_line_view::fillCombo(QComboBox* box, const QStringList& items)
{
    QStringList have;
    for (int i = 0; i < box->count(); ++i)
        have << box->itemText(i);
    if (have == items)
        return false;
    box->clear();
    box->addItems(items);
    return true;
}

bool ccForm1_line_view::fillLists()
{
    bool filled = fillPorts();
    filled = fillCombo(m_cboSpeed, m_engine.cboSpeedItems) || filled;
    filled = fillCombo(m_cboParity, m_engine.cboParityItems) || filled;
    filled = fillCombo(m_cboDataBits, m_engine.cboDataBitsItems) || filled;
    filled = fillCombo(m_cboStopBits, m_engine.cboStopBitsItems) || filled;
    return filled;
}

bool ccForm1_line_view::fillPorts()
{
    const auto& ports = m_engine.cboPortItems;
    bool same = m_cboPort->count() == ports.size();
    for (int i = 0; same && i < ports.size(); ++i)
        same = m_cboPort->itemText(i) == ports[i].name;
    if (!same) {
        const QString typed = m_cboPort->currentText();
        m_cboPort->clear();
        for (const auto& p : ports) {
            m_cboPort->addItem(p.name);
            m_cboPort->setItemData(m_cboPort->count() - 1, p.description, Qt::ToolTipRole);
        }
        m_cboPort->setEditText(typed);
    }
    QString about;
    for (const auto& p : ports)
        if (p.name == m_engine.cboPort.text)
            about = p.description;
    m_portDescription->setText(about);
    m_portDescription->setVisible(!about.isEmpty());
    return !same;
}
