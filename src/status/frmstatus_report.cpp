// The printed report of frmstatus: the 20 rows as they show now.

#include "platform/printer.h"
#include "status/frmstatus_engine.h"

void frmstatus_engine::printgraph_Click(Printer& Printer)
{
    cycle.printHead(Printer, QStringLiteral("Velmark Instruments Glacinor Current Temperature Status"));
    const auto onOff = [](const ControlState& c) { return c.backColor == Off ? QStringLiteral("OFF") : QStringLiteral("ON"); };
    Printer.line(QStringLiteral("Chan No."), {{13, QStringLiteral("Bank No.")},
                                              {26, QStringLiteral("Channels Temp")},
                                              {43, QStringLiteral("Chan Assoc 1")},
                                              {59, QStringLiteral("Chan Assoc 2")},
                                              {75, QStringLiteral("Chan Assoc 3")},
                                              {91, QStringLiteral("Liquid Sol")},
                                              {105, QStringLiteral("Fans Contactor")},
                                              {123, QStringLiteral("Defrost Sol")},
                                              {138, QStringLiteral("Suction Sol")},
                                              {153, QStringLiteral("PID sol")},
                                              {164, QStringLiteral("Alarm")}});
    Printer.endLine();
    // Hidden rows are printed too; either phase of the blink prints "YES".
    for (int i = 0; i < Rows; ++i) {
        Printer.line(chanframe[i].text, {{13, bank[i].text},
                                         {26, Temp[i].text},
                                         {43, assoc1[i].text},
                                         {59, assoc2[i].text},
                                         {75, assoc3[i].text},
                                         {91, onOff(liquid[i])},
                                         {105, onOff(fans[i])},
                                         {123, onOff(defrost[i])},
                                         {138, onOff(suction[i])},
                                         {153, onOff(pid[i])},
                                         {164, alarm[i].backColor == Off ? QStringLiteral("NO") : QStringLiteral("YES")}});
    }
    Printer.endDoc();
}
