#include "host/columns.h"

#include "host/section.h"
#include "zrparsersql/database_info.h"

namespace zr::host {

namespace {

constexpr const char16_t* kColumnName = u"Name";
constexpr const char16_t* kReferencedName = u"Referenced";

// One section a column, from 1 on.
template <class List, class Write>
void saveColumns(CZRStorageNode& node, const List& columns, Write write) {
    const Section section(node, u"Columns", true);
    int number = 0;
    for (const auto& column : columns) {
        CString name;
        name.Format(u"Column%d", ++number);
        const Section entry(node, name, true);
        write(column);
    }
}

template <class Read>
void loadColumns(CZRStorageNode& node, Read read) {
    const Section section(node, u"Columns", false);
    const CList<CString> names = node.GetChildNames();
    for (const CString& name : names) {
        const Section entry(node, name, false);
        read();
    }
}

void tellOwner(CZRTableInfo* owner) {
    if (owner) owner->RecalcFromChildren();
}

}  // namespace

Field* Field::Clone(int /*selectedOnly*/) const {
    return new Field(*this);
}

void Field::SetSelected(int value) {
    if (value == Selected) return;
    CZRFieldInfo::SetSelected(value);
    tellOwner(owner_);
}

CString Field::GetTypeDefinition() const {
    const bool isMapped = !TypeMapped.IsEmpty();
    const int length = isMapped ? LengthMapped : Length;
    const int scale = isMapped ? ScaleMapped : Scale;
    const CString type = isMapped ? GetTypeMapped() : GetType();
    CString size;
    if (length >= 0 && scale > 0)
        size.Format(u"(%d, %d)", length, scale);
    else if (length >= 0)
        size.Format(u"(%d)", length);
    return type + size;
}

void Field::Save(CZRStorageNode& node) {
    CZRFieldInfo::Save(node);
    const Section section(node, kHostSection, true);
    node.WriteString(u"Collation", Collation, 0);
    node.WriteInt(u"ExcludedFromKey", ExcludedFromKey);
}

void Field::Load(CZRStorageNode& node, CZRDescriptorFactory& factory) {
    CZRFieldInfo::Load(node, factory);
    const Section section(node, kHostSection, false);
    Collation = node.ReadString(u"Collation", CString(), 0);
    ExcludedFromKey = node.ReadInt(u"ExcludedFromKey", 0);
}

Index::Index(const Index& other)
    : CZRIndexInfo(other), PrimaryKey(other.PrimaryKey), Unique(other.Unique), owner_(other.owner_) {
    for (const CZRIndexColumn* column : other.Columns) addColumn(column->GetColumnID());
}

Index::~Index() {
    clearColumns();
}

Index* Index::Clone(int /*selectedOnly*/) const {
    return new Index(*this);
}

void Index::SetSelected(int value) {
    if (value == Selected) return;
    CZRIndexInfo::SetSelected(value);
    tellOwner(owner_);
}

void Index::addColumn(const CString& srcName) {
    const POSITION place = Columns.AddTail(nullptr);
    Columns.SetAt(place, new IndexColumn(srcName));
    ColumnCount = Columns.GetCount();
}

void Index::clearColumns() {
    for (CZRIndexColumn* column : Columns) delete column;
    Columns.RemoveAll();
    ColumnCount = 0;
}

void Index::ResolveReferences() {
    Resolved = 0;
    if (!owner_) return;
    for (const CZRIndexColumn* column : Columns)
        if (!owner_->FindFieldBySrcName(column->GetColumnID())) return;
    Resolved = 1;
}

void Index::Save(CZRStorageNode& node) {
    CZRIndexInfo::Save(node);
    const Section section(node, kHostSection, true);
    node.WriteInt(u"PrimaryKey", PrimaryKey);
    node.WriteInt(u"Unique", Unique);
    saveColumns(node, Columns, [&node](const CZRIndexColumn* column) {
        node.WriteString(kColumnName, column->GetColumnID(), 0);
    });
}

void Index::Load(CZRStorageNode& node, CZRDescriptorFactory& factory) {
    CZRIndexInfo::Load(node, factory);
    const Section section(node, kHostSection, false);
    PrimaryKey = node.ReadInt(u"PrimaryKey", 0);
    Unique = node.ReadInt(u"Unique", 0);
    clearColumns();
    loadColumns(node, [&] { addColumn(node.ReadString(kColumnName, CString(), 0)); });
}

ForeignKey::ForeignKey(const ForeignKey& other)
    : CZRForeignKeyInfo(other),
      ReferencedTable(other.ReferencedTable),
      owner_(other.owner_),
      referencedTableId_(other.referencedTableId_) {
    for (const ColumnPair& pair : other.Columns) Columns.AddTail(pair);
}

ForeignKey* ForeignKey::Clone(int /*selectedOnly*/) const {
    return new ForeignKey(*this);
}

void ForeignKey::SetSelected(int value) {
    if (value == Selected) return;
    CZRForeignKeyInfo::SetSelected(value);
    tellOwner(owner_);
}

void ForeignKey::ResolveReferences() {
    Resolved = 0;
    referencedTableId_.Empty();
    if (!owner_ || !owner_->GetDatabase()) return;
    CZRTableInfo* table = owner_->GetDatabase()->FindTableBySrcName(ReferencedTable);
    if (!table) return;
    referencedTableId_ = table->GetID();
    for (const ColumnPair& pair : Columns)
        if (!owner_->FindFieldBySrcName(pair.column) || !table->FindFieldBySrcName(pair.referenced)) return;
    Resolved = 1;
}

void ForeignKey::Save(CZRStorageNode& node) {
    CZRForeignKeyInfo::Save(node);
    const Section section(node, kHostSection, true);
    node.WriteString(u"ReferencedTable", ReferencedTable, 0);
    saveColumns(node, Columns, [&node](const ColumnPair& pair) {
        node.WriteString(kColumnName, pair.column, 0);
        node.WriteString(kReferencedName, pair.referenced, 0);
    });
}

void ForeignKey::Load(CZRStorageNode& node, CZRDescriptorFactory& factory) {
    CZRForeignKeyInfo::Load(node, factory);
    const Section section(node, kHostSection, false);
    ReferencedTable = node.ReadString(u"ReferencedTable", CString(), 0);
    Columns.RemoveAll();
    loadColumns(node, [&] {
        ColumnPair pair;
        pair.column = node.ReadString(kColumnName, CString(), 0);
        pair.referenced = node.ReadString(kReferencedName, CString(), 0);
        Columns.AddTail(std::move(pair));
    });
}

}  // namespace zr::host
