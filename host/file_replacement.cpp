#include "host/file_replacement.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <filesystem>

namespace zr::host {

namespace {

[[noreturn]] void fail(const std::string& path, const char* what) {
    const int reason = errno;
    throw FileError(path + ": " + what + ": " + std::strerror(reason));
}

class Descriptor {
 public:
    explicit Descriptor(int number) : number_(number) {}
    ~Descriptor() { close(); }
    Descriptor(const Descriptor&) = delete;
    Descriptor& operator=(const Descriptor&) = delete;

    int number() const { return number_; }
    explicit operator bool() const { return number_ >= 0; }
    bool close() {
        if (number_ < 0) return true;
        const int result = ::close(number_);
        number_ = -1;
        return result == 0;
    }

 private:
    int number_;
};

// A file beside the one to be replaced; gone with the object unless it has taken that one's name.
class FileBeside {
 public:
    explicit FileBeside(const std::string& target)
        : target_(target), path_(target + ".XXXXXX"), file_(mkostemp(path_.data(), O_CLOEXEC)) {
        if (!file_) fail(target, "no file can be made beside it");
    }
    ~FileBeside() {
        if (!taken_) unlink(path_.c_str());
    }
    FileBeside(const FileBeside&) = delete;
    FileBeside& operator=(const FileBeside&) = delete;

    const std::string& path() const { return path_; }
    void write(std::string_view bytes) {
        while (!bytes.empty()) {
            const ssize_t count = ::write(file_.number(), bytes.data(), bytes.size());
            if (count < 0 && errno == EINTR) continue;
            if (count < 0) fail(target_, "can't be written");
            bytes.remove_prefix(static_cast<std::size_t>(count));
        }
    }

    void takeName() {
        if (fchmod(file_.number(), mode()) != 0 || fsync(file_.number()) != 0 || !file_.close() ||
            rename(path_.c_str(), target_.c_str()) != 0)
            fail(target_, "can't be written");
        taken_ = true;
        bringFolderToDisk();
    }

 private:
    // The replaced file's, or what a new one gets.
    mode_t mode() const {
        struct stat old {};
        if (stat(target_.c_str(), &old) == 0) return old.st_mode & 07777;
        const mode_t mask = umask(0);
        umask(mask);
        return 0666 & ~mask;
    }

    // The new name is part of the folder. The file is whole either way, so that a folder that can't be
    // brought to the disk is no failure.
    void bringFolderToDisk() const {
        const std::filesystem::path folder = std::filesystem::path(target_).parent_path();
        const Descriptor opened(open(folder.empty() ? "." : folder.c_str(), O_RDONLY | O_CLOEXEC));
        if (opened) (void)fsync(opened.number());
    }

    std::string target_;
    std::string path_;
    Descriptor file_;
    bool taken_ = false;
};

std::string withoutLinks(const std::string& path) {
    std::error_code none;
    const std::filesystem::path real = std::filesystem::canonical(path, none);
    return none ? path : real.string();
}

}  // namespace

void replaceFile(const std::string& path, std::string_view bytes) {
    FileBeside beside(withoutLinks(path));
    beside.write(bytes);
    beside.takeName();
}

void replaceFileBy(const std::string& path, const std::function<void(const std::string&)>& write) {
    FileBeside beside(withoutLinks(path));
    write(beside.path());
    beside.takeName();
}

std::string readFile(const std::string& path) {
    const Descriptor file(open(path.c_str(), O_RDONLY | O_CLOEXEC));
    if (!file) fail(path, "can't be opened");
    std::string bytes;
    struct stat state {};
    if (fstat(file.number(), &state) == 0 && S_ISREG(state.st_mode))
        bytes.reserve(static_cast<std::size_t>(state.st_size));
    char block[1 << 16];
    for (;;) {
        const ssize_t count = read(file.number(), block, sizeof block);
        if (count < 0 && errno == EINTR) continue;
        if (count < 0) fail(path, "can't be read");
        if (count == 0) return bytes;
        bytes.append(block, static_cast<std::size_t>(count));
    }
}

}  // namespace zr::host
