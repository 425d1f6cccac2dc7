#include "ctl/ctl_command.h"

#include <QCoreApplication>
#include <QDir>
#include <QStandardPaths>
#include <cstdio>

namespace {

void printUsage(FILE* to)
{
    QString text = QStringLiteral(
        "Usage: q19ctl [--data-dir DIR] [--id ID] [--port PATH | --tcp HOST:PORT] [--yes] [--json]\n"
        "              COMMAND [ARGS...]\n\n"
        "  --data-dir DIR     the data folder (default $XDG_DATA_HOME/q19)\n"
        "  --id ID            the instrument of that directory row (default: the selected one)\n"
        "  --port PATH        a serial device instead of the stored port\n"
        "  --tcp HOST:PORT    a serial server or simulator on the network instead\n"
        "  --yes              answer confirmations with OK\n"
        "  --json             structured results where a command has them\n"
        "  --help             this text\n\n"
        "Messages go to stderr as \"Title: line / line\". Exit 0 when the dialogue\n"
        "completed, 1 when it ended in a failure message, 2 for a usage error.\n\n"
        "Commands:\n");
    for (const ctl::Command& c : ctl::all())
        text += QStringLiteral("  %1 %2\n      %3\n").arg(c.name, c.usage, c.summary);
    std::fprintf(to, "%s", text.toLocal8Bit().constData());
}

int usageError(const QString& why)
{
    std::fprintf(stderr, "q19ctl: %s\n", why.toLocal8Bit().constData());
    printUsage(stderr);
    return ctl::Usage;
}

} // namespace

int main(int argc, char** argv)
{
    QCoreApplication app(argc, argv);
    QCoreApplication::setApplicationName(QStringLiteral("q19"));
    QStringList args = app.arguments().mid(1);

    CtlOptions options;
    bool tcp = false;
    bool port = false;
    while (!args.isEmpty() && args.first().startsWith(QLatin1String("--"))) {
        QString option = args.takeFirst();
        QString value;
        const qsizetype eq = option.indexOf(QLatin1Char('='));
        if (eq > 0) {
            value = option.mid(eq + 1);
            option.truncate(eq);
        }
        const auto needValue = [&]() -> bool {
            if (eq > 0)
                return true;
            if (args.isEmpty())
                return false;
            value = args.takeFirst();
            return true;
        };
        if (option == QLatin1String("--help")) {
            printUsage(stdout);
            return ctl::Ok;
        } else if (option == QLatin1String("--yes")) {
            options.yes = true;
        } else if (option == QLatin1String("--json")) {
            options.json = true;
        } else if (option == QLatin1String("--data-dir") || option == QLatin1String("--id")
                   || option == QLatin1String("--port") || option == QLatin1String("--tcp")) {
            if (!needValue() || value.isEmpty())
                return usageError(QStringLiteral("%1 needs a value").arg(option));
            if (option == QLatin1String("--data-dir"))
                options.dataDir = value;
            else if (option == QLatin1String("--id"))
                options.id = value;
            else {
                (option == QLatin1String("--tcp") ? tcp : port) = true;
                options.port = value;
            }
        } else {
            return usageError(QStringLiteral("unknown option %1").arg(option));
        }
    }
    if (tcp && port)
        return usageError(QStringLiteral("--port and --tcp exclude each other"));
    if (tcp && !options.port.contains(QLatin1Char(':')))
        return usageError(QStringLiteral("--tcp needs HOST:PORT"));
    if (args.isEmpty())
        return usageError(QStringLiteral("no command given"));

    const ctl::Command* command = ctl::find(args.first());
    if (!command)
        return usageError(QStringLiteral("unknown command %1").arg(args.first()));
    options.args = args.mid(1);
    if (options.dataDir.isEmpty())
        options.dataDir = QStandardPaths::writableLocation(QStandardPaths::GenericDataLocation)
            + QStringLiteral("/q19");
    options.dataDir = QDir(options.dataDir).absolutePath();
    return command->run(options);
}
