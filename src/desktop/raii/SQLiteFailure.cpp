#include "desktop/raii/SQLiteFailure.h"

#include <sqlite3.h>

namespace nimbo {

bool SQLiteFailure::meansDamage() const { return _code == SQLITE_CORRUPT || _code == SQLITE_NOTADB; }

}  // namespace nimbo
