#pragma once

#include <functional>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

#include "host/database.h"

// Reading what a database tells of itself: tables, columns with types, keys and the texts of views.
namespace zr::host {

// A catalogue that can't be read at all; the message is one line that begins with the file's name or the
// server's address.
class CatalogReadError : public std::runtime_error {
 public:
    using std::runtime_error::runtime_error;
};

// What a catalogue holds, a row an object, in the order in which it is told. Names are as the source has
// them.
struct CatalogRows {
    struct Column {
        CString schema;
        CString table;
        CString name;
        CString type;  // may bring its size along: varchar(50)
        int length = -1;
        int scale = 0;
        int place = 0;  // in the table; 0: in the order of the rows
    };
    struct Key {
        enum class Kind { Primary, Unique, Foreign };
        CString schema;
        CString table;
        CString name;
        Kind kind = Kind::Primary;
        CString column;
        int place = 0;
        CString referencedTable;
        CString referencedColumn;
    };
    struct View {
        CString schema;
        CString name;
        std::optional<CString> text;  // with or without CREATE VIEW
        bool isOpen = false;          // the text was not asked for, or not yet
    };
    struct Function {
        CString schema;
        CString name;
        int parameters = 0;
    };
    std::vector<Column> columns;
    std::vector<Key> keys;
    std::vector<View> views;
    std::vector<Function> functions;
    std::vector<std::string> notes;  // what was left out, and why: a line each
    // All but the texts of views is read, and every view is named. What a reading that ends behind this
    // leaves is a catalogue of its own.
    bool isWholeButViews = false;
};

// How a catalogue is to be read.
struct CatalogReading {
    // Called now and then with what was read so far; what it raises ends the reading.
    std::function<void(const CatalogRows& rows)> look;
    // Whether the text of a view is there already, by its name; such a view stays open.
    std::function<bool(const CString& view)> isKnown;

    void tell(const CatalogRows& rows) const {
        if (look) look(rows);
    }
    bool wants(const CString& view) const { return !isKnown || !isKnown(view); }
};

// One kind of source.
class CatalogReader {
 public:
    virtual ~CatalogReader() = default;
    // Appends all that the source tells. Raises CatalogReadError.
    virtual void read(CatalogRows& rows, const CatalogReading& reading) = 0;
    void read(CatalogRows& rows) { read(rows, {}); }
    // The one schema that it reads; empty: not one alone.
    virtual CString schema() const { return {}; }
};

// The reader for the address of a server (postgresql://, mysql://, mariadb://), or for a file, by its
// content: an SQLite database; a database of MS Access; a dump of INFORMATION_SCHEMA or of Oracle's ALL_
// views as CSV or JSON. Raises CatalogReadError when it can't be opened or is no part of this build. Of a
// server a schema that is given is read alone; a file is read whole.
std::unique_ptr<CatalogReader> readerFor(const std::string& source, const CString& schema = {});

// The kind of database that the address of a server or a file of MS Access tells; nothing for another file or
// an address that is not known.
std::optional<DBTypes> kindOfSource(const std::string& source);

// What this build can read, for people.
std::vector<std::string> catalogReaders();

// Makes the tables and queries of the rows; a name that is a view's is no table. With a schema, rows of
// others are passed over. What can't be taken in is noted, and the rest goes on. A view that is open makes no
// query.
std::unique_ptr<Database> makeDatabase(CatalogRows& rows, DBTypes kind, const CString& schema);

// The query of a text that may begin with CREATE VIEW ... AS.
CString queryOfView(const CString& text);

}  // namespace zr::host
