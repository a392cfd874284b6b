// Saves a model through a storage and loads it again. The storage is the host's: here a tree of sections in
// memory.
#include <zrparsersql/analysis.h>
#include <zrparsersql/filter_info.h>
#include <zrparsersql/storage.h>

#include <cstdio>
#include <map>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "small_model.h"

namespace {

// One section. Children keep the order in which they were made: tables and columns come back in it.
struct Section {
    std::map<std::string, int> numbers;
    std::map<std::string, CString> texts;
    std::vector<std::pair<CString, std::unique_ptr<Section>>> children;

    Section* child(const CString& name) {
        for (auto& [childName, section] : children)
            if (childName == name) return section.get();
        return nullptr;
    }
};

class MemoryStorage : public CZRStorageNode {
 public:
    CList<CString> GetChildNames() override {
        CList<CString> names;
        for (const auto& entry : current().children) names.AddTail(entry.first);
        return names;
    }
    int HasChild(CString name) override { return current().child(name) != nullptr; }
    void OpenChild(CString name, int create) override {
        Section* section = current().child(name);
        if (!section && create)
            section = current().children.emplace_back(name, std::make_unique<Section>()).second.get();
        if (!section)  // an empty one that is not stored
            section = unstored_.emplace_back(std::make_unique<Section>()).get();
        open_.push_back(section);
    }
    void CloseChild() override { open_.pop_back(); }
    void RemoveChild(CString name) override {
        std::erase_if(current().children, [&name](const auto& entry) { return entry.first == name; });
    }
    int ReadInt(CString name, int defaultValue) override {
        const auto found = current().numbers.find(name.toUtf8());
        return found == current().numbers.end() ? defaultValue : found->second;
    }
    CString ReadString(CString name, CString defaultValue, int /*flag*/) override {
        const auto found = current().texts.find(name.toUtf8());
        return found == current().texts.end() ? defaultValue : found->second;
    }
    void WriteInt(CString name, int value) override { current().numbers[name.toUtf8()] = value; }
    void WriteString(CString name, CString value, int /*flag*/) override {
        current().texts[name.toUtf8()] = value;
    }

 private:
    Section& current() { return *open_.back(); }

    Section root_;
    std::vector<Section*> open_ = {&root_};
    std::vector<std::unique_ptr<Section>> unstored_;
};

// A query whose text is kept, so that it can be analysed wherever the model is loaded.
class StoredQuery : public Query {
 public:
    StoredQuery* Clone(int /*selectedOnly*/ = 0) const override { return new StoredQuery(*this); }
    void SaveQuery(CZRStorageNode& node) override {
        Query::SaveQuery(node);
        node.WriteString(u"Text", GetSQL(), 0);
    }
    void Load(CZRStorageNode& node, CZRDescriptorFactory& factory) override {
        Query::Load(node, factory);
        SetSQL(node.ReadString(u"Text", CString(), 0));
    }
};

// Makes what a load finds. This model has neither keys nor filters.
class Factory : public CZRDescriptorFactory {
 public:
    CZRTableInfo* CreateTable(DBTypes) override { return new Table; }
    CZRQueryInfo* CreateQuery(DBTypes) override { return new StoredQuery; }
    CZRFieldInfo* CreateField(DBTypes) override { return new Column; }
    CZRIndexInfo* CreateIndex(DBTypes) override { return nullptr; }
    CZRForeignKeyInfo* CreateForeignKey(DBTypes) override { return nullptr; }
    CZRFilterInfo* CreateFilter(DBTypes) override { return nullptr; }
    CZRFilterItemInfo* CreateFilterItem(DBTypes) override { return nullptr; }
};

}  // namespace

int main() {
    MemoryStorage storage;
    {
        Database database;
        database.addTable(u"orders", {u"id", u"price"}).SetSelected(0);
        auto query = std::make_unique<StoredQuery>();
        query->SetName(u"dear");
        query->SetSrcName(u"dear");
        query->SetDatabase(&database);
        query->SetSQL(u"SELECT id FROM orders WHERE price > 100");
        database.Queries.AddTail(query.release());
        database.Save(storage);
    }

    Database database;
    Factory factory;
    database.Load(storage, factory);
    for (const CZRTableInfo* table : database.Tables) {
        std::printf("table %s, selected %d\n", table->GetName().toUtf8().c_str(), table->GetSelected());
        for (const CZRFieldInfo* column : table->Fields)
            std::printf("  column %s\n", column->GetName().toUtf8().c_str());
    }
    for (CZRQueryInfo* query : database.Queries) {
        query->SetDatabase(&database);
        BuildQueryInfo(query, query->GetDBType());  // what an analysis finds is not stored: it is made anew
        for (const auto& source : query->m_sourceTables)
            std::printf("query %s reads %s: %s\n", query->GetName().toUtf8().c_str(),
                        source.key.toUtf8().c_str(),
                        database.FindTableByID(source.value) ? "the table above" : "unknown");
    }
}
