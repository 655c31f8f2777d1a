#include <cstdio>

#include "plinth/Help.h"
#include "plinth/Manual.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

using Form = PageSection::Form;

constexpr const char* kBold = "\\fB";
constexpr const char* kItalic = "\\fI";
constexpr const char* kRoman = "\\fR";

std::string Upper(std::string text) {
  for (char& byte : text) {
    if (byte >= 'a' && byte <= 'z') byte = static_cast<char>(byte - 'a' + 'A');
  }
  return text;
}

/// A character that would be a command, or that man would set as another one.
const char* Special(char character) {
  switch (character) {
    case '\\':
      return "\\e";
    case '-':
      return "\\-";
    case '\'':
      return "\\(aq";
    case '`':
      return "\\(ga";
    case '^':
      return "\\(ha";
    case '~':
      return "\\(ti";
    case '"':
      return "\\(dq";
    default:
      return nullptr;
  }
}

/// @p text, a part of one line, with nothing in it that roff would not show as it is.
std::string Escaped(const std::string& text) {
  const std::string visible = Visible(text);
  std::string escaped;
  for (std::size_t at = 0; at < visible.size();) {
    const Character character = DecodeUtf8(visible, at);
    if (character.code > 0x7F) {
      char code[16];
      std::snprintf(code, sizeof code, "\\[u%04X]", static_cast<unsigned>(character.code));
      escaped += code;
    } else if (const char* const special = Special(visible[at])) {
      escaped += special;
    } else {
      escaped += visible[at];
    }
    at += character.length;
  }
  // At the beginning of a line, a dot is a request; the mark in front of it is nothing.
  return escaped.starts_with('.') ? "\\&" + escaped : escaped;
}

/// Lines of text, each on a line of its own in the page too.
std::string Paragraph(const std::string& text) {
  std::vector<std::string> lines;
  for (const std::string& line : Split(text, '\n')) lines.push_back(Escaped(line));
  return Join(lines, "\n.br\n") + '\n';
}

std::string InFont(const char* font, const std::string& word) { return font + Escaped(word) + kRoman; }

bool IsPlaceholder(const std::string& word) {
  return !word.empty() && word.find_first_not_of("ABCDEFGHIJKLMNOPQRSTUVWXYZ.[]") == word.npos;
}

/// Names of options in bold, what they take in italics.
std::string Styled(const std::string& term) {
  std::vector<std::string> words;
  for (const std::string& word : Split(term, ' ')) {
    if (word.find('-') < 2) {
      words.push_back(InFont(kBold, word));
    } else {
      words.push_back(IsPlaceholder(word) ? InFont(kItalic, word) : Escaped(word));
    }
  }
  return Join(words, " ");
}

std::string SectionText(const PageSection& section) {
  std::string text = ".SH " + Escaped(Upper(section.heading)) + '\n';
  if (!section.text.empty()) text += Paragraph(section.text);
  for (const PageItem& item : section.items) {
    if (section.form == Form::Examples) {
      text += ".PP\n" + Paragraph(item.term) + ".RS 4\n.EX\n";
      // What a terminal of 80 columns holds behind the indents.
      for (const std::string& line : Split(WrappedLine(item.text, 0, 68), '\n')) text += Escaped(line) + '\n';
      text += ".EE\n.RE\n";
    } else {
      const bool isOption = item.term.starts_with('-');
      text += ".TP\n" + (isOption ? Styled(item.term) : InFont(kBold, item.term)) + '\n';
      text += item.text.empty() ? "\\&\n" : Paragraph(item.text);
    }
  }
  return text;
}

/// The description in one line without a stop, as indexes of pages show it.
std::string Summary(const Page& page) {
  std::string summary = Join(Split(page.description, '\n'), " ");
  if (summary.ends_with('.')) summary.pop_back();
  return summary.empty() ? ProgramWith(page.path) : summary;
}

}  // namespace

std::string RoffText(const Page& page) {
  const std::string name = PageName(page.path);
  std::string text =
      ".\\\" Made by hcli.\n.TH " + Escaped(Upper(name)) + " 1 \"\" \"hcli " HCLI_VERSION "\" \"hcli\"\n";
  text += ".nh\n.ad l\n.SH NAME\n" + Escaped(name) + " \\- " + Escaped(Summary(page)) + '\n';
  text += ".SH SYNOPSIS\n" + InFont(kBold, page.synopsis.front());
  for (auto part = page.synopsis.begin() + 1; part != page.synopsis.end(); ++part)
    text += ' ' + Styled(*part);
  text += '\n';
  if (!page.description.empty()) text += ".SH DESCRIPTION\n" + Paragraph(page.description);
  for (const PageSection& section : page.sections) text += SectionText(section);
  return text;
}

}  // namespace Plinth
