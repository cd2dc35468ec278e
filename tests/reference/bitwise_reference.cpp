// One byte at a time, written for clarity, not speed.
#include "tests/reference/bitwise_reference.h"

namespace zul::reference {

std::string combine_reference(binary::detail::bit_op op, bytes_view data, bytes_view mask,
                              std::size_t start) {
  using binary::detail::bit_op;
  std::string out;
  std::size_t k = start;
  for (const std::uint8_t d : data) {
    const std::uint8_t b = mask[k];
    out += static_cast<char>(op == bit_op::kAnd ? (d & b) : op == bit_op::kOr ? (d | b) : (d ^ b));
    if (++k == mask.size()) k = 0;
  }
  return out;
}

}  // namespace zul::reference
