#include "sim/sim_server.h"

#include "platform/pty.h"

#include <QCoreApplication>
#include <QSocketNotifier>
#include <QTcpServer>
#include <QTcpSocket>

#include <cerrno>
#include <cstdio>
#include <csignal>
#include <poll.h>
#include <sys/stat.h>
#include <unistd.h>

namespace sim {

Server::Server(Instrument& instrument, QObject* parent) : QObject(parent), m_instrument(instrument)
{
    connect(&m_instrument, &Instrument::transmit, this, &Server::toLine);
    connect(&m_instrument, &Instrument::lineDropped, this, [this] {
        if (m_client)
            m_client->disconnectFromHost();
    });
    connect(&m_tick, &QTimer::timeout, this, &Server::tick);
    m_wake.setSingleShot(true);
    m_wake.setTimerType(Qt::PreciseTimer);
    connect(&m_wake, &QTimer::timeout, this, &Server::tick);
}

Server::~Server() = default;

QString Server::openPty(QString* error)
{
    m_pty = std::make_unique<PtyPair>();
    if (!m_pty->isValid()) {
        if (error)
            *error = m_pty->errorString();
        m_pty.reset();
        return {};
    }
    m_ptyNotifier = new QSocketNotifier(m_pty->masterFd(), QSocketNotifier::Read, this);
    connect(m_ptyNotifier, &QSocketNotifier::activated, this, &Server::readPty);
    return m_pty->slavePath();
}

bool Server::listenTcp(quint16 port, QString* error)
{
    m_tcp = new QTcpServer(this);
    if (!m_tcp->listen(QHostAddress::LocalHost, port)) {
        if (error)
            *error = m_tcp->errorString();
        return false;
    }
    connect(m_tcp, &QTcpServer::newConnection, this, [this] {
        while (QTcpSocket* s = m_tcp->nextPendingConnection()) {
            // One line at a time: a new client takes the place of the old.
            if (m_client)
                m_client->deleteLater();
            m_client = s;
            connect(s, &QTcpSocket::readyRead, this, [this, s] { fromLine(s->readAll()); });
            connect(s, &QTcpSocket::disconnected, this, [this, s] {
                if (m_client == s)
                    m_client = nullptr;
                s->deleteLater();
            });
        }
    });
    return true;
}

void Server::watchStdin()
{
    // Started in the background of a terminal, a read of stdin would stop
    // the whole simulator; ignored, it fails instead and control is off.
    std::signal(SIGTTIN, SIG_IGN);
    struct stat st {};
    m_stdinIsPipe = ::fstat(STDIN_FILENO, &st) == 0 && (S_ISFIFO(st.st_mode) || S_ISSOCK(st.st_mode));
    m_stdin = new QSocketNotifier(STDIN_FILENO, QSocketNotifier::Read, this);
    connect(m_stdin, &QSocketNotifier::activated, this, &Server::readStdin);
}

void Server::start(bool greet)
{
    m_elapsed.start();
    m_last = 0;
    m_tick.start(20);
    if (greet)
        m_instrument.start();
}

void Server::tick()
{
    const qint64 now = m_elapsed.elapsed();
    m_instrument.advance(now - m_last);
    m_last = now;
    wakeForReply();
}

void Server::wakeForReply()
{
    const qint64 due = m_instrument.nextDue();
    if (due < 0 || !m_tick.isActive())
        return;
    const qint64 wait = qMax<qint64>(1, due - m_last);
    if (wait < m_tick.remainingTime() && (!m_wake.isActive() || wait < m_wake.remainingTime()))
        m_wake.start(int(wait));
}

void Server::fromLine(const QByteArray& bytes)
{
    // Bring the instrument's time up to the moment of arrival first, so that
    // guard times are measured on the real clock.
    tick();
    m_instrument.receive(bytes);
    wakeForReply();
}

void Server::toLine(const QByteArray& bytes)
{
    if (m_pty) {
        // Never block on a line that nobody reads: what does not fit in a
        // short while is lost, as on a real line with no one listening.
        const int fd = m_pty->masterFd();
        qsizetype done = 0;
        int waits = 0;
        while (done < bytes.size()) {
            const ssize_t n = ::write(fd, bytes.constData() + done, size_t(bytes.size() - done));
            if (n > 0) {
                done += n;
            } else if (n < 0 && (errno == EAGAIN || errno == EINTR) && waits++ < 20) {
                pollfd p {fd, POLLOUT, 0};
                ::poll(&p, 1, 50);
            } else {
                break;
            }
        }
    }
    if (m_client)
        m_client->write(bytes);
}

void Server::readPty()
{
    char buf[4096];
    for (;;) {
        const ssize_t n = ::read(m_pty->masterFd(), buf, sizeof buf);
        if (n > 0) {
            fromLine(QByteArray(buf, int(n)));
            continue;
        }
        if (n < 0 && errno == EIO) {
            // No slave is open at the moment; wait for the next client
            // instead of spinning on the error.
            m_ptyNotifier->setEnabled(false);
            QTimer::singleShot(100, this, [this] { m_ptyNotifier->setEnabled(true); });
        }
        break;
    }
}

void Server::readStdin()
{
    char buf[1024];
    const ssize_t n = ::read(STDIN_FILENO, buf, sizeof buf);
    if (n < 0 && (errno == EAGAIN || errno == EINTR))
        return;
    if (n == 0 && m_stdinIsPipe) {
        // The program that controls the simulator has gone: so do we.
        QCoreApplication::quit();
        return;
    }
    if (n <= 0) {
        m_stdin->setEnabled(false); // no control from here on
        return;
    }
    m_stdinLine.append(buf, int(n));
    int nl;
    while ((nl = int(m_stdinLine.indexOf('\n'))) >= 0) {
        const QString line = QString::fromLocal8Bit(m_stdinLine.left(nl)).trimmed();
        m_stdinLine.remove(0, nl + 1);
        if (line.isEmpty())
            continue;
        const QString error = applyScenarioLine(m_instrument, line);
        std::fprintf(stderr, "%s\n", qPrintable(error.isEmpty() ? QStringLiteral("ok: ") + line : error));
        std::fflush(stderr);
    }
}

} // namespace sim
