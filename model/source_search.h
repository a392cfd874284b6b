#pragma once

#include <unordered_map>
#include <vector>

#include "model/source_index.h"
#include "zrparsersql/query_info.h"

namespace zr {

// Looks up sources through the indexes of their databases. Lives for one operation, in which no database
// changes.
class SourceCache {
 public:
    Source byName(const CZRQueryInfo& asking, const CString& srcName);
    Source byId(const CZRQueryInfo& asking, const CString& id);

 private:
    const SourceIndex* indexFor(const CZRQueryInfo& asking);

    // Nearly always one.
    std::vector<std::pair<const CZRDatabaseInfo*, std::shared_ptr<const SourceIndex>>> indexes_;
};

// The look-ups and the validation of queries, which go from query to query through the database.
//
// Queries can read from queries to any depth, from the same ones in many ways and, in a broken model, from
// themselves. So the steps that would call each other keep their state on a stack of their own; each question
// is answered once and the answer remembered; and a question that comes up while it is being answered finds
// nothing. An object lives for one operation.
class SourceSearch {
 public:
    explicit SourceSearch(SourceCache& sources) : sources_(sources) {}

    CZRSourceFildInfo* findField(CZRQueryInfo& query, const CString& tableName, const CString& fieldName);
    CZRSourceFildInfo* findFieldInSources(CZRQueryInfo& query, const CString& fieldName);
    CZRSourceFildInfo* findFieldBySrcName(CZRQueryInfo& query, const CString& name);
    int findInSubQueries(CZRQueryInfo& query, const CString& tableName, const CString& fieldName,
                         CZRQueryInfo*& found);
    int checkFieldRefs(CZRQueryInfo& query);
    int validate(CZRQueryInfo& query);

 private:
    enum class Step { FieldOfAnySource, FieldOfTable, FieldInSources, FieldBySrcName };
    struct Question {
        Step step;
        CZRQueryInfo* query;
        CString table;
        CString column;
        bool operator==(const Question&) const = default;
    };
    struct QuestionHash {
        std::size_t operator()(const Question& question) const {
            const std::size_t where =
                reinterpret_cast<std::uintptr_t>(question.query) + static_cast<std::size_t>(question.step);
            return (question.table.Hash() * 31) ^ question.column.Hash() ^ (where * 0x9e3779b97f4a7c15u);
        }
    };
    // Null while the question is being answered.
    using Answers = std::unordered_map<Question, CZRSourceFildInfo*, QuestionHash>;
    using SourceIterator = decltype(CMapStringToString().begin());
    using FieldIterator = decltype(CMapStringToOb<CFieldObject>().begin());

    // A question on the stack, with how far its answering has come.
    struct Frame {
        Answers::value_type* entry;
        bool started = false;
        SourceIterator sourceAt;        // the source in turn
        FieldIterator fieldAt;          // the column reference in turn
        CZRQueryInfo* asked = nullptr;  // FieldOfTable: the query that the table name means
        bool last = false;              // what the pending question answers is the answer
        const Question& question() const { return entry->first; }
    };
    // What a frame does next: asks another question, or answers its own.
    struct Move {
        bool asks;
        Question question;
        CZRSourceFildInfo* answer;
    };
    static Move ask(Step step, CZRQueryInfo& query, CString table, CString column) {
        return {true, {step, &query, std::move(table), std::move(column)}, nullptr};
    }
    static Move answer(CZRSourceFildInfo* field) { return {false, {}, field}; }
    static Question fieldQuestion(CZRQueryInfo& query, const CString& table, const CString& column) {
        return {table.IsEmpty() ? Step::FieldOfAnySource : Step::FieldOfTable, &query, table, column};
    }

    CZRSourceFildInfo* run(Question question);
    Move go(Frame& frame, CZRSourceFildInfo* heard);
    Move goFieldOfAnySource(Frame& frame, CZRSourceFildInfo* heard);
    Move goFieldOfTable(Frame& frame, CZRSourceFildInfo* heard);
    Move goFieldInSources(Frame& frame, CZRSourceFildInfo* heard);
    Move goFieldBySrcName(Frame& frame, CZRSourceFildInfo* heard);

    struct ValidationFrame {
        CZRQueryInfo* query;
        SourceIterator sourceAt;
        POSITION subQueryAt;
        int result = 0;
        enum class Phase { Start, Sources, SubQueries } phase = Phase::Start;
        bool waiting = false;
    };
    // The next query to validate, or null when the frame's result stands.
    CZRQueryInfo* go(ValidationFrame& frame, int heard);

    SourceCache& sources_;
    Answers answers_;
    std::unordered_map<const CZRQueryInfo*, int> validated_;
};

}  // namespace zr
