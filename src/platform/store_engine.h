#pragma once

#include <QString>

// The version of the data base engine under the store, for the about box
// and for bug reports.
QString storeEngineVersion();
