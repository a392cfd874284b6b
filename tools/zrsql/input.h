#pragma once

#include <stdexcept>
#include <string>
#include <string_view>

#include "zrparsersql/wide_string.h"

namespace zr::tool {

// An input that is not there or can't be read; the message names it.
class InputError : public std::runtime_error {
 public:
    using std::runtime_error::runtime_error;
};

// All bytes of a file, or of standard input for "-". Throws InputError.
std::string readBytes(const std::string& path);

// UTF-8 to UTF-16, without a byte order mark at the start. Each ill-formed piece becomes U+FFFD.
CString decodeText(std::string_view bytes);

}  // namespace zr::tool
