#include "host/registry.h"

namespace zr::host {

Registry::Registry(const CZRDatabaseInfo& catalogue) : Database(catalogue.GetDBType()) {
    SetSchemaName(catalogue.GetSchemaName());
    for (CZRTableInfo* table : catalogue.Tables) Tables.AddTail(table);
    for (CZRQueryInfo* query : catalogue.Queries) Queries.AddTail(query);
}

Registry::~Registry() {
    Tables.RemoveAll();
    Queries.RemoveAll();
}

}  // namespace zr::host
