/// Objects that are not in a tree yet, each held against the schema.
#pragma once

#include <cstddef>
#include <deque>
#include <string>
#include <string_view>

#include "store/Record.h"
#include "store/Schema.h"

#pragma GCC visibility push(default)

namespace store {

/// What is shown in place of a secret; no secret is that.
inline constexpr std::string_view kMask = "***";

/// One object of a document, right by itself and in its place.
struct DocumentObject {
  Kind kind{};
  std::size_t parent = 0;  // its number in the document; the root's is 0
  std::size_t place = 0;   // among the children of the parent that are of the same kind, from 0
  std::size_t offset = 0;  // in the text
  std::string name = {};   // as NameOf gives it
  Record record;
};

/// The objects in the order in which they begin: the root, and each behind its parent. They stay where they
/// are.
using Document = std::deque<DocumentObject>;

/// The record of an object of @p kind with all of @p given and the defaults of what is not in it, checked.
Record Complete(Kind kind, const Record& given);

}  // namespace store

#pragma GCC visibility pop
