// The native functions the host calls through the method table, one per
// registered declaration (rows 31 and 33 share DecodingToHTML). Argument and
// result types follow the declarations: string -> REALstring, MemoryBlock ->
// REALmemoryBlock, ptr -> void*, Integer -> std::int64_t, double -> double,
// boolean -> signed char argument / bool result, string() -> REALarray.
// Each family defines its natives in its own entries.cpp.
#pragma once

#include <cstdint>

#include "plugin/host_types.h"

// binary/: readable runs, bitwise strings, concatenation, hex.
REALarray GetStringsZULp(void* data, std::int64_t size, std::int64_t min_length) noexcept;
REALarray GetStringsZULm(REALmemoryBlock data, std::int64_t min_length) noexcept;
REALarray GetStringsZULs(REALstring data, std::int64_t min_length) noexcept;
REALstring RandomBytesStringZUL(std::int64_t length, signed char ascii) noexcept;
REALstring CreateStringZUL(std::int64_t length, REALstring content) noexcept;
REALstring StringAND(REALstring a, REALstring b) noexcept;
REALstring StringOR(REALstring a, REALstring b) noexcept;
REALstring StringXOR(REALstring data, REALstring mask, std::int64_t mask_offset) noexcept;
REALstring StringXOR2(REALstring data, REALstring mask, std::int64_t mask_offset) noexcept;
REALstring Hexstring(REALstring input, std::int64_t hexlen, std::int64_t linelen,
                     REALstring linestart, REALstring lineend, REALstring spacer,
                     REALstring filler) noexcept;
REALstring EncodingToHex(REALstring s) noexcept;
REALstring DecodingToHex(REALstring s) noexcept;
REALstring ConcatBinaryStringsZUL6(REALstring a, REALstring b, REALstring c, REALstring d,
                                   REALstring e, REALstring f) noexcept;
REALstring ConcatBinaryStringsZUL5(REALstring a, REALstring b, REALstring c, REALstring d,
                                   REALstring e) noexcept;
REALstring ConcatBinaryStringsZUL4(REALstring a, REALstring b, REALstring c, REALstring d) noexcept;
REALstring ConcatBinaryStringsZUL3(REALstring a, REALstring b, REALstring c) noexcept;
REALstring ConcatBinaryStringsZUL2(REALstring a, REALstring b) noexcept;

// text/: UTF-8 repair, character classes, markers, Latin-1 / CP1252, numbers.
REALstring CheckUTF8p(void* data, std::int64_t size, REALstring placeholder) noexcept;
REALstring CheckUTF8m(REALmemoryBlock mem, REALstring placeholder) noexcept;
REALstring CheckUTF8s(REALstring data, REALstring placeholder) noexcept;
REALstring ScientificStrZUL(double d, std::int64_t digits) noexcept;
REALstring StrZUL(double d) noexcept;
std::int64_t DetectUnicodeMarkers(REALstring s) noexcept;
REALstring GetUnicodeMarkers(std::int64_t kind) noexcept;
REALstring RBUnicodeString(REALstring s) noexcept;
REALstring RBNativeString(REALstring s) noexcept;
REALstring EncodingToISO8859(REALstring s) noexcept;
REALstring DecodingToISO8859(REALstring s) noexcept;
REALstring EncodingToCP1252(REALstring s) noexcept;
REALstring DecodingToCP1252(REALstring s) noexcept;
REALstring ReplaceNonPrintableCharactersZUL(REALstring s, std::int64_t replace_value) noexcept;
bool IsASCIIString1(REALstring s) noexcept;
bool IsASCIIString2(REALstring s, std::int64_t mode) noexcept;

// encodings/: web, mail and database codecs.
REALstring EncodeEmailSubjectZUL(REALstring s) noexcept;
REALmemoryBlock yDecodeZULm(REALmemoryBlock data) noexcept;
REALstring yDecodeZULs(REALstring data) noexcept;
bool StringIsHTMLready(REALstring s) noexcept;
bool StringIsXMLready(REALstring s) noexcept;
REALstring DecodingFromMySQL(REALstring s) noexcept;
REALstring EncodingToHTML(REALstring s, std::int64_t options) noexcept;
REALstring DecodingToHTML(REALstring s) noexcept;
REALstring EncodingToXML(REALstring s, std::int64_t options) noexcept;
REALstring EncodingToURL1(REALstring s) noexcept;
REALstring EncodingToURL2(REALstring s, std::int64_t options) noexcept;
REALstring DecodingToURL1(REALstring s) noexcept;
REALstring DecodingToURL2(REALstring s, std::int64_t options) noexcept;
REALstring EncodingToQuotedPrintable2(REALstring s, std::int64_t line_length) noexcept;
REALstring DecodingToQuotedPrintable(REALstring s) noexcept;
REALstring RemoveHTMLTags(REALstring s) noexcept;
REALstring RemoveHTMLTagsWith(REALstring s, REALstring replacement) noexcept;
REALstring SQLReplaceBooleanZUL(REALstring sql) noexcept;

// search/: byte search, counting, comparison, distances.
double jaroWinklerDistanceZUL(REALstring a, REALstring b) noexcept;
double levenshteinDistanceZUL(REALstring a, REALstring b) noexcept;
std::int64_t StrCompBytesZUL(REALstring a, REALstring b) noexcept;
std::int64_t StrCompCharsZUL(REALstring a, REALstring b) noexcept;
std::int64_t CountOccurancesZUL(REALstring s, REALstring find) noexcept;
std::int64_t InStrBytesZUL(REALstring target, REALstring find) noexcept;
std::int64_t InStrByteRange1ZUL(REALstring target, std::int64_t start, std::int64_t end) noexcept;
std::int64_t InStrByteRange2ZUL(REALstring target, std::int64_t start, std::int64_t end,
                                std::int64_t start2, std::int64_t end2) noexcept;
std::int64_t InStrByteRange3ZUL(REALstring target, std::int64_t start, std::int64_t end,
                                std::int64_t start2, std::int64_t end2, std::int64_t start3,
                                std::int64_t end3) noexcept;
std::int64_t InStrByteRange1BZUL(REALstring target, REALstring find, std::int64_t start,
                                 std::int64_t end) noexcept;
std::int64_t InStrByteRange2BZUL(REALstring target, REALstring find, std::int64_t start,
                                 std::int64_t end, std::int64_t start2, std::int64_t end2) noexcept;
std::int64_t InStrByteRange3BZUL(REALstring target, REALstring find, std::int64_t start,
                                 std::int64_t end, std::int64_t start2, std::int64_t end2,
                                 std::int64_t start3, std::int64_t end3) noexcept;
