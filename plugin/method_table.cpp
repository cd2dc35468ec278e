// globalMethods: the one list of every function the library registers, in
// registration order, each with its host-language declaration exactly as the
// host parses it (blanks and case included). Flags are 4 in every row; the
// module path ORs in 16 on its copies. Rows are numbered in trailing
// comments; "DecodingFromHTMLZUL" and "DecodingFromXMLZUL" share one function.
#include "plugin/method_table.h"

#include "plugin/natives.h"

namespace {

template <class Fn>
GlobalMethodEntry row(Fn* function, const char* declaration) {
  return {reinterpret_cast<void*>(function), nullptr, declaration, 4, 0, 0, nullptr};
}

}  // namespace

const GlobalMethodEntry globalMethods[] = {
    row(InStrBytesZUL, "InStrBytesZUL(target as string, find as string) as integer"),  // 58
    row(InStrByteRange1ZUL, "InStrByteRangeZUL(target as string, StartValue as integer, EndValue as integer) as integer"),  // 59
    row(InStrByteRange2ZUL, "InStrByteRangeZUL(target as string, StartValue as integer, EndValue as integer, StartValue2 as integer, EndValue2 as integer) as integer"),  // 60
    row(InStrByteRange3ZUL, "InStrByteRangeZUL(target as string, StartValue as integer, EndValue as integer, StartValue2 as integer, EndValue2 as integer, StartValue3 as integer, EndValue3 as integer) as integer"),  // 61
    row(InStrByteRange1BZUL, "InStrByteRangeZUL(target as string, find as string, StartValue as integer, EndValue as integer) as integer"),  // 62
    row(InStrByteRange2BZUL, "InStrByteRangeZUL(target as string, find as string, StartValue as integer, EndValue as integer, StartValue2 as integer, EndValue2 as integer) as integer"),  // 63
    row(InStrByteRange3BZUL, "InStrByteRangeZUL(target as string, find as string, StartValue as integer, EndValue as integer, StartValue2 as integer, EndValue2 as integer, StartValue3 as integer, EndValue3 as integer) as integer"),  // 64
};

const std::size_t globalMethodCount = sizeof(globalMethods) / sizeof(globalMethods[0]);
