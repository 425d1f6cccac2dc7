#include "directory/data_folder.h"

#include "directory/demo_store.h"
#include "setpoints/instrument_schema.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QRegularExpression>
#include <QSaveFile>
#include <QStandardPaths>

namespace {

// The directory's own version, written into q-19.db.
constexpr int DirectoryVersion = 1;

constexpr int DirectConnection = 1;

void setError(QString* error, const QString& text)
{
    if (error)
        *error = text;
}

} // namespace

QList<Store::Column> Table1::columns()
{
    using T = Store::ColumnType;
    return {
        {QStringLiteral("ID"), T::Integer},
        {QStringLiteral("Name"), T::Text},
        {QStringLiteral("Address"), T::Text},
        {QStringLiteral("townstate"), T::Text},
        {QStringLiteral("phoneno"), T::Text},
        {QStringLiteral("glacinorphone"), T::Text},
    };
}

QString DataFolder::location(const QString& dataDirOption)
{
    if (!dataDirOption.isEmpty())
        return QDir(dataDirOption).absolutePath();
    // GenericDataLocation is $XDG_DATA_HOME, else ~/.local/share.
    const QString base = QStandardPaths::writableLocation(QStandardPaths::GenericDataLocation);
    return QDir(base).absoluteFilePath(QStringLiteral("q19"));
}

QString DataFolder::dataDirOption(const QStringList& arguments)
{
    static const QString option = QStringLiteral("--data-dir");
    for (int i = 0; i < arguments.size(); ++i) {
        const QString& a = arguments.at(i);
        if (a == option)
            return i + 1 < arguments.size() ? arguments.at(i + 1) : QString();
        if (a.startsWith(option + QLatin1Char('=')))
            return a.mid(option.size() + 1);
    }
    return {};
}

DataFolder::DataFolder(const QString& path) : m_path(QDir(path).absolutePath()) {}

QString DataFolder::directoryFile() const
{
    return QDir(m_path).filePath(DirectoryFileName);
}

QString DataFolder::templateFile() const
{
    return QDir(m_path).filePath(TemplateFileName);
}

QString DataFolder::layoutTemplate(int n) const
{
    if (n < 0 || n >= LayoutCount)
        return {};
    return QDir(m_path).filePath(QStringLiteral("s%1.slf").arg(n));
}

bool DataFolder::isValidId(const QString& id)
{
    static const QRegularExpression digits(QStringLiteral("\\A[1-9][0-9]{0,4}\\z"));
    return digits.match(id).hasMatch();
}

QString DataFolder::instrumentFile(const QString& id) const
{
    return isValidId(id) ? QDir(m_path).filePath(QStringLiteral("t-%1.db").arg(id)) : QString();
}

QString DataFolder::backupFile(const QString& id) const
{
    return isValidId(id) ? QDir(m_path).filePath(QStringLiteral("t-%1.bak").arg(id)) : QString();
}

QString DataFolder::layoutFile(int n, const QString& id) const
{
    if (!isValidId(id) || n < 0 || n >= LayoutCount)
        return {};
    return QDir(m_path).filePath(QStringLiteral("s%1-%2.slf").arg(n).arg(id));
}

bool DataFolder::copyReplacing(const QString& from, const QString& to, QString* error)
{
    if (!QFileInfo(from).isFile()) {
        setError(error, QStringLiteral("%1 does not exist.").arg(QDir::toNativeSeparators(from)));
        return false;
    }
    if (QFileInfo::exists(to) && !removeDataBase(to)) {
        setError(error, QStringLiteral("%1 cannot be replaced.").arg(QDir::toNativeSeparators(to)));
        return false;
    }
    removeDataBase(to); // stray journals of an earlier file
    if (!QFile::copy(from, to)) {
        setError(error, QStringLiteral("%1 cannot be copied to %2.")
                            .arg(QDir::toNativeSeparators(from), QDir::toNativeSeparators(to)));
        return false;
    }
    // A copy of a read-only template must stay writable.
    QFile::setPermissions(to, QFile::permissions(to) | QFile::WriteOwner | QFile::ReadOwner);
    return true;
}

bool DataFolder::removeDataBase(const QString& path)
{
    QFile::remove(path + QStringLiteral("-wal"));
    QFile::remove(path + QStringLiteral("-shm"));
    return !QFileInfo::exists(path) || QFile::remove(path);
}

bool DataFolder::ensure(QString* error)
{
    if (!createDirectory(error))
        return false;
    if (!QFileInfo::exists(templateFile()) && !createInstrumentTemplate(templateFile(), error))
        return false;
    if (!createLayoutTemplates(error))
        return false;
    if (QFileInfo::exists(directoryFile()))
        return true;
    return createDemoInstrument(error);
}

bool DataFolder::createDirectory(QString* error) const
{
    if (QFileInfo(m_path).isDir())
        return true;
    if (!QDir().mkpath(m_path)) {
        setError(error, QStringLiteral("The data folder %1 cannot be created.")
                            .arg(QDir::toNativeSeparators(m_path)));
        return false;
    }
    return true;
}

bool DataFolder::createLayoutTemplates(QString* error) const
{
    for (int n = 0; n < LayoutCount; ++n) {
        const QString path = layoutTemplate(n);
        if (QFileInfo::exists(path))
            continue;
        QSaveFile file(path);
        if (!file.open(QIODevice::WriteOnly)) {
            setError(error, file.errorString());
            return false;
        }
        file.write(LayoutHeader.toUtf8() + '\n');
        if (!file.commit()) {
            setError(error, file.errorString());
            return false;
        }
    }
    return true;
}

// The demo instrument's files: the templates' copies, its line set to the
// built-in simulator, and the set points the simulator holds.
bool DataFolder::createDemoFiles(QString* error) const
{
    const QString db = instrumentFile(DemoId);
    if (!copyReplacing(templateFile(), db, error))
        return false;
    for (int n = 0; n < LayoutCount; ++n) {
        if (!copyReplacing(layoutTemplate(n), layoutFile(n, DemoId), error))
            return false;
    }
    if (!fillDemoSetpoints(db, error)) {
        removeDataBase(db);
        return false;
    }
    return true;
}

namespace {

bool setDemoLine(const QString& db, QString* error)
{
    std::unique_ptr<Store> store = Store::open(db, error);
    if (!store)
        return false;
    std::unique_ptr<Recordset> info = store->openRecordset(kInfoTable);
    if (!info || !info->setCell(kInfoPortRow, kInfoConnectionColumn, DataFolder::DemoPort)
        || !info->setCell(kInfoConnectionTypeRow, kInfoConnectionColumn, DirectConnection)) {
        setError(error, info ? info->lastError() : store->lastError());
        return false;
    }
    return true;
}

} // namespace

// A folder without a directory gets one with the demo instrument, so that the
// program opens ready to connect to the built-in simulator.
bool DataFolder::createDemoInstrument(QString* error) const
{
    const QString db = instrumentFile(DemoId);
    if (!QFileInfo::exists(db) && (!createDemoFiles(error) || !setDemoLine(db, error)))
        return false;

    // Built under a temporary name, so that a failure leaves no half directory
    // that the next start would take for a real one.
    const QString partial = directoryFile() + QStringLiteral(".new");
    removeDataBase(partial);
    {
        std::unique_ptr<Store> store = Store::create(partial, DirectoryVersion, error);
        if (!store)
            return false;
        std::unique_ptr<Recordset> rows;
        if (store->createTable(Table1::TableName, Table1::columns()))
            rows = store->openRecordset(Table1::TableName);
        if (!rows || !rows->AddNew() || !rows->setValue(Table1::ID, DemoId.toInt())
            || !rows->setValue(Table1::Name, DemoName) || !rows->Update()) {
            setError(error, rows ? rows->lastError() : store->lastError());
            rows.reset();
            store.reset();
            removeDataBase(partial);
            return false;
        }
    }
    if (!QFile::rename(partial, directoryFile())) {
        removeDataBase(partial);
        setError(error, QStringLiteral("%1 cannot be created.").arg(QDir::toNativeSeparators(directoryFile())));
        return false;
    }
    return true;
}

// The demo's row in an existing directory, under the demo's name unless
// another instrument took it.
bool DataFolder::addDemoRow(QString* error) const
{
    std::unique_ptr<Store> store = Store::open(directoryFile(), error);
    if (!store)
        return false;
    std::unique_ptr<Recordset> rows = store->openRecordset(Table1::TableName);
    if (!rows) {
        setError(error, store->lastError());
        return false;
    }
    bool nameTaken = false;
    for (int i = 0; i < rows->RecordCount(); ++i) {
        rows->setAbsolutePosition(i);
        if (rows->value(Table1::ID).toString() == DemoId)
            return true;
        nameTaken = nameTaken || rows->value(Table1::Name).toString().compare(DemoName, Qt::CaseInsensitive) == 0;
    }
    const QString name = nameTaken ? DemoName + QStringLiteral(" ") + DemoId : DemoName;
    if (!rows->AddNew() || !rows->setValue(Table1::ID, DemoId.toInt()) || !rows->setValue(Table1::Name, name)
        || !rows->Update()) {
        setError(error, rows->lastError());
        return false;
    }
    return true;
}

bool DataFolder::ensureDemo(QString* error)
{
    if (!ensure(error))
        return false;
    const QString db = instrumentFile(DemoId);
    if (!QFileInfo::exists(db) && !createDemoFiles(error))
        return false;
    return addDemoRow(error) && setDemoLine(db, error);
}

bool DataFolder::removeProgramFiles(QString* error)
{
    QDir dir(m_path);
    if (!dir.exists())
        return true;
    const QStringList ours = {DirectoryFileName, TemplateFileName, QStringLiteral("t-*.db"),
                              QStringLiteral("t-*.bak"), QStringLiteral("s*.slf")};
    for (const QString& name : dir.entryList(ours, QDir::Files | QDir::Hidden)) {
        if (!removeDataBase(dir.filePath(name))) {
            setError(error, QStringLiteral("%1 cannot be removed.").arg(QDir::toNativeSeparators(dir.filePath(name))));
            return false;
        }
    }
    return true;
}
