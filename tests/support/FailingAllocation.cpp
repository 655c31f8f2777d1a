#include "support/FailingAllocation.h"

#include <dlfcn.h>

#include <cstdlib>
#include <new>

namespace {

long countdown = 0;
bool (*exempt)() = nullptr;

using Allocate = void*(std::size_t);

/// The operator that this one stands in front of: the sanitizers have one of their own.
Allocate* Next(const char* symbol) {
  void* const found = dlsym(RTLD_NEXT, symbol);
  if (found == nullptr) std::abort();
  return reinterpret_cast<Allocate*>(found);
}

void Count() {
  if (countdown > 0 && !exempt() && --countdown == 0) {
    countdown = -1;
    throw std::bad_alloc();
  }
}

}  // namespace

// The matching operators delete stay the ones of the library.
void* operator new(std::size_t size) {
  static Allocate* const next = Next("_Znwm");
  Count();
  return next(size);
}

void* operator new[](std::size_t size) {
  static Allocate* const next = Next("_Znam");
  Count();
  return next(size);
}

FailingAllocation::FailingAllocation(long number, bool (*isExempt)()) {
  exempt = isExempt;
  countdown = number;
}
FailingAllocation::~FailingAllocation() { countdown = 0; }
bool FailingAllocation::HasHappened() const { return countdown == -1; }
