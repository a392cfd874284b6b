#include "zrparsersql/wide_string.h"

#include <algorithm>
#include <limits>
#include <new>

#include "platform/case_mapping.h"
#include "platform/utf8.h"

namespace {

constexpr std::size_t kLongest = std::numeric_limits<int>::max() - 1;

int orderOf(int comparison) {
    return comparison < 0 ? -1 : comparison > 0 ? 1 : 0;
}

// A position or count of a caller, brought into 0..limit.
std::size_t clamp(int value, std::size_t limit) {
    return value <= 0 ? 0 : std::min(static_cast<std::size_t>(value), limit);
}

}  // namespace

CString::Rep* CString::create(std::size_t length, std::size_t capacity) {
    if (capacity > kLongest) throw std::bad_alloc();
    void* memory = ::operator new(sizeof(Rep) + (capacity + 1) * sizeof(char16_t));
    Rep* rep =
        new (memory) Rep{{1}, static_cast<std::uint32_t>(length), static_cast<std::uint32_t>(capacity)};
    rep->text()[length] = u'\0';
    return rep;
}

void CString::destroy(Rep* rep) noexcept {
    rep->~Rep();
    ::operator delete(rep);
}

void CString::assign(std::u16string_view text) {
    if (text.empty()) return;
    rep_ = create(text.size(), text.size());
    std::memcpy(rep_->text(), text.data(), text.size() * sizeof(char16_t));
}

void CString::makeUnique() {
    if (rep_ && !isUnique()) *this = CString(View());
}

void CString::append(std::u16string_view text) {
    if (text.empty()) return;
    const std::size_t length = static_cast<std::size_t>(GetLength());
    const std::size_t needed = length + text.size();
    if (rep_ && isUnique() && needed <= rep_->capacity) {
        // The text may be a part of this very buffer; what stands there is not touched.
        std::memcpy(rep_->text() + length, text.data(), text.size() * sizeof(char16_t));
        rep_->text()[needed] = u'\0';
        rep_->length = static_cast<std::uint32_t>(needed);
        return;
    }
    // The first append to a text is often the only one.
    const bool growing = rep_ && isUnique();
    Rep* rep = create(needed, growing ? std::max(needed, std::min(length * 2, kLongest)) : needed);
    std::memcpy(rep->text(), GetString(), length * sizeof(char16_t));
    std::memcpy(rep->text() + length, text.data(), text.size() * sizeof(char16_t));
    release(rep_);
    rep_ = rep;
}

CString CString::concatenate(std::u16string_view left, std::u16string_view right) {
    const std::size_t length = left.size() + right.size();
    if (length == 0) return CString();
    Rep* rep = create(length, length);
    std::copy(left.begin(), left.end(), rep->text());
    std::copy(right.begin(), right.end(), rep->text() + left.size());
    return adopt(rep);
}

void CString::keep(std::size_t first, std::size_t count) {
    if (first == 0 && count == static_cast<std::size_t>(GetLength())) return;
    if (count == 0) return Empty();
    if (!isUnique()) {
        *this = CString(View().substr(first, count));
        return;
    }
    char16_t* text = rep_->text();
    std::memmove(text, text + first, count * sizeof(char16_t));
    text[count] = u'\0';
    rep_->length = static_cast<std::uint32_t>(count);
}

void CString::SetAt(int position, char16_t unit) {
    if (position < 0 || position >= GetLength()) return;
    makeUnique();
    rep_->text()[position] = unit;
}

int CString::Find(std::u16string_view text, int start) const noexcept {
    if (start < 0 || start > GetLength()) return -1;
    const std::size_t found = View().find(text, static_cast<std::size_t>(start));
    return found == std::u16string_view::npos ? -1 : static_cast<int>(found);
}

int CString::Find(char16_t unit, int start) const noexcept {
    return Find(std::u16string_view(&unit, 1), start);
}

CString CString::Left(int count) const {
    return count >= GetLength() ? *this : CString(View().substr(0, clamp(count, View().size())));
}

CString CString::Right(int count) const {
    return count >= GetLength() ? *this : CString(View().substr(View().size() - clamp(count, View().size())));
}

CString CString::Mid(int first) const {
    return Mid(first, GetLength());
}

CString CString::Mid(int first, int count) const {
    const std::u16string_view text = View().substr(clamp(first, View().size()));
    const std::size_t length = clamp(count, text.size());
    return length == View().size() ? *this : CString(text.substr(0, length));
}

int CString::Delete(int position, int count) {
    const std::u16string_view text = View();
    const std::size_t from = clamp(position, text.size());
    const std::size_t removed = clamp(count, text.size() - from);
    if (removed == 0) return GetLength();
    if (from == 0)
        keep(removed, text.size() - removed);
    else if (from + removed == text.size())
        keep(0, from);
    else
        *this = concatenate(text.substr(0, from), text.substr(from + removed));
    return GetLength();
}

int CString::Replace(std::u16string_view oldText, std::u16string_view newText) {
    const std::u16string_view text = View();
    std::size_t found = oldText.empty() ? std::u16string_view::npos : text.find(oldText);
    if (found == std::u16string_view::npos) return 0;
    std::u16string result;
    result.reserve(text.size());
    std::size_t at = 0;
    int count = 0;
    for (; found != std::u16string_view::npos; found = text.find(oldText, at)) {
        result.append(text, at, found - at).append(newText);
        at = found + oldText.size();
        ++count;
    }
    result.append(text, at);
    *this = CString(result);
    return count;
}

CString& CString::Trim() {
    return TrimRight().TrimLeft();
}
CString& CString::Trim(std::u16string_view units) {
    return TrimRight(units).TrimLeft(units);
}

CString& CString::TrimLeft() {
    const std::u16string_view text = View();
    const auto first = std::find_if_not(text.begin(), text.end(), zr::isWhiteSpace);
    keep(static_cast<std::size_t>(first - text.begin()), static_cast<std::size_t>(text.end() - first));
    return *this;
}

CString& CString::TrimRight() {
    const std::u16string_view text = View();
    const auto last = std::find_if_not(text.rbegin(), text.rend(), zr::isWhiteSpace);
    keep(0, static_cast<std::size_t>(text.rend() - last));
    return *this;
}

CString& CString::TrimLeft(std::u16string_view units) {
    const std::size_t first = std::min(View().find_first_not_of(units), View().size());
    keep(first, View().size() - first);
    return *this;
}

CString& CString::TrimRight(std::u16string_view units) {
    keep(0, View().find_last_not_of(units) + 1);
    return *this;
}

CString& CString::MakeLower() {
    if (rep_ && !zr::isLowerAscii(View())) {
        makeUnique();
        zr::makeLower(rep_->text(), rep_->length);
    }
    return *this;
}

CString& CString::MakeUpper() {
    if (rep_ && !zr::isUpperAscii(View())) {
        makeUnique();
        zr::makeUpper(rep_->text(), rep_->length);
    }
    return *this;
}

CString& CString::MakeReverse() {
    if (rep_) {
        makeUnique();
        std::reverse(rep_->text(), rep_->text() + rep_->length);
    }
    return *this;
}

int CString::Compare(std::u16string_view other) const noexcept {
    return orderOf(View().compare(other));
}

int CString::CompareNoCase(std::u16string_view other) const noexcept {
    return zr::compareNoCase(View(), other);
}

bool CString::EqualsNoCase(std::u16string_view other) const noexcept {
    // Simple case folding keeps lengths.
    return View().size() == other.size() && zr::compareNoCase(View(), other) == 0;
}

CString CString::fromUtf8(std::string_view bytes) {
    return CString(zr::utf8ToUtf16(bytes));
}

std::string CString::toUtf8() const {
    return zr::utf16ToUtf8(View());
}
