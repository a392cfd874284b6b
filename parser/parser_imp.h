#pragma once

#include <antlr3.h>

#include <memory>
#include <new>
#include <utility>
#include <vector>

#include "grammar/engine/utf16_stream.h"
#include "parser/pipeline.h"
#include "parser/tree_view.h"
#include "zrparsersql/sql_parsers.h"

namespace zr {

// What stands behind each facade: the text's stream and its parses. Grammar names the recognisers, View the
// dialect's tree view. Nothing here throws; a parse that can't be made leaves the result of the one before.
template <class Grammar, class View>
class ParserImp : public CZRSQLParser {
 public:
    // Nothing of the runtime outlives this object, and its trees read their text from the streams: the
    // streams are closed first and the parses freed behind them, as the runtime allows.
    ~ParserImp() override {
        if (m_input) m_input->close(m_input);
        for (pANTLR3_INPUT_STREAM input : earlierInputs_) input->close(input);
    }

    virtual void SetSQL(CString& text) {
        try {
            dropInput();
            m_input = newUtf16InPlaceStream(text.GetString(), static_cast<std::uint32_t>(text.GetLength()));
        } catch (const std::bad_alloc&) {
            // Without a stream ParseSQL does nothing.
        }
    }

    void ParseSQL() override {
        if (!m_input) return;
        try {
            parses_.reserve(parses_.size() + 1);
            // The lexer of a parse before this one left the stream at its end.
            if (isInputRead_) m_input->reset(m_input);
            isInputRead_ = true;
            if (auto parse = Pipeline<Grammar>::run(m_input)) parses_.push_back(std::move(parse));
        } catch (...) {
            // As with every other failure, the result stays what it was.
        }
    }

    virtual void GetSQLTree(CZRSQLTree** out) {
        const Pipeline<Grammar>* parse = parses_.empty() ? nullptr : parses_.back().get();
        *out = newView(parse ? parse->tree() : nullptr, parse ? parse->tokens() : nullptr);
    }

 protected:
    static CZRSQLTree* newView(pANTLR3_BASE_TREE tree, pANTLR3_COMMON_TOKEN_STREAM tokens) {
        try {
            return new View(tree, tokens);
        } catch (const std::bad_alloc&) {
            return nullptr;
        }
    }

 private:
    // A stream that a parse has read stays open: the parse's tokens refer to it.
    void dropInput() {
        if (!m_input) return;
        if (isInputRead_)
            earlierInputs_.push_back(m_input);
        else
            m_input->close(m_input);
        m_input = nullptr;
        isInputRead_ = false;
    }

    pANTLR3_INPUT_STREAM m_input = nullptr;
    bool isInputRead_ = false;
    std::vector<pANTLR3_INPUT_STREAM> earlierInputs_;
    std::vector<std::unique_ptr<Pipeline<Grammar>>>
        parses_;  // the last one counts; trees of earlier ones may be held
};

}  // namespace zr
