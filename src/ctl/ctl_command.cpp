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

} // namespace ctl
