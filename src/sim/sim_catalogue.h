#pragma once

#include <QList>
#include <QVector>

namespace sim {

// The instrument's own map of its numbered functions onto the set point table
// (216 rows of fields 0..227, in the instrument's units).
constexpr int Channels = 216;
constexpr int Fields = 228;
constexpr int DescriptionField = 25;

struct Function {
    int number = -1;
    QVector<int> fields;  // by sub-function
    int firstChannel = 1; // scope in user channel numbers
    int lastChannel = 1;
    bool global = false;
};

// The function of that wire number, or nullptr when the instrument has none.
const Function* function(int number);
// Set point times, data log times, print times, defrost times: the write
// carries every time of the group.
bool isTimeGroup(int number);

// Which channels a block of the channel record holds.
enum class Block { All, Upto200, Upto100, Upto66, Upto32, Upto27, Upto15, Upto12, Only1, Only1Above85, Only1From87 };

struct RecordItem {
    int field;
    int width; // 0: field 165, whose width depends on the version
    Block block;
};

// The values of a channel record in their order on the wire, after the
// leading wire channel.
const QList<RecordItem>& recordOrder();

// Version text as the instrument reports it, compared as a number.
double versionNumber(const QByteArray& version);

} // namespace sim
