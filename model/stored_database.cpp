#include "model/owned_append.h"
#include "model/retired_model.h"
#include "model/stored_section.h"
#include "zrparsersql/database_info.h"

using zr::Missing;
using zr::StoredSection;

namespace {

// Reads and writes one option of whatever width its member has.
struct StoredOption {
    const char16_t* key;
    int readDefault;
    int (*get)(const CZRDatabaseInfo&);
    void (*set)(CZRDatabaseInfo&, int);
};

template <auto member>
constexpr StoredOption option(const char16_t* key, int readDefault) {
    return {key, readDefault,
            [](const CZRDatabaseInfo& database) { return static_cast<int>(database.*member); },
            [](CZRDatabaseInfo& database, int value) {
                database.*member = static_cast<std::remove_reference_t<decltype(database.*member)>>(value);
            }};
}

// In the order in which they are written and read. Read defaults that differ from a new database's values do
// so on purpose: a stored project without the key was made before the option was.
constexpr StoredOption kOptions[] = {
    option<&CZRDatabaseInfo::OverwriteDatabase>(u"OverwriteDatabase", 1),
    option<&CZRDatabaseInfo::CloseExistingConnections>(u"CloseExistingConnections", 0),
    option<&CZRDatabaseInfo::OverwriteTables>(u"OverwriteTables", 0),
    option<&CZRDatabaseInfo::AutoStructureUpdate>(u"AutoStructureUpdate", 1),
    option<&CZRDatabaseInfo::CreateLogsEnabled>(u"CreateLogsEnabled", 0),
    option<&CZRDatabaseInfo::CreateDiff>(u"CreateDiff", 0),
    option<&CZRDatabaseInfo::CreateUndiff>(u"CreateUndiff", 0),
    option<&CZRDatabaseInfo::BulkInsert>(u"BulkInsert", 0),
    option<&CZRDatabaseInfo::Quant>(u"Quant", 0),
    option<&CZRDatabaseInfo::CaseState>(u"CaseState", 0),
    option<&CZRDatabaseInfo::MaxThreads>(u"MaxThreads", 1),
    option<&CZRDatabaseInfo::MaxQuant>(u"MaxQuant", 1),
    option<&CZRDatabaseInfo::UseHistoryCopyData>(u"UseHistoryCopyData", 0),
    option<&CZRDatabaseInfo::UseTriggersOnlyMaster>(u"UseTriggersOnlyMaster", 0),
    option<&CZRDatabaseInfo::BidirectionalSync>(u"BidirectionalSync", 0),
    option<&CZRDatabaseInfo::CleanHistoryAfterUse>(u"CleanHistoryAfterUse", 0),
    option<&CZRDatabaseInfo::ModifiedTriggers>(u"ModifiedTriggers", 0),
    option<&CZRDatabaseInfo::WithTriggers>(u"WithTriggers", 0),
    option<&CZRDatabaseInfo::WithBidirectional>(u"WithBidirectional", 0),
    option<&CZRDatabaseInfo::HandleSelectedObjects>(u"HandleSelectedObjects", 0),
};

struct StoredText {
    const char16_t* key;
    CString CZRDatabaseInfo::*member;
};

constexpr StoredText kTexts[] = {
    {u"GarbageSymbols", &CZRDatabaseInfo::GarbageSymbols},
    {u"GarbageReplace", &CZRDatabaseInfo::GarbageReplace},
    {u"Version", &CZRDatabaseInfo::Version},
    {u"SchemaName", &CZRDatabaseInfo::SchemaName},
};

// Moves the objects out of a list without deleting them.
template <class T>
void retireAll(CList<T*>& list, std::vector<std::unique_ptr<T>>& retired) {
    for (T* object : list) retired.emplace_back(object);
    list.RemoveAll();
}

}  // namespace

void CZRDatabaseInfo::Save(CZRStorageNode& node) {
    CZRObjectInfo::Save(node);
    {
        const StoredSection options(node, u"Options", Missing::Leave);
        for (const StoredOption& stored : kOptions) node.WriteInt(stored.key, stored.get(*this));
    }
    {
        const StoredSection common(node, u"Common", Missing::Leave);
        for (const StoredText& stored : kTexts) node.WriteString(stored.key, this->*stored.member, 0);
    }
    {
        const StoredSection queries(node, u"Queries", Missing::Create);
        zr::saveNumbered(node, Queries, u"Query%d", [&node](CZRQueryInfo& query) { query.SaveQuery(node); });
    }
    const StoredSection tables(node, u"Tables", Missing::Create);
    zr::saveNumbered(node, Tables, u"Table%d", [&node](CZRTableInfo& table) { table.Save(node); });
}

void CZRDatabaseInfo::Load(CZRStorageNode& node, CZRDescriptorFactory& factory) {
    CZRObjectInfo::Load(node, factory);
    {
        const StoredSection options(node, u"Options", Missing::Leave);
        for (const StoredOption& stored : kOptions)
            stored.set(*this, node.ReadInt(stored.key, stored.readDefault));
    }
    {
        const StoredSection common(node, u"Common", Missing::Leave);
        for (const StoredText& stored : kTexts)
            this->*stored.member = node.ReadString(stored.key, CString(), 0);
    }
    if (!retired_) retired_ = std::make_unique<zr::RetiredModel>();
    retireAll(Queries, retired_->queries);
    retireAll(Tables, retired_->tables);

    const DBTypes type = GetDBType();
    const auto loadAll = [&](auto& list, auto create) {
        zr::forEachStoredChild(node, [&] {
            auto* object = create();
            if (!object) return;
            zr::appendOwned(list, object);
            object->SetDatabase(this);
            object->Load(node, factory);
        });
    };
    {
        const StoredSection queries(node, u"Queries", Missing::Create);
        loadAll(Queries, [&] { return factory.CreateQuery(type); });
    }
    const StoredSection tables(node, u"Tables", Missing::Leave);
    loadAll(Tables, [&] { return factory.CreateTable(type); });
}
