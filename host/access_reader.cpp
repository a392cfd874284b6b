#include "host/access_reader.h"

#include <algorithm>
#include <charconv>
#include <fstream>
#include <map>

#include "host/access_queries.h"
#include "host/child_process.h"
#include "host/csv.h"
#include "host/server_readers.h"

namespace zr::host {

namespace {

constexpr int kQueryObject = 5;
constexpr int kNotEnforced = 2;  // of a relationship: a hint for people and no key

// Goes through a line: quoted names, and texts between them.
class Line {
 public:
    explicit Line(std::string_view text) : text_(text) {}

    bool take(std::string_view expected) {
        if (!text_.starts_with(expected)) return false;
        text_.remove_prefix(expected.size());
        return true;
    }
    // Names of MS Access hold neither brackets nor backquotes.
    std::string takeName(char open, char close) {
        if (text_.empty() || text_.front() != open) return {};
        const std::size_t end = text_.find(close, 1);
        if (end == text_.npos) return {};
        std::string name(text_.substr(1, end - 1));
        text_.remove_prefix(end + 1);
        return name;
    }
    std::string_view rest() const { return text_; }

 private:
    std::string_view text_;
};

template <class Use>
void eachLine(std::string_view text, Use use) {
    while (!text.empty()) {
        const std::size_t end = std::min(text.find('\n'), text.size());
        use(text.substr(0, end));
        text.remove_prefix(std::min(end + 1, text.size()));
    }
}

std::string_view trimmed(std::string_view text) {
    const std::size_t first = text.find_first_not_of(" \t\r,");
    if (first == text.npos) return {};
    return text.substr(first, text.find_last_not_of(" \t\r,") - first + 1);
}

// A size is told for types that have none, too.
std::string_view typeIn(std::string_view text) {
    text = trimmed(text);
    return text.starts_with("Memo") || text.starts_with("OLE") ? text.substr(0, text.find(" (")) : text;
}

// The rows of an exported table, by the names of its columns.
class Export {
 public:
    explicit Export(std::string_view text) : csv_(text), names_(csv_.next()) {}

    bool next() {
        if (csv_.isAtEnd()) return false;
        cells_ = csv_.next();
        return true;
    }
    std::string text(std::string_view name) const {
        const auto found = std::find(names_.begin(), names_.end(), name);
        const auto at = static_cast<std::size_t>(found - names_.begin());
        return at < cells_.size() ? cells_[at] : std::string();
    }
    int number(std::string_view name) const {
        const std::string digits = text(name);
        int number = 0;
        std::from_chars(digits.data(), digits.data() + digits.size(), number);
        return number;
    }

 private:
    Csv csv_;
    std::vector<std::string> names_;
    std::vector<std::string> cells_;
};

bool isOfSystem(const std::string& name) {
    return CString::fromUtf8(name.substr(0, 4)).EqualsNoCase(u"MSys");
}

}  // namespace

bool isAccessFile(const std::string& path) {
    std::ifstream file(path, std::ios::binary);
    std::string head(19, '\0');
    file.read(head.data(), static_cast<std::streamsize>(head.size()));
    const std::string_view name = std::string_view(head).substr(4);
    return file && (name == "Standard Jet DB" || name == "Standard ACE DB");
}

std::string AccessReader::run(const std::vector<std::string>& words) const {
    // Names and texts come as UTF-8, whatever the user has set.
    const ProgramEnd end = runProgram(words, {"LC_ALL=C.UTF-8", "MDBICONV", "MDBOPTS"}, {.time = patience_});
    if (end.isDone()) return end.output;
    const std::string begin = path_ + ": " + words.front();
    switch (end.how) {
        case ProgramEnd::How::Missing:
            throw CatalogReadError(begin +
                                   " is not installed; databases of MS Access are read by the programs of "
                                   "mdbtools (Debian: apt-get install mdbtools)");
        case ProgramEnd::How::TooSlow:
            throw CatalogReadError(begin + " did not end in " + std::to_string(patience_.count() / 1000) +
                                   " seconds");
        case ProgramEnd::How::TooMuch:
            throw CatalogReadError(begin + " tells too much");
        default:
            throw CatalogReadError(begin + " failed: " + onOneLine(end.complaints));
    }
}

void AccessReader::read(CatalogRows& rows, const CatalogReading& reading) {
    readTables(rows);
    // What is beyond the tables may be missing in old or damaged files.
    const auto orNote = [&](const char* what, auto step) {
        reading.tell(rows);
        try {
            (this->*step)(rows);
        } catch (const CatalogReadError& error) {
            rows.notes.push_back(std::string(what) + ": left out; " + error.what());
        }
    };
    orNote("keys", &AccessReader::readKeys);
    orNote("relationships", &AccessReader::readRelationships);
    orNote("queries", &AccessReader::readQueries);
}

void AccessReader::readTables(CatalogRows& rows) const {
    const std::string schema = run({"mdb-schema", "--no-not-null", "--no-default-values", "--no-indexes",
                                    "--no-relations", "--no-comments", "--", path_, "access"});
    std::string table;
    eachLine(schema, [&](std::string_view text) {
        Line line(text);
        if (line.take("CREATE TABLE ")) {
            table = line.takeName('[', ']');
        } else if (line.take(");")) {
            table.clear();
        } else if (!table.empty() && line.take("\t")) {
            CatalogRows::Column column;
            column.table = CString::fromUtf8(table);
            column.name = CString::fromUtf8(line.takeName('[', ']'));
            column.type = CString::fromUtf8(typeIn(line.rest()));
            if (!column.name.IsEmpty()) rows.columns.push_back(std::move(column));
        }
    });
}

// Of the forms in which keys are told, MySQL's alone leaves all names as they are.
void AccessReader::readKeys(CatalogRows& rows) const {
    const std::string schema =
        run({"mdb-schema", "--no-drop-table", "--no-relations", "--no-comments", "--", path_, "mysql"});
    eachLine(schema, [&](std::string_view text) {
        Line line(text);
        if (!line.take("ALTER TABLE ")) return;
        CatalogRows::Key key;
        const std::string table = line.takeName('`', '`');
        key.table = CString::fromUtf8(table);
        if (line.take(" ADD PRIMARY KEY (")) {
            key.name = u"pk_" + key.table;
        } else if (line.take(" ADD UNIQUE INDEX ")) {
            key.kind = CatalogRows::Key::Kind::Unique;
            key.name = CString::fromUtf8(line.takeName('`', '`'));
            if (!line.take(" (")) return;
        } else {
            return;
        }
        for (std::string column = line.takeName('`', '`'); !column.empty();
             column = line.takeName('`', '`')) {
            key.column = CString::fromUtf8(column);
            ++key.place;
            rows.keys.push_back(key);
            line.take(" DESC");
            line.take(", ");
        }
    });
}

void AccessReader::readRelationships(CatalogRows& rows) const {
    const std::string exported = run({"mdb-export", "-b", "strip", "--", path_, "MSysRelationships"});
    Export relationships(exported);
    while (relationships.next()) {
        CatalogRows::Key key;
        const std::string table = relationships.text("szObject");
        if (relationships.number("grbit") & kNotEnforced || isOfSystem(table)) continue;
        key.kind = CatalogRows::Key::Kind::Foreign;
        key.table = CString::fromUtf8(table);
        key.name = CString::fromUtf8(relationships.text("szRelationship"));
        key.column = CString::fromUtf8(relationships.text("szColumn"));
        key.place = relationships.number("icolumn");
        key.referencedTable = CString::fromUtf8(relationships.text("szReferencedObject"));
        key.referencedColumn = CString::fromUtf8(relationships.text("szReferencedColumn"));
        rows.keys.push_back(std::move(key));
    }
}

// mdb-queries leaves out aliases, joins and unions, so the texts are made of the stored parts.
void AccessReader::readQueries(CatalogRows& rows) const {
    std::vector<std::pair<int, std::string>> queries;
    const std::string objectRows = run({"mdb-export", "-b", "strip", "--", path_, "MSysObjects"});
    for (Export objects(objectRows); objects.next();)
        if (objects.number("Type") == kQueryObject)
            queries.emplace_back(objects.number("Id"), objects.text("Name"));
    if (queries.empty()) return;

    std::map<int, std::vector<AccessQueryPart>> partsOf;
    const std::string partRows = run({"mdb-export", "-b", "strip", "--", path_, "MSysQueries"});
    for (Export parts(partRows); parts.next();)
        partsOf[parts.number("ObjectId")].push_back({parts.number("Attribute"), parts.number("Flag"),
                                                     parts.text("Name1"), parts.text("Name2"),
                                                     parts.text("Expression")});
    for (const auto& [id, name] : queries) {
        try {
            rows.views.push_back(
                {{}, CString::fromUtf8(name), CString::fromUtf8(textOfAccessQuery(partsOf[id]))});
        } catch (const NoAccessQuery& why) {
            rows.notes.push_back("query " + name + ": left out; " + why.what());
        }
    }
}

}  // namespace zr::host
