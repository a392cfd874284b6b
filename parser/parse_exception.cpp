#include "zrparsersql/parse_exception.h"

#include <cstdint>
#include <utility>

#include "platform/message_box.h"

namespace {
constexpr std::uint32_t kErrorBox = 16;  // one button, error icon
}  // namespace

// Leaving the numbers unset is intended; zero is as good as any value.
CZRParseSQLException::CZRParseSQLException() : m_code(0), m_number(0) {}
CZRParseSQLException::CZRParseSQLException(int number) : m_code(-1), m_number(number) {}
CZRParseSQLException::CZRParseSQLException(CString text, unsigned int code)
    : m_code(static_cast<int>(code)), m_number(0), m_text(std::move(text)) {}
CZRParseSQLException::CZRParseSQLException(const CZRParseSQLException&) = default;
CZRParseSQLException& CZRParseSQLException::operator=(const CZRParseSQLException&) = default;
CZRParseSQLException::~CZRParseSQLException() = default;

// The blank box is intended: hosts show their own text beside it.
void CZRParseSQLException::DoMessageBox(HWND owner) {
    zr::showMessageBox(owner, u"", u"", kErrorBox);
}

int CZRParseSQLException::GetErrNumber() {
    return m_number;
}
int CZRParseSQLException::GetErrCode() {
    return m_code;
}
CString CZRParseSQLException::GetErrString() {
    return m_text;
}
CString CZRParseSQLException::GetErrMessage() {
    return CString();
}
