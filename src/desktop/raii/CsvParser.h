#pragma once

#include <csv.h>

#include <new>

namespace nimbo {

/// Owns a libcsv parser, which keeps a quotation mark inside a field as it stands.
class CsvParser {
 public:
  CsvParser() {
    if (::csv_init(&_parser, 0) != 0) throw std::bad_alloc();
  }
  ~CsvParser() { ::csv_free(&_parser); }
  CsvParser(const CsvParser&) = delete;
  CsvParser& operator=(const CsvParser&) = delete;

  csv_parser* get() { return &_parser; }

 private:
  csv_parser _parser{};
};

}  // namespace nimbo
