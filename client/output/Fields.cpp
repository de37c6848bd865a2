#include "Fields.h"

#include "Text.h"

#include <algorithm>

namespace lumora::client {

namespace {

// Longer cells stand out instead of widening their column.
constexpr std::size_t widestColumn = 60;

using Row = std::vector<std::string>;

std::string cell(const Value& row, const Field& column) {
  const Value* const value = row.dictionary()->find(column.key);
  return value != nullptr ? column.text(*value) : "";
}

Row cells(const Value& row, const std::vector<Field>& columns) {
  if (row.dictionary() == nullptr) {
    return {plainText(row)};
  }
  Row texts;
  for (const Field& column : columns) {
    texts.push_back(cell(row, column));
  }
  return texts;
}

bool isFilled(const Array& rows, const Field& column) {
  return std::ranges::any_of(
      rows, [&](const Value& row) { return row.dictionary() != nullptr && !cell(row, column).empty(); });
}

std::string orDash(const std::string& text) {
  return text.empty() ? "-" : text;
}

std::string aligned(const std::vector<Row>& rows) {
  std::vector<std::size_t> widths;
  for (const Row& row : rows) {
    widths.resize(std::max(widths.size(), row.size()));
    for (std::size_t i = 0; i < row.size(); ++i) {
      if (const auto needed = width(row[i]); needed <= widestColumn) {
        widths[i] = std::max(widths[i], needed);
      }
    }
  }
  std::string text;
  for (const Row& row : rows) {
    std::string line;
    for (std::size_t i = 0; i < row.size(); ++i) {
      const std::size_t taken = width(row[i]);
      line += row[i] + std::string(taken < widths[i] ? widths[i] - taken : 0, ' ') + "  ";
    }
    line.erase(line.find_last_not_of(' ') + 1);
    text += line + "\n";
  }
  return text;
}

} // namespace

std::string table(const Array& rows, const std::vector<Field>& columns) {
  std::vector<Field> shown;
  std::ranges::copy_if(columns, std::back_inserter(shown), [&](const Field& column) { return isFilled(rows, column); });
  Row labels;
  for (const Field& column : shown) {
    labels.emplace_back(column.label);
  }
  std::vector<Row> lines{labels};
  for (const Value& row : rows) {
    lines.push_back(cells(row, shown));
  }
  return aligned(lines);
}

std::string facts(const Dictionary& entries, const std::vector<Field>& fields) {
  std::vector<Row> lines;
  for (const Field& field : fields) {
    if (const Value* const value = entries.find(field.key)) {
      lines.push_back({std::string(field.label), orDash(field.text(*value))});
    }
  }
  for (const auto& [key, value] : entries) {
    if (std::ranges::find(fields, key, &Field::key) == fields.end()) {
      lines.push_back({printable(key), orDash(plainText(value))});
    }
  }
  return aligned(lines);
}

} // namespace lumora::client
