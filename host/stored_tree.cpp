#include "host/stored_tree.h"

#include <algorithm>

namespace zr::host {

namespace {

// Below that many children looking at each is as fast as a map.
constexpr std::size_t kFewChildren = 16;

// "line 4, Database/Common: ", as far as there is something to tell.
std::string describe(const StoredTree& tree, FilePlace place, const std::string& path) {
    std::string text = place ? std::string(tree.placeWord) + " " + std::to_string(place) : std::string();
    if (!text.empty() && !path.empty()) text += ", ";
    text += path;
    return text.empty() ? text : text + ": ";
}

std::string joined(const std::string& path, const CString& name) {
    return path.empty() ? name.toUtf8() : path + "/" + name.toUtf8();
}

std::string inQuotes(const CString& name) {
    return "\"" + name.toUtf8() + "\"";
}

// Calls visit(section, path) for a section and all below it, in order, until it answers true. As deep as the
// tree, which kMostLevels bounds.
template <class Visit>
bool walk(const StoredSection& section, const std::string& path, const Visit& visit) {
    if (visit(section, path)) return true;
    return std::any_of(section.children.begin(), section.children.end(),
                       [&](const auto& child) { return walk(*child, joined(path, child->name), visit); });
}

}  // namespace

StoredValue* StoredSection::findValue(const CString& wanted, std::size_t guess) {
    for (std::size_t at = guess; at < values.size(); ++at)
        if (values[at].name == wanted) return &values[at];
    for (std::size_t at = 0; at < guess && at < values.size(); ++at)
        if (values[at].name == wanted) return &values[at];
    return nullptr;
}

StoredSection* StoredSection::findChild(const CString& wanted, std::size_t guess) {
    if (guess < children.size() && children[guess]->name == wanted) return children[guess].get();
    if (!byName_.empty()) {
        const auto found = byName_.find(wanted);
        return found == byName_.end() ? nullptr : found->second;
    }
    for (const auto& child : children)
        if (child->name == wanted) return child.get();
    return nullptr;
}

StoredSection& StoredSection::addChild(const CString& childName) {
    children.push_back(std::make_unique<StoredSection>());
    StoredSection& child = *children.back();
    child.name = childName;
    if (byName_.empty() && children.size() > kFewChildren)
        for (const auto& each : children) byName_.emplace(each->name, each.get());
    else if (!byName_.empty())
        byName_.emplace(childName, &child);
    return child;
}

void StoredSection::removeChild(const CString& childName) {
    byName_.clear();
    std::erase_if(children, [&](const auto& child) { return child->name == childName; });
}

bool isSame(const StoredSection& a, const StoredSection& b) {
    const auto sameValue = [](const StoredValue& x, const StoredValue& y) {
        return x.name == y.name && x.isText == y.isText && x.number == y.number && x.text == y.text;
    };
    return a.name == b.name &&
           std::equal(a.values.begin(), a.values.end(), b.values.begin(), b.values.end(), sameValue) &&
           std::equal(a.children.begin(), a.children.end(), b.children.begin(), b.children.end(),
                      [](const auto& x, const auto& y) { return isSame(*x, *y); });
}

std::string TreeStorage::here(FilePlace place) const {
    std::string path;
    for (std::size_t level = 1; level < open_.size(); ++level)
        path = joined(path, open_[level].section->name);
    return describe(tree_, place, path);
}

std::string TreeStorage::lastRead() const {
    std::string found;
    walk(tree_.root, std::string(), [&](const StoredSection& section, const std::string& path) {
        const bool isThere = lastRead_ && !section.values.empty() && lastRead_ >= section.values.data() &&
                             lastRead_ < section.values.data() + section.values.size();
        if (isThere) found = describe(tree_, lastRead_->place, path);
        return isThere;
    });
    return found;
}

void TreeStorage::requireAllUsed() const {
    walk(tree_.root, std::string(), [&](const StoredSection& section, const std::string& path) {
        for (const StoredValue& value : section.values)
            if (!value.isUsed)
                throw StorageError(describe(tree_, value.place, path) + "there is no value " +
                                   inQuotes(value.name) + " in this section");
        for (const auto& child : section.children)
            if (!child->isUsed)
                throw StorageError(describe(tree_, child->place, path) + "there is no section " +
                                   inQuotes(child->name) + " in this section");
        return false;
    });
}

CList<CString> TreeStorage::GetChildNames() {
    CList<CString> names;
    for (const auto& child : current().children) names.AddTail(child->name);
    return names;
}

int TreeStorage::HasChild(CString name) {
    return current().findChild(name) != nullptr;
}

void TreeStorage::OpenChild(CString name, int create) {
    Open& open = open_.back();
    StoredSection* section = open.section->findChild(name, open.nextChild);
    ++open.nextChild;
    if (!section) {
        if (const StoredValue* value = open.section->findValue(name))
            throw StorageError(here(value->place) + inQuotes(name) + " has to be a section, and is a value");
        if (open_.size() > kMostLevels) throw StorageError(here(0) + "sections are nested too deeply");
        if (create && use_ == Use::Save) {
            section = &open.section->addChild(name);
        } else {
            unstored_.push_back(std::make_unique<StoredSection>());
            section = unstored_.back().get();
            section->name = name;
        }
    }
    section->isUsed = true;
    open_.push_back({section, 0, 0});
}

void TreeStorage::CloseChild() {
    open_.pop_back();
}

void TreeStorage::RemoveChild(CString name) {
    current().removeChild(name);
}

const StoredValue* TreeStorage::read(const CString& name) {
    Open& open = open_.back();
    StoredValue* value = open.section->findValue(name, open.nextValue);
    if (!value) {
        if (const StoredSection* child = open.section->findChild(name))
            throw StorageError(here(child->place) + inQuotes(name) + " has to be a value, and is a section");
        return nullptr;
    }
    open.nextValue = static_cast<std::size_t>(value - open.section->values.data()) + 1;
    value->isUsed = true;
    lastRead_ = value;
    return value;
}

int TreeStorage::ReadInt(CString name, int defaultValue) {
    const StoredValue* value = read(name);
    if (value && value->isText)
        throw StorageError(here(value->place) + inQuotes(name) + " has to be a whole number, and is a text");
    return value ? value->number : defaultValue;
}

CString TreeStorage::ReadString(CString name, CString defaultValue, int /*flag*/) {
    const StoredValue* value = read(name);
    if (value && !value->isText)
        throw StorageError(here(value->place) + inQuotes(name) + " has to be a text, and is a number");
    return value ? value->text : defaultValue;
}

StoredValue& TreeStorage::write(const CString& name) {
    StoredSection& section = current();
    if (StoredValue* value = section.findValue(name)) return *value;
    if (section.findChild(name))
        throw StorageError(here(0) + inQuotes(name) + " is a section and can't be a value as well");
    section.values.emplace_back();
    section.values.back().name = name;
    return section.values.back();
}

void TreeStorage::WriteInt(CString name, int value) {
    StoredValue& stored = write(name);
    stored.isText = false;
    stored.text.Empty();
    stored.number = value;
}

void TreeStorage::WriteString(CString name, CString value, int /*flag*/) {
    StoredValue& stored = write(name);
    stored.isText = true;
    stored.number = 0;
    stored.text = std::move(value);
}

}  // namespace zr::host
