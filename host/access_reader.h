#pragma once

#include <chrono>
#include <string>

#include "host/catalog_reader.h"

namespace zr::host {

// True for a file that begins as a database of MS Access does (.mdb, .accdb).
bool isAccessFile(const std::string& path);

// The catalogue of such a file, by the programs of mdbtools, which have to be installed where it is read.
// They open it for reading, one after the other: nothing should change it meanwhile.
class AccessReader : public CatalogReader {
 public:
    explicit AccessReader(std::string path, std::chrono::milliseconds patience = std::chrono::seconds(60))
        : path_(std::move(path)), patience_(patience) {}
    using CatalogReader::read;
    void read(CatalogRows& rows, const CatalogReading& reading) override;

 private:
    std::string run(const std::vector<std::string>& words) const;
    void readTables(CatalogRows& rows) const;
    void readKeys(CatalogRows& rows) const;
    void readRelationships(CatalogRows& rows) const;
    void readQueries(CatalogRows& rows) const;

    std::string path_;
    std::chrono::milliseconds patience_;
};

}  // namespace zr::host
