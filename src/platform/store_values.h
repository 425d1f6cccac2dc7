#pragma once

// How the program's values are held in the file: the conversion both ways,
// by the column's declared kind.

#include "platform/store.h"

namespace store_detail {

extern const QString DateTimeFormat;

// Turns a value given by the program into what the column holds in the file.
// False when it cannot be one.
bool toStored(Store::ColumnType type, const QVariant& in, QVariant* out);
// Turns what the file holds into the value the program reads. A value the
// column cannot hold (a damaged file, a foreign writer) comes back as it is,
// so that verification can see it.
QVariant fromStored(Store::ColumnType type, const QVariant& raw);

} // namespace store_detail
