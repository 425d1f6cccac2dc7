#include "status/frmstatusp_view.h"

#include "platform/widget_printer.h"
#include "status/frmstatusp_engine.h"

#include <QGridLayout>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QLabel>
#include <QPushButton>
#include <QScrollArea>
#include <QSpinBox>
#include <QTextEdit>
#include <QVBoxLayout>

namespace {

QLabel* box(const QString& name, QWidget* parent, bool bold = false)
{
    auto* l = new QLabel(parent);
    l->setObjectName(name);
    l->setAlignment(Qt::AlignCenter);
    l->setFrameShape(QFrame::StyledPanel);
    l->setMargin(2);
    if (bold) {
        QFont f = l->font();
        f.setBold(true);
        l->setFont(f);
    }
    return l;
}

QString indexed(const char* name, int i)
{
    return QStringLiteral("%1_%2").arg(QLatin1String(name)).arg(i);
}

QLabel* head(const QString& text, QWidget* parent)
{
    auto* h = new QLabel(text, parent);
    QFont f = h->font();
    f.setBold(true);
    h->setFont(f);
    h->setAlignment(Qt::AlignCenter);
    return h;
}

} // namespace

frmstatusp_view::frmstatusp_view(frmstatusp_engine& e, QWidget* parent) : StatusViewBase(e.cycle, parent), m_e(e)
{
    setObjectName(QStringLiteral("frmstatusp"));
    setWindowTitle(QStringLiteral("Current Status Pressure"));
    StatusCycle& c = e.cycle;
    auto* v = new QVBoxLayout(this);

    auto* top = new QHBoxLayout;
    auto* id = box(QStringLiteral("Text10_0"), this, true);
    auto* time = box(QStringLiteral("Text10_2"), this, true);
    QFont tf = time->font();
    tf.setPointSize(tf.pointSize() + 2);
    time->setFont(tf);
    auto* interval = new QSpinBox(this);
    interval->setObjectName(QStringLiteral("UpDown1"));
    interval->setSuffix(QStringLiteral(" s"));
    auto* now = new QPushButton(this);
    now->setObjectName(QStringLiteral("nowstatus"));
    auto* start = new QPushButton(this);
    start->setObjectName(QStringLiteral("startstatus"));
    auto* stop = new QPushButton(this);
    stop->setObjectName(QStringLiteral("stopstatus"));
    auto* panel = new QPushButton(this);
    panel->setObjectName(QStringLiteral("dbaseload"));
    auto* print = new QPushButton(this);
    print->setObjectName(QStringLiteral("printgraph"));
    top->addWidget(new QLabel(QStringLiteral("Glacinor ID"), this));
    top->addWidget(id);
    top->addSpacing(12);
    top->addWidget(new QLabel(QStringLiteral("Glacinor Date and Time"), this));
    top->addWidget(time);
    top->addSpacing(12);
    top->addWidget(new QLabel(QStringLiteral("Update every"), this));
    top->addWidget(interval);
    top->addStretch();
    v->addLayout(top);
    // The commands get a row of their own, so the view fits a 1366 pixel screen.
    auto* commands = new QHBoxLayout;
    for (QPushButton* b : {now, start, stop, panel, print})
        commands->addWidget(b);
    commands->addStretch();
    v->addLayout(commands);
    auto* ceased = box(QStringLiteral("Text1"), this, true);
    auto* ceased2 = box(QStringLiteral("Text2"), this, true);
    v->addWidget(ceased);
    v->addWidget(ceased2);
    bind(c.Text10[0], id);
    bind(c.Text10[2], time);
    bindInterval(interval);
    bind(c.nowstatus, now);
    bind(c.startstatus, start);
    bind(c.stopstatus, stop);
    bind(c.Text1, ceased);
    bind(c.Text2, ceased2);
    bind(e.dbaseload, panel);
    bind(e.printgraph, print);

    // Banks.
    auto* banks = new QGroupBox(QStringLiteral("Banks"), this);
    auto* bg = new QGridLayout(banks);
    // The replies carry no units: the heads say them.
    const QStringList rows = {QStringLiteral("Temperature °C"), QStringLiteral("Suction KPA"),
                              QStringLiteral("Discharge KPA"), QStringLiteral("Liquid KPA"), QStringLiteral("Liquid Pump")};
    const QStringList tips = {QStringLiteral("Temperature of bank %1, in °C"),
                              QStringLiteral("Suction pressure of bank %1, in KPA"),
                              QStringLiteral("Discharge pressure of bank %1, in KPA"),
                              QStringLiteral("Liquid pressure of bank %1, in KPA"), QString()};
    for (int r = 0; r < rows.size(); ++r) {
        QLabel* h = head(rows[r], banks);
        h->setObjectName(indexed("bankHead", r));
        bg->addWidget(h, r + 1, 0, Qt::AlignLeft);
    }
    for (int b = 0; b < frmstatusp_engine::Banks; ++b) {
        auto* l = new QLabel(banks);
        l->setObjectName(indexed("Label2", b));
        l->setAlignment(Qt::AlignCenter);
        bg->addWidget(l, 0, b + 1);
        bind(e.Label2[b], l);
        ControlState* states[] = {&e.Temp[b], &e.suction[b], &e.discharge[b], &e.liquid[b], &e.liquidpump[b]};
        const char* names[] = {"Temp", "suction", "discharge", "liquid", "liquidpump"};
        for (int r = 0; r < 5; ++r) {
            auto* w = box(indexed(names[r], b), banks, true);
            w->setMinimumWidth(70);
            if (!tips[r].isEmpty())
                unitTip(w, tips[r].arg(b + 1));
            bg->addWidget(w, r + 1, b + 1);
            bind(*states[r], w, true);
        }
    }
    auto* levelBox = new QGroupBox(QStringLiteral("Liquid Level %"), this);
    levelBox->setObjectName(QStringLiteral("levelBox"));
    auto* lv = new QVBoxLayout(levelBox);
    auto* level = box(QStringLiteral("liquidlevel_0"), levelBox, true);
    lv->addWidget(level);
    lv->addStretch();
    bind(e.liquidlevel[0], level, true);
    auto* upper = new QHBoxLayout;
    upper->addWidget(banks, 4);
    upper->addWidget(levelBox, 1);
    v->addLayout(upper);

    // Compressors and condensers, or the Torvanel panel in their place.
    m_plant = new QWidget(this);
    auto* plant = new QHBoxLayout(m_plant);
    plant->setContentsMargins(0, 0, 0, 0);
    auto* comp = new QWidget;
    auto* cg = new QGridLayout(comp);
    cg->setVerticalSpacing(1);
    const QStringList compHeads = {QStringLiteral("Compressor"), QStringLiteral("Bank"), QStringLiteral("Equal'z"),
                                   QStringLiteral("Stages"), QString(), QString(), QString(), QString(), QString(),
                                   QString(), QString(), QStringLiteral("Run Hours H")};
    for (int col = 0; col < compHeads.size(); ++col) {
        QLabel* h = head(compHeads[col], comp);
        h->setObjectName(indexed("compHead", col));
        cg->addWidget(h, 0, col);
    }
    for (int i = 0; i < frmstatusp_engine::Compressors; ++i) {
        QList<QWidget*> row = {box(indexed("chanframe", i), comp, true), box(indexed("bank", i), comp),
                               box(indexed("equal", i), comp)};
        bind(e.chanframe[i], row[0]);
        bind(e.bank[i], row[1]);
        bind(e.equal[i], row[2], true);
        for (int k = 1; k <= frmstatusp_engine::Stages; ++k) {
            auto* s = box(QStringLiteral("stage%1_%2").arg(k).arg(i), comp);
            row.append(s);
            bind(e.stage(k, i), s, true);
        }
        auto* hours = box(indexed("hours_run", i), comp);
        row.append(hours);
        bind(e.hours_run[i], hours, true);
        for (int col = 0; col < row.size(); ++col)
            cg->addWidget(row[col], i + 1, col);
        m_compressorRows.append(row);
    }
    cg->setRowStretch(frmstatusp_engine::Compressors + 1, 1);
    auto* compScroll = new QScrollArea;
    compScroll->setWidgetResizable(true);
    compScroll->setWidget(comp);
    auto* compBox = new QGroupBox(QStringLiteral("Compressors"));
    (new QVBoxLayout(compBox))->addWidget(compScroll);

    auto* cond = new QWidget;
    auto* kg = new QGridLayout(cond);
    kg->setVerticalSpacing(1);
    const QStringList condHeads = {QStringLiteral("Condenser"), QStringLiteral("Bank"), QStringLiteral("Stages"),
                                   QString(), QString(), QString(), QStringLiteral("Run Hours H")};
    for (int col = 0; col < condHeads.size(); ++col)
        kg->addWidget(head(condHeads[col], cond), 0, col);
    for (int c2 = 0; c2 < frmstatusp_engine::Condensers; ++c2) {
        QList<QWidget*> row = {box(indexed("chanframec", c2), cond, true), box(indexed("bankc", c2), cond)};
        bind(e.chanframec[c2], row[0]);
        bind(e.bankc[c2], row[1]);
        for (int k = 1; k <= frmstatusp_engine::CondenserStages; ++k) {
            auto* s = box(QStringLiteral("stage%1c_%2").arg(k).arg(c2), cond);
            row.append(s);
            bind(e.stagec(k, c2), s, true);
        }
        auto* hours = box(indexed("hours_runc", c2), cond);
        row.append(hours);
        bind(e.hours_runc[c2], hours, true);
        for (int col = 0; col < row.size(); ++col)
            kg->addWidget(row[col], c2 + 1, col);
        m_condenserRows.append(row);
    }
    kg->setRowStretch(frmstatusp_engine::Condensers + 1, 1);
    auto* condBox = new QGroupBox(QStringLiteral("Condensers"));
    (new QVBoxLayout(condBox))->addWidget(cond);
    plant->addWidget(compBox, 3);
    plant->addWidget(condBox, 2);
    v->addWidget(m_plant, 1);

    // The Torvanel panel.
    auto* torvanel = new QGroupBox(QStringLiteral("Torvanel"), this);
    torvanel->setObjectName(QStringLiteral("Picture1"));
    bind(e.Picture1, torvanel);
    auto* tv = new QVBoxLayout(torvanel);
    auto* sel = new QHBoxLayout;
    for (int i = 0; i < frmstatusp_engine::Compressors; ++i) {
        auto* b = new QPushButton(torvanel);
        b->setObjectName(indexed("CompSelect", i));
        b->setMaximumWidth(40);
        sel->addWidget(b);
        bind(e.CompSelect[i], b);
        connect(b, &QPushButton::clicked, this, [this, i] { m_e.CompSelect_Click(i); });
    }
    tv->addLayout(sel);
    auto* body = new QHBoxLayout;
    auto* pg = new QGridLayout;
    for (int i = 0; i < frmstatusp_engine::PanelBoxes; ++i) {
        auto* l = new QLabel(torvanel);
        l->setObjectName(indexed("Label10", i));
        auto* t = box(indexed("Text3", i), torvanel, true);
        t->setMinimumWidth(60);
        const int col = (i / 12) * 2;
        pg->addWidget(l, i % 12, col);
        pg->addWidget(t, i % 12, col + 1);
        bind(e.Label10[i], l);
        bind(e.Text3[i], t, true);
    }
    body->addLayout(pg, 3);
    auto* almSide = new QVBoxLayout;
    auto* label4 = new QLabel(torvanel);
    label4->setObjectName(QStringLiteral("Label4"));
    auto* alm = new QTextEdit(torvanel);
    alm->setObjectName(QStringLiteral("Alm"));
    alm->setReadOnly(true);
    QFont mono(QStringLiteral("monospace"));
    mono.setStyleHint(QFont::Monospace);
    alm->setFont(mono);
    almSide->addWidget(label4);
    almSide->addWidget(alm, 1);
    body->addLayout(almSide, 2);
    tv->addLayout(body, 1);
    bind(e.Label4, label4);
    bind(e.Alm, alm, true);
    v->addWidget(torvanel, 1);

    connect(now, &QPushButton::clicked, &c, &StatusCycle::nowstatus_Click);
    connect(start, &QPushButton::clicked, &c, &StatusCycle::startstatus_Click);
    connect(stop, &QPushButton::clicked, &c, &StatusCycle::stopstatus_Click);
    // Shown first; the preview prints the report or saves it as a PDF file.
    connect(print, &QPushButton::clicked, this, [this] {
        printPreview(this, m_e.printgraph.text, [this](Printer& p) { m_e.printgraph_Click(p); });
    });
    connect(panel, &QPushButton::clicked, &e, &frmstatusp_engine::dbaseload_Click);
    connect(&e, &frmstatusp_engine::changed, this, &frmstatusp_view::scheduleRefresh);
    refresh();
}

void frmstatusp_view::afterRefresh()
{
    // A hidden frame hides its whole row; the Torvanel panel covers the plant.
    for (int i = 0; i < m_compressorRows.size(); ++i) {
        if (!m_e.chanframe[i].visible)
            for (QWidget* w : m_compressorRows[i])
                w->setVisible(false);
    }
    for (int c = 0; c < m_condenserRows.size(); ++c) {
        if (!m_e.chanframec[c].visible)
            for (QWidget* w : m_condenserRows[c])
                w->setVisible(false);
    }
    m_plant->setVisible(!m_e.Picture1.visible);
}
