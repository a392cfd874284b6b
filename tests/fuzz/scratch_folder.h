#pragma once

#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <string_view>

namespace zr::fuzz {

/// A folder for the files of one run, in memory where there is such a place: a target writes some for every
/// input.
class ScratchFolder {
 public:
    ScratchFolder() {
        static int count = 0;
        path_ = place() / ("zr_fuzz_" + std::to_string(::getpid()) + "_" + std::to_string(++count));
        std::filesystem::create_directories(path_);
    }
    ~ScratchFolder() {
        std::error_code ignored;
        std::filesystem::remove_all(path_, ignored);
    }
    ScratchFolder(const ScratchFolder&) = delete;
    ScratchFolder& operator=(const ScratchFolder&) = delete;

    std::string path(const std::string& name) const { return (path_ / name).string(); }
    std::string write(const std::string& name, std::string_view bytes) const {
        std::ofstream(path_ / name, std::ios::binary) << bytes;
        return path(name);
    }

 private:
    static std::filesystem::path place() {
        const std::filesystem::path memory = "/dev/shm";
        return ::access(memory.c_str(), W_OK) == 0 ? memory : std::filesystem::temp_directory_path();
    }

    std::filesystem::path path_;
};

inline std::string bytesOf(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), {}};
}

}  // namespace zr::fuzz
