#include "platform/line_factory.h"

#include "platform/builtin_simulator_line.h"
#include "platform/serial_line.h"
#include "platform/tcp_line.h"

std::unique_ptr<Line> makeLine(const QString& portName)
{
    std::unique_ptr<Line> line;
    if (TcpLine::looksLikeTcp(portName))
        line = std::make_unique<TcpLine>();
    else
        line = std::make_unique<SerialLine>();
    line->setPortName(portName);
    return line;
}

std::unique_ptr<Line> makeWorkstationLine(const QString& portName, std::function<bool()> modemWanted)
{
    if (portName == BuiltinSimulatorLine::PortName)
        return std::make_unique<BuiltinSimulatorLine>(std::move(modemWanted));
    return makeLine(portName);
}
