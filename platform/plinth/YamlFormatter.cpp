#include <yaml.h>

#include <algorithm>
#include <cstdint>
#include <new>
#include <nlohmann/json.hpp>

#include "plinth/Formatter.h"

namespace Plinth {

namespace {

bool Contains(const std::string& text, std::string_view part) { return text.find(part) != text.npos; }

/// True where every reader takes the bare text for a text: those of YAML 1.1 see numbers in addresses, dates
/// and times, and truth in "on" and "no", which those of YAML 1.2 do not.
bool MayStandBare(const std::string& text) {
  static constexpr std::string_view kWords[] = {"y", "yes", "n", "no", "true", "on", "off", "false", "null"};
  if (text.empty()) return false;
  std::string lower = text;
  for (char& byte : lower) {
    if (byte >= 'A' && byte <= 'Z') byte = static_cast<char>(byte - 'A' + 'a');
  }
  const bool startsAsWord = (lower.front() >= 'a' && lower.front() <= 'z') || (lower.front() & 0x80) != 0;
  return startsAsWord && std::find(std::begin(kWords), std::end(kWords), lower) == std::end(kWords);
}

/// Where there is no reason for another, the library chooses.
yaml_scalar_style_t StyleOf(const std::string& text) {
  // Line breaks to YAML 1.1, so they are lost unless they are escaped.
  for (const std::string_view lineBreak : {"\r", "\xc2\x85", "\xe2\x80\xa8", "\xe2\x80\xa9"}) {
    if (Contains(text, lineBreak)) return YAML_DOUBLE_QUOTED_SCALAR_STYLE;
  }
  return Contains(text, "\n") ? YAML_LITERAL_SCALAR_STYLE : YAML_ANY_SCALAR_STYLE;
}

/// Writes YAML. It takes what a parser of JSON finds, by the names that the parser calls.
class YamlWriter {
 public:
  explicit YamlWriter(Sink& sink) : sink_(sink) {
    if (!yaml_emitter_initialize(&emitter_)) throw std::bad_alloc();
    yaml_emitter_set_output(&emitter_, Write, this);
    yaml_emitter_set_unicode(&emitter_, 1);
    yaml_emitter_set_width(&emitter_, -1);
  }
  YamlWriter(const YamlWriter&) = delete;
  YamlWriter& operator=(const YamlWriter&) = delete;
  ~YamlWriter() { yaml_emitter_delete(&emitter_); }

  bool Begin() {
    yaml_event_t event;
    return Emit(event, yaml_stream_start_event_initialize(&event, YAML_UTF8_ENCODING)) &&
           Emit(event, yaml_document_start_event_initialize(&event, nullptr, nullptr, nullptr, 0));
  }
  bool End() {
    yaml_event_t event;
    return Emit(event, yaml_document_end_event_initialize(&event, 1)) &&
           Emit(event, yaml_stream_end_event_initialize(&event));
  }

  bool null() { return Scalar("null", true, YAML_PLAIN_SCALAR_STYLE); }
  bool boolean(bool truth) { return Scalar(truth ? "true" : "false", true, YAML_PLAIN_SCALAR_STYLE); }
  bool number_integer(std::int64_t number) {
    return Scalar(std::to_string(number), true, YAML_PLAIN_SCALAR_STYLE);
  }
  bool number_unsigned(std::uint64_t number) {
    return Scalar(std::to_string(number), true, YAML_PLAIN_SCALAR_STYLE);
  }
  bool number_float(double, const std::string& text) { return Scalar(text, true, YAML_PLAIN_SCALAR_STYLE); }
  bool string(const std::string& text) { return Scalar(text, MayStandBare(text), StyleOf(text)); }
  bool key(const std::string& text) { return string(text); }
  bool start_object(std::size_t) {
    yaml_event_t event;
    return Emit(event,
                yaml_mapping_start_event_initialize(&event, nullptr, nullptr, 1, YAML_BLOCK_MAPPING_STYLE));
  }
  bool end_object() {
    yaml_event_t event;
    return Emit(event, yaml_mapping_end_event_initialize(&event));
  }
  bool start_array(std::size_t) {
    yaml_event_t event;
    return Emit(event,
                yaml_sequence_start_event_initialize(&event, nullptr, nullptr, 1, YAML_BLOCK_SEQUENCE_STYLE));
  }
  bool end_array() {
    yaml_event_t event;
    return Emit(event, yaml_sequence_end_event_initialize(&event));
  }
  // A document has neither of these.
  static bool binary(const std::vector<std::uint8_t>&) { return false; }
  static bool parse_error(std::size_t, const std::string&, const std::exception&) { return false; }

 private:
  /// No exception may pass through the library.
  static int Write(void* self, unsigned char* bytes, std::size_t size) try {
    static_cast<YamlWriter*>(self)->sink_.Write({reinterpret_cast<const char*>(bytes), size});
    return 1;
  } catch (const std::bad_alloc&) {
    return 0;
  }

  /// The emitter takes the event over however that ends.
  bool Emit(yaml_event_t& event, int isMade) { return isMade && yaml_emitter_emit(&emitter_, &event); }

  bool Scalar(const std::string& text, bool mayBeBare, yaml_scalar_style_t style) {
    yaml_event_t event;
    const auto* const bytes = reinterpret_cast<const yaml_char_t*>(text.data());
    return Emit(event, yaml_scalar_event_initialize(&event, nullptr, nullptr, bytes,
                                                    static_cast<int>(text.size()), mayBeBare, 1, style));
  }

  Sink& sink_;
  yaml_emitter_t emitter_;
};

}  // namespace

void WriteYaml(const Report& report, Sink& sink) {
  // What a document holds is decided in one place.
  TextSink json;
  WriteJson(report, json);
  YamlWriter writer(sink);
  // What else than memory could the library lack, where the text is JSON and UTF-8?
  if (!writer.Begin() || !nlohmann::json::sax_parse(json.text, &writer) || !writer.End()) {
    throw std::bad_alloc();
  }
}

}  // namespace Plinth
