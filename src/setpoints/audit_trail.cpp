#include "setpoints/audit_trail.h"

#include "platform/clock.h"
#include "platform/store.h"

namespace {

enum Column { Time, Kind, Function, Channel, Subfunction, OldValue, NewValue, Outcome };

QList<Store::Column> auditColumns()
{
    using T = Store::ColumnType;
    return {{QStringLiteral("time"), T::DateTime},       {QStringLiteral("kind"), T::Text},
            {QStringLiteral("function"), T::Integer},    {QStringLiteral("channel"), T::Integer},
            {QStringLiteral("subfunction"), T::Integer}, {QStringLiteral("old_value"), T::Text},
            {QStringLiteral("new_value"), T::Text},      {QStringLiteral("outcome"), T::Text}};
}

QVariant orNull(int v) { return v < 0 ? QVariant() : QVariant(v); }

} // namespace

AuditTrail::AuditTrail(Store& store, Clock& clock, std::unique_ptr<Recordset> rows)
    : m_store(store), m_clock(clock), m_rows(std::move(rows))
{
}

AuditTrail::~AuditTrail() = default;

std::unique_ptr<AuditTrail> AuditTrail::open(Store& store, Clock& clock, QString* error)
{
    if (!store.hasTable(kAuditTable) && !store.createTable(kAuditTable, auditColumns())) {
        if (error)
            *error = store.lastError();
        return nullptr;
    }
    std::unique_ptr<Recordset> rows = store.openRecordset(kAuditTable);
    if (!rows) {
        if (error)
            *error = store.lastError();
        return nullptr;
    }
    return std::unique_ptr<AuditTrail>(new AuditTrail(store, clock, std::move(rows)));
}

int AuditTrail::begin(const QString& kind, int function, int channel, int subfunction,
                      const QString& oldValue, const QString& newValue)
{
    Store::Transaction tx(m_store);
    if (!m_rows->AddNew())
        return -1;
    m_rows->setValue(Time, m_clock.now());
    m_rows->setValue(Kind, kind);
    m_rows->setValue(Function, orNull(function));
    m_rows->setValue(Channel, channel);
    m_rows->setValue(Subfunction, orNull(subfunction));
    m_rows->setValue(OldValue, oldValue);
    m_rows->setValue(NewValue, newValue);
    m_rows->setValue(Outcome, QString());
    if (!m_rows->Update() || !tx.commit())
        return -1;
    return m_rows->RecordCount() - 1;
}

bool AuditTrail::setOutcome(int entry, const QString& outcome)
{
    if (entry < 0 || entry >= m_rows->RecordCount())
        return false;
    Store::Transaction tx(m_store);
    return m_rows->setCell(entry, Outcome, outcome) && tx.commit();
}

AuditEntry AuditTrail::current() const
{
    AuditEntry e;
    e.time = m_rows->value(Time).toDateTime();
    e.kind = m_rows->value(Kind).toString();
    const QVariant f = m_rows->value(Function);
    e.function = isNull(f) ? -1 : f.toInt();
    e.channel = m_rows->value(Channel).toInt();
    const QVariant s = m_rows->value(Subfunction);
    e.subfunction = isNull(s) ? -1 : s.toInt();
    e.oldValue = m_rows->value(OldValue).toString();
    e.newValue = m_rows->value(NewValue).toString();
    e.outcome = m_rows->value(Outcome).toString();
    return e;
}

QList<AuditEntry> AuditTrail::entries()
{
    QList<AuditEntry> out;
    const int saved = m_rows->AbsolutePosition();
    for (bool more = m_rows->MoveFirst(); more && !m_rows->atEOF(); more = m_rows->MoveNext())
        out.append(current());
    if (saved >= 0)
        m_rows->setAbsolutePosition(saved);
    return out;
}

AuditEntry AuditTrail::last()
{
    const int saved = m_rows->AbsolutePosition();
    AuditEntry e;
    if (m_rows->MoveLast())
        e = current();
    if (saved >= 0)
        m_rows->setAbsolutePosition(saved);
    return e;
}
