#pragma once

#include <memory>
#include <string>

#include "host/project.h"

namespace zr::host::test {

// A folder of the test's own, removed with the object.
class Folder {
 public:
    Folder();
    ~Folder();
    Folder(const Folder&) = delete;
    Folder& operator=(const Folder&) = delete;
    std::string path(const std::string& name) const { return path_ + "/" + name; }
    // Names of the files in it, sorted, with "," between them.
    std::string files() const;

 private:
    std::string path_;
};

std::string bytesOf(const std::string& path);
void writeBytes(const std::string& path, const std::string& bytes);

// A project with one of everything, all of it with texts and numbers that are not the defaults.
std::unique_ptr<Database> smallProject();

// A project that chance made: any text, unpaired surrogates and zeros included, and any number, wherever the
// model holds one. Names of tables and queries are distinct.
std::unique_ptr<Database> randomProject(unsigned seed);

// The project as it is stored: equal projects have equal texts.
std::string stored(Database& database);

// Runs statements on an SQLite file, which is made when it is not there.
void runSql(const std::string& path, const std::string& statements);

// What loadProject complains about; fails the test when it does not.
std::string complaintOf(const std::string& path);

}  // namespace zr::host::test
