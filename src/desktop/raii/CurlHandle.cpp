#include "desktop/raii/CurlHandle.h"

namespace nimbo {

const Curl& Curl::library() {
  static const Curl curl = [] {
    const LazyLibrary library(NIMBO_CURL_LIBRARY);
    return Curl{library["curl_global_init"],  library["curl_easy_init"],    library["curl_easy_setopt"],
                library["curl_easy_perform"], library["curl_easy_getinfo"], library["curl_easy_strerror"],
                library["curl_easy_cleanup"], library["curl_slist_append"], library["curl_slist_free_all"]};
  }();
  return curl;
}

}  // namespace nimbo
