// Codecs and transcoding beside memcpy of the same size in the same run, so
// each figure reads as a share of memory speed. Inputs: text that needs no
// change, typical text (about one byte in 96 needing work) and worst-case
// text (every byte needing work), at 1 KiB, 1 MiB and 64 MiB. UTF-8 repair
// runs at every kernel level the machine has (scalar is the previous
// prefix-skipping repair). Calls the pure workers: no host in the loop.
#include <benchmark/benchmark.h>

#include <cstdint>
#include <cstring>
#include <map>
#include <random>
#include <string>
#include <vector>

#include "binary/hex_dump.h"
#include "binary/readable_runs.h"
#include "common/bytes.h"
#include "common/cpu.h"
#include "common/scan.h"
#include "encodings/html.h"
#include "encodings/html_tags.h"
#include "encodings/mail_subject.h"
#include "encodings/quoted_printable.h"
#include "encodings/sql.h"
#include "encodings/url.h"
#include "encodings/xml.h"
#include "tests/reference/hex_dump_reference.h"
#include "tests/reference/html_reference.h"
#include "tests/reference/mail_subject_reference.h"
#include "tests/reference/quoted_printable_reference.h"
#include "tests/reference/sql_reference.h"
#include "tests/reference/xml_reference.h"
#include "text/latin1.h"
#include "text/utf8_repair.h"

namespace {

void sizes(benchmark::internal::Benchmark* b) { b->Arg(1 << 10)->Arg(1 << 20)->Arg(64 << 20); }

void BM_memcpy(benchmark::State& state) {
  const std::size_t n = static_cast<std::size_t>(state.range(0));
  std::vector<char> from(n, 'x'), to(n);
  for (auto _ : state) {
    std::memcpy(to.data(), from.data(), n);
    benchmark::DoNotOptimize(to.data());
    benchmark::ClobberMemory();
  }
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) * state.range(0));
}
BENCHMARK(BM_memcpy)->Apply(sizes);

// Repeats pieces (chosen by a fixed random sequence) up to size bytes.
std::string repeat_pieces(std::size_t size, std::initializer_list<std::string_view> pieces,
                          unsigned seed) {
  std::vector<std::string_view> list(pieces);
  std::mt19937 rng(seed);
  std::string s;
  s.reserve(size + 64);
  while (s.size() < size) s += list[rng() % list.size()];
  s.resize(size);
  return s;
}

enum utf8_input { kAscii, kMixed, kTypical, kRandom, kWorst };

// ASCII prose; valid text with about 38% of its bytes non-ASCII; the same
// with one stray byte in 96; random bytes; all bytes invalid.
const std::string& utf8_input_of(utf8_input kind, std::size_t size) {
  static std::map<std::pair<int, std::size_t>, std::string> cache;
  auto [it, fresh] = cache.try_emplace({kind, size});
  if (!fresh) return it->second;
  std::string& s = it->second;
  switch (kind) {
    case kAscii:
      s = repeat_pieces(size, {"plain ", "text ", "line\n", "of words, "}, 1);
      break;
    case kMixed:
    case kTypical:
      s = repeat_pieces(size,
                        {"plain ", "caf\xC3\xA9 ", "\xD1\x82\xD0\xB5\xD0\xBA\xD1\x81\xD1\x82 ",
                         "\xE2\x82\xAC", "\xF0\x9F\x98\x80 ", "words ", "more "},
                        2);
      if (kind == kTypical) {
        for (std::size_t i = 95; i < s.size(); i += 96) {
          if (static_cast<unsigned char>(s[i]) < 0x80) s[i] = '\xFF';
        }
      }
      break;
    case kRandom: {
      std::mt19937 rng(3);
      s.resize(size);
      for (char& c : s) c = static_cast<char>(rng());
      break;
    }
    case kWorst:
      s.assign(size, '\xFF');
      break;
  }
  return s;
}

void BM_repair_utf8(benchmark::State& state, utf8_input kind, zul::simd::isa level) {
  const std::string& in = utf8_input_of(kind, static_cast<std::size_t>(state.range(0)));
  const auto& kernels = zul::simd::kernels_for(zul::simd::utf8_tables(), level);
  for (auto _ : state) {
    benchmark::DoNotOptimize(
        zul::text::repair_utf8(zul::bytes_of(in), "?", zul::kMaxResultBytes, kernels));
  }
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) * state.range(0));
}

// Western text for the single-byte sets: Latin-1 letters throughout; in the
// typical text one unit in 96 is a Windows-1252 sign (a quote or the euro);
// in the worst case every unit needs the table (signs, and Greek that is
// dropped).
enum charset_input { kPlain, kSigns, kAllSigns };

const std::u16string& charset_text(charset_input kind, std::size_t units) {
  static std::map<std::pair<int, std::size_t>, std::u16string> cache;
  auto [it, fresh] = cache.try_emplace({kind, units});
  if (!fresh) return it->second;
  std::u16string& s = it->second;
  static constexpr std::u16string_view kWords = u"Caf\u00E9 cr\u00E8me na\u00EFve and more. ";
  while (s.size() < units) s += kWords;
  s.resize(units);
  if (kind == kSigns) {
    for (std::size_t i = 95; i < s.size(); i += 96) s[i] = i % 192 == 95 ? u'\u20AC' : u'\u2019';
  } else if (kind == kAllSigns) {
    for (std::size_t i = 0; i < s.size(); ++i) s[i] = i % 2 ? u'\u201C' : u'\u03A9';
  }
  return s;
}

// The same texts as Windows-1252 bytes (the scalar encoder makes them).
const std::string& charset_bytes(charset_input kind, std::size_t size) {
  static std::map<std::pair<int, std::size_t>, std::string> cache;
  auto [it, fresh] = cache.try_emplace({kind, size});
  if (fresh) {
    const std::u16string& text = charset_text(kind, size);
    std::string& s = it->second;
    s.resize(size);
    for (std::size_t i = 0; i < size; ++i) {
      const int b = zul::text::byte_for_unit(zul::text::kWindows1252, text[i]);
      s[i] = static_cast<char>(b < 0 ? 0x81 : b);
    }
  }
  return it->second;
}

// Bytes processed: the single-byte side (one byte per unit), so the figures
// of both directions compare with memcpy of the same byte count.
void BM_decode_cp1252(benchmark::State& state, charset_input kind, zul::simd::isa level) {
  const std::string& in = charset_bytes(kind, static_cast<std::size_t>(state.range(0)));
  const auto& kernels = zul::simd::kernels_for(zul::text::single_byte_tables(), level);
  for (auto _ : state) {
    benchmark::DoNotOptimize(zul::text::decode_single_byte(
        zul::bytes_of(in), zul::text::kWindows1252, zul::text::kHandleLimit, kernels));
  }
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) * state.range(0));
}

void BM_encode_cp1252(benchmark::State& state, charset_input kind, zul::simd::isa level) {
  const std::u16string& text = charset_text(kind, static_cast<std::size_t>(state.range(0)));
  const std::span<const std::uint16_t> units(reinterpret_cast<const std::uint16_t*>(text.data()),
                                             text.size());
  const auto& kernels = zul::simd::kernels_for(zul::text::single_byte_tables(), level);
  for (auto _ : state) {
    benchmark::DoNotOptimize(zul::text::encode_single_byte(units, zul::text::kWindows1252,
                                                           zul::text::kHandleLimit, kernels));
  }
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) * state.range(0));
}

void BM_decode_iso8859(benchmark::State& state, zul::simd::isa level) {
  const std::string& in = charset_bytes(kSigns, static_cast<std::size_t>(state.range(0)));
  const auto& kernels = zul::simd::kernels_for(zul::text::single_byte_tables(), level);
  for (auto _ : state) {
    benchmark::DoNotOptimize(zul::text::decode_single_byte(zul::bytes_of(in), zul::text::kISO8859_1,
                                                           zul::text::kHandleLimit, kernels));
  }
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) * state.range(0));
}

void BM_encode_iso8859(benchmark::State& state, charset_input kind, zul::simd::isa level) {
  const std::u16string& text = charset_text(kind, static_cast<std::size_t>(state.range(0)));
  const std::span<const std::uint16_t> units(reinterpret_cast<const std::uint16_t*>(text.data()),
                                             text.size());
  const auto& kernels = zul::simd::kernels_for(zul::text::single_byte_tables(), level);
  for (auto _ : state) {
    benchmark::DoNotOptimize(zul::text::encode_single_byte(units, zul::text::kISO8859_1,
                                                           zul::text::kHandleLimit, kernels));
  }
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) * state.range(0));
}

// Inputs for the byte codecs: letters and digits that need no change, the
// same with one of the codec's special bytes every 96 bytes, and nothing
// but special bytes.
enum codec_input { kNoChange, kOneIn96, kAllSpecial };

std::string codec_input_of(codec_input kind, std::size_t size, std::string_view specials) {
  std::string s = repeat_pieces(size, {"Plain", "text", "made", "of", "Words", "0123", "and"}, 4);
  std::size_t k = 0;
  if (kind == kOneIn96) {
    for (std::size_t i = 95; i < size; i += 96) s[i] = specials[k++ % specials.size()];
  } else if (kind == kAllSpecial) {
    for (char& c : s) c = specials[k++ % specials.size()];
  }
  return s;
}

// Each codec keeps its result from the optimizer itself (results differ in
// type).
using byte_codec = void (*)(std::string_view, zul::simd::isa);

void BM_codec(benchmark::State& state, byte_codec codec, codec_input kind, std::string specials,
              zul::simd::isa level) {
  const std::string in = codec_input_of(kind, static_cast<std::size_t>(state.range(0)), specials);
  for (auto _ : state) codec(in, level);
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) * state.range(0));
}

// Readable runs: one long run, a NUL every 96 bytes, and runs of one byte.
void BM_readable_runs(benchmark::State& state, codec_input kind, zul::simd::isa level) {
  const std::string in =
      codec_input_of(kind, static_cast<std::size_t>(state.range(0)), std::string(1, '\0'));
  const zul::scan_kernels& scan = zul::scan_for(level);
  for (auto _ : state) {
    std::size_t kept = 0;
    zul::binary::for_each_readable_run(
        zul::bytes_of(in), 0, [&](zul::bytes_view run) { kept += run.size(); }, scan);
    benchmark::DoNotOptimize(kept);
  }
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) * state.range(0));
}

// The code-point codecs (HTML, XML) read UTF-32 lanes, as the host hands
// them text: the same inputs with each byte as one code point (so "\xE9" is
// U+00E9), size / 4 of them, so that the bytes read equal memcpy's.
using code_point_codec = void (*)(zul::encodings::code_point_view, const zul::scan_kernels&);

void BM_code_point_codec(benchmark::State& state, code_point_codec codec, codec_input kind,
                         std::string specials, zul::simd::isa level) {
  const std::string bytes =
      codec_input_of(kind, static_cast<std::size_t>(state.range(0)) / 4, specials);
  const zul::encodings::code_points lanes = [&] {
    zul::encodings::code_points v;
    for (const char c : bytes) v.push_back(static_cast<std::uint8_t>(c));
    return v;
  }();
  const zul::scan_kernels& scan = zul::scan_for(level);
  for (auto _ : state) codec(lanes, scan);
  state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) * state.range(0));
}

// reference: today's one-at-a-time version, run once (it takes no kernels).
struct code_point_codec_row {
  const char* name;
  code_point_codec codec;
  const char* specials;
  bool reference = false;
};
const code_point_codec_row kCodePointCodecs[] = {
    {"encode_html",
     [](zul::encodings::code_point_view in, const zul::scan_kernels& k) {
       benchmark::DoNotOptimize(zul::encodings::encode_html(in, 0, zul::kMaxResultBytes, k));
     },
     "<&\xE9>"},
    {"encode_xml",
     [](zul::encodings::code_point_view in, const zul::scan_kernels& k) {
       benchmark::DoNotOptimize(
           zul::encodings::encode_xml(in, 0, zul::encodings::kMaxResultCodePoints, k));
     },
     "<&\">"},
    {"decode_html",
     [](zul::encodings::code_point_view in, const zul::scan_kernels& k) {
       benchmark::DoNotOptimize(
           zul::encodings::decode_html(in, zul::encodings::kMaxResultCodePoints, k));
     },
     "&"},
    {"encode_html_reference",
     [](zul::encodings::code_point_view in, const zul::scan_kernels&) {
       benchmark::DoNotOptimize(zul::reference::encode_html_reference(in, 0));
     },
     "<&\xE9>", true},
    {"encode_xml_reference",
     [](zul::encodings::code_point_view in, const zul::scan_kernels&) {
       benchmark::DoNotOptimize(zul::reference::encode_xml_reference(in, 0));
     },
     "<&\">", true},
    {"decode_html_reference",
     [](zul::encodings::code_point_view in, const zul::scan_kernels&) {
       benchmark::DoNotOptimize(zul::reference::decode_html_reference(in));
     },
     "&", true},
};

// The usual dump: 16 one-byte groups a line, spaced, one line end.
const zul::binary::hex_dump_layout kDumpLayout{2, 16, "", "\n", " ", ""};

// Each codec with the bytes that make it work; "scalar" is the plain scan.
struct codec_row {
  const char* name;
  byte_codec codec;
  const char* specials;
  bool reference = false;
};
const codec_row kCodecs[] = {
    {"encode_url",
     [](std::string_view in, zul::simd::isa k) {
       benchmark::DoNotOptimize(
           zul::encodings::encode_url(in, 1, zul::kMaxResultBytes, zul::scan_for(k)));
     },
     " &/="},
    {"decode_url",
     [](std::string_view in, zul::simd::isa k) {
       benchmark::DoNotOptimize(zul::encodings::decode_url(in, 1, zul::scan_for(k)));
     },
     "+"},
    {"remove_html_tags",
     [](std::string_view in, zul::simd::isa k) {
       benchmark::DoNotOptimize(zul::encodings::remove_html_tags(in, "", zul::kMaxResultBytes, k));
     },
     "<>"},
    {"encode_quoted_printable",
     [](std::string_view in, zul::simd::isa k) {
       benchmark::DoNotOptimize(
           zul::encodings::encode_quoted_printable(in, 76, zul::kMaxResultBytes, zul::scan_for(k)));
     },
     "=\n\xE9"},
    {"decode_quoted_printable",
     [](std::string_view in, zul::simd::isa k) {
       benchmark::DoNotOptimize(zul::encodings::decode_quoted_printable(in, zul::scan_for(k)));
     },
     "=\n"},
    {"decode_mysql",
     [](std::string_view in, zul::simd::isa k) {
       benchmark::DoNotOptimize(zul::encodings::decode_mysql(in, k));
     },
     "\\"},
    {"replace_sql_booleans",
     [](std::string_view in, zul::simd::isa k) {
       benchmark::DoNotOptimize(
           zul::encodings::replace_sql_booleans(in, zul::encodings::detail::sql_kernels_for(k)));
     },
     " true 'x' "},
    {"replace_sql_booleans_reference",
     [](std::string_view in, zul::simd::isa) {
       benchmark::DoNotOptimize(zul::reference::replace_sql_booleans_reference(in));
     },
     " true 'x' ", true},
    {"encode_mail_subject",
     [](std::string_view in, zul::simd::isa k) {
       benchmark::DoNotOptimize(
           zul::encodings::encode_mail_subject(in, zul::kMaxResultBytes, zul::scan_for(k)));
     },
     " ?\xC3"},
    {"encode_mail_subject_reference",
     [](std::string_view in, zul::simd::isa) {
       benchmark::DoNotOptimize(zul::reference::encode_mail_subject_reference(in));
     },
     " ?\xC3", true},
    {"hex_dump",
     [](std::string_view in, zul::simd::isa k) {
       benchmark::DoNotOptimize(
           zul::binary::hex_dump(zul::bytes_of(in), kDumpLayout,
                                 zul::simd::kernels_for(zul::binary::detail::hex_tables(), k)));
     },
     "\xFF"},
    {"hex_dump_reference",
     [](std::string_view in, zul::simd::isa) {
       benchmark::DoNotOptimize(zul::reference::hex_dump_reference(zul::bytes_of(in), kDumpLayout));
     },
     "\xFF", true},
    {"encode_quoted_printable_reference",
     [](std::string_view in, zul::simd::isa) {
       benchmark::DoNotOptimize(zul::reference::encode_quoted_printable_reference(in, 76));
     },
     "=\n\xE9", true},
    {"decode_quoted_printable_reference",
     [](std::string_view in, zul::simd::isa) {
       benchmark::DoNotOptimize(zul::reference::decode_quoted_printable_reference(in));
     },
     "=\n", true},
};

const bool registered = [] {
  const std::pair<utf8_input, const char*> inputs[] = {{kAscii, "ascii"},
                                                       {kMixed, "mixed"},
                                                       {kTypical, "typical"},
                                                       {kRandom, "random"},
                                                       {kWorst, "worst"}};
  for (const auto& [kind, name] : inputs) {
    for (const zul::simd::isa level : zul::simd::supported_isas()) {
      const std::string label =
          std::string("BM_repair_utf8/") + name + "/" + zul::simd::isa_name(level);
      benchmark::RegisterBenchmark(label.c_str(), BM_repair_utf8, kind, level)->Apply(sizes);
    }
  }
  const std::pair<charset_input, const char*> charset_inputs[] = {
      {kPlain, "plain"}, {kSigns, "typical"}, {kAllSigns, "worst"}};
  for (const zul::simd::isa level : zul::simd::supported_isas()) {
    const std::string isa = zul::simd::isa_name(level);
    for (const auto& [kind, name] : charset_inputs) {
      benchmark::RegisterBenchmark(("BM_decode_cp1252/" + std::string(name) + "/" + isa).c_str(),
                                   BM_decode_cp1252, kind, level)
          ->Apply(sizes);
      benchmark::RegisterBenchmark(("BM_encode_cp1252/" + std::string(name) + "/" + isa).c_str(),
                                   BM_encode_cp1252, kind, level)
          ->Apply(sizes);
      benchmark::RegisterBenchmark(("BM_encode_iso8859/" + std::string(name) + "/" + isa).c_str(),
                                   BM_encode_iso8859, kind, level)
          ->Apply(sizes);
    }
    benchmark::RegisterBenchmark(("BM_decode_iso8859/typical/" + isa).c_str(), BM_decode_iso8859,
                                 level)
        ->Apply(sizes);
  }
  const std::pair<codec_input, const char*> codec_inputs[] = {
      {kNoChange, "plain"}, {kOneIn96, "typical"}, {kAllSpecial, "worst"}};
  for (const codec_row& row : kCodecs) {
    for (const auto& [kind, name] : codec_inputs) {
      for (const zul::simd::isa level : zul::simd::supported_isas()) {
        if (row.reference && level != zul::simd::isa::scalar) continue;
        const std::string label =
            std::string("BM_") + row.name + "/" + name + "/" + zul::simd::isa_name(level);
        benchmark::RegisterBenchmark(label.c_str(), BM_codec, row.codec, kind,
                                     std::string(row.specials), level)
            ->Apply(sizes);
      }
    }
  }
  for (const code_point_codec_row& row : kCodePointCodecs) {
    for (const auto& [kind, name] : codec_inputs) {
      for (const zul::simd::isa level : zul::simd::supported_isas()) {
        if (row.reference && level != zul::simd::isa::scalar) continue;
        const std::string label =
            std::string("BM_") + row.name + "/" + name + "/" + zul::simd::isa_name(level);
        benchmark::RegisterBenchmark(label.c_str(), BM_code_point_codec, row.codec, kind,
                                     std::string(row.specials), level)
            ->Apply(sizes);
      }
    }
  }
  for (const auto& [kind, name] : codec_inputs) {
    for (const zul::simd::isa level : zul::simd::supported_isas()) {
      const std::string label =
          std::string("BM_readable_runs/") + name + "/" + zul::simd::isa_name(level);
      benchmark::RegisterBenchmark(label.c_str(), BM_readable_runs, kind, level)->Apply(sizes);
    }
  }
  return true;
}();

}  // namespace
