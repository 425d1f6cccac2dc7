#include "platform/builtin_simulator_line.h"

#include "platform/line_factory.h"

#include <QCoreApplication>
#include <QDir>
#include <QFileInfo>
#include <QStandardPaths>

#include <csignal>
#include <sys/prctl.h>

BuiltinSimulatorLine::BuiltinSimulatorLine(std::function<bool()> modemWanted, QObject* parent)
    : Line(parent), m_modemWanted(std::move(modemWanted))
{
}

BuiltinSimulatorLine::~BuiltinSimulatorLine()
{
    stopSimulator();
}

QString BuiltinSimulatorLine::simulatorProgram()
{
    const QString here = QCoreApplication::applicationDirPath();
    for (const QString& candidate : {here + QStringLiteral("/q19sim"), here + QStringLiteral("/../sim/q19sim")}) {
        const QFileInfo fi(candidate);
        if (fi.isFile() && fi.isExecutable())
            return fi.canonicalFilePath();
    }
    return QStandardPaths::findExecutable(QStringLiteral("q19sim"));
}

bool BuiltinSimulatorLine::startSimulator(QString* error)
{
    const bool modem = m_modemWanted && m_modemWanted();
    if (m_process && m_process->state() == QProcess::Running && modem == m_withModem)
        return true;
    // A change between direct and modem needs a simulator of the other kind.
    stopSimulator();
    const QString program = simulatorProgram();
    if (program.isEmpty()) {
        if (error)
            *error = tr("The built-in simulator (q19sim) is not installed beside this program.");
        return false;
    }
    m_process = std::make_unique<QProcess>();
    m_process->setProgram(program);
    QStringList args{QStringLiteral("--pty")};
    if (modem)
        args << QStringLiteral("--modem");
    m_process->setArguments(args);
    // If the workstation dies without cleaning up, the simulator goes with it
    // rather than holding its terminal for ever.
    m_process->setChildProcessModifier([] { ::prctl(PR_SET_PDEATHSIG, SIGTERM); });
    // The simulator's own messages are of no use to the operator.
    m_process->setStandardErrorFile(QProcess::nullDevice());
    m_process->start();
    if (!m_process->waitForStarted(5000)) {
        if (error)
            *error = tr("The built-in simulator could not be started: %1").arg(m_process->errorString());
        m_process.reset();
        return false;
    }
    // Its first line is the terminal it serves on.
    QByteArray first;
    while (!first.contains('\n') && m_process->waitForReadyRead(5000))
        first += m_process->readAllStandardOutput();
    m_terminal = QString::fromLocal8Bit(first.left(first.indexOf('\n'))).trimmed();
    if (m_terminal.isEmpty()) {
        if (error)
            *error = tr("The built-in simulator did not say where it listens.");
        stopSimulator();
        return false;
    }
    m_withModem = modem;
    return true;
}

void BuiltinSimulatorLine::stopSimulator()
{
    if (m_inner) {
        m_inner->close();
        m_inner.reset();
    }
    if (m_process) {
        m_process->closeWriteChannel(); // the simulator ends when its control input closes
        if (!m_process->waitForFinished(1000)) {
            m_process->terminate();
            if (!m_process->waitForFinished(1000))
                m_process->kill();
        }
        m_process.reset();
    }
    m_terminal.clear();
}

bool BuiltinSimulatorLine::setSettings(const LineSettings& settings, QString* error)
{
    m_settings = settings;
    return m_inner ? m_inner->setSettings(settings, error) : true;
}

void BuiltinSimulatorLine::setHandshaking(Handshaking h)
{
    m_handshaking = h;
    if (m_inner)
        m_inner->setHandshaking(h);
}

bool BuiltinSimulatorLine::open(QString* error)
{
    if (isOpen())
        return true;
    if (!startSimulator(error))
        return false;
    if (!m_inner) {
        m_inner = makeLine(m_terminal);
        connect(m_inner.get(), &Line::received, this, &Line::received);
        connect(m_inner.get(), &Line::lineEvent, this, &Line::lineEvent);
    }
    m_inner->setSettings(m_settings);
    m_inner->setHandshaking(m_handshaking);
    return m_inner->open(error);
}

void BuiltinSimulatorLine::close()
{
    // The simulated instrument outlives the call, as a real one does: what
    // was written to it is still there at the next connect.
    if (m_inner)
        m_inner->close();
}

bool BuiltinSimulatorLine::isOpen() const
{
    return m_inner && m_inner->isOpen();
}

bool BuiltinSimulatorLine::write(const QByteArray& bytes)
{
    return isOpen() && m_inner->write(bytes);
}

void BuiltinSimulatorLine::discardInput()
{
    if (m_inner)
        m_inner->discardInput();
}

void BuiltinSimulatorLine::setDtr(bool on)
{
    m_dtr = on;
    if (m_inner)
        m_inner->setDtr(on);
}
