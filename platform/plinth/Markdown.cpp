#include "plinth/Manual.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

using Form = PageSection::Form;

/// @p text with nothing in it that Markdown takes for more than text; its lines stay apart.
std::string Escaped(const std::string& text, const std::string& indent) {
  std::string escaped;
  for (const char character : Visible(text, Lines::Kept)) {
    if (character == '\n') {
      escaped += "\\\n" + indent;
    } else {
      if (std::string_view("\\`*<>[]|").find(character) != std::string_view::npos) escaped += '\\';
      escaped += character;
    }
  }
  return escaped;
}

std::string Code(const std::string& text) { return '`' + Visible(text) + '`'; }

std::string Block(const std::string& line) { return "```sh\n" + Visible(line) + "\n```\n"; }

std::string SectionText(const PageSection& section) {
  std::string text = "\n### " + section.heading + "\n\n";
  if (!section.text.empty()) text += Escaped(section.text, "") + "\n\n";
  for (const PageItem& item : section.items) {
    if (section.form == Form::Examples) {
      text += Escaped(item.term, "") + "\n\n" + Block(item.text) + '\n';
    } else {
      text += "- " + Code(item.term) + (item.text.empty() ? "" : ": " + Escaped(item.text, "  ")) + '\n';
    }
  }
  while (text.ends_with("\n\n")) text.pop_back();
  return text;
}

bool IsOfCommand(const PageSection& section) {
  return section.heading == "Options" || section.heading == "Result" || section.heading == "Examples";
}

}  // namespace

std::string MarkdownText(const Page& page) {
  std::string text = "\n## " + ProgramWith(page.path) + '\n';
  if (!page.description.empty()) text += '\n' + Escaped(page.description, "") + '\n';
  text += '\n' + Block(Join(page.synopsis, " "));
  for (const PageSection& section : page.sections) {
    const bool isShown = page.path.empty() ? section.heading != "See also" : IsOfCommand(section);
    if (isShown) text += SectionText(section);
  }
  return text;
}

}  // namespace Plinth
