#include "setpoints/view_store.h"

#include "link/link.h"
#include "platform/operator.h"

std::unique_ptr<InstrumentStore> openViewStore(const QString& path, Operator& op, Link& link)
{
    QString why;
    std::unique_ptr<InstrumentStore> store = InstrumentStore::open(path, &why);
    if (!store) {
        op.message(QStringLiteral("Data Base Invalid"),
                   {QStringLiteral("There was an error in this Glacinors data base,")});
        link.startDbaseError();
    }
    return store;
}
