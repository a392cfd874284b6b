#include "tests/analysis/plain_descriptor.h"

#include <set>
#include <string_view>

namespace {

// A text without an ending.
CString without(const CString& text, std::u16string_view ending) {
    CString result = text;
    if (result.View().ends_with(ending))
        result.Delete(result.GetLength() - static_cast<int>(ending.size()), static_cast<int>(ending.size()));
    return result;
}

class Writer {
 public:
    explicit Writer(const Differences& differences) : differences_(differences) {}

    void query(const CZRQueryInfo& query, std::size_t depth) {
        fact(depth, "predicate", std::to_string(query.m_predicate));
        if (query.m_hasLimit)
            fact(depth, "limit",
                 std::to_string(query.m_limitOffset) + ' ' + std::to_string(query.m_limitCount));
        for (const CString& key : keys(query.m_aliases)) {
            const CZRAliasInfo& alias = **query.m_aliases.Find(key);
            if (differences_.aliasesAreKept) {
                fact(depth, "alias",
                     without(without(key, u"_TABLE"), u"_FIELD").toUtf8() + " name=" +
                         alias.GetName().toUtf8() + " source=" + alias.GetSrcName().toUtf8() + " of=.");
                continue;
            }
            fact(depth, "alias",
                 key.toUtf8() + " name=" + alias.GetName().toUtf8() +
                     " source=" + alias.GetSrcName().toUtf8() + " of=" + alias.AliasTable.toUtf8() + '.' +
                     alias.AliasField.toUtf8());
        }
        for (const CString& key : keys(query.m_sourceTables))
            fact(depth, "table", key.toUtf8() + '=' + query.m_sourceTables.Find(key)->toUtf8());
        for (const CString& key : keys(query.m_fields)) {
            const CFieldObject& field = **query.m_fields.Find(key);
            if (differences_.aliasesAreKept && isOfAnAlias(query, field)) continue;
            fact(depth, "field",
                 field.m_table.toUtf8() + '|' + field.m_field.toUtf8() + (field.m_hasTable ? " table" : ""));
        }
        items(depth, "select", query.m_selectItems);
        items(depth, "from", query.m_fromItems);
        if (query.m_whereItem) items(depth, "where", query.m_whereItem->m_items);
        items(depth, "group", query.m_groupItems);
        items(depth, "having", query.m_havingItems);
        items(depth, "order", query.m_orderItems);
        items(depth, "union", query.m_unionItems);
        for (const CZRQueryInfo* nested : query.m_subQueries) {
            fact(depth, "nested", "");
            this->query(*nested, depth + 1);
        }
    }
    std::string text;

 private:
    void fact(std::size_t depth, std::string_view name, const std::string& value) {
        text.append(2 * depth, ' ').append(name).append(" ").append(value).append("\n");
    }

    // The entry of a column under the table that its qualifier stands for. The entry without a table stands
    // beside it.
    static bool isOfAnAlias(const CZRQueryInfo& query, const CFieldObject& field) {
        if (!field.m_hasTable) return false;
        for (const auto& entry : query.m_aliases)
            if (entry.key.View().ends_with(u"_TABLE") && entry.value->AliasTable == field.m_table)
                return true;
        return false;
    }

    template <class Map>
    static std::set<CString> keys(const Map& map) {
        std::set<CString> keys;
        for (const auto& entry : map) keys.insert(entry.key);
        return keys;
    }

    void items(std::size_t depth, std::string_view name, const CList<SelectItem*>& list) {
        for (const SelectItem* each : list) item(depth, name, *each);
    }
    void item(std::size_t depth, std::string_view name, const SelectItem& item) {
        std::string value = std::to_string(item.m_kind);
        const auto add = [&value](const char* what, const CString& member) {
            if (!member.IsEmpty()) value += std::string(" ") + what + '=' + member.toUtf8();
        };
        add("name", item.m_name);
        CString shown = item.m_text;
        if (differences_.stringsAreQuoted && item.m_kind == SIK_STRING) {
            shown.Trim(u"'");
            if (shown.IsEmpty()) shown = u" ";  // as an empty string is stored elsewhere
        }
        add("text", shown);
        if (item.m_isOperator) value += " operator";
        if (item.m_nested && !(differences_.joinPartsAreNested && item.m_name == u" ")) value += " nested";
        if (item.m_tokenType) value += " token";
        if (const auto* field = dynamic_cast<const SelectItemField*>(&item)) {
            add("table", field->m_sourceTable);
            add("field", field->m_sourceField);
            add("alias", field->m_tableAlias);
            add("schema", field->m_schemaName);
            add("database", field->m_dbName);
        }
        fact(depth, name, value);
        if (const auto* subQuery = dynamic_cast<const SelectItemSubQuery*>(&item))
            query(*subQuery->m_query, depth + 1);
        if (const auto* branch = dynamic_cast<const SelectItemUnion*>(&item))
            query(*branch->m_query, depth + 1);
        items(depth + 1, "item", item.m_items);
    }

    const Differences differences_;
};

}  // namespace

std::string plainDescriptor(const CZRQueryInfo& query, const Differences& differences) {
    Writer writer(differences);
    writer.query(query, 0);
    return writer.text;
}
