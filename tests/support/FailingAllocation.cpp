#include "support/FailingAllocation.h"

#include <dlfcn.h>

#include <new>

namespace {

long countdown = 0;
bool (*exempt)() = nullptr;

void Count() {
  if (countdown > 0 && !exempt() && --countdown == 0) {
    countdown = -1;
    throw std::bad_alloc();
  }
}

}  // namespace

// The one for arrays calls this one; the operators delete stay the ones of the library.
void* operator new(std::size_t size) {
  // The operator that this one stands in front of: the sanitizers have one of their own.
  static auto* const next = reinterpret_cast<void* (*)(std::size_t)>(dlsym(RTLD_NEXT, "_Znwm"));
  Count();
  return next(size);
}

FailingAllocation::FailingAllocation(long number, bool (*isExempt)()) {
  exempt = isExempt;
  countdown = number;
}
FailingAllocation::~FailingAllocation() { countdown = 0; }
bool FailingAllocation::HasHappened() const { return countdown == -1; }
