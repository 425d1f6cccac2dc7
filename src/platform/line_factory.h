#pragma once

#include "platform/line.h"

#include <functional>
#include <memory>

// The line for a port name: TCP for host:port, a serial device otherwise.
// The port name is already set on the line.
std::unique_ptr<Line> makeLine(const QString& portName);

// The line a workstation program opens for a port name: the built-in
// simulator for its name, else what makeLine() gives. modemWanted is asked
// when the simulator starts.
std::unique_ptr<Line> makeWorkstationLine(const QString& portName, std::function<bool()> modemWanted);
