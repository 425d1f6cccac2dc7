#include "status/frmstatus_view.h"

#include "platform/widget_control_state.h"
#include "platform/widget_printer.h"
#include "status/frmstatus_engine.h"
#include "status/status_cycle.h"

#include <QGridLayout>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QLabel>
#include <QPushButton>
#include <QScrollArea>
#include <QSpinBox>
#include <QTabWidget>
#include <QVBoxLayout>

namespace {

QLabel* box(const QString& name, QWidget* parent, int pointSize = 0, bool bold = false)
{
    auto* l = new QLabel(parent);
    l->setObjectName(name);
    l->setAlignment(Qt::AlignCenter);
    l->setFrameShape(QFrame::StyledPanel);
    l->setMargin(2);
    if (pointSize || bold) {
        QFont f = l->font();
        if (pointSize)
            f.setPointSize(pointSize);
        f.setBold(bold);
        l->setFont(f);
    }
    return l;
}

QPushButton* button(const QString& name, QWidget* parent)
{
    auto* b = new QPushButton(parent);
    b->setObjectName(name);
    return b;
}

QString indexed(const char* name, int i)
{
    return QStringLiteral("%1_%2").arg(QLatin1String(name)).arg(i);
}

} // namespace

frmstatus_view::frmstatus_view(frmstatus_engine& e, QWidget* parent) : StatusViewBase(e.cycle, parent), m_e(e)
{
    setObjectName(QStringLiteral("frmstatus"));
    setWindowTitle(QStringLiteral("Current Status Temperature"));
    auto* outer = new QVBoxLayout(this);
    auto* tabs = new QTabWidget(this);
    tabs->setObjectName(QStringLiteral("SSTab1"));
    outer->addWidget(tabs);

    // --- tab 1: the status ---
    auto* page = new QWidget;
    auto* v = new QVBoxLayout(page);
    auto* top = new QHBoxLayout;
    StatusCycle& c = e.cycle;
    auto* idLabel = new QLabel(QStringLiteral("Glacinor ID"), page);
    auto* id = box(QStringLiteral("Text10_0"), page, 0, true);
    auto* timeLabel = new QLabel(QStringLiteral("Glacinor Date and Time"), page);
    auto* time = box(QStringLiteral("Text10_2"), page, 12, true);
    time->setMinimumWidth(time->fontMetrics().horizontalAdvance(QStringLiteral("00/00/0000 00:00:00")) + 16);
    auto* interval = new QSpinBox(page);
    interval->setObjectName(QStringLiteral("UpDown1"));
    interval->setSuffix(QStringLiteral(" s"));
    auto* intervalText = box(QStringLiteral("Text10_1"), page);
    intervalText->hide(); // the spinner shows the same number
    auto* now = button(QStringLiteral("nowstatus"), page);
    auto* start = button(QStringLiteral("startstatus"), page);
    auto* stop = button(QStringLiteral("stopstatus"), page);
    auto* print = button(QStringLiteral("printgraph"), page);
    top->addWidget(idLabel);
    top->addWidget(id);
    top->addSpacing(12);
    top->addWidget(timeLabel);
    top->addWidget(time);
    top->addSpacing(12);
    top->addWidget(new QLabel(QStringLiteral("Update every"), page));
    top->addWidget(interval);
    top->addWidget(intervalText);
    top->addStretch();
    v->addLayout(top);
    // The commands get a row of their own, so the view fits a 1366 pixel screen.
    auto* commands = new QHBoxLayout;
    commands->addWidget(now);
    commands->addWidget(start);
    commands->addWidget(stop);
    commands->addWidget(print);
    commands->addStretch();
    v->addLayout(commands);
    auto* ceased = box(QStringLiteral("Text1"), page, 14, true);
    v->addWidget(ceased);

    bind(c.Text10[0], id);
    bind(c.Text10[1], intervalText);
    bind(c.Text10[2], time);
    bindInterval(interval);
    bind(c.nowstatus, now);
    bind(c.startstatus, start);
    bind(c.stopstatus, stop);
    bind(c.Text1, ceased);
    bind(e.printgraph, print);

    // The rows, one grid so that columns line up.
    auto* rowsBox = new QWidget(page);
    auto* grid = new QGridLayout(rowsBox);
    grid->setHorizontalSpacing(6);
    grid->setVerticalSpacing(2);
    // The replies carry no units: the heads say them.
    const QStringList heads = {QStringLiteral("Channel"),    QStringLiteral("Temp °C"),    QStringLiteral("Bank"),
                               QStringLiteral("Assoc 1 °C"), QStringLiteral("Assoc 2 °C"), QStringLiteral("Assoc 3 °C"),
                               QStringLiteral("Outputs"),    QString(),                    QString(),
                               QString(),                    QStringLiteral("PID %"),      QStringLiteral("Alarm")};
    for (int col = 0; col < heads.size(); ++col) {
        auto* h = new QLabel(heads[col], rowsBox);
        h->setObjectName(indexed("head", col));
        QFont f = h->font();
        f.setBold(true);
        h->setFont(f);
        grid->addWidget(h, 0, col, Qt::AlignCenter);
    }
    for (int i = 0; i < frmstatus_engine::Rows; ++i) {
        auto* frame = box(indexed("chanframe", i), rowsBox, 0, true);
        frame->setAlignment(Qt::AlignLeft | Qt::AlignVCenter);
        auto* temp = button(indexed("Temp", i), rowsBox);
        temp->setFlat(true);
        QFont tf = temp->font();
        tf.setPointSize(tf.pointSize() + 3);
        tf.setBold(true);
        temp->setFont(tf);
        temp->setMinimumWidth(90);
        connect(temp, &QPushButton::clicked, this, [this, i] { m_e.Temp_Click(i); });
        QList<QWidget*> row = {frame,
                               temp,
                               box(indexed("bank", i), rowsBox),
                               box(indexed("assoc1", i), rowsBox),
                               box(indexed("assoc2", i), rowsBox),
                               box(indexed("assoc3", i), rowsBox),
                               box(indexed("liquid", i), rowsBox),
                               box(indexed("fans", i), rowsBox),
                               box(indexed("defrost", i), rowsBox),
                               box(indexed("suction", i), rowsBox),
                               box(indexed("pid", i), rowsBox),
                               box(indexed("alarm", i), rowsBox)};
        for (int col = 0; col < row.size(); ++col)
            grid->addWidget(row[col], i + 1, col);
        bind(e.chanframe[i], row[0]);
        bind(e.Temp[i], row[1], true);
        bind(e.bank[i], row[2]);
        bind(e.assoc1[i], row[3], true);
        bind(e.assoc2[i], row[4], true);
        bind(e.assoc3[i], row[5], true);
        bind(e.liquid[i], row[6], true);
        bind(e.fans[i], row[7], true);
        bind(e.defrost[i], row[8], true);
        bind(e.suction[i], row[9], true);
        bind(e.pid[i], row[10], true);
        bind(e.alarm[i], row[11], true);
        static_cast<QLabel*>(row[11])->setText(QStringLiteral("Alarm"));
        m_rows.append(row);
    }
    grid->setRowStretch(frmstatus_engine::Rows + 1, 1);
    auto* scroll = new QScrollArea(page);
    scroll->setWidgetResizable(true);
    scroll->setWidget(rowsBox);
    scroll->setFrameShape(QFrame::NoFrame);
    v->addWidget(scroll, 1);

    // Suction pressures and the pressure inputs of the banks.
    auto* plant = new QHBoxLayout;
    auto* sucBox = new QGroupBox(QStringLiteral("Suction Pressures KPA"), page);
    auto* sucGrid = new QGridLayout(sucBox);
    for (int i = 0; i < frmstatus_engine::Suctions; ++i) {
        auto* l = new QLabel(QStringLiteral("Suc %1").arg(i + 1), sucBox);
        l->setObjectName(indexed("sucLabel", i));
        l->setAlignment(Qt::AlignCenter);
        auto* s = box(indexed("suc", i), sucBox);
        s->setMinimumWidth(48);
        unitTip(s, QStringLiteral("Suction pressure %1, in KPA").arg(i + 1));
        sucGrid->addWidget(l, 0, i);
        sucGrid->addWidget(s, 1, i);
        bind(e.suc[i], s, true);
        m_sucLabels.append(std::pair<QWidget*, QWidget*>(l, s));
    }
    auto* pBox = new QGroupBox(QStringLiteral("Pressures"), page);
    auto* pGrid = new QGridLayout(pBox);
    for (int k = 0; k < frmstatus_engine::Pressures; ++k) {
        auto* l = new QLabel(pBox);
        l->setObjectName(indexed("TempPLabel", k));
        l->setAlignment(Qt::AlignCenter);
        auto* p = box(indexed("TempP", k), pBox, 0, true);
        p->setMinimumWidth(56);
        pGrid->addWidget(l, 0, k);
        pGrid->addWidget(p, 1, k);
        bind(e.TempPLabel[k], l);
        bind(e.TempP[k], p, true);
    }
    plant->addWidget(sucBox, 3);
    plant->addWidget(pBox, 2);
    v->addLayout(plant);
    tabs->addTab(page, QStringLiteral("Current Status"));

    // --- tab 2: channel selection ---
    auto* sel = new QWidget;
    auto* sv = new QVBoxLayout(sel);
    auto* selTop = new QHBoxLayout;
    auto* clear = button(QStringLiteral("Command2"), sel);
    auto* numbers = button(QStringLiteral("Cmdselchan"), sel);
    auto* descriptions = button(QStringLiteral("Cmdseldis"), sel);
    selTop->addWidget(clear);
    selTop->addStretch();
    selTop->addWidget(numbers);
    selTop->addWidget(descriptions);
    sv->addLayout(selTop);
    bind(e.Command2, clear);
    bind(e.Cmdselchan, numbers);
    bind(e.Cmdseldis, descriptions);
    auto* buttons = new QWidget(sel);
    auto* bg = new QGridLayout(buttons);
    bg->setSpacing(2);
    for (int n = 1; n <= frmstatus_engine::Buttons; ++n) {
        auto* b = button(indexed("Command1", n), buttons);
        b->setMinimumWidth(56);
        bg->addWidget(b, (n - 1) / 20, (n - 1) % 20);
        bind(e.Command1[n], b);
        connect(b, &QPushButton::clicked, this, [this, n] { m_e.Command1_Click(n); });
    }
    auto* bscroll = new QScrollArea(sel);
    bscroll->setWidgetResizable(true);
    bscroll->setWidget(buttons);
    sv->addWidget(bscroll, 1);
    tabs->addTab(sel, QStringLiteral("Select/De select Glacinor channel numbers"));

    connect(now, &QPushButton::clicked, &c, &StatusCycle::nowstatus_Click);
    connect(start, &QPushButton::clicked, &c, &StatusCycle::startstatus_Click);
    connect(stop, &QPushButton::clicked, &c, &StatusCycle::stopstatus_Click);
    // The report is shown first, so that it can be seen without paper; the
    // preview prints it or saves it as a PDF file.
    connect(print, &QPushButton::clicked, this, [this] {
        printPreview(this, m_e.printgraph.text, [this](Printer& p) { m_e.printgraph_Click(p); });
    });
    connect(clear, &QPushButton::clicked, &e, &frmstatus_engine::Command2_Click);
    connect(numbers, &QPushButton::clicked, &e, &frmstatus_engine::Cmdselchan_Click);
    connect(descriptions, &QPushButton::clicked, &e, &frmstatus_engine::Cmdseldis_Click);
    connect(&e, &frmstatus_engine::changed, this, &frmstatus_view::scheduleRefresh);
    refresh();
}

void frmstatus_view::afterRefresh()
{
    // A suction label goes with its box.
    for (const auto& [label, value] : std::as_const(m_sucLabels))
        label->setVisible(!value->isHidden());
    // A hidden frame hides its whole row.
    for (int i = 0; i < m_rows.size(); ++i) {
        if (!m_e.chanframe[i].visible) {
            for (QWidget* w : m_rows[i])
                w->setVisible(false);
        }
    }
    if (!m_e.setPointCardAvailable()) {
        for (int i = 0; i < frmstatus_engine::Rows; ++i)
            findChild<QWidget*>(QStringLiteral("Temp_%1").arg(i))
                ->setCursor(Qt::ArrowCursor);
    }
}
