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

} // namespace

int main(int argc, char** argv)
{
    QCoreApplication app(argc, argv);
    QCommandLineParser parser;
    parser.setApplicationDescription(QStringLiteral(
        "A Glacinor Model Q-19 refrigeration scanner/controller with 216 channels and\n"
        "a living plant, for demos, training and tests. Give one of --pty and --tcp."));
    const auto option = [&parser](const QString& name, const QString& help, const QString& value = {}) {
        parser.addOption(QCommandLineOption(name, help, value));
        return name;
    };
    const QString ptyOpt = option(QStringLiteral("pty"),
                                  QStringLiteral("Open a pseudo-terminal; its path is the first line on stdout. "
                                                 "Point the workstation's port at that path."));
    const QString tcpOpt = option(QStringLiteral("tcp"), QStringLiteral("Serve on 127.0.0.1:PORT, one client at a time."),
                                  QStringLiteral("PORT"));
    const QString versionOpt = option(QStringLiteral("version"),
                                      QStringLiteral("Firmware version text (default 9.6), e.g. 6.5, 8.7, 14."),
                                      QStringLiteral("V"));
    const QString idOpt = option(QStringLiteral("id"), QStringLiteral("Instrument ID (default 1)."), QStringLiteral("N"));
    const QString resetsOpt = option(QStringLiteral("resets"), QStringLiteral("Number of resets reported (default 0)."),
                                     QStringLiteral("N"));
    const QString seedOpt = option(QStringLiteral("seed"), QStringLiteral("Seed of the plant's randomness (default 1)."),
                                   QStringLiteral("N"));
    const QString speedOpt = option(QStringLiteral("speed"),
                                    QStringLiteral("Plant time runs N times faster than real time (default 1)."),
                                    QStringLiteral("N"));
    const QString startOpt = option(QStringLiteral("start"),
                                    QStringLiteral("Instrument clock at start, \"yyyy-MM-dd hh:mm\" (default: now)."),
                                    QStringLiteral("TIME"));
    const QString historyOpt = option(QStringLiteral("history-hours"),
                                      QStringLiteral("Hours the plant has run before start, filling the logs "
                                                     "(default 24)."),
                                      QStringLiteral("N"));
    const QString alarmOpt = option(QStringLiteral("alarm-log"),
                                    QStringLiteral("Size of the alarm log in records (default 200)."),
                                    QStringLiteral("N"));
    const QString dataOpt = option(QStringLiteral("data-log"),
                                   QStringLiteral("Size of the data log in records (default 1000)."),
                                   QStringLiteral("N"));
    const QString powerOpt = option(QStringLiteral("power-log"),
                                    QStringLiteral("Size of the power log in records (default 2000)."),
                                    QStringLiteral("N"));
    const QString modemOpt = option(QStringLiteral("modem"),
                                    QStringLiteral("Put a Hayes modem in front: dial, CONNECT 9600, +++."));
    const QString nocompOpt = option(QStringLiteral("nocomp"),
                                     QStringLiteral("The instrument has no computer link: answers \"nocomp\"."));
    const QString greetOpt = option(QStringLiteral("greet"),
                                    QStringLiteral("Send \"AT&FE0\" at start also on a pty, where it waits for the "
                                                   "first client (a line nobody listens to loses it, so by default "
                                                   "only a reset greets on the line)."));
    const QString scenarioOpt = option(QStringLiteral("scenario"),
                                       QStringLiteral("Read \"key = value\" lines (below) at start."),
                                       QStringLiteral("FILE"));
    parser.addOption(QCommandLineOption({QStringLiteral("h"), QStringLiteral("help")}, QStringLiteral("This text.")));

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

    sim::Options options;
    sim::Instrument::Settings settings;
    const bool pty = parser.isSet(ptyOpt);
    const bool greeting = parser.isSet(greetOpt);
    const bool nocomp = parser.isSet(nocompOpt);
    settings.modem = parser.isSet(modemOpt);
    const QString scenario = parser.value(scenarioOpt);
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
    int tcpPort = -1;
    int seed = int(options.seed);
    QString bad;
    if (!integer(tcpOpt, tcpPort, 1) || (parser.isSet(tcpOpt) && tcpPort > 65535))
        bad = tcpOpt;
    else if (parser.isSet(versionOpt) && parser.value(versionOpt).isEmpty())
        bad = versionOpt;
    else if (!integer(idOpt, settings.id, std::numeric_limits<int>::min()))
        bad = idOpt;
    else if (!integer(resetsOpt, options.resets, std::numeric_limits<int>::min()))
        bad = resetsOpt;
    else if (!integer(seedOpt, seed, std::numeric_limits<int>::min()))
        bad = seedOpt;
    else if (!integer(historyOpt, options.historyHours, 0))
        bad = historyOpt;
    else if (!integer(alarmOpt, options.alarmCapacity, 1))
        bad = alarmOpt;
    else if (!integer(dataOpt, options.historyCapacity, 1))
        bad = dataOpt;
    else if (!integer(powerOpt, options.powerCapacity, 1))
        bad = powerOpt;
    if (bad.isEmpty() && parser.isSet(speedOpt)) {
        bool ok = false;
        settings.speed = parser.value(speedOpt).toDouble(&ok);
        if (!ok || settings.speed <= 0)
            bad = speedOpt;
    }
    if (bad.isEmpty() && parser.isSet(startOpt)) {
        options.start = QDateTime::fromString(parser.value(startOpt), QStringLiteral("yyyy-MM-dd hh:mm"));
        if (!options.start.isValid())
            bad = startOpt;
    }
    if (!bad.isEmpty())
        return usage(QStringLiteral("bad value for --%1: %2").arg(bad, parser.value(bad)));
    if (parser.isSet(versionOpt))
        options.version = parser.value(versionOpt).toLatin1();
    options.seed = quint32(seed);
    if (pty == (tcpPort > 0))
        return usage(QStringLiteral("give exactly one of --pty and --tcp PORT"));

    sim::Instrument instrument(options, settings);
    instrument.faults().nocomp = nocomp;
    if (!scenario.isEmpty()) {
        QFile file(scenario);
        if (!file.open(QIODevice::ReadOnly | QIODevice::Text))
            return usage(QStringLiteral("cannot read %1: %2").arg(scenario, file.errorString()));
        int lineNo = 0;
        QTextStream in(&file);
        while (!in.atEnd()) {
            ++lineNo;
            const QString error = sim::applyScenarioLine(instrument, in.readLine());
            if (!error.isEmpty())
                return usage(QStringLiteral("%1:%2: %3").arg(scenario).arg(lineNo).arg(error));
        }
    }

    sim::Server server(instrument);
    QString error;
    if (pty) {
        const QString path = server.openPty(&error);
        if (path.isEmpty())
            return usage(QStringLiteral("cannot open a pseudo-terminal: %1").arg(error));
        std::printf("%s\n", qPrintable(path));
    } else {
        if (!server.listenTcp(quint16(tcpPort), &error))
            return usage(QStringLiteral("cannot listen on 127.0.0.1:%1: %2").arg(tcpPort).arg(error));
        std::printf("127.0.0.1:%d\n", tcpPort);
    }
    std::fflush(stdout);
    server.watchStdin();
    server.start(greeting);
    return app.exec();
}
