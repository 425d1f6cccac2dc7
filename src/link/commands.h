#pragma once

#include <QByteArray>
#include <QString>

// The wire language: every text the program writes to the instrument or its
// modem, and the tokens that end the replies. Senders compose their commands
// here so that the framing is written once.
namespace commands {

constexpr char EOT = '\x04';

// Who sends: the length of the run of Z in front of a command differs from
// sender to sender. The instrument ignores it; the lengths stay as they are.
enum class Sender {
    DirectConnect, // ccForm1 Command3_Click, 30
    Disconnect,    // ccForm1 Command6_Click, 34
    DialDirect,    // ccForm1 dial_num_Click on a direct line, 36
    FrontKeys,     // frmfront, 41
    Channels,      // channels, 61
    History,       // frmhistory, 84
    Alarm,         // frmalarm, 85
    Power,         // frmpower, 85
    StatusP,       // frmstatusp, 85
    Brumalet,      // frmbrumalet, 85
    Status,        // frmstatus, frmstatusg, frmmultiprobes, frmstatuspg, 85
    LoadShed,      // frmloadshed, 105
};

int prefixLength(Sender sender);
QByteArray prefix(Sender sender);
// prefix, body, EOT: the common framing of an instrument command.
QByteArray framed(Sender sender, const QByteArray& body);
// The same with a prefix the sender keeps (prefix(sender)).
QByteArray framed(const QByteArray& prefix, const QByteArray& body);
// body, EOT: the requests that go without a prefix.
QByteArray unprefixed(const QByteArray& body);

// --- ccForm1 ---
QByteArray connectDirect();     // 30 Z, "CONNECTK", EOT
QByteArray identifyAfterCall(); // "K": no prefix, no EOT
// 34 Z, "ATH": composed after the port is closed, so it never reaches the line.
QByteArray disconnectDirect();

// --- the views ---
QByteArray statusRequest();        // "F", EOT, no prefix
QByteArray pressureRequest();      // "T", EOT, no prefix
QByteArray torvanelRequest();      // 85 Z, "t", EOT
QByteArray nextRecord();           // EOT alone: record taken, send the next
QByteArray acceptWrite();          // "X"
QByteArray breakOff();             // "V"
QByteArray downloadControl();      // "e"

// --- the modem: these alone end in CR LF ---
// "ATX4" when waiting for the dial tone (so the modem reports NO DIALTONE and
// BUSY), else "ATX0"; then the modem box's text, "DT", the number.
QByteArray modemDial(bool waitForDialTone, const QString& modemText, const QString& number);
QByteArray modemHangUp();          // "ATH0" CR LF
QByteArray modemEscape();          // "+++", no line end
QByteArray modemAskModulation();   // "AT+MS?" CR LF
QByteArray modemCommand(const QString& text); // "AT" + text, CR LF

// Tokens that end the replies; the dispatcher's table (reply_do) gives the
// order in which they are looked for.
enum class Token {
    NoDialtone, Busy, NoCarrier, Connect, Glacinor, Sret, Schanupload, Downcheck,
    Donedown, Reset, Dlres, Histy, Plres, Power, Status, Presss, Torvan, Realarms,
    Noalarms, Almlog, AlmNew, Nocomp, Tempfront, Dxstart, Evapfrst,
};
QLatin1String tokenText(Token token);

} // namespace commands
