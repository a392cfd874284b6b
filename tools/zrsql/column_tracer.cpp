#include "column_tracer.h"

#include <algorithm>

#include "descriptor_access.h"
#include "expression_text.h"

namespace zr::tool {

namespace {

constexpr const char16_t* kStar = u"*";
constexpr int kStarPredicate = 5;  // PostgreSQL's select list of nothing but "*"

void addNew(std::vector<ColumnOrigin>& to, const std::vector<ColumnOrigin>& origins) {
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

}  // namespace

ColumnTracer::ColumnTracer(CZRDatabaseInfo& database) : database_(database) {
    for (CZRTableInfo* table : database.Tables) byId_.try_emplace(table->GetID(), Meaning{table, nullptr});
    for (const CZRQueryInfo* query : database.Queries)
        byId_.try_emplace(query->GetID(), Meaning{nullptr, query});
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

ColumnTracer::Sources ColumnTracer::sourcesOf(const CZRQueryInfo& query) {
    Sources sources;
    for (const FromSource& from : fromSources(query)) {
        Source source;
        source.alias = from.alias;
        source.query = from.query;
        if (from.table) {
            source.name = from.table->m_sourceTable;
            const Meaning meaning = meaningOf(query, source.name);
            source.table = meaning.table;
            source.query = meaning.query;
        }
        sources.push_back(std::move(source));
    }
    return sources;
}

std::vector<const CZRQueryInfo*> ColumnTracer::queriesBehind(const CZRQueryInfo& query) {
    std::vector<const CZRQueryInfo*> behind;
    for (const Source& source : sourcesOf(query))
        if (source.query) behind.push_back(source.query);
    for (const CList<SelectItem*>* items : {&query.m_selectItems, &query.m_unionItems})
        for (const SelectItem* root : *items)
            forEachItem(*root, [&](const SelectItem& item) {
                if (const CZRQueryInfo* nested = classOf(item).query) behind.push_back(nested);
            });
    return behind;
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
            for (const CZRQueryInfo* behind : queriesBehind(*next))
                if (!traced_.contains(behind) && !met.contains(behind)) waiting.push_back(behind);
        } else {
            waiting.pop_back();
            Columns columns = trace(*next);
            traced_.emplace(next, std::move(columns));
        }
    }
    return traced_[&query];
}

ColumnTracer::Columns ColumnTracer::trace(const CZRQueryInfo& query) {
    const Sources sources = sourcesOf(query);
    Columns columns;
    if (query.m_selectItems.IsEmpty() && query.m_predicate == kStarPredicate)
        addStar(columns, sources, CString());
    for (const SelectItem* item : query.m_selectItems) {
        if (const CString* qualifier = starQualifier(*item))
            addStar(columns, sources, *qualifier);
        else
            columns.push_back(columnOf(*item, sources));
    }
    addBranches(columns, query);
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
    if (!isFound) columns.push_back({kStar, nullptr, {{qualifier, kStar}}});
}

void ColumnTracer::addStarOf(Columns& columns, const Source& source) {
    if (source.table) {
        for (const CZRFieldInfo* field : source.table->Fields)
            columns.push_back({field->GetName(), nullptr, originsIn(source, field->GetSrcName())});
    } else if (source.query) {
        for (const ResultColumn& column : traced_[source.query])
            columns.push_back({column.name, nullptr, column.origins});
    } else {
        columns.push_back({kStar, nullptr, {{source.name, kStar}}});
    }
}

// A union's columns come from each of its branches, place by place.
void ColumnTracer::addBranches(Columns& columns, const CZRQueryInfo& query) {
    for (const SelectItem* item : query.m_unionItems) {
        const CZRQueryInfo* branch = classOf(*item).query;
        if (!branch) continue;
        const Columns& others = traced_[branch];
        for (std::size_t place = 0; place < columns.size() && place < others.size(); ++place)
            addNew(columns[place].origins, others[place].origins);
    }
}

ResultColumn ColumnTracer::columnOf(const SelectItem& item, const Sources& sources) {
    ResultColumn column{nameOf(item), isAlias(item) ? item.m_items.GetHead() : &item, {}};
    forEachItem(*column.expression, [&](const SelectItem& part) {
        const ItemClass itemClass = classOf(part);
        // A reference to an alias has what it stands for below it.
        if (itemClass.field && part.m_kind != SIK_FIELD_LIKE && !itemClass.field->m_sourceField.IsEmpty())
            addNew(column.origins, originsOf(*itemClass.field, sources));
        if (itemClass.query)
            for (const ResultColumn& nested : traced_[itemClass.query])
                addNew(column.origins, nested.origins);
    });
    return column;
}

std::vector<ColumnOrigin> ColumnTracer::originsOf(const SelectItemField& field, const Sources& sources) {
    const CString& qualifier = field.m_tableAlias.IsEmpty() ? field.m_sourceTable : field.m_tableAlias;
    const Source* found = nullptr;
    if (!qualifier.IsEmpty()) {
        for (const Source& source : sources) {
            // A table that has an alias is known by that alone, where another one has its name.
            if (source.alias.EqualsNoCase(qualifier)) {
                found = &source;
                break;
            }
            if (!found && source.name.EqualsNoCase(qualifier)) found = &source;
        }
    } else if (sources.size() == 1) {
        found = &sources.front();
    } else {
        for (const Source& source : sources) {
            if (!hasColumn(source, field.m_sourceField)) continue;
            if (found) return {{CString(), field.m_sourceField}};
            found = &source;
        }
    }
    if (!found) return {{qualifier, field.m_sourceField}};
    return originsIn(*found, field.m_sourceField);
}

std::vector<ColumnOrigin> ColumnTracer::originsIn(const Source& source, const CString& column) {
    if (source.table) {
        const CZRSourceFildInfo* field = source.table->FindFieldBySrcName(column);
        return {{source.table->GetName(), field ? field->GetName() : column, field != nullptr}};
    }
    if (source.query)
        if (const ResultColumn* found = findColumn(*source.query, column)) return found->origins;
    return {{source.name.IsEmpty() ? source.alias : source.name, column}};
}

const ResultColumn* ColumnTracer::findColumn(const CZRQueryInfo& query, const CString& name) {
    for (const ResultColumn& column : traced_[&query])
        if (column.name.EqualsNoCase(name)) return &column;
    return nullptr;
}

bool ColumnTracer::hasColumn(const Source& source, const CString& name) {
    if (source.table) return source.table->FindFieldBySrcName(name) != nullptr;
    return source.query && findColumn(*source.query, name);
}

}  // namespace zr::tool
