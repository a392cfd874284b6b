#include "tests/model/memory_storage.h"

#include <gtest/gtest.h>

namespace zr::test {

Section* Section::child(const CString& name) {
    for (auto& [childName, section] : children)
        if (childName == name) return section.get();
    return nullptr;
}

Section* Section::at(const std::string& path) {
    const std::size_t slash = path.find('/');
    Section* found = child(CString(path.substr(0, slash).c_str()));
    return found && slash != std::string::npos ? found->at(path.substr(slash + 1)) : found;
}

std::string Section::keys() const {
    std::string names;
    for (const auto& [name, value] : values) names += (names.empty() ? "" : ",") + name.toUtf8();
    return names;
}

std::string Section::childNames() const {
    std::string names;
    for (const auto& [name, section] : children) names += (names.empty() ? "" : ",") + name.toUtf8();
    return names;
}

bool Section::has(const CString& name) const {
    for (const auto& [key, value] : values)
        if (key == name) return true;
    return false;
}

int Section::intOf(const CString& name) const {
    for (const auto& [key, value] : values)
        if (key == name) return std::get<int>(value);
    ADD_FAILURE() << "no value " << name.toUtf8();
    return -999;
}

CString Section::textOf(const CString& name) const {
    for (const auto& [key, value] : values)
        if (key == name) return std::get<CString>(value);
    ADD_FAILURE() << "no value " << name.toUtf8();
    return CString();
}

void Section::set(const CString& name, std::variant<int, CString> value) {
    for (auto& [key, held] : values) {
        if (key == name) {
            held = std::move(value);
            return;
        }
    }
    values.emplace_back(name, std::move(value));
}

Section& Section::add(const CString& name) {
    if (Section* found = child(name)) return *found;
    children.emplace_back(name, std::make_unique<Section>());
    return *children.back().second;
}

std::string Section::dump(const std::string& indent) const {
    std::string text;
    for (const auto& [name, value] : values)
        text += indent + name.toUtf8() + " = " +
                (value.index() == 0 ? std::to_string(std::get<int>(value))
                                    : "'" + std::get<CString>(value).toUtf8() + "'") +
                "\n";
    for (const auto& [name, section] : children)
        text += indent + name.toUtf8() + "\n" + section->dump(indent + "  ");
    return text;
}

CList<CString> MemoryStorage::GetChildNames() {
    calls.push_back("names");
    CList<CString> names;
    for (const auto& entry : current().children) names.AddTail(entry.first);
    return names;
}

int MemoryStorage::HasChild(CString name) {
    calls.push_back("has " + name.toUtf8());
    return current().child(name) != nullptr;
}

void MemoryStorage::OpenChild(CString name, int create) {
    calls.push_back("open " + name.toUtf8() + " " + std::to_string(create));
    Section* section = create ? &current().add(name) : current().child(name);
    if (!section) {
        unstored_.push_back(std::make_unique<Section>());
        section = unstored_.back().get();
    }
    path_.push_back(section);
}

void MemoryStorage::CloseChild() {
    calls.push_back("close");
    ASSERT_GT(path_.size(), 1u) << "more sections closed than opened";
    path_.pop_back();
}

void MemoryStorage::RemoveChild(CString name) {
    calls.push_back("remove " + name.toUtf8());
    std::erase_if(current().children, [&name](const auto& entry) { return entry.first == name; });
}

int MemoryStorage::ReadInt(CString name, int defaultValue) {
    calls.push_back("int " + name.toUtf8() + "?" + std::to_string(defaultValue));
    return current().has(name) ? current().intOf(name) : defaultValue;
}

CString MemoryStorage::ReadString(CString name, CString defaultValue, int flag) {
    calls.push_back("text " + name.toUtf8() + "?'" + defaultValue.toUtf8() + "' " + std::to_string(flag));
    return current().has(name) ? current().textOf(name) : defaultValue;
}

void MemoryStorage::WriteInt(CString name, int value) {
    calls.push_back("int " + name.toUtf8() + "=" + std::to_string(value));
    current().set(name, value);
}

void MemoryStorage::WriteString(CString name, CString value, int flag) {
    calls.push_back("text " + name.toUtf8() + "='" + value.toUtf8() + "' " + std::to_string(flag));
    current().set(name, value);
}

}  // namespace zr::test
