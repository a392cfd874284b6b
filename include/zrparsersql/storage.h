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
// Implemented by the host, which owns it and keeps it for the length of a Save or Load. Every OpenChild of
// the library is followed by its CloseChild, also when an exception passes through.
//
// Names are exact in case and unique within a section. Failure: an operation may throw what the host likes;
// it comes out of Save or Load, and the descriptor that was loading then holds what had been read by then.
// Threads: called on the thread that saves or loads.
class ZR_SHARED_DECLARATION CZRStorageNode {
 public:
    virtual ~CZRStorageNode();

    // Names of the current section's child sections, in stored order.
    virtual CList<CString> GetChildNames() = 0;
    // 1 when the current section has such a child section, else 0.
    virtual int HasChild(CString name) = 0;
    // Makes a child the current section. A missing one is made when create is nonzero; otherwise the host
    // makes an empty section current that is not stored.
    virtual void OpenChild(CString name, int create) = 0;
    // Goes back to the parent.
    virtual void CloseChild() = 0;
    // Removes a child section with all below it. A missing one is no error.
    virtual void RemoveChild(CString name) = 0;
    // A value of the current section, or the default where there is none; writing replaces it. The flag of
    // the text operations is always 0.
    virtual int ReadInt(CString name, int defaultValue) = 0;
    virtual CString ReadString(CString name, CString defaultValue, int flag) = 0;
    virtual void WriteInt(CString name, int value) = 0;
    virtual void WriteString(CString name, CString value, int flag) = 0;
};

// Makes the host's descriptors. Each operation gives a new, empty object for the caller to own, or null for a
// kind that the host does not know: what is stored for that object is then passed over.
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
