#include "desktop/gtfs/net/CurlFetcher.h"

#include <algorithm>
#include <chrono>
#include <memory>
#include <new>

#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/net/GzipReader.h"
#include "desktop/gtfs/text/Utf8.h"
#include "desktop/raii/CurlHandle.h"
#include "platform/foundation/Version.h"

namespace nimbo {

namespace {

using Code = TransitLineServiceError;

constexpr int kMostRedirects = 5;
constexpr long kConnectSeconds = 15;
constexpr long kStalledSeconds = 30;  // a server that sends less than this for so long will not do better
constexpr long kStalledBytesASecond = 100;
constexpr std::size_t kLongestValidator = 1024;
constexpr long kBufferBytes = 64 * 1024;  // a quarter of the calls that the default takes

/// One fetch in progress.
struct Transfer {
  const HTTPRequest& request;
  const std::stop_token& stop;
  const HTTPFetcher::Sink& sink;
  CURL* handle;
  HTTPValidators validators;
  HTTPWishes wishes;
  std::string encoding;  // as the answer's header says, in lower case; may be empty
  // libcurl takes a packed answer without its end for a whole one.
  std::unique_ptr<GzipReader> packed;
  std::uint64_t received = 0;
  bool isTooLarge = false;
  bool isUnkept = false;

  bool hasDocument() const {
    long status = 0;
    curl_easy_getinfo(handle, CURLINFO_RESPONSE_CODE, &status);
    return status == 200;
  }

  bool isPlain() const { return encoding.empty() || encoding == "identity"; }
  bool isGzip() const { return encoding == "gzip" || encoding == "x-gzip"; }
  /// Whether a packed answer has come to its end, as far as it has.
  bool isCutOff() const { return isGzip() && (!packed || !packed->isWhole()); }

  std::size_t takePiece(std::string_view piece) {
    if (!hasDocument()) return piece.size();  // the page of a redirect or an error
    bool isTaken = false;
    if (received == 0 && isPlain()) tellLength();
    if (isPlain()) {
      isTaken = keep(piece);
    } else if (isGzip()) {
      if (!packed) packed = std::make_unique<GzipReader>();
      isTaken = packed->take(piece, [this](std::string_view unpacked) { return keep(unpacked); });
    }
    return isTaken ? piece.size() : 0;
  }

  void tellLength() const {
    curl_off_t length = -1;
    curl_easy_getinfo(handle, CURLINFO_CONTENT_LENGTH_DOWNLOAD_T, &length);
    if (length > 0 && request.onLength) request.onLength(static_cast<std::uint64_t>(length));
  }

  bool keep(std::string_view piece) {
    received += piece.size();
    isTooLarge = received > request.limit;
    isUnkept = !isTooLarge && !sink(piece);
    return !isTooLarge && !isUnkept;
  }

  void takeHeader(std::string_view line) {
    if (line.starts_with("HTTP/")) {  // those were of the answer before a redirect
      validators = {};
      wishes = {};
      encoding.clear();
    }
    const std::size_t colon = line.find(':');
    if (colon == std::string_view::npos) return;
    const std::string name = asciiLowerCase(line.substr(0, colon));
    const std::string_view value = trimmed(line.substr(colon + 1));
    if (value.size() > kLongestValidator || value.find('\0') != std::string_view::npos) return;
    if (name == "content-encoding")
      encoding = asciiLowerCase(value);
    else if (name == "etag")
      validators.etag = value;
    else if (name == "last-modified")
      validators.lastModified = value;
    else if (name == "cache-control")
      wishes.cacheControl.append(wishes.cacheControl.empty() ? "" : ",").append(value);
    else if (name == "age")
      wishes.age = value;
    else if (name == "retry-after")
      wishes.retryAfter = value;
  }

  static std::size_t onPiece(char* bytes, std::size_t size, std::size_t count, void* transfer) {
    return static_cast<Transfer*>(transfer)->takePiece({bytes, size * count});
  }
  static std::size_t onHeader(char* bytes, std::size_t size, std::size_t count, void* transfer) {
    static_cast<Transfer*>(transfer)->takeHeader({bytes, size * count});
    return size * count;
  }
  static int onProgress(void* transfer, curl_off_t, curl_off_t, curl_off_t, curl_off_t) {
    return static_cast<Transfer*>(transfer)->stop.stop_requested() ? 1 : 0;
  }
};

CurlHandle makeHandle() {
  static const bool isReady = curl_global_init(CURL_GLOBAL_DEFAULT) == CURLE_OK;
  CurlHandle handle(isReady ? curl_easy_init() : nullptr);
  if (!handle) throw std::bad_alloc();
  return handle;
}

/// Those of the key, if any, and what the request is.
CurlHeaders headersFor(const std::vector<std::string>& key, const HTTPValidators& validators) {
  CurlHeaders headers;
  const auto add = [&](const std::string& line) {
    curl_slist* longer = curl_slist_append(headers.get(), line.c_str());
    if (!longer) throw std::bad_alloc();
    (void)headers.release();
    headers.reset(longer);
  };
  add("Accept-Encoding: gzip");
  for (const std::string& line : key) add(line);
  if (!validators.etag.empty()) add("If-None-Match: " + validators.etag);
  if (!validators.lastModified.empty()) add("If-Modified-Since: " + validators.lastModified);
  return headers;
}

bool isEncrypted(const HTTPRequest& request) { return asciiLowerCase(request.address.text()).starts_with("https:"); }

/// A part of an address; empty where it has none.
std::string partOf(CURLU* address, CURLUPart part, unsigned flags = 0) {
  char* text = nullptr;
  if (curl_url_get(address, part, &text, flags) != CURLUE_OK) return {};
  const std::unique_ptr<char, void (*)(void*)> owned(text, curl_free);
  return text;
}

/// The address that a redirect leads to, with the user name and the password of the one before where it stays with that
/// server; `isSameServer` hears whether it does: scheme, host and port are the same.
std::string redirected(const std::string& from, const std::string& to, bool& isSameServer) {
  const CurlAddress before(curl_url()), after(curl_url());
  isSameServer = curl_url_set(before.get(), CURLUPART_URL, from.c_str(), 0) == CURLUE_OK &&
                 curl_url_set(after.get(), CURLUPART_URL, to.c_str(), 0) == CURLUE_OK;
  for (const CURLUPart part : {CURLUPART_SCHEME, CURLUPART_HOST, CURLUPART_PORT})
    isSameServer = isSameServer && asciiLowerCase(partOf(before.get(), part, CURLU_DEFAULT_PORT)) ==
                                       asciiLowerCase(partOf(after.get(), part, CURLU_DEFAULT_PORT));
  if (!isSameServer) return to;
  for (const CURLUPart part : {CURLUPART_USER, CURLUPART_PASSWORD})
    if (const std::string text = partOf(before.get(), part); !text.empty())
      curl_url_set(after.get(), part, text.c_str(), 0);
  return partOf(after.get(), CURLUPART_URL);
}

void setOptions(CURL* handle, Transfer& transfer) {
  const auto set = [&](CURLoption option, auto value) { curl_easy_setopt(handle, option, value); };
  // Whoever chose https is not led off it.
  set(CURLOPT_PROTOCOLS_STR, isEncrypted(transfer.request) ? "https" : "http,https");
  set(CURLOPT_USERAGENT, (std::string("nimbo-transit/") + kVersion).c_str());
  set(CURLOPT_CONNECTTIMEOUT, kConnectSeconds);
  set(CURLOPT_MAXFILESIZE_LARGE, static_cast<curl_off_t>(transfer.request.limit));
  set(CURLOPT_LOW_SPEED_TIME, kStalledSeconds);
  set(CURLOPT_LOW_SPEED_LIMIT, kStalledBytesASecond);
  set(CURLOPT_BUFFERSIZE, kBufferBytes);
  set(CURLOPT_NOSIGNAL, 1L);
  set(CURLOPT_QUICK_EXIT, 1L);  // a name being looked up must not hold up the end
  set(CURLOPT_WRITEFUNCTION, &Transfer::onPiece);
  set(CURLOPT_WRITEDATA, static_cast<void*>(&transfer));
  set(CURLOPT_HEADERFUNCTION, &Transfer::onHeader);
  set(CURLOPT_HEADERDATA, static_cast<void*>(&transfer));
  set(CURLOPT_NOPROGRESS, 0L);
  set(CURLOPT_XFERINFOFUNCTION, &Transfer::onProgress);
  set(CURLOPT_XFERINFODATA, static_cast<void*>(&transfer));
}

struct Failure {
  Code code;
  std::string what;
};

Failure cutOff() { return {Code::cutOff, "the connection broke before everything had come. Try again later."}; }

Failure failureOf(CURLcode result, const Transfer& transfer) {
  const std::string limit = std::to_string(transfer.request.limit >> 20) + " MiB";
  if (transfer.isTooLarge) return {Code::tooLarge, "it sends more than " + limit + ". Check the address."};
  if (transfer.packed && transfer.packed->isDamaged()) return cutOff();
  if (!transfer.isPlain() && !transfer.isGzip() && result == CURLE_WRITE_ERROR)
    return {Code::serverFailure, "its server packs it in a way that was not asked for. Check the address."};
  if (transfer.isUnkept) return {Code::notKept, "what it sends cannot be kept. Free some space on the disk."};
  switch (result) {
    case CURLE_COULDNT_RESOLVE_HOST:
    case CURLE_COULDNT_RESOLVE_PROXY:
      return {Code::unreachable, "its server's name is not known. Check the address and the network."};
    case CURLE_COULDNT_CONNECT:
      return {Code::unreachable, "its server refuses the connection. Check the address and the network."};
    case CURLE_OPERATION_TIMEDOUT:
      return {Code::timedOut, "its server took too long. Try again later."};
    case CURLE_PEER_FAILED_VERIFICATION:
    case CURLE_SSL_CONNECT_ERROR:
    case CURLE_SSL_CACERT_BADFILE:
      return {Code::untrustedServer,
              "its server's certificate cannot be trusted. Check the address and the date of "
              "this machine."};
    case CURLE_UNSUPPORTED_PROTOCOL:
    case CURLE_URL_MALFORMAT:
      if (isEncrypted(transfer.request))
        return {Code::badAddress,
                "it leads from https to an address that is not. Ask the publisher for the right one."};
      return {Code::badAddress, "it is no http or https address, or leads to one that is not. Check the address."};
    case CURLE_PARTIAL_FILE:
    case CURLE_GOT_NOTHING:
    case CURLE_RECV_ERROR:
    case CURLE_SEND_ERROR:
    case CURLE_HTTP2_STREAM:
      return cutOff();
    case CURLE_OUT_OF_MEMORY:  // which is also what libcurl calls a header of more than 100 KB
      return {Code::serverFailure, "its server sends a header that is too long. Check the address."};
    case CURLE_FILESIZE_EXCEEDED:
      return {Code::tooLarge, "it is larger than " + limit + ". Check the address."};
    case CURLE_ABORTED_BY_CALLBACK:
      return {Code::internal, "the program is ending."};
    default:
      return {Code::unreachable, std::string(curl_easy_strerror(result)) + ". Check the address and the network."};
  }
}

Failure failureOfStatus(long status) {
  const std::string answered = "its server answers with status " + std::to_string(status) + ". ";
  if (status == 401 || status == 403)
    return {Code::keyNeeded, answered + "The address may need a key from the publisher."};
  if (status == 404 || status == 410) return {Code::notFound, answered + "Check the address."};
  return {Code::serverFailure, answered + "Try again later."};
}

}  // namespace

Outcome<HTTPAnswer> fetchWithCurl(const HTTPRequest& request, const std::stop_token& stop,
                                  const HTTPFetcher::Sink& sink) {
  const CurlHandle handle = makeHandle();
  const bool isConditional = request.validators != HTTPValidators();
  Transfer transfer{request, stop, sink, handle.get(), {}, {}, {}, {}};
  setOptions(handle.get(), transfer);
  const auto failed = [&](const Failure& failure) {
    return transitLineServiceError(failure.code, "Cannot fetch " + request.address.publicText() + ": " + failure.what,
                                   request.address.publicText());
  };
  const auto isDue = std::chrono::steady_clock::now() + request.timeLimit;
  std::string address = request.address.textWithKey();
  CurlHeaders headers = headersFor(request.address.key().headers, request.validators);
  long status = 0;
  // By hand, since libcurl would take headers of keys along to any server.
  for (int redirects = 0;; ++redirects) {
    const auto left = std::chrono::ceil<std::chrono::milliseconds>(isDue - std::chrono::steady_clock::now());
    curl_easy_setopt(handle.get(), CURLOPT_TIMEOUT_MS, std::max<long>(left.count(), 1));
    curl_easy_setopt(handle.get(), CURLOPT_URL, address.c_str());
    curl_easy_setopt(handle.get(), CURLOPT_HTTPHEADER, headers.get());
    if (const CURLcode result = curl_easy_perform(handle.get()); result != CURLE_OK)
      return failed(failureOf(result, transfer));
    curl_easy_getinfo(handle.get(), CURLINFO_RESPONSE_CODE, &status);
    const char* next = nullptr;
    curl_easy_getinfo(handle.get(), CURLINFO_REDIRECT_URL, &next);
    if (!next) break;
    if (redirects == kMostRedirects)
      return failed(
          {Code::serverFailure, "its server redirects without end. Ask the publisher for the right address."});
    bool isSameServer = false;
    address = redirected(address, next, isSameServer);
    // Gone for good: another server may lead back to the first with an address of its own choice.
    if (!isSameServer) headers = headersFor({}, request.validators);
  }
  if (request.wishes) *request.wishes = std::move(transfer.wishes);
  if (status == 304 && isConditional) {
    // The server may leave out what has not changed.
    const auto orHeld = [](std::string& value, const std::string& held) {
      if (value.empty()) value = held;
    };
    orHeld(transfer.validators.etag, request.validators.etag);
    orHeld(transfer.validators.lastModified, request.validators.lastModified);
    return HTTPAnswer{true, std::move(transfer.validators)};
  }
  if (status != 200) return failed(failureOfStatus(status));
  if (transfer.isCutOff()) return failed(cutOff());
  return HTTPAnswer{false, std::move(transfer.validators)};
}

}  // namespace nimbo
