// What the simulated instrument puts on the line when several things meet:
// every message must reach the reader on its own.

#include "sim/sim_instrument.h"

#include <QTest>

using namespace sim;

namespace {

const QByteArray Eot("\x04");

// One message as a reader would see it, with the times its first and last
// bytes went out.
struct Message {
    QByteArray text;
    qint64 first = 0;
    qint64 last = 0;
};

// Drives an instrument in steps of a few milliseconds and cuts what it sends
// into messages at their tokens.
struct Line {
    explicit Line(const QString& scenario)
        : instrument(options(), Instrument::Settings())
    {
        for (const QString& l : scenario.split(QLatin1Char(';'), Qt::SkipEmptyParts))
            error += applyScenarioLine(instrument, l);
        QObject::connect(&instrument, &Instrument::transmit, [this](const QByteArray& b) {
            if (open.text.isEmpty())
                open.first = now;
            open.text += b;
            open.last = now;
            for (const char* token : {"status", "alm-new", "dxstart", "evapfrst", "presss"})
                if (open.text.endsWith(token)) {
                    messages << open;
                    open = Message();
                    break;
                }
        });
    }
    static Options options()
    {
        Options o;
        o.historyHours = 0;
        o.start = QDateTime(QDate(2026, 3, 7), QTime(14, 5));
        return o;
    }
    void run(qint64 ms)
    {
        for (const qint64 end = now + ms; now < end;) {
            now += 5;
            instrument.advance(5);
        }
    }
    void say(const QByteArray& bytes) { instrument.receive(bytes); }
    Instrument instrument;
    qint64 now = 0;
    QList<Message> messages;
    Message open;
    QString error;
};

// The tokens found anywhere in a text, in their order.
QByteArrayList tokensIn(const QByteArray& text)
{
    QByteArrayList found;
    for (int i = 0; i < text.size(); ++i)
        for (const char* token : {"status", "alm-new", "dxstart", "evapfrst", "presss"})
            if (text.mid(i).startsWith(token))
                found << token;
    return found;
}

} // namespace

class TstSimLine : public QObject {
    Q_OBJECT
private slots:
    void messagesStandAlone_data();
    void messagesStandAlone();
};

void TstSimLine::messagesStandAlone_data()
{
    QTest::addColumn<QString>("scenario");
    // Steps: "alarm" logs an alarm, a number lets that many ms pass, any
    // other word is sent as a command with EOT.
    QTest::addColumn<QStringList>("steps");
    QTest::addColumn<QByteArrayList>("tokens"); // what must come out, sorted
    QTest::addColumn<int>("pollWithin");        // ms the "F" reply may take
    const QByteArrayList almStatus {"alm-new", "status"};
    const QByteArrayList brumalet {"dxstart", "evapfrst", "status"};
    QTest::newRow("alarm logged as the poll arrives") << QString() << QStringList {"alarm", "F", "1000"} << almStatus << 0;
    QTest::newRow("alarm sent as the poll arrives") << QString() << QStringList {"alarm", "5", "F", "1000"} << almStatus << 500;
    QTest::newRow("alarm just after a poll") << QString() << QStringList {"F", "alarm", "1000"} << almStatus << 0;
    QTest::newRow("alarm in a slow reply") << QString("batch = 10:5") << QStringList {"F", "alarm", "3000"} << almStatus << 3000;
    QTest::newRow("alarm in a late reply") << QString("delay = 300") << QStringList {"F", "100", "alarm", "1000"} << almStatus << 300;
    QTest::newRow("poll while a reading is pending") << QString() << QStringList {"J005", "1000", "F", "3000"} << brumalet << 0;
    QTest::newRow("reading due as the poll arrives") << QString("brumalet_delay = 1000") << QStringList {"J005", "1000", "F", "2000"} << brumalet << 500;
    QTest::newRow("poll after the reading starts") << QString() << QStringList {"J005", "200", "F", "3000"} << brumalet << 0;
}

void TstSimLine::messagesStandAlone()
{
    QFETCH(QString, scenario);
    QFETCH(QStringList, steps);
    QFETCH(QByteArrayList, tokens);
    QFETCH(int, pollWithin);
    Line line(scenario);
    QCOMPARE(line.error, QString());
    line.run(1000);
    qint64 polled = -1;
    for (const QString& step : steps) {
        bool number = false;
        const int ms = step.toInt(&number);
        if (number)
            line.run(ms);
        else if (step == QLatin1String("alarm"))
            line.instrument.state().raiseAlarm(3);
        else {
            if (step == QLatin1String("F"))
                polled = line.now;
            line.say(step.toLatin1() + Eot);
        }
    }
    QCOMPARE(line.open.text, QByteArray());
    QByteArrayList seen;
    for (int i = 0; i < line.messages.size(); ++i) {
        const Message& m = line.messages[i];
        // One token to a message, at its end...
        QCOMPARE(tokensIn(m.text).size(), 1);
        seen << tokensIn(m.text).first();
        // ...and silence in front of it, so that no read takes two.
        if (i > 0)
            QVERIFY2(m.first - line.messages[i - 1].last >= 50, m.text.right(20).constData());
        if (m.text.endsWith("status"))
            QVERIFY2(m.first - polled <= pollWithin, QByteArray::number(m.first - polled).constData());
    }
    std::sort(seen.begin(), seen.end());
    QCOMPARE(seen, tokens);
}

QTEST_GUILESS_MAIN(TstSimLine)
#include "tst_sim_line.moc"
