#include "host/access_queries.h"

#include <algorithm>

#include "zrparsersql/wide_string.h"

namespace zr::host {

namespace {

// What the rows of a query are.
enum Attribute {
    kType = 1,
    kOptions = 3,
    kTable = 5,
    kColumn = 6,
    kJoin = 7,
    kWhere = 8,
    kGroup = 9,
    kHaving = 10,
    kOrder = 11,
};

// Kinds of queries, the flag of the row of the type.
enum Type { kSelection = 1, kCrosstab = 6, kDefinition = 7, kForServer = 8, kUnion = 9 };

enum Option { kStar = 0x01, kDistinct = 0x02, kDistinctRow = 0x08, kTop = 0x10, kPercent = 0x20 };

bool isSame(const std::string& a, const std::string& b) {
    return CString::fromUtf8(a).EqualsNoCase(CString::fromUtf8(b));
}

// Nested selections and names that have brackets already stand as they are.
std::string quoted(const std::string& name) {
    if (name.empty() || name.front() == '[' || name.front() == '(') return name;
    return "[" + name + "]";
}

void appendListed(std::string& list, const std::string& one) {
    list += (list.empty() ? "" : ", ") + one;
}

// A table, or tables that are joined already.
struct Source {
    std::string text;
    std::vector<std::string> names;
    bool isJoined = false;

    bool has(const std::string& name) const {
        return std::any_of(names.begin(), names.end(),
                           [&](const std::string& own) { return isSame(own, name); });
    }
    std::string operand() const { return isJoined ? "(" + text + ")" : text; }
};

class Text {
 public:
    explicit Text(const std::vector<AccessQueryPart>& parts) : parts_(parts) {}

    std::string make() const {
        const AccessQueryPart* type = find(kType);
        switch (type ? type->flag : kSelection) {
            case kSelection:
                return selection();
            case kDefinition:
            case kForServer:
                return type->expression;
            case kUnion:
                return unionOf();
            case kCrosstab:
                throw NoAccessQuery("it is a crosstab");
            default:
                throw NoAccessQuery("it changes data");
        }
    }

 private:
    const AccessQueryPart* find(int attribute) const {
        for (const AccessQueryPart& part : parts_)
            if (part.attribute == attribute) return &part;
        return nullptr;
    }

    template <class Use>
    void each(int attribute, Use use) const {
        for (const AccessQueryPart& part : parts_)
            if (part.attribute == attribute) use(part);
    }

    int options() const {
        const AccessQueryPart* options = find(kOptions);
        return options ? options->flag : 0;
    }

    std::string selection() const {
        std::string text = "SELECT " + predicate() + columns();
        const std::string tables = from();
        if (!tables.empty()) text += "\nFROM " + tables;
        if (const AccessQueryPart* where = find(kWhere)) text += "\nWHERE " + where->expression;
        std::string groups;
        each(kGroup, [&](const auto& part) { appendListed(groups, part.expression); });
        if (!groups.empty()) text += "\nGROUP BY " + groups;
        if (const AccessQueryPart* having = find(kHaving)) text += "\nHAVING " + having->expression;
        return text + order();
    }

    std::string predicate() const {
        if (options() & kTop)
            return "TOP " + find(kOptions)->name1 + (options() & kPercent ? " PERCENT " : " ");
        if (options() & kDistinctRow) return "DISTINCTROW ";
        return options() & kDistinct ? "DISTINCT " : "";
    }

    std::string columns() const {
        std::string list;
        each(kColumn, [&](const auto& part) {
            appendListed(list, part.expression + (part.name1.empty() ? "" : " AS " + quoted(part.name1)));
        });
        if (options() & kStar) appendListed(list, "*");
        if (list.empty()) throw NoAccessQuery("it has no columns");
        return list;
    }

    std::string order() const {
        std::string list;
        each(kOrder, [&](const auto& part) {
            appendListed(list, part.expression + (isSame(part.name1, "D") ? " DESC" : ""));
        });
        return list.empty() ? "" : "\nORDER BY " + list;
    }

    std::string from() const {
        std::vector<Source> sources;
        each(kTable, [&](const auto& part) {
            Source source;
            // A table of another file has that one's path before it.
            source.text = (part.expression.empty() ? "" : quoted(part.expression) + ".") + quoted(part.name1);
            if (!part.name2.empty()) source.text += " AS " + quoted(part.name2);
            source.names = {part.name2.empty() ? part.name1 : part.name2};
            sources.push_back(std::move(source));
        });
        join(sources);
        std::string list;
        for (const Source& source : sources) appendListed(list, source.text);
        return list;
    }

    // Rows of the same two tables are one join, whose conditions all have to hold.
    void join(std::vector<Source>& sources) const {
        std::vector<std::vector<const AccessQueryPart*>> joins;
        each(kJoin, [&](const auto& part) {
            const auto known = std::find_if(joins.begin(), joins.end(), [&](const auto& other) {
                return isSame(other.front()->name1, part.name1) && isSame(other.front()->name2, part.name2);
            });
            if (known != joins.end())
                known->push_back(&part);
            else
                joins.push_back({&part});
        });
        for (const auto& parts : joins) joinTwo(sources, parts);
    }

    static void joinTwo(std::vector<Source>& sources, const std::vector<const AccessQueryPart*>& parts) {
        const auto with = [&](const std::string& name) {
            return std::find_if(sources.begin(), sources.end(),
                                [&](const Source& source) { return source.has(name); });
        };
        const auto left = with(parts.front()->name1);
        const auto right = with(parts.front()->name2);
        if (left == sources.end() || right == sources.end() || left == right)
            throw NoAccessQuery("its join of " + parts.front()->name1 + " and " + parts.front()->name2 +
                                " can't be placed");
        std::string condition;
        for (const AccessQueryPart* part : parts) {
            const bool isOne = parts.size() == 1;
            condition += (condition.empty() ? "" : " AND ") +
                         (isOne ? part->expression : "(" + part->expression + ")");
        }
        const int side = parts.front()->flag;
        left->text = left->operand() +
                     (side == 2   ? " LEFT JOIN "
                      : side == 3 ? " RIGHT JOIN "
                                  : " INNER JOIN ") +
                     right->operand() + " ON " + condition;
        left->isJoined = true;
        left->names.insert(left->names.end(), right->names.begin(), right->names.end());
        sources.erase(right);
    }

    // The branches are texts; only the first of them may be a union itself.
    std::string unionOf() const {
        std::string text;
        each(kTable, [&](const auto& part) {
            if (part.expression.empty()) return;
            if (!text.empty()) text += options() & kDistinct ? "\nUNION " : "\nUNION ALL ";
            const std::size_t last = part.expression.find_last_not_of(" \t\r\n;");
            text += part.expression.substr(0, last == std::string::npos ? 0 : last + 1);
        });
        if (text.empty()) throw NoAccessQuery("it has no branches");
        return text + order();
    }

    const std::vector<AccessQueryPart>& parts_;
};

}  // namespace

std::string textOfAccessQuery(const std::vector<AccessQueryPart>& parts) {
    return Text(parts).make();
}

}  // namespace zr::host
