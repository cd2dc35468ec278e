// globalMethods: the one list of every function the library registers, in
// registration order, each with its host-language declaration exactly as the
// host parses it (blanks and case included). Flags are 4 in every row; the
// module path ORs in 16 on its copies. Rows are numbered in trailing
// comments; "DecodingFromHTMLZUL" and "DecodingFromXMLZUL" share one function.
#include "plugin/method_table.h"

#include "plugin/natives.h"

namespace {

// Takes only noexcept functions: a native that could let an exception out
// into the host does not compile into the table.
template <class R, class... Args>
GlobalMethodEntry row(R (*function)(Args...) noexcept, const char* declaration) {
  return {reinterpret_cast<void*>(function), nullptr, declaration, 4, 0, 0, nullptr};
}

}  // namespace

// One row per line, in declared order; kept out of clang-format, which
// does not settle on one layout for rows with trailing numbers.
// clang-format off
const GlobalMethodEntry globalMethods[] = {
    row(GetStringsZULp,
        "GetStringsFromDataZUL(data as ptr, size as Integer, MinLength as Integer = 0) as "
        "string()"),  // 1
    row(GetStringsZULm,
        "GetStringsFromDataZUL(data as MemoryBlock, MinLength as Integer = 0) as string()"),  // 2
    row(GetStringsZULs,
        "GetStringsFromDataZUL(data as String, MinLength as Integer = 0) as string()"),  // 3
    row(CheckUTF8p,
        "CheckUTF8ZUL(data as ptr, size as Integer, Placeholder as string) as string"),    // 4
    row(CheckUTF8m, "CheckUTF8ZUL(mem as MemoryBlock, Placeholder as string) as string"),  // 5
    row(CheckUTF8s, "CheckUTF8ZUL(data as string, Placeholder as string) as string"),      // 6
    row(EncodeEmailSubjectZUL, "EncodeEmailSubjectZUL(s as string) as string"),            // 7
    row(yDecodeZULm, "_yDecodeMemoryZUL(data as memoryblock) as memoryblock"),             // 8
    row(yDecodeZULs, "_yDecodeStringZUL(data as string) as string"),                       // 9
    row(jaroWinklerDistanceZUL,
        "JaroWinklerDistanceZUL(a as string, b as string) as double"),  // 10
    row(levenshteinDistanceZUL,
        "LevenshteinDistanceZUL(a as string, b as string) as double"),                    // 11
    row(ScientificStrZUL, "ScientificStrZUL(d as double, digits as integer) as string"),  // 12
    row(StrZUL, "StrZUL(d as double) as string"),                                         // 13
    row(RandomBytesStringZUL,
        "RandomBytesStringZUL(Length as integer, ASCII as boolean=false) as string"),         // 14
    row(CreateStringZUL, "CreateStringZUL(Length as integer, Content as String) as string"),  // 15
    row(StrCompBytesZUL, "StrCompBytesZUL(a as string, b as string) as integer"),             // 16
    row(StrCompCharsZUL, "StrCompCharactersZUL(a as string, b as string) as integer"),        // 17
    row(CountOccurancesZUL, "CountOccurancesZUL(s as string, find as string) as integer"),    // 18
    row(DetectUnicodeMarkers, "DetectUnicodeMarkersZUL(s as string) as integer"),             // 19
    row(GetUnicodeMarkers, "GetUnicodeMarkersZUL(kind as integer) as string"),                // 20
    row(StringIsHTMLready, "StringIsHTMLreadyZUL(s as string) as boolean"),                   // 21
    row(StringIsXMLready, "StringIsXMLreadyZUL(s as string) as boolean"),                     // 22
    row(StringAND, "StringANDZUL(a as string,b as string) as string"),                        // 23
    row(StringOR, "StringORZUL(a as string,b as string) as string"),                          // 24
    row(StringXOR,
        "StringXORZUL(data as string, XorMask as string, MaskOffset as integer = 0) as string"),  // 25
    row(StringXOR2,
        "StringXOR2ZUL(data as string, XorMask as string, MaskOffset as integer = 0) as string"),  // 26
    row(RBUnicodeString, "UnicodeStringZUL(s as string) as string"),                          // 27
    row(RBNativeString, "NativeStringZUL(s as string) as string"),                            // 28
    row(DecodingFromMySQL, "DecodingFromMySQLZUL(s as string) as string"),                    // 29
    row(EncodingToHTML, "EncodingToHTMLZUL(s as string, options as integer = 0) as string"),  // 30
    row(DecodingToHTML, "DecodingFromHTMLZUL(s as string) as string"),                        // 31
    row(EncodingToXML, "EncodingToXMLZUL(s as string, options as integer = 0) as string"),    // 32
    row(DecodingToHTML, "DecodingFromXMLZUL(s as string) as string"),                         // 33
    row(EncodingToURL1, "EncodingToURLZUL(s as string) as string"),                           // 34
    row(EncodingToURL2, "EncodingToURLZUL(s as string, options as integer) as string"),       // 35
    row(DecodingToURL1, "DecodingFromURLZUL(s as string) as string"),                         // 36
    row(DecodingToURL2, "DecodingFromURLZUL(s as string, options as integer) as string"),     // 37
    row(EncodingToQuotedPrintable2,
        "EncodingToQuotedPrintableZUL(s as string, LineLen as integer = 72) as string"),      // 38
    row(DecodingToQuotedPrintable, "DecodingFromQuotedPrintableZUL(s as string) as string"),  // 39
    row(Hexstring,
        "HexstringZUL(input as string, hexlen as integer, linelen as integer, linestart as string, "
        "lineend as string, spacer as string,filler as string) as string"),   // 40
    row(EncodingToISO8859, "EncodingToISO8859ZUL(s as string) as string"),    // 41
    row(DecodingToISO8859, "DecodingFromISO8859ZUL(s as string) as string"),  // 42
    row(EncodingToCP1252, "EncodingToCP1252ZUL(s as string) as string"),      // 43
    row(DecodingToCP1252, "DecodingFromCP1252ZUL(s as string) as string"),    // 44
    row(EncodingToHex, "EncodingToHexZUL(s as string) as string"),            // 45
    row(DecodingToHex, "DecodingFromHexZUL(s as string) as string"),          // 46
    row(ReplaceNonPrintableCharactersZUL,
        "ReplaceNonPrintableCharactersZUL(s as string, replacevalue as integer=46) as string"),  // 47
    row(IsASCIIString1, "IsASCIIStringZUL(s as string) as boolean"),                   // 48
    row(IsASCIIString2, "IsASCIIStringZUL(s as string, mode as integer) as boolean"),  // 49
    row(RemoveHTMLTags, "RemoveHTMLTagsZUL(AsciiTextWithTags as string) as string"),   // 50
    row(RemoveHTMLTagsWith,
        "RemoveHTMLTagsWithZUL(AsciiTextWithTags as string, Replacement as string) as string"),  // 51
    row(ConcatBinaryStringsZUL6,
        "ConcatBinaryStringsZUL(a as string, b as string, c as string, d as string, e as string, f "
        "as string) as string"),  // 52
    row(ConcatBinaryStringsZUL5,
        "ConcatBinaryStringsZUL(a as string, b as string, c as string, d as string, e as string) "
        "as string"),  // 53
    row(ConcatBinaryStringsZUL4,
        "ConcatBinaryStringsZUL(a as string, b as string, c as string, d as string) as string"),  // 54
    row(ConcatBinaryStringsZUL3,
        "ConcatBinaryStringsZUL(a as string, b as string, c as string) as string"),  // 55
    row(ConcatBinaryStringsZUL2,
        "ConcatBinaryStringsZUL(a as string, b as string) as string"),                 // 56
    row(SQLReplaceBooleanZUL, "SQLReplaceBooleanZUL(SQL as string) as string"),        // 57
    row(InStrBytesZUL, "InStrBytesZUL(target as string, find as string) as integer"),  // 58
    row(InStrByteRange1ZUL,
        "InStrByteRangeZUL(target as string, StartValue as integer, EndValue as integer) as "
        "integer"),  // 59
    row(InStrByteRange2ZUL,
        "InStrByteRangeZUL(target as string, StartValue as integer, EndValue as integer, "
        "StartValue2 as integer, EndValue2 as integer) as integer"),  // 60
    row(InStrByteRange3ZUL,
        "InStrByteRangeZUL(target as string, StartValue as integer, EndValue as integer, "
        "StartValue2 as integer, EndValue2 as integer, StartValue3 as integer, EndValue3 as "
        "integer) as integer"),  // 61
    row(InStrByteRange1BZUL,
        "InStrByteRangeZUL(target as string, find as string, StartValue as integer, EndValue as "
        "integer) as integer"),  // 62
    row(InStrByteRange2BZUL,
        "InStrByteRangeZUL(target as string, find as string, StartValue as integer, EndValue as "
        "integer, StartValue2 as integer, EndValue2 as integer) as integer"),  // 63
    row(InStrByteRange3BZUL,
        "InStrByteRangeZUL(target as string, find as string, StartValue as integer, EndValue as "
        "integer, StartValue2 as integer, EndValue2 as integer, StartValue3 as integer, EndValue3 "
        "as integer) as integer"),  // 64
};
// clang-format on

const std::size_t globalMethodCount = sizeof(globalMethods) / sizeof(globalMethods[0]);
