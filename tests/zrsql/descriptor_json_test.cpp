#include "descriptor_json.h"

#include <gtest/gtest.h>

#include <nlohmann/json.hpp>

namespace zr::tool {
namespace {

std::string jsonOf(const CZRQueryInfo& query) {
    std::string out;
    appendQuery(out, query);
    return out;
}

TEST(DescriptorJson, OfAnEmptyQueryHasAllMembersButTheLimit) {
    EXPECT_EQ(jsonOf(CZRQueryInfo()),
              R"({"m_aliases":{},"m_sourceTables":{},"m_fields":{},"m_subQueries":[],"m_selectItems":[],)"
              R"("m_fromItems":[],"m_whereItem":null,"m_groupItems":[],"m_havingItems":[],"m_orderItems":[],)"
              R"("m_unionItems":[],"m_predicate":0,"m_hasLimit":0,"DataType":0})");
}

TEST(DescriptorJson, WritesTheLimitOnlyWhereThereIsOne) {
    CZRQueryInfo query;
    query.SetLimit(5);
    const auto json = nlohmann::json::parse(jsonOf(query));
    EXPECT_EQ(json["m_hasLimit"], 1);
    EXPECT_EQ(json["m_limitOffset"], 0);
    EXPECT_EQ(json["m_limitCount"], 5);
}

TEST(DescriptorJson, WritesMapsInOrderOfTheirKeys) {
    CZRQueryInfo query;
    for (const char16_t* name : {u"b", u"a", u"ä", u"B"}) query.m_sourceTables[name] = u"of " + CString(name);
    EXPECT_NE(
        jsonOf(query).find(R"("m_sourceTables":{"B":"of B","a":"of a","b":"of b","\u00e4":"of \u00e4"})"),
        std::string::npos);
}

TEST(DescriptorJson, WritesAliasesFieldsAndTheirNulls) {
    CZRQueryInfo query;
    auto* alias = new CZRAliasInfo;
    alias->Name = u"N";
    alias->SrcName = u"S";
    alias->AliasTable = u"T";
    alias->AliasField = u"F";
    query.m_aliases[u"without"] = alias;
    query.m_aliases[u"with"] = new CZRAliasInfo(*alias);
    query.m_aliases[u"with"]->Expression = new SelectItem;
    query.m_fields[u"tc"] = new CFieldObject;
    query.m_fields[u"tc"]->m_table = u"t";
    query.m_fields[u"tc"]->m_field = u"c";
    query.m_fields[u"tc"]->m_hasTable = 1;
    query.m_fields[u"none"] = nullptr;
    const auto json = nlohmann::json::parse(jsonOf(query));
    EXPECT_EQ(json["m_aliases"]["without"].dump(),
              R"({"AliasField":"F","AliasTable":"T","Expression":null,"Name":"N","SrcName":"S"})");
    EXPECT_EQ(json["m_aliases"]["with"]["Expression"]["class"], "SelectItem");
    EXPECT_EQ(json["m_fields"].dump(), R"({"none":null,"tc":{"m_field":"c","m_hasTable":1,"m_table":"t"}})");
}

TEST(DescriptorJson, WritesAnItemsMembersInOrderAndItsItemsWhenThereAreSome) {
    CZRQueryInfo query;
    auto* item = new SelectItem;
    item->m_kind = SIK_FUNCTION;
    item->m_name = u"+";
    item->m_tokenType = 252;
    item->m_isOperator = 1;
    item->m_nested = 1;
    auto* operand = new SelectItem;
    operand->m_text = u"1";
    item->m_items.AddTail(operand);
    query.m_selectItems.AddTail(item);
    EXPECT_NE(
        jsonOf(query).find(
            R"("m_selectItems":[{"class":"SelectItem","m_kind":4,"m_name":"+","m_text":"","m_tokenType":252,)"
            R"("m_isOperator":1,"m_nested":1,"m_items":[{"class":"SelectItem","m_kind":0,"m_name":"",)"
            R"("m_text":"1","m_tokenType":0,"m_isOperator":0,"m_nested":0}]}])"),
        std::string::npos)
        << jsonOf(query);
}

TEST(DescriptorJson, WritesTheFieldTextsThatAreNotEmpty) {
    CZRQueryInfo query;
    auto* field = new SelectItemField;
    field->m_sourceField = u"c";
    field->m_tableAlias = u"a";
    query.m_whereItem = new SelectItem;
    query.m_whereItem->m_items.AddTail(field);
    const auto json = nlohmann::json::parse(jsonOf(query))["m_whereItem"]["m_items"][0];
    EXPECT_EQ(json["class"], "SelectItemField");
    EXPECT_EQ(json["m_kind"], 5);
    EXPECT_EQ(json["m_sourceField"], "c");
    EXPECT_EQ(json["m_tableAlias"], "a");
    for (const char* name :
         {"m_sourceTable", "m_tableName", "m_fieldName", "m_schemaName", "m_dbName", "m_query"})
        EXPECT_FALSE(json.contains(name)) << name;
}

TEST(DescriptorJson, WritesNestedQueriesOfItemsAndOfTheList) {
    CZRQueryInfo query;
    query.m_subQueries.AddTail(new CZRQueryInfo);
    auto* subQuery = new SelectItemSubQuery;
    subQuery->m_query = new CZRQueryInfo;
    subQuery->m_query->DataType = 8;
    query.m_selectItems.AddTail(subQuery);
    query.m_unionItems.AddTail(new SelectItemUnion);
    const auto json = nlohmann::json::parse(jsonOf(query));
    EXPECT_EQ(json["m_subQueries"].size(), 1u);
    EXPECT_EQ(json["m_selectItems"][0]["class"], "SelectItemSubQuery");
    EXPECT_EQ(json["m_selectItems"][0]["m_query"]["DataType"], 8);
    EXPECT_EQ(json["m_unionItems"][0]["class"], "SelectItemUnion");
    EXPECT_TRUE(json["m_unionItems"][0]["m_query"].is_null());
}

TEST(DescriptorJson, WritesItemsOfAnyDepth) {
    constexpr int depth = 100000;
    CZRQueryInfo query;
    CList<SelectItem*>* below = &query.m_selectItems;
    for (int level = 0; level < depth; ++level) {
        below->AddTail(new SelectItem);
        below = &below->GetTail()->m_items;
    }
    const std::string json = jsonOf(query);
    EXPECT_EQ(std::count(json.begin(), json.end(), '{'), depth + 4);
    EXPECT_EQ(std::count(json.begin(), json.end(), '}'), depth + 4);
}

}  // namespace
}  // namespace zr::tool
