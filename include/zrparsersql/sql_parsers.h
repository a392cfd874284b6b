#pragma once

#include "zrparsersql/export.h"
#include "zrparsersql/sql_tree.h"
#include "zrparsersql/wide_string.h"

// One facade a dialect: takes the text of one query, parses it, and hands out the syntax tree.
//
//     CString text = u"SELECT a FROM t";
//     CZRMSSQLParser parser;
//     parser.SetSQL(text);
//     parser.ParseSQL();
//     CZRSQLTree* tree = nullptr;
//     parser.GetSQLTree(&tree);
//     ... walk ...
//     delete tree;  // ahead of the facade
//
// SetSQL takes the text by reference and reads it in place, without a copy: the text must stay alive and
// unchanged as long as the facade or one of its trees is in use.
//
// ParseSQL parses the text set last; without a text it does nothing. Wrong SQL is no failure: the tree then
// holds error nodes, or is one. Earlier trees stay good until the facade goes.
//
// GetSQLTree stores a new root view over the tree of the last ParseSQL in *out, which may not be null. The
// caller owns it. Before the first ParseSQL the view stands over no node. An exhausted heap stores null.
//
// None of them throws. Threads: a facade and its trees belong to one thread; facades are independent of each
// other.
class ZR_API CZRSQLParser {
 public:
    CZRSQLParser() = default;
    CZRSQLParser(const CZRSQLParser&) = delete;
    CZRSQLParser& operator=(const CZRSQLParser&) = delete;
    virtual ~CZRSQLParser() = default;

    virtual void ParseSQL() = 0;
};

class CZROracleParserImp;
class CZRMSSQLParserImp;
class CZRMySQLParcerImp;
class CZRPostgreParserImp;
class CZRMSAccessSQL_v3ParcerImp;

class ZR_API CZROracleParser : public CZRSQLParser {
 public:
    CZROracleParser();
    ~CZROracleParser() override;
    void ParseSQL() override;
    virtual void SetSQL(CString& text);
    virtual void GetSQLTree(CZRSQLTree** out);

 private:
    CZROracleParserImp* m_pImp;
};

class ZR_API CZRMSSQLParser : public CZRSQLParser {
 public:
    CZRMSSQLParser();
    ~CZRMSSQLParser() override;
    void ParseSQL() override;
    virtual void SetSQL(CString& text);
    virtual void GetSQLTree(CZRSQLTree** out);
    // A view over no node: nothing parses a FROM list by itself. Kept for the hosts that call it.
    virtual void GetSQLFromTree(CZRSQLTree** out);

 private:
    CZRMSSQLParserImp* m_pImp;
};

class ZR_API CZRMySQLParcer : public CZRSQLParser {
 public:
    CZRMySQLParcer();
    ~CZRMySQLParcer() override;
    void ParseSQL() override;
    virtual void SetSQL(CString& text);
    virtual void GetSQLTree(CZRSQLTree** out);

 private:
    CZRMySQLParcerImp* m_pImp;
};

class ZR_API CZRPostgreParser : public CZRSQLParser {
 public:
    CZRPostgreParser();
    ~CZRPostgreParser() override;
    void ParseSQL() override;
    virtual void SetSQL(CString& text);
    virtual void GetSQLTree(CZRSQLTree** out);

 private:
    CZRPostgreParserImp* m_pImp;
};

class ZR_API CZRMSAccessSQL_v3Parcer : public CZRSQLParser {
 public:
    CZRMSAccessSQL_v3Parcer();
    ~CZRMSAccessSQL_v3Parcer() override;
    void ParseSQL() override;
    virtual void SetSQL(CString& text);
    virtual void GetSQLTree(CZRSQLTree** out);

 private:
    CZRMSAccessSQL_v3ParcerImp* m_pImp;
};
