#include "zrparsersql/query_info.h"

#include "model/descriptor_copier.h"
#include "model/descriptor_reaper.h"
#include "model/retired_objects.h"
#include "model/source_search.h"
#include "zrparsersql/database_info.h"

CZRQueryUnionInfo::CZRQueryUnionInfo(const CZRQueryUnionInfo& other)
    : Query(other.Query ? other.Query->Clone() : nullptr), UnionKind(other.UnionKind) {}

CZRQueryUnionInfo::~CZRQueryUnionInfo() {
    delete Query;
}

CZRQueryInfo::CZRQueryInfo() = default;

CZRQueryInfo::CZRQueryInfo(const CZRQueryInfo& other, zr::ShallowCopy)
    : CZRSourceInfo(other),
      QueryFlag(other.QueryFlag),
      m_database(other.m_database),
      m_sql(other.m_sql),
      m_hasLimit(other.m_hasLimit),
      LimitMode(other.LimitMode),
      m_limitOffset(other.m_limitOffset),
      m_limitCount(other.m_limitCount),
      m_predicate(other.m_predicate),
      QueryOption1(other.QueryOption1) {}

CZRQueryInfo::CZRQueryInfo(const CZRQueryInfo& other) : CZRQueryInfo(other, zr::ShallowCopy{}) {
    zr::DescriptorCopier().copyBelow(other, *this);
}

CZRQueryInfo::~CZRQueryInfo() {
    // Clause by clause in this order, for hosts whose items do something at their end.
    zr::DescriptorReaper reaper;
    const auto end = [&reaper](auto& part) {
        reaper.take(part);
        reaper.drain();
    };
    end(m_selectItems);
    end(m_fromItems);
    end(m_whereItem);
    m_whereItem = nullptr;
    end(m_subQueries);
    end(m_orderItems);
    end(m_groupItems);
    reaper.takeContents(*this);
}

CZRQueryInfo* CZRQueryInfo::Clone(int /*selectedOnly*/) const {
    return new CZRQueryInfo(*this);
}

bool CZRQueryInfo::IsDerivedSource() const {
    return true;
}
bool CZRQueryInfo::IsBaseTable() const {
    return !IsDerivedSource();
}

CString CZRQueryInfo::GetDialectText1() const {
    return CString();
}
CString CZRQueryInfo::GetDialectText2() const {
    return CString();
}

void CZRQueryInfo::CopyProperties(CZRQueryInfo& source, int flag) {
    CZRSourceInfo::CopyProperties(source, flag);
}

void CZRQueryInfo::SetDatabase(CZRDatabaseInfo* database) {
    m_database = database;
}

void CZRQueryInfo::SetSQL(CString text) {
    text.Replace(u"\r\n", u" ");
    text.TrimRight();
    m_sql = std::move(text);
}

void CZRQueryInfo::SetLimit(int count) {
    m_hasLimit = 1;
    m_limitOffset = 0;
    m_limitCount = count;
}

int CZRQueryInfo::GetLimit(int& offset, int& count) const {
    offset = m_limitOffset;
    count = m_limitCount;
    return m_hasLimit;
}

void CZRQueryInfo::AddUserFunction(CString name, int parameterCount) {
    if (!m_database) return;
    CString count;
    count.Format(u"%d", parameterCount);
    m_database->UserFunctions[name] = count;
}

void CZRQueryInfo::ResolveSources() {
    zr::SourceCache sources;
    std::vector<CZRQueryInfo*> waiting{this};
    while (!waiting.empty()) {
        CZRQueryInfo* query = waiting.back();
        waiting.pop_back();
        for (CZRQueryInfo* nested : query->m_subQueries)
            if (nested) waiting.push_back(nested);
        for (auto& entry : query->m_sourceTables)
            if (const zr::Source found = sources.byName(*query, entry.key))
                entry.value = found.source->GetID();
    }
}

CZRSourceInfo* CZRQueryInfo::FindSource(CString srcName) const {
    if (!m_database) return nullptr;
    if (CZRTableInfo* table = m_database->FindTableBySrcName(srcName)) return table;
    return m_database->FindQueryBySrcName(srcName);
}

CZRSourceInfo* CZRQueryInfo::FindSourceByID(CString id) const {
    if (!m_database) return nullptr;
    if (CZRTableInfo* table = m_database->FindTableByID(id)) return table;
    return m_database->FindQueryByID(id);
}

int CZRQueryInfo::HasQuerySource() {
    zr::SourceCache sources;
    for (const auto& entry : m_fields)
        if (entry.value && !entry.value->m_table.IsEmpty() &&
            sources.byName(*this, entry.value->m_table).query)
            return 1;
    return 0;
}

CZRSourceFildInfo* CZRQueryInfo::FindFieldByID(CString /*id*/) {
    return nullptr;
}
CZRSourceFildInfo* CZRQueryInfo::FindFieldByName(CString /*name*/) {
    return nullptr;
}

CZRSourceFildInfo* CZRQueryInfo::FindFieldBySrcName(CString name) {
    zr::SourceCache sources;
    return zr::SourceSearch(sources).findFieldBySrcName(*this, name);
}

CZRSourceFildInfo* CZRQueryInfo::FindField(CString tableName, CString fieldName) {
    zr::SourceCache sources;
    return zr::SourceSearch(sources).findField(*this, tableName, fieldName);
}

CZRSourceFildInfo* CZRQueryInfo::FindFieldInSources(CString fieldName) {
    zr::SourceCache sources;
    return zr::SourceSearch(sources).findFieldInSources(*this, fieldName);
}

int CZRQueryInfo::FindInSubQueries(CString tableName, CString fieldName, CZRQueryInfo*& found) {
    zr::SourceCache sources;
    return zr::SourceSearch(sources).findInSubQueries(*this, tableName, fieldName, found);
}

int CZRQueryInfo::CheckFieldRefs() {
    zr::SourceCache sources;
    return zr::SourceSearch(sources).checkFieldRefs(*this);
}

int CZRQueryInfo::GetCorrect() {
    zr::SourceCache sources;
    return zr::SourceSearch(sources).validate(*this);
}

int CZRQueryInfo::Validate(int /*requireAllSelected*/) {
    return GetCorrect();
}

zr::RetiredObjects& CZRQueryInfo::retired() {
    if (!retired_) retired_ = std::make_shared<zr::RetiredObjects>();
    return *retired_;
}

std::shared_ptr<zr::RetiredObjects> CZRQueryInfo::HoldRetired() {
    retired();
    return retired_;
}

void CZRQueryInfo::RetireItems(CList<SelectItem*>& items) {
    if (items.IsEmpty()) return;
    std::vector<SelectItem*>& store = retired().items;
    store.insert(store.end(), items.begin(), items.end());
    items.RemoveAll();
}

void CZRQueryInfo::RetireItem(SelectItem* item) {
    if (item) retired().items.push_back(item);
}

void CZRQueryInfo::RetireFieldObject(CFieldObject* field) {
    if (field) retired().fields.push_back(field);
}

void CZRQueryInfo::RetireAlias(CZRAliasInfo* alias) {
    if (alias) retired().aliases.push_back(alias);
}

void CZRQueryInfo::RetireQuery(CZRQueryInfo* query) {
    if (query) retired().queries.push_back(query);
}

void CZRQueryInfo::RetireUnions(CList<CZRQueryUnionInfo*>& unions) {
    if (unions.IsEmpty()) return;
    std::vector<CZRQueryUnionInfo*>& store = retired().unions;
    store.insert(store.end(), unions.begin(), unions.end());
    unions.RemoveAll();
}

void CZRQueryInfo::ReplaceFieldObject(const CString& key, CFieldObject* field) {
    CFieldObject*& slot = m_fields[key];
    if (slot != field) RetireFieldObject(slot);
    slot = field;
}

void CZRQueryInfo::ReplaceAlias(const CString& key, CZRAliasInfo* alias) {
    CZRAliasInfo*& slot = m_aliases[key];
    if (slot != alias) RetireAlias(slot);
    slot = alias;
}
