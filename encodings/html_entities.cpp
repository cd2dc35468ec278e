// Named character reference look-ups. The table is sorted by code point, so
// code point to name is a binary search; name to code point searches a copy
// of the table sorted by name at compile time. Both copies are immutable.
#include "encodings/html_entities.h"

#include <algorithm>
#include <array>

#include "encodings/html_entities_tables.h"

namespace zul::encodings {
namespace {

constexpr bool table_is_well_formed() {
  for (std::size_t i = 0; i < kEntities.size(); ++i) {
    if (kEntities[i].code_point == 0 || kEntities[i].name.empty()) return false;
    if (kEntities[i].name.size() > 8) return false;
    if (i > 0 && kEntities[i - 1].code_point >= kEntities[i].code_point) return false;
  }
  return kEntities[5].code_point == 0xA0 && kEntities[100].code_point == 0xFF;
}
static_assert(table_is_well_formed(),
              "entity rows must be sorted by code point, names 1-8, Latin-1 contiguous");

constexpr std::uint32_t kNbsp = 0xA0;

constexpr auto kByName = [] {
  auto sorted = kEntities;
  std::sort(sorted.begin(), sorted.end(),
            [](const entity& a, const entity& b) { return a.name < b.name; });
  return sorted;
}();

constexpr bool names_are_unique() {
  for (std::size_t i = 1; i < kByName.size(); ++i) {
    if (kByName[i - 1].name == kByName[i].name) return false;
  }
  return true;
}
static_assert(names_are_unique(), "entity names must be unique");

}  // namespace

std::string_view entity_name(std::uint32_t cp, bool from_nbsp) {
  if (from_nbsp && cp < kNbsp) return {};
  // Latin-1 rows are contiguous: U+00A0 is row 5, U+00FF row 100.
  if (cp >= kNbsp && cp <= 0xFF) return kEntities[5 + (cp - kNbsp)].name;
  const auto* it = std::lower_bound(
      kEntities.begin(), kEntities.end(), cp,
      [](const entity& row, std::uint32_t value) { return row.code_point < value; });
  if (it == kEntities.end() || it->code_point != cp) return {};
  return it->name;
}

std::optional<std::uint32_t> entity_code_point(std::string_view name) {
  const auto* it =
      std::lower_bound(kByName.begin(), kByName.end(), name,
                       [](const entity& row, std::string_view value) { return row.name < value; });
  if (it == kByName.end() || it->name != name) return std::nullopt;
  return it->code_point;
}

}  // namespace zul::encodings
