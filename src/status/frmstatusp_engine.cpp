#include "status/frmstatusp_engine.h"

#include "link/commands.h"
#include "link/link.h"
#include "link/link_globals.h"
#include "platform/operator.h"
#include "setpoints/catalogue.h"
#include "setpoints/instrument_store.h"
#include "setpoints/view_store.h"

namespace {

using catalogue::kBanksInUseField;
using catalogue::kCompressorBankField; // row 0, one for each bank
using catalogue::kCompressorKindField;
using catalogue::kCondenserBankField; // row 0, one for each bank
using catalogue::kCondenserKindField;
using catalogue::kEqualizerField;

const QString kUnknown = QStringLiteral("????");

int number(const QVariant& v)
{
    return int(replyfield::val(v.toString()));
}

} // namespace

frmstatusp_engine::frmstatusp_engine(Link& link, Clock& clock, Operator& op, OpenViews& views, QObject* parent)
    : QObject(parent), cycle(StatusViewKind::statusp, link, clock, op, views), Timer2(cycle.noReply),
      Timer3(clock, 500), m_link(link), m_op(op), m_views(views)
{
    m_views.statusp = this;
    connect(&cycle, &StatusCycle::changed, this, &frmstatusp_engine::changed);
    connect(&Timer3, &Timer::timeout, this, &frmstatusp_engine::Timer3_Timer);
    cycle.afterFlash = [this] { afterFlash(); };
    Timer3.setEnabled(true);

    for (int b = 0; b < Banks; ++b) {
        Label2[b].text = QStringLiteral("Bank %1").arg(b + 1);
        for (ControlState* c : {&suction[b], &discharge[b], &liquid[b], &liquidpump[b], &Temp[b]})
            c->text = kUnknown;
    }
    liquidlevel[0].text = kUnknown;
    for (int i = 0; i < Compressors; ++i) {
        chanframe[i].text = QStringLiteral("Compressor %1").arg(i + 1);
        equal[i].text = QStringLiteral("Equalizer");
        hours_run[i].text = kUnknown;
        for (int k = 1; k <= Stages; ++k)
            stage(k, i).text = QStringLiteral("Stage %1").arg(k);
        stage8[i].visible = false;
        CompSelect[i].text = QString::number(i + 1);
    }
    CompSelect[0].backColor = StepOn;
    for (int c = 0; c < Condensers; ++c) {
        chanframec[c].text = QStringLiteral("Condenser %1").arg(c + 1);
        hours_runc[c].text = kUnknown;
        for (int k = 1; k <= CondenserStages; ++k)
            stagec(k, c).text = QStringLiteral("Stage %1").arg(k);
    }
    for (ControlState& t : Text3)
        t.text = kUnknown;
    labelPanel(0);
    Alm.text = NoAlarms;
    Alm.backColor = AlarmPale;
    Alm.toolTip = QStringLiteral("Displays the alarms valid in the selected Torvanel.");
    Label4.text = QStringLiteral("Torvanel No. 1 Alarms");
    Picture1.visible = false;
    dbaseload.text = QStringLiteral("Torvanel Status");
    dbaseload.toolTip = QStringLiteral("Displays individual compressor status from Torvanels");
    printgraph.text = QStringLiteral("Print Current Status");
    printgraph.toolTip = QStringLiteral("Print the current status");
}

frmstatusp_engine::~frmstatusp_engine()
{
    if (m_views.statusp == this)
        m_views.statusp = nullptr;
}

ControlState& frmstatusp_engine::stage(int k, int i)
{
    ControlState* const all[Stages] = {stage1, stage2, stage3, stage4, stage5, stage6, stage7, stage8};
    return all[qBound(1, k, Stages) - 1][i];
}

ControlState& frmstatusp_engine::stagec(int k, int c)
{
    ControlState* const all[CondenserStages] = {stage1c, stage2c, stage3c, stage4c};
    return all[qBound(1, k, CondenserStages) - 1][c];
}

QVariant frmstatusp_engine::setpoint(int row, int field)
{
    return m_store ? m_store->setpoint(row, field) : QVariant();
}

bool frmstatusp_engine::Form_Load(const QString& instrumentId, const QString& storePath)
{
    const auto p = cycle.notify.procedure();
    m_views.statusp_open = true;
    cycle.Text10[0].text = instrumentId;
    m_store = openViewStore(storePath, m_op, m_link);
    if (!m_store) {
        return false;
    }
    cycle.loadInterval(m_store.get());
    chanBanks();
    stages();
    cycle.firstRequest();
    return true;
}

void frmstatusp_engine::chanBanks()
{
    const auto assign = [this](int firstField, int count, ControlState* frames, ControlState* banks) {
        int size[Banks];
        int total = 0;
        for (int b = 0; b < Banks; ++b) {
            size[b] = number(setpoint(0, firstField + b));
            total += size[b];
        }
        for (int n = 1; n <= count; ++n) {
            int upTo = 0;
            for (int b = 0; b < Banks; ++b) {
                upTo += size[b];
                if (n <= upTo) {
                    banks[n - 1].text = QStringLiteral("Bank %1").arg(b + 1);
                    break;
                }
            }
            frames[n - 1].visible = n <= total;
        }
    };
    assign(kCompressorBankField, Compressors, chanframe, bank);
    assign(kCondenserBankField, Condensers, chanframec, bankc);
    const int g = qMin(number(setpoint(0, kBanksInUseField)), Banks);
    for (int b = 0; b < Banks; ++b) {
        for (ControlState* c : {&Label2[b], &Temp[b], &suction[b], &discharge[b], &liquid[b], &liquidpump[b]})
            c->visible = b < g;
    }
}

void frmstatusp_engine::stages()
{
    for (int i = 0; i < Compressors; ++i) {
        equal[i].visible = number(setpoint(i, kEqualizerField)) != 0;
        stage1[i].text = QStringLiteral("Stage 1");
        stage2[i].text = QStringLiteral("Stage 2");
        const int kind = number(setpoint(i, kCompressorKindField));
        const auto show = [&](std::initializer_list<int> shown, std::initializer_list<int> hidden) {
            for (int k : shown)
                stage(k, i).visible = true;
            for (int k : hidden)
                stage(k, i).visible = false;
        };
        if (kind >= 0 && kind <= 6) {
            for (int k = 1; k <= 7; ++k)
                stage(k, i).visible = k <= kind + 1;
        } else if (kind == 7) {
            show({1, 2, 3, 4, 5, 6, 7, 8}, {});
        } else if (kind == 8) {
            stage1[i].text = QStringLiteral("ScrewSA");
            stage3[i].text = QStringLiteral("Loaded");
            stage4[i].text = QStringLiteral("Not fully");
            show({1, 3, 4}, {2, 5, 6, 7});
        } else if (kind == 9 || kind == 10) {
            stage1[i].text = kind == 9 ? QStringLiteral("Variable") : QStringLiteral("ScrewTV");
            stage3[i].text = QStringLiteral("Step 0");
            stage4[i].text = QStringLiteral("Loaded");
            stage5[i].text = QStringLiteral("0 %");
            show({1, 3, 4, 5}, {2, 6, 7, 8});
        }
    }
    for (int c = 0; c < Condensers; ++c) {
        const int kind = number(setpoint(c, kCondenserKindField));
        if (kind >= 0 && kind <= 3) {
            for (int k = 1; k <= CondenserStages; ++k)
                stagec(k, c).visible = k <= kind + 1;
        } else if (kind == 4) {
            const QString texts[] = {VariableCondenser, QStringLiteral("Step 0"), QStringLiteral("Loaded"),
                                     QStringLiteral("0 %")};
            for (int k = 1; k <= CondenserStages; ++k) {
                stagec(k, c).text = texts[k - 1];
                stagec(k, c).visible = true;
            }
        }
    }
}

void frmstatusp_engine::statusp_do()
{
    statusp_do(m_link.test3Text());
}

void frmstatusp_engine::statusp_do(const QString& reply)
{
    const auto p = cycle.notify.procedure();
    cycle.replyStarted(reply);
    const double version = m_link.globals().versionNumber();
    const PresssReply r = decodePresss(reply, version);
    CsData = r.csData;
    if (r.hasTorvanel)
        torvanel = r.torvanel;

    for (int b = 0; b < Banks; ++b) {
        suction[b].text = presssPressureText(r.banks[b].suction);
        discharge[b].text = presssPressureText(r.banks[b].discharge);
        liquid[b].text = presssPressureText(r.banks[b].liquid);
    }
    liquidlevel[0].text = liquidLevelText(r.liquidLevel);
    for (int i = 0; i < Compressors; ++i)
        equal[i].backColor = r.equalizer[i] ? LoadedOn : Off;

    // Records come in the instrument's order; the display is by number.
    for (const CompressorRecord& rec : r.records) {
        if (rec.number < 1 || rec.number > Compressors)
            continue;
        const int idx = rec.number - 1;
        const int step = r.compressorStep[idx];
        if (!rec.running) {
            for (int k = 1; k <= Stages; ++k)
                stage(k, idx).backColor = Off;
            if (rec.kind == 3) {
                stage3[idx].text = QStringLiteral("Step 0");
                stage4[idx].text = QStringLiteral("Loaded");
                stage5[idx].text = QStringLiteral("0 %");
                stage3[idx].visible = stage4[idx].visible = stage5[idx].visible = true;
            } else if (rec.kind == 2) {
                stage1[idx].text = QStringLiteral("Screw");
                stage3[idx].text = QStringLiteral("Loaded");
                stage4[idx].text = QStringLiteral("Not fully");
                for (int k : {1, 3, 4})
                    stage(k, idx).visible = true;
                for (int k : {2, 5, 6, 7})
                    stage(k, idx).visible = false;
            }
            continue;
        }
        if (rec.kind < 2) {
            if (rec.stages >= 0 && rec.stages <= 7) {
                const int lit = qMin(rec.stages + 1, 7);
                for (int k = 1; k <= 7; ++k)
                    stage(k, idx).backColor = k <= lit ? StageOn : Off;
            }
        } else if (rec.kind == 2) {
            stage1[idx].backColor = StageOn;
            stage3[idx].text = QStringLiteral("Loaded");
            stage4[idx].text = rec.full ? QStringLiteral("Fully") : QStringLiteral("Not fully");
            stage3[idx].visible = stage4[idx].visible = true;
            stage3[idx].backColor = stage4[idx].backColor = rec.full ? LoadedOn : Off;
        } else if (rec.kind == 3) {
            stage1[idx].backColor = StageOn;
            stage3[idx].backColor = StepOn;
            stage3[idx].text = QStringLiteral("Step %1").arg(step);
            stage4[idx].backColor = LoadedOn;
            stage4[idx].text = QStringLiteral("Loaded");
            stage5[idx].backColor = LoadedOn;
            stage5[idx].text = stepPercentText(step);
            stage3[idx].visible = stage4[idx].visible = stage5[idx].visible = true;
        }
    }

    for (int c = 0; c < Condensers; ++c) {
        const int step = r.condenserStep[c];
        if (stage1c[c].text != VariableCondenser) {
            for (int k = 1; k <= CondenserStages; ++k)
                stagec(k, c).backColor = r.condenser[c][k - 1] ? StageOn : Off;
            continue;
        }
        for (int k = 1; k <= CondenserStages; ++k)
            stagec(k, c).visible = true;
        // A field of 64 reads as step 65 and shows as step 0 with the mark lit.
        if (step == 1 || step == presss_layout::MaxStep + 1) {
            stage1c[c].text = VariableCondenser;
            stage2c[c].text = QStringLiteral("Step 0");
            stage3c[c].text = QStringLiteral("Loaded");
            stage4c[c].text = QStringLiteral("0 %");
            for (int k = 1; k <= CondenserStages; ++k)
                stagec(k, c).backColor = Off;
            if (step != 1)
                stage1c[c].backColor = StepOn;
        } else {
            stage1c[c].backColor = StepOn;
            stage2c[c].text = QStringLiteral("Step %1").arg(step);
            stage2c[c].backColor = LoadedOn;
            stage3c[c].text = QStringLiteral("Loaded");
            stage3c[c].backColor = LoadedOn;
            stage4c[c].text = stepPercentText(step);
            stage4c[c].backColor = LoadedOn;
        }
    }

    for (int p = 0; p < Banks; ++p)
        liquidpump[p].text = r.banks[p].liquidPump ? QStringLiteral("ON") : QStringLiteral("OFF");
    for (int i = 0; i < Compressors; ++i)
        hours_run[i].text = r.hoursRun[i] + QStringLiteral(" H");
    for (int c = 0; c < Condensers; ++c)
        hours_runc[c].text = r.hoursRunCondenser[c] + QStringLiteral(" H");
    // The panel follows each reply, so that it is never older than the rest.
    if (Picture1.visible)
        show_torvanel_data();
    show_alarm_words();
    cycle.replyFinished();
}
