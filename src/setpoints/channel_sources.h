#pragma once

// Where the set points of each channel's store row came from: the template
// the store was made from, an upload from the instrument, or an edit the
// instrument confirmed. A download of rows that still hold the template's
// values would push made-up set points into a live plant, so the download's
// callers ask here first. The marks live in the instrument's own data base,
// table "Channel Source", and outlast the program.

#include <QList>
#include <QString>
#include <memory>

class Store;
class Recordset;

inline const QString kChannelSourceTable = QStringLiteral("Channel Source");

class ChannelSources {
public:
    enum class Source { Template, Upload, Edit };

    // Creates the table (every channel from the template) when it is not
    // there yet. Null with the reason in *error when the store refuses.
    static std::unique_ptr<ChannelSources> open(Store& store, QString* error = nullptr);
    ~ChannelSources();

    // By wire channel, 0..215.
    Source source(int wireChannel);
    // Joins the caller's transaction when one is open.
    bool mark(int wireChannel, Source source);
    // The wire channels among `wireChannels` whose rows hold the template's values.
    QList<int> fromTemplate(const QList<int>& wireChannels);

    // "1-59, 61, 200-216": 1-based channel numbers in runs, for messages.
    static QString channelRuns(const QList<int>& channels);

private:
    ChannelSources(Store& store, std::unique_ptr<Recordset> rows);
    Store& m_store;
    std::unique_ptr<Recordset> m_rows;
};
