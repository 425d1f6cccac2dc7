#include "directory/directory_view.h"

#include "directory/directory_engine.h"
#include "platform/widget_control_state.h"

#include <QComboBox>
#include <QFormLayout>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QLabel>
#include <QLineEdit>
#include <QPushButton>
#include <QRadioButton>
#include <QVBoxLayout>

namespace {

QString boxLabel(int box)
{
    switch (box) {
    case ccForm1_directory::IdBox: return QStringLiteral("Glacinor ID");
    case ccForm1_directory::NameBox: return QStringLiteral("Name");
    case ccForm1_directory::AddressBox: return QStringLiteral("Address");
    case ccForm1_directory::TownBox: return QStringLiteral("Town/State");
    case ccForm1_directory::PhoneBox: return QStringLiteral("Phone");
    case ccForm1_directory::ModemPhoneBox: return QStringLiteral("Modem Phone");
    default: return {};
    }
}

QPushButton* button(const char* name, QWidget* parent)
{
    auto* b = new QPushButton(parent);
    b->setObjectName(QLatin1String(name));
    return b;
}

} // namespace

DirectoryView::DirectoryView(ccForm1_directory& engine, QWidget* parent)
    : QWidget(parent), m_engine(engine)
{
    setObjectName(QStringLiteral("directory"));

    auto* listBox = new QGroupBox(QStringLiteral("Glacinor"), this);
    m_DBCombo1 = new QComboBox(listBox);
    m_DBCombo1->setObjectName(QStringLiteral("DBCombo1"));
    m_DBCombo1->setSizeAdjustPolicy(QComboBox::AdjustToContents);
    m_Text5 = new QLineEdit(listBox);
    m_Text5->setObjectName(QStringLiteral("Text5"));
    m_Text5->setReadOnly(true);
    m_Text5->setMaximumWidth(m_Text5->fontMetrics().horizontalAdvance(QStringLiteral("000000")) + 16);
    m_Data1 = new QLabel(listBox);
    m_Data1->setObjectName(QStringLiteral("Data1"));
    auto* listRow = new QHBoxLayout;
    listRow->addWidget(m_DBCombo1, 1);
    listRow->addWidget(m_Text5);
    auto* listLayout = new QVBoxLayout(listBox);
    listLayout->addLayout(listRow);
    listLayout->addWidget(m_Data1);

    auto* sortBox = new QGroupBox(QStringLiteral("Sort && Display by"), this);
    auto* sortLayout = new QHBoxLayout(sortBox);
    for (int i = 0; i < 2; ++i) {
        m_Option1[i] = new QRadioButton(sortBox);
        m_Option1[i]->setObjectName(QStringLiteral("Option1_%1").arg(i));
        sortLayout->addWidget(m_Option1[i]);
        connect(m_Option1[i], &QRadioButton::clicked, this, [this, i] { m_engine.Option1_Click(i); });
    }

    auto* form = new QFormLayout;
    for (int box = 0; box < ccForm1_directory::BoxCount; ++box) {
        if (ccForm1_directory::fieldOfBox(box) < 0)
            continue;
        auto* edit = new QLineEdit(this);
        edit->setObjectName(QStringLiteral("Text1_%1").arg(box));
        m_Text1[box] = edit;
        form->addRow(boxLabel(box), edit);
        connect(edit, &QLineEdit::textEdited, this, [this, box](const QString& text) {
            m_engine.Text1_Change(box, text);
        });
    }
    m_Text1[ccForm1_directory::IdBox]->setMaxLength(DataFolder::MaxIdDigits);

    m_Command1 = button("Command1", this);
    m_Command4 = button("Command4", this);
    m_Command5 = button("Command5", this);
    m_Command2 = button("Command2", this);
    m_Command8 = button("Command8", this);
    auto* buttons = new QHBoxLayout;
    for (QPushButton* b : {m_Command1, m_Command4, m_Command5, m_Command2, m_Command8})
        buttons->addWidget(b);
    buttons->addStretch(1);

    auto* top = new QHBoxLayout;
    top->addWidget(listBox, 1);
    top->addWidget(sortBox);
    auto* layout = new QVBoxLayout(this);
    layout->addLayout(top);
    layout->addLayout(form);
    layout->addLayout(buttons);
    layout->addStretch(1);

    connect(m_DBCombo1, &QComboBox::activated, this, [this](int index) { m_engine.DBCombo1_Click(index); });
    connect(m_Command1, &QPushButton::clicked, this, [this] { m_engine.Command1_Click(); });
    connect(m_Command4, &QPushButton::clicked, this, [this] { m_engine.Command4_Click(); });
    connect(m_Command5, &QPushButton::clicked, this, [this] { m_engine.Command5_Click(); });
    connect(m_Command2, &QPushButton::clicked, this, [this] { m_engine.Command2_Click(); });
    connect(m_Command8, &QPushButton::clicked, this, [this] { m_engine.Command8_Click(); });
    connect(&m_engine, &ccForm1_directory::changed, this, &DirectoryView::refresh);
    connect(&m_engine, &ccForm1_directory::addingChanged, this, [this](bool adding) {
        if (adding)
            m_Text1[ccForm1_directory::IdBox]->setFocus();
    });
    refresh();
}

void DirectoryView::refresh()
{
    QStringList items;
    for (int i = 0; i < m_DBCombo1->count(); ++i)
        items.append(m_DBCombo1->itemText(i));
    if (items != m_engine.DBCombo1_List) {
        const QSignalBlocker block(m_DBCombo1);
        m_DBCombo1->clear();
        m_DBCombo1->addItems(m_engine.DBCombo1_List);
    }
    {
        const QSignalBlocker block(m_DBCombo1);
        applyControlState(m_engine.DBCombo1, m_DBCombo1);
    }
    applyControlState(m_engine.Data1, m_Data1);
    applyControlState(m_engine.Text5, m_Text5);
    for (int box = 0; box < ccForm1_directory::BoxCount; ++box) {
        if (!m_Text1[box])
            continue;
        applyControlState(m_engine.Text1[box], m_Text1[box]);
        m_Text1[box]->setReadOnly(m_engine.Text1_Locked[box]);
    }
    for (int i = 0; i < 2; ++i)
        applyControlState(m_engine.Option1[i], m_Option1[i]);
    applyControlState(m_engine.Command1, m_Command1);
    applyControlState(m_engine.Command2, m_Command2);
    applyControlState(m_engine.Command4, m_Command4);
    applyControlState(m_engine.Command5, m_Command5);
    applyControlState(m_engine.Command8, m_Command8);
}
