#include "setpoints/catalogue.h"

#include <QtTest>
#include <set>

using namespace catalogue;

class TestCatalogue : public QObject {
    Q_OBJECT
private slots:
    void everyTaggedFieldRoundTripsThroughItsTag();
    void noFieldHasTwoOwners();
    void rangesAreOrderedAndHoldTheirDefaults();
    void timeGroupsAreTheTimeFunctions();
    void replyOrderTakesEachCheckedValueOnce();
    void functionsAtTheirBoundaries_data();
    void functionsAtTheirBoundaries();
    void replyRowsAtTheEnds_data();
    void replyRowsAtTheEnds();
    void tags_data();
    void tags();
    void checkedValueAtLimitsAndWithText_data();
    void checkedValueAtLimitsAndWithText();
    void times_data();
    void times();
};

void TestCatalogue::everyTaggedFieldRoundTripsThroughItsTag()
{
    for (const Function& f : functions()) {
        QVERIFY2(f.fieldCount() >= 1, f.name);
        for (int sub = 0; sub < int(f.fields.size()); ++sub) {
            const std::optional<Tag> tag = tagFor(f.number, sub);
            QCOMPARE(tag.has_value(), f.field(sub) != kNoField);
            if (!tag)
                continue;
            QCOMPARE(decodeTag(encodeTag(*tag)), tag);
            QCOMPARE(functionOfTag(*tag), &f);
            const FieldOwner owner = findField(tag->field);
            QCOMPARE(owner.function, &f);
            QCOMPARE(owner.subfunction, sub);
        }
    }
}

void TestCatalogue::noFieldHasTwoOwners()
{
    std::set<int> numbers;
    std::set<int> owned;
    for (const Function& f : functions()) {
        QVERIFY2(numbers.insert(f.number).second, f.name);
        for (short field : f.fields) {
            if (field == kNoField)
                continue;
            QVERIFY(field > kChannelNumberField && field < kSetpointFields);
            QVERIFY2(owned.insert(field).second, qPrintable(QStringLiteral("field %1 twice").arg(field)));
        }
    }
    for (const UntaggedValue& u : untaggedValues()) {
        // Soft defrost is both a tagged box and a check box of its own.
        if (u.field == kNoField || findField(u.field).function == findFunction(u.function))
            continue;
        QVERIFY2(owned.insert(u.field).second, qPrintable(QStringLiteral("field %1 twice").arg(u.field)));
        QCOMPARE(findField(u.field).untagged, &u);
    }
}

void TestCatalogue::rangesAreOrderedAndHoldTheirDefaults()
{
    for (const Function& f : functions()) {
        QVERIFY2(f.group >= f.fieldCount() && f.group <= 8, f.name);
        QVERIFY2(f.width == 0 || f.width == 1, f.name);
        // The PID values are the ones that came with firmware 14.
        const bool pid = f.scope == Scope::Pid32 || f.scope == Scope::Analogue66;
        QCOMPARE(f.minVersion, pid ? 14 : 0);
        if (!f.rangeChecked)
            continue;
        QVERIFY2(f.min <= f.max, f.name);
        QVERIFY2(inRange(f, f.defaultValue), f.name);
        QVERIFY2(!inRange(f, qint64(f.min) - 1) && !inRange(f, qint64(f.max) + 1), f.name);
    }
}

void TestCatalogue::timeGroupsAreTheTimeFunctions()
{
    int timeFunctions = 0;
    for (const Function& f : functions()) {
        const bool times = f.unit == Unit::TimeOfDay;
        timeFunctions += times;
        for (int sub = 0; sub < f.fieldCount(); ++sub) {
            const TimeGroup* g = timeGroupOf(f.field(sub));
            QCOMPARE(g != nullptr, times);
            if (g) {
                QCOMPARE(g->function, f.number);
                QCOMPARE(g->count, f.fieldCount());
            }
        }
    }
    QCOMPARE(int(timeGroups().size()), timeFunctions);
    QCOMPARE(timeFunctions, 4);
}

void TestCatalogue::replyOrderTakesEachCheckedValueOnce()
{
    const auto order = replyOrderFields();
    QCOMPARE(int(order.size()), 220);
    std::set<int> seen;
    for (int row = 0; row < int(order.size()); ++row) {
        QVERIFY(seen.insert(order[std::size_t(row)]).second);
        QCOMPARE(replyRowOf(order[std::size_t(row)]), row);
    }
    // Every field has its row but the channel number, the two spares and the
    // PID values of the newer firmware.
    for (int field = 0; field < kSetpointFields; ++field) {
        const FieldOwner owner = findField(field);
        const bool pid = owner.function && owner.function->minVersion > 0;
        const bool rowless = field == kChannelNumberField || field == kChannelTextField || field == kSpareField || pid;
        QCOMPARE(seen.count(field) == 0, rowless);
    }
}

void TestCatalogue::functionsAtTheirBoundaries_data()
{
    QTest::addColumn<int>("function");
    QTest::addColumn<int>("channel");
    QTest::addColumn<bool>("applies");
    QTest::addColumn<int>("row");   // store row of that channel's value
    QTest::addColumn<int>("field"); // of sub-function 0
    QTest::addColumn<int>("min");
    QTest::addColumn<int>("max");
    QTest::newRow("set temperature 100") << 5 << 100 << true << 99 << 2 << -500 << 1500;
    QTest::newRow("low alarm 201") << 10 << 201 << false << 200 << 19 << -500 << 1500;
    QTest::newRow("high KPA alarm 16") << 13 << 16 << false << 15 << 202 << -100 << 4000;
    QTest::newRow("equalizer 27") << 70 << 27 << true << 26 << 167 << 0 << 30;
    QTest::newRow("condenser type 13") << 91 << 13 << false << 12 << 169 << 0 << 9;
    QTest::newRow("third PID 33") << 79 << 33 << false << 32 << 227 << 0 << 100;
    QTest::newRow("PID full on 66") << 83 << 66 << true << 65 << 224 << -30 << 30;
    QTest::newRow("description 216") << 49 << 216 << true << 215 << 25 << 0 << 0;
    QTest::newRow("banks, global") << 86 << 150 << true << 0 << 83 << 1 << 5;
    QTest::newRow("channels in bank, global") << 1 << 216 << true << 0 << 78 << 0 << 100;
}

void TestCatalogue::functionsAtTheirBoundaries()
{
    QFETCH(int, function);
    QFETCH(int, channel);
    QFETCH(bool, applies);
    QFETCH(int, row);
    QFETCH(int, field);
    QFETCH(int, min);
    QFETCH(int, max);
    const Function* f = findFunction(function);
    QVERIFY(f);
    QCOMPARE(f->appliesTo(channel), applies);
    QCOMPARE(f->storeRow(channel), row);
    QCOMPARE(f->wireChannel(channel), row);
    QCOMPARE(f->field(0), field);
    QCOMPARE(f->min, min);
    QCOMPARE(f->max, max);
}

void TestCatalogue::replyRowsAtTheEnds_data()
{
    QTest::addColumn<int>("row");
    QTest::addColumn<int>("field");
    QTest::newRow("connected") << 0 << 1;
    QTest::newRow("description") << 6 << 25;
    QTest::newRow("control type") << 59 << 209;
    QTest::newRow("liquid low alarm behind the PID values") << 72 << 168;
    QTest::newRow("condenser type") << 83 << 169;
    QTest::newRow("number of banks") << 182 << 83;
    QTest::newRow("last") << 219 << 222;
}

void TestCatalogue::replyRowsAtTheEnds()
{
    QFETCH(int, row);
    QFETCH(int, field);
    QCOMPARE(int(replyOrderFields()[std::size_t(row)]), field);
}

void TestCatalogue::tags_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<bool>("decodes");
    QTest::addColumn<bool>("inCatalogue");
    QTest::newRow("set point 3") << "005210044" << true << true;
    QTest::newRow("wrong group") << "005210045" << true << false;
    QTest::newRow("flag of 18 has no tag") << "018100306" << true << false;
    QTest::newRow("no such function") << "004010011" << true << false;
    QTest::newRow("letter") << "00521004a" << false << false;
}

void TestCatalogue::tags()
{
    QFETCH(QString, text);
    QFETCH(bool, decodes);
    QFETCH(bool, inCatalogue);
    const std::optional<Tag> tag = decodeTag(text);
    QCOMPARE(tag.has_value(), decodes);
    if (!tag)
        return;
    QCOMPARE(encodeTag(*tag), text);
    QCOMPARE(functionOfTag(*tag) != nullptr, inCatalogue);
}

void TestCatalogue::checkedValueAtLimitsAndWithText_data()
{
    QTest::addColumn<QVariant>("value");
    QTest::addColumn<QVariant>("min");
    QTest::addColumn<QVariant>("max");
    QTest::addColumn<QVariant>("expected");
    const QVariant lo(-500), hi(1500), def(30);
    QTest::newRow("at minimum") << QVariant(-500) << lo << hi << QVariant(qlonglong(-500));
    QTest::newRow("below minimum") << QVariant(-501) << lo << hi << def;
    QTest::newRow("above maximum") << QVariant(1501) << lo << hi << def;
    QTest::newRow("padded, leading zeros") << QVariant("  -0050") << lo << hi << QVariant(qlonglong(-50));
    QTest::newRow("decimal text") << QVariant("21.5") << lo << hi << QVariant(21.5);
    QTest::newRow("number then junk") << QVariant("12ab") << lo << hi << def;
    QTest::newRow("infinity") << QVariant("inf") << lo << hi << def;
    QTest::newRow("limit not numeric") << QVariant(7) << QVariant("zero") << hi << def;
}

void TestCatalogue::checkedValueAtLimitsAndWithText()
{
    QFETCH(QVariant, value);
    QFETCH(QVariant, min);
    QFETCH(QVariant, max);
    QFETCH(QVariant, expected);
    int flagged = 0;
    const QVariant def(30);
    QCOMPARE(checkedValue(value, def, min, max, &flagged), expected);
    QCOMPARE(flagged, expected == def ? 1 : 0);
}

void TestCatalogue::times_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<int>("minutes"); // -1: refused
    QTest::newRow("midnight") << "00:00" << 0;
    QTest::newRow("485") << "08:05" << 485;
    QTest::newRow("three digit hours") << "100:00" << 6000;
    for (const char* t : {"8", "08:5", "08:60", "08:05:00", "-1:00"})
        QTest::newRow(t) << QString::fromLatin1(t) << -1;
}

void TestCatalogue::times()
{
    QFETCH(QString, text);
    QFETCH(int, minutes);
    QCOMPARE(minutesOf(text), minutes < 0 ? std::nullopt : std::optional<int>(minutes));
    if (minutes >= 0)
        QCOMPARE(hhmm(minutes), text);
}

QTEST_GUILESS_MAIN(TestCatalogue)
#include "tst_catalogue.moc"
