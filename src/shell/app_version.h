#pragma once

#include <QString>

// The program's version as the splash and the about box show it:
// major.minor.revision.
QString appVersionText();
