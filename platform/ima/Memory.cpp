#include "ima/Memory.h"

#include <cstdlib>
#include <new>
#include <set>

namespace ima {

namespace {

std::set<void*>& HandedOut() {
  static std::set<void*> registry;
  return registry;
}

}  // namespace

void* Allocate(std::size_t size) {
  std::unique_ptr<void, void (*)(void*)> memory(std::calloc(1, size), std::free);
  if (memory == nullptr) throw std::bad_alloc();
  HandedOut().insert(memory.get());
  return memory.release();
}

std::size_t OutstandingAllocations() { return HandedOut().size(); }

}  // namespace ima

extern "C" IMA_STATUS IMA_FreeMemory(void* memory) {
  if (ima::HandedOut().erase(memory) == 0) return IMA_ERROR_INVALID_PARAMETER;
  std::free(memory);
  return IMA_STATUS_SUCCESS;
}
