#pragma once

#include <QString>

// The demo instrument's set points, as an upload from the built-in simulator
// would store them. The simulator holds the same table from its first start,
// so the demo's views show its compressors, banks and descriptions before
// anything has been uploaded.
//
// Fills the setpoints table of the instrument data base at dbPath. Every value
// goes through the upload's own range checks; a value they refuse fails the
// whole fill (nothing is written) with the channel named in *error.
bool fillDemoSetpoints(const QString& dbPath, QString* error = nullptr);
