// The least that a program does which shows saved rows: opens a database, lays the rows out, draws them into shared
// memory. nimbo-bare-widget DATABASE PICTURE; says "drawn", and waits for the end of its input.

#include <fcntl.h>
#include <sqlite3.h>
#include <unistd.h>

#include <cstdio>

#include "peers/BareRows.h"

namespace {

std::string column(sqlite3_stmt* statement, int index) {
  const auto* text = reinterpret_cast<const char*>(sqlite3_column_text(statement, index));
  return text ? text : "";
}

bool readRows(const char* path, std::vector<BareRows::Row>& rows) {
  sqlite3* database = nullptr;
  sqlite3_stmt* statement = nullptr;
  if (sqlite3_open_v2(path, &database, SQLITE_OPEN_READWRITE, nullptr) != SQLITE_OK ||
      sqlite3_prepare_v2(database, "SELECT title, text, shield, color FROM rows ORDER BY rowid", -1, &statement,
                         nullptr) != SQLITE_OK)
    return false;
  while (sqlite3_step(statement) == SQLITE_ROW) {
    const int color = sqlite3_column_int(statement, 3);
    rows.push_back({column(statement, 0), column(statement, 1), column(statement, 2), (color >> 16) / 255.0,
                    (color >> 8 & 255) / 255.0, (color & 255) / 255.0});
  }
  sqlite3_finalize(statement);
  return !rows.empty();
}

}  // namespace

int main(int argc, char** argv) {
  std::vector<BareRows::Row> rows;
  if (argc != 3 || !readRows(argv[1], rows)) {
    std::fprintf(stderr, "usage: nimbo-bare-widget DATABASE PICTURE\n");
    return 2;
  }
  const BareRows bareRows(rows);
  cairo_surface_t* surface = bareRows.draw();
  cairo_surface_flush(surface);
  const auto size = static_cast<std::size_t>(cairo_image_surface_get_stride(surface)) *
                    static_cast<std::size_t>(cairo_image_surface_get_height(surface));
  const int file = open(argv[2], O_RDWR | O_CLOEXEC);
  if (file < 0 || ftruncate(file, static_cast<off_t>(size)) != 0 ||
      pwrite(file, cairo_image_surface_get_data(surface), size, 0) != static_cast<ssize_t>(size)) {
    std::perror("nimbo-bare-widget");
    return 1;
  }
  std::puts("drawn");
  std::fflush(stdout);
  while (std::getchar() != EOF) {
  }
}
