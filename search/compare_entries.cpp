// Host adapters for counting, comparison and distances. Counting and byte
// comparison read stored bytes through rbData; the character comparison and
// the distances read text through rbText views, so strings stored in
// different encodings compare by their characters. Views and holders are
// released on every path. Counting and byte comparison report nothing; the
// character comparison and the distances raise through the trap.
#include <cstdio>

#include "plugin/exceptions.h"
#include "plugin/host_services.h"
#include "plugin/natives.h"
#include "plugin/rb_data.h"
#include "plugin/rb_text.h"
#include "search/count_compare.h"
#include "search/distance.h"

namespace {

// Raises "OutOfMemoryException" for a work buffer of bytes bytes; the count
// is printed as a 32-bit signed integer (a larger count shows truncated).
void raise_allocation_failure(std::int64_t bytes) {
  char message[100];
  std::snprintf(message, sizeof message, "Failed to allocate %d bytes of memory.",
                static_cast<int>(static_cast<std::int32_t>(bytes)));
  RaiseException("OutOfMemoryException", message, 0);
}

template <class Distance>
double distance_between(REALstring a, REALstring b, double failed, Distance distance) {
  return trapped(failed, [&] {
    rbText ta(a);
    rbText tb(b);
    ta.ConvertUTF32();
    tb.ConvertUTF32();
    const zul::search::distance_result r = distance(ta.utf32(), tb.utf32());
    if (r.unallocated_bytes != 0) raise_allocation_failure(r.unallocated_bytes);
    return r.value;
  });
}

}  // namespace

std::int64_t CountOccurancesZUL(REALstring s, REALstring find) noexcept {
  return quietly<std::int64_t>(0, [&] {
    rbData hs(s);
    rbData hf(find);
    return zul::search::count_occurrences(hs.bytes(), hf.bytes());
  });
}

std::int64_t StrCompBytesZUL(REALstring a, REALstring b) noexcept {
  return quietly<std::int64_t>(0, [&] {
    rbData ha(a);
    rbData hb(b);
    return zul::search::compare_bytes(ha.bytes(), hb.bytes());
  });
}

std::int64_t StrCompCharsZUL(REALstring a, REALstring b) noexcept {
  return trapped<std::int64_t>(0, [&]() -> std::int64_t {
    {
      rbData ha(a);
      rbData hb(b);
      // An empty side orders the same by stored bytes as by characters (all
      // zero bytes either way), and a null handle has no encoding to ask for.
      if (ha.empty() || hb.empty() || REALGetStringEncoding(a) == REALGetStringEncoding(b)) {
        return zul::search::compare_bytes(ha.bytes(), hb.bytes());
      }
    }
    rbText ta(a);
    rbText tb(b);
    return zul::search::compare_bytes(zul::bytes_of(ta.utf8()), zul::bytes_of(tb.utf8()));
  });
}

double jaroWinklerDistanceZUL(REALstring a, REALstring b) noexcept {
  return distance_between(a, b, 0.0, zul::search::jaro_winkler_distance);
}

double levenshteinDistanceZUL(REALstring a, REALstring b) noexcept {
  return distance_between(a, b, 1.0, zul::search::levenshtein_distance);
}
