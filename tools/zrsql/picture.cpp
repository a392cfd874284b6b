#include "picture.h"

#include <algorithm>
#include <deque>
#include <map>
#include <optional>
#include <set>
#include <vector>

#include "expression_text.h"
#include "host/descriptor_access.h"
#include "host/from_sources.h"
#include "text_table.h"
#include "zrparsersql/database_info.h"
#include "zrparsersql/nested_queries.h"

namespace zr::tool {

namespace {

using Text = std::u16string;

Text lowered(const CString& name) {
    CString lower = name;
    return Text(lower.MakeLower().View());
}

void joinTo(Text& text, const Text& part, std::u16string_view between) {
    if (!text.empty()) text += between;
    text += part;
}

// Query descriptors get numbers as they are met; the picture shows them one below the other.
class Numbering {
 public:
    Text nameOf(const CZRQueryInfo& query) { return u"query " + number(numberOf(query)); }
    std::size_t numberOf(const CZRQueryInfo& query) {
        const auto [found, isNew] = numbers_.try_emplace(&query, numbers_.size() + 1);
        if (isNew) queries_.push_back(&query);
        return found->second;
    }
    const CZRQueryInfo* next() {
        if (queries_.empty()) return nullptr;
        const CZRQueryInfo* query = queries_.front();
        queries_.pop_front();
        return query;
    }

 private:
    std::map<const CZRQueryInfo*, std::size_t> numbers_;
    std::deque<const CZRQueryInfo*> queries_;
};

// What a FROM clause names: tables and nested queries, with their aliases.
class FromNames {
 public:
    FromNames(const CZRQueryInfo& query, Numbering& numbering) {
        for (const host::FromSource& source : host::fromSources(query)) add(source, numbering);
    }

    // Names of the sources, each once, in order.
    const std::vector<Text>& sources() const { return sources_; }
    bool hasSource(const CString& table) const {
        return std::any_of(sources_.begin(), sources_.end(),
                           [&](const Text& source) { return table.EqualsNoCase(source); });
    }
    // What an alias stands for; empty for a name that is none.
    Text meaningOf(const CString& alias) const {
        const auto found = meanings_.find(lowered(alias));
        return found == meanings_.end() ? Text() : found->second;
    }
    // The aliases of a table, in order.
    Text aliasesOf(const CString& table) const {
        Text aliases;
        for (const auto& [name, alias] : tableAliases_)
            if (name == lowered(table)) joinTo(aliases, Text(alias.View()), u", ");
        return aliases;
    }

 private:
    void add(const host::FromSource& source, Numbering& numbering) {
        const Text name =
            source.query ? numbering.nameOf(*source.query) : Text(source.table->m_sourceTable.View());
        if (!source.alias.IsEmpty()) {
            meanings_[lowered(source.alias)] = name;
            if (source.table) tableAliases_.emplace_back(lowered(source.table->m_sourceTable), source.alias);
        }
        if (!name.empty() && std::find(sources_.begin(), sources_.end(), name) == sources_.end())
            sources_.push_back(name);
    }

    std::vector<Text> sources_;
    std::map<Text, Text> meanings_;
    std::vector<std::pair<Text, CString>> tableAliases_;
};

class QueryPicture {
 public:
    QueryPicture(Text& out, const CZRQueryInfo& query, bool isNested, Numbering& numbering)
        : out_(out), query_(query), isNested_(isNested), numbering_(numbering), names_(query, numbering) {}

    void draw() {
        drawColumns();
        drawSources();
        drawClauses();
    }

 private:
    void drawColumns() {
        out_ += u"\nColumns\n";
        if (query_.m_selectItems.IsEmpty() && !query_.m_subQueries.IsEmpty()) {
            out_ += u"  none: a nested query stands in the first clause, and there the analysis ends\n";
            return;
        }
        if (query_.m_selectItems.IsEmpty()) {
            out_ += u"  none\n";
            return;
        }
        TextTable table;
        std::size_t place = 0;
        for (const SelectItem* item : query_.m_selectItems) {
            const Text origin = originOf(*item);
            table.add({number(++place), columnName(*item), columnExpression(*item),
                       origin.empty() ? origin : u"from " + origin});
        }
        table.appendTo(out_);
    }

    // Some dialects leave all columns of a table as the table without a column.
    static bool isAllColumns(const SelectItemField& field) {
        return field.m_sourceField.IsEmpty() &&
               !(field.m_sourceTable.IsEmpty() && field.m_tableAlias.IsEmpty());
    }

    static Text columnName(const SelectItem& item) {
        if (host::isAlias(item)) return Text(item.m_items.GetTail()->m_text.View());
        if (const SelectItemField* field = host::classOf(item).field) {
            if (isAllColumns(*field)) return u"*";
            return Text(field->m_sourceField.IsEmpty() ? field->m_text.View() : field->m_sourceField.View());
        }
        return item.m_kind == SIK_NUMBER && item.m_text == u"*" ? u"*" : u"-";
    }

    Text columnExpression(const SelectItem& item) {
        if (host::isAlias(item)) return expression(*item.m_items.GetHead());
        const SelectItemField* const field = host::classOf(item).field;
        return field && isAllColumns(*field) ? fieldText(*field) + u".*" : expression(item);
    }

    // The columns of sources that an expression reads, each once, in order.
    Text originOf(const SelectItem& root) {
        Text origin;
        std::set<Text> seen;
        host::forEachItem(root, [&](const SelectItem& item) {
            const host::ItemClass itemClass = host::classOf(item);
            Text one;
            // A reference to an alias has what it stands for below it.
            if (itemClass.field && item.m_kind != SIK_FIELD_LIKE)
                one = originOfField(*itemClass.field);
            else if (itemClass.query)
                one = numbering_.nameOf(*itemClass.query);
            if (!one.empty() && seen.insert(one).second) joinTo(origin, one, u", ");
        });
        return origin;
    }

    Text originOfField(const SelectItemField& field) const {
        const Text source = sourceOfField(field);
        if (source.empty()) return source;
        if (isAllColumns(field)) return source + u".*";
        return field.m_sourceField.IsEmpty() ? source : source + u"." + Text(field.m_sourceField.View());
    }

    Text sourceOfField(const SelectItemField& field) const {
        if (!field.m_tableAlias.IsEmpty()) return names_.meaningOf(field.m_tableAlias);
        if (field.m_sourceTable.IsEmpty()) return onlySourceOf(field.m_sourceField);
        // The name may be that of an alias which was not known yet where it was read.
        const Text meaning = names_.meaningOf(field.m_sourceTable);
        return meaning.empty() ? Text(field.m_sourceTable.View()) : meaning;
    }

    // The source of a column that is written without one: the only source there is, or the only one of the
    // catalogue that has the column. "?" where that leaves it open; empty without any source.
    Text onlySourceOf(const CString& column) const {
        const std::vector<Text>& sources = names_.sources();
        if (sources.size() <= 1) return sources.empty() ? Text() : sources.front();
        Text only;
        for (const Text& source : sources) {
            CZRSourceInfo* known = query_.FindSource(CString(source));
            if (!known || !known->FindFieldBySrcName(column)) continue;
            if (!only.empty()) return u"?";
            only = source;
        }
        return only.empty() ? u"?" : only;
    }

    void drawSources() {
        const bool hasCatalog = query_.m_database && !(query_.m_database->Tables.IsEmpty() &&
                                                       query_.m_database->Queries.IsEmpty());
        TextTable table;
        for (const auto* entry : host::sortedEntries(query_.m_sourceTables)) {
            const bool isOwn = names_.hasSource(entry->key);
            // A nested query's descriptor lists what the outer ones read as well.
            if (!isOwn && isNested_) continue;
            const Text aliases = names_.aliasesOf(entry->key);
            Text resolved;
            if (hasCatalog)
                resolved = query_.FindSource(entry->key) ? u"known as " + Text(entry->value.View())
                                                         : u"not in the catalogue";
            table.add({Text(entry->key.View()), aliases.empty() ? aliases : u"as " + aliases,
                       isOwn || !isReadByNested(entry->key) ? u"" : u"in another query", resolved});
        }
        Text sources;
        table.appendTo(sources);
        if (!sources.empty()) out_ += u"\nSources\n" + sources;
    }

    // Whether the FROM clause of a nested query names it. Some dialects keep no item for a table in
    // parentheses.
    bool isReadByNested(const CString& source) const {
        // Nothing is changed: the function takes what it hands out.
        for (const CZRQueryInfo* nested : withNestedQueries(const_cast<CZRQueryInfo&>(query_))) {
            if (nested == &query_) continue;
            for (const host::FromSource& from : host::fromSources(*nested))
                if (from.table && from.table->m_sourceTable.EqualsNoCase(source)) return true;
        }
        return false;
    }

    void drawClauses() {
        TextTable table;
        static constexpr std::u16string_view predicates[] = {u"", u"ALL", u"DISTINCT", u"DISTINCTROW",
                                                             u"", u"*"};
        if (query_.m_predicate > 0 && query_.m_predicate < static_cast<int>(std::size(predicates)))
            table.add({u"predicate", Text(predicates[query_.m_predicate])});
        if (query_.m_hasLimit) table.add({u"limit", limitText()});
        addClause(table, u"from", query_.m_fromItems, u", ");
        if (query_.m_whereItem) addClause(table, u"where", query_.m_whereItem->m_items, u" ");
        addClause(table, u"group by", query_.m_groupItems, u", ");
        addClause(table, u"having", query_.m_havingItems, u" ");
        addClause(table, u"order by", query_.m_orderItems, u", ");
        addClause(table, u"union", query_.m_unionItems, u", ");
        Text clauses;
        table.appendTo(clauses);
        if (!clauses.empty()) out_ += u"\nClauses\n" + clauses;
    }

    Text limitText() const {
        const Text count = number(query_.m_limitCount) + u" rows";
        return query_.m_limitOffset ? count + u" from row " + number(query_.m_limitOffset) : count;
    }

    void addClause(TextTable& table, const Text& name, const CList<SelectItem*>& items,
                   std::u16string_view between) {
        Text text;
        for (const SelectItem* item : items) joinTo(text, expression(*item), between);
        if (!items.IsEmpty()) table.add({name, text});
    }

    Text expression(const SelectItem& item) {
        return expressionText(
            item, [this](const CZRQueryInfo& query) { return u"(" + numbering_.nameOf(query) + u")"; });
    }

    Text& out_;
    const CZRQueryInfo& query_;
    const bool isNested_;
    Numbering& numbering_;
    FromNames names_;
};

}  // namespace

void appendSql(Text& out, std::u16string_view text) {
    while (!text.empty()) {
        const std::size_t end = text.find_first_of(u"\r\n");
        const std::u16string_view line = text.substr(0, end);
        out += line.empty() ? Text(u"\n") : u"  " + Text(line) + u'\n';
        if (end == text.npos) break;
        text.remove_prefix(end + (text.substr(end, 2) == u"\r\n" ? 2 : 1));
    }
}

void appendStop(Text& out, const ReadPlace& place) {
    if (!place.stop) return;
    out += u"\nRead " + number(place.taken) + u" of " + number(place.all) + u" tokens; stopped at line " +
           number(place.stop->line) + u", column " + number(place.stop->column) + u", before \"" +
           place.stop->text + u"\"\n";
}

void drawPicture(std::string& out, const CString& text, const CZRQueryInfo& root, const ReadPlace& place) {
    Text picture;
    picture += u"SQL\n";
    appendSql(picture, text);
    Numbering numbering;
    numbering.numberOf(root);
    while (const CZRQueryInfo* query = numbering.next()) {
        if (query != &root) picture += u"\n" + Text(u"Query ") + number(numbering.numberOf(*query)) + u'\n';
        QueryPicture(picture, *query, query != &root, numbering).draw();
    }
    appendStop(picture, place);
    out += CString(picture).toUtf8();
}

}  // namespace zr::tool
