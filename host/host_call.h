// The body of Host::call: maps each C++ argument type to the native type the
// host passes for its declared type, calls the registered pointer with those
// types, reads and releases the result, and closes the call's ledger.
// Included at the end of host/host.h; not meant to be included on its own.
#pragma once

#include <array>
#include <cstdint>
#include <tuple>
#include <type_traits>

namespace zul_host::call_detail {

template <class A>
using plain = std::remove_cvref_t<std::decay_t<A>>;

// The declared type a C++ argument stands for.
template <class A>
constexpr ValueType argument_type() {
  using T = plain<A>;
  if constexpr (std::is_same_v<T, Str>)
    return ValueType::string;
  else if constexpr (std::is_same_v<T, Block>)
    return ValueType::memory_block;
  else if constexpr (std::is_same_v<T, bool>)
    return ValueType::boolean;
  else if constexpr (std::is_integral_v<T>)
    return ValueType::integer;
  else if constexpr (std::is_floating_point_v<T>)
    return ValueType::double_;
  else if constexpr (std::is_pointer_v<T> || std::is_null_pointer_v<T>)
    return ValueType::ptr;
  else
    static_assert(sizeof(T) == 0, "unsupported argument type for Host::call");
}

template <class R>
constexpr ValueType result_type() {
  if constexpr (std::is_same_v<R, Str>)
    return ValueType::string;
  else if constexpr (std::is_same_v<R, Block>)
    return ValueType::memory_block;
  else if constexpr (std::is_same_v<R, StrArray>)
    return ValueType::string_array;
  else if constexpr (std::is_same_v<R, bool>)
    return ValueType::boolean;
  else if constexpr (std::is_same_v<R, std::int64_t>)
    return ValueType::integer;
  else if constexpr (std::is_same_v<R, double>)
    return ValueType::double_;
  else
    static_assert(sizeof(R) == 0,
                  "Host::call returns Str, Block, StrArray, int64_t, double or bool");
}

// The native type the host passes for an argument of C++ type A.
template <class A>
using native_argument = std::conditional_t<
    std::is_same_v<plain<A>, Str>, REALstring,
    std::conditional_t<
        std::is_same_v<plain<A>, Block>, REALmemoryBlock,
        std::conditional_t<std::is_same_v<plain<A>, bool>, signed char,
                           std::conditional_t<std::is_integral_v<plain<A>>, std::int64_t,
                                              std::conditional_t<std::is_floating_point_v<plain<A>>,
                                                                 double, void*>>>>>;

template <class R>
using native_result = std::conditional_t<
    std::is_same_v<R, Str>, REALstring,
    std::conditional_t<std::is_same_v<R, Block>, REALmemoryBlock,
                       std::conditional_t<std::is_same_v<R, StrArray>, REALarray, R>>>;

// Makes the host value for one argument; handles made here are recorded so
// the call can check and release them.
template <class A, std::size_t N>
native_argument<A> to_native(Host& host, const A& arg, std::array<const void*, N>& handles,
                             std::size_t& used) {
  using T = plain<A>;
  if constexpr (std::is_same_v<T, Str>) {
    REALstring s = arg.null ? nullptr : host.make_string(arg.bytes, arg.encoding);
    handles[used++] = s;
    return s;
  } else if constexpr (std::is_same_v<T, Block>) {
    REALmemoryBlock m = arg.null ? nullptr : host.make_block(arg.bytes);
    handles[used++] = m;
    return m;
  } else if constexpr (std::is_same_v<T, bool>) {
    return static_cast<signed char>(arg ? 1 : 0);
  } else if constexpr (std::is_integral_v<T> || std::is_floating_point_v<T>) {
    return static_cast<native_argument<A>>(arg);
  } else if constexpr (std::is_null_pointer_v<T>) {
    return nullptr;
  } else {
    return const_cast<void*>(static_cast<const void*>(arg));
  }
}

template <class R>
R from_native(Host& host, native_result<R> raw) {
  if constexpr (std::is_same_v<R, Str> || std::is_same_v<R, Block> || std::is_same_v<R, StrArray>) {
    R result = host.read(raw);
    if (raw) host.release(raw);
    return result;
  } else {
    return raw;
  }
}

}  // namespace zul_host::call_detail

namespace zul_host {

template <class R, class... A>
R Host::call(std::string_view declaration, const A&... args) {
  namespace cd = call_detail;
  void* function = checked_function(declaration, {cd::argument_type<A>()...}, cd::result_type<R>());
  using Native = cd::native_result<R> (*)(cd::native_argument<A>...);
  auto native = reinterpret_cast<Native>(function);

  call_started();
  std::array<const void*, sizeof...(A) + 1> handles{};
  std::size_t used = 0;
  // Braced initialisation evaluates the arguments left to right.
  std::tuple<cd::native_argument<A>...> values{cd::to_native(*this, args, handles, used)...};
  R result = cd::from_native<R>(*this, std::apply(native, values));
  call_finished(std::span<const void* const>(handles.data(), used));
  return result;
}

}  // namespace zul_host
