#include "host/Platform.h"

namespace host {

namespace {

constinit Platform* current = nullptr;

}  // namespace

Platform::Platform() : before_(current) { current = this; }

Platform::~Platform() { current = before_; }

Platform& Platform::Current() { return *current; }

}  // namespace host
