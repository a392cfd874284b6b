// Compiled for the layouts that the compiler tells of its classes, never run: every class with virtual
// operations that library and hosts go by. What is abstract has a stand-in, whose names mark the slots that
// are pure.
#include <zrparsersql/parse_exception.h>
#include <zrparsersql/sql_parsers.h>
#include <zrparsersql/sql_tree.h>

#include "tests/model/small_host.h"

class Tree : public CZRSQLTree {
 public:
    CZRSQLTree* GetChild(unsigned int) override;
    unsigned int GetChildCount() override;
    CString GetText() override;
    unsigned int GetType() override;
};

class Parser : public CZRSQLParser {
 public:
    void ParseSQL() override;
};

class Exception : public CZRException {
 public:
    void DoMessageBox(HWND) override;
    int GetErrNumber() override;
    int GetErrCode() override;
    CString GetErrString() override;
    CString GetErrMessage() override;
};

class StorageNode : public CZRStorageNode {
 public:
    CList<CString> GetChildNames() override;
    int HasChild(CString) override;
    void OpenChild(CString, int) override;
    void CloseChild() override;
    void RemoveChild(CString) override;
    int ReadInt(CString, int) override;
    CString ReadString(CString, CString, int) override;
    void WriteInt(CString, int) override;
    void WriteString(CString, CString, int) override;
};
