#pragma once

// The checked write of one set point: the store takes the value first; then,
// with the line up, one P command goes out and the instrument echoes what it
// understood. The echo must equal the expected text exactly before "X"
// commits it; a wrong echo or silence breaks the dialogue off with "V". The
// store is never rolled back. The channel editor, the order buttons and the
// load shed view all write through this.

#include "link/commands.h"
#include "platform/clock.h"
#include "platform/operator.h"
#include "setpoints/write_check.h"

#include <QByteArray>
#include <QList>
#include <QObject>
#include <QPair>
#include <QString>
#include <QStringList>
#include <QVariant>
#include <optional>

class Link;
struct OpenViews;
class InstrumentStore;
class AuditTrail;
namespace catalogue {
struct Function;
}

namespace write_command {

// The body of a P command behind its prefix, without EOT: "P", function,
// channel, sub-function, width flag, the first value, group size, then any
// further values (the times of a time group), each followed by a comma.
QByteArray pBody(int function, int channel, int subfunction, int width, const QStringList& values,
                 int group);
// The echo that confirms it: the same text less "P", ",sret" in the place of
// the last comma.
QString pEcho(const QByteArray& body);
// prefix + body + EOT.
QByteArray pCommand(const QByteArray& prefix, const QByteArray& body);

// The fixed command of a check box Check1(index); value is the box's 0 or 1
// (for the day boxes 11..38, the day's mask, with the day as sub-function).
// Empty for an index that has none.
QByteArray checkBoxBody(int index, int channel, int value, int subfunction = 0, int group = 7);

// The check box that serves an untagged function/sub-function (function 41:
// its first box of the day); -1 when there is none.
int checkBoxOf(int function, int subfunction);

// Which control asked for a write (write_control_kind).
enum ControlKind {
    KindCheck = 0,
    KindManualDefrost = 8,
    KindCancelDefrost = 10,
    KindText2 = 100,
    KindText1 = 101,
    KindCombo1 = 102,
    KindCompressorBank = 104,
    KindCompUpdate = 105,
    KindCondUpdate = 106,
    KindCondenserBank = 107,
};

// What the box of a function's sub-function on a 1-based channel shows of
// the store: "21.5", "08:30", a list index, a check box's 0 or 1.
QString shownValue(InstrumentStore& store, int function, int channel, int subfunction);
// What the checks of a value need from the store (bank kind, control type,
// the neighbouring times of a group).
write_check::Context checkContextOf(InstrumentStore& store, int function, int channel, int subfunction);

} // namespace write_command

class WritePath : public QObject {
    Q_OBJECT
public:
    // One write as the sender composed it.
    struct Write {
        int function = 0;
        int channel = 0;     // on the wire: 0 for a global value
        bool global = false; // the value lives in row 0
        int subfunction = 0;
        QByteArray body;     // the P command without prefix and EOT
        int storeRow = 0;    // row of `setpoints` (0 for a global value)
        QList<QPair<int, QVariant>> fields; // store field and new value
        int kind = write_command::KindText1;
        int index = 0;       // write_control_index
        QString oldValue;    // for the audit trail
        QString newValue;
    };

    WritePath(commands::Sender sender, Link& link, Clock& clock, Operator& op, OpenViews& views,
              InstrumentStore& store, QObject* parent = nullptr);

    void setAuditTrail(AuditTrail* audit) { m_audit = audit; }

    // --- state of the write ---
    QByteArray command_prefix;
    QString sent_to_glacinor;
    QString return_string;
    QString oldvalue;
    int write_control_kind = write_command::KindText1;
    int write_control_index = 0;
    int description_fault = 0;
    bool update_pending = false;
    bool filling_screen = false;
    bool skip_lost_focus = false;
    bool button_pressed = false;
    bool status_stopped = false;
    bool no_send = false;

    // No-echo timers: Check1, Text2, Text1 or Combo1.
    Timer Timer1, Timer2, Timer4;

    // Steps 1 to 4 of every LostFocus: the screen being filled, the one-shot
    // flags, a write under way, a running status view (stopped here, with its
    // message), a refused value. False when the handler ends here.
    bool lostFocusGate();
    // Stops the first running status view with its message; false when none ran.
    bool stopRunningStatus();

    // Steps 8 to 10: the store first, then, with the line up, the command and
    // the no-echo timer of the control's kind.
    void send(const Write& write);

    // The operator's value for a catalogue function of a 1-based channel, as
    // it would be typed (degrees "21.5", times "08:30", list indexes, the
    // description), composed into its write. Null with the reason in *error
    // when the text is no number or the channel has no such function.
    std::optional<Write> compose(int function, int channel, int subfunction, const QString& screenText,
                                 QString* error = nullptr);
    // The control of a function's sub-function on a 1-based channel takes the
    // focus: oldvalue takes what its box shows now, from the store.
    void gotFocus(int function, int channel, int subfunction);
    // The focus leaves the control: gate, the checks against oldvalue, the
    // store, the command, and the function's effects. False when nothing went
    // out (the reason in *error; empty when the value was unchanged); a
    // refusal shows the program's message.
    bool writeValue(int function, int channel, int subfunction, const QString& screenText,
                    QString* error = nullptr);

    // The echo arrived ("sret" in test3).
    void ret_handel();

signals:
    void changed();
    // "X" went out for the control of this kind and index.
    void confirmed(int kind, int index);
    // "Update Not Completed": the focus goes back to this control.
    void abandoned(int kind, int index);

private:
    void noEcho(Timer& timer);
    void effects(int function);
    void resetOrder(int field, int places);
    void orderResetMessage(bool compressors);
    QString storedText(int row, int field);

    Link& m_link;
    Clock& m_clock;
    Operator& m_op;
    OpenViews& m_views;
    InstrumentStore& m_store;
    AuditTrail* m_audit = nullptr;
    int m_auditEntry = -1;
};
