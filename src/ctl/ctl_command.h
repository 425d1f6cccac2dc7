#pragma once

#include <QString>
#include <QStringList>
#include <functional>

// The options every command shares:
// q19ctl [--data-dir DIR] [--id ID] [--port PATH | --tcp HOST:PORT] [--yes] [--json] COMMAND ...
struct CtlOptions {
    QString dataDir; // the data folder, already resolved
    QString id;      // the instrument; empty: the directory's selected one
    QString port;    // a device path or host:port that overrides the stored port
    bool yes = false;  // confirmations are answered OK
    bool json = false; // structured result on stdout
    QStringList args;  // what follows the command's name
};

namespace ctl {

enum Exit { Ok = 0, Failure = 1, Usage = 2 };

struct Command {
    QString name;
    QString usage;   // the command's own arguments, for --help
    QString summary; // one line
    std::function<int(const CtlOptions&)> run;
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

} // namespace ctl
