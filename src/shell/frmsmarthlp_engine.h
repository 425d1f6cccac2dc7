#pragma once

#include "platform/clock.h"

#include <QObject>
#include <QString>

struct LinkGlobals;

// The small hover help window: while it stands, the set point views explain
// what the mouse points at in it (they read smart_help_open). It closes by
// itself after a while, or by Cancel.
class frmsmarthlp_engine : public QObject {
    Q_OBJECT
public:
    static constexpr int StandMs = 20000;

    frmsmarthlp_engine(Clock& clock, LinkGlobals& globals, QObject* parent = nullptr);

    Timer Timer1;
    QString text;

    void Form_Load();
    void Cancel_Click();
    // A view's mouse move: the help for what is under the mouse.
    void explain(const QString& help);

signals:
    void changed();
    void unloadRequested();

private:
    void Timer1_Timer();
    LinkGlobals& m_globals;
};
