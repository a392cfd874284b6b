#pragma once

#include "zrparsersql/containers.h"
#include "zrparsersql/export.h"
#include "zrparsersql/wide_string.h"

class CZRQueryInfo;

namespace zr {
// Marks the constructors that copy an object without what hangs below it.
struct ShallowCopy {};
class DescriptorCopier;
}  // namespace zr

// Values of SelectItem::m_kind.
enum SelectItemKind : int {
    SIK_VALUE = 0,
    SIK_NUMBER = 1,  // also an asterisk, an alias name or a join keyword
    SIK_STRING = 2,
    SIK_DATE = 3,
    SIK_FUNCTION = 4,  // also an operator
    SIK_FIELD = 5,
    SIK_SUB_QUERY = 6,
    SIK_USER_FUNCTION = 7,
    SIK_UNION = 8,
    SIK_DATA_TYPE = 9,
    SIK_FIELD_LIKE = 10,  // a field-like kind of a SelectItemField
};

// One node of a descriptor's expression tree. Owned by the list, item or descriptor that holds it; nothing in
// it points into the syntax tree it was made from. Trees may be of any depth: copying and deleting one needs
// no machine stack for it. Not guarded against use from several threads. Failure: an exhausted heap, as
// std::bad_alloc, and what GetExpressionText tells.
class ZR_SHARED_DECLARATION SelectItem {
 public:
    int m_nested = 0;     // 1 for an operator that stands directly under a nested join
    CString m_name;       // name of a function, text of an operator, or a fixed word
    int m_tokenType = 0;  // token number of the node that gave the name
    CString m_text;       // text of a literal, keyword or name
    int m_kind = SIK_VALUE;
    int m_isOperator = 0;  // written between its operands
    CString m_quoteOpen;   // around names in SelectItemField's GetItemText
    CString m_quoteClose;
    int m_computed = 0;          // set when the item was resolved to an expression
    CList<SelectItem*> m_items;  // operands, parameters, direction of an ordering; owned

    SelectItem() = default;
    // Null entries of m_items are left out.
    SelectItem(const SelectItem& other);
    SelectItem& operator=(const SelectItem&) = delete;
    virtual ~SelectItem();
    // A new tree of the same classes, for the caller to own.
    virtual SelectItem* Clone() const;
    // The item's own text.
    virtual CString GetItemText() const;
    // The item with its operands: "first name last" for an operator, "name(all,of,them)" otherwise. An
    // operator without operands raises CInvalidArgException.
    virtual CString GetExpressionText() const;

    // Deletes everything below the item and empties m_items.
    void ClearItems();
    // GetItemText of each item of m_items, with "," between them.
    CString JoinItems() const;

    void SetQuoteOpen(CString value) { m_quoteOpen = std::move(value); }
    void SetQuoteClose(CString value) { m_quoteClose = std::move(value); }

 protected:
    SelectItem(const SelectItem& other, zr::ShallowCopy);
    friend class zr::DescriptorCopier;
};

// A column.
class ZR_SHARED_DECLARATION SelectItemField : public SelectItem {
 public:
    CString m_sourceTable;     // the table as written, when it is not an alias
    CString m_sourceField;     // the column as written
    CString m_tableName;       // resolved names, which GetItemText prints
    CString m_fieldName;       //
    CString m_tableAlias;      // the qualifier, when it is a known alias
    CString m_resolvedSchema;  // schema of the resolved table
    CString m_reservedText;
    CString m_schemaName;  // schema and database of a qualified name, as written
    CString m_dbName;      //

    SelectItemField();
    // Kind 10 stays, every other becomes a field.
    SelectItemField(const SelectItemField& other);
    ~SelectItemField() override;
    SelectItemField* Clone() const override;
    CString GetItemText() const override;

 protected:
    SelectItemField(const SelectItemField& other, zr::ShallowCopy);
    friend class zr::DescriptorCopier;
};

// A nested query within an expression.
class ZR_SHARED_DECLARATION SelectItemSubQuery : public SelectItem {
 public:
    CZRQueryInfo* m_query = nullptr;  // owned

    SelectItemSubQuery();
    SelectItemSubQuery(const SelectItemSubQuery& other);
    ~SelectItemSubQuery() override;
    SelectItemSubQuery* Clone() const override;

 protected:
    SelectItemSubQuery(const SelectItemSubQuery& other, zr::ShallowCopy);
    friend class zr::DescriptorCopier;
};

// A branch of a union.
class ZR_SHARED_DECLARATION SelectItemUnion : public SelectItem {
 public:
    CZRQueryInfo* m_query = nullptr;  // owned

    SelectItemUnion();
    SelectItemUnion(const SelectItemUnion& other);
    ~SelectItemUnion() override;
    SelectItemUnion* Clone() const override;

 protected:
    SelectItemUnion(const SelectItemUnion& other, zr::ShallowCopy);
    friend class zr::DescriptorCopier;
};
