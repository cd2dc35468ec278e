// The zul command line: option parsing, argument forms, overload choice and
// result printing. Everything goes through one Host with the plug-in loaded,
// so the ledger is checked after each call exactly as in the tests.
#include "host/zul_cli.h"

#include <cctype>
#include <cerrno>
#include <charconv>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <stdexcept>

#include "common/hex_digits.h"
#include "host/text_convert.h"
#include "host/zul_bench.h"

namespace zul_host {

using namespace text_encoding;

namespace {

constexpr std::string_view kUsage =
    "usage: zul [--plugin PATH] [--host-version V|none] [--verbose] list\n"
    "       zul [--plugin PATH] [--host-version V|none] [--verbose] call NAME ARG...\n"
    "       zul [--plugin PATH] [--host-version V|none] bench [--seconds S] [--json] NAME ARG...\n"
    "options may stand anywhere; after a lone -- every word is an argument\n"
    "string, memoryblock and ptr arguments: TEXT, hex:C3A9, file:PATH, @null,\n"
    "  or utf8: utf16: utf32: latin1: cp1252: macroman: ascii: followed by TEXT,\n"
    "  or utf8file: utf16file: (and so on) followed by PATH: the file's bytes in that encoding\n";

struct Prefix {
  std::string_view prefix;
  std::uint32_t encoding;
};
constexpr Prefix kPrefixes[] = {
    {"utf8:", kUTF8},     {"utf16:", kUTF16},          {"utf32:", kUTF32},
    {"latin1:", kLatin1}, {"cp1252:", kWindowsLatin1}, {"macroman:", kMacRoman},
    {"ascii:", kASCII},
};

bool starts_with(std::string_view s, std::string_view p) { return s.substr(0, p.size()) == p; }

// The path of a "file:" form, or of an encoding's file form ("utf8file:"
// and the like, whose bytes are taken as that encoding, unconverted), with
// the encoding the bytes carry; nullopt for other forms.
std::optional<std::pair<std::string, std::uint32_t>> file_form(std::string_view text) {
  if (starts_with(text, "file:")) return std::pair{std::string(text.substr(5)), kUnknown};
  for (const Prefix& p : kPrefixes) {
    const std::string_view name = p.prefix.substr(0, p.prefix.size() - 1);
    if (starts_with(text, name) && starts_with(text.substr(name.size()), "file:")) {
      return std::pair{std::string(text.substr(name.size() + 5)), p.encoding};
    }
  }
  return std::nullopt;
}

// What is wrong with the digits of a "hex:" form, or "".
std::string hex_problem(std::string_view hex) {
  std::string problem;
  for (std::size_t i = 0; i < hex.size() && problem.empty(); ++i) {
    if (zul::is_hex_digit(hex[i])) continue;
    problem.append("'").append(1, hex[i]).append("' at position ");
    problem.append(std::to_string(i + 1)).append(" of the digits is not a hex digit");
  }
  if (problem.empty() && hex.size() % 2) {
    problem.append("an odd number of hex digits (").append(std::to_string(hex.size())).append(")");
  }
  return problem;
}

std::optional<std::string> from_hex(std::string_view hex) {
  if (!hex_problem(hex).empty()) return std::nullopt;
  std::string out;
  for (std::size_t i = 0; i < hex.size(); i += 2) {
    out += static_cast<char>(zul::hex_value(hex[i]) << 4 | zul::hex_value(hex[i + 1]));
  }
  return out;
}

// What keeps the file at path from being read as an argument, or "".
std::string file_problem(const std::string& path) {
  std::error_code ec;
  const auto status = std::filesystem::status(path, ec);
  if (ec || !std::filesystem::exists(status)) return "no such file";
  if (std::filesystem::is_directory(status)) return "is a directory, not a file";
  if (!std::filesystem::is_regular_file(status)) return "is not a regular file";
  return "";
}

// The bytes of a regular file; nullopt when it cannot be read. Reading a
// directory or a vanishing file makes the stream throw: that is caught.
std::optional<std::string> read_file(const std::string& path) {
  if (!file_problem(path).empty()) return std::nullopt;
  try {
    std::ifstream in(path, std::ios::binary);
    if (!in) return std::nullopt;
    std::string bytes((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
    if (in.bad()) return std::nullopt;
    return bytes;
  } catch (const std::exception&) {
    return std::nullopt;
  }
}

// Bytes and encoding for the string-like forms.
std::optional<Str> parse_bytes(std::string_view text) {
  if (text == "@null") return null_string();
  if (starts_with(text, "hex:")) {
    auto bytes = from_hex(text.substr(4));
    if (!bytes) return std::nullopt;
    return tagged(*bytes, kUnknown);
  }
  if (const auto file = file_form(text)) {
    auto bytes = read_file(file->first);
    if (!bytes) return std::nullopt;
    return tagged(std::move(*bytes), file->second);
  }
  for (const Prefix& p : kPrefixes) {
    if (starts_with(text, p.prefix)) {
      auto bytes = convert_text(text.substr(p.prefix.size()), kUTF8, p.encoding);
      if (!bytes) return std::nullopt;
      return tagged(*bytes, p.encoding);
    }
  }
  return utf8(text);
}

bool printable_utf8(std::string_view s) {
  for (std::size_t i = 0; i < s.size();) {
    const auto c = static_cast<unsigned char>(s[i]);
    if (c < 0x80) {
      if ((c < 0x20 && c != '\t' && c != '\n' && c != '\r') || c == 0x7F) return false;
      ++i;
      continue;
    }
    const int n = c >= 0xC2 && c <= 0xDF   ? 1
                  : c >= 0xE0 && c <= 0xEF ? 2
                  : c >= 0xF0 && c <= 0xF4 ? 3
                                           : -1;
    if (n < 0 || i + static_cast<std::size_t>(n) >= s.size()) return false;
    std::uint32_t cp = c & (0x3F >> n);
    for (int k = 1; k <= n; ++k) {
      const auto t = static_cast<unsigned char>(s[i + k]);
      if ((t & 0xC0) != 0x80) return false;
      cp = (cp << 6) | (t & 0x3F);
    }
    const std::uint32_t min = n == 1 ? 0x80 : n == 2 ? 0x800 : 0x10000;
    if (cp < min || cp > 0x10FFFF || (cp >= 0xD800 && cp <= 0xDFFF)) return false;
    i += static_cast<std::size_t>(n) + 1;
  }
  return true;
}

std::string to_hex(std::string_view bytes) {
  std::string out;
  for (unsigned char c : bytes) {
    out += zul::kHexDigits[c >> 4];
    out += zul::kHexDigits[c & 15];
  }
  return out;
}

std::string format_bytes(std::string_view bytes, std::uint32_t encoding, bool* as_hex) {
  if (encoding != kUnknown && encoding != kUTF8) {
    if (auto text = convert_text(bytes, encoding, kUTF8); text && printable_utf8(*text)) {
      if (as_hex) *as_hex = false;
      return *text;
    }
  } else if (printable_utf8(bytes)) {
    if (as_hex) *as_hex = false;
    return std::string(bytes);
  }
  if (as_hex) *as_hex = true;
  return to_hex(bytes);
}

}  // namespace

std::string argument_problem(std::string_view text) {
  if (starts_with(text, "hex:")) return hex_problem(text.substr(4));
  if (const auto file = file_form(text)) return file_problem(file->first);
  return "";
}

std::optional<DynamicValue> parse_argument(ValueType type, std::string_view text) {
  DynamicValue v;
  v.type = type;
  switch (type) {
    case ValueType::string: {
      auto s = parse_bytes(text);
      if (!s) return std::nullopt;
      v.string = *s;
      return v;
    }
    case ValueType::memory_block:
    case ValueType::ptr: {
      auto s = parse_bytes(text);
      if (!s) return std::nullopt;
      v.block = {s->bytes, s->null};
      return v;
    }
    case ValueType::integer: {
      const char* end = text.data() + text.size();
      const char* begin = text.data() + (starts_with(text, "+") ? 1 : 0);
      const auto [at, ec] = std::from_chars(begin, end, v.integer);
      if (text.empty() || ec != std::errc() || at != end) return std::nullopt;
      return v;
    }
    case ValueType::double_: {
      const std::string copy(text);
      char* end = nullptr;
      errno = 0;
      v.real = std::strtod(copy.c_str(), &end);
      if (copy.empty() || std::isspace(static_cast<unsigned char>(copy[0])) || *end != '\0')
        return std::nullopt;
      return v;
    }
    case ValueType::boolean: {
      std::string l(text);
      for (char& c : l) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
      if (l == "true" || l == "1")
        v.boolean = true;
      else if (l == "false" || l == "0")
        v.boolean = false;
      else
        return std::nullopt;
      return v;
    }
    default:
      return std::nullopt;
  }
}

std::optional<std::string> choose_overload(const Registration& registration, std::string_view name,
                                           const std::vector<std::string>& args,
                                           std::vector<DynamicValue>& values) {
  // First pass: exactly that many parameters. Second: trailing parameters
  // left out are filled from their declared defaults.
  for (const bool with_defaults : {false, true}) {
    for (const RegisteredMethod& m : registration.methods) {
      const auto d = parse_declaration(m.declaration);
      if (!d || d->name != name) continue;
      if (with_defaults ? d->params.size() <= args.size() : d->params.size() != args.size())
        continue;
      std::vector<DynamicValue> parsed;
      for (std::size_t i = 0; i < d->params.size(); ++i) {
        const Parameter& p = d->params[i];
        if (i >= args.size() && !p.default_value) break;
        auto v =
            parse_argument(p.type, i < args.size() ? std::string_view(args[i]) : *p.default_value);
        if (!v) break;
        parsed.push_back(std::move(*v));
      }
      if (parsed.size() == d->params.size()) {
        values = std::move(parsed);
        return m.declaration;
      }
    }
  }
  return std::nullopt;
}

std::string format_value(const DynamicValue& value, bool* as_hex) {
  if (as_hex) *as_hex = false;
  switch (value.type) {
    case ValueType::string:
      return format_bytes(value.string.bytes, value.string.encoding, as_hex);
    case ValueType::memory_block:
    case ValueType::ptr:
      return format_bytes(value.block.bytes, kUnknown, as_hex);
    case ValueType::integer:
      return std::to_string(value.integer);
    case ValueType::double_: {
      char text[64];
      const auto [end, ec] = std::to_chars(text, text + sizeof text, value.real);
      return ec == std::errc() ? std::string(text, end) : "nan";
    }
    case ValueType::boolean:
      return value.boolean ? "true" : "false";
    case ValueType::string_array: {
      std::string out;
      for (const Str& item : value.array.items) {
        if (!out.empty()) out += '\n';
        out += format_bytes(item.bytes, item.encoding, nullptr);
      }
      return out;
    }
    case ValueType::none:
      return "";
  }
  return "";
}

namespace {

// What the command line asks for once its options are read.
struct CommandLine {
  std::string plugin;
  HostConfig config;
  bool verbose = false;
  double seconds = 1.0;            // bench: how long to repeat the call
  bool json = false;               // bench: one JSON object a line
  std::vector<std::string> words;  // the sub-command, then its arguments
};

// Reads the option at args[i] (advancing i past its value); false after
// reporting an unknown or incomplete one.
bool read_option(const std::vector<std::string>& args, std::size_t& i, CommandLine& line,
                 std::ostream& err) {
  const std::string& option = args[i];
  const bool has_value = i + 1 < args.size();
  if (option == "--verbose") {
    line.verbose = true;
  } else if (option == "--json") {
    line.json = true;
  } else if (option == "--seconds" && has_value) {
    const auto parsed = parse_argument(ValueType::double_, args[++i]);
    if (!parsed || !(parsed->real > 0 && parsed->real <= 3600)) {
      err << "zul: --seconds wants a number of seconds above 0, not '" << args[i] << "'\n"
          << kUsage;
      return false;
    }
    line.seconds = parsed->real;
  } else if (option == "--plugin" && has_value) {
    line.plugin = args[++i];
  } else if (option == "--host-version" && has_value) {
    const std::string& v = args[++i];
    if (v == "none") {
      line.config.version.reset();
    } else if (auto parsed = parse_argument(ValueType::double_, v)) {
      line.config.version = parsed->real;
    } else {
      err << "zul: --host-version wants a number or none, not '" << v << "'\n" << kUsage;
      return false;
    }
  } else {
    err << "zul: unknown or incomplete option '" << option << "'\n" << kUsage;
    return false;
  }
  return true;
}

// Options may stand anywhere, before or after the sub-command and between
// its arguments, as users type them; a lone "--" ends them, so that later
// words starting with "--" are arguments.
bool read_command_line(const std::vector<std::string>& args, CommandLine& line, std::ostream& err) {
  bool options_ended = false;
  for (std::size_t i = 0; i < args.size(); ++i) {
    if (!options_ended && args[i] == "--") {
      options_ended = true;
    } else if (!options_ended && starts_with(args[i], "--")) {
      if (!read_option(args, i, line, err)) return false;
    } else {
      line.words.push_back(args[i]);
    }
  }
  const std::vector<std::string>& w = line.words;
  const bool calls = !w.empty() && (w[0] == "call" || w[0] == "bench");
  if (w.empty() || (w[0] != "list" && !calls) || (calls && w.size() < 2)) {
    err << kUsage;
    return false;
  }
  return true;
}

// Why args do not fit d: the first argument that is missing, extra or not
// of its parameter's type.
std::string mismatch(const Declaration& d, const std::vector<std::string>& args) {
  if (args.size() > d.params.size()) {
    return "takes " + std::to_string(d.params.size()) + " arguments, given " +
           std::to_string(args.size());
  }
  for (std::size_t i = 0; i < d.params.size(); ++i) {
    const Parameter& p = d.params[i];
    const std::string which = "argument " + std::to_string(i + 1) + " (" + p.name + ")";
    if (i >= args.size()) {
      if (!p.default_value) return which + " is missing";
      continue;
    }
    if (!parse_argument(p.type, args[i])) {
      return which + ": '" + args[i] + "' is not a valid " + type_name(p.type);
    }
  }
  return "";
}

void report_no_overload(const Registration& registration, const std::string& name,
                        const std::vector<std::string>& args, std::ostream& err) {
  bool any = false;
  for (const RegisteredMethod& m : registration.methods) {
    const auto d = parse_declaration(m.declaration);
    if (!d || d->name != name) continue;
    if (!any) err << "zul: these arguments fit no overload of " << name << ":\n";
    any = true;
    err << "  " << m.declaration << "\n    " << mismatch(*d, args) << "\n";
  }
  if (!any) err << "zul: no function named " << name << " (see zul list)\n";
}

// Prints the result (and, when asked or when it is hex, what it is) and
// checks the ledger. Returns the exit status.
int report_result(const Host& host, const DynamicValue& result, bool verbose, std::ostream& out,
                  std::ostream& err) {
  if (const auto& raised = host.last_exception()) {
    err << raised->class_name << ": " << raised->message << "\n";
    return 1;
  }
  bool as_hex = false;
  out << format_value(result, &as_hex) << "\n";
  const bool has_encoding = result.type == ValueType::string && !result.string.null;
  if (has_encoding && (verbose || as_hex)) {
    err << "zul: " << (as_hex ? "hex of a string in " : "string in ")
        << encoding_label(result.string.encoding) << "\n";
  } else if (result.type == ValueType::string && result.string.null && verbose) {
    err << "zul: the null string\n";
  }
  if (!host.last_ledger_report().empty()) {
    err << "zul: the host's ledger is not balanced after the call:\n" << host.last_ledger_report();
    return 3;
  }
  return 0;
}

// The arguments for name, or nullopt after reporting why there are none
// (status 2).
std::optional<std::pair<std::string, std::vector<DynamicValue>>> arguments_for(
    const Host& host, const std::string& name, const std::vector<std::string>& args,
    std::ostream& err) {
  // A broken hex: or file: form is wrong whatever the overload.
  for (std::size_t i = 0; i < args.size(); ++i) {
    if (const std::string problem = argument_problem(args[i]); !problem.empty()) {
      err << "zul: argument " << i + 1 << " (" << args[i] << "): " << problem << "\n";
      return std::nullopt;
    }
  }
  std::vector<DynamicValue> values;
  const auto declaration = choose_overload(host.registration(), name, args, values);
  if (!declaration) {
    report_no_overload(host.registration(), name, args, err);
    return std::nullopt;
  }
  return std::make_pair(*declaration, std::move(values));
}

int call_by_name(Host& host, const std::string& name, const std::vector<std::string>& args,
                 bool verbose, std::ostream& out, std::ostream& err) {
  const auto chosen = arguments_for(host, name, args, err);
  if (!chosen) return 2;
  const auto& [declaration, values] = *chosen;
  DynamicValue result;
  try {
    result = call_dynamic(host, declaration, values);
  } catch (const std::exception& e) {
    err << "zul: " << e.what() << "\n";
    return 2;
  }
  if (verbose) err << "zul: called " << declaration << "\n";
  return report_result(host, result, verbose, out, err);
}

}  // namespace

int run_zul(const std::vector<std::string>& args, const std::string& default_plugin,
            std::ostream& out, std::ostream& err) {
  CommandLine line;
  line.plugin = default_plugin;
  if (!read_command_line(args, line, err)) return 2;
  line.config.bench = line.words[0] == "bench";

  Host host(line.config);
  try {
    host.load(line.plugin);
  } catch (const std::exception& e) {
    err << "zul: " << e.what() << "\n";
    return 3;
  }
  if (line.words[0] == "list") {
    for (const RegisteredMethod& m : host.registration().methods) out << m.declaration << "\n";
    return 0;
  }
  const std::vector<std::string> call_args(line.words.begin() + 2, line.words.end());
  if (line.words[0] == "call") {
    return call_by_name(host, line.words[1], call_args, line.verbose, out, err);
  }
  const auto chosen = arguments_for(host, line.words[1], call_args, err);
  if (!chosen) return 2;
  try {
    return bench_call(host, chosen->first, chosen->second, {line.seconds, line.json}, out, err);
  } catch (const std::exception& e) {
    err << "zul: " << e.what() << "\n";
    return 2;
  }
}

}  // namespace zul_host
