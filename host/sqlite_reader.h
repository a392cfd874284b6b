#pragma once

#include <string>

#include "host/catalog_reader.h"

namespace zr::host {

// The catalogue of an SQLite database. It is opened for reading alone and read as it is at one moment.
class SqliteReader : public CatalogReader {
 public:
    explicit SqliteReader(std::string path) : path_(std::move(path)) {}
    using CatalogReader::read;
    void read(CatalogRows& rows, const CatalogReading& reading) override;

 private:
    std::string path_;
};

}  // namespace zr::host
