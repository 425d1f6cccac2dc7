#include "platform/fake_line.h"

FakeLine::FakeLine(QObject* parent) : Line(parent) {}

bool FakeLine::setSettings(const LineSettings& settings, QString* error)
{
    if (!m_settingsFailure.isEmpty()) {
        if (error)
            *error = m_settingsFailure;
        return false;
    }
    m_settings = settings;
    return true;
}

bool FakeLine::open(QString* error)
{
    if (!m_openFailure.isEmpty()) {
        if (error)
            *error = m_openFailure;
        m_openFailure.clear();
        return false;
    }
    m_open = true;
    ++m_opens;
    return true;
}

bool FakeLine::write(const QByteArray& bytes)
{
    if (!m_open || m_failWrites)
        return false;
    m_writes.append(bytes);
    return true;
}

void FakeLine::setDtr(bool on)
{
    m_dtr = on;
    m_dtrHistory.append(on);
}

void FakeLine::deliver(const QByteArray& bytes)
{
    emit received(bytes);
}

void FakeLine::deliverInBatches(const QByteArray& bytes, int n)
{
    if (n <= 0)
        n = 1;
    for (qsizetype i = 0; i < bytes.size(); i += n)
        emit received(bytes.mid(i, n));
}

QByteArray FakeLine::written() const
{
    QByteArray all;
    for (const QByteArray& w : m_writes)
        all += w;
    return all;
}
