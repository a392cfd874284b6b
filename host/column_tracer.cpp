#include "host/column_tracer.h"

#include <algorithm>

#include "host/descriptor_access.h"

namespace zr::host {

namespace {

constexpr const char16_t* kStar = u"*";
constexpr int kStarPredicate = 5;  // PostgreSQL's select list of nothing but "*"
constexpr std::u16string_view kCastMark = u"CAST";

void addNew(ColumnOrigins& to, const ColumnOrigins& origins) {
    for (const ColumnOrigin& origin : origins)
        if (std::find(to.begin(), to.end(), origin) == to.end()) to.push_back(origin);
}

// What a "*" is qualified with; null for an item that is none.
const CString* starQualifier(const SelectItem& item) {
    static const CString none;
    if (const SelectItemField* field = classOf(item).field) {
        const CString& qualifier = field->m_tableAlias.IsEmpty() ? field->m_sourceTable : field->m_tableAlias;
        // Some dialects leave all columns of a table as the table without a column.
        const bool isTable = field->m_sourceField.IsEmpty() && !qualifier.IsEmpty();
        return isTable || field->m_sourceField == kStar ? &qualifier : nullptr;
    }
    return item.m_text == kStar && item.m_items.IsEmpty() ? &none : nullptr;
}

CString nameOf(const SelectItem& item) {
    if (isAlias(item)) return item.m_items.GetTail()->m_text;
    if (const SelectItemField* field = classOf(item).field)
        return field->m_sourceField.IsEmpty() ? field->m_text : field->m_sourceField;
    return u"-";
}

// A bare name that is an alias, too: descriptors leave its text alone, without what the alias stands for.
bool isBareAlias(const SelectItemField& field, const CZRQueryInfo& query) {
    if (!field.m_sourceField.IsEmpty() || !field.m_sourceTable.IsEmpty() || !field.m_tableAlias.IsEmpty() ||
        !field.m_items.IsEmpty())
        return false;
    const CString oracleKey = field.m_text + u"_FIELD";
    return query.m_aliases.Contains(field.m_text.View()) || query.m_aliases.Contains(oracleKey.View());
}

bool isAllKnown(const ColumnOrigins& origins) {
    return std::all_of(origins.begin(), origins.end(),
                       [](const ColumnOrigin& origin) { return origin.isKnown(); });
}

// Dialects may end a query's analysis at a nested query in its first clause.
bool endsInFirstClause(const CZRQueryInfo& query) {
    return query.m_selectItems.IsEmpty() && !query.m_subQueries.IsEmpty();
}

struct Clause {
    std::string_view name;
    std::vector<const SelectItem*> items;
};

std::vector<Clause> clausesBesideSelect(const CZRQueryInfo& query) {
    const auto all = [](const CList<SelectItem*>& list) {
        return std::vector<const SelectItem*>(list.begin(), list.end());
    };
    std::vector<Clause> clauses = {{"from", all(query.m_fromItems)},
                                   {"where", {}},
                                   {"group by", all(query.m_groupItems)},
                                   {"having", all(query.m_havingItems)},
                                   {"order by", all(query.m_orderItems)}};
    if (query.m_whereItem) clauses[1].items.push_back(query.m_whereItem);
    return clauses;
}

template <class Visit>
void forEachNested(const CList<SelectItem*>& items, Visit visit) {
    for (const SelectItem* root : items)
        forEachItem(*root, [&](const SelectItem& item) {
            if (const CZRQueryInfo* nested = classOf(item).query) visit(*nested);
        });
}

}  // namespace

std::string_view explain(Unknown why) {
    switch (why) {
        case Unknown::No:
            return "";
        case Unknown::Source:
            return "the project has no table or query of that name";
        case Unknown::Columns:
            return "the project does not tell the columns of the table";
        case Unknown::Column:
            return "there is no such column";
        case Unknown::Qualifier:
            return "no source of the query has that name";
        case Unknown::Ambiguous:
            return "several sources may have it";
        case Unknown::Nowhere:
            return "no source of the query has it";
        case Unknown::InRing:
            return "the query reads from itself";
        case Unknown::PartOfText:
            return "the text was not read to its end";
        case Unknown::PartOfAnalysis:
            return "a nested query stands in the first clause, and there the analysis ends";
    }
    return "";
}

ColumnTracer::ColumnTracer(CZRDatabaseInfo& database, IsReadWhole isReadWhole)
    : database_(database), isReadWhole_(std::move(isReadWhole)) {
    for (CZRTableInfo* table : database.Tables) byId_.try_emplace(table->GetID(), Meaning{table, nullptr});
    for (const CZRQueryInfo* query : database.Queries) {
        byId_.try_emplace(query->GetID(), Meaning{nullptr, query});
        stored_.insert(query);
    }
}

ColumnTracer::Meaning ColumnTracer::meaningOf(const CZRQueryInfo& query, const CString& source) {
    // The analysis has looked up nearly all of them; the lists are long to search.
    if (const CString* id = query.m_sourceTables.Find(source))
        if (const auto found = byId_.find(*id); found != byId_.end()) return found->second;
    const auto [place, isNew] = byName_.try_emplace(source);
    if (isNew) {
        place->second.table = database_.FindTableBySrcName(source);
        if (!place->second.table) place->second.query = database_.FindQueryBySrcName(source);
    }
    return place->second;
}

const ColumnTracer::Sources& ColumnTracer::sourcesOf(const CZRQueryInfo& query) {
    const auto [place, isNew] = sources_.try_emplace(&query);
    if (!isNew) return place->second;
    for (const FromSource& from : fromSources(query)) {
        Source source;
        source.alias = from.alias;
        source.query = from.query;
        if (from.table) {
            source.name = from.table->m_sourceTable;
            const Meaning meaning = meaningOf(query, source.name);
            source.table = meaning.table;
            source.query = meaning.query;
            source.isStored = meaning.query != nullptr;
        }
        if (from.isBehindJoin && source.isOpen() && isAliasOfLast(place->second)) {
            place->second.back().alias = source.name;
            continue;
        }
        place->second.push_back(std::move(source));
    }
    return place->second;
}

// Whether a name behind a join that is nothing in the database is meant as the name of the source before it.
bool ColumnTracer::isAliasOfLast(const Sources& sources) const {
    return database_.GetDBType() == DB_MYSQL && !sources.empty() && sources.back().alias.IsEmpty() &&
           !sources.back().name.IsEmpty();
}

std::vector<const CZRQueryInfo*> ColumnTracer::adopt(const CZRQueryInfo& query) {
    std::vector<const CZRQueryInfo*> all{&query};
    for (std::size_t at = 0; at < all.size(); ++at) {
        const CZRQueryInfo& outer = *all[at];
        const auto takeAll = [&](const CList<SelectItem*>& items, const CZRQueryInfo* around) {
            forEachNested(items, [&](const CZRQueryInfo& nested) {
                around_.try_emplace(&nested, around);
                all.push_back(&nested);
            });
        };
        for (const auto* items : {&outer.m_selectItems, &outer.m_fromItems, &outer.m_groupItems,
                                  &outer.m_havingItems, &outer.m_orderItems})
            takeAll(*items, &outer);
        if (outer.m_whereItem) takeAll(outer.m_whereItem->m_items, &outer);
        // A branch stands beside the query that it continues.
        takeAll(outer.m_unionItems, queryAround(outer));
    }
    return all;
}

// From the last to the first in the order in which they see each other's columns.
std::vector<const CZRQueryInfo*> ColumnTracer::queriesBehind(const CZRQueryInfo& query) {
    std::vector<const CZRQueryInfo*> behind;
    for (const Source& source : sourcesOf(query))
        if (source.query) behind.push_back(source.query);
    for (const CList<SelectItem*>* items : {&query.m_selectItems, &query.m_unionItems})
        forEachNested(*items, [&](const CZRQueryInfo& nested) { behind.push_back(&nested); });
    std::reverse(behind.begin(), behind.end());
    return behind;
}

const ColumnTracer::Columns* ColumnTracer::tracedColumns(const CZRQueryInfo& query) const {
    const auto found = traced_.find(&query);
    return found == traced_.end() ? nullptr : &found->second;
}

const ColumnTracer::Columns& ColumnTracer::columnsOf(const CZRQueryInfo& query) {
    // What a query reads from is traced first. A query that is met again before it is traced reads from
    // itself and has no columns there.
    std::vector<const CZRQueryInfo*> waiting{&query};
    std::unordered_set<const CZRQueryInfo*> met;
    while (!waiting.empty()) {
        const CZRQueryInfo* next = waiting.back();
        if (traced_.contains(next)) {
            waiting.pop_back();
        } else if (met.insert(next).second) {
            if (!around_.contains(next)) adopt(*next);
            for (const CZRQueryInfo* behind : queriesBehind(*next))
                if (!traced_.contains(behind) && !met.contains(behind)) waiting.push_back(behind);
        } else {
            waiting.pop_back();
            Columns columns = trace(*next);
            traced_.emplace(next, std::move(columns));
        }
    }
    return traced_.at(&query);
}

ColumnTracer::Columns ColumnTracer::trace(const CZRQueryInfo& query) {
    const Sources& sources = sourcesOf(query);
    Columns columns;
    if (query.m_selectItems.IsEmpty() && query.m_predicate == kStarPredicate)
        addStar(columns, sources, CString());
    for (const SelectItem* item : query.m_selectItems) {
        if (const CString* qualifier = starQualifier(*item))
            addStar(columns, sources, *qualifier);
        else
            columns.push_back(columnOf(*item, query));
    }
    addBranches(columns, query);
    markPart(columns, query);
    return columns;
}

void ColumnTracer::addStar(Columns& columns, const Sources& sources, const CString& qualifier) {
    bool isFound = false;
    for (const Source& source : sources) {
        if (!qualifier.IsEmpty() && !source.alias.EqualsNoCase(qualifier) &&
            !source.name.EqualsNoCase(qualifier))
            continue;
        addStarOf(columns, source);
        isFound = true;
    }
    if (isFound) return;
    const Unknown why = qualifier.IsEmpty() ? Unknown::Nowhere : Unknown::Qualifier;
    const ColumnOrigins origins{{qualifier, kStar, why}};
    columns.push_back({kStar, nullptr, origins, origins});
}

void ColumnTracer::addStarOf(Columns& columns, const Source& source) {
    const auto add = [&](const CString& name, Origins origins) {
        columns.push_back({name, nullptr, std::move(origins.ends), std::move(origins.steps)});
    };
    const Columns* const known = source.query ? tracedColumns(*source.query) : nullptr;
    if (source.table && !source.table->Fields.IsEmpty()) {
        for (const CZRFieldInfo* field : source.table->Fields)
            add(field->GetName(), originsIn(source, field->GetSrcName()));
    } else if (known && !known->empty()) {
        for (const ResultColumn& column : *known) {
            ColumnOrigins steps = column.steps;
            if (source.isStored) steps = {{source.query->GetName(), column.name, Unknown::No, source.query}};
            add(column.name, {column.origins, steps});
        }
    } else {
        add(kStar, originsIn(source, kStar));
    }
}

// A union's columns come from each of its branches, place by place.
void ColumnTracer::addBranches(Columns& columns, const CZRQueryInfo& query) {
    for (const SelectItem* item : query.m_unionItems) {
        const CZRQueryInfo* branch = classOf(*item).query;
        const Columns* const others = branch ? tracedColumns(*branch) : nullptr;
        if (!others) continue;
        for (std::size_t place = 0; place < columns.size() && place < others->size(); ++place) {
            addNew(columns[place].origins, (*others)[place].origins);
            addNew(columns[place].steps, (*others)[place].steps);
        }
    }
}

void ColumnTracer::markPart(Columns& columns, const CZRQueryInfo& query) {
    if (missingOf(query) != Unknown::PartOfText) return;
    const ColumnOrigins part{{query.GetName(), CString(), Unknown::PartOfText, &query}};
    for (ResultColumn& column : columns) {
        addNew(column.origins, part);
        addNew(column.steps, part);
    }
}

Unknown ColumnTracer::missingOf(const CZRQueryInfo& query) const {
    if (endsInFirstClause(query)) return Unknown::PartOfAnalysis;
    const bool isPart = isReadWhole_ && stored_.contains(&query) && !isReadWhole_(query);
    return isPart ? Unknown::PartOfText : Unknown::No;
}

ResultColumn ColumnTracer::columnOf(const SelectItem& item, const CZRQueryInfo& query) {
    const bool isNamed = isAlias(item);
    ResultColumn column{
        isNamed ? nameOf(item) : withoutCast(nameOf(item)), isNamed ? item.m_items.GetHead() : &item, {}, {}};
    Origins origins;
    addOriginsIn(origins, *column.expression, query);
    column.origins = std::move(origins.ends);
    column.steps = std::move(origins.steps);
    return column;
}

void ColumnTracer::addOriginsIn(Origins& origins, const SelectItem& expression, const CZRQueryInfo& query) {
    forEachItem(expression, [&](const SelectItem& part) {
        const ItemClass itemClass = classOf(part);
        // A reference to an alias has what it stands for below it.
        if (itemClass.field && part.m_kind != SIK_FIELD_LIKE && !itemClass.field->m_sourceField.IsEmpty()) {
            const Origins found = originsOf(*itemClass.field, query);
            addNew(origins.ends, found.ends);
            addNew(origins.steps, found.steps);
        } else if (itemClass.field && isBareAlias(*itemClass.field, query)) {
            // SQL knows no aliases within a select list: the name is a column's.
            const Origins found = unqualified(itemClass.field->m_text, query);
            addNew(origins.ends, found.ends);
            addNew(origins.steps, found.steps);
        }
        const Columns* const nested = itemClass.query ? tracedColumns(*itemClass.query) : nullptr;
        if (!nested) return;
        for (const ResultColumn& column : *nested) {
            addNew(origins.ends, column.origins);
            addNew(origins.steps, column.steps);
        }
    });
}

std::vector<ColumnUse> ColumnTracer::usesOf(const CZRQueryInfo& query) {
    columnsOf(query);
    std::vector<ColumnUse> uses;
    const auto add = [&](std::string_view clause, Origins origins) {
        if (origins.steps.empty()) return;
        const auto isSame = [&](const ColumnUse& use) {
            return use.clause == clause && use.steps == origins.steps;
        };
        if (std::none_of(uses.begin(), uses.end(), isSame))
            uses.push_back({clause, std::move(origins.ends), std::move(origins.steps)});
    };
    const auto addFields = [&](std::string_view name, const SelectItem& root, const CZRQueryInfo& reader) {
        const Columns& results = columnsOf(reader);
        forEachItem(root, [&](const SelectItem& part) {
            const SelectItemField* const field = classOf(part).field;
            if (!field) return;
            // Rows are ordered by result columns, where one has the name.
            if (name == "order by" && field->m_sourceTable.IsEmpty() && field->m_tableAlias.IsEmpty()) {
                for (const ResultColumn& column : results)
                    if (column.name.EqualsNoCase(withoutCast(nameOf(*field))))
                        return add(name, {column.origins, column.steps});
            }
            if (isBareAlias(*field, reader)) {
                Origins column = unqualified(field->m_text, reader);
                if (isAllKnown(column.ends)) return add(name, std::move(column));
                for (const ResultColumn& result : results)
                    if (result.name.EqualsNoCase(field->m_text))
                        return add(name, {result.origins, result.steps});
            }
            if (part.m_kind == SIK_FIELD_LIKE || field->m_sourceField.IsEmpty() ||
                field->m_sourceField == kStar)
                return;
            add(name, originsOf(*field, reader));
        });
    };
    for (const CZRQueryInfo* reader : adopt(query)) {
        // A sub-query of a condition is not behind any column, so it is traced only now.
        for (const ResultColumn& column : columnsOf(*reader))
            if (reader != &query) add("sub-query", {column.origins, column.steps});
        for (const Clause& clause : clausesBesideSelect(*reader))
            for (const SelectItem* item : clause.items) addFields(clause.name, *item, *reader);
    }
    return uses;
}

std::vector<const CZRSourceInfo*> ColumnTracer::objectsReadBy(const CZRQueryInfo& query) {
    std::vector<const CZRSourceInfo*> objects;
    for (const CZRQueryInfo* reader : adopt(query))
        for (const Source& source : sourcesOf(*reader)) {
            const CZRSourceInfo* object = source.table;
            if (source.isStored) object = source.query;
            if (object && std::find(objects.begin(), objects.end(), object) == objects.end())
                objects.push_back(object);
        }
    return objects;
}

ColumnTracer::Origins ColumnTracer::originsOf(const SelectItemField& field, const CZRQueryInfo& query) {
    const CString& qualifier = field.m_tableAlias.IsEmpty() ? field.m_sourceTable : field.m_tableAlias;
    const auto named = [&](const CString& name) {
        return qualifier.IsEmpty() ? unqualified(name, query) : qualified(qualifier, name, query);
    };
    Origins origins = named(field.m_sourceField);
    const CString name = withoutCast(field.m_sourceField);
    if (!isAllKnown(origins.ends) && name != field.m_sourceField) return named(name);
    return origins;
}

// PostgreSQL's grammar leaves a mark of a cast in the column's name: o.id::text is the column "idCAST".
CString ColumnTracer::withoutCast(const CString& name) const {
    const std::u16string_view text = name.View();
    const bool hasMark =
        database_.GetDBType() == DB_POSTGRESQL && text.size() > kCastMark.size() && text.ends_with(kCastMark);
    return hasMark ? CString(text.substr(0, text.size() - kCastMark.size())) : name;
}

ColumnTracer::Origins ColumnTracer::qualified(const CString& qualifier, const CString& column,
                                              const CZRQueryInfo& query) {
    for (const CZRQueryInfo* scope = &query; scope; scope = queryAround(*scope)) {
        const Source* found = nullptr;
        for (const Source& source : sourcesOf(*scope)) {
            // A table that has an alias is known by that alone, where another one has its name.
            if (source.alias.EqualsNoCase(qualifier)) {
                found = &source;
                break;
            }
            if (!found && source.name.EqualsNoCase(qualifier)) found = &source;
        }
        if (found) return originsIn(*found, column);
    }
    const ColumnOrigins none{{qualifier, column, Unknown::Qualifier}};
    return {none, none};
}

ColumnTracer::Origins ColumnTracer::unqualified(const CString& column, const CZRQueryInfo& query) {
    const auto unknown = [&](Unknown why) -> Origins {
        return {{{CString(), column, why}}, {{CString(), column, why}}};
    };
    for (const CZRQueryInfo* scope = &query; scope; scope = queryAround(*scope)) {
        std::vector<const Source*> having;
        std::vector<const Source*> open;
        for (const Source& source : sourcesOf(*scope)) {
            if (hasColumn(source, column)) having.push_back(&source);
            if (source.isOpen()) open.push_back(&source);
        }
        // SQL allows the column no second source; so what is open doesn't have it.
        if (having.size() == 1) return originsIn(*having.front(), column);
        if (having.size() > 1) return unknown(Unknown::Ambiguous);
        if (open.size() == 1) return originsIn(*open.front(), column);
        if (open.size() > 1) return unknown(Unknown::Ambiguous);
    }
    const Sources& own = sourcesOf(query);
    return own.size() == 1 ? originsIn(own.front(), column) : unknown(Unknown::Nowhere);
}

ColumnTracer::Origins ColumnTracer::originsIn(const Source& source, const CString& column) {
    if (source.table) {
        const CZRSourceFildInfo* field = source.table->FindFieldBySrcName(column);
        const Unknown why = field                            ? Unknown::No
                            : source.table->Fields.IsEmpty() ? Unknown::Columns
                                                             : Unknown::Column;
        const ColumnOrigins one{
            {source.table->GetName(), field ? field->GetName() : column, why, source.table}};
        return {one, one};
    }
    CString name = source.isStored ? source.query->GetName() : source.name;
    if (name.IsEmpty()) name = source.alias;
    Unknown why = Unknown::Source;
    if (source.query) {
        if (const ResultColumn* found = findColumn(*source.query, column)) {
            if (!source.isStored) return {found->origins, found->steps};
            return {found->origins, {{name, found->name, Unknown::No, source.query}}};
        }
        why = tracedColumns(*source.query) ? missingOf(*source.query) : Unknown::InRing;
        if (why == Unknown::No) why = Unknown::Column;
    }
    const ColumnOrigins one{{name, column, why, source.isStored ? source.query : nullptr}};
    return {one, one};
}

const CZRQueryInfo* ColumnTracer::queryAround(const CZRQueryInfo& query) const {
    const auto found = around_.find(&query);
    return found == around_.end() ? nullptr : found->second;
}

const ResultColumn* ColumnTracer::findColumn(const CZRQueryInfo& query, const CString& name) const {
    const Columns* const columns = tracedColumns(query);
    if (!columns) return nullptr;
    for (const ResultColumn& column : *columns)
        if (column.name.EqualsNoCase(name)) return &column;
    return nullptr;
}

bool ColumnTracer::hasColumn(const Source& source, const CString& name) const {
    if (source.table) return source.table->FindFieldBySrcName(name) != nullptr;
    return source.query && findColumn(*source.query, name);
}

}  // namespace zr::host
