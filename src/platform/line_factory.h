#pragma once

#include "platform/line.h"

#include <memory>

// The line for a port name: TCP for host:port, a serial device otherwise.
// The port name is already set on the line.
std::unique_ptr<Line> makeLine(const QString& portName);
