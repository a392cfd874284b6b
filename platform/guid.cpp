#include "platform/guid.h"

#include <pthread.h>
#include <uuid/uuid.h>

#include <cstdint>
#include <cstring>

namespace zr {
namespace {

// Asking the system for every GUID costs microseconds, and a model of tens of thousands of objects needs one
// for each. So a thread asks for one now and then and derives the next ones from it: GUIDs identify, they
// keep no secrets.
class GuidSequence {
 public:
    void next(unsigned char (&guid)[16]) {
        if (left_ == 0) start();
        --left_;
        ++count_;
        // Each half runs through different values; two halves of two sequences meet by chance alone.
        put(guid, scramble(high_ + count_ * 0x9e3779b97f4a7c15u));
        put(guid + 8, scramble(low_ + count_ * 0xd1b54a32d192ed03u));
        guid[6] = static_cast<unsigned char>((guid[6] & 0x0F) | 0x40);  // version: random
        guid[8] = static_cast<unsigned char>((guid[8] & 0x3F) | 0x80);  // variant
    }
    void end() { left_ = 0; }

 private:
    static constexpr int kLength = 1024;

    void start();

    static std::uint64_t scramble(std::uint64_t value) {
        value = (value ^ (value >> 30)) * 0xbf58476d1ce4e5b9u;
        value = (value ^ (value >> 27)) * 0x94d049bb133111ebu;
        return value ^ (value >> 31);
    }
    static void put(unsigned char* bytes, std::uint64_t value) { std::memcpy(bytes, &value, sizeof value); }

    int left_ = 0;
    std::uint64_t count_ = 0;
    std::uint64_t high_ = 0;
    std::uint64_t low_ = 0;
};

thread_local GuidSequence sequence;

// A forked process goes on with the thread that forked; its sequence must not go on in both.
bool endSequencesOnFork() {
    return pthread_atfork(nullptr, nullptr, [] { sequence.end(); }) == 0;
}

void GuidSequence::start() {
    static const bool registered = endSequencesOnFork();
    uuid_t seed;
    uuid_generate_random(seed);
    std::memcpy(&high_, seed, sizeof high_);
    std::memcpy(&low_, seed + sizeof high_, sizeof low_);
    left_ = registered ? kLength : 1;
}

}  // namespace

int createGuidText(CString& text) {
    static constexpr char16_t kDigits[] = u"0123456789ABCDEF";
    unsigned char guid[16];
    // The service behind it has no way to fail: it falls back to weaker sources of chance by itself.
    sequence.next(guid);
    char16_t units[38];
    char16_t* out = units;
    *out++ = u'{';
    for (int byte = 0; byte < 16; ++byte) {
        if (byte == 4 || byte == 6 || byte == 8 || byte == 10) *out++ = u'-';
        *out++ = kDigits[guid[byte] >> 4];
        *out++ = kDigits[guid[byte] & 15];
    }
    *out++ = u'}';
    text = std::u16string_view(units, static_cast<std::size_t>(out - units));
    return 0;
}

}  // namespace zr
