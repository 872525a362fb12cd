#pragma once

#include <curl/curl.h>

#include <memory>

#include "desktop/raii/LazyLibrary.h"

namespace nimbo {

/// libcurl, which is opened with the first fetch: with the forty libraries that it needs in turn it takes as long to
/// load as all the others together, before the first row could be drawn.
struct Curl {
  /// Opens libcurl with the first call. Throws std::runtime_error where there is none.
  static const Curl& library();

  decltype(&::curl_global_init) global_init;
  decltype(&::curl_easy_init) easy_init;
  decltype(&::curl_easy_setopt) easy_setopt;
  decltype(&::curl_easy_perform) easy_perform;
  decltype(&::curl_easy_getinfo) easy_getinfo;
  decltype(&::curl_easy_strerror) easy_strerror;
  decltype(&::curl_easy_cleanup) easy_cleanup;
  decltype(&::curl_slist_append) slist_append;
  decltype(&::curl_slist_free_all) slist_free_all;
};

struct CurlHandleCloser {
  void operator()(CURL* handle) const { Curl::library().easy_cleanup(handle); }
};
/// One transfer and its connections.
using CurlHandle = std::unique_ptr<CURL, CurlHandleCloser>;

struct CurlHeadersDeleter {
  void operator()(curl_slist* headers) const { Curl::library().slist_free_all(headers); }
};
/// Header lines of a request.
using CurlHeaders = std::unique_ptr<curl_slist, CurlHeadersDeleter>;

}  // namespace nimbo
