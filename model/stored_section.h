#pragma once

#include <memory>

#include "zrparsersql/storage.h"

namespace zr {

enum class Missing { Leave, Create };

// A child section, current for the length of a block.
class StoredSection {
 public:
    StoredSection(CZRStorageNode& node, CString name, Missing missing) : node_(node) {
        node_.OpenChild(std::move(name), missing == Missing::Create);
    }
    ~StoredSection() { node_.CloseChild(); }
    StoredSection(const StoredSection&) = delete;
    StoredSection& operator=(const StoredSection&) = delete;

 private:
    CZRStorageNode& node_;
};

// Writes each object into a child section of its own, named by the picture with the numbers from 1 on.
template <class List, class Save>
void saveNumbered(CZRStorageNode& node, const List& list, const char16_t* picture, Save save) {
    int number = 0;
    for (auto* object : list) {
        if (!object) continue;
        CString name;
        name.Format(picture, ++number);
        const StoredSection section(node, name, Missing::Create);
        save(*object);
    }
}

// Goes through the child sections in stored order, whatever their names.
template <class Load>
void forEachStoredChild(CZRStorageNode& node, Load load) {
    const CList<CString> names = node.GetChildNames();
    for (const CString& name : names) {
        const StoredSection section(node, name, Missing::Leave);
        load();
    }
}

}  // namespace zr
