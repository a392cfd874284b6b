#pragma once

#if defined(_MSVC_LANG) ? _MSVC_LANG < 202002L : __cplusplus < 202002L
#error "The headers of ZRParserSQL are C++20: compile with -std=c++20 or newer"
#endif

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <functional>
#include <string>
#include <string_view>
#include <type_traits>

#include "zrparsersql/export.h"

class CString;

namespace zr {

// One argument of CString::Format. Made implicitly from numbers, characters, char16_t text and CString; it
// points at text and does not own it, so it lives no longer than the call.
class FormatArgument {
 public:
    enum class Kind { Signed, Unsigned, Floating, Text };

    template <class Integer>
    requires(std::is_integral_v<Integer>) FormatArgument(Integer value)
        : kind(std::is_signed_v<Integer> ? Kind::Signed : Kind::Unsigned),
          bytes(sizeof(Integer)),
          bits(static_cast<std::uint64_t>(value)) {}
    template <class Enumeration>
    requires(std::is_enum_v<Enumeration>) FormatArgument(Enumeration value)
        : FormatArgument(static_cast<std::underlying_type_t<Enumeration>>(value)) {}
    FormatArgument(double value) : kind(Kind::Floating), floating(value) {}
    FormatArgument(const char16_t* value)
        : kind(Kind::Text), text(value ? std::u16string_view(value) : std::u16string_view()) {}
    FormatArgument(std::u16string_view value) : kind(Kind::Text), text(value) {}
    inline FormatArgument(const CString& value);

    Kind kind;
    std::size_t bytes = 0;   // width of an integer as it was passed
    std::uint64_t bits = 0;  // an integer, sign-extended
    double floating = 0;
    std::u16string_view text;
};

}  // namespace zr

// Text in UTF-16 units, with value semantics.
//
// Positions and lengths count UTF-16 units. Any sequence of units is allowed, unpaired surrogates and zeros
// included; operations that take a bare pointer read up to the first zero. Copies share one buffer until one
// of them is changed, so that copying is cheap whatever the length, and an empty text owns nothing.
//
// Threads: distinct objects may be used from distinct threads, even when they share a buffer. One object
// needs the caller's own guard as soon as a thread changes it. Failure: only an exhausted heap, as
// std::bad_alloc; positions and lengths out of range are brought into range.
class ZR_SHARED_DECLARATION CString {
 public:
    CString() noexcept = default;
    CString(const CString& other) noexcept : rep_(other.rep_) { retain(rep_); }
    CString(CString&& other) noexcept : rep_(other.rep_) { other.rep_ = nullptr; }
    // A null pointer gives an empty text.
    CString(const char16_t* text) : CString(text ? std::u16string_view(text) : std::u16string_view()) {}
    CString(std::u16string_view text) { assign(text); }
    CString(const std::u16string& text) : CString(std::u16string_view(text)) {}
    CString(const char16_t* text, std::size_t length) : CString(std::u16string_view(text, length)) {}
    // Narrow text is read as UTF-8, with U+FFFD where it is not.
    CString(const char* text) : CString(fromUtf8(text ? std::string_view(text) : std::string_view())) {}
    ~CString() { release(rep_); }

    CString& operator=(const CString& other) noexcept {
        Rep* old = rep_;
        retain(other.rep_);
        rep_ = other.rep_;
        release(old);
        return *this;
    }
    CString& operator=(CString&& other) noexcept {
        if (this != &other) {
            Rep* old = rep_;
            rep_ = other.rep_;
            other.rep_ = nullptr;
            release(old);
        }
        return *this;
    }
    // The text given may be part of this object.
    CString& operator=(std::u16string_view text) { return *this = CString(text); }
    CString& operator=(const char16_t* text) { return *this = CString(text); }
    CString& operator=(const char* text) { return *this = CString(text); }

    int GetLength() const noexcept { return rep_ ? static_cast<int>(rep_->length) : 0; }
    bool IsEmpty() const noexcept { return rep_ == nullptr; }
    void Empty() noexcept {
        release(rep_);
        rep_ = nullptr;
    }

    // The unit at a position; 0 outside of the text.
    char16_t GetAt(int position) const noexcept {
        return position >= 0 && position < GetLength() ? rep_->text()[position] : u'\0';
    }
    char16_t operator[](int position) const noexcept { return GetAt(position); }
    // Outside of the text nothing happens.
    void SetAt(int position, char16_t unit);

    // The units with a zero behind them. Never null. The pointer holds as long as this object is neither
    // changed nor destroyed; reading, copying it and changing its copies keep the pointer.
    const char16_t* GetString() const noexcept { return rep_ ? rep_->text() : u""; }
    // The same units as a view, for as long.
    std::u16string_view View() const noexcept {
        return rep_ ? std::u16string_view(rep_->text(), rep_->length) : std::u16string_view();
    }
    operator std::u16string_view() const noexcept { return View(); }

    // Position of the first occurrence at or behind start, or -1. Empty text is found at start. A start
    // outside of the text finds nothing.
    int Find(std::u16string_view text, int start = 0) const noexcept;
    int Find(char16_t unit, int start = 0) const noexcept;

    // Parts of the text. Counts below zero count as zero, counts beyond the end as up to the end.
    CString Left(int count) const;
    CString Right(int count) const;
    CString Mid(int first) const;
    CString Mid(int first, int count) const;

    // Removes count units from a position on; gives the new length.
    int Delete(int position, int count = 1);
    // Replaces every occurrence, left to right, without looking into what was put in; gives the number
    // replaced. Replacing empty text does nothing.
    int Replace(std::u16string_view oldText, std::u16string_view newText);

    // Without an argument: remove white space (Unicode's). With one: remove units that occur in it.
    CString& Trim();
    CString& TrimLeft();
    CString& TrimRight();
    CString& Trim(std::u16string_view units);
    CString& TrimLeft(std::u16string_view units);
    CString& TrimRight(std::u16string_view units);

    // Case mapping by Unicode's simple mappings, code point by code point, whatever the locale: the length
    // never changes. MakeReverse reverses units.
    CString& MakeLower();
    CString& MakeUpper();
    CString& MakeReverse();

    // Below 0, 0 or above 0 as this text sorts before, equals or sorts behind the other, unit by unit.
    // CompareNoCase compares code points after Unicode's simple case folding.
    int Compare(std::u16string_view other) const noexcept;
    int CompareNoCase(std::u16string_view other) const noexcept;
    bool EqualsNoCase(std::u16string_view other) const noexcept;

    CString& operator+=(std::u16string_view text) {
        append(text);
        return *this;
    }
    CString& operator+=(const CString& text) {
        if (IsEmpty()) return *this = text;
        append(text.View());
        return *this;
    }
    CString& operator+=(const char16_t* text) { return *this += CString(text).View(); }
    CString& operator+=(char16_t unit) {
        append(std::u16string_view(&unit, 1));
        return *this;
    }

    // Replaces the text by a printf-like picture. Conversions: %s (char16_t text or CString), %c (a unit), %d
    // %i %u %x %X with the sizes h, hh, l, ll and I64, %f with an optional precision, %%; flags '-', '+', ' '
    // and '0' and a width. Sizes never decide how an argument is read: an integer keeps the width it was
    // passed with, and h and hh cut it to 16 and 8 bits. The decimal point is always '.'. A conversion
    // without argument, or one that does not fit the kind of its argument, prints nothing. The arguments may
    // be this object itself.
    template <class... Arguments>
    void Format(const char16_t* picture, const Arguments&... arguments) {
        if constexpr (sizeof...(Arguments) == 0) {
            format(picture, nullptr, 0);
        } else {
            const zr::FormatArgument list[] = {zr::FormatArgument(arguments)...};
            format(picture, list, sizeof...(Arguments));
        }
    }

    // From UTF-8. Bytes that are no UTF-8 become U+FFFD, one for each ill-formed piece; the three-byte form
    // of a surrogate is taken as that surrogate, so that fromUtf8(toUtf8()) gives back any text unchanged.
    static CString fromUtf8(std::string_view bytes);
    // To UTF-8. An unpaired surrogate is written in the three-byte form that its number has (ED
    // A0..BF 80..BF).
    std::string toUtf8() const;

    // Equal texts have equal hashes; the same on every run.
    std::size_t Hash() const noexcept { return hash(View()); }
    static std::size_t hash(std::u16string_view text) noexcept {
        std::uint64_t state = 0x9e3779b97f4a7c15u ^ text.size();
        const char16_t* at = text.data();
        std::size_t left = text.size();
        for (; left >= 4; left -= 4, at += 4) {
            std::uint64_t four;
            std::memcpy(&four, at, sizeof four);
            state = mix(state ^ four);
        }
        std::uint64_t rest = 0;
        if (left) std::memcpy(&rest, at, left * sizeof(char16_t));
        return static_cast<std::size_t>(mix(state ^ rest));
    }

    // Friends found through an operand that is a CString, so that they take no part in anyone else's
    // comparisons.
    friend bool operator==(const CString& left, const CString& right) noexcept {
        return left.rep_ == right.rep_ || left.View() == right.View();
    }
    friend bool operator==(const CString& left, std::u16string_view right) noexcept {
        return left.View() == right;
    }
    friend bool operator==(const CString& left, const std::u16string& right) noexcept {
        return left.View() == std::u16string_view(right);
    }
    friend bool operator==(const CString& left, const char16_t* right) noexcept {
        return left.View() == std::u16string_view(right);
    }
    friend bool operator<(const CString& left, const CString& right) noexcept {
        return left.Compare(right) < 0;
    }

    friend CString operator+(const CString& left, const CString& right) {
        if (left.IsEmpty()) return right;
        if (right.IsEmpty()) return left;
        return concatenate(left.View(), right.View());
    }
    friend CString operator+(const CString& left, std::u16string_view right) {
        return concatenate(left.View(), right);
    }
    friend CString operator+(std::u16string_view left, const CString& right) {
        return concatenate(left, right.View());
    }
    friend CString operator+(const CString& left, const char16_t* right) {
        return concatenate(left.View(), right);
    }
    friend CString operator+(const char16_t* left, const CString& right) {
        return concatenate(left, right.View());
    }

    friend void swap(CString& a, CString& b) noexcept {
        Rep* rep = a.rep_;
        a.rep_ = b.rep_;
        b.rep_ = rep;
    }

 private:
    // Header of a shared buffer; the units and a zero stand behind it.
    struct Rep {
        std::atomic<std::uint32_t> owners;
        std::uint32_t length;
        std::uint32_t capacity;
        char16_t* text() noexcept { return reinterpret_cast<char16_t*>(this + 1); }
    };

    static std::uint64_t mix(std::uint64_t value) noexcept {
        value *= 0xff51afd7ed558ccdu;
        value ^= value >> 32;
        value *= 0xc4ceb9fe1a85ec53u;
        return value ^ (value >> 29);
    }
    static void retain(Rep* rep) noexcept {
        if (rep) rep->owners.fetch_add(1, std::memory_order_relaxed);
    }
    static void release(Rep* rep) noexcept {
        if (!rep) return;
        // The last owner needs no read-modify-write: nobody else can take a share any more.
        if (rep->owners.load(std::memory_order_acquire) == 1 ||
            rep->owners.fetch_sub(1, std::memory_order_acq_rel) == 1)
            destroy(rep);
    }
    static Rep* create(std::size_t length, std::size_t capacity);
    static void destroy(Rep* rep) noexcept;
    static CString adopt(Rep* rep) noexcept {
        CString result;
        result.rep_ = rep;
        return result;
    }
    static CString concatenate(std::u16string_view left, std::u16string_view right);
    bool isUnique() const noexcept { return rep_->owners.load(std::memory_order_acquire) == 1; }
    void makeUnique();
    void assign(std::u16string_view text);
    void append(std::u16string_view text);
    void keep(std::size_t first, std::size_t count);
    void format(std::u16string_view picture, const zr::FormatArgument* arguments, std::size_t count);

    Rep* rep_ = nullptr;  // null for an empty text, and only for that
};

inline zr::FormatArgument::FormatArgument(const CString& value) : kind(Kind::Text), text(value.View()) {}

template <>
struct std::hash<CString> {
    std::size_t operator()(const CString& text) const noexcept { return text.Hash(); }
};
