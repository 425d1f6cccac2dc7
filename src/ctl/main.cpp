#include "ctl/ctl_command.h"
#include "ctl/ctl_connect.h"
#include "directory/data_folder.h"
#include "platform/tcp_line.h"

#include <QCommandLineParser>
#include <QCoreApplication>
#include <QRegularExpression>
#include <cstdio>

namespace {

// A negative number ("-18.5") is an argument, not an option: it is hidden
// from the parser behind this mark and unmarked afterwards.
constexpr QChar kNumberMark(0xE000);

QStringList markNumbers(QStringList args)
{
    static const QRegularExpression number(QStringLiteral(R"(^-\.?\d)"));
    for (qsizetype i = 1; i < args.size(); ++i) {
        if (number.match(args[i]).hasMatch())
            args[i].prepend(kNumberMark);
    }
    return args;
}

QString unmark(QString text)
{
    if (text.startsWith(kNumberMark))
        text.remove(0, 1);
    return text;
}

QStringList unmark(QStringList list)
{
    for (QString& s : list)
        s = unmark(s);
    return list;
}

QList<QCommandLineOption> globalOptions()
{
    return {
        QCommandLineOption(QStringLiteral("data-dir"), QStringLiteral("The data folder (default $XDG_DATA_HOME/q19)."),
                           QStringLiteral("DIR")),
        QCommandLineOption(QStringLiteral("id"),
                           QStringLiteral("The instrument of that directory row (default: the selected one, "
                                          "as the workstation selects it at start)."),
                           QStringLiteral("ID")),
        QCommandLineOption(QStringLiteral("port"), QStringLiteral("A serial device instead of the stored port."),
                           QStringLiteral("PATH")),
        QCommandLineOption(QStringLiteral("tcp"),
                           QStringLiteral("A serial server or simulator on the network instead."),
                           QStringLiteral("HOST:PORT")),
        QCommandLineOption(QStringLiteral("yes"), QStringLiteral("Answer confirmations with OK.")),
        QCommandLineOption(QStringLiteral("json"), QStringLiteral("Structured results where a command has them.")),
        QCommandLineOption({QStringLiteral("h"), QStringLiteral("help")},
                           QStringLiteral("This text; after a command, the command's own.")),
    };
}

const QString kConventions = QStringLiteral(
    "Options may stand before or after the command. Messages go to stderr as\n"
    "\"Title: line / line\". Exit 0 when the dialogue completed, 1 when it ended in\n"
    "a failure message, 2 for a usage error.\n");

// The parser for one command, or for finding the command (null: every
// command's options, so that none of them hides the command's name).
void setUp(QCommandLineParser& parser, const ctl::Command* command)
{
    parser.setSingleDashWordOptionMode(QCommandLineParser::ParseAsLongOptions);
    QStringList known;
    const auto addOnce = [&](const QCommandLineOption& option) {
        if (known.contains(option.names().first()))
            return;
        known += option.names();
        parser.addOption(option);
    };
    for (const QCommandLineOption& option : globalOptions())
        addOnce(option);
    const QList<ctl::Command> commands = command ? QList<ctl::Command>{*command} : ctl::all();
    for (const ctl::Command& c : commands) {
        for (const QCommandLineOption& option : c.options)
            addOnce(option);
    }
    if (command) {
        parser.addPositionalArgument(command->name, command->summary,
                                     (command->name + QLatin1Char(' ') + command->usage).trimmed());
    } else {
        parser.addPositionalArgument(QStringLiteral("command"), QStringLiteral("One of the commands below."),
                                     QStringLiteral("COMMAND [ARGS...]"));
    }
}

// Qt names the program by the path it was started with.
QString helpText(QCommandLineParser& parser)
{
    QString text = parser.helpText();
    const qsizetype eol = text.indexOf(QLatin1Char('\n'));
    const QString first = text.left(eol);
    const qsizetype options = first.indexOf(QLatin1String(" [options]"));
    if (first.startsWith(QLatin1String("Usage: ")) && options > 0)
        text.replace(0, options, QStringLiteral("Usage: q19ctl"));
    return text;
}

void print(FILE* to, const QString& text)
{
    std::fputs(text.toLocal8Bit().constData(), to);
    std::fflush(to);
}

QString globalHelp()
{
    // Only the shared options: each command lists its own under --help.
    QCommandLineParser shared;
    shared.setApplicationDescription(QStringLiteral("The Q-19 workstation without windows."));
    for (const QCommandLineOption& option : globalOptions())
        shared.addOption(option);
    shared.addPositionalArgument(QStringLiteral("command"), QStringLiteral("One of the commands below."),
                                 QStringLiteral("COMMAND [ARGS...]"));
    QString text = helpText(shared) + QLatin1Char('\n') + kConventions + QStringLiteral("\nCommands:\n");
    for (const ctl::Command& c : ctl::all())
        text += QStringLiteral("  %1 %2\n      %3\n").arg(c.name, c.usage, c.summary);
    text += QStringLiteral("\n\"q19ctl COMMAND --help\" shows a command's options.\n");
    return text;
}

int globalUsageError(const QString& why)
{
    print(stderr, QStringLiteral("q19ctl: %1\nRun \"q19ctl --help\" for the commands and options.\n").arg(why));
    return ctl::Usage;
}

// The Qt library's own warnings (a socket read after the peer went, a
// device not open) say nothing a user can act on; the program's messages go
// to stderr themselves or through a "q19" logging category.
void messageFilter(QtMsgType type, const QMessageLogContext& context, const QString& text)
{
    const bool ours = context.category && QByteArray(context.category).startsWith("q19");
    if (!ours && type != QtFatalMsg)
        return;
    std::fprintf(stderr, "%s\n", text.toLocal8Bit().constData());
    std::fflush(stderr);
    if (type == QtFatalMsg)
        std::abort();
}

} // namespace

int main(int argc, char** argv)
{
    qInstallMessageHandler(messageFilter);
    QCoreApplication app(argc, argv);
    QCoreApplication::setApplicationName(QStringLiteral("q19"));
    const QStringList args = markNumbers(app.arguments());

    // First the command's name, then its own options are known.
    QCommandLineParser finder;
    setUp(finder, nullptr);
    finder.parse(args);
    const QStringList positional = unmark(finder.positionalArguments());
    if (positional.isEmpty()) {
        if (finder.isSet(QStringLiteral("help"))) {
            print(stdout, globalHelp());
            return ctl::Ok;
        }
        if (!finder.unknownOptionNames().isEmpty())
            return globalUsageError(finder.errorText());
        return globalUsageError(QStringLiteral("no command given"));
    }
    const ctl::Command* command = ctl::find(positional.first());
    if (!command)
        return globalUsageError(QStringLiteral("unknown command %1").arg(positional.first()));

    QCommandLineParser parser;
    setUp(parser, command);
    if (!parser.parse(args))
        return ctl::usageError(command->name, parser.errorText());
    if (parser.isSet(QStringLiteral("help"))) {
        print(stdout, helpText(parser) + QLatin1Char('\n') + kConventions);
        return ctl::Ok;
    }

    CtlOptions options;
    options.args = unmark(parser.positionalArguments()).mid(1);
    options.yes = parser.isSet(QStringLiteral("yes"));
    options.json = parser.isSet(QStringLiteral("json"));
    for (const QString& name : {QStringLiteral("data-dir"), QStringLiteral("id"), QStringLiteral("port"),
                                QStringLiteral("tcp")}) {
        if (parser.isSet(name) && unmark(parser.value(name)).isEmpty())
            return ctl::usageError(command->name, QStringLiteral("--%1 needs a value").arg(name));
    }
    options.dataDir = parser.value(QStringLiteral("data-dir"));
    options.id = unmark(parser.value(QStringLiteral("id")));
    const bool port = parser.isSet(QStringLiteral("port"));
    options.tcp = parser.isSet(QStringLiteral("tcp"));
    if (port && options.tcp)
        return ctl::usageError(command->name, QStringLiteral("--port and --tcp exclude each other"));
    options.port = parser.value(options.tcp ? QStringLiteral("tcp") : QStringLiteral("port"));
    if (options.tcp && !TcpLine::looksLikeTcp(options.port))
        return ctl::usageError(command->name,
                               QStringLiteral("--tcp %1 is not a network address: give HOST:PORT, "
                                              "the port a number from 1 to 65535")
                                   .arg(options.port));
    for (const QCommandLineOption& option : command->options) {
        if (!parser.isSet(option.names().first()))
            continue;
        const QStringList values = unmark(parser.values(option.names().first()));
        for (const QString& name : option.names())
            options.own.insert(name, values.isEmpty() ? QStringList{QString()} : values);
    }

    options.dataDir = DataFolder::location(options.dataDir);
    if (command->needsInstrument && options.id.isEmpty())
        options.id = ctl::selectedInstrument(options.dataDir);
    return command->run(options);
}
