#pragma once

#include <fmt/format.h>
#include <CLI/App.hpp>

#include <algorithm>
#include <iterator>
#include <string>
#include <string_view>

/// Tables whose rows have a name that the user types.
namespace CommandLine {

/// The plainest of such rows.
template <typename Value>
struct Named {
  const char* name;
  Value value;
};

/// \return the row with that name, or null.
template <typename Row, std::size_t N>
const Row* Find(const Row (&table)[N], std::string_view name) {
  const Row* row = std::find_if(std::begin(table), std::end(table),
                                [&](const Row& candidate) { return candidate.name == name; });
  return row == std::end(table) ? nullptr : row;
}

/// \return the name of a value, or its number where it has none.
template <typename Value, std::size_t N>
std::string NameOf(const Named<Value> (&table)[N], Value value) {
  for (const Named<Value>& row : table) {
    if (row.value == value) return row.name;
  }
  return fmt::format("{}", static_cast<int>(value));
}

/// \return "media, media-mix, alarm".
template <typename Row, std::size_t N>
std::string NamesIn(const Row (&table)[N], const char* separator = ", ") {
  std::string names;
  for (const Row& row : table) names += (names.empty() ? "" : separator) + std::string(row.name);
  return names;
}

/// \return an error text, "" for one of the table's names, as CLI11 wants it.
/// \param kind what the table's rows are: "category"
template <typename Row, std::size_t N>
std::string CheckName(const Row (&table)[N], const char* kind, std::string_view name) {
  if (Find(table, name) != nullptr) return "";
  return fmt::format("there is no {} '{}'; there are: {}", kind, name, NamesIn(table));
}

/// The same as a validator of CLI11's, which also tells the names. The table must outlive it.
template <typename Row, std::size_t N>
CLI::Validator OneOf(const Row (&table)[N], const char* kind) {
  return CLI::Validator([&table, kind](std::string& name) { return CheckName(table, kind, name); },
                        NamesIn(table, " "));
}

}  // namespace CommandLine
