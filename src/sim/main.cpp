// q19sim: a Glacinor Model Q-19 on a pseudo-terminal or a TCP port.

#include "sim/sim_instrument.h"
#include "sim/sim_server.h"

#include <QCommandLineParser>
#include <QCoreApplication>
#include <QDateTime>
#include <QFile>
#include <QTextStream>

#include <cstdio>
#include <limits>

namespace {

const char* const ScenarioHelp = R"(
Scenario keys, also control commands on stdin (one per line; the answer
"ok: ..." or "error: ..." goes to stderr). When stdin is a pipe and is
closed, q19sim ends.
  version = V         Report another firmware version.
  id = N, resets = N  Identity fields.
  speed = N           Plant speed factor.
  dial = R[,R...]     Results of successive dials: connect, busy, no carrier,
                      no dialtone; the last one stands for later dials.
  drop = KIND:N[,N]   Lose the reply to the Nth command of KIND (F, T, t, K,
                      CONNECTK, c, a, d, e, P, D, b, S, U, s, u, E, Q, q, J,
                      EOT, key, or any).
  garble = KIND:N     Change a digit of the Nth echo of KIND (P or d).
  delay = MS          Every reply waits MS milliseconds.
  batch = N[:GAP]     Replies go out in pieces of N bytes, GAP ms apart.
  nocomp = 1|0        Answer "nocomp" to everything.
  wrong_id = N|off    Report this ID instead of the real one.
  wrong_version = V|off  Report this version text in the identity.
  brumalet_delay = MS Time from "dxstart" to "evapfrst" (default 2500).
  torvanel_alarm = S:I[:0]  Set (or clear) alarm flag I of Torvanel S.
  clear_faults        Forget every fault above.
Control commands only:
  reset               Restart: resets + 1, "AT&FE0" on the line.
  drop_line [MS]      Lose the line: the modem says NO CARRIER; a direct line
                      goes deaf for MS ms (default 10000).
  alarm CH            Log an alarm of channel CH now ("alm-new" follows).
)";

int usage(const QString& error)
{
    std::fprintf(stderr, "q19sim: %s\nTry q19sim --help\n", qPrintable(error));
    return 2;
}

struct OptionNames {
    QString pty, tcp, version, id, resets, seed, speed, start, history, alarm, data, power, modem, nocomp, greet,
        scenario;
};

OptionNames addOptions(QCommandLineParser& parser)
{
    OptionNames n;
    const auto option = [&parser](const QString& name, const QString& help, const QString& value = {}) {
        parser.addOption(QCommandLineOption(name, help, value));
        return name;
    };
    n.pty = option(QStringLiteral("pty"),
                                  QStringLiteral("Open a pseudo-terminal; its path is the first line on stdout. "
                                                 "Point the workstation's port at that path."));
    n.tcp = option(QStringLiteral("tcp"), QStringLiteral("Serve on 127.0.0.1:PORT, one client at a time."),
                                  QStringLiteral("PORT"));
    n.version = option(QStringLiteral("version"),
                                      QStringLiteral("Firmware version text (default 9.6), e.g. 6.5, 8.7, 14."),
                                      QStringLiteral("V"));
    n.id = option(QStringLiteral("id"), QStringLiteral("Instrument ID (default 1)."), QStringLiteral("N"));
    n.resets = option(QStringLiteral("resets"), QStringLiteral("Number of resets reported (default 0)."),
                                     QStringLiteral("N"));
    n.seed = option(QStringLiteral("seed"), QStringLiteral("Seed of the plant's randomness (default 1)."),
                                   QStringLiteral("N"));
    n.speed = option(QStringLiteral("speed"),
                                    QStringLiteral("Plant time runs N times faster than real time (default 1)."),
                                    QStringLiteral("N"));
    n.start = option(QStringLiteral("start"),
                                    QStringLiteral("Instrument clock at start, \"yyyy-MM-dd hh:mm\" (default: now)."),
                                    QStringLiteral("TIME"));
    n.history = option(QStringLiteral("history-hours"),
                                      QStringLiteral("Hours the plant has run before start, filling the logs "
                                                     "(default 24)."),
                                      QStringLiteral("N"));
    n.alarm = option(QStringLiteral("alarm-log"),
                                    QStringLiteral("Size of the alarm log in records (default 200)."),
                                    QStringLiteral("N"));
    n.data = option(QStringLiteral("data-log"),
                                   QStringLiteral("Size of the data log in records (default 1000)."),
                                   QStringLiteral("N"));
    n.power = option(QStringLiteral("power-log"),
                                    QStringLiteral("Size of the power log in records (default 2000)."),
                                    QStringLiteral("N"));
    n.modem = option(QStringLiteral("modem"),
                                    QStringLiteral("Put a Hayes modem in front: dial, CONNECT 9600, +++."));
    n.nocomp = option(QStringLiteral("nocomp"),
                                     QStringLiteral("The instrument has no computer link: answers \"nocomp\"."));
    n.greet = option(QStringLiteral("greet"),
                                    QStringLiteral("Send \"AT&FE0\" at start also on a pty, where it waits for the "
                                                   "first client (a line nobody listens to loses it, so by default "
                                                   "only a reset greets on the line)."));
    n.scenario = option(QStringLiteral("scenario"),
                                       QStringLiteral("Read \"key = value\" lines (below) at start."),
                                       QStringLiteral("FILE"));
    parser.addOption(QCommandLineOption({QStringLiteral("h"), QStringLiteral("help")}, QStringLiteral("This text.")));
    return n;
}

struct Config {
    sim::Options options;
    sim::Instrument::Settings settings;
    bool pty = false;
    bool greeting = false;
    bool nocomp = false;
    int tcpPort = -1;
    QString scenario;
};

// The options' values into c; the complaint when one is bad.
QString readConfig(const QCommandLineParser& parser, const OptionNames& n, Config& c)
{
    c.pty = parser.isSet(n.pty);
    c.greeting = parser.isSet(n.greet);
    c.nocomp = parser.isSet(n.nocomp);
    c.settings.modem = parser.isSet(n.modem);
    c.scenario = parser.value(n.scenario);
    // Each check names the option whose value is bad.
    const auto integer = [&](const QString& name, int& out, int min) {
        if (!parser.isSet(name))
            return true;
        bool ok = false;
        const int v = parser.value(name).toInt(&ok);
        if (ok && v >= min)
            out = v;
        return ok && v >= min;
    };
    int seed = int(c.options.seed);
    QString bad;
    if (!integer(n.tcp, c.tcpPort, 1) || (parser.isSet(n.tcp) && c.tcpPort > 65535))
        bad = n.tcp;
    else if (parser.isSet(n.version) && parser.value(n.version).isEmpty())
        bad = n.version;
    else if (!integer(n.id, c.settings.id, std::numeric_limits<int>::min()))
        bad = n.id;
    else if (!integer(n.resets, c.options.resets, std::numeric_limits<int>::min()))
        bad = n.resets;
    else if (!integer(n.seed, seed, std::numeric_limits<int>::min()))
        bad = n.seed;
    else if (!integer(n.history, c.options.historyHours, 0))
        bad = n.history;
    else if (!integer(n.alarm, c.options.alarmCapacity, 1))
        bad = n.alarm;
    else if (!integer(n.data, c.options.historyCapacity, 1))
        bad = n.data;
    else if (!integer(n.power, c.options.powerCapacity, 1))
        bad = n.power;
    if (bad.isEmpty() && parser.isSet(n.speed)) {
        bool ok = false;
        c.settings.speed = parser.value(n.speed).toDouble(&ok);
        if (!ok || c.settings.speed <= 0)
            bad = n.speed;
    }
    if (bad.isEmpty() && parser.isSet(n.start)) {
        c.options.start = QDateTime::fromString(parser.value(n.start), QStringLiteral("yyyy-MM-dd hh:mm"));
        if (!c.options.start.isValid())
            bad = n.start;
    }
    if (!bad.isEmpty())
        return QStringLiteral("bad value for --%1: %2").arg(bad, parser.value(bad));
    if (parser.isSet(n.version))
        c.options.version = parser.value(n.version).toLatin1();
    c.options.seed = quint32(seed);
    if (c.pty == (c.tcpPort > 0))
        return QStringLiteral("give exactly one of --pty and --tcp PORT");

    return {};
}

// The scenario file's lines, each as a control command at start.
QString loadScenario(sim::Instrument& instrument, const QString& scenario)
{
    QFile file(scenario);
    if (!file.open(QIODevice::ReadOnly | QIODevice::Text))
        return QStringLiteral("cannot read %1: %2").arg(scenario, file.errorString());
    int lineNo = 0;
    QTextStream in(&file);
    while (!in.atEnd()) {
        ++lineNo;
        const QString error = sim::applyScenarioLine(instrument, in.readLine());
        if (!error.isEmpty())
            return QStringLiteral("%1:%2: %3").arg(scenario).arg(lineNo).arg(error);
    }
    return {};
}

} // namespace

int main(int argc, char** argv)
{
    QCoreApplication app(argc, argv);
    QCommandLineParser parser;
    parser.setApplicationDescription(QStringLiteral(
        "A Glacinor Model Q-19 refrigeration scanner/controller with 216 channels and\n"
        "a living plant, for demos, training and tests. Give one of --pty and --tcp."));
    const OptionNames names = addOptions(parser);

    if (!parser.parse(app.arguments()))
        return usage(parser.errorText());
    if (parser.isSet(QStringLiteral("help"))) {
        QString help = parser.helpText();
        // Qt names the program by the path it was started with.
        const qsizetype options = help.indexOf(QLatin1String(" [options]"));
        if (help.startsWith(QLatin1String("Usage: ")) && options > 0)
            help.replace(0, options, QStringLiteral("Usage: q19sim"));
        std::fputs(qPrintable(help + QLatin1Char('\n') + QLatin1String(ScenarioHelp)), stdout);
        return 0;
    }
    if (!parser.positionalArguments().isEmpty())
        return usage(QStringLiteral("unexpected argument %1").arg(parser.positionalArguments().first()));
    Config config;
    if (const QString bad = readConfig(parser, names, config); !bad.isEmpty())
        return usage(bad);

    sim::Instrument instrument(config.options, config.settings);
    instrument.faults().nocomp = config.nocomp;
    if (!config.scenario.isEmpty())
        if (const QString error = loadScenario(instrument, config.scenario); !error.isEmpty())
            return usage(error);

    sim::Server server(instrument);
    QString error;
    if (config.pty) {
        const QString path = server.openPty(&error);
        if (path.isEmpty())
            return usage(QStringLiteral("cannot open a pseudo-terminal: %1").arg(error));
        std::printf("%s\n", qPrintable(path));
    } else {
        if (!server.listenTcp(quint16(config.tcpPort), &error))
            return usage(QStringLiteral("cannot listen on 127.0.0.1:%1: %2").arg(config.tcpPort).arg(error));
        std::printf("127.0.0.1:%d\n", config.tcpPort);
    }
    std::fflush(stdout);
    server.watchStdin();
    server.start(config.greeting);
    return app.exec();
}
