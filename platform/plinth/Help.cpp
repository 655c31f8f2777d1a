#include "plinth/Help.h"

#include <algorithm>

#include "plinth/Text.h"

namespace Plinth {

namespace {

using Form = PageSection::Form;

/// The words of a line for a shell, each with its quotes.
std::vector<std::string> ShellWords(const std::string& line) {
  std::vector<std::string> words{""};
  char quote = 0;
  for (const char character : line) {
    if (quote == 0 && character == ' ') {
      words.emplace_back();
      continue;
    }
    if (quote == character) {
      quote = 0;
    } else if (quote == 0 && (character == '"' || character == '\'')) {
      quote = character;
    }
    words.back() += character;
  }
  return words;
}

std::string UsageText(const std::vector<std::string>& synopsis, std::size_t screen) {
  std::vector<std::string> parts = Split(synopsis.front(), ' ');
  parts.insert(parts.end(), synopsis.begin() + 1, synopsis.end());
  std::string usage = "Usage:";
  std::size_t column = usage.size();
  for (const std::string& part : parts) {
    const std::size_t width = 1 + DisplayWidth(part);
    if (column + width > screen) {
      usage += "\n      ";
      column = 6;
    }
    usage += ' ' + part;
    column += width;
  }
  return usage + '\n';
}

std::string ColumnsText(const std::vector<PageItem>& items, std::size_t screen) {
  std::size_t width = 0;
  for (const PageItem& item : items) width = std::max(width, DisplayWidth(item.term));
  std::string text;
  for (const PageItem& item : items) {
    text += "  " + item.term;
    if (!item.text.empty()) {
      text += std::string(width + 2 - DisplayWidth(item.term), ' ') + Wrap(item.text, width + 4, screen);
    }
    text += '\n';
  }
  return text;
}

std::string ItemsText(const PageSection& section, std::size_t screen) {
  if (section.form == Form::Columns) return ColumnsText(section.items, screen);
  std::string text;
  for (const PageItem& item : section.items) {
    if (section.form == Form::Examples) {
      text += "  " + Wrap(item.term, 2, screen) + '\n' + WrappedLine(item.text, 6, screen) + '\n';
    } else {
      text += (item.term.starts_with("--") ? "      " : "  ") + item.term + '\n';
      if (!item.text.empty()) text += std::string(10, ' ') + Wrap(item.text, 10, screen) + '\n';
    }
  }
  return text;
}

std::string SectionText(const PageSection& section, std::size_t screen) {
  if (section.heading.empty()) return Wrap(section.text, 0, screen) + '\n';
  std::string text = section.heading + ':';
  if (!section.text.empty()) text += ' ' + section.text;
  return Wrap(text, 0, screen) + '\n' + ItemsText(section, screen);
}

}  // namespace

std::string WrappedLine(const std::string& line, std::size_t indent, std::size_t screen) {
  std::string wrapped(indent, ' ');
  std::size_t column = indent;
  for (const std::string& word : ShellWords(Visible(line))) {
    const std::size_t width = 1 + DisplayWidth(word);
    if (column > indent && column + width + 2 > screen) {
      wrapped += " \\\n  " + std::string(indent, ' ');
      column = indent + 2;
    } else if (column > indent) {
      wrapped += ' ';
    }
    wrapped += word;
    column += width;
  }
  return wrapped;
}

std::string HelpText(const Place& place, std::size_t columns) {
  const Page page = HelpPage(place);
  std::string text = UsageText(page.synopsis, columns);
  if (!page.description.empty()) text += '\n' + Wrap(page.description, 0, columns) + '\n';
  for (const PageSection& section : page.sections) text += '\n' + SectionText(section, columns);
  return text;
}

}  // namespace Plinth
