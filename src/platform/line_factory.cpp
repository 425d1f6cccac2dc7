#include "platform/line_factory.h"

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
