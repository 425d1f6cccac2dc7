#pragma once

#include <QString>

// The variables every form shares about the line. One object, owned by the
// application and handed to each engine by reference.
struct LinkGlobals {
    // The line to an instrument is open (a modem test leaves it True with the
    // port closed; views believe it until the next connect or hang up).
    bool link_up = false;
    // Multiplies the no-reply waits: 13, 8, 4, 2 or 1 by the baud rate.
    int speed_factor = 1;
    // Retry wait of the automatic status cycle: 4000 direct, 7000 modem.
    int reply_wait_ms = 7000;
    // The first 3 characters of the identity reply, trimmed. A text that is
    // always compared as a number: use versionNumber().
    QString instrument_version;
    // A status request left less than 8000 ms ago.
    bool status_request_wait = false;
    // The modem reported a connection: a hang up must escape data mode first.
    bool modem_online = false;
    bool smart_help_open = false;

    // instrument_version as a number; 0 when it is not one.
    double versionNumber() const;
};

// True when the text reads as a number: blanks around it, a sign, digits and
// one decimal point. Fields of the replies are tested with this before use.
bool isNumericText(const QString& text);
