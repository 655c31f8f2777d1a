#include <algorithm>
#include <cstdint>
#include <iterator>
#include <nlohmann/json.hpp>
#include <set>

#include "simulator/Description.h"
#include "store/DocumentChecks.h"
#include "store/DocumentReader.h"

namespace simulator {

using namespace host;

namespace {

/// Moves with the copies of it that the parser makes, so that it can be told where the parser is.
struct Cursor {
  using iterator_category = std::input_iterator_tag;
  using value_type = char;
  using difference_type = std::ptrdiff_t;
  using pointer = const char*;
  using reference = const char&;

  const char** at;
  char operator*() const { return **at; }
  Cursor& operator++() { return ++*at, *this; }
  bool operator==(const Cursor& other) const { return *at == *other.at; }
};

/// Hands on what the parser reads, and where it stands.
class Parser {
 public:
  using Text = Json::string_t;

  Parser(const std::string& text, DocumentReader& reader)
      : reader_(reader), text_(text), at_(text.data()), before_(at_) {}

  void Parse() {
    const char* end = text_.data() + text_.size();
    Json::sax_parse(Cursor{&at_}, Cursor{&end}, this);
  }

  bool null() { return Value({}); }
  bool boolean(bool value) { return Value(value); }
  bool number_integer(Json::number_integer_t value) { return Value(value); }
  bool number_unsigned(Json::number_unsigned_t value) { return Value(Whole(value)); }
  bool number_float(Json::number_float_t value, const Text&) { return Value(value); }
  bool string(const Text& value) { return Value(std::string_view(value)); }
  bool binary(const Json::binary_t&) { return false; }
  bool start_object(std::size_t) {
    return Do([&] { reader_.BeginObject(); });
  }
  bool key(const Text& name) {
    return Do([&] { reader_.Name(name); });
  }
  bool end_object() {
    return Do([&] { reader_.EndObject(); });
  }
  bool start_array(std::size_t) {
    return Do([&] { reader_.BeginList(); });
  }
  bool end_array() {
    return Do([&] { reader_.EndList(); });
  }
  bool parse_error(std::size_t, const Text&, const Json::exception& error) {
    if (dynamic_cast<const Json::out_of_range*>(&error) != nullptr) {
      Do([&] { reader_.Refuse("the number is too large"); });
    }
    // "[json.exception...] parse error at line 1, column 2: REASON; last read: 'TEXT'", and the text may hold
    // a secret.
    const std::string what = error.what();
    const std::size_t begin = std::min(what.find("parse error"), what.size());
    throw Error(Error::Kind::Invalid,
                "not a JSON document: " + what.substr(begin, what.find("; last read: ") - begin));
  }

 private:
  template <class Event>
  bool Do(Event event) {
    while (before_ < at_ && (*before_ <= ' ' || *before_ == ',' || *before_ == ':')) ++before_;
    reader_.MoveTo(static_cast<std::size_t>(before_ - text_.data()));
    event();
    before_ = at_;
    return true;
  }
  bool Value(const Scalar& value) {
    return Do([&] { reader_.Value(value); });
  }

  DocumentReader& reader_;
  const std::string& text_;
  const char* at_;      // how far the parser has read
  const char* before_;  // how far it had with the event before; behind a number, one character more
};

/// Adapters may go ahead of the NICs that are bound to them.
void RequireBoundNics(const Description& description) {
  std::set<std::string> nics;
  for (const DocumentObject& object : description) {
    if (object.kind == Kind::Nic) nics.insert(NameOf(Kind::Nic, object.record));
  }
  for (std::size_t i = 0; i < description.size(); ++i) {
    if (description[i].kind != Kind::NetworkPortal) continue;
    const std::string name = NameOf(Kind::NetworkPortal, description[i].record);
    if (nics.contains(name)) continue;
    throw Fault(description[i].offset, Below(PathOf(description, i), "nic"),
                "the host has no NIC " + Excerpt(name));
  }
}

}  // namespace

Description ReadDescription(const std::string& text) try {
  DocumentReader reader(Kind::Host);
  Parser(text, reader).Parse();
  Description description = reader.Take();
  RequireBoundNics(description);
  return description;
} catch (const Fault& fault) {
  const std::string_view ahead(text.data(), fault.offset);
  const auto line = std::count(ahead.begin(), ahead.end(), '\n') + 1;
  const std::size_t column = fault.offset - (ahead.rfind('\n') + 1) + 1;
  throw Error(Error::Kind::Invalid,
              fault.what() + (" (line " + std::to_string(line)) + ", column " + std::to_string(column) + ")");
}

}  // namespace simulator
