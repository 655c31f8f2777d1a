#include "plinth/Failure.h"

#include <cxxabi.h>

#include <cstdlib>
#include <exception>
#include <memory>
#include <new>
#include <typeinfo>

namespace Plinth {

std::string CurrentExceptionText() {
  try {
    throw;
  } catch (const std::bad_alloc&) {
    return kOutOfMemory;
  } catch (const std::exception& failure) {
    const char* text = failure.what();
    if (text && *text) return text;
  } catch (...) {
  }
  const char* name = abi::__cxa_current_exception_type()->name();
  const std::unique_ptr<char, void (*)(void*)> plain(abi::__cxa_demangle(name, nullptr, nullptr, nullptr),
                                                     std::free);
  return std::string("an exception of type ") + (plain ? plain.get() : name);
}

}  // namespace Plinth
