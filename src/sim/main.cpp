// q19sim: a Glacinor Model Q-19 on a pseudo-terminal or a TCP port.

#include "sim/sim_instrument.h"
#include "sim/sim_server.h"

#include <QCoreApplication>
#include <QDateTime>
#include <QFile>
#include <QTextStream>

#include <cstdio>

namespace {

const char* const Help = R"(Usage: q19sim (--pty | --tcp PORT) [options]

A Glacinor Model Q-19 refrigeration scanner/controller with 216 channels and
a living plant, for demos, training and tests.

Transports (one of them):
  --pty               Open a pseudo-terminal; its path is the first line on
                      stdout. Point the workstation's port at that path.
  --tcp PORT          Serve on 127.0.0.1:PORT, one client at a time.

Instrument:
  --version V         Firmware version text (default 9.6), e.g. 6.5, 8.7, 14.
  --id N              Instrument ID (default 1).
  --resets N          Number of resets reported (default 0).
  --seed N            Seed of the plant's randomness (default 1).
  --speed N           Plant time runs N times faster than real time (default 1).
  --start "yyyy-MM-dd hh:mm"  Instrument clock at start (default: now).
  --history-hours N   Hours the plant has run before start, filling the logs
                      (default 24).
  --alarm-log N, --data-log N, --power-log N
                      Sizes of the three logs in records (200, 1000, 2000).
  --modem             Put a Hayes modem in front: dial, CONNECT 9600, +++.
  --nocomp            The instrument has no computer link: answers "nocomp".
  --greet             Send "AT&FE0" at start also on a pty, where it waits for
                      the first client (a line nobody listens to loses it, so
                      by default only a reset greets on the line).
  --scenario FILE     Read "key = value" lines (below) at start.
  --help              This text.

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
    const QStringList args = app.arguments().mid(1);

    sim::Options options;
    sim::Instrument::Settings settings;
    bool pty = false, greeting = false, nocomp = false;
    int tcpPort = -1;
    QString scenario;
    for (int i = 0; i < args.size(); ++i) {
        const QString a = args[i];
        auto value = [&](QString& out) {
            if (i + 1 >= args.size())
                return false;
            out = args[++i];
            return true;
        };
        auto integer = [&](int& out) {
            QString v;
            bool ok = false;
            if (value(v))
                out = v.toInt(&ok);
            return ok;
        };
        QString v;
        bool ok = true;
        if (a == QLatin1String("--help") || a == QLatin1String("-h")) {
            std::fputs(Help, stdout);
            return 0;
        } else if (a == QLatin1String("--pty")) {
            pty = true;
        } else if (a == QLatin1String("--tcp")) {
            ok = integer(tcpPort) && tcpPort > 0 && tcpPort < 65536;
        } else if (a == QLatin1String("--version")) {
            ok = value(v) && !v.isEmpty();
            options.version = v.toLatin1();
        } else if (a == QLatin1String("--id")) {
            ok = integer(settings.id);
        } else if (a == QLatin1String("--resets")) {
            ok = integer(options.resets);
        } else if (a == QLatin1String("--seed")) {
            int seed = 0;
            ok = integer(seed);
            options.seed = quint32(seed);
        } else if (a == QLatin1String("--speed")) {
            ok = value(v);
            settings.speed = v.toDouble(&ok);
            ok = ok && settings.speed > 0;
        } else if (a == QLatin1String("--start")) {
            ok = value(v);
            options.start = QDateTime::fromString(v, QStringLiteral("yyyy-MM-dd hh:mm"));
            ok = ok && options.start.isValid();
        } else if (a == QLatin1String("--history-hours")) {
            ok = integer(options.historyHours) && options.historyHours >= 0;
        } else if (a == QLatin1String("--alarm-log")) {
            ok = integer(options.alarmCapacity) && options.alarmCapacity > 0;
        } else if (a == QLatin1String("--data-log")) {
            ok = integer(options.historyCapacity) && options.historyCapacity > 0;
        } else if (a == QLatin1String("--power-log")) {
            ok = integer(options.powerCapacity) && options.powerCapacity > 0;
        } else if (a == QLatin1String("--modem")) {
            settings.modem = true;
        } else if (a == QLatin1String("--nocomp")) {
            nocomp = true;
        } else if (a == QLatin1String("--greet")) {
            greeting = true;
        } else if (a == QLatin1String("--scenario")) {
            ok = value(scenario);
        } else {
            return usage(QStringLiteral("unknown option %1").arg(a));
        }
        if (!ok)
            return usage(QStringLiteral("bad or missing value for %1").arg(a));
    }
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
