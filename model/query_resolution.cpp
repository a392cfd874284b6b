#include <vector>

#include "model/select_list_search.h"
#include "model/source_search.h"
#include "zrparsersql/database_info.h"
#include "zrparsersql/query_info.h"

namespace {

// Fills the resolved members of one column after another. The sources that it has looked up stay known from
// one to the next; everything else is looked up anew, since resolving changes the marks that look-ups go by.
class ItemResolver {
 public:
    explicit ItemResolver(CZRQueryInfo& query) : query_(query) {}

    // The item and everything below it, in order.
    void resolve(SelectItem* root) {
        std::vector<SelectItem*> waiting{root};
        while (!waiting.empty()) {
            SelectItem* item = waiting.back();
            waiting.pop_back();
            if (!item) continue;
            if (auto* field = dynamic_cast<SelectItemField*>(item)) {
                if (field->m_kind == SIK_FIELD_LIKE)
                    dropExpression(*field);
                else if (field->m_kind == SIK_FIELD)
                    resolveField(*field);
            }
            if (item->m_items.IsEmpty()) continue;
            query_.Resolved = 0;
            for (auto child = item->m_items.end(); child != item->m_items.begin();)
                waiting.push_back(*--child);
        }
    }

    void resolveAll(const CList<SelectItem*>& items) {
        if (items.IsEmpty()) return;
        query_.Resolved = 0;
        for (SelectItem* item : items) resolve(item);
    }

 private:
    // A qualified name that is a column of the query after all does not stand for an alias's expression.
    void dropExpression(SelectItemField& item) {
        if (item.m_items.IsEmpty() || item.m_tableAlias.IsEmpty() || !isKnownField(item.m_sourceField))
            return;
        CList<SelectItem*> items = std::move(item.m_items);
        item.m_items.RemoveAll();
        SelectItem* first = items.GetHead();
        items.RemoveAt(items.GetHeadPosition());
        delete first;
        // The others leave the tree without being deleted; hosts rely on it.
        query_.RetireItems(items);
    }

    bool isKnownField(const CString& name) const {
        for (const auto& entry : query_.m_fields)
            if (entry.value && entry.value->m_field.EqualsNoCase(name)) return true;
        return false;
    }

    bool isSelectAlias(const CString& name) const {
        for (const auto& entry : query_.m_aliases)
            if (entry.value && entry.value->GetSrcName().EqualsNoCase(name)) return true;
        return false;
    }

    void resolveField(SelectItemField& item) {
        if (item.m_sourceTable.IsEmpty()) {
            if (!item.m_sourceField.IsEmpty()) resolveColumn(item);
        } else if (item.m_sourceField.IsEmpty()) {
            resolveTable(item);
        } else if (item.m_sourceField == u"*") {
            if (const zr::Source source = sources_.byName(query_, item.m_sourceTable))
                item.m_tableName = source.source->GetName();
            else
                query_.SetCorrect(1);
            item.m_text = u"*";
        } else if (!resolveThroughQuery(item)) {
            resolveQualified(item);
        }
    }

    // The column of a query is found in that query's select list.
    bool resolveThroughQuery(SelectItemField& item) {
        const zr::Source source = sources_.byName(query_, item.m_sourceTable);
        if (!source.query) return false;
        const SelectItemField* found = zr::SelectListSearch(sources_, item, true, false)
                                           .find(*source.query, source.query->m_selectItems);
        if (!found) return false;
        setResolved(item, *source.source, found->m_sourceField);
        return true;
    }

    void resolveQualified(SelectItemField& item) {
        const zr::Source source = sources_.byName(query_, item.m_sourceTable);
        if (source) source.source->Resolved = 0;
        CZRSourceFildInfo* hit =
            zr::SourceSearch(sources_).findField(query_, item.m_sourceTable, item.m_sourceField);
        if (!hit) {
            CZRQueryInfo* found = nullptr;
            if (!zr::SourceSearch(sources_).findInSubQueries(query_, item.m_sourceTable, item.m_sourceField,
                                                             found))
                query_.SetCorrect(1);
            return;
        }
        if (hit->Computed) item.m_computed = 1;
        setResolved(item, *source.source, hit->GetName());
    }

    void setResolved(SelectItemField& item, CZRSourceInfo& source, const CString& column) {
        item.m_fieldName = column;
        item.m_tableName = source.GetName();
        setSchema(item);
        source.Resolved = 1;
    }

    void setSchema(SelectItemField& item) {
        if (query_.m_database) item.m_resolvedSchema = query_.m_database->SchemaName;
    }

    void resolveTable(SelectItemField& item) {
        const zr::Source source = sources_.byName(query_, item.m_sourceTable);
        if (!source) {
            query_.SetCorrect(1);
            return;
        }
        item.m_tableName = source.source->GetName();
        setSchema(item);
    }

    void resolveColumn(SelectItemField& item) {
        const CZRSourceFildInfo* hit =
            zr::SourceSearch(sources_).findField(query_, CString(), item.m_sourceField);
        if (hit && hit->Computed) item.m_computed = 1;
        if (const SelectItemField* found = inQueriesOfFrom(item)) {
            item.m_tableName = found->m_tableName.IsEmpty() ? found->m_sourceTable : found->m_tableName;
            item.m_fieldName = found->m_fieldName.IsEmpty() ? found->m_sourceField : found->m_fieldName;
        } else {
            item.m_tableName = item.m_sourceTable;
            item.m_fieldName = item.m_sourceField;
        }
    }

    const SelectItemField* inQueriesOfFrom(const SelectItemField& item) {
        // SQL Server looks a bare column up by itself. 9 is a kind that hosts hold and nothing here knows.
        constexpr int kHostKind = 9;
        const int kind = query_.GetDBType();
        if (item.m_sourceField == u"*" || isSelectAlias(item.m_sourceField) || kind == DB_MSSQL ||
            kind == kHostKind)
            return nullptr;
        for (const auto& entry : query_.m_sourceTables) {
            const CZRQueryInfo* source = sources_.byId(query_, entry.value).query;
            if (!source) continue;
            if (const SelectItemField* found =
                    zr::SelectListSearch(sources_, item, true, false).find(*source, source->m_selectItems))
                return found;
        }
        return nullptr;
    }

    CZRQueryInfo& query_;
    zr::SourceCache sources_;
};

}  // namespace

void CZRQueryInfo::ResolveItem(SelectItem* item) {
    ItemResolver(*this).resolve(item);
}

void CZRQueryInfo::ResolveItems(CList<SelectItem*>& items) {
    ItemResolver(*this).resolveAll(items);
}

void CZRQueryInfo::ResolveAllItems() {
    // One resolver for all, so that the sources are looked up once.
    ItemResolver resolver(*this);
    resolver.resolveAll(m_selectItems);
    resolver.resolveAll(m_fromItems);
    resolver.resolveAll(m_orderItems);
    if (m_whereItem) resolver.resolveAll(m_whereItem->m_items);
    resolver.resolveAll(m_groupItems);
    resolver.resolveAll(m_havingItems);
    resolver.resolveAll(m_unionItems);
}

CString CZRQueryInfo::MatchSelectList(const CList<SelectItem*>& items, const SelectItemField& wanted,
                                      SelectItem*& found, int flag, int mode) {
    zr::SourceCache sources;
    SelectItemField* hit = zr::SelectListSearch(sources, wanted, flag != 0, mode != 0).find(*this, items);
    if (!hit) return CString();
    found = hit;
    return hit->m_sourceField;
}
