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

}  // namespace

DynamicValue call_dynamic(Host& host, std::string_view declaration,
                          const std::vector<DynamicValue>& args) {
  void* function = host.find(declaration);
  if (!function) throw std::invalid_argument("not registered: " + std::string(declaration));
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

  const std::size_t n = args.size();
  std::vector<ffi_type*> types(n);
  std::vector<Slot> slots(n);
  std::vector<void*> values(n);
  std::vector<std::string> ptr_bytes(n);  // private copies that ptr arguments point at
  std::vector<const void*> handles;

  host.call_started();
  for (std::size_t i = 0; i < n; ++i) {
    const DynamicValue& a = args[i];
    types[i] = argument_ffi_type(a.type);
    values[i] = &slots[i];
    switch (a.type) {
      case ValueType::string:
        slots[i].pointer =
            a.string.null ? nullptr : host.make_string(a.string.bytes, a.string.encoding);
        handles.push_back(slots[i].pointer);
        break;
      case ValueType::memory_block:
        slots[i].pointer = a.block.null ? nullptr : host.make_block(a.block.bytes);
        handles.push_back(slots[i].pointer);
        break;
      case ValueType::ptr:
        ptr_bytes[i] = a.block.bytes;
        slots[i].pointer = a.block.null ? nullptr : ptr_bytes[i].data();
        break;
      case ValueType::integer:
        slots[i].integer = a.integer;
        break;
      case ValueType::double_:
        slots[i].real = a.real;
        break;
      case ValueType::boolean:
        slots[i].boolean = a.boolean ? 1 : 0;
        break;
      default:
        break;
    }
  }

  ffi_cif cif;
  if (ffi_prep_cif(&cif, FFI_DEFAULT_ABI, static_cast<unsigned>(n), result_ffi_type(parsed->result),
                   types.data()) != FFI_OK) {
    host.call_finished(handles);
    throw std::invalid_argument("libffi cannot describe " + std::string(declaration));
  }
  union {
    ffi_arg small;
    void* pointer;
    std::int64_t integer;
    double real;
  } raw{};
  ffi_call(&cif, FFI_FN(function), &raw, values.data());

  DynamicValue result;
  result.type = parsed->result;
  switch (parsed->result) {
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
  host.call_finished(handles);
  return result;
}

}  // namespace zul_host
