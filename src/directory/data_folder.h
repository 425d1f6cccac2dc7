#pragma once

#include "platform/store.h"

#include <QString>

// The directory q-19.db: one table, one row per instrument. ID holds digits
// only (the instrument reports it as a number); ID and Name are each unique,
// which the directory engine checks before a row is written.
namespace Table1 {
inline const QString TableName = QStringLiteral("Table1");
enum Field { ID, Name, Address, townstate, phoneno, glacinorphone, FieldCount };
QList<Store::Column> columns();
} // namespace Table1

// The one folder that holds every file of the program: the directory
// q-19.db, the template gl.db, the layout templates s0.slf .. s9.slf, and per
// instrument t-<id>.db, t-<id>.bak and s0-<id>.slf .. s9-<id>.slf.
//
// File names made from an instrument ID go through the builders below, which
// accept only a positive number of at most 5 digits written without sign,
// blanks or leading zeros. Anything else gives an empty name, so no text typed
// into the ID box can name a file outside the folder.
//
// Layout files hold one header line, "Q19 layout 1", followed by the
// layout's own lines; the templates have the header alone (no panes yet).
class DataFolder {
public:
    static constexpr int LayoutCount = 10; // s0 .. s9
    static constexpr int MaxIdDigits = 5;
    static inline const QString DirectoryFileName = QStringLiteral("q-19.db");
    static inline const QString TemplateFileName = QStringLiteral("gl.db");
    static inline const QString LayoutHeader = QStringLiteral("Q19 layout 1");

    // The demo instrument of a new folder, wired to the built-in simulator.
    static inline const QString DemoId = QStringLiteral("1");
    static inline const QString DemoName = QStringLiteral("Demo Cold Store");
    static inline const QString DemoPort = QStringLiteral("Simulator (built-in)");

    // The folder named by --data-dir, else the user's data folder
    // ($XDG_DATA_HOME/q19, normally ~/.local/share/q19).
    static QString location(const QString& dataDirOption = {});
    // The value of --data-dir DIR or --data-dir=DIR in a command line, or empty.
    static QString dataDirOption(const QStringList& arguments);

    explicit DataFolder(const QString& path);

    QString path() const { return m_path; }

    // Creates what is missing at first start: the folder, gl.db, the layout
    // templates, and q-19.db with the demo instrument and its files. Files
    // that exist are left as they are. False with the reason in *error.
    bool ensure(QString* error = nullptr);
    // The demo's start: ensure(), then the demo instrument back if its row or
    // its files have gone, and its line set to the built-in simulator.
    bool ensureDemo(QString* error = nullptr);
    // Removes every file the program keeps in the folder (directory,
    // templates, instruments, back-ups, layouts); other files stay. The demo
    // starts afresh from here.
    bool removeProgramFiles(QString* error = nullptr);

    QString directoryFile() const;
    QString templateFile() const;
    // Empty for n outside 0..9.
    QString layoutTemplate(int n) const;

    // A valid instrument ID: "1" .. "99999".
    static bool isValidId(const QString& id);
    // Empty when id is not valid.
    QString instrumentFile(const QString& id) const; // t-<id>.db
    QString backupFile(const QString& id) const;     // t-<id>.bak
    QString layoutFile(int n, const QString& id) const; // s<n>-<id>.slf

    // File operations of the folder's own files. A data base goes together
    // with its journal files (-wal, -shm): a journal left beside a replaced
    // file would be played into the new one.
    static bool copyReplacing(const QString& from, const QString& to, QString* error = nullptr);
    static bool removeDataBase(const QString& path);

private:
    bool createDirectory(QString* error) const;
    bool createLayoutTemplates(QString* error) const;
    bool createDemoInstrument(QString* error) const;
    bool createDemoFiles(QString* error) const;
    bool addDemoRow(QString* error) const;

    QString m_path;
};
