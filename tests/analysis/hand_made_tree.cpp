#include "tests/analysis/hand_made_tree.h"

#include <cstdlib>
#include <stdexcept>
#include <string>
#include <utility>

std::unique_ptr<HandMadeTree> HandMadeTree::read(std::string_view text) {
    std::vector<std::unique_ptr<HandMadeTree>> open;
    for (std::size_t at = 0; at < text.size();) {
        if (text[at] == ' ') {
            ++at;
        } else if (text[at] == '(') {
            const std::size_t quote = text.find('"', at), end = text.find('"', quote + 1);
            if (end == std::string_view::npos) break;
            const unsigned long type =
                std::strtoul(std::string(text.substr(at + 1, quote)).c_str(), nullptr, 10);
            const std::string name(text.substr(quote + 1, end - quote - 1));
            open.push_back(
                std::make_unique<HandMadeTree>(static_cast<unsigned int>(type), CString(name.c_str())));
            at = end + 1;
        } else if (text[at] == ')' && !open.empty()) {
            std::unique_ptr<HandMadeTree> done = std::move(open.back());
            open.pop_back();
            if (open.empty()) return done;
            open.back()->add(std::move(done));
            ++at;
        } else {
            break;
        }
    }
    throw std::invalid_argument("no tree: " + std::string(text));
}

HandMadeTree::~HandMadeTree() {
    std::vector<std::unique_ptr<HandMadeTree>> open = std::move(children_);
    while (!open.empty()) {
        const std::unique_ptr<HandMadeTree> node = std::move(open.back());
        open.pop_back();
        for (auto& child : node->children_) open.push_back(std::move(child));
        node->children_.clear();
    }
}

HandMadeTree& HandMadeTree::add(std::unique_ptr<HandMadeTree> child) {
    children_.push_back(std::move(child));
    return *children_.back();
}

CZRSQLTree* HandMadeTree::GetChild(unsigned int index) {
    if (index < children_.size()) return children_[index].get();
    if (!beyond_) beyond_ = std::make_unique<HandMadeTree>(0, CString(u" "));
    return beyond_.get();
}
