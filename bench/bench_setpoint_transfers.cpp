// The workstation's own processing time for an upload and a download of all
// 216 channels against q19sim on a pseudo-terminal, as a share of the time
// the same bytes take on the line at 9600 and at 115200 baud. The simulator
// answers after 1 ms; the pty itself does not throttle.

#include "link/ccform1_engine.h"
#include "setpoints/channels_transfer_engine.h"
#include "setpoints/instrument_schema.h"
#include "setpoints/instrument_store.h"
#include "setpoints/upload_progress_engine.h"

#include <QCoreApplication>
#include <QElapsedTimer>
#include <QEventLoop>
#include <QProcess>
#include <QTemporaryDir>
#include <QTimer>
#include <cstdio>
#include <ctime>

// Under `valgrind --tool=callgrind` each transfer is dumped apart, so that
// its instruction count can be read unaffected by a busy machine.
#if __has_include(<valgrind/callgrind.h>)
#include <valgrind/callgrind.h>
#else
#define CALLGRIND_ZERO_STATS
#define CALLGRIND_DUMP_STATS_AT(name)
#endif

namespace {

double threadCpuMs()
{
    timespec t{};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &t);
    return double(t.tv_sec) * 1000.0 + double(t.tv_nsec) / 1.0e6;
}

// The line side, counting the bytes that pass.
class CountingLink : public ccForm1_engine {
public:
    using ccForm1_engine::ccForm1_engine;
    qint64 bytesOut = 0;
    bool Output(const QByteArray& bytes) override
    {
        bytesOut += bytes.size();
        return ccForm1_engine::Output(bytes);
    }
};

// Sits between the dispatcher and the channels engine and times its parsers.
class TimedChannels : public ChannelsView {
public:
    explicit TimedChannels(channels_transfer_engine& e) : m_e(e) {}
    double parserMs = 0;
    void ret_handel() override { timed([&] { m_e.ret_handel(); }); }
    void sin_chan_up_load() override { timed([&] { m_e.sin_chan_up_load(); }); }
    void down_check() override { timed([&] { m_e.down_check(); }); }
    void done_down() override { timed([&] { m_e.done_down(); }); }
    void stopTimer5() override { m_e.stopTimer5(); }

private:
    void timed(const std::function<void()>& f)
    {
        const double t0 = threadCpuMs();
        f();
        parserMs += threadCpuMs() - t0;
    }
    channels_transfer_engine& m_e;
};

struct Result {
    bool ok = false;
    double cpuMs = 0;
    double wallMs = 0;
    double parserMs = 0;
    qint64 in = 0;
    qint64 out = 0;
};

void report(const char* what, const Result& r)
{
    // 10 bits a character: start, 8 data, stop.
    const double bytes = double(r.in + r.out);
    const double line9600 = bytes * 10.0 / 9600.0 * 1000.0;
    const double line115200 = bytes * 10.0 / 115200.0 * 1000.0;
    std::printf("%-22s %s  %7lld bytes in %6lld out  processing %8.1f ms (wall %8.1f ms)\n", what,
                r.ok ? "ok    " : "FAILED", static_cast<long long>(r.in), static_cast<long long>(r.out), r.cpuMs,
                r.wallMs);
    std::printf("%-22s of which the parsers (record, store) %.1f ms\n", "", r.parserMs);
    std::printf("%-22s line time %9.1f ms at 9600 (ratio %.4f), %8.1f ms at 115200 (ratio %.4f)\n", "",
                line9600, r.cpuMs / line9600, line115200, r.cpuMs / line115200);
}

} // namespace

int main(int argc, char** argv)
{
    QCoreApplication app(argc, argv);
    const QString version = argc > 1 ? QString::fromLocal8Bit(argv[1]) : QStringLiteral("14");

    QProcess sim;
    sim.setProgram(QStringLiteral(Q19SIM_PATH));
    sim.setArguments({"--pty", "--id", "1", "--version", version});
    sim.start();
    if (!sim.waitForStarted(5000))
        return 1;
    for (int i = 0; i < 50 && !sim.canReadLine(); ++i)
        sim.waitForReadyRead(100);
    const QString pty = QString::fromLocal8Bit(sim.readLine()).trimmed();
    // Without any delay the instrument's answer can arrive before the
    // dispatcher discards the input behind the reply that asked for it.
    sim.write("delay = 1\n");
    sim.waitForBytesWritten(1000);
    // Its answer on stderr says the simulator is up and listening; a connect
    // sent before that would be sent twice and answered twice.
    QByteArray answer;
    for (int i = 0; i < 100 && !answer.contains("ok"); ++i) {
        sim.waitForReadyRead(100);
        answer += sim.readAllStandardError();
    }

    QTemporaryDir dir;
    const QString db = dir.filePath(QStringLiteral("t-1.db"));
    if (!createInstrumentTemplate(db))
        return 1;
    std::unique_ptr<InstrumentStore> store = InstrumentStore::open(db);
    SystemClock clock;
    HeadlessOperator op;
    MemorySettings settings;
    OpenViews views;
    LinkGlobals globals;
    CountingLink link(clock, op, settings, views, globals);
    qint64 bytesIn = 0;
    link.setInstrument(QStringLiteral("1"), QString(), nullptr);
    link.setCommPort(pty);
    link.Option2_Click(1);
    QObject::connect(&link.line(), &Line::received, [&](const QByteArray& b) { bytesIn += b.size(); });
    upload_progress_engine upload;
    channels_transfer_engine channels(link, clock, op, views, *store, upload);
    TimedChannels timed(channels);
    views.channels = &timed;
    views.channels_open = true;

    bool accepted = false;
    {
        QEventLoop loop;
        QObject::connect(&link, &ccForm1_engine::identityAccepted, &loop, [&] {
            accepted = true;
            loop.quit();
        });
        QTimer::singleShot(10000, &loop, &QEventLoop::quit);
        link.Command3_Click();
        if (!accepted)
            loop.exec();
    }
    if (!accepted) {
        std::fprintf(stderr, "no connection on %s\n", qPrintable(pty));
        return 1;
    }
    std::printf("q19sim %s on %s, speed factor %d\n", qPrintable(version), qPrintable(pty), globals.speed_factor);

    auto measure = [&](const char* name, const std::function<void()>& start) {
        Result r;
        QEventLoop loop;
        QObject::connect(&channels, &channels_transfer_engine::transferEnded, &loop, [&](bool ok) {
            r.ok = ok;
            loop.quit();
        });
        bytesIn = 0;
        link.bytesOut = 0;
        timed.parserMs = 0;
        QElapsedTimer wall;
        wall.start();
        CALLGRIND_ZERO_STATS;
        const double cpu0 = threadCpuMs();
        start();
        if (channels.transferRunning())
            loop.exec();
        r.cpuMs = threadCpuMs() - cpu0;
        CALLGRIND_DUMP_STATS_AT(name);
        r.wallMs = double(wall.elapsed());
        r.in = bytesIn;
        r.out = link.bytesOut;
        r.parserMs = timed.parserMs;
        QObject::disconnect(&channels, nullptr, &loop, nullptr);
        return r;
    };
    const Result up = measure("upload", [&] { channels.uploadall_Click(); });
    report("upload all channels", up);
    const Result down = measure("download", [&] { channels.downloadall_Click(); });
    report("download all channels", down);

    views.channels_open = false;
    views.channels = nullptr;
    link.Command6_Click();
    sim.kill();
    sim.waitForFinished(2000);
    return up.ok && down.ok ? 0 : 1;
}
