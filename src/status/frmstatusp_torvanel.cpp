// frmstatusp's Torvanel part: the "t" request, the alarm reply, the panel of
// the selected Torvanel in place of the compressors and its blinking alarm.

#include "link/commands.h"
#include "link/link.h"
#include "link/link_globals.h"
#include "status/frmstatusp_engine.h"

namespace {

const QString kUnknown = QStringLiteral("????");

QString yesNo(bool on)
{
    return on ? QStringLiteral("YES") : QStringLiteral("NO");
}

QString onOff(bool on)
{
    return on ? QStringLiteral("ON") : QStringLiteral("OFF");
}

// Label sets of the two kinds of Torvanel: 1 a recip, others a screw.
const char* const kScrewLabels[frmstatusp_engine::PanelBoxes] = {
    "Suction Temp", "Discharge Temp", "Oil Manifold Temp", "Oil Seperator Temp",
    "Suction Press", "Discharge Press", "Oil Manifold Press", "Oil Pre Filter",
    "Load Slide %", "Volume Ratio %", "Motor Current",
    "Remote Run", "Remote Off", "Emergency Switch", "Full Load Switch", "Full Unload Switch",
    "Motor Auxilary", "Oil Level Switch", "Auxilary 1", "Load Solenoid", "Unload Solenoid", "Oil Pump",
    "Compressor", "Running", "In Alarm",
    "Oil Heater", "Vi Increase", "Vi Decrease", "Start Contactor", "Run Contactor",
    "Fully Loaded", "Fully Unloaded", "Spare 1", "Spare 2", "Spare 3",
};
const char* const kRecipLabels[frmstatusp_engine::PanelBoxes] = {
    "Suction Temp", "Discharge Temp", "Oil Manifold Temp", "Intermediate Temp",
    "Suction Press", "Discharge Press", "Oil Pressure", "Intermediate Press",
    "Motor Current", "Super Heat", "Spare Analogue",
    "Remote Run Switch", "Remote Off Switch", "Motor Auxillary", "Water Jacket Flow", "Emergency Switch",
    "Stage 1 Solenoid", "Stage 2 Solenoid", "Stage 3 Solenoid", "Stage 4 Solenoid", "Oil Pump", "Crankcase Heater",
    "Compressor", "Running", "In Alarm",
    "Spare Input 1", "Spare Input 2", "Spare Input 3", "Spare Input 4", "Spare Input 5",
    "Fully Loaded", "Spare 1", "Spare 2", "Spare 3", "Spare 4",
};

} // namespace

void frmstatusp_engine::afterFlash()
{
    if (m_link.globals().versionNumber() >= presss_layout::TorvanelRequestVersion)
        send_torvanel_request();
}

void frmstatusp_engine::send_torvanel_request()
{
    if (m_link.globals().link_up)
        m_link.Output(commands::torvanelRequest());
    m_link.startWaitUd();
}

void frmstatusp_engine::statuspa_do()
{
    statuspa_do(m_link.test3Text());
}

void frmstatusp_engine::statuspa_do(const QString& reply)
{
    const auto p = cycle.notify.procedure();
    const double version = m_link.globals().versionNumber();
    if (version < presss_layout::TorvanelRequestVersion)
        return;
    cycle.releaseManualWait();
    CsAlarms = reply;
    show_alarm_words();
    if (version >= presss_layout::TorvanTemperatureVersion) {
        for (int i = 0; i < presss_layout::TorvanTemperatures; ++i)
            Temp[i].text = torvanTemperature(reply, i);
    }
    cycle.restartWatchdog();
    cycle.Timer5.setEnabled(false);
}

void frmstatusp_engine::labelPanel(int kind)
{
    const char* const* labels = kind == 1 ? kRecipLabels : kScrewLabels;
    for (int i = 0; i < PanelBoxes; ++i)
        Label10[i].text = QString::fromLatin1(labels[i]);
}

void frmstatusp_engine::show_torvanel_data()
{
    const TorvanelBlock b = decodeTorvanelBlock(CsData, selected);
    if (!b.known || CsData == CsDataInitial) {
        for (ControlState& t : Text3)
            t.text = kUnknown;
        labelPanel(0);
        return;
    }
    labelPanel(b.kind);
    for (int i = 0; i < presss_layout::BlockTemperatures; ++i)
        Text3[PanelTemperature + i].text = b.temperatures[i];
    for (int i = 0; i < presss_layout::BlockPressures; ++i)
        Text3[PanelPressure + i].text = b.pressures[i];
    Text3[PanelAnalogue].text = b.analogue1;
    Text3[PanelAnalogue + 1].text = b.analogue2;
    Text3[PanelAnalogue + 2].text = b.analogue3;
    for (int i = 0; i < presss_layout::BlockInputs; ++i)
        Text3[panelInput(i)].text = onOff(b.inputs[i]);
    for (int j = 1; j < presss_layout::BlockFurtherInputs; ++j)
        Text3[panelFurtherInput(j)].text = yesNo(b.furtherInputs[j]);
    Text3[PanelKind].text = b.kind == 1 ? QStringLiteral("Recip") : QStringLiteral("Screw");
}

void frmstatusp_engine::show_alarm_words()
{
    if (CsAlarms == CsAlarmsInitial)
        return;
    const TorvanelBlock b = decodeTorvanelBlock(CsData, selected);
    Alm.text = torvanelAlarmWords(CsAlarms, selected, b.known ? b.kind : 0);
    if (Text3[PanelAlarm].text == QLatin1String("YES") && Alm.text == NoAlarms)
        Alm.text = QStringLiteral("Unknown Alarm's");
}

void frmstatusp_engine::CompSelect_Click(int index)
{
    const auto p = cycle.notify.procedure();
    if (index < 0 || index >= Compressors)
        return;
    for (ControlState& b : CompSelect)
        b.backColor = Off;
    CompSelect[index].backColor = StepOn;
    selected = index;
    if (CsData != CsDataInitial)
        show_torvanel_data();
    if (CsAlarms != CsAlarmsInitial)
        show_alarm_words();
    Label4.text = QStringLiteral("Torvanel No. %1 Alarms").arg(index + 1);
}

void frmstatusp_engine::dbaseload_Click()
{
    const auto p = cycle.notify.procedure();
    if (dbaseload.text == QLatin1String("Torvanel Status")) {
        dbaseload.text = QStringLiteral("Glacinor Status");
        dbaseload.toolTip = QStringLiteral("Displays the Glacinor compressor status");
        Picture1.visible = true;
        if (CsData != CsDataInitial)
            show_torvanel_data();
    } else {
        dbaseload.text = QStringLiteral("Torvanel Status");
        dbaseload.toolTip = QStringLiteral("Displays individual compressor status from Torvanels");
        Picture1.visible = false;
    }
}

// Tells only when a colour changes.
void frmstatusp_engine::Timer3_Timer()
{
    const ControlState& box = Text3[PanelAlarm];
    const quint32 boxColour = box.text != QLatin1String("YES") ? AlarmPale
                              : box.backColor == Colour::Yellow ? StageOn
                                                                : Colour::Yellow;
    // The alarm list blinks while it names an alarm.
    const bool alarms = Alm.text != NoAlarms && CsAlarms != CsAlarmsInitial;
    m_blinkPhase = alarms && !m_blinkPhase;
    const quint32 almColour = m_blinkPhase ? AlarmBlink : AlarmPale;
    if (box.backColor == boxColour && Alm.backColor == almColour)
        return;
    const auto p = cycle.notify.procedure();
    Text3[PanelAlarm].backColor = boxColour;
    Alm.backColor = almColour;
}
