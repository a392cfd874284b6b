#pragma once

#include <memory>
#include <string_view>

#include "zrparsersql/sql_parsers.h"

// A parsed text with everything that has to live as long as its tree.
template <class Facade>
struct Parsed {
    CString text;
    Facade facade;
    std::unique_ptr<CZRSQLTree> tree;

    explicit Parsed(std::u16string_view sql) : text(sql) {
        facade.SetSQL(text);
        facade.ParseSQL();
        tree = newTree();
    }
    std::unique_ptr<CZRSQLTree> newTree() {
        CZRSQLTree* root = nullptr;
        facade.GetSQLTree(&root);
        return std::unique_ptr<CZRSQLTree>(root);
    }
};

using ParsedMssql = Parsed<CZRMSSQLParser>;
using ParsedMsAccess = Parsed<CZRMSAccessSQL_v3Parcer>;
