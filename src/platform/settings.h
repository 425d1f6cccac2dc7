#pragma once

#include <QHash>
#include <QString>
#include <QVariant>

// The workstation's own settings store (not the instrument's), section "Properties".
class Settings {
public:
    virtual ~Settings() = default;
    virtual QVariant value(const QString& key, const QVariant& fallback = {}) const = 0;
    virtual void setValue(const QString& key, const QVariant& value) = 0;
};

// QSettings under the organisation and application names, or in a given file.
class QtSettings : public Settings {
public:
    QtSettings();
    explicit QtSettings(const QString& iniFile);
    QVariant value(const QString& key, const QVariant& fallback = {}) const override;
    void setValue(const QString& key, const QVariant& value) override;

private:
    QString m_file;
};

class MemorySettings : public Settings {
public:
    QVariant value(const QString& key, const QVariant& fallback = {}) const override
    {
        return m_values.value(key, fallback);
    }
    void setValue(const QString& key, const QVariant& value) override { m_values.insert(key, value); }
    const QHash<QString, QVariant>& values() const { return m_values; }

private:
    QHash<QString, QVariant> m_values;
};
