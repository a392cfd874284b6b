#include "host/catalog_reader.h"

#include <algorithm>
#include <charconv>
#include <map>
#include <set>
#include <unordered_map>

namespace zr::host {

namespace {

bool isWordUnit(char16_t unit) {
    return unit == u'_' || unit == u'$' || unit == u'#' || (unit >= u'0' && unit <= u'9') ||
           (unit >= u'a' && unit <= u'z') || (unit >= u'A' && unit <= u'Z') || unit > 0x7F;
}

// Goes through a text by words, quoted names and signs; white space and comments are passed over.
class Words {
 public:
    explicit Words(std::u16string_view text) : text_(text) {}

    // Empty at the end of the text.
    std::u16string_view next() {
        skipBlanks();
        const std::size_t begin = at_;
        if (begin == text_.size()) return {};
        const char16_t first = text_[at_++];
        if (isWordUnit(first)) {
            while (at_ < text_.size() && isWordUnit(text_[at_])) ++at_;
        } else if (first == u'"' || first == u'`' || first == u'[' || first == u'\'') {
            at_ = std::min(text_.find(first == u'[' ? u']' : first, at_), text_.size() - 1) + 1;
        }
        return text_.substr(begin, at_ - begin);
    }
    std::size_t place() const { return at_; }

 private:
    void skipBlanks() {
        while (at_ < text_.size()) {
            if (text_[at_] <= u' ')
                ++at_;
            else if (text_.substr(at_, 2) == u"--")
                at_ = std::min(text_.find(u'\n', at_), text_.size());
            else if (text_.substr(at_, 2) == u"/*")
                at_ = std::min(text_.find(u"*/", at_ + 2), text_.size() - 2) + 2;
            else
                return;
        }
    }

    std::u16string_view text_;
    std::size_t at_ = 0;
};

bool isWord(std::u16string_view text, const char16_t* wanted) {
    return CString(text).EqualsNoCase(wanted);
}

// Takes the size off a type's name: varchar(50), decimal(10,2). Anything else stays part of the name.
void setType(Field& field, const CatalogRows::Column& column) {
    field.Type = column.type;
    field.Length = column.length;
    field.Scale = column.scale;
    const std::string text = column.type.toUtf8();
    const std::size_t open = text.find('(');
    if (open == std::string::npos || text.back() != ')') return;
    int numbers[2] = {-1, 0};
    int count = 0;
    for (std::size_t at = open + 1; at < text.size(); ++count) {
        while (text[at] == ' ') ++at;
        if (count == 2) return;
        const auto read = std::from_chars(text.data() + at, text.data() + text.size(), numbers[count]);
        if (read.ec != std::errc()) return;
        at = static_cast<std::size_t>(read.ptr - text.data());
        while (text[at] == ' ') ++at;
        if (text[at] != ',' && at + 1 != text.size()) return;
        ++at;
    }
    field.Type = CString::fromUtf8(text.substr(0, text.find_last_not_of(' ', open - 1) + 1));
    field.Length = numbers[0];
    field.Scale = numbers[1];
}

CString lower(CString text) {
    text.MakeLower();
    return text;
}

class Maker {
 public:
    Maker(CatalogRows& rows, DBTypes kind, const CString& schema)
        : rows_(rows), schema_(schema), database_(std::make_unique<Database>(kind)) {
        database_->SchemaName = schema;
    }

    std::unique_ptr<Database> make() {
        addQueries();
        addTables();
        addKeys();
        addFunctions();
        database_->ResolveReferences();
        return std::move(database_);
    }

 private:
    template <class Row>
    bool isWanted(const Row& row) const {
        return schema_.IsEmpty() || row.schema.IsEmpty() || row.schema.EqualsNoCase(schema_);
    }

    void note(const std::string& text) { rows_.notes.push_back(text); }

    void addQueries() {
        for (const CatalogRows::View& view : rows_.views) {
            if (!isWanted(view)) continue;
            const auto [place, isNew] = schemaOfView_.try_emplace(lower(view.name), view.schema);
            if (!isNew) {
                note("view " + view.schema.toUtf8() + "." + view.name.toUtf8() +
                     ": left out; there is one of that name already");
                continue;
            }
            if (view.isOpen) continue;
            const CString sql = view.text ? queryOfView(*view.text) : CString();
            if (sql.IsEmpty()) {
                note("view " + view.name.toUtf8() + ": left out; the catalogue does not tell its text");
                continue;
            }
            auto query = std::make_unique<Query>(database_->GetDBType());
            setNames(*query, view.name);
            query->SetSQL(sql);
            database_->addQuery(std::move(query));
        }
    }

    void addTables() {
        std::vector<const CatalogRows::Column*> columns;
        for (const CatalogRows::Column& column : rows_.columns)
            if (isWanted(column) && !isOfView(column)) columns.push_back(&column);
        std::stable_sort(columns.begin(), columns.end(),
                         [](const auto* a, const auto* b) { return a->place < b->place; });
        // Tables stand in the order in which the rows tell them first.
        for (const CatalogRows::Column& column : rows_.columns)
            if (isWanted(column) && !isOfView(column)) tableOf(column);
        for (const CatalogRows::Column* column : columns) {
            Table* const table = tableOf(*column);
            if (!table || column->name.IsEmpty()) continue;
            if (table->FindFieldBySrcName(column->name)) {
                note("column " + column->table.toUtf8() + "." + column->name.toUtf8() +
                     ": left out; it is told twice");
                continue;
            }
            auto field = std::make_unique<Field>();
            setNames(*field, column->name);
            setType(*field, *column);
            table->addField(std::move(field));
        }
    }

    // Some catalogues tell the columns of views as well. A table of another schema that has a view's name is
    // left out.
    bool isOfView(const CatalogRows::Column& column) {
        const auto view = schemaOfView_.find(lower(column.table));
        if (view == schemaOfView_.end()) return false;
        if (!view->second.EqualsNoCase(column.schema) && !column.schema.IsEmpty() && !view->second.IsEmpty())
            leaveOut(column, "there is a view of that name, in " + view->second.toUtf8());
        return true;
    }

    // Null where another table has the name, in another schema or with other capitals.
    Table* tableOf(const CatalogRows::Column& column) {
        Known& known = tables_[lower(column.table)];
        if (!known.table) {
            auto table = std::make_unique<Table>(database_->GetDBType());
            setNames(*table, column.table);
            known = {&database_->addTable(std::move(table)), column.schema};
        }
        const bool isSchema = known.schema.EqualsNoCase(column.schema);
        if (isSchema && known.table->GetSrcName() == column.table) return known.table;
        leaveOut(column, isSchema ? "there is a table " + known.table->GetSrcName().toUtf8() + " already"
                                  : "there is one of that name already, in " + known.schema.toUtf8());
        return nullptr;
    }

    void leaveOut(const CatalogRows::Column& column, const std::string& why) {
        if (leftOut_.emplace(column.schema, column.table).second)
            note("table " + column.schema.toUtf8() + "." + column.table.toUtf8() + ": left out; " + why);
    }

    void addKeys() {
        std::vector<const CatalogRows::Key*> keys;
        for (const CatalogRows::Key& key : rows_.keys)
            if (isWanted(key)) keys.push_back(&key);
        std::stable_sort(keys.begin(), keys.end(),
                         [](const auto* a, const auto* b) { return a->place < b->place; });
        std::map<std::pair<CString, CString>, std::vector<const CatalogRows::Key*>> byName;
        for (const CatalogRows::Key* key : keys) byName[{lower(key->table), key->name}].push_back(key);
        for (const auto& [name, parts] : byName) {
            const auto found = tables_.find(name.first);
            if (found == tables_.end() || !found->second.schema.EqualsNoCase(parts.front()->schema) ||
                found->second.table->GetSrcName() != parts.front()->table)
                note("key " + name.second.toUtf8() + ": left out; there is no table " +
                     parts.front()->table.toUtf8());
            else if (parts.front()->kind == CatalogRows::Key::Kind::Foreign)
                addForeignKey(*found->second.table, parts);
            else
                addIndex(*found->second.table, parts);
        }
    }

    void addIndex(Table& table, const std::vector<const CatalogRows::Key*>& parts) {
        auto index = std::make_unique<Index>();
        setNames(*index, parts.front()->name);
        index->PrimaryKey = parts.front()->kind == CatalogRows::Key::Kind::Primary;
        index->Unique = 1;
        for (const CatalogRows::Key* part : parts) index->addColumn(part->column);
        table.addIndex(std::move(index));
    }

    void addForeignKey(Table& table, const std::vector<const CatalogRows::Key*>& parts) {
        if (parts.front()->referencedTable.IsEmpty())
            return note("foreign key " + parts.front()->name.toUtf8() +
                        ": left out; the catalogue does not tell what it refers to");
        auto key = std::make_unique<ForeignKey>();
        setNames(*key, parts.front()->name);
        key->ReferencedTable = parts.front()->referencedTable;
        for (const CatalogRows::Key* part : parts)
            key->Columns.AddTail({part->column, part->referencedColumn});
        table.addForeignKey(std::move(key));
    }

    // The model knows a function by its name alone: of several the one with the most parameters stays.
    void addFunctions() {
        for (const CatalogRows::Function& function : rows_.functions) {
            if (!isWanted(function)) continue;
            int& parameters = parametersOf_.try_emplace(function.name, 0).first->second;
            parameters = std::max(parameters, function.parameters);
            database_->UserFunctions[function.name].Format(u"%d", parameters);
        }
    }

    struct Known {
        Table* table = nullptr;
        CString schema;
    };

    CatalogRows& rows_;
    const CString& schema_;
    std::unique_ptr<Database> database_;
    std::unordered_map<CString, CString> schemaOfView_;
    std::unordered_map<CString, Known> tables_;
    std::set<std::pair<CString, CString>> leftOut_;  // schema and name of tables
    std::unordered_map<CString, int> parametersOf_;
};

}  // namespace

std::unique_ptr<Database> makeDatabase(CatalogRows& rows, DBTypes kind, const CString& schema) {
    return Maker(rows, kind, schema).make();
}

CString queryOfView(const CString& text) {
    CString query = text;
    Words words(text.View());
    std::u16string_view word = words.next();
    if (isWord(word, u"CREATE") || isWord(word, u"ALTER")) {
        while (!word.empty() && !isWord(word, u"VIEW")) word = words.next();
        // Columns in parentheses stand between the view's name and AS.
        int depth = 0;
        for (word = words.next(); !word.empty(); word = words.next()) {
            if (word == u"(") ++depth;
            if (word == u")") --depth;
            if (depth == 0 && isWord(word, u"AS")) break;
        }
        query = CString(text.View().substr(word.empty() ? text.View().size() : words.place()));
    }
    query.Trim(u" \t\r\n;");
    return query;
}

}  // namespace zr::host
