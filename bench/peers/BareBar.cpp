// The least that a program of a status bar holds: GLib's main loop and an SQLite database; with NIMBO_BARE_FETCH also
// one request through libcurl and one plural through ICU, as the process behind it. nimbo-bare-bar DATABASE ADDRESS;
// says "ready", and waits for the end of its input.

#include <glib.h>
#include <sqlite3.h>

#include <cstdio>

#ifdef NIMBO_BARE_FETCH
#include <curl/curl.h>
#include <unicode/plurrule.h>
#include <unicode/unistr.h>
#endif

int main(int argc, char** argv) {
  sqlite3* database = nullptr;
  if (argc != 3 || sqlite3_open(argv[1], &database) != SQLITE_OK ||
      sqlite3_exec(database, "SELECT count(*) FROM rows", nullptr, nullptr, nullptr) != SQLITE_OK)
    return 1;
#ifdef NIMBO_BARE_FETCH
  curl_global_init(CURL_GLOBAL_DEFAULT);
  CURL* handle = curl_easy_init();
  curl_easy_setopt(handle, CURLOPT_URL, argv[2]);
  curl_easy_setopt(
      handle, CURLOPT_WRITEFUNCTION, +[](char*, std::size_t size, std::size_t count, void*) { return size * count; });
  if (curl_easy_perform(handle) != CURLE_OK) return 1;
  curl_easy_cleanup(handle);
  UErrorCode status = U_ZERO_ERROR;
  const icu::PluralRules* rules = icu::PluralRules::forLocale("en", status);
  if (U_FAILURE(status) || rules->select(2).length() == 0) return 1;
  delete rules;
#endif
  GMainLoop* loop = g_main_loop_new(nullptr, FALSE);
  GIOChannel* input = g_io_channel_unix_new(0);
  g_io_add_watch(
      input, G_IO_HUP,
      [](GIOChannel*, GIOCondition, gpointer toQuit) -> gboolean {
        g_main_loop_quit(static_cast<GMainLoop*>(toQuit));
        return G_SOURCE_REMOVE;
      },
      loop);
  std::puts("ready");
  std::fflush(stdout);
  g_main_loop_run(loop);
}
