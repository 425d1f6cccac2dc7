#include "shell/frmsplash_view.h"

#include "shell/app_version.h"
#include "shell/widget_icons.h"

#include <QGuiApplication>
#include <QHBoxLayout>
#include <QLabel>
#include <QScreen>
#include <QVBoxLayout>

frmSplash_view::frmSplash_view(QWidget* parent) : QWidget(parent, Qt::SplashScreen | Qt::FramelessWindowHint)
{
    setObjectName(QStringLiteral("frmSplash"));
    setAttribute(Qt::WA_DeleteOnClose);
    auto* outer = new QHBoxLayout(this);
    outer->setContentsMargins(24, 24, 32, 24);
    outer->setSpacing(24);

    auto* logo = new QLabel(this);
    logo->setPixmap(q19Icon(QStringLiteral("app")).pixmap(96, 96));
    outer->addWidget(logo, 0, Qt::AlignTop);

    auto* text = new QVBoxLayout;
    auto* product = new QLabel(QStringLiteral("Glacinor"), this);
    QFont big = product->font();
    big.setPointSizeF(big.pointSizeF() * 2.2);
    big.setBold(true);
    product->setFont(big);
    auto* model = new QLabel(QStringLiteral("Model Q-19 Workstation"), this);
    QFont mid = model->font();
    mid.setPointSizeF(mid.pointSizeF() * 1.3);
    model->setFont(mid);
    lblVersion = new QLabel(appVersionText(), this);
    lblVersion->setObjectName(QStringLiteral("lblVersion"));
    auto* loading = new QLabel(tr("Opening the directory of instruments…"), this);
    loading->setEnabled(false);
    text->addWidget(product);
    text->addWidget(model);
    text->addSpacing(8);
    text->addWidget(lblVersion);
    text->addStretch();
    text->addWidget(loading);
    outer->addLayout(text);

    setAutoFillBackground(true);
    adjustSize();
    if (const QScreen* screen = QGuiApplication::primaryScreen())
        move(screen->availableGeometry().center() - rect().center());
}
