// One byte at a time: a byte-class table drives the encoder; the decoder
// walks the input byte by byte.
#include "tests/reference/quoted_printable_reference.h"

#include <array>

#include "common/hex_digits.h"
#include "common/size_gate.h"

namespace zul::reference {
namespace {

enum class byte_class : std::uint8_t { literal, whitespace, line_break, hex };

constexpr std::array<byte_class, 256> kClasses = [] {
  std::array<byte_class, 256> classes{};
  for (unsigned b = 0; b < 256; ++b) {
    if (b == '\t' || b == ' ') {
      classes[b] = byte_class::whitespace;
    } else if (b == '\n' || b == '\r') {
      classes[b] = byte_class::line_break;
    } else if (b >= 33 && b <= 126 && b != '=') {
      classes[b] = byte_class::literal;
    } else {
      classes[b] = byte_class::hex;
    }
  }
  return classes;
}();

constexpr std::string_view kLineBreak = "\r\n";

// The state of one encoding run: output, column of the current output line
// and the space or tab held back until we know whether a line break follows.
class encoder {
 public:
  encoder(std::size_t input_size, std::int64_t line_length, std::uint64_t limit)
      : line_length_(line_length), limit_(limit) {
    // Every input byte writes at most 6 bytes (a soft break and "=XX").
    out_.reserve(worst_case_reserve(input_size, 6, 16, limit));
  }

  // True once some output was refused because it would pass the limit.
  bool over() const { return over_; }

  void emit_literally(char c) {
    const bool wraps = column_ + 1 >= line_length_ - 1;
    if (!room(wraps ? 4 : 1)) return;
    if (wraps) {
      soft_break();
      column_ = 1;
    } else {
      column_ += 1;
    }
    out_ += c;
  }

  void emit_hex_encoded(char c) {
    const bool wraps = column_ + 3 >= line_length_ - 1;
    if (!room(wraps ? 6 : 3)) return;
    const auto b = static_cast<std::uint8_t>(c);
    if (wraps) {
      soft_break();
      column_ = 3;
    } else {
      column_ += 3;
    }
    out_ += '=';
    out_ += kHexDigits[b >> 4];
    out_ += kHexDigits[b & 15];
  }

  void output_line_break() {
    if (!room(kLineBreak.size())) return;
    out_ += kLineBreak;
    column_ = 0;
  }

  // Writes the held-back space or tab, if any: literally, or encoded when a
  // line break follows (RFC 2045 rule 3).
  void flush_pending(bool before_line_break) {
    if (pending_ == 0) return;
    if (before_line_break) {
      emit_hex_encoded(pending_);
    } else {
      emit_literally(pending_);
    }
    pending_ = 0;
  }
  void hold(char c) { pending_ = c; }

  std::string finish(bool had_line_break) {
    flush_pending(false);
    if (had_line_break && column_ > 0 && room(3)) {
      soft_break();
      column_ = 0;
    }
    if (over_) return {};
    return std::move(out_);
  }

 private:
  // Room for n more bytes within the limit; once refused, always refused.
  bool room(std::size_t n) {
    if (!over_ && !make_room(out_, n, limit_)) over_ = true;
    return !over_;
  }

  void soft_break() {
    out_ += '=';
    out_ += kLineBreak;
  }

  std::string out_;
  std::int64_t line_length_;
  std::uint64_t limit_;
  bool over_ = false;
  std::int64_t column_ = 0;
  char pending_ = 0;
};

bool is_line_break(char c) { return c == '\r' || c == '\n'; }

// The other byte of a two-byte line break (LF after CR, CR after LF).
char partner(char c) { return c == '\r' ? '\n' : '\r'; }

}  // namespace

std::string encode_quoted_printable_reference(std::string_view in, std::int64_t line_length,
                                              std::uint64_t limit) {
  std::int64_t width = static_cast<std::int32_t>(static_cast<std::uint32_t>(line_length));
  if (width <= 1) width = 72;
  encoder enc(in.size(), width, limit);
  bool had_line_break = false;
  const std::size_t n = in.size();
  for (std::size_t i = 0; i < n && !enc.over(); ++i) {
    const char c = in[i];
    switch (kClasses[static_cast<std::uint8_t>(c)]) {
      case byte_class::hex:
        enc.flush_pending(false);
        enc.emit_hex_encoded(c);
        break;
      case byte_class::literal:
        enc.flush_pending(false);
        enc.emit_literally(c);
        break;
      case byte_class::whitespace:
        enc.flush_pending(false);
        enc.hold(c);
        break;
      case byte_class::line_break:
        if (i + 1 < n && in[i + 1] == partner(c)) ++i;
        enc.flush_pending(true);
        enc.output_line_break();
        had_line_break = true;
        break;
    }
  }
  return enc.finish(had_line_break);
}

std::string decode_quoted_printable_reference(std::string_view in) {
  const std::size_t n = in.size();
  std::string out;
  out.reserve(n + 1024);
  std::size_t i = 0;
  // Skips one line break at i (CR, LF, CR LF or LF CR).
  auto skip_line_break = [&] {
    const char c = in[i++];
    if (i < n && in[i] == partner(c)) ++i;
  };
  while (i < n) {
    std::size_t run = i;
    while (run < n && in[run] != '=' && !is_line_break(in[run])) ++run;
    out.append(in.data() + i, run - i);
    i = run;
    if (i == n) break;
    if (is_line_break(in[i])) {
      skip_line_break();
      out += '\n';
      continue;
    }
    ++i;  // past "="
    if (i == n) break;
    if (is_line_break(in[i])) {
      skip_line_break();  // soft break
    } else if (in[i] == ' ' || in[i] == '\t') {
      // Soft break with trailing text: drop the rest of the line.
      while (i < n && !is_line_break(in[i])) ++i;
      if (i < n) skip_line_break();
    } else {
      const char high = in[i++];
      if (i == n) break;
      const char low = in[i++];
      if (is_hex_digit(high) && is_hex_digit(low)) {
        out += static_cast<char>(hex_value(high) << 4 | hex_value(low));
      }
    }
  }
  return out;
}

}  // namespace zul::reference
