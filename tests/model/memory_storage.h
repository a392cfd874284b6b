#pragma once

#include <memory>
#include <string>
#include <utility>
#include <variant>
#include <vector>

#include "zrparsersql/storage.h"

namespace zr::test {

// A section with its values and child sections, each in the order in which they were first written.
struct Section {
    std::vector<std::pair<CString, std::variant<int, CString>>> values;
    std::vector<std::pair<CString, std::unique_ptr<Section>>> children;

    Section* child(const CString& name);
    // The section at a path like "Fields/Field1", or null.
    Section* at(const std::string& path);
    // Names of the values, with "," between them.
    std::string keys() const;
    std::string childNames() const;
    int intOf(const CString& name) const;
    CString textOf(const CString& name) const;
    bool has(const CString& name) const;
    void set(const CString& name, std::variant<int, CString> value);
    Section& add(const CString& name);
    // The whole section, a line a value: equal stored forms have equal texts.
    std::string dump(const std::string& indent = "") const;
};

// A storage in memory that notes every call made to it.
class MemoryStorage : public CZRStorageNode {
 public:
    MemoryStorage() : path_{&root} {}

    CList<CString> GetChildNames() override;
    int HasChild(CString name) override;
    void OpenChild(CString name, int create) override;
    void CloseChild() override;
    void RemoveChild(CString name) override;
    int ReadInt(CString name, int defaultValue) override;
    CString ReadString(CString name, CString defaultValue, int flag) override;
    void WriteInt(CString name, int value) override;
    void WriteString(CString name, CString value, int flag) override;

    bool isAtRoot() const { return path_.size() == 1; }
    // Starts the calls anew.
    void forgetCalls() { calls.clear(); }

    Section root;
    std::vector<std::string> calls;  // "open Options 1", "close", "int Selected=1", "text Name='x' 0", ...

 private:
    Section& current() { return *path_.back(); }

    std::vector<Section*> path_;
    std::vector<std::unique_ptr<Section>> unstored_;  // sections opened without being there
};

}  // namespace zr::test
