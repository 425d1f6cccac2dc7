#include "directory/directory_engine.h"

#include "platform/operator.h"
#include "platform/store.h"
#include "setpoints/instrument_store.h"

#include <QDir>
#include <QFileInfo>

namespace {

using Icon = Operator::Icon;
using Buttons = Operator::Buttons;

const QString OrderById = QStringLiteral("ID");
const QString OrderByName = QStringLiteral("Name");

} // namespace

int ccForm1_directory::boxOfField(int field)
{
    switch (field) {
    case Table1::ID: return IdBox;
    case Table1::Name: return NameBox;
    case Table1::Address: return AddressBox;
    case Table1::townstate: return TownBox;
    case Table1::phoneno: return PhoneBox;
    case Table1::glacinorphone: return ModemPhoneBox;
    default: return -1;
    }
}

int ccForm1_directory::fieldOfBox(int box)
{
    for (int f = 0; f < Table1::FieldCount; ++f) {
        if (boxOfField(f) == box)
            return f;
    }
    return -1;
}

ccForm1_directory::ccForm1_directory(const DataFolder& folder, Operator& op, QObject* parent)
    : QObject(parent), m_folder(folder), m_op(op)
{
    const QString tips[Table1::FieldCount] = {
        QStringLiteral("The Glacinor ID number (must be numeric)"),
        QStringLiteral("The name of the Glacinor/Owner"),
        QStringLiteral("The Glacinors/Owners address"),
        QStringLiteral("The Town & State"),
        QStringLiteral("The Owners home phone number"),
        QStringLiteral("The Glacinor/Modem phone number"),
    };
    for (int box = 0; box < BoxCount; ++box) {
        const int field = fieldOfBox(box);
        Text1[box].visible = field >= 0;
        if (field >= 0)
            Text1[box].toolTip = tips[field];
    }
    Command1.text = QStringLiteral("&Add Glacinor");
    Command2.text = QStringLiteral("D&elete Glacinor");
    Command4.text = QStringLiteral("&Update");
    Command5.text = QStringLiteral("&Cancel");
    Command8.text = QStringLiteral("Compact");
    Option1[0].text = QStringLiteral("Glacinor ID");
    Option1[1].text = QStringLiteral("Name");
    Option1[0].value = false;
    Option1[1].value = true;
    setBrowsing(true);
}

ccForm1_directory::~ccForm1_directory()
{
    closeInstrument();
}

int ccForm1_directory::RecordCount() const
{
    return m_Data1 ? m_Data1->RecordCount() : 0;
}

QList<QStringList> ccForm1_directory::rows() const
{
    QList<QStringList> out;
    if (!m_Data1)
        return out;
    for (int r = 0; r < m_Data1->RecordCount(); ++r) {
        QStringList row;
        for (int f = 0; f < Table1::FieldCount; ++f)
            row.append(m_Data1->cell(r, f).toString());
        out.append(row);
    }
    return out;
}

int ccForm1_directory::indexOfId(const QString& id) const
{
    if (!m_Data1)
        return -1;
    for (int r = 0; r < m_Data1->RecordCount(); ++r) {
        if (m_Data1->cell(r, Table1::ID).toString() == id)
            return r;
    }
    return -1;
}

bool ccForm1_directory::Form_Load()
{
    QString error;
    m_directory = Store::open(m_folder.directoryFile(), &error);
    if (!m_directory || !m_directory->hasTable(Table1::TableName)) {
        unexpectedError(m_directory ? QStringLiteral("%1 has no %2").arg(m_folder.directoryFile(), Table1::TableName)
                                    : error);
        m_directory.reset();
        return false;
    }
    // Ordered by name from the start (the form's Option1(1)), so that the row
    // checked and opened below is the row that the list then shows.
    m_orderBy = OrderByName;
    Option1[0].value = false;
    Option1[1].value = true;
    Data1_Refresh();

    for (;;) {
        if (RecordCount() == 0) {
            m_op.message(QStringLiteral("No Records"),
                         {QStringLiteral("Their are no records in the data base,"),
                          QStringLiteral("You must re install the software.")});
            return false;
        }
        const QString file = m_folder.instrumentFile(Text1[IdBox].text);
        if (!file.isEmpty() && QFileInfo(file).isFile())
            break;
        // The directory empties itself of rows whose files have gone.
        m_op.message(QStringLiteral("No DataBase"),
                     {QStringLiteral("This database does not exist,"),
                      QStringLiteral("The program will delete this entry and select the next one.")});
        m_Data1->Delete();
        Data1_Refresh();
        Text5.text = Text1[IdBox].text;
    }
    Text5.text = Text1[IdBox].text;
    openInstrument(Text1[IdBox].text);
    setBrowsing(true);
    done();
    emit propertySettingsWanted();
    return true;
}

void ccForm1_directory::Form_Unload()
{
    saveBoundEdits();
    closeInstrument();
    m_Data1.reset();
    m_directory.reset();
}

void ccForm1_directory::DBCombo1_Click(int index)
{
    if (adding || !m_Data1)
        return;
    saveBoundEdits();
    if (!m_Data1->setAbsolutePosition(index))
        return;
    showCurrentRow();
    Data1_Reposition();
    Text5.text = Text1[IdBox].text;
    openInstrument(Text1[IdBox].text);
    done();
}

void ccForm1_directory::Option1_Click(int index)
{
    if (index != 0 && index != 1)
        return;
    saveBoundEdits();
    m_orderBy = index == 0 ? OrderById : OrderByName;
    Option1[0].value = index == 0;
    Option1[1].value = index == 1;
    Data1_Refresh();
    done();
}

void ccForm1_directory::Text1_Change(int index, const QString& text)
{
    if (index < 0 || index >= BoxCount || Text1_Locked[index] || fieldOfBox(index) < 0)
        return;
    if (Text1[index].text == text)
        return;
    Text1[index].text = text;
    if (!adding)
        m_boundDirty = true;
    if (index == ModemPhoneBox)
        done();
}

void ccForm1_directory::Command1_Click()
{
    m_op.message(QStringLiteral("Mandatory"),
                 {QStringLiteral("You must press either \"UPDATE\" or \"CANCEL\","),
                  QStringLiteral("once parameters have been entered and not exit the program."),
                  QStringLiteral("You can edit all parameters except \"Glacinor ID\" and \"Name\" at any time.")},
                 Icon::Critical);
    if (!m_Data1)
        return;
    saveBoundEdits();
    adding = true;
    emit addingChanged(true);
    m_Data1->AddNew();
    m_newRowPending = true;
    for (ControlState& box : Text1)
        box.text.clear();
    setBrowsing(false);
    Data1_Reposition();
    done();
}

bool ccForm1_directory::Command4_Click()
{
    if (!adding || !m_Data1)
        return false;
    const QString id = Text1[IdBox].text;
    if (id == QLatin1String("0")) {
        m_op.message(QStringLiteral("ID Number 0"),
                     {QStringLiteral("You must not have a 0 value"), QStringLiteral("for the Glacinor ID")});
        Data1_Refresh();
        done();
        return false;
    }
    // The ID names the instrument's files: digits only, as the field's type
    // demands.
    if (!DataFolder::isValidId(id)) {
        unexpectedError(QStringLiteral("The Glacinor ID must be a number from 1 to 99999"));
        done();
        return false;
    }
    // The name is as mandatory as the ID: the list shows instruments by it.
    const QString name = Text1[NameBox].text.trimmed();
    if (name.isEmpty()) {
        m_op.message(QStringLiteral("Mandatory"), {QStringLiteral("You must enter a \"Name\""),
                                                   QStringLiteral("for the Glacinor. Re enter the correct data")});
        done();
        return false;
    }
    Text1[NameBox].text = name;
    for (const QStringList& row : rows()) {
        if (row.at(Table1::ID) == id || row.at(Table1::Name).trimmed().compare(name, Qt::CaseInsensitive) == 0) {
            m_op.message(QStringLiteral("Duplicate ID Number"),
                         {QStringLiteral("You have entered a Glacinor ID number or Last Name"),
                          QStringLiteral("that already exists. Re enter the correct data")});
            done();
            return false;
        }
    }
    // After the ID 0 refusal the boxes were refreshed: Update still adds a row,
    // it never overwrites the one shown.
    if (!m_newRowPending && !m_Data1->AddNew()) {
        unexpectedError(m_Data1->lastError());
        done();
        return false;
    }
    m_newRowPending = true;
    for (int f = 0; f < Table1::FieldCount; ++f) {
        const QString text = Text1[boxOfField(f)].text;
        m_Data1->setValue(f, f == Table1::ID ? QVariant(id.toInt()) : QVariant(text));
    }
    if (!m_Data1->Update()) {
        unexpectedError(m_Data1->lastError());
        done();
        return false;
    }
    m_newRowPending = false;
    Data1_Refresh();
    findFirst(id);

    // A new instrument starts from the templates, over any files of an
    // earlier instrument of the same ID.
    QString error;
    bool copied = DataFolder::copyReplacing(m_folder.templateFile(), m_folder.instrumentFile(id), &error);
    for (int n = 0; copied && n < DataFolder::LayoutCount; ++n)
        copied = DataFolder::copyReplacing(m_folder.layoutTemplate(n), m_folder.layoutFile(n, id), &error);
    if (!copied) {
        unexpectedError(error);
        done();
        return false;
    }

    setBrowsing(true);
    adding = false;
    emit addingChanged(false);
    done();
    return true;
}

void ccForm1_directory::Command5_Click()
{
    if (m_Data1 && m_newRowPending)
        m_Data1->CancelUpdate();
    m_newRowPending = false;
    setBrowsing(true);
    Data1_Refresh();
    Text5.text = Text1[IdBox].text;
    if (adding) {
        adding = false;
        emit addingChanged(false);
    }
    done();
}

bool ccForm1_directory::Command2_Click()
{
    if (!m_Data1 || adding)
        return false;
    // Its file is the one the connection and the views work on.
    const QString connected = m_connectedId ? m_connectedId() : QString();
    if (!connected.isEmpty() && Text1[IdBox].text == connected) {
        m_op.message(QStringLiteral("Can't Delete"),
                     {QStringLiteral("This Glacinor is connected,"),
                      QStringLiteral("Disconnect it first, then delete it.")});
        return false;
    }
    const Operator::Answer answer = m_op.message(
        QStringLiteral("Delete Glacinor"),
        {QStringLiteral("Are you sure, this will permanatly delete this record and data base for this Glacinor"),
         QStringLiteral("and delete the associated control and log file")},
        Icon::Question, Buttons::YesNo);
    if (answer != Operator::Answer::Yes)
        return false;
    if (RecordCount() == 1) {
        m_op.message(QStringLiteral("Can't Delete"),
                     {QStringLiteral("There is only one record left,"),
                      QStringLiteral("You must add a new one then delete the one not required.")});
        return false;
    }
    saveBoundEdits();
    const QString id = Text1[IdBox].text;
    if (id == m_openId)
        closeInstrument();
    // A file that will not go stays behind; the row goes all the same.
    if (DataFolder::isValidId(id)) {
        DataFolder::removeDataBase(m_folder.instrumentFile(id));
        if (QFileInfo::exists(m_folder.layoutFile(0, id))) {
            QDir dir(m_folder.path());
            const QStringList layouts =
                dir.entryList({QStringLiteral("s*-%1.slf").arg(id)}, QDir::Files | QDir::Hidden);
            for (const QString& f : layouts)
                dir.remove(f);
        }
    }
    m_Data1->Delete();
    m_orderBy = OrderByName;
    Option1[0].value = false;
    Option1[1].value = true;
    Data1_Refresh();
    Text5.text = Text1[IdBox].text;
    // The connection settings are read next from the open data base: with
    // the deleted one gone, the row now shown takes its place.
    if (!m_info && QFileInfo(m_folder.instrumentFile(Text1[IdBox].text)).isFile())
        openInstrument(Text1[IdBox].text);
    adding = false;
    done();
    emit propertySettingsWanted();
    return true;
}

bool ccForm1_directory::compact_directory()
{
    if (!m_Data1 || adding)
        return false;
    saveBoundEdits();
    const QString id = Text1[IdBox].text;
    const QString name = Text1[NameBox].text;
    const QString db = m_folder.instrumentFile(id);
    const QString bak = m_folder.backupFile(id);
    if (db.isEmpty()) {
        unexpectedError(QStringLiteral("The Glacinor ID must be a number from 1 to 99999"));
        return false;
    }
    const QString reopenId = m_openId;
    const int position = m_Data1->AbsolutePosition();
    closeInstrument();
    m_Data1.reset();

    const auto setUpAgain = [&] {
        Data1_Refresh();
        if (position > 0 && m_Data1 && m_Data1->setAbsolutePosition(position)) {
            showCurrentRow();
            Data1_Reposition();
        }
        if (!reopenId.isEmpty())
            openInstrument(reopenId);
        done();
    };
    const auto fail = [&](const QString& description) {
        setUpAgain();
        unexpectedError(description);
        return false;
    };

    // The directory is checked but not compacted.
    QString report;
    if (!m_directory->integrityCheck(&report))
        return fail(report);
    {
        QString error;
        std::unique_ptr<Store> store = Store::open(db, &error);
        if (!store)
            return fail(error);
        if (!store->integrityCheck(&report))
            return fail(report);
        if (QFileInfo::exists(bak) && !DataFolder::removeDataBase(bak))
            return fail(QStringLiteral("%1 cannot be deleted").arg(QDir::toNativeSeparators(bak)));
        if (!store->compactInto(bak))
            return fail(store->lastError());
    }
    // The .bak stays behind as the last good copy.
    QString error;
    if (!DataFolder::removeDataBase(db) || !DataFolder::copyReplacing(bak, db, &error))
        return fail(error.isEmpty() ? QStringLiteral("%1 cannot be replaced").arg(QDir::toNativeSeparators(db))
                                    : error);
    m_op.message(QStringLiteral("Done Compact"),
                 {QStringLiteral("Name = ") + name, QStringLiteral("Glacinor ID No. = ") + id});
    setUpAgain();
    return true;
}

void ccForm1_directory::Data1_Refresh()
{
    if (m_Data1 && m_newRowPending)
        m_Data1->CancelUpdate();
    m_newRowPending = false;
    m_boundDirty = false;
    m_Data1.reset();
    if (m_directory)
        m_Data1 = m_directory->openRecordset(Table1::TableName, m_orderBy);
    DBCombo1_List.clear();
    if (m_Data1) {
        const int listField = m_orderBy == OrderById ? Table1::ID : Table1::Name;
        for (int r = 0; r < m_Data1->RecordCount(); ++r)
            DBCombo1_List.append(m_Data1->cell(r, listField).toString());
        m_Data1->MoveFirst();
    }
    showCurrentRow();
    Data1_Reposition();
}

void ccForm1_directory::Data1_Reposition()
{
    const int position = (!m_Data1 || m_newRowPending) ? -1 : m_Data1->AbsolutePosition();
    Data1.text = QStringLiteral("Record: %1 of %2").arg(position + 1).arg(RecordCount());
}

void ccForm1_directory::showCurrentRow()
{
    const int position = m_Data1 ? m_Data1->AbsolutePosition() : -1;
    for (int f = 0; f < Table1::FieldCount; ++f)
        Text1[boxOfField(f)].text = position >= 0 ? m_Data1->value(f).toString() : QString();
    DBCombo1.value = position;
    DBCombo1.text = DBCombo1_List.value(position);
    m_boundDirty = false;
}

bool ccForm1_directory::findFirst(const QString& id)
{
    const int index = indexOfId(id);
    if (index < 0 || !m_Data1->setAbsolutePosition(index))
        return false;
    showCurrentRow();
    Data1_Reposition();
    return true;
}

bool ccForm1_directory::openInstrument(const QString& id)
{
    closeInstrument();
    const QString path = m_folder.instrumentFile(id);
    QString error;
    if (path.isEmpty()) {
        unexpectedError(QStringLiteral("The Glacinor ID must be a number from 1 to 99999"));
        return false;
    }
    m_instrument = InstrumentStore::open(path, &error);
    if (!m_instrument) {
        unexpectedError(error);
        return false;
    }
    m_info = &m_instrument->infoTable();
    // Positioned at both ends once, so that RecordCount is valid.
    m_info->MoveLast();
    m_info->MoveFirst();
    m_openId = id;
    return true;
}

void ccForm1_directory::closeInstrument()
{
    if (m_info && m_toldInfo == m_info) {
        m_toldInfo = nullptr;
        emit instrumentSelected(m_toldId, m_toldPhone, nullptr);
    }
    m_info = nullptr;
    m_instrument.reset();
    m_openId.clear();
}

// The boxes other than ID and Name can be edited at any time; like bound
// boxes they are written when the row is left.
void ccForm1_directory::saveBoundEdits()
{
    if (!m_boundDirty || adding || !m_Data1)
        return;
    m_boundDirty = false;
    if (m_Data1->AbsolutePosition() < 0)
        return;
    bool ok = m_Data1->Edit();
    for (int f = Table1::Address; ok && f < Table1::FieldCount; ++f)
        ok = m_Data1->setValue(f, Text1[boxOfField(f)].text);
    if (!ok || !m_Data1->Update()) {
        m_Data1->CancelUpdate();
        unexpectedError(m_Data1->lastError());
    }
}

void ccForm1_directory::setBrowsing(bool browsing)
{
    for (ControlState* c : {&Command1, &Command2, &Command8, &DBCombo1, &Data1, &Option1[0], &Option1[1], &Text5})
        c->enabled = browsing;
    Command4.enabled = !browsing;
    Command5.enabled = !browsing;
    Text1_Locked[IdBox] = browsing;
    Text1_Locked[NameBox] = browsing;
}

void ccForm1_directory::unexpectedError(const QString& description)
{
    m_op.message(QStringLiteral("Q-19"), {QStringLiteral("Unexpected Error: ") + description}, Icon::Critical);
}

void ccForm1_directory::done()
{
    const QString id = Text1[IdBox].text;
    const QString phone = Text1[ModemPhoneBox].text;
    if (!m_told || id != m_toldId || phone != m_toldPhone || m_info != m_toldInfo) {
        m_told = true;
        m_toldId = id;
        m_toldPhone = phone;
        m_toldInfo = m_info;
        emit instrumentSelected(id, phone, m_toldInfo);
    }
    emit changed();
}
