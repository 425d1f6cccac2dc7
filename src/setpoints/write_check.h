#pragma once

// The rules a single set point value must pass before it is stored and sent,
// in the order the editor applies them: what the operator may type into the
// box (a number, whole where the function is whole, within its range, times
// between their neighbours), then at the focus change whether anything
// changed, then whether the channel belongs to the function's class. Pure:
// the caller reads what the rules need from the store. The write path and
// q19ctl both ask this, so a refusal reads the same from either, and q19ctl
// can refuse before it dials.

#include "platform/operator.h"

#include <QString>
#include <QVariant>
#include <optional>

namespace catalogue {
struct Function;
}

namespace write_check {

// What the rules need besides the value itself.
struct Context {
    bool bankIsTemperature = false;  // 59..62: the bank's Comp Ct PRES-TMP is 1
    int controlType = 0;             // 113: the channel's control type (function 112)
    std::optional<int> previousTime; // a time: the one before it in its group, if any
    std::optional<int> nextTime;     // a time: the one behind it, if any
};

enum class Outcome {
    Accept,    // store and send
    Unchanged, // the same as before the edit: nothing is stored or sent
    Refused,   // the program's message says why; nothing is stored or sent
    Unknown,   // no such function, sub-function or value for this channel
};

struct Verdict {
    Outcome outcome = Outcome::Unknown;
    Operator::Message message; // the program's message when Refused
    QString summary;           // one line in screen units, for a terminal
    QVariant stored;           // Accept: the value as the store keeps it
};

// Checks the text typed for a function's sub-function on a 1-based channel
// against the box's text before the edit (oldvalue). Functions served by a
// check box (0, 8, 18/1, 41, 98, 99, 106, 109, 150) take 0 or 1, or the day's
// mask.
Verdict check(int function, int channel, int subfunction, const QString& text, const QString& oldvalue,
              const Context& context = {});

// The unit the screen puts behind a value of the function ("oC", "KPA", ...),
// empty where none is named.
QString screenUnit(const catalogue::Function& f, bool bankIsTemperature = false, int controlType = 0);
// The screen's text of a value the store holds: "21.5", "08:30", "3".
QString screenText(const catalogue::Function& f, const QVariant& stored, bool bankIsTemperature = false,
                   int controlType = 0);

} // namespace write_check
