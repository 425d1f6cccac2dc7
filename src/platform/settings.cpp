#include "platform/settings.h"

#include <QSettings>

namespace {
const QString kSection = QStringLiteral("Properties/");
}

QtSettings::QtSettings() = default;

QtSettings::QtSettings(const QString& iniFile) : m_file(iniFile) {}

QVariant QtSettings::value(const QString& key, const QVariant& fallback) const
{
    if (m_file.isEmpty())
        return QSettings().value(kSection + key, fallback);
    return QSettings(m_file, QSettings::IniFormat).value(kSection + key, fallback);
}

void QtSettings::setValue(const QString& key, const QVariant& value)
{
    if (m_file.isEmpty()) {
        QSettings().setValue(kSection + key, value);
        return;
    }
    QSettings(m_file, QSettings::IniFormat).setValue(kSection + key, value);
}
