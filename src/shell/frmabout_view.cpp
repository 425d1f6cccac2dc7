#include "shell/frmabout_view.h"

#include "platform/store_engine.h"
#include "shell/app_version.h"
#include "shell/widget_icons.h"

#include <QDialogButtonBox>
#include <QHBoxLayout>
#include <QLabel>
#include <QPlainTextEdit>
#include <QPushButton>
#include <QSysInfo>
#include <QVBoxLayout>

frmAbout_view::frmAbout_view(QWidget* parent) : QDialog(parent)
{
    setObjectName(QStringLiteral("frmAbout"));
    setWindowTitle(QStringLiteral("Glacinor"));
    auto* layout = new QVBoxLayout(this);
    auto* top = new QHBoxLayout;
    auto* logo = new QLabel(this);
    logo->setPixmap(q19Icon(QStringLiteral("app")).pixmap(64, 64));
    top->addWidget(logo, 0, Qt::AlignTop);
    auto* words = new QVBoxLayout;
    auto* title = new QLabel(QStringLiteral("<b>Glacinor Model Q-19 Workstation</b>"), this);
    lblVersion = new QLabel(appVersionText(), this);
    lblVersion->setObjectName(QStringLiteral("lblVersion"));
    auto* licence = new QLabel(tr("Free software under the GNU General Public License, version 3 or later."), this);
    licence->setWordWrap(true);
    words->addWidget(title);
    words->addWidget(lblVersion);
    words->addWidget(licence);
    top->addLayout(words, 1);
    layout->addLayout(top);

    sysInfo = new QPlainTextEdit(this);
    sysInfo->setObjectName(QStringLiteral("sysInfo"));
    sysInfo->setReadOnly(true);
    sysInfo->setVisible(false);
    layout->addWidget(sysInfo);

    auto* buttons = new QDialogButtonBox(QDialogButtonBox::Ok, this);
    auto* info = buttons->addButton(tr("&System Info..."), QDialogButtonBox::ActionRole);
    info->setObjectName(QStringLiteral("cmdSysInfo"));
    connect(info, &QPushButton::clicked, this, &frmAbout_view::cmdSysInfo_Click);
    connect(buttons, &QDialogButtonBox::accepted, this, &QDialog::accept);
    layout->addWidget(buttons);
}

QString frmAbout_view::systemInformation()
{
    QStringList lines;
    lines << QStringLiteral("Program: Q-19 Workstation %1").arg(appVersionText());
    lines << QStringLiteral("Qt: %1 (built with %2)").arg(QString::fromLatin1(qVersion()), QStringLiteral(QT_VERSION_STR));
    lines << QStringLiteral("SQLite: %1").arg(storeEngineVersion());
    lines << QStringLiteral("Operating system: %1").arg(QSysInfo::prettyProductName());
    lines << QStringLiteral("Kernel: %1 %2").arg(QSysInfo::kernelType(), QSysInfo::kernelVersion());
    lines << QStringLiteral("Architecture: %1").arg(QSysInfo::currentCpuArchitecture());
    return lines.join(QLatin1Char('\n'));
}

void frmAbout_view::cmdSysInfo_Click()
{
    sysInfo->setPlainText(systemInformation());
    sysInfo->setVisible(true);
    adjustSize();
}
