#include "desktop/gtfs/static/CsvTable.h"

#include <cstdlib>
#include <optional>

#include "desktop/gtfs/text/Utf8.h"
#include "desktop/raii/CsvParser.h"

namespace nimbo {

namespace {

constexpr std::size_t kLongestField = 1 << 20;

void* growWithinLimit(void* buffer, std::size_t size) {
  return size > kLongestField ? nullptr : std::realloc(buffer, size);
}

}  // namespace

struct CsvTable::State {
  std::vector<std::string_view> columns;
  RowHandler handler;
  CsvParser parser;
  bool hasHeader = false;
  bool isFirstField = true;
  std::vector<std::optional<std::size_t>> columnOfField;  // field of the file -> wanted column
  std::vector<bool> present;
  std::string texts;               // the row's wanted values, one after the other
  std::vector<std::size_t> begin;  // of each wanted value in `texts`
  std::vector<std::size_t> length;
  std::vector<std::string_view> values;
  std::size_t field = 0;

  void takeField(std::string_view text) {
    if (isFirstField && text.starts_with("\xEF\xBB\xBF")) text.remove_prefix(3);
    isFirstField = false;
    text = trimmed(text);
    if (!hasHeader) {
      std::optional<std::size_t> column;
      const std::string name =
          asciiLowerCase(text.size() > 1 && text.front() == '"' ? text.substr(1, text.size() - 2) : text);
      for (std::size_t i = 0; i < columns.size() && !column; ++i)
        if (columns[i] == name && !present[i]) column = i;
      if (column) present[*column] = true;
      columnOfField.push_back(column);
    } else if (field < columnOfField.size() && columnOfField[field]) {
      const std::size_t column = *columnOfField[field];
      begin[column] = texts.size();
      length[column] = text.size();
      texts.append(text);
    }
    ++field;
  }

  void takeRowEnd() {
    if (hasHeader) {
      for (std::size_t i = 0; i < columns.size(); ++i) values[i] = std::string_view(texts).substr(begin[i], length[i]);
      handler(values);
    }
    hasHeader = true;
    texts.clear();
    begin.assign(columns.size(), 0);
    length.assign(columns.size(), 0);
    field = 0;
  }

  static void onField(void* text, std::size_t size, void* state) {
    static_cast<State*>(state)->takeField({static_cast<const char*>(text), size});
  }
  static void onRowEnd(int, void* state) { static_cast<State*>(state)->takeRowEnd(); }
};

CsvTable::CsvTable(std::vector<std::string_view> columns, RowHandler handler) : _state(std::make_unique<State>()) {
  _state->present.resize(columns.size());
  _state->begin.resize(columns.size());
  _state->length.resize(columns.size());
  _state->values.resize(columns.size());
  _state->columns = std::move(columns);
  _state->handler = std::move(handler);
  ::csv_set_realloc_func(_state->parser.get(), growWithinLimit);
}

CsvTable::~CsvTable() = default;

bool CsvTable::read(std::string_view piece) {
  return ::csv_parse(_state->parser.get(), piece.data(), piece.size(), State::onField, State::onRowEnd, _state.get()) ==
         piece.size();
}

bool CsvTable::finish() { return ::csv_fini(_state->parser.get(), State::onField, State::onRowEnd, _state.get()) == 0; }

bool CsvTable::hasColumn(std::size_t column) const { return _state->present[column]; }

}  // namespace nimbo
