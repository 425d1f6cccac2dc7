#include "shell/frmsmarthlp_engine.h"

#include "link/link_globals.h"

frmsmarthlp_engine::frmsmarthlp_engine(Clock& clock, LinkGlobals& globals, QObject* parent)
    : QObject(parent), Timer1(clock, StandMs), m_globals(globals)
{
    connect(&Timer1, &Timer::timeout, this, &frmsmarthlp_engine::Timer1_Timer);
}

void frmsmarthlp_engine::Form_Load()
{
    Timer1.setEnabled(true);
    m_globals.smart_help_open = true;
    emit changed();
}

void frmsmarthlp_engine::Timer1_Timer()
{
    m_globals.smart_help_open = false;
    Timer1.setEnabled(false);
    emit unloadRequested();
}

void frmsmarthlp_engine::Cancel_Click()
{
    m_globals.smart_help_open = false;
    Timer1.setEnabled(false);
    emit unloadRequested();
}

void frmsmarthlp_engine::explain(const QString& help)
{
    if (!m_globals.smart_help_open || help == text)
        return;
    text = help;
    emit changed();
}
