#include <algorithm>

#include "plinth/CommandLine.h"
#include "plinth/Declarations.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

using MetaObj::MetaType;

std::string Differ(const std::string& where, const std::string& posted, const std::string& declared) {
  return where + " is " + posted + ", declared is " + declared;
}

std::string Compare(const MetaObj::MetaObject& declared, const MetaObj::MetaObject& posted,
                    const std::string& where);

std::string CompareLists(const MetaObj::MetaList& declared, const MetaObj::MetaList& posted,
                         const std::string& where) {
  if (declared.GetElementType() != posted.GetElementType()) {
    return Differ(where, std::string("a list of ") + TypeName(posted.GetElementType()),
                  std::string("a list of ") + TypeName(declared.GetElementType()));
  }
  for (std::size_t index = 0; index < posted.GetSize(); ++index) {
    const MetaObj::MetaObject& element = *posted.GetElement(index);
    const std::string place = where + "[" + std::to_string(index) + "]";
    if (element.GetType() != declared.GetElementType()) {
      return Differ(place, TypeName(element.GetType()), TypeName(declared.GetElementType()));
    }
    if (!declared.GetPrototype()) continue;
    std::string difference = Compare(*declared.GetPrototype(), element, place);
    if (!difference.empty()) return difference;
  }
  return "";
}

std::string CompareStructures(const MetaObj::MetaStruct& declared, const MetaObj::MetaStruct& posted,
                              const std::string& where) {
  if (declared.GetTypeName() != posted.GetTypeName()) {
    return Differ(where, "structure " + Quoted(posted.GetTypeName()), Quoted(declared.GetTypeName()));
  }
  if (declared.GetFieldCount() == 0) return "";
  const std::size_t both = std::min(declared.GetFieldCount(), posted.GetFieldCount());
  for (std::size_t index = 0; index < both; ++index) {
    const std::string& name = declared.GetFieldName(index);
    if (posted.GetFieldName(index) != name) {
      return Differ(where + ": field " + std::to_string(index + 1), Quoted(posted.GetFieldName(index)),
                    Quoted(name));
    }
    std::string difference = Compare(*declared.GetField(index), *posted.GetField(index), where + "." + name);
    if (!difference.empty()) return difference;
  }
  if (declared.GetFieldCount() > both) {
    return where + ": field " + Quoted(declared.GetFieldName(both)) + " is missing";
  }
  if (posted.GetFieldCount() > both) {
    return where + ": field " + Quoted(posted.GetFieldName(both)) + " is not declared";
  }
  return "";
}

std::string Compare(const MetaObj::MetaObject& declared, const MetaObj::MetaObject& posted,
                    const std::string& where) {
  if (declared.GetType() != posted.GetType()) {
    return Differ(where, TypeName(posted.GetType()), TypeName(declared.GetType()));
  }
  if (declared.GetType() == MetaType::List) {
    return CompareLists(static_cast<const MetaObj::MetaList&>(declared),
                        static_cast<const MetaObj::MetaList&>(posted), where);
  }
  if (declared.GetType() == MetaType::Struct) {
    return CompareStructures(static_cast<const MetaObj::MetaStruct&>(declared),
                             static_cast<const MetaObj::MetaStruct&>(posted), where);
  }
  return "";
}

}  // namespace

std::string CheckResult(const MetaObj::MetaObject* prototype, const MetaObj::MetaObject& posted) {
  if (!prototype) return "the command declares no result type";
  return Compare(*prototype, posted, "the result");
}

}  // namespace Plinth
