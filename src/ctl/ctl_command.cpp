#include "ctl/ctl_command.h"

#include <QMap>
#include <cstdio>

namespace ctl {

namespace {
QMap<QString, Command>& table()
{
    static QMap<QString, Command> commands;
    return commands;
}
} // namespace

void add(const Command& command)
{
    table().insert(command.name, command);
}

const Command* find(const QString& name)
{
    const auto it = table().constFind(name);
    return it == table().cend() ? nullptr : &*it;
}

QList<Command> all()
{
    return table().values();
}

void progress(const QString& text)
{
    std::fprintf(stderr, "%s\n", text.toLocal8Bit().constData());
    std::fflush(stderr);
}

int usageError(const QString& command, const QString& why)
{
    const Command* c = find(command);
    const QString usage = c ? (c->name + QLatin1Char(' ') + c->usage).trimmed() : command;
    std::fprintf(stderr, "q19ctl %s: %s\nUsage: q19ctl [options] %s\nRun \"q19ctl %s --help\" for its options.\n",
                 command.toLocal8Bit().constData(), why.toLocal8Bit().constData(), usage.toLocal8Bit().constData(),
                 command.toLocal8Bit().constData());
    return Usage;
}

} // namespace ctl
