#pragma once

// A link for the status tests: records what the views send, keeps the
// shared variables and WaitUd on the test clock.

#include "link/link.h"
#include "link/link_globals.h"
#include "link/open_views.h"
#include "platform/clock.h"
#include "platform/manual_clock.h"
#include "platform/operator.h"
#include "setpoints/instrument_schema.h"
#include "setpoints/instrument_store.h"

#include <QList>
#include <QTemporaryDir>
#include <memory>

class TestLink : public Link {
public:
    explicit TestLink(Clock& clock) : WaitUd(clock, 8000)
    {
        QObject::connect(&WaitUd, &Timer::timeout, [this] { g.status_request_wait = false; });
        g.link_up = true;
        g.reply_wait_ms = 4000;
    }
    bool Output(const QByteArray& bytes) override
    {
        writes.append(bytes);
        return true;
    }
    void discardInput() override {}
    void emptyReceiveBuffer() override { test3.clear(); }
    QString test3Text() const override { return test3; }
    LinkGlobals& globals() override { return g; }
    void startWaitUd() override
    {
        g.status_request_wait = true;
        WaitUd.start(8000);
    }
    void startDbaseError() override { ++dbaseErrors; }
    void hangUp() override {}

    LinkGlobals g;
    QList<QByteArray> writes;
    QString test3;
    Timer WaitUd;
    int dbaseErrors = 0;
};

// A reply built by hand: blanks, with fields put at 1-based positions.
struct ReplyText {
    QString text;
    explicit ReplyText(int length, const QString& token = {}) : text(length, QLatin1Char(' ')), token(token) {}
    // A 6-wide number, right-aligned as the instrument pads it.
    ReplyText& num(int pos, int value, int width = 6)
    {
        return put(pos, QString::number(value).rightJustified(width));
    }
    ReplyText& put(int pos, const QString& t)
    {
        if (pos - 1 + t.size() > text.size())
            text.resize(pos - 1 + t.size(), QLatin1Char(' '));
        text.replace(pos - 1, t.size(), t);
        return *this;
    }
    QString str() const { return text + token; }
    QString token;
};

// An instrument's store made from the template, and what a status engine needs.
struct StatusRig {
    QTemporaryDir dir;
    QString path = dir.filePath(QStringLiteral("t-7.db"));
    ManualClock clock{QDateTime(QDate(2026, 3, 9), QTime(14, 5, 30))};
    TestLink link{clock};
    ScriptedOperator op;
    OpenViews views;
    std::unique_ptr<InstrumentStore> store;
    StatusRig()
    {
        createInstrumentTemplate(path);
        store = InstrumentStore::open(path);
    }
    // The channels of the display rows, in order.
    void select(const QList<int>& channels)
    {
        for (int i = 0; i < 20; ++i)
            store->setInfo(i, 7, i < channels.size() ? channels[i] : 0);
    }
};
