#include "link/commands.h"

namespace commands {

namespace {
const QByteArray kCrLf = QByteArrayLiteral("\r\n");
}

int prefixLength(Sender sender)
{
    switch (sender) {
    case Sender::DirectConnect: return 30;
    case Sender::Disconnect: return 34;
    case Sender::DialDirect: return 36;
    case Sender::FrontKeys: return 41;
    case Sender::Channels: return 61;
    case Sender::History: return 84;
    case Sender::Alarm:
    case Sender::Power:
    case Sender::StatusP:
    case Sender::Brumalet:
    case Sender::Status: return 85;
    case Sender::LoadShed: return 105;
    }
    return 0;
}

QByteArray prefix(Sender sender)
{
    return QByteArray(prefixLength(sender), 'Z');
}

QByteArray framed(Sender sender, const QByteArray& body)
{
    return framed(prefix(sender), body);
}

QByteArray framed(const QByteArray& prefix, const QByteArray& body)
{
    return prefix + body + EOT;
}

QByteArray unprefixed(const QByteArray& body) { return body + EOT; }

QByteArray connectDirect() { return framed(Sender::DirectConnect, "CONNECTK"); }
QByteArray identifyAfterCall() { return QByteArrayLiteral("K"); }
QByteArray disconnectDirect() { return prefix(Sender::Disconnect) + "ATH"; }

QByteArray statusRequest() { return unprefixed("F"); }
QByteArray pressureRequest() { return unprefixed("T"); }
QByteArray torvanelRequest() { return framed(Sender::StatusP, "t"); }
QByteArray nextRecord() { return QByteArray(1, EOT); }
QByteArray acceptWrite() { return QByteArrayLiteral("X"); }
QByteArray breakOff() { return QByteArrayLiteral("V"); }
QByteArray downloadControl() { return QByteArrayLiteral("e"); }

QByteArray modemDial(bool waitForDialTone, const QString& modemText, const QString& number)
{
    return QByteArray(waitForDialTone ? "ATX4" : "ATX0") + modemText.toLatin1() + "DT"
        + number.toLatin1() + kCrLf;
}

QByteArray modemHangUp() { return QByteArrayLiteral("ATH0") + kCrLf; }
QByteArray modemEscape() { return QByteArrayLiteral("+++"); }
QByteArray modemAskModulation() { return QByteArrayLiteral("AT+MS?") + kCrLf; }
QByteArray modemCommand(const QString& text) { return "AT" + text.toLatin1() + kCrLf; }

QLatin1String tokenText(Token token)
{
    switch (token) {
    case Token::NoDialtone: return QLatin1String("NO DIALTONE");
    case Token::Busy: return QLatin1String("BUSY");
    case Token::NoCarrier: return QLatin1String("NO CARRIER");
    case Token::Connect: return QLatin1String("CONNECT");
    case Token::Glacinor: return QLatin1String("Glacinor");
    case Token::Sret: return QLatin1String("sret");
    case Token::Schanupload: return QLatin1String("schanupload");
    case Token::Downcheck: return QLatin1String("downcheck");
    case Token::Donedown: return QLatin1String("donedown");
    case Token::Reset: return QLatin1String("AT&FE0");
    case Token::Dlres: return QLatin1String("dlres");
    case Token::Histy: return QLatin1String("histy");
    case Token::Plres: return QLatin1String("plres");
    case Token::Power: return QLatin1String("power");
    case Token::Status: return QLatin1String("status");
    case Token::Presss: return QLatin1String("presss");
    case Token::Torvan: return QLatin1String("torvan");
    case Token::Realarms: return QLatin1String("realarms");
    case Token::Noalarms: return QLatin1String("noalarms");
    case Token::Almlog: return QLatin1String("almlog");
    case Token::AlmNew: return QLatin1String("alm-new");
    case Token::Nocomp: return QLatin1String("nocomp");
    case Token::Tempfront: return QLatin1String("tempfront");
    case Token::Dxstart: return QLatin1String("dxstart");
    case Token::Evapfrst: return QLatin1String("evapfrst");
    }
    return QLatin1String();
}

} // namespace commands
