#pragma once

#include <QByteArray>
#include <QString>

struct LinkGlobals;

// What a view's engine needs of the line side: the one port, the receive
// buffer and the shared timers. ccForm1's engine provides it; views receive
// it by reference and never see the form itself.
class Link {
public:
    virtual ~Link() = default;

    // MSComm1.Output: the bytes go out at once. False when the port is closed
    // or the write failed; senders go on regardless, as under resume-on-error.
    virtual bool Output(const QByteArray& bytes) = 0;
    // InBufferCount = 0.
    virtual void discardInput() = 0;
    // InBufferCount = 0 and test3 emptied: nothing half received stays in
    // front of the next reply.
    virtual void emptyReceiveBuffer() = 0;
    // test3.Text: the receive buffer after the line filter (CR LF line ends).
    virtual QString test3Text() const = 0;
    virtual LinkGlobals& globals() = 0;

    // Starts WaitUd with a status request; it clears status_request_wait.
    virtual void startWaitUd() = 0;
    // Starts dbase_error after "Data Base Invalid": all views close a second later.
    virtual void startDbaseError() = 0;
    // Closes whatever line is open: the modem call (Text3(3) "Port Open") by
    // cancel_dial_Click, else the direct line by Command6_Click.
    virtual void hangUp() = 0;
};
