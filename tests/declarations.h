// The 64 declarations the library registers, in registration order,
// character for character as the host parses them. Kept apart from the
// method table on purpose: a typo on either side fails the tests.
#pragma once

inline constexpr const char* kDeclarations[] = {
    "GetStringsFromDataZUL(data as ptr, size as Integer, MinLength as Integer = 0) as string()",
    "GetStringsFromDataZUL(data as MemoryBlock, MinLength as Integer = 0) as string()",
    "GetStringsFromDataZUL(data as String, MinLength as Integer = 0) as string()",
    "CheckUTF8ZUL(data as ptr, size as Integer, Placeholder as string) as string",
    "CheckUTF8ZUL(mem as MemoryBlock, Placeholder as string) as string",
    "CheckUTF8ZUL(data as string, Placeholder as string) as string",
    "EncodeEmailSubjectZUL(s as string) as string",
    "_yDecodeMemoryZUL(data as memoryblock) as memoryblock",
    "_yDecodeStringZUL(data as string) as string",
    "JaroWinklerDistanceZUL(a as string, b as string) as double",
    "LevenshteinDistanceZUL(a as string, b as string) as double",
    "ScientificStrZUL(d as double, digits as integer) as string",
    "StrZUL(d as double) as string",
    "RandomBytesStringZUL(Length as integer, ASCII as boolean=false) as string",
    "CreateStringZUL(Length as integer, Content as String) as string",
    "StrCompBytesZUL(a as string, b as string) as integer",
    "StrCompCharactersZUL(a as string, b as string) as integer",
    "CountOccurancesZUL(s as string, find as string) as integer",
    "DetectUnicodeMarkersZUL(s as string) as integer",
    "GetUnicodeMarkersZUL(kind as integer) as string",
    "StringIsHTMLreadyZUL(s as string) as boolean",
    "StringIsXMLreadyZUL(s as string) as boolean",
    "StringANDZUL(a as string,b as string) as string",
    "StringORZUL(a as string,b as string) as string",
    "StringXORZUL(data as string, XorMask as string, MaskOffset as integer = 0) as string",
    "StringXOR2ZUL(data as string, XorMask as string, MaskOffset as integer = 0) as string",
    "UnicodeStringZUL(s as string) as string",
    "NativeStringZUL(s as string) as string",
    "DecodingFromMySQLZUL(s as string) as string",
    "EncodingToHTMLZUL(s as string, options as integer = 0) as string",
    "DecodingFromHTMLZUL(s as string) as string",
    "EncodingToXMLZUL(s as string, options as integer = 0) as string",
    "DecodingFromXMLZUL(s as string) as string",
    "EncodingToURLZUL(s as string) as string",
    "EncodingToURLZUL(s as string, options as integer) as string",
    "DecodingFromURLZUL(s as string) as string",
    "DecodingFromURLZUL(s as string, options as integer) as string",
    "EncodingToQuotedPrintableZUL(s as string, LineLen as integer = 72) as string",
    "DecodingFromQuotedPrintableZUL(s as string) as string",
    "HexstringZUL(input as string, hexlen as integer, linelen as integer, linestart as string, "
    "lineend as string, spacer as string,filler as string) as string",
    "EncodingToISO8859ZUL(s as string) as string",
    "DecodingFromISO8859ZUL(s as string) as string",
    "EncodingToCP1252ZUL(s as string) as string",
    "DecodingFromCP1252ZUL(s as string) as string",
    "EncodingToHexZUL(s as string) as string",
    "DecodingFromHexZUL(s as string) as string",
    "ReplaceNonPrintableCharactersZUL(s as string, replacevalue as integer=46) as string",
    "IsASCIIStringZUL(s as string) as boolean",
    "IsASCIIStringZUL(s as string, mode as integer) as boolean",
    "RemoveHTMLTagsZUL(AsciiTextWithTags as string) as string",
    "RemoveHTMLTagsWithZUL(AsciiTextWithTags as string, Replacement as string) as string",
    "ConcatBinaryStringsZUL(a as string, b as string, c as string, d as string, e as string, f as "
    "string) as string",
    "ConcatBinaryStringsZUL(a as string, b as string, c as string, d as string, e as string) as "
    "string",
    "ConcatBinaryStringsZUL(a as string, b as string, c as string, d as string) as string",
    "ConcatBinaryStringsZUL(a as string, b as string, c as string) as string",
    "ConcatBinaryStringsZUL(a as string, b as string) as string",
    "SQLReplaceBooleanZUL(SQL as string) as string",
    "InStrBytesZUL(target as string, find as string) as integer",
    "InStrByteRangeZUL(target as string, StartValue as integer, EndValue as integer) as integer",
    "InStrByteRangeZUL(target as string, StartValue as integer, EndValue as integer, StartValue2 "
    "as integer, EndValue2 as integer) as integer",
    "InStrByteRangeZUL(target as string, StartValue as integer, EndValue as integer, StartValue2 "
    "as integer, EndValue2 as integer, StartValue3 as integer, EndValue3 as integer) as integer",
    "InStrByteRangeZUL(target as string, find as string, StartValue as integer, EndValue as "
    "integer) as integer",
    "InStrByteRangeZUL(target as string, find as string, StartValue as integer, EndValue as "
    "integer, StartValue2 as integer, EndValue2 as integer) as integer",
    "InStrByteRangeZUL(target as string, find as string, StartValue as integer, EndValue as "
    "integer, StartValue2 as integer, EndValue2 as integer, StartValue3 as integer, EndValue3 as "
    "integer) as integer",
};

// The declaration of a row of the method table, numbered from 1.
inline const char* decl(int row) { return kDeclarations[row - 1]; }
