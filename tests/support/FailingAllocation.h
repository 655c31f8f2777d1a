/// Memory that runs out: operator new of the whole process fails once, where a test wants it.
#pragma once

/// Makes allocation @p number from now (1 is the next) throw std::bad_alloc; 0 is none. Allocations for which
/// @p isExempt is true neither count nor fail. At most one such object lives at a time.
class FailingAllocation {
 public:
  FailingAllocation(long number, bool (*isExempt)());
  FailingAllocation(const FailingAllocation&) = delete;
  FailingAllocation& operator=(const FailingAllocation&) = delete;
  ~FailingAllocation();

  /// True when it has failed.
  bool HasHappened() const;
};
