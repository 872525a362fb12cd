#pragma once

#include <cstddef>
#include <functional>
#include <memory>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace nimbo {

/// Reads a table of comma-separated values with a header line, piece by piece, for the columns that are wanted.
/// Tolerates a byte order mark, CR LF, blanks around values, missing and unknown columns, short and long rows; header
/// names may differ in case. Source: https://gtfs.org/documentation/schedule/reference/#file-requirements
class CsvTable {
 public:
  /// A row's values, one for each wanted column, without blanks at their ends; empty where the row or the table has
  /// none. They live until the call returns.
  using RowHandler = std::function<void(std::span<const std::string_view> values)>;

  CsvTable(std::vector<std::string_view> columns, RowHandler handler);
  ~CsvTable();

  /// Takes the next piece. False once the table cannot be read: a field is longer than 1 MiB.
  bool read(std::string_view piece);
  /// Takes the end of the table. False as above.
  bool finish();

  /// Whether the header line, once read, has the wanted column of this index.
  bool hasColumn(std::size_t column) const;

 private:
  struct State;
  std::unique_ptr<State> _state;
};

}  // namespace nimbo
