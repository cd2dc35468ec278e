// The dynamic call: one libffi call interface per call, built from the
// parsed declaration. Native types: string, memoryblock and ptr are
// pointers, integer is a signed 64-bit value, double a double, a boolean
// argument a signed char and a boolean result a one-byte bool.
#include "host/dynamic_call.h"

#include <ffi.h>

#include <stdexcept>
#include <string>

namespace zul_host {
namespace {

union Slot {
  void* pointer;
  std::int64_t integer;
  double real;
  signed char boolean;
};

ffi_type* argument_ffi_type(ValueType type) {
  switch (type) {
    case ValueType::integer:
      return &ffi_type_sint64;
    case ValueType::double_:
      return &ffi_type_double;
    case ValueType::boolean:
      return &ffi_type_sint8;
    default:
      return &ffi_type_pointer;
  }
}

ffi_type* result_ffi_type(ValueType type) {
  switch (type) {
    case ValueType::none:
      return &ffi_type_void;
    case ValueType::integer:
      return &ffi_type_sint64;
    case ValueType::double_:
      return &ffi_type_double;
    case ValueType::boolean:
      return &ffi_type_uint8;
    default:
      return &ffi_type_pointer;
  }
}

// A ptr argument points at a private copy of its bytes and nothing more, so
// the integer right after it (its size) may not ask for more bytes than it
// holds: the callee would read past them. Throws std::invalid_argument.
void check_ptr_sizes(const Declaration& d, const std::vector<DynamicValue>& args) {
  for (std::size_t i = 0; i + 1 < args.size(); ++i) {
    if (args[i].type != ValueType::ptr || args[i + 1].type != ValueType::integer) continue;
    const std::size_t held = args[i].block.null ? 0 : args[i].block.bytes.size();
    const std::int64_t size = args[i + 1].integer;
    if (size > 0 && static_cast<std::uint64_t>(size) > held) {
      throw std::invalid_argument("argument " + std::to_string(i + 2) + " (" +
                                  d.params[i + 1].name + "): " + std::to_string(size) +
                                  " is more than the " + std::to_string(held) +
                                  (held == 1 ? " byte" : " bytes") + " that argument " +
                                  std::to_string(i + 1) + " (" + d.params[i].name + ") holds");
    }
  }
}

// The parsed declaration, after checking that it is registered and that
// the arguments have its parameter types. Throws std::invalid_argument.
Declaration checked_declaration(const Host& host, std::string_view declaration,
                                const std::vector<DynamicValue>& args) {
  if (!host.find(declaration)) {
    throw std::invalid_argument("not registered: " + std::string(declaration));
  }
  const auto parsed = parse_declaration(declaration);
  if (!parsed) throw std::invalid_argument("cannot parse: " + std::string(declaration));
  if (parsed->params.size() != args.size()) {
    throw std::invalid_argument(std::string(declaration) + ": takes " +
                                std::to_string(parsed->params.size()) + " arguments, given " +
                                std::to_string(args.size()));
  }
  for (std::size_t i = 0; i < args.size(); ++i) {
    if (args[i].type != parsed->params[i].type) {
      throw std::invalid_argument(std::string(declaration) + ": argument " + std::to_string(i + 1) +
                                  " is " + type_name(parsed->params[i].type) + ", given " +
                                  type_name(args[i].type));
    }
  }
  check_ptr_sizes(*parsed, args);
  return *parsed;
}

// The native arguments of one call: libffi types, the values they point
// at, private copies for ptr arguments, and the host handles made for them.
struct NativeArguments {
  std::vector<ffi_type*> types;
  std::vector<Slot> slots;
  std::vector<void*> values;
  std::vector<std::string> ptr_bytes;
  std::vector<const void*> handles;
};

void pass_arguments(Host& host, const std::vector<DynamicValue>& args, NativeArguments& native) {
  const std::size_t n = args.size();
  native.types.resize(n);
  native.slots.resize(n);
  native.values.resize(n);
  native.ptr_bytes.resize(n);
  for (std::size_t i = 0; i < n; ++i) {
    const DynamicValue& a = args[i];
    Slot& slot = native.slots[i];
    native.types[i] = argument_ffi_type(a.type);
    native.values[i] = &slot;
    switch (a.type) {
      case ValueType::string:
        slot.pointer =
            a.string.null ? nullptr : host.make_string(a.string.bytes, a.string.encoding);
        native.handles.push_back(slot.pointer);
        break;
      case ValueType::memory_block:
        slot.pointer = a.block.null ? nullptr : host.make_block(a.block.bytes);
        native.handles.push_back(slot.pointer);
        break;
      case ValueType::ptr:
        native.ptr_bytes[i] = a.block.bytes;
        slot.pointer = a.block.null ? nullptr : native.ptr_bytes[i].data();
        break;
      case ValueType::integer:
        slot.integer = a.integer;
        break;
      case ValueType::double_:
        slot.real = a.real;
        break;
      case ValueType::boolean:
        slot.boolean = a.boolean ? 1 : 0;
        break;
      default:
        break;
    }
  }
}

union RawResult {
  ffi_arg small;
  void* pointer;
  std::int64_t integer;
  double real;
};

// The result as a value; host objects are read and released.
DynamicValue read_result(Host& host, ValueType type, const RawResult& raw) {
  DynamicValue result;
  result.type = type;
  switch (type) {
    case ValueType::string: {
      auto s = static_cast<REALstring>(raw.pointer);
      result.string = host.read(s);
      if (s) host.release(s);
      break;
    }
    case ValueType::memory_block: {
      auto m = static_cast<REALmemoryBlock>(raw.pointer);
      result.block = host.read(m);
      if (m) host.release(m);
      break;
    }
    case ValueType::string_array: {
      auto a = static_cast<REALarray>(raw.pointer);
      result.array = host.read(a);
      if (a) host.release(a);
      break;
    }
    case ValueType::integer:
      result.integer = raw.integer;
      break;
    case ValueType::double_:
      result.real = raw.real;
      break;
    case ValueType::boolean:
      result.boolean = (raw.small & 0xFF) != 0;
      break;
    default:
      break;
  }
  return result;
}

}  // namespace

DynamicValue call_dynamic(Host& host, std::string_view declaration,
                          const std::vector<DynamicValue>& args) {
  const Declaration parsed = checked_declaration(host, declaration, args);
  void* function = host.find(declaration);

  NativeArguments native;
  host.call_started();
  pass_arguments(host, args, native);
  ffi_cif cif;
  if (ffi_prep_cif(&cif, FFI_DEFAULT_ABI, static_cast<unsigned>(args.size()),
                   result_ffi_type(parsed.result), native.types.data()) != FFI_OK) {
    host.call_finished(native.handles);
    throw std::invalid_argument("libffi cannot describe " + std::string(declaration));
  }
  RawResult raw{};
  ffi_call(&cif, FFI_FN(function), &raw, native.values.data());
  DynamicValue result = read_result(host, parsed.result, raw);
  host.call_finished(native.handles);
  return result;
}

}  // namespace zul_host
