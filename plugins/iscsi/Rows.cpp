#include "Rows.h"

namespace TessaroCli {

using Plinth::MetaObj::MetaBool;
using Plinth::MetaObj::MetaInt;
using Plinth::MetaObj::MetaList;
using Plinth::MetaObj::MetaString;
using Plinth::MetaObj::MetaStruct;

std::vector<std::string> NamesOf(std::span<const Field> fields) {
  std::vector<std::string> names;
  for (const Field& field : fields) names.emplace_back(field.name);
  return names;
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
