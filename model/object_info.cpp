#include "zrparsersql/object_info.h"

#include "platform/guid.h"

namespace {

constexpr std::int16_t kShowUpper = 1;
constexpr std::int16_t kShowLower = 2;

CString trimmed(CString text) {
    text.Trim();
    return text;
}

}  // namespace

CZRObjectInfo::CZRObjectInfo() {
    // A failure is not reported: the object then has an empty ID. The service is called directly since
    // overrides of GenerateID do not exist yet.
    zr::createGuidText(ID);
}

CZRObjectInfo::~CZRObjectInfo() = default;

CString CZRObjectInfo::foldCase(const CString& text) const {
    CString result = text;
    if (LowerCase == kShowUpper)
        result.MakeUpper();
    else if (LowerCase == kShowLower)
        result.MakeLower();
    return result;
}

int CZRObjectInfo::GenerateID() {
    return zr::createGuidText(ID);
}

int CZRObjectInfo::GetSelected() const {
    return Selected;
}
void CZRObjectInfo::SetSelected(int value) {
    Selected = value;
}
std::int16_t CZRObjectInfo::GetLowerCase() const {
    return LowerCase;
}
void CZRObjectInfo::SetLowerCase(std::int16_t value) {
    LowerCase = value;
}
CString CZRObjectInfo::GetID() const {
    return ID;
}
void CZRObjectInfo::SetID(CString value) {
    ID = std::move(value);
}
CString CZRObjectInfo::GetName() const {
    return foldCase(Name);
}
void CZRObjectInfo::SetName(CString value) {
    Name = trimmed(std::move(value));
}
CString CZRObjectInfo::GetSrcName() const {
    return SrcName;
}
void CZRObjectInfo::SetSrcName(CString value) {
    SrcName = std::move(value);
}
DBTypes CZRObjectInfo::GetDBType() const {
    return DB_NONE;
}
CString CZRObjectInfo::GetType() const {
    return foldCase(Type);
}
void CZRObjectInfo::SetType(CString value) {
    Type = trimmed(std::move(value));
}
CString CZRObjectInfo::GetTypeName() const {
    return foldCase(Type);
}
void CZRObjectInfo::SetTypeName(CString value) {
    Type = trimmed(std::move(value));
}
CString CZRObjectInfo::GetTypeMappedString() const {
    return foldCase(TypeMappedString);
}
void CZRObjectInfo::BuildTypeMappedString() {}
CString CZRObjectInfo::GetTypeMapped() const {
    return foldCase(TypeMapped);
}
void CZRObjectInfo::SetTypeMapped(CString value) {
    TypeMapped = trimmed(std::move(value));
}
int CZRObjectInfo::GetLength() const {
    return Length;
}
void CZRObjectInfo::SetLength(int value) {
    Length = value;
}
int CZRObjectInfo::GetLengthMapped() const {
    return LengthMapped;
}
void CZRObjectInfo::SetLengthMapped(int value) {
    LengthMapped = value;
}
int CZRObjectInfo::GetScale() const {
    return Scale;
}
void CZRObjectInfo::SetScale(int value) {
    Scale = value;
}
int CZRObjectInfo::GetScaleMapped() const {
    return ScaleMapped;
}
void CZRObjectInfo::SetScaleMapped(int value) {
    ScaleMapped = value;
}
int CZRObjectInfo::GetState() const {
    return State;
}
void CZRObjectInfo::SetState(int value) {
    State = value;
}
int CZRObjectInfo::GetCorrect() {
    return Correct;
}
void CZRObjectInfo::SetCorrect(int value) {
    Correct = value;
}
int CZRObjectInfo::GetDbTypeSrcLast() const {
    return DbTypeSrcLast;
}
void CZRObjectInfo::SetDbTypeSrcLast(int value) {
    DbTypeSrcLast = value;
}
int CZRObjectInfo::GetDbTypeSrcCur() const {
    return DbTypeSrcCur;
}
void CZRObjectInfo::SetDbTypeSrcCur(int value) {
    DbTypeSrcCur = value;
}
int CZRObjectInfo::GetAutoIncrMapped() const {
    return AutoIncrMapped;
}
void CZRObjectInfo::SetAutoIncrMapped(int value) {
    AutoIncrMapped = value;
}
int CZRObjectInfo::GetUnsignedMapped() const {
    return UnsignedMapped;
}
void CZRObjectInfo::SetUnsignedMapped(int value) {
    UnsignedMapped = value;
}
int CZRObjectInfo::GetIndexOff() const {
    return IndexOff;
}
void CZRObjectInfo::SetIndexOff(int value) {
    IndexOff = value;
}
int CZRObjectInfo::GetMaxNameLength() const {
    return -1;
}
int CZRObjectInfo::HasQuerySource() {
    return 1;
}

void CZRObjectInfo::CopyProperties(CZRObjectInfo& source, int /*flag*/) {
    Name = source.GetName();
    Type = source.GetTypeName();
    TypeMapped = source.GetTypeMapped();
    TypeMappedString = source.GetTypeMappedString();
    Length = source.GetLength();
    LengthMapped = source.GetLengthMapped();
    Scale = source.GetScale();
    ScaleMapped = source.GetScaleMapped();
    DataType = source.DataType;
    State = source.GetState();
    Correct = source.GetCorrect();
    DbTypeSrcLast = source.GetDbTypeSrcLast();
    DbTypeSrcCur = source.GetDbTypeSrcCur();
    Selected = source.GetSelected();
    LowerCase = source.GetLowerCase();
    AutoIncrMapped = source.GetAutoIncrMapped();
    UnsignedMapped = source.GetUnsignedMapped();
    IndexOff = source.GetIndexOff();
}

void CZRObjectInfo::TruncateName() {
    const int limit = GetMaxNameLength();
    if (limit < 0) return;
    const CString name = GetName();
    if (name.GetLength() > limit) SetName(name.Left(limit));
}
