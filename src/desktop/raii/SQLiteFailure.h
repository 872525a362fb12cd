#pragma once

#include <stdexcept>
#include <string>

namespace nimbo {

/// Something that SQLite could not do. Thrown below the store, which turns it into an error value.
class SQLiteFailure final : public std::runtime_error {
 public:
  /// `code` is an SQLite result code, primary or extended. Source: https://www.sqlite.org/rescode.html
  SQLiteFailure(int code, const std::string& message) : std::runtime_error(message), _code(code & 0xff) {}

  /// The primary result code.
  int code() const { return _code; }
  /// Whether the file is damaged or never was a database.
  bool meansDamage() const;

 private:
  int _code;
};

}  // namespace nimbo
