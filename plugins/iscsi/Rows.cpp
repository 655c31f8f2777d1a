#include "Rows.h"

namespace TessaroCli {

using Plinth::MetaObj::MetaBool;
using Plinth::MetaObj::MetaInt;
using Plinth::MetaObj::MetaList;
using Plinth::MetaObj::MetaString;
using Plinth::MetaObj::MetaStruct;

Names::Names(const Structure& structure) : type(structure.name) {
  for (const Field& field : structure.fields) fields.emplace_back(field.name);
}

StructPtr NewPrototype(const Structure& structure) {
  StructPtr prototype = MetaStruct::New(structure.name);
  for (const Field& field : structure.fields) {
    switch (field.type) {
      case MetaType::Bool:
        prototype->SetField(field.name, MetaBool::New());
        break;
      case MetaType::Int:
        prototype->SetField(field.name, MetaInt::New());
        break;
      default:
        prototype->SetField(field.name, MetaString::New());
        break;
    }
  }
  return prototype;
}

ListPtr NewList(const StructPtr& element) { return MetaList::New(MetaType::Struct, element); }

}  // namespace TessaroCli
