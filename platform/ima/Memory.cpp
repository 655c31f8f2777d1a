#include "ima/Memory.h"

#include <cstdlib>
#include <new>
#include <optional>
#include <set>

#include "host/Storage.h"

namespace ima {

namespace {

struct Registry {
  std::set<void*> handedOut;
  /// What is called while a list is held is a walk, and sees one state of the host. It is the walk of the
  /// list that was there first: one within it that is never given back keeps no transaction open.
  std::optional<host::Reading> walk;
  void* outermost = nullptr;
};

Registry& TheRegistry() {
  static Registry registry;
  return registry;
}

}  // namespace

void* Allocate(std::size_t size) {
  std::unique_ptr<void, void (*)(void*)> memory(std::calloc(1, size), std::free);
  if (memory == nullptr) throw std::bad_alloc();
  Registry& registry = TheRegistry();
  registry.handedOut.insert(memory.get());
  if (!registry.walk) {
    registry.walk.emplace();
    registry.outermost = memory.get();
  }
  return memory.release();
}

#ifdef HCLI_CHECKED
std::size_t OutstandingAllocations() { return TheRegistry().handedOut.size(); }
#endif

}  // namespace ima

extern "C" IMA_STATUS IMA_FreeMemory(void* memory) {
  ima::Registry& registry = ima::TheRegistry();
  if (registry.handedOut.erase(memory) == 0) return IMA_ERROR_INVALID_PARAMETER;
  if (memory == registry.outermost) {
    registry.walk.reset();
    registry.outermost = nullptr;
  }
  std::free(memory);
  return IMA_STATUS_SUCCESS;
}
