#include "descriptor_json.h"

#include <iterator>
#include <vector>

#include "host/descriptor_access.h"
#include "json_text.h"

namespace zr::tool {

namespace {

// A descriptor is written from a list of pieces still to come: text, an item or a query. Writing an object
// puts its own pieces in front of that list, so nesting of any depth needs no machine stack.
class DescriptorWriter {
 public:
    explicit DescriptorWriter(std::string& out) : out_(out) {}

    void write(const CZRQueryInfo& query) {
        expand(query);
        while (!todo_.empty()) {
            const Piece piece = std::move(todo_.back());
            todo_.pop_back();
            out_ += piece.text;
            if (piece.item) expand(*piece.item);
            if (piece.query) expand(*piece.query);
        }
    }

 private:
    // Text, and what stands behind it.
    struct Piece {
        std::string text;
        const SelectItem* item = nullptr;
        const CZRQueryInfo* query = nullptr;
    };

    // The pieces of one object, in order, until they go on the list.
    class Pieces {
     public:
        void add(const SelectItem* item) { addObject(item, nullptr); }
        void add(const CZRQueryInfo* query) { addObject(nullptr, query); }
        template <class Object>
        void addList(const CList<Object*>& list) {
            text += '[';
            bool first = true;
            for (const Object* object : list) {
                if (!first) text += ',';
                first = false;
                add(object);
            }
            text += ']';
        }
        void moveTo(std::vector<Piece>& todo) {
            todo.push_back({std::move(text)});
            todo.insert(todo.end(), std::make_move_iterator(done_.rbegin()),
                        std::make_move_iterator(done_.rend()));
        }

        std::string text;  // goes behind the pieces added so far

     private:
        void addObject(const SelectItem* item, const CZRQueryInfo* query) {
            if (item || query) {
                done_.push_back({std::move(text), item, query});
                text.clear();
            } else {
                text += "null";
            }
        }

        std::vector<Piece> done_;
    };

    void expand(const SelectItem& item) {
        Pieces pieces;
        pieces.text += '{';
        JsonMembers members(pieces.text);
        const host::ItemClass itemClass = host::classOf(item);
        members.ascii("class", itemClass.name);
        members.number("m_kind", item.m_kind);
        members.text("m_name", item.m_name);
        members.text("m_text", item.m_text);
        members.number("m_tokenType", item.m_tokenType);
        members.number("m_isOperator", item.m_isOperator);
        members.number("m_nested", item.m_nested);
        if (itemClass.field) expandField(members, *itemClass.field);
        if (itemClass.hasQuery) {
            members.name("m_query");
            pieces.add(itemClass.query);
        }
        if (!item.m_items.IsEmpty()) {
            members.name("m_items");
            pieces.addList(item.m_items);
        }
        pieces.text += '}';
        pieces.moveTo(todo_);
    }

    static void expandField(JsonMembers& members, const SelectItemField& field) {
        const auto textUnlessEmpty = [&](std::string_view name, const CString& value) {
            if (!value.IsEmpty()) members.text(name, value);
        };
        textUnlessEmpty("m_sourceTable", field.m_sourceTable);
        textUnlessEmpty("m_sourceField", field.m_sourceField);
        textUnlessEmpty("m_tableName", field.m_tableName);
        textUnlessEmpty("m_fieldName", field.m_fieldName);
        textUnlessEmpty("m_tableAlias", field.m_tableAlias);
        textUnlessEmpty("m_resolvedSchema", field.m_resolvedSchema);
        textUnlessEmpty("m_reservedText", field.m_reservedText);
        textUnlessEmpty("m_schemaName", field.m_schemaName);
        textUnlessEmpty("m_dbName", field.m_dbName);
    }

    void expand(const CZRQueryInfo& query) {
        Pieces pieces;
        pieces.text += '{';
        JsonMembers members(pieces.text);
        members.name("m_aliases");
        writeMap(pieces.text, query.m_aliases, [&](const CZRAliasInfo* alias) { writeAlias(pieces, alias); });
        members.name("m_sourceTables");
        appendTextMap(pieces.text, query.m_sourceTables);
        members.name("m_fields");
        writeMap(pieces.text, query.m_fields,
                 [&](const CFieldObject* field) { writeFieldObject(pieces.text, field); });
        const auto list = [&](std::string_view name, const auto& objects) {
            members.name(name);
            pieces.addList(objects);
        };
        list("m_subQueries", query.m_subQueries);
        list("m_selectItems", query.m_selectItems);
        list("m_fromItems", query.m_fromItems);
        members.name("m_whereItem");
        pieces.add(query.m_whereItem);
        list("m_groupItems", query.m_groupItems);
        list("m_havingItems", query.m_havingItems);
        list("m_orderItems", query.m_orderItems);
        list("m_unionItems", query.m_unionItems);
        members.number("m_predicate", query.m_predicate);
        members.number("m_hasLimit", query.m_hasLimit);
        if (query.m_hasLimit) {
            members.number("m_limitOffset", query.m_limitOffset);
            members.number("m_limitCount", query.m_limitCount);
        }
        members.number("DataType", query.DataType);
        pieces.text += '}';
        pieces.moveTo(todo_);
    }

    template <class Map, class WriteValue>
    static void writeMap(std::string& out, const Map& map, WriteValue writeValue) {
        out += '{';
        JsonMembers members(out);
        for (const auto* entry : host::sortedEntries(map)) {
            members.name(entry->key.View());
            writeValue(entry->value);
        }
        out += '}';
    }

    static void writeAlias(Pieces& pieces, const CZRAliasInfo* alias) {
        if (!alias) {
            pieces.text += "null";
            return;
        }
        pieces.text += '{';
        JsonMembers members(pieces.text);
        members.text("Name", alias->Name);
        members.text("SrcName", alias->SrcName);
        members.text("AliasTable", alias->AliasTable);
        members.text("AliasField", alias->AliasField);
        members.name("Expression");
        pieces.add(alias->Expression);
        pieces.text += '}';
    }

    static void writeFieldObject(std::string& out, const CFieldObject* field) {
        if (!field) {
            out += "null";
            return;
        }
        out += '{';
        JsonMembers members(out);
        members.text("m_table", field->m_table);
        members.text("m_field", field->m_field);
        members.number("m_hasTable", field->m_hasTable);
        out += '}';
    }

    std::string& out_;
    std::vector<Piece> todo_;  // from the last to the first
};

}  // namespace

void appendQuery(std::string& out, const CZRQueryInfo& query) {
    DescriptorWriter(out).write(query);
}

void appendTextMap(std::string& out, const CMapStringToString& map) {
    out += '{';
    JsonMembers members(out);
    for (const auto* entry : host::sortedEntries(map)) members.text(entry->key.View(), entry->value);
    out += '}';
}

}  // namespace zr::tool
