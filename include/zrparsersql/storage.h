#pragma once

#include "zrparsersql/containers.h"
#include "zrparsersql/db_types.h"
#include "zrparsersql/export.h"
#include "zrparsersql/wide_string.h"

class CZRFieldInfo;
class CZRFilterInfo;
class CZRFilterItemInfo;
class CZRForeignKeyInfo;
class CZRIndexInfo;
class CZRQueryInfo;
class CZRTableInfo;

// Where descriptors save themselves: a tree of named sections with named values, with one section current.
// Implemented by the host. Every OpenChild of the library is followed by its CloseChild, also when an
// exception passes through.
class ZR_SHARED_DECLARATION CZRStorageNode {
 public:
    virtual ~CZRStorageNode();

    // Names of the current section's child sections, in stored order.
    virtual CList<CString> GetChildNames() = 0;
    virtual int HasChild(CString name) = 0;
    // Makes a child the current section. A missing one is made when create is nonzero; otherwise the host
    // makes an empty section current that is not stored.
    virtual void OpenChild(CString name, int create) = 0;
    // Goes back to the parent.
    virtual void CloseChild() = 0;
    virtual void RemoveChild(CString name) = 0;
    // The flag of the text operations is always 0.
    virtual int ReadInt(CString name, int defaultValue) = 0;
    virtual CString ReadString(CString name, CString defaultValue, int flag) = 0;
    virtual void WriteInt(CString name, int value) = 0;
    virtual void WriteString(CString name, CString value, int flag) = 0;
};

// Makes the host's descriptors. Each operation gives a new, empty object for the caller to own.
class ZR_SHARED_DECLARATION CZRDescriptorFactory {
 public:
    virtual ~CZRDescriptorFactory();

    virtual CZRTableInfo* CreateTable(DBTypes type) = 0;
    virtual CZRQueryInfo* CreateQuery(DBTypes type) = 0;
    virtual CZRFieldInfo* CreateField(DBTypes type) = 0;
    virtual CZRIndexInfo* CreateIndex(DBTypes type) = 0;
    virtual CZRForeignKeyInfo* CreateForeignKey(DBTypes type) = 0;
    virtual CZRFilterInfo* CreateFilter(DBTypes type) = 0;
    virtual CZRFilterItemInfo* CreateFilterItem(DBTypes type) = 0;
};
