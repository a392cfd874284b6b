#pragma once

#include <cstdint>

#include "zrparsersql/db_types.h"
#include "zrparsersql/export.h"
#include "zrparsersql/wide_string.h"

class CZRDescriptorFactory;
class CZRStorageNode;

// Root of every descriptor of a model: database, table, query, field, index, foreign key and alias. Holds
// what all of them have in common: an identity, the names in the source and in the target, the type before
// and after mapping, the selection and the rule by which names are shown.
//
// A descriptor is owned by the descriptor whose list or map holds it and deleted through the virtual
// destructor. Threads: none of it is guarded; a model is built and changed on one thread (CZRTableInfo tells
// its one exception). Failure: nothing here reports an error, apart from GenerateID.
class ZR_SHARED_DECLARATION CZRObjectInfo {
 public:
    CString ID;                // identity in the model, text of a GUID in braces
    CString SrcName;           // name in the source
    CString Type;              // source type
    CString TypeMapped;        // target type
    CString TypeMappedString;  // complete target type, as a definition writes it
    int Length = -1;           // as the type counts it (characters, bytes or digits); -1: none
    int LengthMapped = -1;     // -1: none
    int Scale = 0;
    int ScaleMapped = 0;
    int DataType = 0;
    int State = 1;
    int Correct = 0;  // 0 valid, 1 to 100 an error, from 101 on a warning
    int DbTypeSrcLast = 0;
    int DbTypeSrcCur = 0;
    int AutoIncrMapped = 0;
    int UnsignedMapped = 0;
    int IndexOff = 0;
    CString Name;      // name in the target
    int Selected = 1;  // takes part in the conversion
    // Rule of the getters of names and types: 1 upper case, in spite of the member's name, 2 lower case,
    // anything else as stored. What is stored and saved keeps its case.
    std::int16_t LowerCase = 0;
    int Resolved = 0;  // references were looked up and found
    int Computed = 0;  // an expression, not a stored column

    // Gives the object an ID of its own; it stays empty when none can be made.
    CZRObjectInfo();
    // A copy keeps the ID: other descriptors refer to the object by it.
    CZRObjectInfo(const CZRObjectInfo& other) = default;
    CZRObjectInfo& operator=(const CZRObjectInfo&) = delete;
    virtual ~CZRObjectInfo();

    virtual int GetSelected() const;
    virtual void SetSelected(int value);
    virtual std::int16_t GetLowerCase() const;
    virtual void SetLowerCase(std::int16_t value);
    virtual CString GetID() const;
    virtual void SetID(CString value);
    // Makes a new ID. 0 when it was done, or when the text could not be made (ID is unchanged then);
    // otherwise the failure code of the GUID service, with ID unchanged.
    virtual int GenerateID();
    // Names and types are read by the rule of LowerCase and stored without white space at their ends.
    virtual CString GetName() const;
    virtual void SetName(CString value);
    // Read and stored as it is.
    virtual CString GetSrcName() const;
    virtual void SetSrcName(CString value);
    // Kind of database that the host's class is for; DB_NONE here.
    virtual DBTypes GetDBType() const;
    virtual CString GetType() const;
    virtual void SetType(CString value);
    // A second pair on the member Type.
    virtual CString GetTypeName() const;
    virtual void SetTypeName(CString value);
    virtual CString GetTypeMappedString() const;
    // Rebuilds TypeMappedString from the type definition and collation that classes of columns know. Does
    // nothing for an object that has neither.
    virtual void BuildTypeMappedString();
    virtual CString GetTypeMapped() const;
    virtual void SetTypeMapped(CString value);
    virtual int GetLength() const;
    virtual void SetLength(int value);
    virtual int GetLengthMapped() const;
    virtual void SetLengthMapped(int value);
    virtual int GetScale() const;
    virtual void SetScale(int value);
    virtual int GetScaleMapped() const;
    virtual void SetScaleMapped(int value);
    virtual int GetState() const;
    virtual void SetState(int value);
    // Validates where a class has something to validate (CZRQueryInfo), so it may change the object.
    virtual int GetCorrect();
    virtual void SetCorrect(int value);
    virtual int GetDbTypeSrcLast() const;
    virtual void SetDbTypeSrcLast(int value);
    virtual int GetDbTypeSrcCur() const;
    virtual void SetDbTypeSrcCur(int value);
    virtual int GetAutoIncrMapped() const;
    virtual void SetAutoIncrMapped(int value);
    virtual int GetUnsignedMapped() const;
    virtual void SetUnsignedMapped(int value);
    virtual int GetIndexOff() const;
    virtual void SetIndexOff(int value);
    // Write to and read from a storage node, see storage.h. What the node or the factory throws comes out.
    virtual void Save(CZRStorageNode& node);
    virtual void Load(CZRStorageNode& node, CZRDescriptorFactory& factory);
    // Takes over names, types, selection and state of another object, read through its getters, and leaves
    // ID, SrcName, Resolved and Computed alone: so a later source is merged into objects that have their
    // identity already. The flag is for subclasses.
    virtual void CopyProperties(CZRObjectInfo& source, int flag);
    // A new object of the same class, for the caller to own. selectedOnly matters to classes with lists: they
    // leave out the entries that are not selected.
    virtual CZRObjectInfo* Clone(int selectedOnly = 0) const = 0;
    // Whether the object stands for something that is computed, such as a query, or for a stored table.
    virtual bool IsDerivedSource() const = 0;
    virtual bool IsBaseTable() const = 0;
    // Longest name that the target allows, in UTF-16 units; -1 for no limit.
    virtual int GetMaxNameLength() const;
    // 1; a query answers whether it reads from another one.
    virtual int HasQuerySource();

    int GetDataType() const { return DataType; }
    void SetDataType(int value) { DataType = value; }

    // Cuts a name that is longer than GetMaxNameLength. A cut name is stored as GetName shows it.
    void TruncateName();

 protected:
    // The text by the rule of LowerCase.
    CString foldCase(const CString& text) const;
};
