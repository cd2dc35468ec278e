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
    row(EncodeEmailSubjectZUL, "EncodeEmailSubjectZUL(s as string) as string"),  // 7
    row(yDecodeZULm, "_yDecodeMemoryZUL(data as memoryblock) as memoryblock"),  // 8
    row(yDecodeZULs, "_yDecodeStringZUL(data as string) as string"),  // 9
    row(StringIsHTMLready, "StringIsHTMLreadyZUL(s as string) as boolean"),  // 21
    row(StringIsXMLready, "StringIsXMLreadyZUL(s as string) as boolean"),  // 22
    row(DecodingFromMySQL, "DecodingFromMySQLZUL(s as string) as string"),  // 29
    row(EncodingToHTML, "EncodingToHTMLZUL(s as string, options as integer = 0) as string"),  // 30
    row(DecodingToHTML, "DecodingFromHTMLZUL(s as string) as string"),  // 31
    row(EncodingToXML, "EncodingToXMLZUL(s as string, options as integer = 0) as string"),  // 32
    row(DecodingToHTML, "DecodingFromXMLZUL(s as string) as string"),  // 33
    row(EncodingToURL1, "EncodingToURLZUL(s as string) as string"),  // 34
    row(EncodingToURL2, "EncodingToURLZUL(s as string, options as integer) as string"),  // 35
    row(DecodingToURL1, "DecodingFromURLZUL(s as string) as string"),  // 36
    row(DecodingToURL2, "DecodingFromURLZUL(s as string, options as integer) as string"),  // 37
    row(EncodingToQuotedPrintable2, "EncodingToQuotedPrintableZUL(s as string, LineLen as integer = 72) as string"),  // 38
    row(DecodingToQuotedPrintable, "DecodingFromQuotedPrintableZUL(s as string) as string"),  // 39
    row(RemoveHTMLTags, "RemoveHTMLTagsZUL(AsciiTextWithTags as string) as string"),  // 50
    row(RemoveHTMLTagsWith, "RemoveHTMLTagsWithZUL(AsciiTextWithTags as string, Replacement as string) as string"),  // 51
    row(SQLReplaceBooleanZUL, "SQLReplaceBooleanZUL(SQL as string) as string"),  // 57
    row(InStrBytesZUL, "InStrBytesZUL(target as string, find as string) as integer"),  // 58
    row(InStrByteRange1ZUL, "InStrByteRangeZUL(target as string, StartValue as integer, EndValue as integer) as integer"),  // 59
    row(InStrByteRange2ZUL, "InStrByteRangeZUL(target as string, StartValue as integer, EndValue as integer, StartValue2 as integer, EndValue2 as integer) as integer"),  // 60
    row(InStrByteRange3ZUL, "InStrByteRangeZUL(target as string, StartValue as integer, EndValue as integer, StartValue2 as integer, EndValue2 as integer, StartValue3 as integer, EndValue3 as integer) as integer"),  // 61
    row(InStrByteRange1BZUL, "InStrByteRangeZUL(target as string, find as string, StartValue as integer, EndValue as integer) as integer"),  // 62
    row(InStrByteRange2BZUL, "InStrByteRangeZUL(target as string, find as string, StartValue as integer, EndValue as integer, StartValue2 as integer, EndValue2 as integer) as integer"),  // 63
    row(InStrByteRange3BZUL, "InStrByteRangeZUL(target as string, find as string, StartValue as integer, EndValue as integer, StartValue2 as integer, EndValue2 as integer, StartValue3 as integer, EndValue3 as integer) as integer"),  // 64
};

const std::size_t globalMethodCount = sizeof(globalMethods) / sizeof(globalMethods[0]);
