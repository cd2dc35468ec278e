#include "tests/reference/utf8_reference.h"

#include "text/utf8_repair.h"

namespace zul::reference {

std::string repair_utf8_reference(bytes_view bytes, std::string_view placeholder) {
  std::string out;
  std::size_t i = 0;
  while (i < bytes.size()) {
    const std::size_t length = text::well_formed_length(bytes.subspan(i));
    if (length == 0) {
      out.append(placeholder);
      ++i;
    } else {
      out.append(reinterpret_cast<const char*>(bytes.data() + i), length);
      i += length;
    }
  }
  return out;
}

}  // namespace zul::reference
