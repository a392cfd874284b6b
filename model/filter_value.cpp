#include <charconv>
#include <cstdlib>
#include <cstring>
#include <new>
#include <string>
#include <utility>

#include "model/filter_text.h"
#include "platform/case_mapping.h"
#include "platform/date_time.h"
#include "zrparsersql/filter_info.h"

namespace {

// Behind every text, so that it ends whether it is read as bytes or as UTF-16 units.
constexpr std::size_t kTerminatorBytes = 2;

// Values of ValueType that are compared in a way of their own.
constexpr int kTypeFloating = 3;
constexpr int kFirstConvertedType = 2;
constexpr int kLastConvertedType = 5;

// A copy that free() ends; null without memory.
char* copyBytes(const void* bytes, std::size_t length) {
    char* copy = static_cast<char*>(std::malloc(length + kTerminatorBytes));
    if (!copy) return nullptr;
    if (length) std::memcpy(copy, bytes, length);
    std::memset(copy + length, 0, kTerminatorBytes);
    return copy;
}

void release(char*& bytes) {
    std::free(bytes);
    bytes = nullptr;
}

// One unit of a text, which takes one byte or, in UTF-16, two.
bool isUnit(const char* at, std::size_t bytes, char16_t wanted) {
    char16_t unit = 0;
    if (bytes == 1) return *at == static_cast<char>(wanted);
    std::memcpy(&unit, at, sizeof unit);
    return unit == wanted;
}

void putUnit(char* at, std::size_t bytes, char16_t unit) {
    if (bytes == 1)
        *at = static_cast<char>(unit);
    else
        std::memcpy(at, &unit, sizeof unit);
}

std::string_view textOf(const CZRFilterValue& value) {
    return {value.Data, value.DataLength};
}

struct ParsedNumber {
    double value;
    bool isNumber;
};

// Reads as far as the text is a number; a comma counts as the point.
ParsedNumber parseNumber(std::u16string_view units) {
    std::string text;
    for (char16_t unit : units) text += unit < 0x80 ? static_cast<char>(unit == u',' ? u'.' : unit) : '\x7F';
    const char* begin = text.data();
    const char* end = begin + text.size();
    while (begin != end && zr::isWhiteSpace(static_cast<char16_t>(*begin))) ++begin;
    if (begin != end && *begin == '+' && (begin + 1 == end || begin[1] != '-')) ++begin;
    double value = 0;
    const bool isNumber = std::from_chars(begin, end, value).ec == std::errc();
    return {isNumber ? value : 0, isNumber};
}

std::u16string unitsOf(const CZRFilterValue& value) {
    return zr::decodeFilterText(textOf(value), value.Encoding);
}

bool hasSpanBeforeExponent(std::u16string_view text) {
    return !text.substr(0, text.find_first_of(u"Ee")).empty();
}

bool equalsAsText(const CZRFilterValue& value, const CZRFilterValue& other) {
    if (value.ValueType >= kFirstConvertedType && value.ValueType <= kLastConvertedType &&
        value.Encoding != other.Encoding)
        return textOf(value) == zr::convertFilterText(textOf(other), other.Encoding, value.Encoding);
    return textOf(value) == textOf(other);
}

bool equalsAsData(const CZRFilterValue& value, const CZRFilterValue& other) {
    if (value.ValueType == kTypeFloating) {
        const std::u16string left = unitsOf(value);
        const std::u16string right = unitsOf(other);
        if (hasSpanBeforeExponent(left) || hasSpanBeforeExponent(right)) {
            const ParsedNumber a = parseNumber(left);
            const ParsedNumber b = parseNumber(right);
            return a.isNumber && b.isNumber && a.value == b.value;
        }
    }
    return equalsAsText(value, other);
}

bool equalsAsBlob(const CZRFilterValue& value, const CZRFilterValue& other) {
    return value.BlobLength == other.BlobLength &&
           (value.BlobLength == 0 || std::memcmp(value.Blob, other.Blob, value.BlobLength) == 0);
}

}  // namespace

// Delegates, so that a copy that runs out of memory half-way ends like any other value.
CZRFilterValue::CZRFilterValue(const CZRFilterValue& other) : CZRFilterValue() {
    Encoding = other.Encoding;
    ValueType = other.ValueType;
    if (other.Data) {
        Data = copyBytes(other.Data, other.DataLength);
        if (!Data) throw std::bad_alloc();
        DataLength = other.DataLength;
    }
    if (other.Blob && !SetBlob(other.Blob, other.BlobLength)) throw std::bad_alloc();
}

CZRFilterValue& CZRFilterValue::operator=(const CZRFilterValue& other) {
    if (this == &other) return *this;
    CZRFilterValue copy(other);
    std::swap(Data, copy.Data);
    std::swap(Blob, copy.Blob);
    release(Converted);
    DataLength = copy.DataLength;
    BlobLength = copy.BlobLength;
    Encoding = copy.Encoding;
    ConvertedEncoding = copy.ConvertedEncoding;
    ValueType = copy.ValueType;
    return *this;
}

CZRFilterValue::~CZRFilterValue() {
    std::free(Data);
    std::free(Converted);
    std::free(Blob);
}

namespace {

// A value's new text; a null pointer makes it null.
int store(CZRFilterValue& value, const void* bytes, std::size_t length, int encoding, int valueType) {
    value.SetNull(valueType);
    if (!bytes) return 1;
    if (length > UINT32_MAX) return 0;
    value.Data = copyBytes(bytes, length);
    if (!value.Data) return 0;
    value.DataLength = static_cast<std::uint32_t>(length);
    value.Encoding = encoding;
    return 1;
}

// Stores what a step stores; where that runs out of memory, nothing.
template <class Step>
int storeOrNull(CZRFilterValue& value, int valueType, Step step) {
    try {
        return step();
    } catch (const std::bad_alloc&) {
        value.SetNull(valueType);
        return 0;
    }
}

template <class Number>
int storeNumber(CZRFilterValue& value, const char16_t* picture, Number number, int valueType) {
    return storeOrNull(value, valueType, [&] {
        CString text;
        text.Format(picture, number);
        const std::string bytes(text.View().begin(), text.View().end());
        return store(value, bytes.data(), bytes.size(), FE_ASCII, valueType);
    });
}

}  // namespace

void CZRFilterValue::SetNull(int valueType) {
    release(Data);
    release(Converted);
    release(Blob);
    DataLength = 0;
    BlobLength = 0;
    Encoding = FE_ANSI;
    ConvertedEncoding = FE_ANSI;
    ValueType = valueType;
}

int CZRFilterValue::SetDouble(double value, int valueType) {
    return storeNumber(*this, u"%f", value, valueType);
}
int CZRFilterValue::SetInt64(std::int64_t value, int valueType) {
    return storeNumber(*this, u"%I64d", value, valueType);
}
int CZRFilterValue::SetUInt32(std::uint32_t value, int valueType) {
    // Shown as signed, so that the upper half comes out negative: intended, stored projects rely on it.
    return storeNumber(*this, u"%ld", value, valueType);
}
int CZRFilterValue::SetInt32(std::int32_t value, int valueType) {
    return storeNumber(*this, u"%d", value, valueType);
}
int CZRFilterValue::SetInt16(std::int16_t value, int valueType) {
    return storeNumber(*this, u"%hd", value, valueType);
}
int CZRFilterValue::SetInt8(std::int8_t value, int valueType) {
    return storeNumber(*this, u"%d", value, valueType);
}

int CZRFilterValue::SetDate(const zr::DateTime& value, int valueType) {
    if (value.status == zr::DateTime::Status::Null) return SetWide(u"", valueType);
    if (value.status == zr::DateTime::Status::Invalid || !zr::areDaysValid(value.days))
        return SetWide(u"Invalid DateTime", valueType);
    return storeOrNull(*this, valueType,
                       [&] { return SetWide(zr::formatDays(value.days).c_str(), valueType); });
}

int CZRFilterValue::SetWide(const char16_t* text, int valueType) {
    const std::size_t units = text ? std::char_traits<char16_t>::length(text) : 0;
    return store(*this, text, units * sizeof(char16_t), FE_UTF16, valueType);
}

int CZRFilterValue::SetBytes(const void* bytes, std::uint32_t length, int valueType) {
    return store(*this, bytes, length, FE_ASCII, valueType);
}

int CZRFilterValue::SetText(const char* text, int encoding, int valueType) {
    return store(*this, text, text ? std::strlen(text) : 0, encoding, valueType);
}

int CZRFilterValue::SetBlob(const void* bytes, std::uint32_t length) {
    // Copied first: the bytes may be the value's own.
    char* copy = bytes ? copyBytes(bytes, length) : nullptr;
    release(Blob);
    BlobLength = copy ? length : 0;
    Blob = copy;
    return copy || !bytes;
}

const char* CZRFilterValue::GetAs(int encoding) {
    if (!Data || encoding == Encoding) return Data;
    if (Converted && ConvertedEncoding == encoding) return Converted;
    release(Converted);
    try {
        const std::string text = zr::convertFilterText(textOf(*this), Encoding, encoding);
        Converted = copyBytes(text.data(), text.size());
        ConvertedEncoding = encoding;
    } catch (const std::bad_alloc&) {
        return nullptr;
    }
    return Converted;
}

const char16_t* CZRFilterValue::GetWide() {
    return reinterpret_cast<const char16_t*>(GetAs(FE_UTF16));
}

double CZRFilterValue::GetDouble() {
    if (!Data) return 0;
    const std::size_t unit = Encoding == FE_UTF16 ? sizeof(char16_t) : 1;
    bool changed = false;
    for (std::size_t at = 0; at + unit <= DataLength; at += unit) {
        if (isUnit(Data + at, unit, u',')) {
            putUnit(Data + at, unit, u'.');
            changed = true;
        }
    }
    if (changed) release(Converted);
    return parseNumber(unitsOf(*this)).value;
}

int CZRFilterValue::GetDate(zr::DateTime& result) {
    double days = 0;
    if (!Data || !zr::parseDays(unitsOf(*this), days)) return 0;
    result = {days, zr::DateTime::Status::Valid};
    return 1;
}

bool CZRFilterValue::Equals(const CZRFilterValue& other) const {
    if (IsNull() || other.IsNull()) return IsNull() && other.IsNull();
    return ValueType == other.ValueType && equalsAsData(*this, other) && equalsAsBlob(*this, other);
}

bool CZRFilterValue::EqualsLoosely(const CZRFilterValue& other) const {
    if (IsNull() || other.IsNull()) return IsNull() && other.IsNull();
    return equalsAsData(*this, other) && (!Blob || !other.Blob || equalsAsBlob(*this, other));
}
