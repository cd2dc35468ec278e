// A switch that makes every operator new on the current thread fail with
// std::bad_alloc while a fail_allocations guard lives. The test binary
// replaces the global operator new and delete for this; with no guard alive
// they behave as the ordinary ones.
#pragma once

namespace zul::testing {

class fail_allocations {
 public:
  fail_allocations();
  ~fail_allocations();
  fail_allocations(const fail_allocations&) = delete;
  fail_allocations& operator=(const fail_allocations&) = delete;
};

}  // namespace zul::testing
