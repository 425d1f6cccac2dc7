#include "platform/device_line.h"

#include <QIODevice>

void DeviceLine::setDevice(QIODevice& device)
{
    m_device = &device;
    connect(m_device, &QIODevice::readyRead, this, &DeviceLine::onReadyRead);
}

bool DeviceLine::setSettings(const LineSettings& settings, QString*)
{
    m_settings = settings;
    return true;
}

void DeviceLine::close()
{
    ++m_closes;
    m_closing = true;
    closeDevice();
    m_closing = false;
}

bool DeviceLine::write(const QByteArray& bytes)
{
    if (!isOpen())
        return false;
    if (m_device->write(bytes) != bytes.size())
        return false;
    flushOutput();
    m_wroteSinceArrival = true;
    return true;
}

void DeviceLine::discardInput()
{
    // A closed device has nothing to give (and Qt warns about the read).
    if (m_wroteSinceArrival || !m_device->isOpen())
        return;
    m_device->readAll();
    dropWaitingInput();
}

void DeviceLine::onReadyRead()
{
    if (m_deliveryQueued)
        return;
    m_deliveryQueued = true;
    QMetaObject::invokeMethod(this, &DeviceLine::deliverArrived, Qt::QueuedConnection);
}

void DeviceLine::deliverArrived()
{
    m_deliveryQueued = false;
    if (!m_device->isOpen())
        return;
    m_wroteSinceArrival = false;
    const QByteArray bytes = m_device->readAll();
    if (!bytes.isEmpty())
        emit received(bytes);
}

void DeviceLine::deviceLost()
{
    if (m_closing)
        return;
    const int closes = m_closes;
    deliverArrived();
    if (m_closes != closes)
        return;
    close();
    emit lineEvent(LineLost);
}
