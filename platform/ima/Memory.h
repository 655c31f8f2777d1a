/// The memory that the calls of this API hand out.
#pragma once

#include <ima/ima.h>

#include <cstddef>
#include <memory>

namespace ima {

struct FreeMemory {
  void operator()(void* memory) const { IMA_FreeMemory(memory); }
};

/// Released into an out parameter as the last step of all, when nothing can fail any more.
template <class Record>
using Owned = std::unique_ptr<Record, FreeMemory>;

/// @p size zeroed bytes that IMA_FreeMemory takes back. Throws std::bad_alloc.
__attribute__((visibility("default"))) void* Allocate(std::size_t size);

/// A record that ends in an array of which it has @p count elements, as the lists of OIDs and address keys
/// do.
template <class List, class Element>
Owned<List> NewList(std::size_t count) {
  const std::size_t more = count > 1 ? count - 1 : 0;
  return Owned<List>(static_cast<List*>(Allocate(sizeof(List) + more * sizeof(Element))));
}

#ifdef HCLI_CHECKED
/// How much of what was handed out has not come back yet. The libraries that are installed have no such call.
__attribute__((visibility("default"))) std::size_t OutstandingAllocations();
#endif

}  // namespace ima
