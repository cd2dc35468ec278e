// The native functions the host calls through the method table, one per
// registered declaration (rows 31 and 33 share DecodingToHTML). Argument and
// result types follow the declarations: string -> REALstring, MemoryBlock ->
// REALmemoryBlock, ptr -> void*, Integer -> std::int64_t, double -> double,
// boolean -> signed char argument / bool result, string() -> REALarray.
// Each family defines its natives in its own entries.cpp.
#pragma once

#include <cstdint>

#include "plugin/host_types.h"

using std::int64_t;

// binary/: readable runs, bitwise strings, concatenation, hex.
REALarray GetStringsZULp(void* data, int64_t size, int64_t min_length);
REALarray GetStringsZULm(REALmemoryBlock data, int64_t min_length);
REALarray GetStringsZULs(REALstring data, int64_t min_length);
REALstring RandomBytesStringZUL(int64_t length, signed char ascii);
REALstring CreateStringZUL(int64_t length, REALstring content);
REALstring StringAND(REALstring a, REALstring b);
REALstring StringOR(REALstring a, REALstring b);
REALstring StringXOR(REALstring data, REALstring mask, int64_t mask_offset);
REALstring StringXOR2(REALstring data, REALstring mask, int64_t mask_offset);
REALstring Hexstring(REALstring input, int64_t hexlen, int64_t linelen, REALstring linestart,
                     REALstring lineend, REALstring spacer, REALstring filler);
REALstring EncodingToHex(REALstring s);
REALstring DecodingToHex(REALstring s);
REALstring ConcatBinaryStringsZUL6(REALstring a, REALstring b, REALstring c, REALstring d,
                                   REALstring e, REALstring f);
REALstring ConcatBinaryStringsZUL5(REALstring a, REALstring b, REALstring c, REALstring d,
                                   REALstring e);
REALstring ConcatBinaryStringsZUL4(REALstring a, REALstring b, REALstring c, REALstring d);
REALstring ConcatBinaryStringsZUL3(REALstring a, REALstring b, REALstring c);
REALstring ConcatBinaryStringsZUL2(REALstring a, REALstring b);

// text/: UTF-8 repair, character classes, markers, Latin-1 / CP1252, numbers.
REALstring CheckUTF8p(void* data, int64_t size, REALstring placeholder);
REALstring CheckUTF8m(REALmemoryBlock mem, REALstring placeholder);
REALstring CheckUTF8s(REALstring data, REALstring placeholder);
REALstring ScientificStrZUL(double d, int64_t digits);
REALstring StrZUL(double d);
int64_t DetectUnicodeMarkers(REALstring s);
REALstring GetUnicodeMarkers(int64_t kind);
REALstring RBUnicodeString(REALstring s);
REALstring RBNativeString(REALstring s);
REALstring EncodingToISO8859(REALstring s);
REALstring DecodingToISO8859(REALstring s);
REALstring EncodingToCP1252(REALstring s);
REALstring DecodingToCP1252(REALstring s);
REALstring ReplaceNonPrintableCharactersZUL(REALstring s, int64_t replace_value);
bool IsASCIIString1(REALstring s);
bool IsASCIIString2(REALstring s, int64_t mode);

// encodings/: web, mail and database codecs.
REALstring EncodeEmailSubjectZUL(REALstring s);
REALmemoryBlock yDecodeZULm(REALmemoryBlock data);
REALstring yDecodeZULs(REALstring data);
bool StringIsHTMLready(REALstring s);
bool StringIsXMLready(REALstring s);
REALstring DecodingFromMySQL(REALstring s);
REALstring EncodingToHTML(REALstring s, int64_t options);
REALstring DecodingToHTML(REALstring s);
REALstring EncodingToXML(REALstring s, int64_t options);
REALstring EncodingToURL1(REALstring s);
REALstring EncodingToURL2(REALstring s, int64_t options);
REALstring DecodingToURL1(REALstring s);
REALstring DecodingToURL2(REALstring s, int64_t options);
REALstring EncodingToQuotedPrintable2(REALstring s, int64_t line_length);
REALstring DecodingToQuotedPrintable(REALstring s);
REALstring RemoveHTMLTags(REALstring s);
REALstring RemoveHTMLTagsWith(REALstring s, REALstring replacement);
REALstring SQLReplaceBooleanZUL(REALstring sql);

// search/: byte search, counting, comparison, distances.
double jaroWinklerDistanceZUL(REALstring a, REALstring b);
double levenshteinDistanceZUL(REALstring a, REALstring b);
int64_t StrCompBytesZUL(REALstring a, REALstring b);
int64_t StrCompCharsZUL(REALstring a, REALstring b);
int64_t CountOccurancesZUL(REALstring s, REALstring find);
int64_t InStrBytesZUL(REALstring target, REALstring find);
int64_t InStrByteRange1ZUL(REALstring target, int64_t start, int64_t end);
int64_t InStrByteRange2ZUL(REALstring target, int64_t start, int64_t end, int64_t start2,
                           int64_t end2);
int64_t InStrByteRange3ZUL(REALstring target, int64_t start, int64_t end, int64_t start2,
                           int64_t end2, int64_t start3, int64_t end3);
int64_t InStrByteRange1BZUL(REALstring target, REALstring find, int64_t start, int64_t end);
int64_t InStrByteRange2BZUL(REALstring target, REALstring find, int64_t start, int64_t end,
                            int64_t start2, int64_t end2);
int64_t InStrByteRange3BZUL(REALstring target, REALstring find, int64_t start, int64_t end,
                            int64_t start2, int64_t end2, int64_t start3, int64_t end3);
