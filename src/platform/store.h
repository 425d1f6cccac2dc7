#pragma once

#include <QList>
#include <QString>
#include <QStringList>
#include <QVariant>
#include <memory>

class Recordset;

// One data base file of the program (SQLite through QtSql). All SQL of the
// program lives behind this class and Recordset; SQLite-only pragmas sit in
// store_sqlite.cpp alone, so that the same store can later live on another server.
//
// Errors, everywhere in the store: a call that can fail says so in what it
// returns (false, a null pointer, an invalid QVariant, an empty list, -1 for
// a number that is never negative) and leaves the reason, in words fit for
// the user, in lastError() of the object asked (the Store for its own calls
// and its transactions, the Recordset for a set's calls). Nothing throws and
// nothing is logged. open() and create() have no object to ask yet: they
// alone hand the reason back through *error.
class Store {
public:
    // Written into every file the program creates, so that a stranger's file
    // (or a file of a newer program) is recognised before it is used.
    static constexpr qint32 ApplicationId = 0x51313930; // "Q190"

    enum class ColumnType { Integer, Double, Text, DateTime, Boolean };
    struct Column {
        QString name;
        ColumnType type = ColumnType::Text;
    };

    ~Store();
    Store(const Store&) = delete;
    Store& operator=(const Store&) = delete;

    // Opens an existing file. Null with the reason in *error when it is
    // missing, is not a data base, or is one of another program.
    static std::unique_ptr<Store> open(const QString& path, QString* error = nullptr);
    // Creates a new file (it must not exist) stamped with ApplicationId and
    // userVersion.
    static std::unique_ptr<Store> create(const QString& path, int userVersion,
                                         QString* error = nullptr);

    QString path() const { return m_path; }
    QString lastError() const { return m_lastError; }
    // -1 when it cannot be read.
    int userVersion() const;
    bool setUserVersion(int v);

    bool createTable(const QString& table, const QList<Column>& columns);
    bool hasTable(const QString& table) const;
    QStringList tables() const;
    QStringList columnNames(const QString& table) const;
    // Empties a table in one statement.
    bool deleteAll(const QString& table);

    // All rows of a table in insertion order, or ordered by one column (rows
    // with equal values keep insertion order). Null with lastError() on failure.
    std::unique_ptr<Recordset> openRecordset(const QString& table, const QString& orderBy = {});

    bool beginTransaction();
    bool commit();
    bool rollback();
    bool inTransaction() const { return m_txDepth > 0; }

    // Everything written inside one scope lands together or not at all: the
    // record on the wire is the most a crash can cost.
    class Transaction {
    public:
        explicit Transaction(Store& store);
        ~Transaction(); // rolls back unless committed
        bool commit();
        Transaction(const Transaction&) = delete;
        Transaction& operator=(const Transaction&) = delete;

    private:
        Store& m_store;
        bool m_done = false;
    };

    // The file's own consistency check. True when sound; the findings in *report.
    bool integrityCheck(QString* report = nullptr);
    // Writes a compacted copy of the whole file to target (which must not exist).
    bool compactInto(const QString& target);

    // For the adapter's own record sets.
    QString connectionName() const { return m_connection; }
    void setLastError(const QString& e) const { m_lastError = e; }

private:
    friend class Recordset;
    Store(QString path, QString connection);
    // A new connection to the file, whether it opened or not: the caller
    // checks and says why.
    static std::unique_ptr<Store> connectTo(const QString& path);
    bool configure();
    void requeryAll();
    QString m_path;
    QString m_connection;
    mutable QString m_lastError;
    int m_txDepth = 0;
    // An inner scope rolled back: the outermost commit must not write.
    bool m_txDoomed = false;
    // Open record sets, detached when the store closes before them.
    QList<Recordset*> m_recordsets;
};

// A record set in the manner the program's algorithms are written in: one
// current record, moved by position; fields addressed by ordinal. Null (no
// value) is an invalid QVariant and stays distinct from empty text.
//
// Positions behave as the classic desktop data base engines have them:
// - an empty set is at BOF and EOF at once;
// - MoveNext from the last record reaches EOF, MovePrevious from the first
//   reaches BOF; AbsolutePosition is then -1; moving further is refused;
// - Delete removes the current record, which stays "current and deleted"
//   (no values, position -1) until the next move, and MoveNext goes to the
//   record that followed it;
// - AddNew + Update append the new record at the end and leave the current
//   record where it was before AddNew.
class Recordset {
public:
    ~Recordset();
    Recordset(const Recordset&) = delete;
    Recordset& operator=(const Recordset&) = delete;

    QString table() const { return m_table; }
    int RecordCount() const { return int(m_rowIds.size()); }
    int fieldCount() const { return int(m_fields.size()); }
    QString fieldName(int ordinal) const { return m_fields.value(ordinal); }
    int ordinalOf(const QString& name) const { return int(m_fields.indexOf(name)); }

    bool atBOF() const;
    bool atEOF() const;
    // 0-based; -1 at BOF, at EOF and on a deleted record.
    int AbsolutePosition() const;
    bool setAbsolutePosition(int position);

    bool MoveFirst();
    bool MoveLast();
    bool MoveNext();
    bool MovePrevious();

    // The current record's field. Invalid (Null) off a record.
    QVariant value(int ordinal) const;
    QVariant value(const QString& name) const { return value(ordinalOf(name)); }
    QVariantList values() const;
    // Some fields of the current record in one query, without reading the
    // others of a wide row; values set since Edit win.
    QVariantList values(const QList<int>& ordinals) const;
    // One field of every record, in the set's order, in one query.
    QVariantList column(int ordinal);
    // Some fields of some records (by position), in one query: a transfer of
    // many records pays the driver's work per query once, not per record.
    QList<QVariantList> rows(const QList<int>& positions, const QList<int>& ordinals);

    bool Edit();
    bool AddNew();
    // Between Edit/AddNew and Update only.
    bool setValue(int ordinal, const QVariant& value);
    bool setValue(const QString& name, const QVariant& value) { return setValue(ordinalOf(name), value); }
    bool Update();
    void CancelUpdate();
    bool Delete();
    bool editing() const { return m_mode != Mode::None; }

    // Reads the rows again from the file, keeping the position where it can.
    bool Requery();

    // Typed helpers: a cell by row position and ordinal. They put the current
    // position back afterwards, as every reader must.
    QVariant cell(int row, int ordinal);
    bool setCell(int row, int ordinal, const QVariant& value);

    QString lastError() const { return m_lastError; }

private:
    friend class Store;
    enum class Mode { None, Edit, AddNew };
    struct Statements;
    Recordset(Store& store, QString table, QList<Store::Column> columns, QString orderBy);
    bool load();
    bool loadCurrent() const;
    bool fetchRow(qint64 rowId, QVariantList* values) const;
    bool writeRow(qint64 rowId, const QList<int>& ordinals, const QVariantList& stored);
    bool hasCurrent() const;
    void leaveEditing();
    void moved();
    void detach();
    bool fail(const QString& message) const;

    Store* m_store; // null once the store has closed
    std::unique_ptr<Statements> m_sql;
    QString m_table;
    QStringList m_fields;
    QList<Store::ColumnType> m_types;
    QString m_orderBy;
    QList<qint64> m_rowIds;
    // -1 = BOF, RecordCount() = EOF.
    int m_pos = -1;
    bool m_deleted = false;
    // Records were added to an empty set: BOF and EOF stay until the next move.
    bool m_bothEnds = false;
    Mode m_mode = Mode::None;
    // Values as written to the file, for the fields set since Edit/AddNew.
    QVariantList m_buffer;
    QList<bool> m_dirty;
    mutable QVariantList m_current;
    mutable bool m_currentLoaded = false;
    mutable QString m_lastError;
};

// Null as the store has it: no value at all.
inline bool isNull(const QVariant& v) { return !v.isValid() || v.isNull(); }
