#include "model/owned_append.h"
#include "model/stored_section.h"
#include "zrparsersql/table_info.h"

using zr::Missing;
using zr::StoredSection;

namespace {

struct StoredOption {
    const char16_t* key;
    int CZRTableInfo::*member;
    int readDefault;
};

// In the order in which they are written and read.
constexpr StoredOption kOptions[] = {
    {u"CopyStructure", &CZRTableInfo::CopyStructure, 1},
    {u"CopyIndexes", &CZRTableInfo::CopyIndexes, 1},
    {u"CopyForeignKeys", &CZRTableInfo::CopyForeignKeys, 1},
    {u"CopyData", &CZRTableInfo::CopyData, 1},
    {u"OverwriteTable", &CZRTableInfo::OverwriteTable, 0},
    {u"TruncateTable", &CZRTableInfo::TruncateTable, 0},
    {u"ModifyFields", &CZRTableInfo::ModifyFields, 0},
    {u"ModifyIndexes", &CZRTableInfo::ModifyIndexes, 0},
    {u"ModifyForeignKeys", &CZRTableInfo::ModifyForeignKeys, 0},
    {u"SyncInsert", &CZRTableInfo::SyncInsert, 1},
    {u"SyncUpdate", &CZRTableInfo::SyncUpdate, 1},
    {u"SyncDrop", &CZRTableInfo::SyncDrop, 1},
};

template <class List>
void saveChildren(CZRStorageNode& node, const List& list, const char16_t* section, const char16_t* picture) {
    const StoredSection children(node, section, Missing::Create);
    zr::saveNumbered(node, list, picture, [&node](auto& object) { object.Save(node); });
}

}  // namespace

void CZRTableInfo::Save(CZRStorageNode& node) {
    CZRSourceInfo::Save(node);
    {
        const StoredSection options(node, u"Options", Missing::Leave);
        for (const StoredOption& option : kOptions) node.WriteInt(option.key, this->*option.member);
    }
    saveChildren(node, Fields, u"Fields", u"Field%d");
    saveChildren(node, Indexes, u"Indexes", u"Index%d");
    saveChildren(node, ForeignKeys, u"ForeignKeys", u"ForeignKey%d");
    if (Filter) {
        const StoredSection section(node, u"Filter", Missing::Create);
        node.WriteInt(u"DBType", Filter->GetDBType());
        Filter->Save(node);
    } else if (node.HasChild(u"Filter")) {
        node.RemoveChild(u"Filter");
    }
}

void CZRTableInfo::Load(CZRStorageNode& node, CZRDescriptorFactory& factory) {
    Clear();
    CZRSourceInfo::Load(node, factory);
    {
        const StoredSection options(node, u"Options", Missing::Leave);
        for (const StoredOption& option : kOptions)
            this->*option.member = node.ReadInt(option.key, option.readDefault);
    }
    const auto loadChildren = [&](const char16_t* section, auto& list, auto create) {
        const StoredSection children(node, section, Missing::Leave);
        zr::forEachStoredChild(node, [&] {
            auto* child = create();
            if (!child) return;
            zr::appendOwned(list, child);
            child->SetOwner(this);
            child->Load(node, factory);
        });
    };
    const DBTypes type = GetDBType();
    loadChildren(u"Fields", Fields, [&] { return factory.CreateField(type); });
    loadChildren(u"Indexes", Indexes, [&] { return factory.CreateIndex(type); });
    if (node.HasChild(u"ForeignKeys"))
        loadChildren(u"ForeignKeys", ForeignKeys, [&] { return factory.CreateForeignKey(type); });
    if (node.HasChild(u"Filter")) {
        const StoredSection section(node, u"Filter", Missing::Leave);
        Filter = factory.CreateFilter(static_cast<DBTypes>(node.ReadInt(u"DBType", 0)));
        if (Filter) Filter->Load(node, factory);
    }
}
