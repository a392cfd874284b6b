#pragma once

#include "host/database.h"

namespace zr::host {

// A database for one thread whose tables and queries are those of a catalogue that several threads share.
// User functions that an analysis meets are noted here, and the catalogue is only read. IDs and schema are
// those of the catalogue, the other settings are not taken over.
//
// For BuildQueryInfo alone: to follow columns (CZRQueryInfo::ResolveItems and the like) marks sources, and
// wants a clone a thread. Owns none of the tables and queries: the catalogue outlives the object, and nobody
// changes it meanwhile. Not to be loaded into.
class Registry : public Database {
 public:
    explicit Registry(const CZRDatabaseInfo& catalogue);
    ~Registry() override;
};

}  // namespace zr::host
