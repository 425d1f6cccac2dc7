#pragma once

#include "setpoints/instrument_store.h"

#include <QString>
#include <memory>

class Link;
class Operator;

// Opens the connected instrument's store for a view as the view loads. When
// it cannot be opened the operator is told "Data Base Invalid" and the link
// starts dbase_error, which closes every view a second later; the result is
// then null and the view loads on without a store until that happens.
std::unique_ptr<InstrumentStore> openViewStore(const QString& path, Operator& op, Link& link);
