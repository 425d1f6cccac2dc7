#pragma once

#include <QString>

// Texts ccForm1's engine writes into more than one of its controls, shared by
// the files the engine is split into.
namespace ccform1 {
inline const QString kPortOpen = QStringLiteral("Port Open");
inline const QString kPortClosed = QStringLiteral("Port Closed");
inline const QString kUnknown = QStringLiteral("????");
} // namespace ccform1
