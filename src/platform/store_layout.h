#pragma once

// The cells that forms share in the stores: who keeps what in which row and
// column of an instrument's `info` table, and the columns of the directory's
// table. Every form names a cell through these, so that two forms cannot take
// the same cell by accident and the template holds every cell someone reads.
// Rows and columns count from 0.

#include <QString>

// --- `info` of an instrument's data base ------------------------------------

inline const QString kInfoTable = QStringLiteral("info");
constexpr int kInfoRows = 227;
constexpr int kInfoColumns = 66;

// Columns 0..4: the upload's validation rows, one for each value of the
// upload record in reply order (the description's row has no limits).
constexpr int kInfoName = 0;
constexpr int kInfoDefault = 1;
constexpr int kInfoField = 2; // the `setpoints` field the row describes
constexpr int kInfoMinimum = 3;
constexpr int kInfoMaximum = 4;
constexpr int kInfoValidationRows = 227;

// Column 7: in rows 0..19 the channel a status view shows in display row i
// (0 none); in two rows of its own the interval of a status cycle, seconds.
constexpr int kInfoShownChannelColumn = 7;
constexpr int kInfoIntervalColumn = 7;
constexpr int kInfoTemperatureIntervalRow = 29;
constexpr int kInfoPressureIntervalRow = 30;

// Column 8: in rows 0..19 the channels chosen for the graph and the reports
// (0 none); the graph's settings in the rows below.
constexpr int kInfoGraphColumn = 8;
constexpr int kInfoChartTypeRow = 10;
constexpr int kInfoBarWidthRow = 11;
constexpr int kInfoDataPointsRow = 30;
constexpr int kInfoLegendRow = 31;
constexpr int kInfoDateMarkerRow = 32;
constexpr int kInfoValueMarkerRow = 33;
constexpr int kInfoPointerChannelRow = 34;
constexpr int kInfoPointerNameRow = 35; // its name and a blank
constexpr int kInfoLastMaximumRow = 37;
constexpr int kInfoLastMinimumRow = 38;
// Column 9, rows 0..19: the caption of a chosen channel's button.
constexpr int kInfoGraphCaptionColumn = 9;
constexpr int kInfoChosenChannels = 20; // rows of columns 7, 8 and 9

// Column 11: the room channel of multi probe panel i (0 none); columns 12..31,
// in the row of the room channel less 1, the room's probes (0 a free place).
constexpr int kInfoRoomChannelColumn = 11;
constexpr int kInfoFirstProbeColumn = 12;
constexpr int kInfoProbes = 20;

// Column 34, row 0: seconds between evaporator scanner updates.
constexpr int kInfoBrumaletColumn = 34;
constexpr int kInfoBrumaletRow = 0;

// Column 39, rows 0..2: company name, second and third report heading lines.
constexpr int kInfoHeadingColumn = 39;
constexpr int kInfoHeadingLines = 3;

// Column 40: 0 shows channel numbers, any other value descriptions; one row
// for the status view and one for the channels view's buttons.
constexpr int kInfoDescriptionsColumn = 40;
constexpr int kInfoStatusDescriptionsRow = 2;
constexpr int kInfoChannelsDescriptionsRow = 4;

// Column 41: the instrument's line, one row each.
constexpr int kInfoConnectionColumn = 41;
constexpr int kInfoPortSettingsRow = 2;
constexpr int kInfoPortRow = 3;
constexpr int kInfoConnectionTypeRow = 4; // 0 modem, 1 direct
constexpr int kInfoDialToneRow = 5;
constexpr int kInfoModemTextRow = 6;
constexpr int kInfoFlowControlRow = 7;

// Column 42, rows 0..4: names of the graphic view's tabs.
constexpr int kInfoTabNameColumn = 42;
constexpr int kInfoTabs = 5;

// The pane tables of the two graphic views: one row a pane, 200 rows, a run
// of columns in this order from the table's first column.
namespace info_pane {
enum Column { Tab, Name, InUse, Channel, Index, Colour, Room, Columns };
}
constexpr int kInfoPaneRows = 200;
constexpr int kInfoPaneFirstColumn = 43;      // graphic temperature view
constexpr int kInfoPlantPaneFirstColumn = 53; // graphic plant room view
// The plant room's tag positions 8..11 in columns 62..65.
constexpr int kInfoPlantTagFirstColumn = 62;
constexpr int kInfoPlantFirstTag = 8;
constexpr int kInfoPlantTags = 4;

// Columns 50 and 51, rows 0..9: fore and back colour of indicator kinds 0..9.
constexpr int kInfoKindForeColumn = 50;
constexpr int kInfoKindBackColumn = 51;
constexpr int kInfoKinds = 10;

// --- The directory q-19.db: one row for each instrument -----------------------

namespace directory_table {
inline const QString TableName = QStringLiteral("Table1");
enum Field { ID, Name, Address, townstate, phoneno, glacinorphone, FieldCount };
inline QString columnName(Field field)
{
    static const char* const names[FieldCount] = {"ID", "Name", "Address", "townstate", "phoneno", "glacinorphone"};
    return QString::fromLatin1(names[field]);
}
} // namespace directory_table
