#pragma once

#include <QCommandLineOption>
#include <QHash>
#include <QString>
#include <QStringList>
#include <functional>

// The options every command shares:
// q19ctl [--data-dir DIR] [--id ID] [--port PATH | --tcp HOST:PORT] [--yes] [--json] COMMAND ...
// Options may stand before or after the command's name and arguments.
struct CtlOptions {
    QString dataDir; // the data folder, already resolved
    QString id;      // the instrument; filled with the directory's selected one when not given
    QString port;    // a device path or host:port that overrides the stored port
    bool tcp = false;  // port came from --tcp
    bool yes = false;  // confirmations are answered OK
    bool json = false; // structured result on stdout
    QStringList args;  // what follows the command's name, options taken out

    // The command's own options that were given, by every name of the option.
    QHash<QString, QStringList> own;
    bool isSet(const QString& name) const { return own.contains(name); }
    // The last value given to the option, or empty.
    QString value(const QString& name) const
    {
        const QStringList v = own.value(name);
        return v.isEmpty() ? QString() : v.last();
    }
};

namespace ctl {

enum Exit { Ok = 0, Failure = 1, Usage = 2 };

struct Command {
    QString name;
    QString usage;   // the command's own arguments, for --help
    QString summary; // one line
    std::function<int(const CtlOptions&)> run;
    // The command's own options; the parser refuses any other. An option's
    // name means the same to every command that declares it.
    QList<QCommandLineOption> options = {};
    // False for commands that never talk to an instrument (no --id lookup).
    bool needsInstrument = true;
};

// The command table. A command's source file registers it with a static
// Registration, so that adding a command touches no other file.
void add(const Command& command);
const Command* find(const QString& name);
QList<Command> all();

struct Registration {
    explicit Registration(const Command& command) { add(command); }
};

// Progress for the user, on stderr.
void progress(const QString& text);

// Prints "q19ctl <command>: why" and the command's usage line on stderr;
// returns Usage.
int usageError(const QString& command, const QString& why);

} // namespace ctl
