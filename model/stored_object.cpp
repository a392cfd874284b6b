#include "model/stored_section.h"
#include "zrparsersql/object_info.h"
#include "zrparsersql/query_info.h"

CZRStorageNode::~CZRStorageNode() = default;
CZRDescriptorFactory::~CZRDescriptorFactory() = default;

void CZRObjectInfo::Save(CZRStorageNode& node) {
    {
        const zr::StoredSection options(node, u"Options", zr::Missing::Create);
        node.WriteInt(u"Selected", Selected);
        node.WriteInt(u"LowerCase", LowerCase);
    }
    const zr::StoredSection common(node, u"Common", zr::Missing::Create);
    node.WriteString(u"Name", Name, 0);
    node.WriteString(u"Type", Type, 0);
    node.WriteString(u"TypeMapped", TypeMapped, 0);
    node.WriteString(u"TypeMappedString", TypeMappedString, 0);
    node.WriteString(u"SrcName", SrcName, 0);
    node.WriteInt(u"Length", Length);
    node.WriteInt(u"LengthMapped", LengthMapped);
    node.WriteInt(u"Scale", Scale);
    node.WriteInt(u"ScaleMapped", ScaleMapped);
    node.WriteInt(u"DataType", DataType);
    node.WriteInt(u"State", State);
    node.WriteInt(u"Correct", Correct);
    node.WriteInt(u"DbTypeSrcLast", DbTypeSrcLast);
    node.WriteInt(u"DbTypeSrcCur", DbTypeSrcCur);
    node.WriteInt(u"AutoIncrMapped", AutoIncrMapped);
    node.WriteInt(u"UnsignedMapped", UnsignedMapped);
    node.WriteInt(u"IndexOff", IndexOff);
}

void CZRObjectInfo::Load(CZRStorageNode& node, CZRDescriptorFactory& /*factory*/) {
    {
        const zr::StoredSection options(node, u"Options", zr::Missing::Leave);
        // Old projects may have the name here; nothing writes it here any more.
        SrcName = node.ReadString(u"SrcName", CString(), 0);
        Selected = node.ReadInt(u"Selected", 1);
        LowerCase = static_cast<std::int16_t>(node.ReadInt(u"LowerCase", 0));
    }
    const zr::StoredSection common(node, u"Common", zr::Missing::Leave);
    Name = node.ReadString(u"Name", CString(), 0);
    Type = node.ReadString(u"Type", CString(), 0);
    TypeMapped = node.ReadString(u"TypeMapped", CString(), 0);
    TypeMappedString = node.ReadString(u"TypeMappedString", CString(), 0);
    SrcName = node.ReadString(u"SrcName", SrcName, 0);
    Length = node.ReadInt(u"Length", Length);
    LengthMapped = node.ReadInt(u"LengthMapped", LengthMapped);
    Scale = node.ReadInt(u"Scale", Scale);
    ScaleMapped = node.ReadInt(u"ScaleMapped", ScaleMapped);
    DataType = node.ReadInt(u"DataType", 0);
    // A new object has 1 here; a stored one without the key has 0. Intended, stored projects rely on it.
    State = node.ReadInt(u"State", 0);
    Correct = node.ReadInt(u"Correct", 0);
    DbTypeSrcLast = node.ReadInt(u"DbTypeSrcLast", 0);
    DbTypeSrcCur = node.ReadInt(u"DbTypeSrcCur", 0);
    AutoIncrMapped = node.ReadInt(u"AutoIncrMapped", 0);
    UnsignedMapped = node.ReadInt(u"UnsignedMapped", 0);
    IndexOff = node.ReadInt(u"IndexOff", 0);
}

void CZRQueryInfo::SaveQuery(CZRStorageNode& node) {
    Save(node);
}

void CZRQueryInfo::Load(CZRStorageNode& node, CZRDescriptorFactory& factory) {
    CZRSourceInfo::Load(node, factory);
}
