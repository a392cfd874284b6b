#include "table_words.h"

#include <charconv>

#include "project_options.h"

namespace zr::tool {

namespace {

std::string trimmed(const std::string& text) {
    const auto begin = text.find_first_not_of(' ');
    if (begin == std::string::npos) return {};
    return text.substr(begin, text.find_last_not_of(' ') - begin + 1);
}

std::vector<std::string> splitNames(const std::string& list, const std::string& word) {
    std::vector<std::string> names;
    for (std::size_t begin = 0; begin <= list.size();) {
        const std::size_t end = std::min(list.find(',', begin), list.size());
        names.push_back(trimmed(list.substr(begin, end - begin)));
        if (names.back().empty()) throw WrongUse("\"" + word + "\": the name of a column is missing");
        begin = end + 1;
    }
    return names;
}

CString columnOf(host::Table& table, const std::string& name) {
    const CZRSourceFildInfo* field = table.FindFieldBySrcName(CString(name.c_str()));
    if (!field) throw WrongUse("the table has no column \"" + name + "\"");
    return field->GetSrcName();
}

bool readNumber(const std::string& text, int& number) {
    const char* end = text.data() + text.size();
    return !text.empty() && std::from_chars(text.data(), end, number).ptr == end && number >= 0;
}

// "(10,2)" or "(10)"; anything else stays part of the type's name.
bool readSize(const std::string& size, int& length, int& scale) {
    const std::size_t comma = size.find(',');
    if (comma == std::string::npos) return readNumber(trimmed(size), length);
    int readLength = 0;
    if (!readNumber(trimmed(size.substr(0, comma)), readLength) ||
        !readNumber(trimmed(size.substr(comma + 1)), scale))
        return false;
    length = readLength;
    return true;
}

}  // namespace

std::unique_ptr<host::Field> readColumn(const std::string& word) {
    const std::size_t colon = word.find(':');
    const std::string name = trimmed(word.substr(0, colon));
    if (name.empty()) throw WrongUse("\"" + word + "\": the name of the column is missing");
    auto field = std::make_unique<host::Field>();
    host::setNames(*field, CString(name.c_str()));
    if (colon == std::string::npos) return field;

    std::string type = trimmed(word.substr(colon + 1));
    if (const std::size_t open = type.find('(');
        open != std::string::npos && type.back() == ')' &&
        readSize(type.substr(open + 1, type.size() - open - 2), field->Length, field->Scale))
        type = trimmed(type.substr(0, open));
    if (type.empty()) throw WrongUse("\"" + word + "\": the type of the column is missing");
    field->SetType(CString(type.c_str()));
    return field;
}

std::unique_ptr<host::Index> readIndex(const std::string& word, host::Table& table) {
    auto index = std::make_unique<host::Index>();
    for (const std::string& name : splitNames(word, word)) index->addColumn(columnOf(table, name));
    return index;
}

std::unique_ptr<host::ForeignKey> readForeignKey(const std::string& word, host::Table& table) {
    const std::size_t equals = word.find('=');
    if (equals == std::string::npos)
        throw WrongUse("\"" + word + "\": a foreign key is written COLUMNS=TABLE(COLUMNS)");
    const std::vector<std::string> columns = splitNames(word.substr(0, equals), word);
    std::string target = trimmed(word.substr(equals + 1));
    std::vector<std::string> referenced = columns;
    if (const std::size_t open = target.find('('); open != std::string::npos) {
        if (target.back() != ')') throw WrongUse("\"" + word + "\": the last parenthesis is missing");
        referenced = splitNames(target.substr(open + 1, target.size() - open - 2), word);
        target = trimmed(target.substr(0, open));
    }
    if (target.empty()) throw WrongUse("\"" + word + "\": the name of the other table is missing");
    if (referenced.size() != columns.size())
        throw WrongUse("\"" + word + "\": as many columns have to stand on both sides");

    auto key = std::make_unique<host::ForeignKey>();
    key->ReferencedTable = CString(target.c_str());
    for (std::size_t at = 0; at < columns.size(); ++at)
        key->Columns.AddTail({columnOf(table, columns[at]), CString(referenced[at].c_str())});
    return key;
}

}  // namespace zr::tool
