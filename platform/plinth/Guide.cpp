#include "plinth/Guide.h"

#include <yaml.h>

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <memory>
#include <new>
#include <string_view>
#include <system_error>
#include <utility>

#include "plinth/Options.h"
#include "plinth/OwnCommands.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

class GuideReader {
 public:
  explicit GuideReader(const std::string& file) : file_(file) {
    const std::unique_ptr<std::FILE, int (*)(std::FILE*)> stream(std::fopen(file.c_str(), "re"), std::fclose);
    if (!stream) throw GuideError(file + ": " + std::strerror(errno));
    yaml_parser_t parser;
    if (!yaml_parser_initialize(&parser)) throw std::bad_alloc();
    yaml_parser_set_input_file(&parser, stream.get());
    isLoaded_ = yaml_parser_load(&parser, &document_) == 1;
    yaml_document_t behind;
    // Without a document that is left, the library gives an empty one.
    const bool isRead = isLoaded_ && yaml_parser_load(&parser, &behind) == 1;
    if (!isRead) {
      fault_ = At(parser.problem_mark.line, parser.problem ? parser.problem : "it cannot be read");
    } else {
      if (yaml_document_get_root_node(&behind)) {
        fault_ = At(behind.start_mark.line, "a second document begins here; a guide is a single one");
      }
      yaml_document_delete(&behind);
    }
    yaml_parser_delete(&parser);
  }
  GuideReader(const GuideReader&) = delete;
  GuideReader& operator=(const GuideReader&) = delete;
  ~GuideReader() {
    if (isLoaded_) yaml_document_delete(&document_);
  }

  Guide Read() {
    if (!fault_.empty()) throw GuideError(fault_);
    Guide guide;
    const yaml_node_t* const top = yaml_document_get_root_node(&document_);
    if (!top) return guide;
    ForEachPair(*top, [&](const std::string& key, const yaml_node_t& value) {
      if (key == "values") {
        ForEachItem(value, [&](const yaml_node_t& item) { AddSource(item, guide); });
      } else if (key == "commands") {
        ForEachPair(value, [&](const std::string& path, const yaml_node_t& command) {
          ReadCommand(command, path, guide);
        });
      } else if (key == "fields") {
        ForEachPair(value, [&](const std::string& structure, const yaml_node_t& fields) {
          ForEachPair(fields, [&](const std::string& field, const yaml_node_t& meaning) {
            guide.fields[structure][field] = Text(meaning);
          });
        });
      } else if (KeyValues* const texts = FindTexts(guide, key)) {
        ForEachPair(value, [&](const std::string& name, const yaml_node_t& meaning) {
          texts->emplace_back(name, Text(meaning));
        });
      } else {
        FailKey(value, key, "values, commands, fields, terms, environment and files");
      }
    });
    return guide;
  }

 private:
  static KeyValues* FindTexts(Guide& guide, const std::string& key) {
    return key == "terms"         ? &guide.terms
           : key == "environment" ? &guide.environment
           : key == "files"       ? &guide.files
                                  : nullptr;
  }

  std::string At(std::size_t line, const std::string& text) const {
    return file_ + ':' + std::to_string(line + 1) + ": " + text;
  }
  [[noreturn]] void Fail(const yaml_node_t& node, const std::string& text) const {
    throw GuideError(At(node.start_mark.line, text));
  }
  [[noreturn]] void FailKey(const yaml_node_t& node, const std::string& key, const char* right) const {
    Fail(node, "there is no key " + Quoted(key) + " here; there are " + right);
  }

  std::string Text(const yaml_node_t& node) const {
    if (node.type != YAML_SCALAR_NODE || node.data.scalar.length == 0) Fail(node, "a text has to stand here");
    return {reinterpret_cast<const char*>(node.data.scalar.value), node.data.scalar.length};
  }

  template <class Visitor>
  void ForEachItem(const yaml_node_t& node, Visitor visit) {
    if (node.type != YAML_SEQUENCE_NODE) Fail(node, "a list has to stand here");
    for (const auto* item = node.data.sequence.items.start; item != node.data.sequence.items.top; ++item) {
      visit(*yaml_document_get_node(&document_, *item));
    }
  }

  /// The library lets a key stand twice.
  template <class Visitor>
  void ForEachPair(const yaml_node_t& node, Visitor visit) {
    if (node.type != YAML_MAPPING_NODE) Fail(node, "names with values have to stand here");
    std::map<std::string, bool> seen;
    for (const auto* pair = node.data.mapping.pairs.start; pair != node.data.mapping.pairs.top; ++pair) {
      const yaml_node_t& keyNode = *yaml_document_get_node(&document_, pair->key);
      const std::string key = Text(keyNode);
      if (!seen.emplace(key, true).second) Fail(keyNode, Quoted(key) + " stands here twice");
      visit(key, *yaml_document_get_node(&document_, pair->value));
    }
  }

  void AddSource(const yaml_node_t& node, Guide& guide) {
    ValueSource source = ReadSource(node);
    for (const ValueSource& known : guide.values) {
      if (known.option != source.option || known.of != source.of) continue;
      Fail(node, "the values of " + Quoted(source.option) + " stand here twice for the same place");
    }
    guide.values.push_back(std::move(source));
  }

  ValueSource ReadSource(const yaml_node_t& node) {
    ValueSource source;
    ForEachPair(node, [&](const std::string& key, const yaml_node_t& value) {
      if (key == "option") {
        source.option = Text(value);
      } else if (key == "of") {
        source.of = Text(value);
      } else if (key == "from") {
        source.from = Text(value);
      } else if (key == "field") {
        source.field = Text(value);
      } else if (key == "about") {
        source.about = Text(value);
      } else if (key == "with") {
        ForEachItem(value, [&](const yaml_node_t& option) { source.with.push_back(Text(option)); });
      } else if (key == "kind") {
        source.kind = ReadKind(value);
      } else if (key == "listed") {
        if (!ReadTruth(Text(value), source.isListed)) Fail(value, "either yes or no has to stand here");
      } else {
        FailKey(value, key, "option, of, from, field, about, with, kind and listed");
      }
    });
    const bool isShown = source.kind == ValueSource::Kind::Shown;
    if (source.option.empty()) Fail(node, "the key option is missing");
    if (isShown == source.from.empty() || isShown == source.field.empty()) {
      Fail(node, "either from and field, or kind, has to stand here");
    }
    return source;
  }

  ValueSource::Kind ReadKind(const yaml_node_t& node) const {
    const std::string kind = Text(node);
    if (kind == "file") return ValueSource::Kind::File;
    if (kind == "folder") return ValueSource::Kind::Folder;
    if (kind == "command") return ValueSource::Kind::Command;
    Fail(node, "the kind " + Quoted(kind) + " is none; there are file, folder and command");
  }

  void ReadCommand(const yaml_node_t& node, const std::string& path, Guide& guide) {
    ForEachPair(node, [&](const std::string& key, const yaml_node_t& value) {
      if (key == "result") {
        guide.results[path] = Text(value);
      } else if (key == "examples") {
        ForEachItem(value,
                    [&](const yaml_node_t& item) { guide.examples[path].push_back(ReadExample(item)); });
      } else {
        FailKey(value, key, "result and examples");
      }
    });
  }

  Example ReadExample(const yaml_node_t& node) {
    Example example;
    ForEachPair(node, [&](const std::string& key, const yaml_node_t& text) {
      if (key != "about" && key != "line") FailKey(text, key, "about and line");
      (key == "about" ? example.about : example.line) = Text(text);
    });
    if (example.about.empty() || example.line.empty()) Fail(node, "an example has about and line");
    return example;
  }

  std::string file_;
  /// Why the file is not YAML, or not one document; empty where it is.
  std::string fault_;
  yaml_document_t document_{};
  bool isLoaded_ = false;
};

std::string& GuideFolder() {
  static std::string folder;
  return folder;
}

template <class Value>
const Value& FindOrEmpty(const std::map<std::string, Value>& values, const std::string& key) {
  static const Value empty;
  const auto found = values.find(key);
  return found == values.end() ? empty : found->second;
}

/// True where @p path is @p place, or stands in it.
bool IsWithin(const std::string& path, const std::string& place) {
  return place.empty() || path == place || path.starts_with(place + ' ');
}

}  // namespace

const ValueSource* Guide::FindValues(const std::string& path, const std::string& option) const {
  const ValueSource* nearest = nullptr;
  for (const ValueSource& source : values) {
    if (source.option != option || !IsWithin(path, source.of)) continue;
    if (!nearest || source.of.size() > nearest->of.size()) nearest = &source;
  }
  return nearest;
}

const std::vector<Example>& Guide::ExamplesOf(const std::string& path) const {
  return FindOrEmpty(examples, path);
}

const std::string& Guide::ResultOf(const std::string& path) const { return FindOrEmpty(results, path); }

const std::string& Guide::MeaningOf(const std::string& structure, const std::string& field) const {
  return FindOrEmpty(FindOrEmpty(fields, structure), field);
}

Guide ReadGuide(const std::string& file) { return GuideReader(file).Read(); }

void SetGuideFolder(const std::string& folder) { GuideFolder() = folder; }

std::vector<std::string> GuideFiles() {
  std::vector<std::string> files;
  std::error_code error;  // of a folder that is not there, too
  for (std::filesystem::directory_iterator at(GuideFolder(), error), end; !error && at != end;
       at.increment(error)) {
    if (at->path().extension() == ".yaml") files.push_back(at->path());
  }
  std::sort(files.begin(), files.end());
  return files;
}

std::vector<std::string> GuideFaults() {
  std::vector<std::string> faults;
  for (const std::string& file : GuideFiles()) {
    try {
      ReadGuide(file);
    } catch (const GuideError& error) {
      faults.emplace_back(error.what());
    }
  }
  return faults;
}

std::string GuideFile(const AutoCli::NamespaceNode& root, const std::string& path) {
  const std::string word = path.substr(0, path.find(' '));
  const AutoCli::NamespaceNode* const top = AutoCli::NodeData::FindChild(root, word);
  const std::string name = FindOwnCommand(word) || path.empty() ? "hcli"
                           : top                                ? AutoCli::NodeData::Of(*top).plugin
                                                                : "";
  return GuideFolder().empty() || name.empty() ? "" : GuideFolder() + '/' + name + ".yaml";
}

const Guide& GuideTo(const AutoCli::NamespaceNode& root, const std::string& path) {
  static std::map<std::string, Guide> guides;
  const std::string file = GuideFile(root, path);
  const auto [known, isNew] = guides.try_emplace(file);
  if (isNew && !file.empty()) {
    try {
      known->second = ReadGuide(file);
    } catch (const GuideError&) {
      // Told by whoever looks the guides through.
    }
  }
  return known->second;
}

}  // namespace Plinth
