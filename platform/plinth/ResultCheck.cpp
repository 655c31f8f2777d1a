#include <algorithm>

#include "plinth/CommandLine.h"
#include "plinth/Declarations.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

using MetaObj::MetaType;

std::string Differ(const std::string& posted, const std::string& declared) {
  return " is " + posted + ", declared is " + declared;
}

/// What differs, behind where it does: ".Name is int, declared is string". Empty where nothing does.
std::string Compare(const MetaObj::MetaObject& declared, const MetaObj::MetaObject& posted);

std::string CompareLists(const MetaObj::MetaList& declared, const MetaObj::MetaList& posted) {
  if (declared.GetElementType() != posted.GetElementType()) {
    return Differ(std::string("a list of ") + TypeName(posted.GetElementType()),
                  std::string("a list of ") + TypeName(declared.GetElementType()));
  }
  for (std::size_t index = 0; index < posted.GetSize(); ++index) {
    const MetaObj::MetaObject& element = *posted.GetElement(index);
    std::string difference;
    if (element.GetType() != declared.GetElementType()) {
      difference = Differ(TypeName(element.GetType()), TypeName(declared.GetElementType()));
    } else if (declared.GetPrototype()) {
      difference = Compare(*declared.GetPrototype(), element);
    }
    if (!difference.empty()) return "[" + std::to_string(index) + "]" + difference;
  }
  return "";
}

std::string CompareStructures(const MetaObj::MetaStruct& declared, const MetaObj::MetaStruct& posted) {
  if (declared.GetTypeName() != posted.GetTypeName()) {
    return Differ("structure " + Quoted(posted.GetTypeName()), Quoted(declared.GetTypeName()));
  }
  if (declared.GetFieldCount() == 0) return "";
  const std::size_t both = std::min(declared.GetFieldCount(), posted.GetFieldCount());
  for (std::size_t index = 0; index < both; ++index) {
    const std::string& name = declared.GetFieldName(index);
    if (posted.GetFieldName(index) != name) {
      return ": field " + std::to_string(index + 1) +
             Differ(Quoted(posted.GetFieldName(index)), Quoted(name));
    }
    const std::string difference = Compare(*declared.GetField(index), *posted.GetField(index));
    if (!difference.empty()) return "." + name + difference;
  }
  if (declared.GetFieldCount() > both) {
    return ": field " + Quoted(declared.GetFieldName(both)) + " is missing";
  }
  if (posted.GetFieldCount() > both) {
    return ": field " + Quoted(posted.GetFieldName(both)) + " is not declared";
  }
  return "";
}

std::string Compare(const MetaObj::MetaObject& declared, const MetaObj::MetaObject& posted) {
  if (declared.GetType() != posted.GetType()) {
    return Differ(TypeName(posted.GetType()), TypeName(declared.GetType()));
  }
  if (declared.GetType() == MetaType::List) {
    return CompareLists(static_cast<const MetaObj::MetaList&>(declared),
                        static_cast<const MetaObj::MetaList&>(posted));
  }
  if (declared.GetType() == MetaType::Struct) {
    return CompareStructures(static_cast<const MetaObj::MetaStruct&>(declared),
                             static_cast<const MetaObj::MetaStruct&>(posted));
  }
  return "";
}

}  // namespace

std::string CheckResult(const MetaObj::MetaObject* prototype, const MetaObj::MetaObject& posted) {
  if (!prototype) return "the command declares no result type";
  const std::string difference = Compare(*prototype, posted);
  return difference.empty() ? "" : "the result" + difference;
}

}  // namespace Plinth
