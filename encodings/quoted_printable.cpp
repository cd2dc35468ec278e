// Quoted-printable: one pass each way, output reserved once (the encoder's
// for the worst case, capped at the result limit, where encoding stops). A
// byte-set search finds the next byte that needs work; the run of printable
// bytes before it is copied a line's room at a time, with soft breaks
// between. Only the bytes that need work (and a space or tab that ends a
// run, which waits to see whether a line break follows) take the byte-class
// table one by one. The decoder copies runs without "=", CR or LF whole.
#include "encodings/quoted_printable.h"

#include <array>

#include "common/hex_digits.h"
#include "common/scan.h"
#include "common/size_gate.h"

namespace zul::encodings {
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

// Bytes the encoder copies as they are, in runs: printable ASCII other than
// "=", space and tab (a space or tab is encoded only before a line break,
// and only the last byte of a run can be followed by one).
constexpr simd::byte_set kEncoderWork = byte_set_where([](std::uint8_t b) {
  return kClasses[b] != byte_class::literal && kClasses[b] != byte_class::whitespace;
});
constexpr simd::byte_set kDecoderWork =
    byte_set_where([](std::uint8_t b) { return b == '=' || b == '\r' || b == '\n'; });

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

  // Copies a run of literal bytes, spaces and tabs, none of them pending,
  // as emit_literally would one by one: as much as fits before the line's
  // wrap column, then a soft break, and so on.
  void emit_run(const char* p, std::size_t n) {
    const std::int64_t width = line_length_ - 2;  // a literal at this column wraps
    while (n > 0) {
      std::size_t take;
      const bool wraps = column_ >= width;
      if (wraps) {
        const auto per_line = static_cast<std::uint64_t>(width > 1 ? width : 1);
        take = static_cast<std::size_t>(n < per_line ? n : per_line);
      } else {
        const auto left = static_cast<std::uint64_t>(width - column_);
        take = static_cast<std::size_t>(n < left ? n : left);
      }
      if (!room(take + (wraps ? 3 : 0))) return;
      if (wraps) {
        soft_break();
        column_ = 0;
      }
      out_.append(p, take);
      column_ += static_cast<std::int64_t>(take);
      p += take;
      n -= take;
    }
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

std::string encode_quoted_printable(std::string_view in, std::int64_t line_length,
                                    std::uint64_t limit, const scan_kernels& scan) {
  std::int64_t width = static_cast<std::int32_t>(static_cast<std::uint32_t>(line_length));
  if (width <= 1) width = 72;
  encoder enc(in.size(), width, limit);
  bool had_line_break = false;
  const auto* bytes = reinterpret_cast<const std::uint8_t*>(in.data());
  const std::size_t n = in.size();
  for (std::size_t i = 0; i < n && !enc.over(); ++i) {
    const char c = in[i];
    switch (kClasses[static_cast<std::uint8_t>(c)]) {
      case byte_class::hex:
        enc.flush_pending(false);
        enc.emit_hex_encoded(c);
        break;
      case byte_class::literal: {
        // A run of literals, spaces and tabs: all but a space or tab at its
        // end go out as a block. The loop's ++i steps past the run's end.
        std::size_t run = scan.find_first(kEncoderWork, bytes + i, n - i);
        if (kClasses[bytes[i + run - 1]] == byte_class::whitespace) --run;
        enc.flush_pending(false);
        enc.emit_run(in.data() + i, run);
        i += run - 1;
        break;
      }
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

std::string decode_quoted_printable(std::string_view in, const scan_kernels& scan) {
  const std::size_t n = in.size();
  std::string out;
  out.reserve(n + 1024);
  std::size_t i = 0;
  // Skips one line break at i (CR, LF, CR LF or LF CR).
  auto skip_line_break = [&] {
    const char c = in[i++];
    if (i < n && in[i] == partner(c)) ++i;
  };
  const auto* bytes = reinterpret_cast<const std::uint8_t*>(in.data());
  while (i < n) {
    // Escapes and breaks back to back need no search.
    if (!kDecoderWork.contains(bytes[i])) {
      const std::size_t run = i + scan.find_first(kDecoderWork, bytes + i, n - i);
      out.append(in.data() + i, run - i);
      i = run;
      if (i == n) break;
    }
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

}  // namespace zul::encodings
