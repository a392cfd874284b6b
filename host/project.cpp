#include "host/project.h"

#include "host/file_replacement.h"
#include "host/json_form.h"
#include "host/kinds.h"
#include "host/section.h"
#include "host/sqlite_form.h"
#include "host/stored_tree.h"

namespace zr::host {

namespace {

// What a project's outermost section tells of it.
constexpr const char16_t* kFormatKey = u"Format";
constexpr const char16_t* kFormat = u"ZRParserSQL project";
constexpr const char16_t* kVersionKey = u"Version";
constexpr int kVersion = 1;
constexpr const char16_t* kKindKey = u"DBType";
constexpr const char16_t* kDatabaseSection = u"Database";

StoredTree readTree(const std::string& path) {
    if (isSqliteFile(path)) return readSqlite(path);
    StoredTree tree;
    JsonReader().read(readFile(path), tree.root);
    return tree;
}

void writeTree(const StoredTree& tree, const std::string& path, StorageForm form) {
    if (form == StorageForm::Sqlite) return writeSqlite(path, tree.root);
    std::string json;
    appendJson(json, tree.root);
    json += '\n';
    replaceFile(path, json);
}

DBTypes readHead(TreeStorage& storage) {
    if (storage.ReadString(kFormatKey, CString(), 0) != kFormat)
        throw StorageError(storage.lastRead() + "this is no project; one begins with \"" +
                           CString(kFormatKey).toUtf8() + "\": \"" + CString(kFormat).toUtf8() + "\"");
    const int version = storage.ReadInt(kVersionKey, 0);
    if (version != kVersion)
        throw StorageError(storage.lastRead() + "the project is of version " + std::to_string(version) +
                           ", and only " + std::to_string(kVersion) + " is known");
    const auto kind = static_cast<DBTypes>(storage.ReadInt(kKindKey, DB_NONE));
    if (!isKnownKind(kind)) throw UnknownKind(kind);
    return kind;
}

std::unique_ptr<Database> loadTree(StoredTree& tree) {
    TreeStorage storage(tree, TreeStorage::Use::Load);
    try {
        auto database = std::make_unique<Database>(readHead(storage));
        if (!storage.HasChild(kDatabaseSection))
            throw StorageError("there is no section \"" + CString(kDatabaseSection).toUtf8() + "\"");
        {
            Factory factory;
            const Section section(storage, kDatabaseSection, false);
            database->Load(storage, factory);
        }
        storage.requireAllUsed();
        database->ResolveReferences();
        return database;
    } catch (const UnknownKind& unknown) {
        throw StorageError(storage.lastRead() + unknown.what());
    }
}

StoredTree storedTree(Database& database) {
    StoredTree tree;
    TreeStorage storage(tree, TreeStorage::Use::Save);
    storage.WriteString(kFormatKey, kFormat, 0);
    storage.WriteInt(kVersionKey, kVersion);
    storage.WriteInt(kKindKey, database.GetDBType());
    const Section section(storage, kDatabaseSection, true);
    database.Save(storage);
    return tree;
}

// Runs a step that works on a file; its failures come out as failures of the project.
template <class Step>
auto onFile(const std::string& path, Step step) {
    try {
        return step();
    } catch (const StorageError& error) {
        throw ProjectError(path + ": " + error.what());
    } catch (const FileError& error) {
        throw ProjectError(error.what());
    }
}

}  // namespace

std::optional<StorageForm> formByName(std::string_view path) {
    if (path.ends_with(".json")) return StorageForm::Json;
    for (const std::string_view ending : {".db", ".sqlite", ".sqlite3"})
        if (path.ends_with(ending)) return StorageForm::Sqlite;
    return std::nullopt;
}

std::unique_ptr<Database> loadProject(const std::string& path) {
    return onFile(path, [&] {
        StoredTree tree = readTree(path);
        return loadTree(tree);
    });
}

void saveProject(Database& database, const std::string& path, StorageForm form) {
    onFile(path, [&] { writeTree(storedTree(database), path, form); });
}

void convertProject(const std::string& from, const std::string& to, StorageForm form) {
    const StoredTree tree = onFile(from, [&] {
        StoredTree read = readTree(from);
        loadTree(read);
        return read;
    });
    onFile(to, [&] { writeTree(tree, to, form); });
}

StorageForm formOfFile(const std::string& path) {
    return isSqliteFile(path) ? StorageForm::Sqlite : StorageForm::Json;
}

}  // namespace zr::host
