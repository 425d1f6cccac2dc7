#pragma once

#include <QString>
#include <QVariant>

// Colours are 24-bit numbers in blue, green, red order (65280 green, 65535
// yellow, 255 red). The high bit marks a system colour.
namespace Colour {
constexpr quint32 ButtonFace = 0x8000000Fu; // the off state of every indicator
constexpr quint32 WindowText = 0x80000008u;
constexpr quint32 Window = 0x80000005u;
constexpr quint32 ButtonText = 0x80000012u;
constexpr quint32 Black = 0x000000u;
constexpr quint32 White = 0xFFFFFFu;
constexpr quint32 Red = 0x0000FFu;
constexpr quint32 Green = 0x00FF00u;
constexpr quint32 Blue = 0xFF0000u;
constexpr quint32 Yellow = 0x00FFFFu;
constexpr inline bool isSystem(quint32 c) { return (c & 0x80000000u) != 0; }
// 0xRRGGBB for a 24-bit BGR number (system colours are not mapped here).
constexpr inline quint32 toRgb(quint32 bgr)
{
    return ((bgr & 0xFFu) << 16) | (bgr & 0xFF00u) | ((bgr >> 16) & 0xFFu);
}
constexpr inline quint32 fromRgb(quint32 rgb) { return toRgb(rgb); }
} // namespace Colour

// The part of a control that the program's logic reads or writes. Engines
// keep one per control, named as the form names it; views apply them.
struct ControlState {
    QString text;                         // Text or Caption
    quint32 backColor = Colour::ButtonFace;
    quint32 foreColor = Colour::ButtonText;
    bool enabled = true;
    bool visible = true;
    QString toolTip;
    QVariant value;                       // Value, ListIndex, a check state

    bool operator==(const ControlState&) const = default;
};
