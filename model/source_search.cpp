#include "model/source_search.h"

#include <unordered_set>

#include "zrparsersql/database_info.h"

namespace zr {
namespace {

bool isError(int code) {
    return code >= 1 && code <= 100;
}

CZRAliasInfo* aliasBySrcName(const CZRQueryInfo& query, const CString& name) {
    for (const auto& entry : query.m_aliases)
        if (entry.value && entry.value->GetSrcName().EqualsNoCase(name)) return entry.value;
    return nullptr;
}

// Two constants of MS Access that stand where a column could.
bool isYesOrNo(const CFieldObject& field) {
    return field.m_table.IsEmpty() &&
           (field.m_field.EqualsNoCase(u"No") || field.m_field.EqualsNoCase(u"Yes"));
}

}  // namespace

const SourceIndex* SourceCache::indexFor(const CZRQueryInfo& asking) {
    if (!asking.m_database) return nullptr;
    for (const auto& [database, index] : indexes_)
        if (database == asking.m_database) return index.get();
    indexes_.emplace_back(asking.m_database, SourceIndex::of(*asking.m_database));
    return indexes_.back().second.get();
}

Source SourceCache::byName(const CZRQueryInfo& asking, const CString& srcName) {
    const SourceIndex* index = indexFor(asking);
    return index ? index->byName(srcName) : Source();
}

Source SourceCache::byId(const CZRQueryInfo& asking, const CString& id) {
    const SourceIndex* index = indexFor(asking);
    return index ? index->byId(id) : Source();
}

CZRSourceFildInfo* SourceSearch::findField(CZRQueryInfo& query, const CString& tableName,
                                           const CString& fieldName) {
    return run(fieldQuestion(query, tableName, fieldName));
}

CZRSourceFildInfo* SourceSearch::findFieldInSources(CZRQueryInfo& query, const CString& fieldName) {
    return run({Step::FieldInSources, &query, CString(), fieldName});
}

CZRSourceFildInfo* SourceSearch::findFieldBySrcName(CZRQueryInfo& query, const CString& name) {
    return run({Step::FieldBySrcName, &query, CString(), name});
}

CZRSourceFildInfo* SourceSearch::run(Question question) {
    std::vector<Frame> stack;
    CZRSourceFildInfo* heard = nullptr;
    // Answers at once when the question was asked before.
    const auto put = [&](Question&& next) {
        const auto [place, isNew] = answers_.try_emplace(std::move(next), nullptr);
        if (isNew)
            stack.push_back(Frame{&*place, false, {}, {}, nullptr, false});
        else
            heard = place->second;
    };
    put(std::move(question));
    while (!stack.empty()) {
        Frame& frame = stack.back();
        Move move = go(frame, heard);
        if (move.asks) {
            put(std::move(move.question));
        } else {
            heard = frame.entry->second = move.answer;
            stack.pop_back();
        }
    }
    return heard;
}

SourceSearch::Move SourceSearch::go(Frame& frame, CZRSourceFildInfo* heard) {
    if (frame.last) return answer(heard);
    switch (frame.question().step) {
        case Step::FieldOfAnySource:
            return goFieldOfAnySource(frame, heard);
        case Step::FieldOfTable:
            return goFieldOfTable(frame, heard);
        case Step::FieldInSources:
            return goFieldInSources(frame, heard);
        case Step::FieldBySrcName:
            break;
    }
    return goFieldBySrcName(frame, heard);
}

SourceSearch::Move SourceSearch::goFieldOfAnySource(Frame& frame, CZRSourceFildInfo* heard) {
    CZRQueryInfo& query = *frame.question().query;
    const CString& column = frame.question().column;
    if (!frame.started) {
        frame.started = true;
        frame.sourceAt = query.m_sourceTables.begin();
    } else {
        // The source in turn is a query that was asked.
        if (heard) return answer(heard);
        const Source source = sources_.byId(query, frame.sourceAt->value);
        if (CZRAliasInfo* alias = aliasBySrcName(*source.query, column)) {
            query.Resolved = 1;
            return answer(alias);
        }
        ++frame.sourceAt;
    }
    for (; frame.sourceAt != query.m_sourceTables.end(); ++frame.sourceAt) {
        const Source source = sources_.byId(query, frame.sourceAt->value);
        if (!source) {
            query.SetCorrect(1);
            return answer(nullptr);
        }
        if (source.query) return ask(Step::FieldOfAnySource, *source.query, CString(), column);
        if (CZRSourceFildInfo* field = source.source->FindFieldBySrcName(column)) return answer(field);
    }
    return answer(nullptr);
}

SourceSearch::Move SourceSearch::goFieldOfTable(Frame& frame, CZRSourceFildInfo* heard) {
    CZRQueryInfo& query = *frame.question().query;
    const CString& column = frame.question().column;
    if (!frame.started) {
        frame.started = true;
        const Source source = sources_.byName(query, frame.question().table);
        if (!source) {
            query.SetCorrect(1);
            return answer(nullptr);
        }
        if (!source.query) return answer(source.source->FindFieldBySrcName(column));
        if (source.query->Resolved == 0) {
            frame.last = true;
            return ask(Step::FieldBySrcName, *source.query, CString(), column);
        }
        frame.asked = source.query;
        frame.fieldAt = frame.asked->m_fields.begin();
    } else {
        if (heard) return answer(heard);
        ++frame.fieldAt;
    }
    CZRQueryInfo& asked = *frame.asked;
    for (; frame.fieldAt != asked.m_fields.end(); ++frame.fieldAt) {
        const CFieldObject* field = frame.fieldAt->value;
        if (!field) continue;
        if (field->m_field == u"*") return ask(Step::FieldInSources, asked, CString(), column);
        if (field->m_field.EqualsNoCase(column)) {
            Question question = fieldQuestion(asked, field->m_table, field->m_field);
            return {true, std::move(question), nullptr};
        }
    }
    const CZRAliasInfo* alias = aliasBySrcName(asked, column);
    if (!alias) return answer(nullptr);
    frame.last = true;
    return ask(Step::FieldOfAnySource, asked, CString(), alias->AliasField);
}

SourceSearch::Move SourceSearch::goFieldInSources(Frame& frame, CZRSourceFildInfo* heard) {
    CZRQueryInfo& query = *frame.question().query;
    const CString& column = frame.question().column;
    if (!frame.started) {
        frame.started = true;
        frame.sourceAt = query.m_sourceTables.begin();
    } else {
        if (heard) return answer(heard);
        ++frame.sourceAt;
    }
    for (; frame.sourceAt != query.m_sourceTables.end(); ++frame.sourceAt) {
        const Source source = sources_.byId(query, frame.sourceAt->value);
        if (!source) continue;
        if (source.query) return ask(Step::FieldBySrcName, *source.query, CString(), column);
        if (CZRSourceFildInfo* field = source.source->FindFieldBySrcName(column)) return answer(field);
    }
    return answer(nullptr);
}

SourceSearch::Move SourceSearch::goFieldBySrcName(Frame& frame, CZRSourceFildInfo* heard) {
    CZRQueryInfo& query = *frame.question().query;
    const CString& name = frame.question().column;
    if (!frame.started) {
        frame.started = true;
        frame.fieldAt = query.m_fields.begin();
    } else {
        const bool isStar = frame.fieldAt->value->m_field == u"*";
        if (heard && (isStar || heard->GetSrcName().EqualsNoCase(name))) return answer(heard);
        ++frame.fieldAt;
    }
    for (; frame.fieldAt != query.m_fields.end(); ++frame.fieldAt) {
        const CFieldObject* field = frame.fieldAt->value;
        if (!field) continue;
        if (field->m_field == u"*") return ask(Step::FieldInSources, query, CString(), name);
        return {true, fieldQuestion(query, field->m_table, field->m_field), nullptr};
    }
    CZRAliasInfo* alias = aliasBySrcName(query, name);
    if (alias) query.Resolved = 1;
    return answer(alias);
}

int SourceSearch::findInSubQueries(CZRQueryInfo& query, const CString& tableName, const CString& fieldName,
                                   CZRQueryInfo*& found) {
    // Depth first, in the order of the sources.
    std::vector<CZRQueryInfo*> waiting{&query};
    std::unordered_set<const CZRQueryInfo*> seen;
    std::vector<CZRQueryInfo*> next;
    while (!waiting.empty()) {
        CZRQueryInfo* at = waiting.back();
        waiting.pop_back();
        if (!seen.insert(at).second) continue;
        for (const auto& entry : at->m_aliases) {
            if (!entry.value) continue;
            const CString name = entry.value->GetName();
            if (name.EqualsNoCase(fieldName) || name.EqualsNoCase(tableName)) {
                found = at;
                return 1;
            }
        }
        next.clear();
        for (const auto& entry : at->m_sourceTables)
            if (CZRQueryInfo* source = sources_.byId(*at, entry.value).query) next.push_back(source);
        waiting.insert(waiting.end(), next.rbegin(), next.rend());
    }
    return 0;
}

int SourceSearch::checkFieldRefs(CZRQueryInfo& query) {
    int result = 0;
    for (const auto& entry : query.m_fields) {
        const CFieldObject* field = entry.value;
        if (!field || field->m_field == u"*" || isYesOrNo(*field)) continue;
        if (const CZRSourceFildInfo* hit = findField(query, field->m_table, field->m_field)) {
            if (hit->GetSelected() == 0) return 1;
            continue;
        }
        CZRQueryInfo* found = nullptr;
        if (!field->m_field.IsEmpty() && !findInSubQueries(query, field->m_table, field->m_field, found))
            result = 1;
    }
    return result;
}

int SourceSearch::validate(CZRQueryInfo& query) {
    std::vector<ValidationFrame> stack;
    int heard = 0;
    const auto put = [&](CZRQueryInfo& next) {
        // A query that is met again while it is being validated counts as valid there.
        const auto [place, isNew] = validated_.try_emplace(&next, 0);
        if (isNew)
            stack.push_back({&next, {}, {}});
        else
            heard = place->second;
    };
    put(query);
    while (!stack.empty()) {
        if (CZRQueryInfo* next = go(stack.back(), heard)) {
            put(*next);
        } else {
            heard = validated_[stack.back().query] = stack.back().result;
            stack.pop_back();
        }
    }
    return heard;
}

CZRQueryInfo* SourceSearch::go(ValidationFrame& frame, int heard) {
    using Phase = ValidationFrame::Phase;
    CZRQueryInfo& query = *frame.query;
    if (frame.phase == Phase::Start) {
        if (query.GetSelected() == 0) query.Resolved = 0;
        frame.result = checkFieldRefs(query);
        if (isError(frame.result)) return nullptr;
        frame.phase = Phase::Sources;
        frame.sourceAt = query.m_sourceTables.begin();
    }
    if (frame.phase == Phase::Sources) {
        for (; frame.sourceAt != query.m_sourceTables.end(); ++frame.sourceAt) {
            if (frame.waiting) {
                frame.waiting = false;
                frame.result = heard;
            } else {
                // A "*" among the sources ends the walk over them.
                if (frame.sourceAt->key == u"*") break;
                const Source source = sources_.byId(query, frame.sourceAt->value);
                CZRQueryInfo* found = nullptr;
                if ((!source || source.source->GetSelected() == 0) &&
                    !findInSubQueries(query, frame.sourceAt->value, CString(), found)) {
                    frame.result = 1;
                    break;
                }
                if (!source) continue;
                if (source.query) {
                    frame.waiting = true;
                    return source.query;
                }
                frame.result = source.source->Validate(0);
            }
            if (isError(frame.result)) break;
        }
        if (frame.result != 0 && frame.result < 101) return nullptr;
        frame.phase = Phase::SubQueries;
        frame.subQueryAt = query.m_subQueries.GetHeadPosition();
    }
    if (frame.waiting) {
        frame.waiting = false;
        frame.result = heard;
        if (heard != 0) return nullptr;
    }
    while (frame.subQueryAt) {
        if (CZRQueryInfo* nested = query.m_subQueries.GetNext(frame.subQueryAt)) {
            frame.waiting = true;
            return nested;
        }
    }
    if (frame.result == 0) query.Resolved = 1;
    return nullptr;
}

}  // namespace zr
