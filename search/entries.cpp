// Host adapters for the byte search: each reads its strings through rbData
// holders (target first), builds the ranges from its integer arguments and
// calls the pure worker. No allocation, nothing raised; the silent policy
// only keeps the compiler-checked promise that nothing escapes.
#include "plugin/exceptions.h"
#include "plugin/natives.h"
#include "plugin/rb_data.h"
#include "search/byte_search.h"

using zul::search::byte_range;

std::int64_t InStrBytesZUL(REALstring target, REALstring find) noexcept {
  return quietly<std::int64_t>(0, [&] {
    rbData t(target);
    rbData f(find);
    return zul::search::find_first_of(t.bytes(), f.bytes());
  });
}

std::int64_t InStrByteRange1ZUL(REALstring target, std::int64_t start, std::int64_t end) noexcept {
  return quietly<std::int64_t>(0, [&] {
    rbData t(target);
    const byte_range ranges[] = {{start, end}};
    return zul::search::find_in_ranges(t.bytes(), ranges);
  });
}

std::int64_t InStrByteRange2ZUL(REALstring target, std::int64_t start, std::int64_t end,
                                std::int64_t start2, std::int64_t end2) noexcept {
  return quietly<std::int64_t>(0, [&] {
    rbData t(target);
    const byte_range ranges[] = {{start, end}, {start2, end2}};
    return zul::search::find_in_ranges(t.bytes(), ranges);
  });
}

std::int64_t InStrByteRange3ZUL(REALstring target, std::int64_t start, std::int64_t end,
                                std::int64_t start2, std::int64_t end2, std::int64_t start3,
                                std::int64_t end3) noexcept {
  return quietly<std::int64_t>(0, [&] {
    rbData t(target);
    const byte_range ranges[] = {{start, end}, {start2, end2}, {start3, end3}};
    return zul::search::find_in_ranges(t.bytes(), ranges);
  });
}

std::int64_t InStrByteRange1BZUL(REALstring target, REALstring find, std::int64_t start,
                                 std::int64_t end) noexcept {
  return quietly<std::int64_t>(0, [&] {
    rbData t(target);
    rbData f(find);
    const byte_range ranges[] = {{start, end}};
    return zul::search::find_in_signed_ranges_or_set(t.bytes(), ranges, f.bytes());
  });
}

std::int64_t InStrByteRange2BZUL(REALstring target, REALstring find, std::int64_t start,
                                 std::int64_t end, std::int64_t start2,
                                 std::int64_t end2) noexcept {
  return quietly<std::int64_t>(0, [&] {
    rbData t(target);
    rbData f(find);
    const byte_range ranges[] = {{start, end}, {start2, end2}};
    return zul::search::find_in_signed_ranges_or_set(t.bytes(), ranges, f.bytes());
  });
}

std::int64_t InStrByteRange3BZUL(REALstring target, REALstring find, std::int64_t start,
                                 std::int64_t end, std::int64_t start2, std::int64_t end2,
                                 std::int64_t start3, std::int64_t end3) noexcept {
  return quietly<std::int64_t>(0, [&] {
    rbData t(target);
    rbData f(find);
    const byte_range ranges[] = {{start, end}, {start2, end2}, {start3, end3}};
    return zul::search::find_in_signed_ranges_or_set(t.bytes(), ranges, f.bytes());
  });
}
