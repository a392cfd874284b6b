#include "bench/dialects.h"

#include <zrparsersql/query_info.h>
#include <zrparsersql/sql_parsers.h>

#include <cstdio>
#include <fstream>
#include <memory>
#include <nlohmann/json.hpp>

#include "analysis/driver.h"
#include "analysis/msaccess_state.h"
#include "analysis/mssql_state.h"
#include "analysis/mysql_state.h"
#include "analysis/oracle_state.h"
#include "analysis/postgresql_state.h"
#include "grammar/engine/lexed_text.h"
#include "grammar/engine/rule_reading.h"
#include "parser/grammars.h"

namespace zr::bench {

using engine::LexedText;
using engine::RuleDerivation;

namespace {

template <class Facade>
void useFacade(CString& text) {
    Facade facade;
    facade.SetSQL(text);
    facade.ParseSQL();
    CZRSQLTree* tree = nullptr;
    facade.GetSQLTree(&tree);
    delete tree;
}

template <class Facade, class State>
std::function<void()> walkOf(CString& text) {
    const auto facade = std::make_shared<Facade>();
    facade->SetSQL(text);
    facade->ParseSQL();
    return [facade, &text] {
        CZRQueryInfo query;
        CZRSQLTree* root = nullptr;
        facade->GetSQLTree(&root);
        const std::unique_ptr<CZRSQLTree> tree(root);
        CZRSQLTree* const selectNode = zr::findSelectNode(root, State::isSelectNode);
        if (!selectNode) return;
        State state(selectNode);
        state.m_query = &query;
        state.setItemLimit(zr::itemLimit(text));
        try {
            zr::runPasses(state);
            state.ProcessTail(root);
        } catch (...) {
            // As in BuildQueryInfo, the query keeps what it has.
        }
    };
}

const std::array<Dialect, 5> kDialects{{
    {"mssql", zr::grammars::MSSQL, DB_MSSQL, &useFacade<CZRMSSQLParser>,
     &walkOf<CZRMSSQLParser, MSSQLStateSelectQuery>},
    {"mysql", zr::grammars::MySQLSelect, DB_MYSQL, &useFacade<CZRMySQLParcer>,
     &walkOf<CZRMySQLParcer, MySQLStateSelectQuery>},
    {"oracle", zr::grammars::Oracle, DB_ORACLE, &useFacade<CZROracleParser>,
     &walkOf<CZROracleParser, OracleStateSelectQuery>},
    {"postgresql", zr::grammars::PostgreSQL, DB_POSTGRESQL, &useFacade<CZRPostgreParser>,
     &walkOf<CZRPostgreParser, PostgreStateSelectQuery>},
    {"msaccess", zr::grammars::MSAccessSQL_v3, DB_MSACCESS, &useFacade<CZRMSAccessSQL_v3Parcer>,
     &walkOf<CZRMSAccessSQL_v3Parcer, MSAccessSQL_v3StateSelectQuery>},
}};

}  // namespace

const std::array<Dialect, 5>& dialects() {
    return kDialects;
}

std::vector<Query> readQueries(const Dialect& dialect, const std::string& folder) {
    const std::string path = folder.empty() ? ZR_PLAIN_QUERIES : folder + "/" + dialect.name + ".jsonl";
    std::vector<Query> queries;
    std::ifstream file(path);
    if (!file) std::fprintf(stderr, "%s can't be read\n", path.c_str());
    for (std::string line; std::getline(file, line);) {
        if (line.empty()) continue;
        const nlohmann::json record = nlohmann::json::parse(line);
        const char* const form = record.contains(dialect.name) ? dialect.name : "sql";
        Query query;
        query.text = CString(record.at(form).get<std::string>().c_str());
        const LexedText lexed(*dialect.grammar.lexer, query.text);
        query.tokens = lexed.seenCount();
        if (query.tokens == 0) continue;
        const RuleDerivation derivation(*dialect.grammar.parser, lexed.types(), {},
                                        dialect.grammar.parser->statementRule);
        query.isReadToEnd = derivation.result().found && derivation.result().high == query.tokens;
        queries.push_back(std::move(query));
    }
    return queries;
}

}  // namespace zr::bench
