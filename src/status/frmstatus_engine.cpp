#include "status/frmstatus_engine.h"

#include "link/link.h"
#include "link/link_globals.h"
#include "platform/operator.h"
#include "platform/store_layout.h"
#include "setpoints/catalogue.h"
#include "setpoints/instrument_store.h"
#include "setpoints/view_store.h"
#include "status/status_codec.h"

#include <algorithm>

namespace {

using catalogue::kBanks;
constexpr int kLastOutputChannel = 100;

const QString kUnknown = QStringLiteral("????");

int number(const QVariant& v)
{
    return int(replyfield::val(v.toString()));
}

} // namespace

frmstatus_engine::frmstatus_engine(Link& link, Clock& clock, Operator& op, OpenViews& views, QObject* parent)
    : QObject(parent), cycle(StatusViewKind::status, link, clock, op, views), Timer2(clock, 1000), m_link(link),
      m_op(op), m_views(views)
{
    m_views.status = this;
    connect(&cycle, &StatusCycle::changed, this, &frmstatus_engine::changed);
    connect(&Timer2, &Timer::timeout, this, &frmstatus_engine::Timer2_Timer);
    Timer2.setEnabled(true);

    for (int i = 0; i < Rows; ++i) {
        liquid[i].text = QStringLiteral("Liquid");
        fans[i].text = QStringLiteral("Fans");
        defrost[i].text = QStringLiteral("Defrost");
        suction[i].text = QStringLiteral("Suction");
        Temp[i].toolTip = QStringLiteral("Display Setpoints");
        Temp[i].text = kUnknown;
        for (ControlState* a : {&assoc1[i], &assoc2[i], &assoc3[i]})
            a->text = kUnknown;
        bank[i].text = QStringLiteral("None");
    }
    for (ControlState& s : suc)
        s.text = kUnknown;
    for (int k = 0; k < Pressures; ++k) {
        TempP[k].text = kUnknown;
        TempPLabel[k].text = QStringLiteral("Bank %1").arg(k + 1);
    }
    Command2.text = QStringLiteral("Clear all Selected");
    Cmdselchan.text = QStringLiteral("Glacinor Numbers");
    Cmdselchan.toolTip = QStringLiteral("Display Glacinor channel numbers");
    Cmdseldis.text = QStringLiteral("Channel Discriptions");
    Cmdseldis.toolTip = QStringLiteral("Display User channel discriptions");
    printgraph.text = QStringLiteral("Print Current Status");
    printgraph.toolTip = QStringLiteral("Print the current status");
    m_config.resize(Buttons + 1);
}

frmstatus_engine::~frmstatus_engine()
{
    if (m_views.status == this)
        m_views.status = nullptr;
}

bool frmstatus_engine::Form_Load(const QString& instrumentId, const QString& storePath)
{
    const auto p = cycle.notify.procedure();
    m_views.status_open = true;
    cycle.Text10[0].text = instrumentId;
    m_store = openViewStore(storePath, m_op, m_link);
    if (!m_store) {
        return false;
    }
    cycle.loadInterval(m_store.get());

    // Set point fields of every channel the view may show.
    Recordset& sp = m_store->setpointsTable();
    const int keep = sp.AbsolutePosition();
    for (int n = 1; n <= Buttons && sp.setAbsolutePosition(n - 1); ++n) {
        ChannelConfig& c = m_config[n];
        c.inUse = number(sp.value(catalogue::kConnectedField)) != 0;
        c.number = sp.value(catalogue::kChannelTextField).toString();
        c.description = sp.value(catalogue::kDescriptionField).toString();
        for (int j = 0; j < 3; ++j)
            c.assoc[j] = number(sp.value(catalogue::kAssociatedChannelField + j));
        c.kind = number(sp.value(catalogue::kControlKindField));
        if (n == 1) {
            for (int b = 0; b < kBanks; ++b)
                m_bankSize[b] = number(sp.value(catalogue::kChannelBankField + b));
            m_banksInUse = number(sp.value(catalogue::kBanksInUseField));
        }
    }
    if (keep >= 0)
        sp.setAbsolutePosition(keep);
    else
        sp.MoveFirst();

    clear_pid_fan_labels();
    const QVariant mode = m_store->info(kInfoStatusDescriptionsRow, kInfoDescriptionsColumn);
    if (mode.isNull())
        m_store->setInfo(kInfoStatusDescriptionsRow, kInfoDescriptionsColumn, 1);
    showDescriptions = mode.isNull() || number(mode) != 0;
    readRows();
    show_channel_rows();
    for (int i = 0; i < Rows; ++i) {
        if (m_rows[i] >= 1 && m_rows[i] <= Buttons)
            Command1[m_rows[i]].backColor = Selected;
    }
    com_chan_visable();
    cycle.firstRequest();
    return true;
}

void frmstatus_engine::readRows()
{
    for (int i = 0; i < Rows; ++i)
        m_rows[i] = m_store ? number(m_store->info(i, kInfoShownChannelColumn)) : 0;
}

QString frmstatus_engine::channelCaption(int n)
{
    if (n < 1 || n > Buttons)
        return {};
    const ChannelConfig& c = m_config[n];
    return showDescriptions ? c.description : c.number;
}

void frmstatus_engine::clear_pid_fan_labels()
{
    for (int i = 0; i < Rows; ++i) {
        pid[i].text = QStringLiteral("PID");
        fans[i].text = QStringLiteral("Fan");
    }
}

void frmstatus_engine::Changechannels()
{
    for (int n = 1; n <= Buttons; ++n)
        Command1[n].text = channelCaption(n);
    for (int i = 0; i < Rows; ++i) {
        if (m_rows[i] != 0)
            chanframe[i].text = channelCaption(m_rows[i]);
    }
}

void frmstatus_engine::com_chan_visable()
{
    for (int n = 1; n <= Buttons; ++n)
        Command1[n].visible = m_config[n].inUse;
}

void frmstatus_engine::show_channel_rows()
{
    for (int i = 0; i < Rows; ++i) {
        const int n = m_rows[i];
        chanframe[i].visible = n != 0;
        if (n == 0)
            continue;
        const bool outputs = n <= kLastOutputChannel;
        for (ControlState* c : {&assoc1[i], &assoc2[i], &assoc3[i], &liquid[i], &fans[i], &pid[i], &defrost[i],
                                &suction[i], &alarm[i], &bank[i]})
            c->visible = outputs;
    }
    Changechannels();
    for (int i = 0; i < Rows; ++i) {
        if (m_rows[i] != 0)
            chanframe[i].text = channelCaption(m_rows[i]);
    }
    chanBanks();
}

void frmstatus_engine::redoBanks()
{
    const auto p = cycle.notify.procedure();
    if (!m_store)
        return;
    for (int b = 0; b < kBanks; ++b)
        m_bankSize[b] = number(m_store->setpoint(0, catalogue::kChannelBankField + b));
    chanBanks();
}

void frmstatus_engine::chanBanks()
{
    const int* b = m_bankSize;
    for (int i = 0; i < Rows; ++i) {
        const int n = m_rows[i];
        QString text = QStringLiteral("None");
        int upTo = 0;
        for (int k = 0; k < kBanks && n != 0; ++k) {
            upTo += b[k];
            if (n <= upTo) {
                text = QStringLiteral("Bank %1").arg(k + 1);
                break;
            }
        }
        bank[i].text = text;
    }
    for (int k = 0; k < Pressures; ++k) {
        TempPLabel[k].visible = false;
        TempP[k].visible = false;
    }
    for (ControlState& s : suc)
        s.visible = false;
    suc[15].visible = true;
    int limit;
    switch (m_banksInUse) {
    case 1: limit = 2; break;
    case 2: limit = 5; break;
    case 3: limit = 8; break;
    case 4: limit = 11; break;
    case 5: limit = 14; break;
    default: limit = b[1]; break; // the variable held bank 2's size before
    }
    for (int i = 0; i <= limit && i < Suctions; ++i)
        suc[i].visible = true;
    for (int k = 0; k < qMin(m_banksInUse, Pressures); ++k) {
        TempPLabel[k].visible = true;
        TempP[k].visible = true;
    }
}

void frmstatus_engine::status_do()
{
    status_do(m_link.test3Text());
}

void frmstatus_engine::status_do(const QString& reply)
{
    const auto p = cycle.notify.procedure();
    using namespace status_layout;
    cycle.replyStarted(reply);
    const double version = m_link.globals().versionNumber();
    const StatusReply r = decodeStatus(reply, version);

    for (int i = 0; i < Rows; ++i) {
        const int n = m_rows[i];
        if (n < 1 || n > Channels)
            continue;
        const ChannelConfig& c = m_config[n];
        if (r.hasPid) {
            switch (c.kind) {
            case -3:
            case 7:
                pid[i].text = QStringLiteral("PID");
                fans[i].text = QStringLiteral("Fan");
                break;
            case 4:
                fans[i].text = QStringLiteral("Fan");
                pid[i].text = QStringLiteral("PID ") + r.pid[n] + QStringLiteral(" %");
                break;
            case 5:
                pid[i].text = QStringLiteral("PID ") + r.pidKind5[n] + QStringLiteral(" %");
                fans[i].text = QStringLiteral("Fan ") + r.fanKind5[n] + QStringLiteral(" %");
                break;
            default:
                break;
            }
        }
        Temp[i].text = channelValueText(r.value[n]);
        alarm[i].backColor = r.alarm[n] ? PaleRed : Off;
        if (n > OutputChannels)
            continue;
        ControlState* boxes[3] = {&assoc1[i], &assoc2[i], &assoc3[i]};
        for (int j = 0; j < 3; ++j) {
            const int m = c.assoc[j];
            if (m == NoAssoc) {
                boxes[j]->visible = false;
            } else if (m > PressureAssoc) {
                boxes[j]->text = QStringLiteral("Press");
                boxes[j]->visible = true;
            } else {
                boxes[j]->text = channelValueText(assocValue(reply, m));
                boxes[j]->visible = true;
            }
        }
        const StatusOutputs& o = r.outputs[n];
        liquid[i].backColor = o.liquid ? PaleRed : Off;
        if (c.kind == 0 || c.kind == 7)
            pid[i].backColor = Off;
        else
            pid[i].backColor = o.liquid ? PaleRed : Off;
        fans[i].backColor = o.fan ? FanOn : Off;
        defrost[i].backColor = o.defrost ? DefrostOn : Off;
        suction[i].backColor = o.suction ? PaleRed : Off;
    }
    for (int i = 0; i < Suctions; ++i)
        suc[i].text = r.hasSuction ? suctionBoxText(r.suction[i]) : QStringLiteral("N/A");
    for (int k = 0; k < Pressures; ++k)
        TempP[k].text = r.hasPressures ? pressureBoxText(r.pressure[k]) : QStringLiteral("N/A");
    cycle.replyFinished();
}

void frmstatus_engine::Command1_Click(int index)
{
    const auto p = cycle.notify.procedure();
    if (index < 1 || index > Buttons || !m_store)
        return;
    if (Command1[index].backColor == Selected) {
        Command1[index].backColor = Off;
        for (int i = 0; i < Rows; ++i) {
            if (m_rows[i] == index) {
                m_store->setInfo(i, kInfoShownChannelColumn, 0);
                m_rows[i] = 0;
            }
        }
    } else {
        int free = -1;
        for (int i = 0; i < Rows && free < 0; ++i) {
            if (m_rows[i] == 0)
                free = i;
        }
        if (free < 0) {
            cycle.notify.flush();
            m_op.message(QStringLiteral("Channel Display Full"),
                         {QStringLiteral("There is already 20 channels (maximum) selected,"),
                          QStringLiteral("De select at least 1 channel by clicking on the channel number."),
                          QStringLiteral("Then select the new channel number to display.")});
            show_channel_rows();
            return;
        }
        m_store->setInfo(free, kInfoShownChannelColumn, index);
        m_rows[free] = index;
        Command1[index].backColor = Selected;
    }
    show_channel_rows();
}

void frmstatus_engine::Command2_Click()
{
    const auto p = cycle.notify.procedure();
    for (int n = 1; n <= Buttons; ++n) {
        if (Command1[n].backColor != Off)
            Command1[n].backColor = Off;
    }
    for (int i = 0; i < Rows; ++i) {
        if (m_store)
            m_store->setInfo(i, kInfoShownChannelColumn, 0);
        m_rows[i] = 0;
    }
    show_channel_rows();
}

void frmstatus_engine::Cmdselchan_Click()
{
    const auto p = cycle.notify.procedure();
    showDescriptions = false;
    Changechannels();
    if (m_store)
        m_store->setInfo(kInfoStatusDescriptionsRow, kInfoDescriptionsColumn, 0);
}

void frmstatus_engine::Cmdseldis_Click()
{
    const auto p = cycle.notify.procedure();
    showDescriptions = true;
    Changechannels();
    if (m_store)
        m_store->setInfo(kInfoStatusDescriptionsRow, kInfoDescriptionsColumn, 1);
}

void frmstatus_engine::Temp_Click(int index)
{
    if (index < 0 || index >= Rows || !m_views.setPointCard || !m_store)
        return;
    const int n = number(m_store->info(index, kInfoShownChannelColumn));
    if (n > 0)
        m_views.setPointCard->showChannel(n);
}

// Tells only while an alarm blinks.
void frmstatus_engine::Timer2_Timer()
{
    const auto lit = [](const ControlState& a) { return a.backColor != Off; };
    if (std::none_of(std::begin(alarm), std::end(alarm), lit))
        return;
    const auto p = cycle.notify.procedure();
    for (ControlState& a : alarm) {
        if (lit(a))
            a.backColor = a.backColor == PaleRed ? Colour::Yellow : PaleRed;
    }
}
