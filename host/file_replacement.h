#pragma once

#include <functional>
#include <stdexcept>
#include <string>
#include <string_view>

namespace zr::host {

// A file that can't be read or written; the message names it and tells why.
class FileError : public std::runtime_error {
 public:
    using std::runtime_error::runtime_error;
};

// Gives a file a new content in one step: whatever interrupts it, the file holds the old content or the new
// one, whole. The new content is written beside the file, brought to the disk, and then takes its name.
// Raises FileError and leaves the file as it was when that can't be done. A link stays a link.
void replaceFile(const std::string& path, std::string_view bytes);

// The same with a content that write brings into the empty file whose path it is given.
void replaceFileBy(const std::string& path, const std::function<void(const std::string&)>& write);

// All bytes of a file. Raises FileError.
std::string readFile(const std::string& path);

}  // namespace zr::host
