#include "platform/code_pages.h"

#include <unicode/ucnv.h>
#include <unicode/ucnv_cb.h>
#include <unicode/ucnv_err.h>

#include <atomic>
#include <memory>
#include <mutex>
#include <new>

namespace zr {
namespace {

constexpr int kFirstTable = 3;
constexpr int kLastTable = 26;
// The tables, and one more for every encoding that has none.
constexpr int kTableCount = kLastTable - kFirstTable + 2;

struct TableSource {
    const char* converter;  // ICU's name
    bool sevenBit;          // bytes from 128 on have no code point
};

// Stored projects know these numbers. Where the comment says "nearest" no converter follows the encoding
// exactly.
constexpr std::array<TableSource, kTableCount> kSources = {{
    {"ISO-8859-2", false},             // 3
    {"ISO-8859-9", false},             // 4
    {"ISO-8859-13", false},            // 5
    {"ISO-8859-1", false},             // 6: Armenian ARMSCII-8; nearest
    {"US-ASCII", true},                // 7: ASCII
    {"windows-1250", false},           // 8
    {"windows-1251", false},           // 9
    {"windows-1256", false},           // 10
    {"windows-1257", false},           // 11
    {"ibm-850", false},                // 12
    {"ibm-852", false},                // 13
    {"ibm-866", false},                // 14
    {"ISO-8859-1", false},             // 15: DEC multinational; nearest, it differs in a dozen places
    {"ISO-8859-1", false},             // 16: Georgian GEOSTD8; nearest
    {"ISO-8859-7", false},             // 17
    {"ISO-8859-8", false},             // 18
    {"hp-roman8", false},              // 19
    {"ibm-852", false},                // 20: Kamenicky; nearest, the same letters at other places
    {"KOI8-R", false},                 // 21
    {"KOI8-R", false},                 // 22
    {"x-mac-centraleurroman", false},  // 23
    {"macintosh", false},              // 24
    {"US-ASCII", true},                // 25: Swedish 7-bit; nearest
    {"TIS-620", false},                // 26: Thai
    {"ISO-8859-1", false},             // anything else
}};

struct ConverterCloser {
    void operator()(UConverter* converter) const { ucnv_close(converter); }
};
using Converter = std::unique_ptr<UConverter, ConverterCloser>;

// Text must not get lost for want of memory, of which ICU tells by its status alone.
bool succeeded(UErrorCode status) {
    if (status == U_MEMORY_ALLOCATION_ERROR) throw std::bad_alloc();
    return U_SUCCESS(status);
}

// ICU's data has a converter for each name above and for the system's encoding, so nothing but memory can be
// missing, even where the status tells of a file: ICU remembers so for good when it had none at its first
// use.
Converter openConverter(const char* name) {
    UErrorCode status = U_ZERO_ERROR;
    Converter converter(ucnv_open(name, &status));
    if (!converter) throw std::bad_alloc();
    return converter;
}

CodeTable makeTable(const TableSource& source) {
    CodeTable table{};
    // The lower half is ASCII everywhere; ICU's PC code pages move three control characters about.
    for (unsigned byte = 0; byte < 128; ++byte) table[byte] = static_cast<char16_t>(byte);
    if (source.sevenBit) return table;
    const Converter converter = openConverter(source.converter);
    UErrorCode status = U_ZERO_ERROR;
    ucnv_setToUCallBack(converter.get(), UCNV_TO_U_CALLBACK_STOP, nullptr, nullptr, nullptr, &status);
    for (unsigned byte = 128; byte < 256; ++byte) {
        const char bytes[] = {static_cast<char>(byte)};
        char16_t units[4];
        status = U_ZERO_ERROR;
        ucnv_resetToUnicode(converter.get());
        const int length = ucnv_toUChars(converter.get(), units, 4, bytes, 1, &status);
        if (succeeded(status) && length == 1) table[byte] = units[0];
    }
    return table;
}

// Made when first asked for, and anew when that failed: std::call_once would do but for the thread sanitizer,
// which doesn't know of a first call that throws.
template <class Value>
class MadeOnce {
 public:
    template <class Make>
    const Value& get(Make make) {
        if (!isMade_.load(std::memory_order_acquire)) {
            const std::lock_guard<std::mutex> lock(mutex_);
            if (!isMade_.load(std::memory_order_relaxed)) {
                value_ = make();
                isMade_.store(true, std::memory_order_release);
            }
        }
        return value_;
    }

 private:
    std::mutex mutex_;
    std::atomic<bool> isMade_{false};
    Value value_{};
};

using ReverseTable = std::unique_ptr<const ReverseCodeTable>;

ReverseTable makeReverse(const CodeTable& table) {
    auto reverse = std::make_unique<ReverseCodeTable>();
    reverse->fill('?');
    for (std::size_t byte = 0; byte < table.size(); ++byte)
        if (table[byte]) (*reverse)[table[byte]] = static_cast<unsigned char>(byte);
    return reverse;
}

class Tables {
 public:
    const CodeTable& forward(int encoding) {
        const std::size_t index = indexOf(encoding);
        return slots_[index].forward.get([index] { return makeTable(kSources[index]); });
    }
    const ReverseCodeTable& reverse(int encoding) {
        const CodeTable& table = forward(encoding);
        return *slots_[indexOf(encoding)].reverse.get([&table] { return makeReverse(table); });
    }

 private:
    struct Slot {
        MadeOnce<CodeTable> forward;
        MadeOnce<ReverseTable> reverse;
    };
    static std::size_t indexOf(int encoding) {
        return static_cast<std::size_t>(
            encoding >= kFirstTable && encoding <= kLastTable ? encoding - kFirstTable : kTableCount - 1);
    }
    std::array<Slot, kTableCount> slots_;
};

Tables& tables() {
    static Tables instance;
    return instance;
}

}  // namespace

const CodeTable& codeTable(int encoding) {
    return tables().forward(encoding);
}
const ReverseCodeTable& reverseCodeTable(int encoding) {
    return tables().reverse(encoding);
}

std::u16string systemToUtf16(std::string_view bytes) {
    const Converter converter = openConverter(nullptr);
    UErrorCode status = U_ZERO_ERROR;
    // At least one byte makes a unit, in every encoding that can be a system's own.
    std::u16string units(bytes.size() * 2 + 1, u'\0');
    const int length = ucnv_toUChars(converter.get(), units.data(), static_cast<int32_t>(units.size()),
                                     bytes.data(), static_cast<int32_t>(bytes.size()), &status);
    units.resize(succeeded(status) ? static_cast<std::size_t>(length) : 0);
    return units;
}

std::string utf16ToSystem(std::u16string_view units) {
    const Converter converter = openConverter(nullptr);
    UErrorCode status = U_ZERO_ERROR;
    ucnv_setSubstChars(converter.get(), "?", 1, &status);
    status = U_ZERO_ERROR;
    const int largest =
        UCNV_GET_MAX_BYTES_FOR_STRING(static_cast<int>(units.size()), ucnv_getMaxCharSize(converter.get()));
    std::string bytes(static_cast<std::size_t>(largest), '\0');
    const int length = ucnv_fromUChars(converter.get(), bytes.data(), largest, units.data(),
                                       static_cast<int32_t>(units.size()), &status);
    bytes.resize(succeeded(status) ? static_cast<std::size_t>(length) : 0);
    return bytes;
}

}  // namespace zr
