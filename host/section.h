#pragma once

#include "zrparsersql/storage.h"

namespace zr::host {

// A child section, current for the length of a block.
class Section {
 public:
    Section(CZRStorageNode& node, CString name, bool create) : node_(node) {
        node_.OpenChild(std::move(name), create);
    }
    ~Section() { node_.CloseChild(); }
    Section(const Section&) = delete;
    Section& operator=(const Section&) = delete;

 private:
    CZRStorageNode& node_;
};

// The section for what the host's classes add to the library's.
inline constexpr const char16_t* kHostSection = u"Host";

}  // namespace zr::host
