// The zul command line: lists the functions a plug-in registers and calls
// them by name with arguments written on the command line, through the
// stand-in host. Kept apart from tools/zul.cpp so tests can run it in
// process. Exit statuses: 0 success, 1 a host exception was raised, 2 usage
// error (unknown name, arguments that fit no overload, an argument that
// cannot be read, a ptr size beyond its bytes, bad options), each with a
// message naming the argument; 3 the plug-in could not be loaded or the
// call left the host's ledger unbalanced. No command line crashes it.
#pragma once

#include <cstdint>
#include <optional>
#include <ostream>
#include <string>
#include <string_view>
#include <vector>

#include "host/dynamic_call.h"
#include "host/host.h"

namespace zul_host {

// One command-line argument read as a value of the declared type, or
// nullopt when it does not fit. string, memoryblock and ptr take: plain text
// (UTF-8); "hex:C3A9" (raw bytes, encoding 0xFFFF); "file:PATH" (the file's
// bytes, 0xFFFF); "@null" (the null string or block); or text given in UTF-8
// and converted to the encoding its prefix names: "utf8:", "utf16:",
// "utf32:", "latin1:", "cp1252:", "macroman:", "ascii:". integer takes a
// decimal integer literal; double any number strtod reads completely;
// boolean true, false, 1 or 0 (any case).
std::optional<DynamicValue> parse_argument(ValueType type, std::string_view text);

// What is wrong with a "hex:" or "file:" argument whatever its type (a
// non-hex digit, an odd count of digits, a missing file, a directory), or
// "" when nothing is (also for every other form).
std::string argument_problem(std::string_view text);

// The declaration to call for name and these arguments: among the
// registered declarations with that name and that many parameters, the
// first in registration order whose parameters all accept their arguments;
// failing that, one whose trailing parameters left out all have defaults
// (taken as written in the declaration). values receives the arguments.
// nullopt when none fits.
std::optional<std::string> choose_overload(const Registration& registration, std::string_view name,
                                           const std::vector<std::string>& args,
                                           std::vector<DynamicValue>& values);

// How zul prints a value: strings and blocks as text when the bytes read as
// printable UTF-8 (after converting a known text encoding to UTF-8),
// otherwise as upper-case hex; doubles in their shortest exact form ("0.5");
// booleans "true"/"false"; arrays one element a line. *as_hex tells whether
// hex was chosen for a single value.
std::string format_value(const DynamicValue& value, bool* as_hex = nullptr);

// Runs zul with its arguments (without the program name). default_plugin is
// used when no --plugin option is given.
int run_zul(const std::vector<std::string>& args, const std::string& default_plugin,
            std::ostream& out, std::ostream& err);

}  // namespace zul_host
