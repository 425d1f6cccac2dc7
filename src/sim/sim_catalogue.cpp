#include "sim/sim_catalogue.h"

#include <QHash>

namespace sim {

namespace {

QVector<int> run(int first, int count)
{
    QVector<int> v;
    for (int i = 0; i < count; ++i)
        v << first + i;
    return v;
}

QHash<int, Function> buildFunctions()
{
    QHash<int, Function> map;
    auto add = [&](int number, QVector<int> fields, int first, int last) {
        Function f;
        f.number = number;
        f.fields = std::move(fields);
        f.firstChannel = first;
        f.lastChannel = last;
        map.insert(number, f);
    };
    auto global = [&](int number, QVector<int> fields) {
        add(number, std::move(fields), 1, 1);
        map[number].global = true;
    };
    // Function 0 carries the channel's switches by sub-function.
    add(0, {1, -1, 48, 49, 50, 44, 43, 52}, 1, 216);
    global(1, run(78, 5));
    add(5, run(2, 4), 1, 100);
    add(6, {10}, 1, 100);
    add(7, {11}, 1, 100);
    add(8, {12}, 1, 100);
    add(9, run(14, 4), 1, 200);
    add(10, run(19, 4), 1, 200);
    add(11, {18}, 1, 200);
    add(12, {23}, 1, 200);
    add(13, {202}, 1, 15);
    add(14, {203}, 1, 15);
    add(15, {204}, 1, 15);
    add(16, {205}, 1, 15);
    add(17, run(6, 4), 1, 200);
    add(18, {29, 30, 31, 32, 33, 34}, 1, 100);
    add(19, run(35, 8), 1, 100);
    global(22, run(155, 5));
    add(23, {165}, 1, 27);
    global(24, {168});
    global(25, run(160, 5));
    global(26, {170});
    add(29, {90}, 1, 216);
    add(30, run(91, 4), 1, 216);
    global(31, {84});
    add(35, {225}, 1, 32);
    add(36, {226}, 1, 32);
    global(38, {76});
    global(39, {77});
    add(41, run(54, 7), 1, 200);
    add(42, {51}, 1, 100);
    global(43, run(61, 5));
    global(44, run(66, 5));
    global(45, run(71, 5));
    add(47, {53}, 1, 100);
    add(48, run(26, 3), 1, 100);
    add(49, {25}, 1, 216);
    add(52, {85}, 1, 216);
    add(53, run(86, 4), 1, 216);
    global(54, run(213, 5));
    add(55, {13}, 1, 100);
    add(56, {166}, 1, 27);
    global(57, run(110, 5));
    global(58, run(115, 5));
    global(59, run(120, 5));
    global(60, run(125, 5));
    global(61, run(100, 5));
    global(62, run(105, 5));
    global(63, run(171, 5));
    global(64, run(176, 5));
    global(66, run(135, 5));
    global(67, run(140, 5));
    global(68, run(181, 5));
    global(69, run(186, 5));
    add(70, {167}, 1, 27);
    add(79, {227}, 1, 32);
    global(82, run(218, 5));
    add(83, {224}, 1, 66);
    global(85, run(130, 5));
    global(86, {83});
    global(88, run(145, 5));
    global(89, run(150, 5));
    add(91, {169}, 1, 12);
    add(98, {45}, 1, 100);
    add(99, {46}, 1, 100);
    global(101, {96});
    global(102, {97});
    global(103, {208});
    global(106, {201});
    global(107, run(196, 5));
    global(108, run(191, 5));
    add(109, {98}, 1, 100);
    global(110, {99});
    add(112, {209}, 1, 100);
    add(113, {210}, 1, 100);
    global(117, {211});
    global(118, {212});
    add(121, {223}, 1, 66);
    return map;
}

QList<RecordItem> buildOrder()
{
    QList<RecordItem> o;
    auto seq = [&](int first, int count, int width, Block b) {
        for (int i = 0; i < count; ++i)
            o.append({first + i, width, b});
    };
    // Every channel.
    seq(1, 1, 1, Block::All);
    seq(85, 1, 1, Block::All);
    seq(86, 4, 6, Block::All);
    seq(25, 1, 6, Block::All);
    seq(90, 1, 1, Block::All);
    seq(91, 4, 6, Block::All);
    // Channels 1 to 200.
    seq(14, 10, 6, Block::Upto200);
    seq(6, 4, 6, Block::Upto200);
    seq(54, 7, 6, Block::Upto200);
    // Channels 1 to 100.
    seq(48, 3, 1, Block::Upto100);
    seq(44, 1, 1, Block::Upto100);
    seq(43, 1, 1, Block::Upto100);
    seq(52, 1, 1, Block::Upto100);
    seq(53, 1, 6, Block::Upto100);
    seq(2, 4, 6, Block::Upto100);
    seq(29, 14, 6, Block::Upto100);
    seq(51, 1, 1, Block::Upto100);
    seq(209, 1, 1, Block::Upto100);
    seq(26, 3, 6, Block::Upto100);
    seq(10, 1, 6, Block::Upto100);
    seq(11, 1, 1, Block::Upto100);
    seq(45, 1, 1, Block::Upto100);
    seq(95, 1, 6, Block::Upto100);
    seq(46, 1, 1, Block::Upto100);
    seq(98, 1, 1, Block::Upto100);
    seq(13, 1, 6, Block::Upto100);
    seq(210, 1, 6, Block::Upto100);
    seq(12, 1, 6, Block::Upto100);
    // PID and evaporator values, firmware 14 on.
    seq(223, 2, 6, Block::Upto66);
    seq(225, 3, 6, Block::Upto32);
    // Compressors, pressures, condensers.
    seq(168, 1, 6, Block::Upto27);
    seq(165, 1, 0, Block::Upto27);
    seq(166, 1, 6, Block::Upto27);
    seq(207, 1, 6, Block::Upto27);
    seq(167, 1, 6, Block::Upto27);
    seq(202, 4, 6, Block::Upto15);
    seq(170, 1, 6, Block::Upto12);
    seq(206, 1, 6, Block::Upto12);
    seq(169, 1, 1, Block::Upto12);
    // The instrument as a whole, in channel 1.
    seq(76, 2, 6, Block::Only1);
    seq(61, 15, 6, Block::Only1);
    seq(78, 5, 6, Block::Only1);
    seq(155, 10, 6, Block::Only1);
    seq(84, 1, 6, Block::Only1);
    seq(110, 20, 4, Block::Only1);
    seq(100, 10, 4, Block::Only1);
    seq(135, 10, 4, Block::Only1);
    seq(181, 10, 4, Block::Only1);
    seq(171, 10, 1, Block::Only1);
    seq(130, 5, 6, Block::Only1);
    seq(83, 1, 1, Block::Only1);
    seq(145, 10, 6, Block::Only1);
    seq(96, 2, 6, Block::Only1);
    seq(208, 1, 6, Block::Only1);
    seq(201, 1, 1, Block::Only1);
    seq(196, 5, 1, Block::Only1);
    seq(191, 5, 6, Block::Only1);
    seq(99, 1, 6, Block::Only1);
    seq(211, 2, 6, Block::Only1Above85);
    seq(213, 10, 1, Block::Only1From87);
    return o;
}

} // namespace

const Function* function(int number)
{
    static const QHash<int, Function> map = buildFunctions();
    auto it = map.constFind(number);
    return it == map.constEnd() ? nullptr : &it.value();
}

bool isTimeGroup(int number)
{
    return number == 17 || number == 19 || number == 30 || number == 53;
}

const QList<RecordItem>& recordOrder()
{
    static const QList<RecordItem> order = buildOrder();
    return order;
}

double versionNumber(const QByteArray& version)
{
    return version.left(3).trimmed().toDouble();
}

} // namespace sim
