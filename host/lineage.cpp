#include "host/lineage.h"

#include <algorithm>
#include <map>
#include <set>

namespace zr::host {

namespace {

// A column of an object; the name in lower case. An empty one is none in particular: the object as a whole.
using Place = std::pair<const CZRSourceInfo*, CString>;

Place placeOf(const CZRSourceInfo* object, CString column) {
    column.MakeLower();
    return {object, std::move(column)};
}

bool holds(const CString& text, CString name) {
    name.MakeLower();
    return text.View().find(name.View()) != std::u16string_view::npos;
}

bool has(const std::optional<CString>& wanted, const CString& column) {
    return !wanted || wanted->EqualsNoCase(column);
}

std::vector<DependentKey> keysOn(const LineageTarget& target, const CZRTableInfo& table) {
    std::vector<DependentKey> keys;
    const bool isOwn = &table == target.object;
    if (isOwn) {
        for (const CZRIndexInfo* index : table.Indexes)
            if (std::any_of(index->Columns.begin(), index->Columns.end(), [&](const CZRIndexColumn* column) {
                    return has(target.column, column->GetColumnID());
                }))
                keys.push_back({&table, index, false});
    }
    for (const CZRForeignKeyInfo* each : table.ForeignKeys) {
        const auto* key = dynamic_cast<const ForeignKey*>(each);
        if (!key) continue;
        const bool refersToIt = target.object->GetSrcName().EqualsNoCase(key->ReferencedTable);
        if (std::any_of(key->Columns.begin(), key->Columns.end(), [&](const ForeignKey::ColumnPair& pair) {
                return (isOwn && has(target.column, pair.column)) ||
                       (refersToIt && has(target.column, pair.referenced));
            }))
            keys.push_back({&table, key, true});
    }
    return keys;
}

bool hasName(const CZRObjectInfo& object, const CString& name) {
    return object.GetSrcName().EqualsNoCase(name);
}

}  // namespace

// Goes from the target to what reads it, a query's distance after the other.
struct Lineage::Walk {
    Walk(Lineage& lineage, const LineageTarget& wanted) : owner(lineage), target(wanted) {}

    // Whether a column is read that depends on the target.
    bool depends(const ColumnOrigin& step) const {
        if (!step.object) return false;
        if (!target.column && step.object == target.object) return true;
        return places.contains(placeOf(step.object, step.column));
    }

    // What is new of a query, now that all of `places` depends on the target.
    bool look(const CZRQueryInfo& query, std::size_t distance) {
        DependentQuery found;
        found.query = &query;
        found.distance = distance;
        for (const ResultColumn& column : owner.tracer_.columnsOf(query))
            if (std::any_of(column.steps.begin(), column.steps.end(),
                            [&](const ColumnOrigin& step) { return depends(step); }))
                found.columns.push_back(column.name);
        for (const ColumnUse& use : uses(query))
            for (const ColumnOrigin& step : use.steps)
                if (depends(step)) found.uses.push_back({use.clause, step});
        for (const CZRSourceInfo* object : objects(query)) {
            const bool isTarget = object == target.object && !target.column;
            if (isTarget || queries.contains(object)) found.reads.push_back(object);
        }
        if (found.columns.empty() && found.uses.empty() && found.reads.empty()) return false;
        DependentQuery& kept = queries[&query];
        if (kept.query) found.distance = kept.distance;
        const bool isNew = !kept.query || kept.columns.size() != found.columns.size() ||
                           kept.uses.size() != found.uses.size() || kept.reads.size() != found.reads.size();
        for (const CString& column : found.columns) places.insert(placeOf(&query, column));
        kept = std::move(found);
        return isNew;
    }

    const std::vector<ColumnUse>& uses(const CZRQueryInfo& query) {
        const auto [place, isNew] = uses_.try_emplace(&query);
        if (isNew) place->second = owner.tracer_.usesOf(query);
        return place->second;
    }

    const std::vector<const CZRSourceInfo*>& objects(const CZRQueryInfo& query) {
        const auto [place, isNew] = objects_.try_emplace(&query);
        if (isNew) place->second = owner.tracer_.objectsReadBy(query);
        return place->second;
    }

    // What keeps a query that was not found to depend on the target from being free of it.
    std::optional<ColumnOrigin> doubtAbout(const CZRQueryInfo& query) {
        if (const Unknown missing = owner.tracer_.missingOf(query); missing != Unknown::No) {
            CString text = query.m_sql;
            text.MakeLower();
            bool namesOne = holds(text, target.object->GetSrcName());
            for (const auto& [object, dependent] : queries)
                namesOne = namesOne || holds(text, object->GetSrcName());
            if (namesOne) return ColumnOrigin{query.GetName(), CString(), missing, &query};
        }
        const auto& read = objects(query);
        if (!target.column || std::find(read.begin(), read.end(), target.object) == read.end())
            return std::nullopt;
        const auto isOpen = [&](const ColumnOrigin& step) {
            return !step.isKnown() && (step.column == u"*" || step.column.EqualsNoCase(*target.column)) &&
                   (step.source.IsEmpty() || step.object == target.object);
        };
        for (const ResultColumn& column : owner.tracer_.columnsOf(query))
            for (const ColumnOrigin& step : column.steps)
                if (isOpen(step)) return step;
        for (const ColumnUse& use : uses(query))
            for (const ColumnOrigin& step : use.steps)
                if (isOpen(step)) return step;
        return std::nullopt;
    }

    Lineage& owner;
    const LineageTarget& target;
    std::set<Place> places;
    std::map<const CZRSourceInfo*, DependentQuery> queries;

 private:
    std::unordered_map<const CZRQueryInfo*, std::vector<ColumnUse>> uses_;
    std::unordered_map<const CZRQueryInfo*, std::vector<const CZRSourceInfo*>> objects_;
};

Lineage::Lineage(Database& database, ColumnTracer::IsReadWhole isReadWhole, const AnalysisProgress& progress)
    : database_(database),
      rings_(analyseQueriesInRings(database, progress)),
      tracer_(database, std::move(isReadWhole)) {}

bool Lineage::isInRing(const CZRQueryInfo& query) const {
    return std::any_of(rings_.begin(), rings_.end(), [&](const Ring& ring) {
        return std::find(ring.begin(), ring.end(), &query) != ring.end();
    });
}

bool Lineage::hasColumn(const CZRSourceInfo& object, const CString& column) {
    if (const auto* query = dynamic_cast<const CZRQueryInfo*>(&object)) {
        const auto& columns = tracer_.columnsOf(*query);
        return std::any_of(columns.begin(), columns.end(),
                           [&](const ResultColumn& each) { return each.name.EqualsNoCase(column); });
    }
    const auto& fields = dynamic_cast<const CZRTableInfo&>(object).Fields;
    return std::any_of(fields.begin(), fields.end(),
                       [&](const CZRFieldInfo* field) { return hasName(*field, column); });
}

std::optional<LineageTarget> Lineage::find(const CString& name) {
    const auto objectOf = [&](const CString& wanted) -> const CZRSourceInfo* {
        if (const CZRTableInfo* table = database_.FindTableBySrcName(wanted)) return table;
        return database_.FindQueryBySrcName(wanted);
    };
    if (const CZRSourceInfo* whole = objectOf(name)) return LineageTarget{whole, std::nullopt};
    const std::u16string_view text = name.View();
    for (std::size_t dot = text.rfind(u'.'); dot != text.npos && dot > 0; dot = text.rfind(u'.', dot - 1)) {
        const CZRSourceInfo* object = objectOf(CString(text.substr(0, dot)));
        const CString column(text.substr(dot + 1));
        if (object && hasColumn(*object, column)) return LineageTarget{object, column};
    }
    return std::nullopt;
}

Impact Lineage::impactOf(const LineageTarget& target) {
    Walk walk(*this, target);
    if (target.column) walk.places.insert(placeOf(target.object, *target.column));

    // Who reads what, so that each round looks only at readers of what the round before has found.
    std::unordered_map<const CZRSourceInfo*, std::vector<const CZRQueryInfo*>> readers;
    for (const CZRQueryInfo* query : database_.Queries)
        for (const CZRSourceInfo* object : walk.objects(*query)) readers[object].push_back(query);
    std::vector<const CZRSourceInfo*> found{target.object};
    for (std::size_t distance = 1; !found.empty(); ++distance) {
        std::vector<const CZRSourceInfo*> next;
        for (const CZRSourceInfo* object : found)
            for (const CZRQueryInfo* query : readers[object])
                if (walk.look(*query, distance)) next.push_back(query);
        found = std::move(next);
    }

    Impact impact;
    for (const CZRQueryInfo* query : database_.Queries) {
        const auto place = walk.queries.find(query);
        if (place != walk.queries.end())
            impact.queries.push_back(place->second);
        else if (const auto doubt = walk.doubtAbout(*query); doubt && query != target.object)
            impact.uncertain.push_back({query, *doubt});
    }
    std::stable_sort(
        impact.queries.begin(), impact.queries.end(),
        [](const DependentQuery& a, const DependentQuery& b) { return a.distance < b.distance; });
    if (dynamic_cast<const CZRTableInfo*>(target.object))
        for (const CZRTableInfo* table : database_.Tables)
            for (const DependentKey& key : keysOn(target, *table)) impact.keys.push_back(key);
    return impact;
}

}  // namespace zr::host
