#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace zr::tool {

// Appends the text as a JSON string, quotes included. The result is plain ASCII: every other unit is written
// as \uXXXX, so that unpaired surrogates come out as what they are.
void appendJsonString(std::string& out, std::u16string_view text);
// The same for a text that is known to be ASCII.
void appendJsonString(std::string& out, std::string_view asciiText);

void appendNumber(std::string& out, std::int64_t number);

// Writes the members of one JSON object; the caller writes the braces. Narrow texts are plain ASCII.
class JsonMembers {
 public:
    explicit JsonMembers(std::string& out) : out_(out) {}

    // Appends what stands in front of a member's value, for a caller that writes the value itself.
    void name(std::string_view name);
    void name(std::u16string_view name);
    void text(std::string_view name, std::u16string_view value);
    void text(std::u16string_view name, std::u16string_view value);
    void ascii(std::string_view name, std::string_view value);
    void number(std::string_view name, std::int64_t value);

 private:
    template <class Text>
    void writeName(Text name);

    std::string& out_;
    bool first_ = true;
};

}  // namespace zr::tool
