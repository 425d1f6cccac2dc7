#include "shell/app_version.h"

QString appVersionText()
{
    return QStringLiteral("Version %1.%2.%3").arg(Q19_VERSION_MAJOR).arg(Q19_VERSION_MINOR).arg(Q19_VERSION_PATCH);
}
