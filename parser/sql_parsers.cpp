#include "zrparsersql/sql_parsers.h"

#include <new>

#include "parser/grammars.h"
#include "parser/parser_imp.h"
#include "parser/tree_view.h"

class CZROracleParserImp final : public zr::ParserImp<zr::grammars::Oracle, CZROracleTree> {};
class CZRMySQLParcerImp final : public zr::ParserImp<zr::grammars::MySQLSelect, CZRMySQLTree> {};
class CZRPostgreParserImp final : public zr::ParserImp<zr::grammars::PostgreSQL, CZRPostgreTree> {};
class CZRMSAccessSQL_v3ParcerImp final
    : public zr::ParserImp<zr::grammars::MSAccessSQL_v3, CZRMSAccessSQL_v3Tree> {};

class CZRMSSQLParserImp final : public zr::ParserImp<zr::grammars::MSSQL, CZRMSSQLTree> {
 public:
    void GetSQLFromTree(CZRSQLTree** out) { *out = newView(m_fromResult); }

 private:
    const zr::engine::SyntaxTree* m_fromResult = nullptr;  // never filled; hosts get their empty view over it
};

// A facade hands everything on to the object behind it. On an exhausted heap there is none, and nothing
// happens.
#define ZR_DEFINE_FACADE(Facade)                                 \
    Facade::Facade() : m_pImp(new (std::nothrow) Facade##Imp) {} \
    Facade::~Facade() {                                          \
        delete m_pImp;                                           \
    }                                                            \
    void Facade::SetSQL(CString& text) {                         \
        if (m_pImp) m_pImp->SetSQL(text);                        \
    }                                                            \
    void Facade::ParseSQL() {                                    \
        if (m_pImp) m_pImp->ParseSQL();                          \
    }                                                            \
    void Facade::GetSQLTree(CZRSQLTree** out) {                  \
        *out = nullptr;                                          \
        if (m_pImp) m_pImp->GetSQLTree(out);                     \
    }

ZR_DEFINE_FACADE(CZROracleParser)
ZR_DEFINE_FACADE(CZRMSSQLParser)
ZR_DEFINE_FACADE(CZRMySQLParcer)
ZR_DEFINE_FACADE(CZRPostgreParser)
ZR_DEFINE_FACADE(CZRMSAccessSQL_v3Parcer)

#undef ZR_DEFINE_FACADE

void CZRMSSQLParser::GetSQLFromTree(CZRSQLTree** out) {
    *out = nullptr;
    if (m_pImp) m_pImp->GetSQLFromTree(out);
}
