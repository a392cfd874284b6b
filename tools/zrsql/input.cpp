#include "input.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <memory>

namespace zr::tool {

namespace {

struct Closer {
    void operator()(std::FILE* file) const {
        if (file != stdin) std::fclose(file);
    }
};

}  // namespace

std::string readBytes(const std::string& path) {
    const std::unique_ptr<std::FILE, Closer> file(path == "-" ? stdin : std::fopen(path.c_str(), "rb"));
    if (!file) throw InputError(path + ": " + std::strerror(errno));
    std::string bytes;
    char block[1 << 16];
    while (const std::size_t count = std::fread(block, 1, sizeof block, file.get()))
        bytes.append(block, count);
    if (std::ferror(file.get()))
        throw InputError((path == "-" ? "standard input" : path) + ": " + std::strerror(errno));
    return bytes;
}

CString decodeText(std::string_view bytes) {
    static constexpr std::string_view mark = "\xEF\xBB\xBF";
    if (bytes.starts_with(mark)) bytes.remove_prefix(mark.size());
    return CString::fromUtf8(bytes);
}

}  // namespace zr::tool
