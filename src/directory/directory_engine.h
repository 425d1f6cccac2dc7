#pragma once

#include "directory/data_folder.h"
#include "platform/control_state.h"

#include <QObject>
#include <QStringList>
#include <functional>
#include <memory>

class InstrumentStore;
class Operator;
class Recordset;
class Store;

// ccForm1's directory side: the list of instruments in q-19.db, the boxes of
// the current row, adding and deleting instruments with their files, compact,
// and the data base of the selected instrument that the form keeps open.
//
// The line side of the form learns the instrument through
// instrumentSelected(); it must forget an info pointer when a new one (or
// null) arrives.
class ccForm1_directory : public QObject {
    Q_OBJECT
public:
    // Boxes of Table1's fields in Text1(): the ID and the modem's number are
    // the ones the line side reads.
    static constexpr int BoxCount = 8;
    static constexpr int IdBox = 0;
    static constexpr int NameBox = 1;
    static constexpr int AddressBox = 2;
    static constexpr int TownBox = 3;
    static constexpr int PhoneBox = 4;
    static constexpr int ModemPhoneBox = 7;
    // The Text1() index of a Table1 field, and back (-1 for a box without one).
    static int boxOfField(int field);
    static int fieldOfBox(int box);

    ccForm1_directory(const DataFolder& folder, Operator& op, QObject* parent = nullptr);
    ~ccForm1_directory() override;

    // Controls the logic reads or writes.
    ControlState Text1[BoxCount];
    bool Text1_Locked[BoxCount] = {};
    ControlState Text5;       // ID of the selected row
    ControlState DBCombo1;    // text: the current row's list field; value: its list index
    QStringList DBCombo1_List; // list field of every row, in Data1's order
    ControlState Data1;       // caption "Record: n of m"
    ControlState Option1[2];  // value true for the chosen order: 0 ID, 1 Name
    ControlState Command1;    // "&Add Glacinor"
    ControlState Command2;    // "D&elete Glacinor"
    ControlState Command4;    // "&Update"
    ControlState Command5;    // "&Cancel"
    ControlState Command8;    // "Compact"

    // True between Add and the end of Update or Cancel.
    bool adding = false;

    // Opens the directory and the first instrument's data base. Rows whose
    // data base has gone are deleted one by one. False when no row is left:
    // the program ends.
    bool Form_Load();
    // Writes the edits still in the boxes, as the bound boxes do on leaving.
    void Form_Unload();

    void DBCombo1_Click(int index);
    void Option1_Click(int index);
    // The operator typed into a box.
    void Text1_Change(int index, const QString& text);

    void Command1_Click(); // Add
    bool Command4_Click(); // Update: true when the new row and its files were made
    void Command5_Click(); // Cancel
    bool Command2_Click(); // Delete: true when the row went
    bool Command8_Click() { return compact_directory(); }
    bool compact_directory();

    // Asked at a delete: the ID of the instrument the line is connected to,
    // empty when none. Its row and files cannot go while the line is up.
    void setConnectedInstrument(std::function<QString()> connectedId) { m_connectedId = std::move(connectedId); }

    // The instrument whose data base is open, its info table (null when none).
    QString openId() const { return m_openId; }
    Recordset* info() const { return m_info; }
    InstrumentStore* instrument() const { return m_instrument.get(); }
    int RecordCount() const;
    // Every row as Table1's fields in text, in Data1's order.
    QList<QStringList> rows() const;
    // The list index of the row with this ID, or -1.
    int indexOfId(const QString& id) const;

signals:
    // After every procedure.
    void changed();
    // The shown row's ID and modem number, or the open data base, changed.
    void instrumentSelected(const QString& id, const QString& phone, Recordset* info);
    // At start and after a delete: the line side clears no_computer_link and
    // runs LoadPropertySettings on the info now given.
    void propertySettingsWanted();
    // dial_num of the line side is disabled while a row is being added.
    void addingChanged(bool adding);

private:
    bool openDirectory(const QString& orderBy);
    void Data1_Refresh();
    void Data1_Reposition();
    void showCurrentRow();
    bool findFirst(const QString& id);
    bool openInstrument(const QString& id);
    void closeInstrument();
    void saveBoundEdits();
    void setBrowsing(bool browsing);
    void unexpectedError(const QString& description);
    void done();

    DataFolder m_folder;
    Operator& m_op;
    std::unique_ptr<Store> m_directory;
    std::unique_ptr<Recordset> m_Data1;
    QString m_orderBy = QStringLiteral("Name");
    std::unique_ptr<InstrumentStore> m_instrument;
    Recordset* m_info = nullptr; // of m_instrument
    QString m_openId;
    std::function<QString()> m_connectedId;
    // A box other than ID and Name was typed into while browsing.
    bool m_boundDirty = false;
    // The new row of an Add waits in the boxes until Update.
    bool m_newRowPending = false;
    // What the line side was last told.
    QString m_toldId, m_toldPhone;
    Recordset* m_toldInfo = nullptr;
    bool m_told = false;
};
