#pragma once

#include <cstdint>
#include <memory>

#include "zrparsersql/alias_info.h"
#include "zrparsersql/containers.h"
#include "zrparsersql/field_object.h"
#include "zrparsersql/select_item.h"
#include "zrparsersql/source_info.h"

class CZRDatabaseInfo;
class CZRQueryInfo;

namespace zr {
class DescriptorCopier;
class DescriptorReaper;
class RetiredObjects;
}  // namespace zr

// One branch of a query text that was cut at its unions.
struct ZR_SHARED_DECLARATION CZRQueryUnionInfo {
    CZRQueryInfo* Query = nullptr;  // owned
    int UnionKind = 0;              // 0 UNION, 1 UNION ALL
    CString Text;                   // neither set nor copied

    CZRQueryUnionInfo() = default;
    CZRQueryUnionInfo(const CZRQueryUnionInfo& other);
    CZRQueryUnionInfo& operator=(const CZRQueryUnionInfo&) = delete;
    ~CZRQueryUnionInfo();
};

// A stored or nested query. Before its analysis it holds the text and the database; behind it, the clauses as
// trees of SelectItem, the aliases, the sources and the column references, with one more CZRQueryInfo for
// each nested query and union branch.
//
// Owns what its lists and maps hold, apart from m_database. What is replaced or dropped during an analysis
// goes to the descriptor's retired objects, since a host may still hold it, and dies with the descriptor.
// Look-ups and validation follow queries that read from queries by this class's own rules to any depth,
// without calling overrides of those operations on the queries in between; queries that read from each other
// find nothing there. Threads: one at a time; two descriptors of one database count as one object. Failure: a
// look-up that fails marks the query with SetCorrect(1).
class ZR_SHARED_DECLARATION CZRQueryInfo : public CZRSourceInfo {
 public:
    std::uint16_t QueryFlag = 0;
    CMapStringToOb<CZRAliasInfo> m_aliases;  // by name in lower case (Oracle: name with "_FIELD" or "_TABLE")
    CMapStringToString
        m_sourceTables;  // by name as written: that name, or the ID of the source once resolved
    CMapStringToOb<CFieldObject> m_fields;  // by table and column joined; a value may be null
    CList<CZRQueryInfo*> m_subQueries;
    CList<SelectItem*> m_selectItems;
    CList<SelectItem*> m_fromItems;
    CList<SelectItem*> m_orderItems;
    CList<SelectItem*> m_groupItems;
    CList<SelectItem*> m_unionItems;
    CList<SelectItem*> m_havingItems;
    SelectItem* m_whereItem = nullptr;  // its children are the condition
    CList<CZRQueryUnionInfo*> m_unions;
    CZRDatabaseInfo* m_database = nullptr;  // not owned
    CString m_sql;
    int QueryMark = 0;
    int m_hasLimit = 0;
    int LimitMode = 0;
    int m_limitOffset = 0;
    int m_limitCount = 0;
    int m_predicate = 0;  // 0 none, 1 ALL, 2 DISTINCT, 3 DISTINCTROW, 5 an asterisk
    int QueryOption1 = 0;
    int QueryOption2 = 0;

    CZRQueryInfo();
    // A deep copy, apart from m_database, which is shared. QueryMark and QueryOption2 are not copied.
    CZRQueryInfo(const CZRQueryInfo& other);
    ~CZRQueryInfo() override;

    CZRQueryInfo* Clone(int selectedOnly = 0) const override;
    bool IsDerivedSource() const override;
    bool IsBaseTable() const override;
    // Validates the query against its database: 0, or the first error, or a warning.
    int GetCorrect() override;
    int Validate(int requireAllSelected) override;
    // Only the common members: the analysis is made anew from the text.
    void Load(CZRStorageNode& node, CZRDescriptorFactory& factory) override;
    // 1 when a column reference names a table that is a query.
    int HasQuerySource() override;
    // Both always null: a query has no list of columns. Use FindFieldBySrcName.
    CZRSourceFildInfo* FindFieldByID(CString id) override;
    CZRSourceFildInfo* FindFieldByName(CString name) override;
    // A result column by name: the column of a source that it comes from, or an alias.
    CZRSourceFildInfo* FindFieldBySrcName(CString name) override;

    virtual CString GetDialectText1() const;
    virtual CString GetDialectText2() const;
    virtual void SaveQuery(CZRStorageNode& node);
    using CZRSourceInfo::CopyProperties;
    virtual void CopyProperties(CZRQueryInfo& source, int flag);
    virtual void SetDatabase(CZRDatabaseInfo* database);

    CZRDatabaseInfo* GetDatabase() const { return m_database; }
    CString GetSQL() const { return m_sql; }
    // Stores a text with each "\r\n" as one blank and without white space at its end.
    void SetSQL(CString text);
    void SetSQLText(CString text) { SetSQL(std::move(text)); }
    // Stores a limit of that many rows from row 0 on.
    void SetLimit(int count);
    // Fills both and answers m_hasLimit.
    int GetLimit(int& offset, int& count) const;
    std::uint16_t GetQueryFlag() const { return QueryFlag; }
    void SetQueryFlag(std::uint16_t value) { QueryFlag = value; }
    int GetQueryMark() const { return QueryMark; }
    void SetQueryMark(int value) { QueryMark = value; }
    int GetLimitMode() const { return LimitMode; }
    void SetLimitMode(int value) { LimitMode = value; }
    int GetPredicate() const { return m_predicate; }
    void SetPredicate(int value) { m_predicate = value; }
    int GetQueryOption1() const { return QueryOption1; }
    void SetQueryOption1(int value) { QueryOption1 = value; }
    int GetQueryOption2() const { return QueryOption2; }
    void SetQueryOption2(int value) { QueryOption2 = value; }

    // Notes a user function with its count of parameters in the database. Without a database nothing happens.
    // An analysis calls it for each call of a user function, and it is not guarded: threads whose queries
    // share a database may not come here at the same time.
    void AddUserFunction(CString name, int parameterCount);

    // Puts the ID of each source that the database knows into m_sourceTables, here and in all m_subQueries.
    void ResolveSources();

    // A table, else a query, of the database, or null.
    CZRSourceInfo* FindSource(CString srcName) const;
    CZRSourceInfo* FindSourceByID(CString id) const;

    // The column that a reference means, or null. With an empty table name all sources are asked.
    CZRSourceFildInfo* FindField(CString tableName, CString fieldName);
    // The first column of that name in the sources, or null.
    CZRSourceFildInfo* FindFieldInSources(CString fieldName);
    // Looks for a query, this one or one it reads from, with an alias whose name is the table name or the
    // column name. Answers 1 and fills found with that query, or 0.
    int FindInSubQueries(CString tableName, CString fieldName, CZRQueryInfo*& found);
    // 0 when all column references are known and selected, else 1.
    int CheckFieldRefs();

    // Fill the resolved members of all items of a list, of all clauses, or of one item and what is below it.
    void ResolveItems(CList<SelectItem*>& items);
    void ResolveAllItems();
    void ResolveItem(SelectItem* item);
    // Looks in a list, and in what stands below its entries, for the column that is wanted: the first one of
    // that table and column, or of that column alone when flag is nonzero or no table is wanted. A "*" is
    // searched through in the select lists of the queries among m_sourceTables. Gives the column's text and
    // fills found, or gives an empty text. With mode 0 nothing is found below functions, operators and
    // sub-queries not named "ALIAS".
    CString MatchSelectList(const CList<SelectItem*>& items, const SelectItemField& wanted,
                            SelectItem*& found, int flag, int mode);

    // Objects that leave the descriptor but may still be held by a host: they stay alive as long as the
    // descriptor, or longer for whoever holds on to HoldRetired(). Null is allowed. RetireItems empties the
    // list it is given.
    void RetireItems(CList<SelectItem*>& items);
    void RetireItem(SelectItem* item);
    void RetireFieldObject(CFieldObject* field);
    void RetireAlias(CZRAliasInfo* alias);
    void RetireQuery(CZRQueryInfo* query);
    void RetireUnions(CList<CZRQueryUnionInfo*>& unions);
    // Enter a value into the map and retire the one that it replaces.
    void ReplaceFieldObject(const CString& key, CFieldObject* field);
    void ReplaceAlias(const CString& key, CZRAliasInfo* alias);
    // Keeps alive what the descriptor has retired and what its own end leaves over (the records of m_unions).
    std::shared_ptr<zr::RetiredObjects> HoldRetired();

 protected:
    CZRQueryInfo(const CZRQueryInfo& other, zr::ShallowCopy);

 private:
    friend class zr::DescriptorCopier;
    friend class zr::DescriptorReaper;
    friend class zr::RetiredObjects;

    zr::RetiredObjects& retired();

    std::shared_ptr<zr::RetiredObjects> retired_;  // made when first needed
    CZRQueryInfo* nextWaiting_ = nullptr;          // links queries that wait for their end
};
