#include "plinth/Formatter.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

class Simple final : public Formatter {
 public:
  void Write(const Report& report, Sink& sink) const override {
    if (!StructureOf(*report.result)) return WritePlain(*report.result, sink);
    bool first = true;
    ForEachElement(*report.result, [&](const MetaObj::MetaObject& element) {
      if (!first) sink.Write("\n");
      first = false;
      if (const auto* structure = dynamic_cast<const MetaObj::MetaStruct*>(&element)) {
        WriteStructure(report, *structure, sink);
      } else {
        WritePlain(element, sink);
      }
    });
  }

 private:
  static void WriteStructure(const Report& report, const MetaObj::MetaStruct& structure, Sink& sink) {
    if (const std::string* header = FindValue(report.settings, "header:" + structure.GetTypeName())) {
      const auto lookup = [&](std::string_view name, std::string& value) {
        const MetaObj::MetaObject* field = FindField(structure, std::string(name));
        if (field) value = ValueText(*field);
        return field != nullptr;
      };
      sink.Write(Expand(*header, lookup) + '\n');
    }
    for (const std::string& name : ShownFields(report, structure)) {
      sink.Write("   " + Visible(name) + ": " + FieldText(structure, name) + '\n');
    }
  }
};

}  // namespace

const Formatter& SimpleFormatter() {
  static const Simple formatter;
  return formatter;
}

}  // namespace Plinth
