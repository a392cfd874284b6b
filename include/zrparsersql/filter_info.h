#pragma once

#include <cstddef>
#include <cstdint>

#include "zrparsersql/containers.h"
#include "zrparsersql/db_types.h"
#include "zrparsersql/export.h"
#include "zrparsersql/wide_string.h"

class CZRDescriptorFactory;
class CZRStorageNode;

namespace zr {

// A point in time as hosts exchange it: days since 30 December 1899, with the time of day as the fraction (of
// the absolute value, before that day).
struct DateTime {
    enum class Status { Valid, Invalid, Null };
    double days = 0;
    Status status = Status::Valid;
};

}  // namespace zr

// Encodings of a filter value's text. Those without a name here are the single-byte tables 3 to 26; any other
// value means ISO 8859-1.
enum FilterEncoding : int {
    FE_UTF8 = 1,
    FE_ANSI = 2,  // the system's code page
    FE_ASCII = 7,
    FE_UTF16 = 1000,
};

// The typed value of one condition: text in a declared encoding that is converted when asked for.
//
// Setters answer 1, or 0 when memory ran out, which leaves a null value. A null pointer makes a null value of
// the type given. Without memory copies, saving and loading throw std::bad_alloc. Reading may fill the cache
// of the last conversion, so even readers of one value need a guard against each other; distinct values are
// independent.
struct ZR_SHARED_DECLARATION CZRFilterValue {
    char* Data = nullptr;             // the text, with a zero behind it; null is SQL's NULL; owned
    std::uint32_t DataLength = 0;     // bytes, without the zero
    int Encoding = FE_ANSI;           // of Data
    char* Converted = nullptr;        // cache of the last conversion; owned
    int ConvertedEncoding = FE_ANSI;  // of Converted
    int ValueType = -1;               // data type of the value
    char* Blob = nullptr;             // binary part; owned
    std::uint32_t BlobLength = 0;     // bytes

    CZRFilterValue() = default;
    // A deep copy, without the cache.
    CZRFilterValue(const CZRFilterValue& other);
    CZRFilterValue& operator=(const CZRFilterValue& other);
    ~CZRFilterValue();

    // Forgets text, cache and binary part; the value is null, of that type.
    void SetNull(int valueType);
    bool IsNull() const { return Data == nullptr; }

    // Numbers are stored as ASCII text.
    int SetDouble(double value, int valueType);
    int SetInt64(std::int64_t value, int valueType);
    int SetUInt32(std::uint32_t value, int valueType);
    int SetInt32(std::int32_t value, int valueType);
    int SetInt16(std::int16_t value, int valueType);
    int SetInt8(std::int8_t value, int valueType);
    int SetDate(const zr::DateTime& value, int valueType);
    // Zero-terminated UTF-16 units.
    int SetWide(const char16_t* text, int valueType);
    // Bytes of a known length, as ASCII.
    int SetBytes(const void* bytes, std::uint32_t length, int valueType);
    // Zero-terminated bytes in an encoding.
    int SetText(const char* text, int encoding, int valueType);
    int SetBlob(const void* bytes, std::uint32_t length);

    // The text in an encoding, with a zero behind it (two zero bytes for UTF-16), or null for a null value or
    // without memory. The pointer holds until the value is changed, destroyed or asked for another encoding.
    const char* GetAs(int encoding);
    const char16_t* GetWide();
    // Reads the text as a number, as far as it is one; 0 where it is none or out of range. Each "," of the
    // text becomes "." for good.
    double GetDouble();
    // Answers 0 and leaves the result alone when the text is no date.
    int GetDate(zr::DateTime& result);

    // Compares type, text and binary part.
    bool Equals(const CZRFilterValue& other) const;
    // Does not compare the type, and takes a binary part that is missing on either side as equal.
    bool EqualsLoosely(const CZRFilterValue& other) const;
    bool NotEquals(const CZRFilterValue& other) const { return !Equals(other); }

    void Save(CZRStorageNode& node);
    void Load(CZRStorageNode& node);
};

// One condition of a filter. A dialect's subclass supplies what is pure here.
//
// The destructor is not virtual: an owner runs this class's destructor and frees the memory with operator
// delete, so a subclass may only add members that need no destruction.
class ZR_SHARED_DECLARATION CZRFilterItemInfo {
 public:
    CString FieldID;       // SrcName of a column
    int Condition = 0;     // how the column is compared
    int ConditionAdd = 0;  // how the next condition is joined
    CZRFilterValue Value;
    std::int64_t ItemMark = 0;  // not saved

    CZRFilterItemInfo() = default;
    CZRFilterItemInfo(const CZRFilterItemInfo&) = default;
    CZRFilterItemInfo& operator=(const CZRFilterItemInfo&) = delete;
    ~CZRFilterItemInfo();

    // The condition as text of the dialect.
    virtual CString GetConditionText() = 0;
    // Write to and read from a storage node, see storage.h. What the node or the factory throws comes out.
    virtual void Save(CZRStorageNode& node);
    virtual void Load(CZRStorageNode& node, CZRDescriptorFactory& factory);
    // A new object of the same class, for the caller to own.
    virtual CZRFilterItemInfo* Clone() const = 0;

    CString GetFieldID() const { return FieldID; }
    void SetFieldID(CString value) { FieldID = std::move(value); }
    int GetCondition() const { return Condition; }
    void SetCondition(int value) { Condition = value; }
    int GetConditionAdd() const { return ConditionAdd; }
    void SetConditionAdd(int value) { ConditionAdd = value; }
    CZRFilterValue& GetValue() { return Value; }
    void SetValue(const CZRFilterValue& value) { Value = value; }
    std::int64_t GetItemMark() const { return ItemMark; }
    void SetItemMark(std::int64_t value) { ItemMark = value; }
    void SetAll(CString fieldID, int condition, const CZRFilterValue& value, int conditionAdd);

    // Ends an item as its owner does. Null is allowed.
    static void destroy(CZRFilterItemInfo* item);
};

// The row filter of a table: conditions, or a free SQL text. Subclasses and destruction as for
// CZRFilterItemInfo. Not guarded against use from several threads.
class ZR_SHARED_DECLARATION CZRFilterInfo {
 public:
    CList<CZRFilterItemInfo*> Items;  // owned
    CString SQLQuery;
    int UseSQLQuery = 0;

    CZRFilterInfo() = default;
    // Clones each item.
    CZRFilterInfo(const CZRFilterInfo& other);
    CZRFilterInfo& operator=(const CZRFilterInfo&) = delete;
    ~CZRFilterInfo();

    // Kind of database that the filter is written for; it is stored with the filter.
    virtual DBTypes GetDBType() const = 0;
    // The whole filter as text of the dialect.
    virtual CString GetFilterText() = 0;
    // As for CZRFilterItemInfo; the items that were there before are ended.
    virtual void Save(CZRStorageNode& node);
    virtual void Load(CZRStorageNode& node, CZRDescriptorFactory& factory);
    // A new object of the same class, for the caller to own.
    virtual CZRFilterInfo* Clone() const = 0;

    CString GetSQLQuery() const { return SQLQuery; }
    void SetSQLQuery(CString value) { SQLQuery = std::move(value); }
    int GetUseSQLQuery() const { return UseSQLQuery; }
    void SetUseSQLQuery(int value) { UseSQLQuery = value; }
    CList<CZRFilterItemInfo*>& GetItems() { return Items; }

    // Ends a filter as its owner does. Null is allowed.
    static void destroy(CZRFilterInfo* filter);
};
