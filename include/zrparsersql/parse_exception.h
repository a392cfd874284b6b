#pragma once

#include "zrparsersql/export.h"
#include "zrparsersql/wide_string.h"

// A window of the platform; declared here as the Windows headers declare it.
struct HWND__;
typedef HWND__* HWND;

// What every exception of the library answers. Defined here as a whole: a host may have exceptions of its own
// below it.
class ZR_API CZRException {
 public:
    CZRException() = default;
    CZRException(const CZRException&) = default;
    CZRException& operator=(const CZRException&) = default;
    virtual ~CZRException() = default;

    virtual void DoMessageBox(HWND owner) = 0;
    virtual int GetErrNumber() = 0;
    virtual int GetErrCode() = 0;
    virtual CString GetErrString() = 0;
    virtual CString GetErrMessage() = 0;
};

// An error in a query, for hosts to make, copy and throw. The library itself never throws one: wrong SQL
// leaves a descriptor empty or partly filled.
class ZR_API CZRParseSQLException : public CZRException {
 public:
    // Code and number have no value: an object made so is only good to be assigned to.
    CZRParseSQLException();
    // Code -1, no text.
    CZRParseSQLException(int number);
    // Number 0.
    CZRParseSQLException(CString text, unsigned int code);
    CZRParseSQLException(const CZRParseSQLException& other);
    CZRParseSQLException& operator=(const CZRParseSQLException& other);
    ~CZRParseSQLException() override;

    // Shows an error box without text and caption, whatever the object holds; see diagnostics.h.
    void DoMessageBox(HWND owner) override;
    int GetErrNumber() override;
    int GetErrCode() override;
    CString GetErrString() override;
    // Always empty.
    CString GetErrMessage() override;

 private:
    int m_code;
    int m_number;
    CString m_text;
};
