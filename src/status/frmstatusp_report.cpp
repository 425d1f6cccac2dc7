// The printed report of frmstatusp: the banks, then the compressors and
// condensers that are shown.

#include "platform/printer.h"
#include "status/frmstatusp_engine.h"

void frmstatusp_engine::printgraph_Click(Printer& Printer)
{
    cycle.printHead(Printer, QStringLiteral("Velmark Instruments Glacinor Current Pressure Status"));
    const int bankColumns[Banks] = {30, 45, 60, 75, 90};
    QList<QPair<int, QString>> cells;
    for (int b = 0; b < Banks; ++b)
        cells.append({bankColumns[b], QStringLiteral("Bank No. %1").arg(b + 1)});
    Printer.line(QString(), cells);
    const struct {
        const char* name;
        const ControlState* boxes;
    } bankRows[] = {{"Temperatures", Temp},
                    {"Suction Pressure", suction},
                    {"Discharge Pressure", discharge},
                    {"Liquid Pressure", liquid},
                    {"Liquid Pump", liquidpump}};
    for (const auto& row : bankRows) {
        cells.clear();
        for (int b = 0; b < Banks; ++b)
            cells.append({bankColumns[b], row.boxes[b].text});
        Printer.line(QString::fromLatin1(row.name), cells);
    }
    Printer.endLine();

    // A box that is shown prints its state by colour; a hidden one a blank.
    const auto state = [](const ControlState& c) {
        if (!c.visible)
            return QStringLiteral(" ");
        return c.backColor == Off ? QStringLiteral("OFF") : QStringLiteral("ON");
    };
    const int compressorColumns[10] = {20, 35, 50, 65, 80, 95, 110, 125, 140, 155};
    cells = {{compressorColumns[0], QStringLiteral("Bank No.")}, {compressorColumns[1], QStringLiteral("Equal'z Sol")}};
    for (int k = 1; k <= Stages; ++k)
        cells.append({compressorColumns[k + 1], QStringLiteral("Stage %1").arg(k)});
    Printer.line(QStringLiteral("Compressor No."), cells);
    for (int i = 0; i < Compressors; ++i) {
        if (!chanframe[i].visible)
            continue;
        cells = {{compressorColumns[0], bank[i].text}, {compressorColumns[1], state(equal[i])}};
        for (int k = 1; k <= Stages; ++k)
            cells.append({compressorColumns[k + 1], state(stage(k, i))});
        Printer.line(QString::number(i + 1), cells);
    }
    Printer.endLine();

    const int condenserColumns[CondenserStages + 1] = {20, 35, 50, 65, 80};
    cells = {{condenserColumns[0], QStringLiteral("Bank No.")}};
    for (int k = 1; k <= CondenserStages; ++k)
        cells.append({condenserColumns[k], QStringLiteral("Stage %1").arg(k)});
    Printer.line(QStringLiteral("Condenser No."), cells);
    for (int c = 0; c < Condensers; ++c) {
        if (!chanframec[c].visible)
            continue;
        cells = {{condenserColumns[0], bankc[c].text}};
        for (int k = 1; k <= CondenserStages; ++k)
            cells.append({condenserColumns[k], state(stagec(k, c))});
        Printer.line(QString::number(c + 1), cells);
    }
    Printer.endDoc();
}
