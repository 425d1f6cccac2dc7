#include "setpoints/catalogue.h"

#include <QtTest>
#include <set>

using namespace catalogue;

namespace {

// "2-5" or "29,31,32" into field ordinals.
QList<int> parseFields(const QString& text)
{
    QList<int> out;
    for (const QString& part : text.split(QLatin1Char(','))) {
        const QStringList ends = part.trimmed().split(QLatin1Char('-'));
        for (int f = ends.first().toInt(); f <= ends.last().toInt(); ++f)
            out.append(f);
    }
    return out;
}

QList<int> taggedFields(const Function& f)
{
    QList<int> out;
    for (short v : f.fields)
        if (v != kNoField)
            out.append(v);
    return out;
}

} // namespace

class TestCatalogue : public QObject {
    Q_OBJECT
private slots:
    void functionMatchesItsRow_data();
    void functionMatchesItsRow();
    void everyFunctionHasARow();
    void storeFieldsBelongToOneOwner();
    void untaggedValues_data();
    void untaggedValues();
    void globalListIsTheGlobalScope();
    void scopeDecidesChannelAndRow_data();
    void scopeDecidesChannelAndRow();
    void timeGroupsRise_data();
    void timeGroupsRise();
    void replyOrderFollowsTheRecord_data();
    void replyOrderFollowsTheRecord();
    void replyOrderCoversEveryValueOnce();
    void checkedValueAtLimitsAndWithText_data();
    void checkedValueAtLimitsAndWithText();
    void hhmm_data();
    void hhmm();
    void hhmmRoundTripsEveryMinuteOfTheDay();
    void malformedTimesAreRefused_data();
    void malformedTimesAreRefused();
    void tags_data();
    void tags();
    void everyTaggedFieldRoundTripsThroughItsTag();
    void screenForms_data();
    void screenForms();
    void defaultsLieInTheirRange();
    void functionsByName_data();
    void functionsByName();
};

void TestCatalogue::functionMatchesItsRow_data()
{
    QTest::addColumn<int>("function");
    QTest::addColumn<QString>("name");
    QTest::addColumn<int>("group");
    QTest::addColumn<int>("width");
    QTest::addColumn<int>("lastChannel"); // 0: global
    QTest::addColumn<QString>("fields");
    QTest::addColumn<int>("min");
    QTest::addColumn<int>("max");
    QTest::addColumn<int>("unit");
    using U = Unit;
    auto row = [](int fn, const char* name, int g, int w, int last, const char* fields, int lo, int hi, U u) {
        QTest::addRow("%d", fn) << fn << QString::fromLatin1(name) << g << w << last << QString::fromLatin1(fields)
                                << lo << hi << int(u);
    };
    row(1, "Chan's Comp Bank", 5, 0, 0, "78-82", 0, 100, U::Count);
    row(5, "Set Temperature", 4, 1, 100, "2-5", -500, 1500, U::Tenths);
    row(6, "Set Differential", 1, 0, 100, "10", 2, 100, U::Tenths);
    row(7, "Diff'tial  Type", 1, 0, 100, "11", 0, 2, U::ListIndex);
    row(8, "Soft Defrost Y/N", 1, 0, 100, "12", 0, 1, U::Flag);
    row(9, "High Alarm Temp", 4, 1, 200, "14-17", -500, 1500, U::Tenths);
    row(10, "Low Alarm Temp", 4, 1, 200, "19-22", -500, 1500, U::Tenths);
    row(11, "Hi Tmp Alm Delay", 1, 0, 200, "18", 0, 120, U::Minutes);
    row(12, "Lo Tmp Alm Delay", 1, 0, 200, "23", 0, 120, U::Minutes);
    row(13, "High Alarm KPA", 1, 1, 15, "202", -100, 4000, U::Kpa);
    row(14, "Low Alarm  KPA", 1, 1, 15, "203", -100, 4000, U::Kpa);
    row(15, "Hi KPA Alm Delay", 1, 0, 15, "204", 0, 120, U::Minutes);
    row(16, "Lo KPA Alm Delay", 1, 0, 15, "205", 0, 120, U::Minutes);
    row(17, "Set Point Times", 4, 1, 200, "6-9", 0, 1439, U::TimeOfDay);
    row(18, "Set Defrost's", 6, 0, 100, "29,31-34", 0, 120, U::Minutes);
    row(19, "Auto Def's Times", 8, 1, 100, "35-42", 0, 1439, U::TimeOfDay);
    row(22, "Comp'ors in Bank", 5, 0, 0, "155-159", 0, 27, U::Count);
    row(23, "Compressor Type", 1, 0, 27, "165", 0, 10, U::ListIndex);
    row(24, "Liq Low Lev Alm", 1, 1, 0, "168", 0, 100, U::Percent);
    row(25, "Cond'ers in Bank", 5, 0, 0, "160-164", 0, 12, U::Count);
    row(26, "Liquid Low Reset", 1, 1, 0, "170", 0, 100, U::Percent);
    row(29, "Set Data Logging", 1, 0, 216, "90", 0, 5, U::ListIndex);
    row(30, "4 Data Log Times", 4, 1, 216, "91-94", 0, 1439, U::TimeOfDay);
    row(31, "P-ON Start Delay", 1, 1, 0, "84", -99999, 999999, U::Plain);
    row(35, "Evaporator Differential", 1, 0, 32, "225", 2, 100, U::Tenths);
    row(36, "Fan Speed Offset", 1, 0, 32, "226", 0, 100, U::Tenths);
    row(38, "Liq Hi Lev Alarm", 1, 1, 0, "76", 0, 100, U::Percent);
    row(39, "Liq Hi Lev Reset", 1, 0, 0, "77", 0, 100, U::Percent);
    row(41, "Daily Set Points", 7, 0, 200, "54-60", 0, 15, U::DayMask);
    row(42, "Type of Control", 1, 0, 100, "51", 0, 3, U::ListIndex);
    row(43, "Max Channels on", 5, 1, 0, "61-65", 1, 100, U::Count);
    row(44, "Min Channels on", 5, 1, 0, "66-70", 0, 100, U::Count);
    row(45, "CH.Turn on Delay", 5, 1, 0, "71-75", 0, 120, U::Plain);
    row(47, "Ctl No2 on Delay", 1, 0, 100, "53", 0, 240, U::Plain);
    row(48, "Associate Chan's", 3, 0, 100, "26-28", 0, 215, U::ListIndex);
    row(49, "Chan Description", 6, 0, 216, "25", 0, 0, U::Text);
    row(52, "Print-Out Times", 1, 0, 216, "85", 0, 5, U::ListIndex);
    row(53, "4 Print Times", 4, 1, 216, "86-89", 0, 1439, U::TimeOfDay);
    row(54, "Comp ON/OFF w Ch", 5, 0, 0, "213-217", 0, 2, U::ListIndex);
    row(55, "Fan Man 1 Day Wk", 1, 0, 100, "13", 0, 7, U::ListIndex);
    row(56, "Start-Start Time", 1, 1, 27, "166", 0, 30, U::Plain);
    row(57, "Comp Slow Load", 5, 1, 0, "110-114", 0, 900, U::Seconds);
    row(58, "Comp Fast Load", 5, 1, 0, "115-119", 0, 100, U::Seconds);
    row(59, "Fast Load Suc Pr", 5, 1, 0, "120-124", -500, 1000, U::KpaOrTenths);
    row(60, "Pump Down St Pnt", 5, 1, 0, "125-129", -500, 1000, U::KpaOrTenths);
    row(61, "Compre Set Point", 5, 1, 0, "100-104", -500, 1000, U::KpaOrTenths);
    row(62, "Compre Diff'tial", 5, 1, 0, "105-109", 10, 100, U::KpaOrTenths);
    row(63, "Compres Rotation", 5, 0, 0, "171-175", 0, 1, U::ListIndex);
    row(64, "Compr Rotate Sel", 5, 0, 0, "176-180", 0, 9, U::ListIndex);
    row(66, "Conden Set Point", 5, 1, 0, "135-139", 0, 2000, U::Kpa);
    row(67, "Conden Diff'tial", 5, 1, 0, "140-144", 1, 400, U::Kpa);
    row(68, "Liq Pump Fail SP", 5, 1, 0, "181-185", 0, 2000, U::Plain);
    row(69, "Liq Pump Reprime", 5, 1, 0, "186-190", 0, 2000, U::Plain);
    row(70, "Comp Equal Sol'd", 1, 0, 27, "167", 0, 30, U::Seconds);
    row(79, "Third PID Value", 1, 0, 32, "227", 0, 100, U::Tenths);
    row(82, "Comp Ct PRES-TMP", 5, 0, 0, "218-222", 0, 1, U::ListIndex);
    row(83, "PID High Full On", 1, 0, 66, "224", -30, 30, U::Tenths);
    row(85, "Comp Unload Time", 5, 1, 0, "130-134", 0, 300, U::Seconds);
    row(86, "Number of Banks", 1, 0, 0, "83", 1, 5, U::Count);
    row(88, "Cond Load Time", 5, 1, 0, "145-149", 1, 300, U::Seconds);
    row(89, "Cond Unload Time", 5, 1, 0, "150-154", 1, 300, U::Seconds);
    row(91, "Condenser Type", 1, 0, 12, "169", 0, 9, U::ListIndex);
    row(101, "Load Shed Time", 1, 1, 0, "96", 1, 300, U::Seconds);
    row(102, "Load Shed Const", 1, 1, 0, "97", 0, 30000, U::Watts);
    row(103, "Contract Rate", 1, 1, 0, "208", 0, 30000, U::Plain);
    row(107, "Auto Reset Hi Ll", 5, 0, 0, "196-200", 0, 1, U::ListIndex);
    row(108, "Auto Reset Time", 5, 0, 0, "191-195", 0, 120, U::Minutes);
    row(110, "Ld Shd Pulse Del", 1, 1, 0, "99", 0, 30000, U::Plain);
    row(112, "Chan Cont'l Type", 1, 0, 100, "209", 0, 7, U::ListIndex);
    row(113, "PidChDly,S-H Use", 1, 1, 100, "210", 1, 600, U::SecondsOrTenths);
    row(117, "Liq Lev Set Pnt", 1, 1, 0, "211", 0, 100, U::Percent);
    row(118, "Liq Lev Diff'al", 1, 1, 0, "212", 4, 40, U::Percent);
    row(121, "PID Differential", 1, 0, 66, "223", 2, 100, U::Tenths);
}

void TestCatalogue::functionMatchesItsRow()
{
    QFETCH(int, function);
    QFETCH(QString, name);
    QFETCH(int, group);
    QFETCH(int, width);
    QFETCH(int, lastChannel);
    QFETCH(QString, fields);
    QFETCH(int, min);
    QFETCH(int, max);
    QFETCH(int, unit);
    const Function* f = findFunction(function);
    QVERIFY(f);
    QCOMPARE(QString::fromLatin1(f->name), name);
    QCOMPARE(f->panelNumber(), function + 1);
    QCOMPARE(f->group, group);
    QCOMPARE(f->width, width);
    QCOMPARE(f->isGlobal(), lastChannel == 0);
    if (lastChannel)
        QCOMPARE(catalogue::lastChannel(f->scope), lastChannel);
    QCOMPARE(taggedFields(*f), parseFields(fields));
    QCOMPARE(f->min, min);
    QCOMPARE(f->max, max);
    QCOMPARE(int(f->unit), unit);
    QCOMPARE(f->minVersion, QList<int>({35, 36, 79, 83, 121}).contains(function) ? 14 : 0);
}

void TestCatalogue::everyFunctionHasARow()
{
    QCOMPARE(int(functions().size()), 73);
    std::set<int> numbers;
    for (const Function& f : functions())
        QVERIFY(numbers.insert(f.number).second);
}

void TestCatalogue::storeFieldsBelongToOneOwner()
{
    std::set<int> seen;
    for (const Function& f : functions())
        for (int field : taggedFields(f))
            QVERIFY2(seen.insert(field).second, qPrintable(QStringLiteral("field %1 twice").arg(field)));
    for (const UntaggedValue& u : catalogue::untaggedValues()) {
        if (u.field == kNoField || (u.function == 8 && u.field == 12))
            continue; // soft defrost is both a tagged box and a flag of its own
        QVERIFY2(seen.insert(u.field).second, qPrintable(QStringLiteral("field %1 twice").arg(u.field)));
    }
}

void TestCatalogue::untaggedValues_data()
{
    QTest::addColumn<int>("field");
    QTest::addColumn<int>("function");
    QTest::addColumn<int>("subfunction");
    const int rows[][3] = {{1, 0, 0},   {48, 0, 2},  {49, 0, 3},  {50, 0, 4},   {44, 0, 5},   {43, 0, 6},
                           {52, 0, 7},  {30, 18, 1}, {45, 98, 0}, {46, 99, 0},  {201, 106, 0}, {98, 109, 0},
                           {207, 65, -1}, {206, 90, -1}};
    for (const auto& r : rows)
        QTest::addRow("field %d", r[0]) << r[0] << r[1] << r[2];
}

void TestCatalogue::untaggedValues()
{
    QFETCH(int, field);
    QFETCH(int, function);
    QFETCH(int, subfunction);
    const FieldOwner owner = findField(field);
    QVERIFY(!owner.function);
    QVERIFY(owner.untagged);
    QCOMPARE(owner.untagged->function, function);
    QCOMPARE(owner.subfunction, subfunction);
    QCOMPARE(owner.untagged->rowZero, field == 201);
}

void TestCatalogue::globalListIsTheGlobalScope()
{
    std::set<int> listed(globalFunctions().begin(), globalFunctions().end());
    std::set<int> scoped;
    for (const Function& f : functions())
        if (f.isGlobal())
            scoped.insert(f.number);
    QCOMPARE(listed.size(), std::size_t(37));
    QVERIFY(listed == scoped);
    QVERIFY(isGlobalFunction(106));
    QVERIFY(!isGlobalFunction(5));
}

void TestCatalogue::scopeDecidesChannelAndRow_data()
{
    QTest::addColumn<int>("function");
    QTest::addColumn<int>("channel");
    QTest::addColumn<bool>("applies");
    QTest::addColumn<int>("row");
    QTest::newRow("condenser 12") << 91 << 12 << true << 11;
    QTest::newRow("condenser 13") << 91 << 13 << false << 12;
    QTest::newRow("pressure 16") << 16 << 16 << false << 15;
    QTest::newRow("compressor 28") << 70 << 28 << false << 27;
    QTest::newRow("pid 33") << 79 << 33 << false << 32;
    QTest::newRow("analogue 67") << 83 << 67 << false << 66;
    QTest::newRow("control 101") << 5 << 101 << false << 100;
    QTest::newRow("alarm 201") << 41 << 201 << false << 200;
    QTest::newRow("all 216") << 49 << 216 << true << 215;
    QTest::newRow("global from 150") << 61 << 150 << true << 0;
    QTest::newRow("liquid level global") << 24 << 20 << true << 0;
}

void TestCatalogue::scopeDecidesChannelAndRow()
{
    QFETCH(int, function);
    QFETCH(int, channel);
    QFETCH(bool, applies);
    QFETCH(int, row);
    const Function* f = findFunction(function);
    QVERIFY(f);
    QCOMPARE(f->appliesTo(channel), applies);
    QCOMPARE(f->storeRow(channel), row);
    QCOMPARE(f->wireChannel(channel), f->isGlobal() ? 0 : channel - 1);
}

void TestCatalogue::timeGroupsRise_data()
{
    QTest::addColumn<int>("function");
    QTest::addColumn<QString>("fields");
    QTest::newRow("set point times") << 17 << "6-9";
    QTest::newRow("data log times") << 30 << "91-94";
    QTest::newRow("print times") << 53 << "86-89";
    QTest::newRow("defrost times") << 19 << "35-42";
}

void TestCatalogue::timeGroupsRise()
{
    QFETCH(int, function);
    QFETCH(QString, fields);
    const QList<int> fieldList = parseFields(fields);
    for (int i = 0; i < fieldList.size(); ++i) {
        const TimeGroup* g = timeGroupOf(fieldList[i]);
        QVERIFY(g && g->function == function && g->count == fieldList.size());
        QCOMPARE(int(g->fields[std::size_t(i)]), fieldList[i]);
    }
}

void TestCatalogue::replyOrderFollowsTheRecord_data()
{
    QTest::addColumn<int>("firstRow");
    QTest::addColumn<QString>("fields");
    const char* rows[][2] = {
        {"0", "1"},        {"1", "85"},       {"2", "86-89"},    {"6", "25"},       {"7", "90"},
        {"8", "91-94"},    {"12", "14-23"},   {"22", "6-9"},     {"26", "54-60"},   {"33", "48-50"},
        {"36", "44"},      {"37", "43"},      {"38", "52"},      {"39", "53"},      {"40", "2-5"},
        {"44", "29-42"},   {"58", "51"},      {"59", "209"},     {"60", "26-28"},   {"63", "10"},
        {"64", "11"},      {"65", "45"},      {"66", "95"},      {"67", "46"},      {"68", "98"},
        {"69", "13"},      {"70", "210"},     {"71", "12"},      {"72", "168"},     {"73", "165"},
        {"74", "166"},     {"75", "207"},     {"76", "167"},     {"77", "202-205"}, {"81", "170"},
        {"82", "206"},     {"83", "169"},     {"84", "76-77"},   {"86", "61-75"},   {"101", "78-82"},
        {"106", "155-164"}, {"116", "84"},    {"117", "110-129"}, {"137", "100-109"}, {"147", "135-144"},
        {"157", "181-190"}, {"167", "171-180"}, {"177", "130-134"}, {"182", "83"},   {"183", "145-154"},
        {"193", "96-97"},  {"195", "208"},    {"196", "201"},    {"197", "196-200"}, {"202", "191-195"},
        {"207", "99"},     {"208", "211-212"}, {"210", "213-222"},
    };
    for (const auto& r : rows)
        QTest::addRow("row %s", r[0]) << QString::fromLatin1(r[0]).toInt() << QString::fromLatin1(r[1]);
}

void TestCatalogue::replyOrderFollowsTheRecord()
{
    QFETCH(int, firstRow);
    QFETCH(QString, fields);
    const QList<int> fieldList = parseFields(fields);
    const auto order = replyOrderFields();
    for (int i = 0; i < fieldList.size(); ++i) {
        QCOMPARE(int(order[std::size_t(firstRow + i)]), fieldList[i]);
        QCOMPARE(replyRowOf(fieldList[i]), firstRow + i);
    }
}

void TestCatalogue::replyOrderCoversEveryValueOnce()
{
    const auto order = replyOrderFields();
    QCOMPARE(int(order.size()), 220);
    std::multiset<int> seen(order.begin(), order.end());
    for (int field = 0; field < kSetpointFields; ++field) {
        const bool expected = field != 0 && field != 24 && field != 47 && field < 223;
        QCOMPARE(int(seen.count(field)), expected ? 1 : 0);
    }
}

void TestCatalogue::checkedValueAtLimitsAndWithText_data()
{
    QTest::addColumn<QVariant>("value");
    QTest::addColumn<QVariant>("min");
    QTest::addColumn<QVariant>("max");
    QTest::addColumn<QVariant>("expected");
    QTest::addColumn<int>("invalid");
    const QVariant lo(-500), hi(1500), def(30);
    QTest::newRow("at minimum") << QVariant(-500) << lo << hi << QVariant(qlonglong(-500)) << 0;
    QTest::newRow("below minimum") << QVariant(-501) << lo << hi << def << 1;
    QTest::newRow("at maximum") << QVariant(1500) << lo << hi << QVariant(qlonglong(1500)) << 0;
    QTest::newRow("above maximum") << QVariant(1501) << lo << hi << def << 1;
    QTest::newRow("padded text") << QVariant("   215") << lo << hi << QVariant(qlonglong(215)) << 0;
    QTest::newRow("leading zeros") << QVariant("-00050") << lo << hi << QVariant(qlonglong(-50)) << 0;
    QTest::newRow("decimal text") << QVariant("21.5") << lo << hi << QVariant(21.5) << 0;
    QTest::newRow("letters") << QVariant("abc") << lo << hi << def << 1;
    QTest::newRow("number then junk") << QVariant("12ab") << lo << hi << def << 1;
    QTest::newRow("empty text") << QVariant("") << lo << hi << def << 1;
    QTest::newRow("blanks") << QVariant("      ") << lo << hi << def << 1;
    QTest::newRow("null") << QVariant() << lo << hi << def << 1;
    QTest::newRow("infinity") << QVariant("inf") << lo << hi << def << 1;
    QTest::newRow("limits as text") << QVariant(7) << QVariant("0") << QVariant(" 10") << QVariant(qlonglong(7)) << 0;
    QTest::newRow("limit not numeric") << QVariant(7) << QVariant("zero") << hi << def << 1;
    QTest::newRow("limit null") << QVariant(7) << lo << QVariant() << def << 1;
}

void TestCatalogue::checkedValueAtLimitsAndWithText()
{
    QFETCH(QVariant, value);
    QFETCH(QVariant, min);
    QFETCH(QVariant, max);
    QFETCH(QVariant, expected);
    QFETCH(int, invalid);
    int flagged = 0;
    QCOMPARE(checkedValue(value, QVariant(30), min, max, &flagged), expected);
    QCOMPARE(flagged, invalid);
}

void TestCatalogue::hhmm_data()
{
    QTest::addColumn<int>("minutes");
    QTest::addColumn<QString>("text");
    QTest::newRow("midnight") << 0 << "00:00";
    QTest::newRow("485") << 485 << "08:05";
    QTest::newRow("blank time default") << 600 << "10:00";
    QTest::newRow("last minute") << 1439 << "23:59";
    QTest::newRow("a whole day") << 1440 << "24:00";
    QTest::newRow("three digit hours") << 6000 << "100:00";
}

void TestCatalogue::hhmm()
{
    QFETCH(int, minutes);
    QFETCH(QString, text);
    QCOMPARE(catalogue::hhmm(minutes), text);
}

void TestCatalogue::hhmmRoundTripsEveryMinuteOfTheDay()
{
    for (int m = 0; m < 24 * 60; ++m)
        QCOMPARE(minutesOf(catalogue::hhmm(m)), std::optional<int>(m));
}

void TestCatalogue::malformedTimesAreRefused_data()
{
    QTest::addColumn<QString>("text");
    for (const char* t : {"", "8", "08:5", "08:60", "ab:cd", "08-05", "08:05:00", "-1:00"})
        QTest::newRow(t) << QString::fromLatin1(t);
}

void TestCatalogue::malformedTimesAreRefused()
{
    QFETCH(QString, text);
    QCOMPARE(minutesOf(text), std::nullopt);
}

void TestCatalogue::tags_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<bool>("decodes");
    QTest::addColumn<bool>("inCatalogue");
    QTest::newRow("set point 3") << "005210044" << true << true;
    QTest::newRow("load time") << "101010961" << true << true;
    QTest::newRow("watts per pulse") << "102010971" << true << true;
    QTest::newRow("contract rate") << "103012081" << true << true;
    QTest::newRow("pulse delay") << "110010991" << true << true;
    QTest::newRow("defrost delay 3") << "018200316" << true << true;
    QTest::newRow("wrong group") << "005210045" << true << false;
    QTest::newRow("wrong field") << "005210054" << true << false;
    QTest::newRow("flag of 18") << "018100306" << true << false;
    QTest::newRow("no such function") << "004010011" << true << false;
    QTest::newRow("eight digits") << "00521004" << false << false;
    QTest::newRow("letter") << "00521004a" << false << false;
    QTest::newRow("blank") << "0052 0044" << false << false;
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
    const Function* f = functionOfTag(*tag);
    QCOMPARE(f != nullptr, inCatalogue);
    if (f)
        QCOMPARE(tagFor(tag->function, tag->subfunction), tag);
}

void TestCatalogue::everyTaggedFieldRoundTripsThroughItsTag()
{
    const Tag example = *decodeTag(QStringLiteral("005210044"));
    QCOMPARE(example, (Tag{5, 2, 1, 4, 4}));
    QVERIFY(encodeTag(Tag{1000, 0, 0, 1, 1}).isEmpty());
    QVERIFY(encodeTag(Tag{5, 10, 0, 1, 1}).isEmpty());
    for (const Function& f : functions()) {
        for (int sub = 0; sub < 8; ++sub) {
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

void TestCatalogue::screenForms_data()
{
    QTest::addColumn<int>("function");
    QTest::addColumn<qlonglong>("value");
    QTest::addColumn<bool>("bankIsTemperature");
    QTest::addColumn<int>("controlType");
    QTest::addColumn<QString>("screen");
    QTest::addColumn<bool>("inRange");
    QTest::newRow("set temperature") << 5 << 215LL << false << 0 << "21.5" << true;
    QTest::newRow("below zero") << 5 << -5LL << false << 0 << "-0.5" << true;
    QTest::newRow("lowest temperature") << 9 << -500LL << false << 0 << "-50.0" << true;
    QTest::newRow("pid full on") << 83 << -31LL << false << 0 << "-3.1" << false;
    QTest::newRow("kpa bank") << 61 << 100LL << false << 0 << "100" << true;
    QTest::newRow("same integer, temperature bank") << 61 << 100LL << true << 0 << "10.0" << true;
    QTest::newRow("differential in kpa") << 62 << 9LL << false << 0 << "9" << false;
    QTest::newRow("pid delay in seconds") << 113 << 600LL << false << 4 << "600" << true;
    QTest::newRow("super heat in tenths") << 113 << 200LL << false << 7 << "20.0" << true;
    QTest::newRow("super heat too high") << 113 << 201LL << false << 7 << "20.1" << false;
    QTest::newRow("defrost time") << 19 << 485LL << false << 0 << "08:05" << true;
    QTest::newRow("kpa alarm") << 13 << 4001LL << false << 0 << "4001" << false;
    QTest::newRow("start delay takes anything") << 31 << -99999LL << false << 0 << "-99999" << true;
}

void TestCatalogue::screenForms()
{
    QFETCH(int, function);
    QFETCH(qlonglong, value);
    QFETCH(bool, bankIsTemperature);
    QFETCH(int, controlType);
    QFETCH(QString, screen);
    QFETCH(bool, inRange);
    const Function* f = findFunction(function);
    QCOMPARE(toScreen(*f, value, bankIsTemperature, controlType), screen);
    QCOMPARE(catalogue::inRange(*f, value, bankIsTemperature, controlType), inRange);
    if (screenForm(*f, bankIsTemperature, controlType) == ScreenForm::Tenths)
        QCOMPARE(parseTenths(toScreen(*f, value, bankIsTemperature, controlType)), std::optional<qint64>(value));
}

void TestCatalogue::defaultsLieInTheirRange()
{
    for (const Function& f : functions())
        QVERIFY2(!f.rangeChecked || (f.defaultValue >= f.min && f.defaultValue <= f.max), f.name);
    QCOMPARE(parseTenths(QStringLiteral("-.")), std::nullopt);
    QCOMPARE(parseTenths(QStringLiteral(" 2.25")), std::optional<qint64>(23));
}

void TestCatalogue::functionsByName_data()
{
    QTest::addColumn<QString>("typed");
    QTest::addColumn<int>("function"); // -1: none
    QTest::newRow("as shown") << "Set Differential" << 6;
    QTest::newRow("case and blanks") << "set  differential" << 6;
    QTest::newRow("punctuation left out") << "difftial type" << 7;
    QTest::newRow("doubled blank inside") << "Low Alarm KPA" << 14;
    QTest::newRow("beginning of one name") << "set temp" << 5;
    QTest::newRow("beginning of several") << "comp" << -1;
    QTest::newRow("whole name") << "Cond Load Time" << 88;
    QTest::newRow("no letters") << "'-" << -1;
    QTest::newRow("none") << "defrost now" << -1;
}

void TestCatalogue::functionsByName()
{
    QFETCH(QString, typed);
    QFETCH(int, function);
    const catalogue::Function* f = catalogue::findFunctionByName(typed);
    QCOMPARE(f ? f->number : -1, function);
}

QTEST_GUILESS_MAIN(TestCatalogue)
#include "tst_catalogue.moc"
