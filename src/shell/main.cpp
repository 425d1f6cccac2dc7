#include "directory/data_folder.h"
#include "directory/directory_engine.h"
#include "link/ccform1_engine.h"
#include "link/link_globals.h"
#include "link/open_views.h"
#include "platform/line_factory.h"
#include "platform/clock.h"
#include "platform/settings.h"
#include "platform/widget_operator.h"
#include "shell/app_version.h"
#include "shell/ccform1_view.h"
#include "shell/frmsplash_view.h"
#include "shell/mdiform1_view.h"
#include "shell/widget_icons.h"
#include "status/frmstatus_engine.h"
#include "status/frmstatus_view.h"
#include "status/frmstatusp_engine.h"
#include "status/frmstatusp_view.h"

#include <QApplication>
#include <QCommandLineParser>
#include <QDir>
#include <QMessageBox>
#include <QStandardPaths>

#include <cstdio>

namespace {

// The demo keeps its own folder, so that trying the program never touches
// the operator's real directory of instruments.
QString demoFolder()
{
    return QStandardPaths::writableLocation(QStandardPaths::GenericDataLocation) + QStringLiteral("/q19-demo");
}

// The connection form's two halves: the directory chooses the instrument,
// the line side connects to it.
void connectLineToDirectory(ccForm1_engine& line, ccForm1_directory& directory, const LinkGlobals& globals,
                            QString& connectedId)
{
    QObject::connect(&directory, &ccForm1_directory::instrumentSelected, &line, &ccForm1_engine::setInstrument);
    QObject::connect(&directory, &ccForm1_directory::propertySettingsWanted, &line,
                     &ccForm1_engine::instrumentOpened);
    QObject::connect(&line, &ccForm1_engine::changed, &directory, [&] {
        if (!globals.link_up)
            connectedId.clear();
        else if (connectedId.isEmpty())
            connectedId = directory.openId();
    });
    directory.setConnectedInstrument([&] { return globals.link_up ? connectedId : QString(); });
    QObject::connect(&directory, &ccForm1_directory::addingChanged, &line,
                     [&line](bool adding) { line.setDialAllowed(!adding); });
}

void registerViews(MDIForm1_view& mainWindow, ccForm1_engine& line, ccForm1_directory& directory,
                   const DataFolder& folder, Clock& clock, Operator& op)
{
    // The views this workstation has. Each window owns its engine; a view
    // whose data base fails has said so and started dbase_error, and still
    // stands until that closes everything.
    const auto storeOf = [&folder, &directory] { return folder.instrumentFile(directory.openId()); };
    mainWindow.registerView(ViewId::status, [&line, &clock, &op, &directory, storeOf](OpenViews& v) -> QWidget* {
        auto* engine = new frmstatus_engine(line, clock, op, v);
        engine->Form_Load(directory.openId(), storeOf());
        auto* view = new frmstatus_view(*engine);
        engine->setParent(view);
        return view;
    });
    mainWindow.registerView(ViewId::statusp, [&line, &clock, &op, &directory, storeOf](OpenViews& v) -> QWidget* {
        auto* engine = new frmstatusp_engine(line, clock, op, v);
        engine->Form_Load(directory.openId(), storeOf());
        auto* view = new frmstatusp_view(*engine);
        engine->setParent(view);
        return view;
    });
}

} // namespace

int main(int argc, char* argv[])
{
    QApplication app(argc, argv);
    QApplication::setOrganizationName(QStringLiteral("Glacinor"));
    QApplication::setOrganizationDomain(QStringLiteral("glacinor.invalid"));
    QApplication::setApplicationName(QStringLiteral("q19"));
    QApplication::setApplicationDisplayName(QStringLiteral("Glacinor Q-19"));
    QApplication::setApplicationVersion(appVersionText().mid(8));
    QApplication::setWindowIcon(q19Icon(QStringLiteral("app")));

    QCommandLineParser parser;
    parser.setApplicationDescription(QStringLiteral("Operator's workstation for the Glacinor Model Q-19."));
    parser.addHelpOption();
    parser.addVersionOption();
    const QCommandLineOption demo(QStringLiteral("demo"),
                                  QStringLiteral("Open the demo data folder, whose instrument is the built-in simulator."));
    const QCommandLineOption dataDir(QStringLiteral("data-dir"), QStringLiteral("Use DIR as the data folder."),
                                     QStringLiteral("DIR"));
    const QCommandLineOption reset(QStringLiteral("reset"),
                                   QStringLiteral("With --demo: start the demo afresh (its directory, instruments and "
                                                  "set points as at the first start)."));
    parser.addOption(demo);
    parser.addOption(dataDir);
    parser.addOption(reset);
    parser.process(app);
    const bool isDemo = parser.isSet(demo);
    if (parser.isSet(reset) && !isDemo) {
        std::fprintf(stderr, "q19: --reset goes with --demo only\n");
        return 2;
    }

    const QString folderPath = parser.isSet(dataDir) ? parser.value(dataDir)
                               : isDemo              ? demoFolder()
                                                     : DataFolder::location();
    DataFolder folder(folderPath);

    auto* splash = new frmSplash_view;
    splash->show();
    app.processEvents();

    // The demo always comes up on its instrument and the built-in simulator,
    // whatever was deleted or changed in it before.
    QString error;
    const bool ready = isDemo ? (!parser.isSet(reset) || folder.removeProgramFiles(&error)) && folder.ensureDemo(&error)
                              : folder.ensure(&error);
    if (!ready) {
        splash->close();
        QMessageBox::critical(nullptr, QStringLiteral("Glacinor Q-19"),
                              QStringLiteral("The data folder %1 cannot be used:\n%2").arg(folderPath, error));
        return 1;
    }

    SystemClock clock;
    WidgetOperator op;
    QtSettings settings;
    OpenViews views;
    LinkGlobals globals;

    MDIForm1_view mainWindow(views, globals);
    op.setParentWidget(&mainWindow);

    ccForm1_engine* lineEngine = nullptr;
    auto lineFactory = [&lineEngine](const QString& port) {
        return makeWorkstationLine(port, [&lineEngine] { return lineEngine && lineEngine->modemSelected(); });
    };
    ccForm1_engine line(clock, op, settings, views, globals, lineFactory);
    lineEngine = &line;
    ccForm1_directory directory(folder, op);
    // The instrument the line was opened for, while it is up.
    QString connectedId;
    connectLineToDirectory(line, directory, globals, connectedId);

    registerViews(mainWindow, line, directory, folder, clock, op);

    mainWindow.engine().setLink(&line);
    mainWindow.engine().MDIForm_Load();
    if (!directory.Form_Load()) {
        splash->close();
        return 1;
    }
    if (isDemo && directory.indexOfId(DataFolder::DemoId) >= 0)
        directory.DBCombo1_Click(directory.indexOfId(DataFolder::DemoId));
    mainWindow.setConnectionForm(new ccForm1_view(directory, line));

    splash->close();
    mainWindow.showMaximized();
    const int rc = app.exec();
    directory.Form_Unload();
    return rc;
}
