#pragma once

#include <string>

#include "host/catalog_reader.h"

namespace zr::host {

// Dumps of a catalogue's views: CSV with a line of names, or JSON: a list of objects, or an object of such
// lists. A row is what its names say: with VIEW_DEFINITION or TEXT a view, with CONSTRAINT_NAME a part of a
// key, with COLUMN_NAME a column. Names are without regard to case; others are passed over.
class DumpReader : public CatalogReader {
 public:
    // The content of the file; the path is for messages.
    DumpReader(std::string path, std::string bytes) : path_(std::move(path)), bytes_(std::move(bytes)) {}
    using CatalogReader::read;
    void read(CatalogRows& rows, const CatalogReading& reading) override;

 private:
    std::string path_;
    std::string bytes_;
};

}  // namespace zr::host
