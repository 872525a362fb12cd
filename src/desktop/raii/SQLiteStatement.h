#pragma once

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

#include "platform/foundation/Boxed.h"

struct sqlite3_stmt;

namespace nimbo {

/// A statement in progress. Lives no longer than its connection; one thread at a time. Everything may throw
/// SQLiteFailure. Parameters count from 1, columns from 0.
class SQLiteStatement final {
 public:
  enum class ColumnType { null, integer, real, text, blob };

  /// Takes over the handle.
  explicit SQLiteStatement(sqlite3_stmt* statement) : _statement(statement) {}

  void bind(int parameter, std::int64_t value);
  /// The text is not copied: it outlives the last step.
  void bind(int parameter, std::string_view value);
  /// The bytes are not copied: they outlive the last step.
  void bind(int parameter, const Bytes& value);
  void bind(int parameter, std::nullopt_t);
  /// The value in a column of another statement's row, copied.
  void bindColumn(int parameter, const SQLiteStatement& row, int column);

  /// Moves to the next row; NO when there is none. A statement without rows is done after one step.
  bool step();
  /// Back to before the first row, the parameters kept.
  void reset();

  int columnCount() const;
  ColumnType type(int column) const;
  std::int64_t integer(int column) const;
  std::string text(int column) const;
  Bytes bytes(int column) const;

 private:
  struct Finalizer {
    void operator()(sqlite3_stmt* statement) const;
  };
  void check(int code) const;

  std::unique_ptr<sqlite3_stmt, Finalizer> _statement;
};

}  // namespace nimbo
