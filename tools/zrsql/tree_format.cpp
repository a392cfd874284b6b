#include "tree_format.h"

#include <algorithm>
#include <new>
#include <vector>

#include "json_text.h"
#include "zrparsersql/wide_string.h"

namespace zr::tool {

namespace {

struct Node {
    std::int32_t type;
    std::u16string_view text;
    ANTLR3_UINT32 childCount;
    std::size_t depth;    // 0 for the root
    ANTLR3_UINT32 place;  // among its parent's children, from 0
};

// Takes a visitor through a tree: enter(node) ahead of a node's children, leave(node's child count) behind
// them. The path to the current node is kept on a stack of its own, so a deep tree needs no machine stack.
template <class Visitor>
void walk(pANTLR3_BASE_TREE root, Visitor& visitor) {
    struct Step {
        pANTLR3_BASE_TREE tree;
        ANTLR3_UINT32 count;
        ANTLR3_UINT32 next;
    };
    std::vector<Step> path;
    const auto enter = [&](pANTLR3_BASE_TREE tree, ANTLR3_UINT32 place) {
        const ANTLR3_UINT32 count = tree->getChildCount(tree);
        // The runtime's own text of a nil node is plain characters.
        const auto text = tree->isNilNode(tree) ? u"nil" : runtimeText(tree->getText(tree));
        visitor.enter(Node{tokenNumber(tree->getType(tree)), text, count, path.size(), place});
        path.push_back({tree, count, 0});
    };

    enter(root, 0);
    while (!path.empty()) {
        Step& step = path.back();
        if (step.next == step.count) {
            visitor.leave(step.count);
            path.pop_back();
        } else {
            const ANTLR3_UINT32 place = step.next++;
            enter(static_cast<pANTLR3_BASE_TREE>(step.tree->getChild(step.tree, place)), place);
        }
    }
}

class SexprWriter {
 public:
    explicit SexprWriter(std::string& out) : out_(out) {}
    void enter(const Node& node) {
        if (node.depth) out_ += ' ';
        out_ += '(';
        appendNumber(out_, node.type);
        out_ += ' ';
        appendJsonString(out_, node.text);
    }
    void leave(ANTLR3_UINT32 /*childCount*/) { out_ += ')'; }

 private:
    std::string& out_;
};

// {"type":..,"name":..,"text":..,"children":[..]}; a leaf has no children member.
class JsonWriter {
 public:
    JsonWriter(std::string& out, const Grammar& grammar) : out_(out), grammar_(grammar) {}
    void enter(const Node& node) {
        if (node.place) out_ += ',';
        out_ += '{';
        JsonMembers members(out_);
        members.number("type", node.type);
        members.ascii("name", grammar_.tokenName(node.type));
        members.text("text", node.text);
        if (node.childCount) {
            members.name("children");
            out_ += '[';
        }
    }
    void leave(ANTLR3_UINT32 childCount) { out_ += childCount ? "]}" : "}"; }

 private:
    std::string& out_;
    const Grammar& grammar_;
};

std::string utf8(std::u16string_view text) {
    return CString(text).toUtf8();
}

class DotWriter {
 public:
    explicit DotWriter(std::string& out) : out_(out) { out_ += "digraph tree {\n  node [shape=box];\n"; }
    void enter(const Node& node) {
        const std::string number = std::to_string(count_++);
        out_ += "  n" + number + " [label=\"" + escaped(utf8(node.text)) + "\"];\n";
        if (!path_.empty()) out_ += "  n" + path_.back() + " -> n" + number + ";\n";
        path_.push_back(number);
    }
    void leave(ANTLR3_UINT32 /*childCount*/) {
        path_.pop_back();
        if (path_.empty()) out_ += "}\n";
    }

 private:
    static std::string escaped(const std::string& text) {
        std::string result;
        for (const char character : text) {
            if (character == '"' || character == '\\') result += '\\';
            if (character == '\n')
                result += "\\n";
            else
                result += character;
        }
        return result;
    }

    std::string& out_;
    std::size_t count_ = 0;
    std::vector<std::string> path_;
};

// An indented line a node: the token's name, and its text where that says more.
class PrettyWriter {
 public:
    PrettyWriter(std::string& out, const Grammar& grammar) : out_(out), grammar_(grammar) {}
    void enter(const Node& node) {
        // Indenting without end would make a chain of 10,000 nodes a hundred megabytes.
        static constexpr std::size_t deepestIndent = 40;
        out_.append(2 * std::min(node.depth, deepestIndent), ' ');
        if (node.depth > deepestIndent) out_ += "[level " + std::to_string(node.depth) + "] ";
        const std::string_view name = node.type > 0 ? grammar_.tokenName(node.type) : std::string_view();
        out_ += name;
        if (name.empty() || !std::equal(name.begin(), name.end(), node.text.begin(), node.text.end())) {
            if (!name.empty()) out_ += ' ';
            appendJsonString(out_, node.text);
        }
        out_ += '\n';
    }
    void leave(ANTLR3_UINT32 /*childCount*/) {}

 private:
    std::string& out_;
    const Grammar& grammar_;
};

template <class Writer>
void write(pANTLR3_BASE_TREE tree, Writer writer) {
    walk(tree, writer);
}

}  // namespace

void appendTree(std::string& out, TreeFormat format, const Grammar& grammar, std::u16string_view text) {
    Recogniser recogniser(grammar, text);
    const pANTLR3_BASE_TREE tree = recogniser.parse();
    if (!tree) throw std::bad_alloc();
    switch (format) {
        case TreeFormat::Sexpr:
            return write(tree, SexprWriter(out));
        case TreeFormat::Json:
            return write(tree, JsonWriter(out, grammar));
        case TreeFormat::Dot:
            return write(tree, DotWriter(out));
        case TreeFormat::Pretty:
            return write(tree, PrettyWriter(out, grammar));
    }
}

}  // namespace zr::tool
