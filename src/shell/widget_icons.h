#pragma once

#include <QIcon>
#include <QString>

// The program's own icons, painted at whatever size a screen asks for, so
// they stay sharp on high-density screens and need no theme installed.
// Keys are the toolbar's button keys ("tlbstatuson", ...) and "app".
QIcon q19Icon(const QString& key);
