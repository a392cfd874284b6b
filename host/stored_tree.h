#pragma once

#include <cstddef>
#include <memory>
#include <stdexcept>
#include <string>
#include <unordered_map>
#include <vector>

#include "zrparsersql/storage.h"

// A stored project in memory: named sections with named values. The files of both forms are read into one and
// written from one, and descriptors save to it and load from it through TreeStorage.
namespace zr::host {

// What is wrong with something stored, and where.
class StorageError : public std::runtime_error {
 public:
    using std::runtime_error::runtime_error;
};

// Where in its file something stands: a line, or a row; 0 for what comes from no file.
using FilePlace = std::uint32_t;

struct StoredValue {
    CString name;
    CString text;
    int number = 0;
    bool isText = false;
    bool isUsed = false;  // was asked for
    FilePlace place = 0;
};

// Sections inside each other; a project has eight. Bounds what recursion over a tree needs of the stack.
inline constexpr std::size_t kMostLevels = 64;

// Values of one section; a project has 30 at most. Values are searched one after the other.
inline constexpr std::size_t kMostValues = 1000;

class StoredSection {
 public:
    CString name;
    std::vector<StoredValue> values;
    std::vector<std::unique_ptr<StoredSection>> children;
    bool isUsed = false;
    FilePlace place = 0;

    // Where to begin the search is a guess: whoever goes through a section in order finds each one at once,
    // if the guess is what stood behind the last. Null when there is none of that name.
    StoredValue* findValue(const CString& wanted, std::size_t guess = 0);
    StoredSection* findChild(const CString& wanted, std::size_t guess = 0);
    StoredSection& addChild(const CString& childName);
    void removeChild(const CString& childName);

 private:
    std::unordered_map<CString, StoredSection*> byName_;  // of the children, once they are many
};

struct StoredTree {
    StoredSection root;
    const char* placeWord = "line";  // what a FilePlace counts
};

// The same names and values in the same order.
bool isSame(const StoredSection& a, const StoredSection& b);

// One storage for descriptors over a tree. A value of another type than the one asked for, and a value where
// a section is asked for or the other way round, raise StorageError.
class TreeStorage : public CZRStorageNode {
 public:
    // Loading never changes the tree: a section that is not there is an empty one, whatever the create flag
    // says.
    enum class Use { Load, Save };
    TreeStorage(StoredTree& tree, Use use) : tree_(tree), use_(use), open_{{&tree.root, 0, 0}} {}

    CList<CString> GetChildNames() override;
    int HasChild(CString name) override;
    void OpenChild(CString name, int create) override;
    void CloseChild() override;
    void RemoveChild(CString name) override;
    int ReadInt(CString name, int defaultValue) override;
    CString ReadString(CString name, CString defaultValue, int flag) override;
    void WriteInt(CString name, int value) override;
    void WriteString(CString name, CString value, int flag) override;

    // Where the value that was read last stands, as messages begin: "line 4, Database/Common: ". Holds also
    // when its section has been closed.
    std::string lastRead() const;
    // Raises StorageError for the first value or section that nobody asked for.
    void requireAllUsed() const;

 private:
    struct Open {
        StoredSection* section;
        std::size_t nextValue;
        std::size_t nextChild;
    };

    StoredSection& current() { return *open_.back().section; }
    // Where something of the current section stands.
    std::string here(FilePlace place) const;
    const StoredValue* read(const CString& name);
    StoredValue& write(const CString& name);

    StoredTree& tree_;
    Use use_;
    std::vector<Open> open_;
    std::vector<std::unique_ptr<StoredSection>> unstored_;  // opened without being there
    const StoredValue* lastRead_ = nullptr;
};

}  // namespace zr::host
