#pragma once

// What the transfer tests share: a link that records what goes out and holds
// the receive buffer, and a fresh instrument data base.

#include "link/link.h"
#include "link/link_globals.h"
#include "setpoints/channel_record_codec.h"
#include "setpoints/instrument_schema.h"
#include "setpoints/instrument_store.h"

#include <QFile>
#include <QMap>
#include <QTemporaryDir>
#include <QtTest>

class TestLink : public Link {
public:
    LinkGlobals g;
    QList<QByteArray> out;
    QString buffer;
    int discards = 0;
    bool lineOpen = true;

    bool Output(const QByteArray& bytes) override
    {
        if (!lineOpen)
            return false;
        out.append(bytes);
        return true;
    }
    void discardInput() override { ++discards; }
    void emptyReceiveBuffer() override
    {
        ++discards;
        buffer.clear();
    }
    QString test3Text() const override { return buffer; }
    LinkGlobals& globals() override { return g; }
    void startWaitUd() override {}
    void startDbaseError() override {}
    void hangUp() override {}

    // The commands that went out, prefix and EOT taken off.
    QStringList bodies() const
    {
        QStringList b;
        for (QByteArray c : out) {
            while (c.startsWith('Z'))
                c.remove(0, 1);
            if (c.endsWith('\x04'))
                c.chop(1);
            b << QString::fromLatin1(c);
        }
        return b;
    }
    int count(const QString& body) const { return int(bodies().count(body)); }
};

struct TestInstrument {
    QTemporaryDir dir;
    std::unique_ptr<InstrumentStore> store;

    // The template is generated once per run and copied for each test.
    TestInstrument()
    {
        static QTemporaryDir templateDir;
        static const QString templatePath = templateDir.filePath(QStringLiteral("gl.db"));
        QString error;
        if (!QFile::exists(templatePath) && !createInstrumentTemplate(templatePath, &error))
            qWarning("no template: %s", qPrintable(error));
        const QString path = dir.filePath(QStringLiteral("t-1.db"));
        if (QFile::copy(templatePath, path))
            store = InstrumentStore::open(path, &error);
        if (!store)
            qWarning("no instrument store: %s", qPrintable(error));
    }
};

// An upload record as the instrument sends it: every value of the layout
// from `value`, right aligned; for firmware below 14 without the values of
// fields 223..227.
inline QString uploadRecordText(int wire, double version, const std::function<QString(int field)>& value)
{
    QString r = QString::number(wire).rightJustified(6);
    for (const channel_record::RecordValue& v : channel_record::uploadLayout(wire, version)) {
        const int gap = v.position - 1 - int(r.size());
        if (gap > 0)
            r += QString(gap, QLatin1Char('#')); // the filler's place
        r += value(v.field).rightJustified(v.width).right(v.width);
    }
    if (version < channel_record::kPidFirmware && r.size() > channel_record::kFillerPosition)
        r.remove(channel_record::kFillerPosition - 1, channel_record::kFiller.size());
    return r + QStringLiteral("schanupload");
}
