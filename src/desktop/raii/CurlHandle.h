#pragma once

#include <curl/curl.h>

#include <memory>

namespace nimbo {

struct CurlHandleCloser {
  void operator()(CURL* handle) const { ::curl_easy_cleanup(handle); }
};
/// One transfer and its connections.
using CurlHandle = std::unique_ptr<CURL, CurlHandleCloser>;

struct CurlHeadersDeleter {
  void operator()(curl_slist* headers) const { ::curl_slist_free_all(headers); }
};
/// Header lines of a request.
using CurlHeaders = std::unique_ptr<curl_slist, CurlHeadersDeleter>;

struct CurlAddressDeleter {
  void operator()(CURLU* address) const { curl_url_cleanup(address); }
};
using CurlAddress = std::unique_ptr<CURLU, CurlAddressDeleter>;

}  // namespace nimbo
