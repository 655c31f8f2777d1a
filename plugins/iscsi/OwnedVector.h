/// Vectors of pointers that the library hands over.
#pragma once

#include <CoreCtl/Util.h>

#include <utility>
#include <vector>

namespace TessaroCli::IscsiNamespace {

/// Owns the elements of a vector from the library for as long as it lives. An element may be null.
template <class T>
class OwnedVector {
 public:
  explicit OwnedVector(std::vector<T*> elements) : elements_(std::move(elements)) {}
  OwnedVector(const OwnedVector&) = delete;
  OwnedVector& operator=(const OwnedVector&) = delete;
  ~OwnedVector() { CoreCtl::Util::DeleteVector(elements_); }

  auto begin() const { return elements_.begin(); }
  auto end() const { return elements_.end(); }

 private:
  std::vector<T*> elements_;
};

}  // namespace TessaroCli::IscsiNamespace
