#include "platform/store_engine.h"

#include "platform/store_sqlite.h"

QString storeEngineVersion()
{
    return store_detail::sqlite::engineVersion();
}
