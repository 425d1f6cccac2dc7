// The serial ports this machine has, for the port list.
#include "link/ccform1_engine.h"

#include <QDir>
#include <QFileInfo>
#include <QHash>
#include <QSerialPortInfo>

QList<ccForm1_engine::PortEntry> ccForm1_engine::availablePorts()
{
    // A USB adapter's ttyUSB number changes between boots; its by-id name does not.
    QHash<QString, QString> stableName;
    const QDir byId(QStringLiteral("/dev/serial/by-id"));
    for (const QFileInfo& link : byId.entryInfoList(QDir::System | QDir::Files | QDir::NoDotAndDotDot))
        stableName.insert(link.canonicalFilePath(), link.absoluteFilePath());

    QList<PortEntry> ports;
    for (const QSerialPortInfo& info : QSerialPortInfo::availablePorts()) {
        PortEntry e;
        e.name = stableName.value(info.systemLocation(), info.systemLocation());
        QStringList about;
        if (!info.description().isEmpty())
            about << info.description();
        if (!info.manufacturer().isEmpty() && info.manufacturer() != info.description())
            about << info.manufacturer();
        if (e.name != info.systemLocation())
            about << info.systemLocation();
        e.description = about.join(QStringLiteral(", "));
        ports.append(e);
    }
    return ports;
}
