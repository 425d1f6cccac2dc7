// The simulated instrument's side of the line: command recognition, echoes,
// log dialogues, the modem in front, faults and the living plant.

#include "sim/sim_instrument.h"

#include <QTest>

using namespace sim;

namespace {

const QByteArray Eot("\x04");
QByteArray z(int n) { return QByteArray(n, 'Z'); }

struct Rig {
    explicit Rig(const QByteArray& version = "9.6", bool modem = false)
        : instrument(options(version), settings(modem))
    {
        QObject::connect(&instrument, &Instrument::transmit, [this](const QByteArray& b) { out += b; });
    }
    static Options options(const QByteArray& version)
    {
        Options o;
        o.version = version;
        o.historyHours = 0;
        o.start = QDateTime(QDate(2026, 3, 7), QTime(14, 5));
        return o;
    }
    static Instrument::Settings settings(bool modem)
    {
        Instrument::Settings s;
        s.id = 12;
        s.modem = modem;
        return s;
    }
    // Sends bytes and returns what came back at once.
    QByteArray say(const QByteArray& bytes)
    {
        out.clear();
        instrument.receive(bytes);
        return out;
    }
    Instrument instrument;
    QByteArray out;
};

} // namespace

class TstSimDialogue : public QObject {
    Q_OBJECT
private slots:
    void recogniser_data();
    void recogniser();
    void splitArrival();
    void writeEcho_data();
    void writeEcho();
    void refusedWrite_data();
    void refusedWrite();
    void download();
    void logChain_data();
    void logChain();
    void newOnly();
    void clearing();
    void almNew();
    void modem_data();
    void modem();
    void escape();
    void faults();
    void plant();
};

void TstSimDialogue::recogniser_data()
{
    QTest::addColumn<QByteArray>("version");
    QTest::addColumn<QByteArray>("bytes");
    QTest::addColumn<QByteArray>("token"); // empty: no reply
    QTest::newRow("CONNECTK with prefix") << QByteArray("9.6") << z(30) + "CONNECTK" + Eot << QByteArray("Glacinor");
    QTest::newRow("CONNECTK without EOT") << QByteArray("9.6") << z(30) + "CONNECTK" << QByteArray();
    QTest::newRow("K alone") << QByteArray("9.6") << QByteArray("K") << QByteArray("Glacinor");
    QTest::newRow("F without prefix") << QByteArray("9.6") << "F" + Eot << QByteArray("status");
    QTest::newRow("F with prefix") << QByteArray("9.6") << z(85) + "F" + Eot << QByteArray("status");
    QTest::newRow("F needs EOT") << QByteArray("9.6") << QByteArray("F") << QByteArray();
    QTest::newRow("T") << QByteArray("9.6") << "T" + Eot << QByteArray("presss");
    QTest::newRow("t from 8") << QByteArray("8") << z(85) + "t" + Eot << QByteArray("torvan");
    QTest::newRow("t below 8") << QByteArray("7") << z(85) + "t" + Eot << QByteArray();
    QTest::newRow("c") << QByteArray("9.6") << z(61) + "c" + Eot << QByteArray("schanupload");
    QTest::newRow("a") << QByteArray("9.6") << z(61) + "a17," + Eot << QByteArray("schanupload");
    QTest::newRow("a out of range") << QByteArray("9.6") << z(61) + "a216," + Eot << QByteArray();
    QTest::newRow("J") << QByteArray("9.6") << z(85) + "J005" + Eot << QByteArray("dxstart");
    QTest::newRow("EOT alone, idle") << QByteArray("9.6") << Eot << QByteArray();
    QTest::newRow("key byte") << QByteArray("9.7") << QByteArray(1, char(164 + 3)) << QByteArray("tempfront");
    QTest::newRow("g key") << QByteArray("9.6") << z(41) + "g;" << QByteArray("tempfront");
    QTest::newRow("h0") << QByteArray("9.6") << z(41) + "h0" << QByteArray("tempfront");
    QTest::newRow("g key at 8.9") << QByteArray("8.9") << z(41) + "g1" << QByteArray("tempfront");
    QTest::newRow("h key at 9.8") << QByteArray("9.8") << z(41) + "h?" << QByteArray("tempfront");
    QTest::newRow("g key at 9.7") << QByteArray("9.7") << z(41) + "g1" << QByteArray();
    QTest::newRow("h key at 7") << QByteArray("7") << z(41) + "h2" << QByteArray();
    QTest::newRow("key byte at 9.1") << QByteArray("9.1") << QByteArray(1, char(164 + 1)) << QByteArray();
    QTest::newRow("key byte at 6.5") << QByteArray("6.5") << QByteArray(1, char(164)) << QByteArray("tempfront");
    QTest::newRow("modem text on a direct line") << QByteArray("9.6") << QByteArray("ATX4DT5551234\r\n") << QByteArray();
    QTest::newRow("after modem text") << QByteArray("9.6") << "ATH0\r\nF" + Eot << QByteArray("status");
}

void TstSimDialogue::recogniser()
{
    QFETCH(QByteArray, version);
    QFETCH(QByteArray, bytes);
    QFETCH(QByteArray, token);
    Rig rig(version);
    const QByteArray reply = rig.say(bytes);
    if (token.isEmpty())
        QCOMPARE(reply, QByteArray());
    else
        QVERIFY2(reply.endsWith(token), reply.right(40).constData());
}

void TstSimDialogue::splitArrival()
{
    Rig rig;
    QCOMPARE(rig.say(z(30) + "CONN"), QByteArray());
    const QByteArray id = rig.say("ECTK" + Eot);
    QCOMPARE(id.size(), 47);
    QCOMPARE(id.mid(7, 5), QByteArray("00012"));
    // "c" walks the channels from the first; any other command starts the
    // walk again, the last channel too.
    QVERIFY(rig.say("c" + Eot).startsWith("     0"));
    QVERIFY(rig.say("c" + Eot).startsWith("     1"));
    rig.say("K");
    QVERIFY(rig.say("c" + Eot).startsWith("     0"));
    QVERIFY(rig.say("c" + Eot).startsWith("     1"));
    rig.say("F" + Eot);
    QVERIFY(rig.say("c" + Eot).startsWith("     0"));
    for (int i = 1; i < 216; ++i)
        rig.say("c" + Eot);
    QVERIFY(rig.say("c" + Eot).startsWith("     0"));
}

void TstSimDialogue::writeEcho_data()
{
    QTest::addColumn<QByteArray>("command");
    QTest::addColumn<QByteArray>("echo");
    QTest::addColumn<int>("wire");
    QTest::addColumn<int>("field");
    QTest::addColumn<int>("stored");
    QTest::newRow("set temperature") << QByteArray("5,3,1,1,215,4,") << QByteArray("5,3,1,1,215,4,sret") << 3 << 3 << 215;
    QTest::newRow("check box") << QByteArray("0,4,0,0,0,") << QByteArray("0,4,0,0,0,sret") << 4 << 1 << 0;
    QTest::newRow("day mask with zero") << QByteArray("041,2,3,0,5,7,") << QByteArray("041,2,3,0,5,7,sret") << 2 << 57 << 5;
    QTest::newRow("associated channel") << QByteArray("48,0,1,0,5,3,") << QByteArray("48,0,1,0,5,3,sret") << 0 << 27 << 4;
    QTest::newRow("global") << QByteArray("86,0,0,0,3,1,") << QByteArray("86,0,0,0,3,1,sret") << 0 << 83 << 3;
    QTest::newRow("time group") << QByteArray("17,1,0,1,60,4,120,180,240,") << QByteArray("17,1,0,1,60,4,120,180,240,sret") << 1 << 9 << 240;
    QTest::newRow("defrost times") << QByteArray("19,0,0,1,1,8,2,3,4,5,6,7,8,") << QByteArray("19,0,0,1,1,8,2,3,4,5,6,7,8,sret") << 0 << 42 << 8;
    QByteArray order = "65,", orderEcho;
    for (int i = 27; i >= 1; --i)
        order += QByteArray::number(i) + ",";
    orderEcho = order.chopped(1) + ",sret";
    QTest::newRow("compressor order") << order << orderEcho << 26 << 207 << 1;
    QTest::newRow("condenser order") << QByteArray("90,2,1,3,4,5,6,7,8,9,10,11,12,") << QByteArray("90,2,1,3,4,5,6,7,8,9,10,11,12,sret") << 1 << 206 << 1;
    QByteArray shed = "100,";
    for (int i = 0; i < 100; ++i)
        shed += QByteArray::number(i == 99 ? 7 : 0) + ",";
    QTest::newRow("load shed order") << shed << shed.chopped(1) + ",sret" << 99 << 95 << 7;
    QTest::newRow("load shed time") << QByteArray("101,0,0,1,120,1,") << QByteArray("101,0,0,1,120,1,sret") << 0 << 96 << 120;
}

void TstSimDialogue::writeEcho()
{
    QFETCH(QByteArray, command);
    QFETCH(QByteArray, echo);
    QFETCH(int, wire);
    QFETCH(int, field);
    QFETCH(int, stored);
    Rig rig;
    const int before = rig.instrument.state().field(wire, field);
    QVERIFY(before != stored);
    QCOMPARE(rig.say(z(61) + "P" + command + Eot), echo);
    // "V" drops the write...
    QCOMPARE(rig.say("V"), QByteArray());
    QCOMPARE(rig.instrument.state().field(wire, field), before);
    // ...and "X" takes it.
    rig.say(z(61) + "P" + command + Eot);
    QCOMPARE(rig.say("X"), QByteArray());
    QCOMPARE(rig.instrument.state().field(wire, field), stored);
    // An "X" with nothing pending changes nothing more.
    rig.instrument.state().setField(wire, field, before);
    rig.say("X");
    QCOMPARE(rig.instrument.state().field(wire, field), before);
}

void TstSimDialogue::refusedWrite_data()
{
    QTest::addColumn<QByteArray>("version");
    QTest::addColumn<QByteArray>("command");
    QTest::addColumn<bool>("taken");
    QTest::addColumn<QByteArray>("recordHas"); // in channel 1's record once taken
    QTest::newRow("set temperature with a point") << QByteArray("9.6") << QByteArray("5,0,0,1,12.5,4,") << false << QByteArray();
    QTest::newRow("slow load too wide") << QByteArray("9.6") << QByteArray("57,0,0,1,1000,5,") << false << QByteArray();
    QTest::newRow("no such function") << QByteArray("9.6") << QByteArray("27,0,0,0,1,1,") << false << QByteArray();
    QTest::newRow("times out of order") << QByteArray("9.6") << QByteArray("17,0,0,1,60,4,120,100,240,") << false << QByteArray();
    QTest::newRow("description with blanks") << QByteArray("9.6") << QByteArray("49,0,0,0,A B  C,6,") << true << QByteArray("A B  C");
    QTest::newRow("description too long") << QByteArray("9.6") << QByteArray("49,0,0,0,Freezer,6,") << false << QByteArray();
    QTest::newRow("description too short") << QByteArray("9.6") << QByteArray("49,0,0,0,Dock,6,") << false << QByteArray();
    QTest::newRow("compressor kind wide from 8") << QByteArray("8") << QByteArray("23,0,0,0,10,1,") << true << QByteArray("    10");
    QTest::newRow("compressor kind wide at 7") << QByteArray("7") << QByteArray("23,0,0,0,10,1,") << false << QByteArray();
    QTest::newRow("daily mask empty") << QByteArray("9.6") << QByteArray("041,0,3,0,0,7,") << false << QByteArray();
}

void TstSimDialogue::refusedWrite()
{
    QFETCH(QByteArray, version);
    QFETCH(QByteArray, command);
    QFETCH(bool, taken);
    QFETCH(QByteArray, recordHas);
    Rig rig(version);
    const QByteArray before = rig.say(z(61) + "a0," + Eot);
    const QByteArray echo = rig.say(z(61) + "P" + command + Eot);
    // A write the instrument cannot hold is not echoed, and an "X" after it
    // changes nothing.
    QCOMPARE(echo.isEmpty(), !taken);
    rig.say("X");
    const QByteArray after = rig.say(z(61) + "a0," + Eot);
    QCOMPARE(after == before, !taken);
    if (taken)
        QVERIFY2(after.contains(recordHas), after.constData());
}

void TstSimDialogue::download()
{
    Rig rig;
    const QByteArray record = "215,1,0,0,360,720,1080,Dock 1,2,0,15,30,45,";
    QCOMPARE(rig.say(z(61) + "d" + record + Eot), record + "downcheck");
    QCOMPARE(rig.say("e"), QByteArray("donedown"));
    QCOMPARE(rig.instrument.state().field(215, 92), 15);
    QVERIFY(rig.say(z(61) + "a215," + Eot).startsWith("   21510     0   360   720  1080Dock 12     0    15    30    45"));
    // A record broken off with "V" is not taken; "e" alone then says nothing.
    rig.say(z(61) + "d215,1,0,0,360,720,1080,Dock 2,2,0,15,30,45," + Eot);
    rig.say("V");
    QCOMPARE(rig.say("e"), QByteArray());
    QCOMPARE(rig.instrument.state().description(215), QByteArray("Dock 1"));
}

void TstSimDialogue::logChain_data()
{
    QTest::addColumn<QByteArray>("letter");
    QTest::addColumn<QByteArray>("token");
    QTest::addColumn<int>("flagPos"); // the continuation flag, from 1; 0: behind the values
    QTest::addColumn<QByteArray>("more");
    QTest::addColumn<QByteArray>("last");
    QTest::newRow("alarms") << QByteArray("D") << QByteArray("almlog") << 55 << QByteArray("1") << QByteArray("0");
    QTest::newRow("data log") << QByteArray("S") << QByteArray("histy") << 0 << QByteArray("+00000") << QByteArray("+00001");
    QTest::newRow("power") << QByteArray("s") << QByteArray("power") << 39 << QByteArray("0") << QByteArray("1");
}

void TstSimDialogue::logChain()
{
    QFETCH(QByteArray, letter);
    QFETCH(QByteArray, token);
    QFETCH(int, flagPos);
    QFETCH(QByteArray, more);
    QFETCH(QByteArray, last);
    Rig rig;
    InstrumentState& s = rig.instrument.state();
    for (int ch : {3, 9, 12})
        s.raiseAlarm(ch);
    rig.instrument.advance(3 * 3600 * 1000); // three hours of logging
    rig.instrument.advance(1000); // "alm-new" has gone out and the line is quiet again
    const int count = letter == "D" ? int(s.alarms.records.size()) : letter == "S" ? int(s.history.records.size()) : int(s.power.records.size());
    QVERIFY(count >= 3);
    auto flag = [&](const QByteArray& r) {
        const QByteArray body = r.chopped(token.size());
        return flagPos ? body.mid(flagPos - 1) : body.right(6);
    };
    QByteArray r = rig.say(z(85) + letter + Eot);
    QVERIFY(r.endsWith(token));
    QCOMPARE(r.mid(letter == "D" ? 12 : 17, 6).toInt(), count);
    for (int i = 1; i < count; ++i) {
        QCOMPARE(flag(r), more);
        r = rig.say(Eot);
        QVERIFY(r.endsWith(token));
    }
    QCOMPARE(flag(r), last);
    QCOMPARE(rig.say(Eot), QByteArray()); // the chain has ended
}

void TstSimDialogue::newOnly()
{
    Rig rig;
    InstrumentState& s = rig.instrument.state();
    QCOMPARE(rig.say(z(85) + "b" + Eot), QByteArray("no data logalmlog"));
    s.raiseAlarm(4);
    s.raiseAlarm(5);
    // A "b" broken off by "V" leaves both new.
    QVERIFY(rig.say(z(85) + "b" + Eot).startsWith("+00004"));
    rig.say("V");
    QVERIFY(rig.say(z(85) + "b" + Eot).startsWith("+00004"));
    QVERIFY(rig.say(Eot).startsWith("+00005"));
    QCOMPARE(rig.say(z(85) + "b" + Eot), QByteArray("no data logalmlog"));
    s.raiseAlarm(6);
    QVERIFY(rig.say(z(85) + "b" + Eot).startsWith("+00006Room06+00001"));
    // "D" still sends all three.
    QCOMPARE(rig.say(z(85) + "D" + Eot).mid(12, 6), QByteArray("+00003"));
    QCOMPARE(rig.say(z(84) + "U" + Eot), QByteArray("no data loghisty"));
    QCOMPARE(rig.say(z(85) + "u" + Eot), QByteArray("no data logpower"));
}

void TstSimDialogue::clearing()
{
    Rig rig;
    rig.instrument.advance(3600 * 1000);
    QCOMPARE(rig.say(z(85) + "E" + Eot), QByteArray("noalarms"));
    rig.instrument.state().raiseAlarm(7);
    QCOMPARE(rig.say(z(85) + "E" + Eot), QByteArray("realarms"));
    QCOMPARE(rig.say(z(85) + "D" + Eot), QByteArray("no data logalmlog"));
    QCOMPARE(rig.say(z(84) + "Q" + Eot), QByteArray("dlres"));
    QCOMPARE(rig.say(z(84) + "S" + Eot), QByteArray("no data loghisty"));
    QCOMPARE(rig.say(z(85) + "q" + Eot), QByteArray("plres"));
    QCOMPARE(rig.say(z(85) + "s" + Eot), QByteArray("no data logpower"));
}

void TstSimDialogue::almNew()
{
    Rig rig;
    rig.instrument.state().raiseAlarm(3);
    rig.instrument.state().raiseAlarm(4);
    // Not in the middle of an upload: it waits for the chain's end.
    QVERIFY(rig.say(z(85) + "D" + Eot).endsWith("almlog"));
    rig.out.clear();
    rig.instrument.state().raiseAlarm(5);
    rig.instrument.advance(100);
    QCOMPARE(rig.out, QByteArray());
    rig.say(Eot);
    rig.out.clear();
    rig.instrument.advance(100);
    QCOMPARE(rig.out, QByteArray("alm-new"));
    rig.out.clear();
    rig.instrument.advance(100);
    QCOMPARE(rig.out, QByteArray());
}

void TstSimDialogue::modem_data()
{
    QTest::addColumn<QString>("scenario");
    QTest::addColumn<QByteArray>("dial");
    QTest::addColumn<QByteArray>("results");
    QTest::newRow("connect") << QString("dial = connect") << QByteArray("ATX4DT5551234\r\n") << QByteArray("\r\nCONNECT 9600\r\n");
    QTest::newRow("busy") << QString("dial = busy") << QByteArray("ATX4DT5551234\r\n") << QByteArray("\r\nBUSY\r\n");
    QTest::newRow("busy unheard with X0") << QString("dial = busy") << QByteArray("ATX0DT5551234\r\n") << QByteArray("\r\nNO CARRIER\r\n");
    QTest::newRow("no dial tone") << QString("dial = no dialtone") << QByteArray("ATX4DT5551234\r\n") << QByteArray("\r\nNO DIALTONE\r\n");
    QTest::newRow("busy then connect")
        << QString("dial = busy, busy, connect") << QByteArray("ATX4DT1\r\nATX4DT1\r\nATX4DT1\r\n")
        << QByteArray("\r\nBUSY\r\n\r\nBUSY\r\n\r\nCONNECT 9600\r\n");
    QTest::newRow("plain ATDT") << QString("dial = connect") << QByteArray("ATDT1\r\n") << QByteArray("\r\nCONNECT 9600\r\n");
    QTest::newRow("modem text with &D2") << QString("dial = connect") << QByteArray("ATX4&D2DT1\r\n") << QByteArray("\r\nCONNECT 9600\r\n");
    QTest::newRow("&D2 is no dial") << QString("dial = connect") << QByteArray("ATX4&D2\r\n") << QByteArray("\r\nOK\r\n");
}

void TstSimDialogue::modem()
{
    QFETCH(QString, scenario);
    QFETCH(QByteArray, dial);
    QFETCH(QByteArray, results);
    Rig rig("9.6", true);
    QCOMPARE(applyScenarioLine(rig.instrument, scenario), QString());
    rig.instrument.start(); // its greeting goes to its own modem only
    QCOMPARE(rig.out, QByteArray());
    QCOMPARE(rig.say("K"), QByteArray()); // no call: nothing reaches it
    QCOMPARE(rig.say("AT+MS?\r\n"), QByteArray("\r\n+MS: 11,1,300,9600,300,9600\r\n\r\nOK\r\n"));
    QCOMPARE(rig.say("AT&F\r\n"), QByteArray("\r\nOK\r\n"));
    QCOMPARE(rig.say(dial), results);
    const bool online = results.endsWith("CONNECT 9600\r\n");
    QCOMPARE(rig.instrument.modemOnline(), online);
    QCOMPARE(rig.say("K").endsWith("Glacinor"), online);
    if (online) {
        rig.out.clear();
        rig.instrument.reset();
        QCOMPARE(rig.out, QByteArray("AT&FE0"));
    }
}

void TstSimDialogue::escape()
{
    Rig rig("9.6", true);
    rig.say("ATX4DT1\r\n");
    rig.instrument.advance(1500);
    // "+++" after a second of silence, then a second more: command mode.
    QCOMPARE(rig.say("+++"), QByteArray());
    rig.instrument.advance(500);
    QCOMPARE(rig.out, QByteArray());
    rig.instrument.advance(600);
    QCOMPARE(rig.out, QByteArray("\r\nOK\r\n"));
    QCOMPARE(rig.say("ATH0\r\n"), QByteArray("\r\nOK\r\n"));
    QVERIFY(!rig.instrument.modemOnline());
    QCOMPARE(rig.say("K"), QByteArray());
    // Plus signs inside the data are data.
    rig.say("ATX4DT1\r\n");
    rig.instrument.advance(200);
    QVERIFY(rig.say("+++F" + Eot).endsWith("status"));
    QVERIFY(rig.instrument.modemOnline());
    // The far end lost: NO CARRIER.
    rig.out.clear();
    rig.instrument.dropLine();
    QCOMPARE(rig.out, QByteArray("\r\nNO CARRIER\r\n"));
}

void TstSimDialogue::faults()
{
    Rig rig;
    QCOMPARE(applyScenarioLine(rig.instrument, "drop = F:2"), QString());
    QVERIFY(rig.say("F" + Eot).endsWith("status"));
    QCOMPARE(rig.say("F" + Eot), QByteArray());
    QVERIFY(rig.say("F" + Eot).endsWith("status"));

    QCOMPARE(applyScenarioLine(rig.instrument, "garble P:1"), QString());
    QCOMPARE(rig.say("P5,3,1,1,215,4," + Eot), QByteArray("6,3,1,1,215,4,sret"));
    QCOMPARE(rig.say("P5,3,1,1,215,4," + Eot), QByteArray("5,3,1,1,215,4,sret"));

    QCOMPARE(applyScenarioLine(rig.instrument, "wrong_id = 99"), QString());
    QCOMPARE(rig.say("K").mid(7, 5), QByteArray("00099"));
    QCOMPARE(applyScenarioLine(rig.instrument, "wrong_version = ?x"), QString());
    QVERIFY(rig.say("K").startsWith("?x     00099"));

    QCOMPARE(applyScenarioLine(rig.instrument, "nocomp = 1"), QString());
    QCOMPARE(rig.say(z(30) + "CONNECTK" + Eot), QByteArray("nocomp"));
    QCOMPARE(applyScenarioLine(rig.instrument, "clear_faults"), QString());

    // Pieces of 10 bytes, 50 ms apart, after a delay of 100 ms.
    QCOMPARE(applyScenarioLine(rig.instrument, "delay = 100"), QString());
    QCOMPARE(applyScenarioLine(rig.instrument, "batch = 10:50"), QString());
    QList<QByteArray> pieces;
    connect(&rig.instrument, &Instrument::transmit, this, [&](const QByteArray& b) { pieces << b; });
    rig.say("K");
    QVERIFY(pieces.isEmpty());
    rig.instrument.advance(100);
    QCOMPARE(pieces.size(), 1);
    rig.instrument.advance(50);
    QCOMPARE(pieces.size(), 2);
    rig.instrument.advance(1000);
    QCOMPARE(pieces.size(), 5);
    QCOMPARE(pieces.join().right(8), QByteArray("Glacinor"));

    QVERIFY(applyScenarioLine(rig.instrument, "drop = F").startsWith("error"));
    QVERIFY(applyScenarioLine(rig.instrument, "dial = ringing").startsWith("error"));
    QVERIFY(applyScenarioLine(rig.instrument, "frobnicate = 1").startsWith("error"));
}

void TstSimDialogue::plant()
{
    Rig rig;
    InstrumentState& s = rig.instrument.state();
    // Room 1 freezes down to its set point, room 21 holds a chill room's.
    s.advance(6 * 3600 * 1000);
    int defrostMinutes = 0, near1 = 0, near21 = 0, staged = 0;
    for (int minute = 0; minute < 24 * 60; ++minute) {
        s.advance(60 * 1000);
        defrostMinutes += s.room(1).defrost;
        staged += s.compressor(0).running > 0;
        near1 += qAbs(s.reading(1) - s.field(0, 2)) <= 40;
        near21 += qAbs(s.reading(21) - s.field(20, 2)) <= 40;
    }
    // Four defrosts of 20 minutes; the rest of the day near the set point.
    QCOMPARE(defrostMinutes, 4 * 20);
    QVERIFY2(near1 > 24 * 60 * 3 / 4, QByteArray::number(near1).constData());
    QVERIFY2(near21 > 24 * 60 * 3 / 4, QByteArray::number(near21).constData());
    QVERIFY(staged > 0 && staged < 24 * 60);
    QCOMPARE(s.power.records.size(), 30 * 4);
    // Room 7's open door was logged as a high alarm, once.
    QCOMPARE(s.alarms.records.size(), 1);
    QCOMPARE(s.alarms.records.first().channel, 7);
    QCOMPARE(s.alarms.records.first().time.time().hour(), 10);
    // A higher set point written through "P" is followed.
    rig.say("P5,0,0,1,-100,4," + Eot);
    rig.say("X");
    s.advance(4 * 3600 * 1000);
    QVERIFY(qAbs(s.reading(1) - -100) < 40 || s.room(1).defrost);
}

QTEST_GUILESS_MAIN(TstSimDialogue)
#include "tst_sim_dialogue.moc"
