#include "setpoints/channel_sources.h"

#include "platform/store.h"
#include "setpoints/catalogue.h"

namespace {

enum Column { Channel, SourceColumn };

QList<Store::Column> sourceColumns()
{
    using T = Store::ColumnType;
    return {{QStringLiteral("channel"), T::Integer}, {QStringLiteral("source"), T::Text}};
}

QString sourceText(ChannelSources::Source s)
{
    switch (s) {
    case ChannelSources::Source::Upload: return QStringLiteral("upload");
    case ChannelSources::Source::Edit: return QStringLiteral("edit");
    case ChannelSources::Source::Template: break;
    }
    return QString();
}

bool fail(const Store& store, QString* error)
{
    if (error)
        *error = store.lastError();
    return false;
}

} // namespace

ChannelSources::ChannelSources(Store& store, std::unique_ptr<Recordset> rows)
    : m_store(store), m_rows(std::move(rows))
{
}

ChannelSources::~ChannelSources() = default;

std::unique_ptr<ChannelSources> ChannelSources::open(Store& store, QString* error)
{
    if (!store.hasTable(kChannelSourceTable)) {
        Store::Transaction tx(store);
        if (!store.createTable(kChannelSourceTable, sourceColumns()))
            return fail(store, error), nullptr;
        std::unique_ptr<Recordset> fresh = store.openRecordset(kChannelSourceTable);
        if (!fresh)
            return fail(store, error), nullptr;
        for (int channel = 1; channel <= catalogue::kChannels; ++channel) {
            if (!fresh->AddNew() || !fresh->setValue(Channel, channel) || !fresh->setValue(SourceColumn, QString())
                || !fresh->Update())
                return fail(store, error), nullptr;
        }
        if (!tx.commit())
            return fail(store, error), nullptr;
    }
    std::unique_ptr<Recordset> rows = store.openRecordset(kChannelSourceTable, QStringLiteral("channel"));
    if (!rows || rows->RecordCount() != catalogue::kChannels) {
        if (error)
            *error = QStringLiteral("The table \"%1\" needs %2 rows").arg(kChannelSourceTable).arg(catalogue::kChannels);
        return nullptr;
    }
    return std::unique_ptr<ChannelSources>(new ChannelSources(store, std::move(rows)));
}

ChannelSources::Source ChannelSources::source(int wireChannel)
{
    const QString s = m_rows->cell(wireChannel, SourceColumn).toString();
    if (s == sourceText(Source::Upload))
        return Source::Upload;
    if (s == sourceText(Source::Edit))
        return Source::Edit;
    return Source::Template;
}

bool ChannelSources::mark(int wireChannel, Source source)
{
    if (wireChannel < 0 || wireChannel >= m_rows->RecordCount())
        return false;
    const QString text = sourceText(source);
    if (m_rows->cell(wireChannel, SourceColumn).toString() == text)
        return true;
    Store::Transaction tx(m_store);
    return m_rows->setCell(wireChannel, SourceColumn, text) && tx.commit();
}

QList<int> ChannelSources::fromTemplate(const QList<int>& wireChannels)
{
    QList<int> out;
    for (int wire : wireChannels)
        if (source(wire) == Source::Template)
            out.append(wire);
    return out;
}

QString ChannelSources::channelRuns(const QList<int>& channels)
{
    QStringList runs;
    for (qsizetype i = 0; i < channels.size();) {
        qsizetype j = i;
        while (j + 1 < channels.size() && channels[j + 1] == channels[j] + 1)
            ++j;
        runs << (j == i ? QString::number(channels[i])
                        : QStringLiteral("%1-%2").arg(channels[i]).arg(channels[j]));
        i = j + 1;
    }
    return runs.join(QStringLiteral(", "));
}
