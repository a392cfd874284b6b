#pragma once

#include <memory>
#include <stdexcept>
#include <string>
#include <string_view>

#include "zrparsersql/database_info.h"

namespace zr::host {

// A column that is known by name only.
class CatalogField : public CZRFieldInfo {
 public:
    CatalogField* Clone(int selectedOnly = 0) const override;
    bool IsDerivedSource() const override { return false; }
    bool IsBaseTable() const override { return false; }
    void SetOwner(CZRTableInfo* owner) override { owner_ = owner; }
    CString GetTypeDefinition() const override { return TypeMapped; }
    CString GetCollation() const override { return CString(); }
    int IsExcludedFromKey() const override { return 0; }

    CZRTableInfo* GetOwner() const { return owner_; }

 private:
    CZRTableInfo* owner_ = nullptr;
};

class CatalogTable : public CZRTableInfo {
 public:
    CatalogTable() = default;
    CatalogTable(const CatalogTable& other, int selectedOnly) : CZRTableInfo(other, selectedOnly) {}
    CatalogTable* Clone(int selectedOnly = 0) const override;
};

// The model of one source database as far as a catalogue tells it. A clone keeps all IDs, so that what is
// resolved against a clone means the same object of the original.
class CatalogDatabase : public CZRDatabaseInfo {
 public:
    CatalogDatabase() = default;
    CatalogDatabase(const CatalogDatabase& other, int selectedOnly) : CZRDatabaseInfo(other, selectedOnly) {}
    CatalogDatabase* Clone(int selectedOnly = 0) const override;
};

class CatalogError : public std::runtime_error {
 public:
    using std::runtime_error::runtime_error;
};

// Reads a catalogue: a JSON list of tables, each {"table": NAME, "columns": [NAME, ...], "id": TEXT}. Columns
// and id may be left out; a table without an id gets its name in braces, so that equal catalogues give equal
// IDs. Other members are passed over. The JSON text is UTF-8. Throws CatalogError, with what is wrong and
// where.
std::unique_ptr<CatalogDatabase> readCatalog(std::string_view json);

}  // namespace zr::host
