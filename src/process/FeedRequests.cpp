#include "process/FeedRequests.h"

#include <limits>
#include <mutex>
#include <thread>

#include "desktop/gtfs/feeds/FeedCheck.h"
#include "desktop/gtfs/feeds/FeedMuid.h"
#include "process/AlertImages.h"
#include "process/FeedMessages.h"
#include "process/PictureOutput.h"
#include "process/RemoteHost.h"
#include "process/Snapshot.h"
#include "protocol/Coding.h"
#include "protocol/Methods.h"

namespace nimbo {

using nlohmann::json;

namespace {

/// Seconds for which the next request is waited for.
constexpr TimeInterval kLeisure = 60;

/// Bytes of lines in an answer, which may take four times as many as JSON.
constexpr std::size_t kMostLineBytes = JSONRPCConnection::kMaximumLine / 8;

const JSONRPCError kCancelled{JSONRPCError::kCancelled, "the request was cancelled"};

std::size_t sizeOf(const protocol::FeedLine& line) {
  constexpr std::size_t kKeysAndNumbers = 300;
  return kKeysAndNumbers + line.id.size() + line.routeID.size() + line.shortName.size() + line.longName.size() +
         line.agency.id.size() + 2 * line.name.value_or("").size() + line.agency.name.value_or("").size();
}

/// Null for an identifier of no form.
MapItemIdentifierRef identifierOf(const protocol::LineKey& key) {
  if (key.id.has_value() == key.muid.has_value()) return nullptr;
  if (key.muid) return std::make_shared<const MapItemIdentifier>(*key.muid);
  const std::size_t colon = key.id->find(':');
  if (colon == std::string::npos) return nullptr;
  TransitLineLocator locator{key.id->substr(0, colon), key.agencyID.value_or(""), key.id->substr(colon + 1),
                             key.shortName.value_or(""), static_cast<TransitMode>(key.mode.value_or(0))};
  const std::uint64_t muid = lineMuid(locator.feed, locator.routeID);
  return std::make_shared<const MapItemIdentifier>(muid, std::move(locator));
}

std::vector<protocol::FetchError> writtenErrors(const std::vector<ErrorRef>& errors) {
  std::vector<protocol::FetchError> written;
  written.reserve(errors.size());
  for (const ErrorRef& error : errors) written.push_back(fetchErrorOf(*error));
  return written;
}

}  // namespace

struct FeedRequests::Running {
  explicit Running(JSONRPCResponder to) : responder(std::move(to)) {}

  void reads(const std::string& feed, std::size_t feedsDone, std::size_t feedsToRead) {
    const std::lock_guard guard(lock);
    progress.feed = feed;
    progress.part = protocol::FeedPart::staticFeed;
    progress.received = 0;
    progress.length.reset();
    progress.done = feedsDone;
    progress.total = feedsToRead;
  }

  const JSONRPCResponder responder;
  /// Set by its thread: makes the answer on the main thread, unless the request has been cancelled by then.
  std::function<json()> conclude;
  std::mutex lock;
  protocol::ProgressParams progress;
  std::jthread thread;  // last: it ends before the rest goes
};

FeedRequests::FeedRequests(const GTFSTransitLineService& service, RunLoop& runLoop, JSONRPCConnection& connection,
                           int pictures)
    : _service(service),
      _library(service.library()),
      _catalog(_library),
      _runLoop(runLoop),
      _connection(connection),
      _pictures(pictures) {}

FeedRequests::~FeedRequests() {
  for (const auto& timer : {_second, _leisure})
    if (timer) timer->invalidate();
  for (const auto& [number, running] : _running) running->thread.request_stop();
  for (const auto& [number, running] : _running) running->responder.fail(kCancelled);
}

void FeedRequests::start(const JSONRPCResponder& responder, Work work) {
  if (_running.size() >= kMostRunning)
    throw JSONRPCFailure(JSONRPCError::kInvalidState,
                         std::to_string(kMostRunning) + " requests for feeds run already: wait for an answer");
  const std::uint64_t number = _nextNumber++;
  const auto running = std::make_shared<Running>(responder);
  running->thread = std::jthread([this, number, to = running.get(), work = std::move(work),
                                  alive = std::weak_ptr(_alive)](const std::stop_token& stop) {
    json result;
    std::optional<JSONRPCError> error;
    try {
      result = work(*to, stop);
    } catch (const JSONRPCFailure& failure) {
      error = failure.error;
    } catch (const std::exception& exception) {
      error = {JSONRPCError::kInternalError, exception.what()};
    }
    _runLoop.dispatchAsync([this, number, alive, result = std::move(result), error]() mutable {
      if (alive.expired()) return;
      const Running& ended = *_running.at(number);
      if (ended.thread.get_stop_token().stop_requested()) error = kCancelled;
      try {
        if (!error && ended.conclude) result = ended.conclude();
      } catch (const JSONRPCFailure& failure) {
        error = failure.error;
      }
      error ? ended.responder.fail(*error) : ended.responder.answer(result);
      finish(number);
    });
  });
  _running.emplace(number, running);
  if (_leisure) std::exchange(_leisure, nullptr)->invalidate();
  if (!_second) _second = _runLoop.scheduleTimer(1, true, [this](Timer&) { tellProgress(); });
}

void FeedRequests::finish(std::uint64_t number) {
  _running.erase(number);
  if (!_running.empty()) return;
  std::exchange(_second, nullptr)->invalidate();
  _leisure = _runLoop.scheduleTimer(kLeisure, false, [this](Timer&) {
    _leisure = nullptr;
    _catalog.forget();
  });
}

void FeedRequests::tellProgress() {
  const auto downloads = _library.downloads().underWay();
  for (const auto& [number, running] : _running) {
    protocol::ProgressParams progress;
    {
      const std::lock_guard guard(running->lock);
      progress = running->progress;
    }
    const auto& id = running->responder.id();
    if (progress.feed.empty() || !id || !(id->is_string() || id->is_number_integer())) continue;
    progress.request = id->is_string() ? protocol::RequestID(id->get<std::string>()) : id->get<std::int64_t>();
    for (const StaticFeedDownloads::Progress& download : downloads)
      if (download.feed == progress.feed && progress.part == protocol::FeedPart::staticFeed &&
          download.received >= progress.received) {
        progress.received = download.received;
        progress.length = download.length;
      }
    notify(_connection, protocol::kProgress, progress);
  }
}

void FeedRequests::cancel(const protocol::RequestID& request) {
  const json id = std::visit([](const auto& value) { return json(value); }, request);
  for (const auto& [number, running] : _running)
    if (running->responder.id() == id) {
      running->thread.request_stop();
      running->responder.fail(kCancelled);
    }
}

void FeedRequests::findLines(const protocol::FindLinesParams& params, const JSONRPCResponder& responder) {
  start(responder, [this, params](Running& running, const std::stop_token& stop) {
    const FeedCatalog::Query query{params.query, params.feed, params.offset,
                                   std::min(params.limit, protocol::FindLinesParams::kMostLines)};
    const auto found = _catalog.find(query, stop, [&](const std::string& feed, std::size_t done, std::size_t all) {
      running.reads(feed, done, all);
    });
    if (!found) return protocol::write(protocol::FoundLines{.failures = {fetchErrorOf(*found.error())}});
    protocol::FoundLines answer{.total = found->total, .failures = writtenErrors(found->errors)};
    std::size_t size = 0;
    for (const FeedCatalog::Line& line : found->lines) {
      protocol::FeedLine written = writtenLine(line);
      size += sizeOf(written);
      if (!answer.lines.empty() && size > kMostLineBytes) break;
      answer.lines.push_back(std::move(written));
    }
    return protocol::write(answer);
  });
}

void FeedRequests::describeLines(const protocol::DescribeLinesParams& params, const JSONRPCResponder& responder) {
  std::vector<MapItemIdentifierRef> identifiers;
  for (const protocol::LineKey& key : params.lines) {
    identifiers.push_back(identifierOf(key));
    if (!identifiers.back())
      throw JSONRPCFailure(JSONRPCError::kInvalidParams,
                           "parameter \"lines." + std::to_string(identifiers.size() - 1) +
                               "\" must have an \"id\" such as \"FEED:ROUTE_ID\", or else a \"muid\"");
  }
  start(responder, [this, identifiers](Running& running, const std::stop_token& stop) {
    const auto found = _catalog.describe(
        identifiers, stop,
        [&](const std::string& feed, std::size_t done, std::size_t all) { running.reads(feed, done, all); });
    protocol::DescribedLines answer;
    if (!found) {
      answer.lines.resize(identifiers.size());
      answer.failures = {fetchErrorOf(*found.error())};
      return protocol::write(answer);
    }
    for (const FeedCatalog::Description& description : found->lines)
      answer.lines.push_back(
          {description.line ? std::optional(writtenLine(*description.line)) : std::nullopt, description.isGone});
    answer.failures = writtenErrors(found->errors);
    return protocol::write(answer);
  });
}

void FeedRequests::checkFeed(const protocol::CheckFeedParams& params, const JSONRPCResponder& responder) {
  if (params.feed.has_value() == params.definition.has_value())
    throw JSONRPCFailure(JSONRPCError::kInvalidParams, "either \"feed\" or \"definition\" must be given");
  const auto feed = params.feed ? _library.configuration().feedNamed(*params.feed) : feedOf(*params.definition);
  if (!feed) throw JSONRPCFailure(JSONRPCError::kInvalidParams, feed.error()->reason());
  start(responder, [this, feed = *feed](Running& running, const std::stop_token& stop) {
    running.reads(feed.name, 0, 1);
    const FeedCheckProgress progress{.beginsAlerts =
                                         [&] {
                                           const std::lock_guard guard(running.lock);
                                           running.progress.part = protocol::FeedPart::alerts;
                                           running.progress.received = 0;
                                           running.progress.length.reset();
                                         },
                                     .receives =
                                         [&](std::uint64_t bytes, std::optional<std::uint64_t> length) {
                                           const std::lock_guard guard(running.lock);
                                           running.progress.received = bytes;
                                           running.progress.length = length;
                                         }};
    return protocol::write(writtenReport(nimbo::checkFeed(feed, _library.cache(), stop, progress)));
  });
}

void FeedRequests::image(const protocol::ImageParams& params, const JSONRPCResponder& responder) {
  if (_pictures < 0) throw JSONRPCFailure(JSONRPCError::kDrawingFailed, "there is no memory for images");
  const auto address = imageOfIncident(params.incident, _service);
  if (!address) throw JSONRPCFailure(JSONRPCError::kDrawingFailed, address.error()->reason());
  start(responder, [this, params, address = *address](Running& running, const std::stop_token& stop) {
    const auto image = fetchImage(address, params.width, stop);
    if (!image) throw JSONRPCFailure(JSONRPCError::kDrawingFailed, image.error()->reason());
    running.conclude = [this, params, image = *image] {
      if (const ErrorRef error = writePicture(*image, _pictures, params.offset.value_or(0),
                                              params.capacity.value_or(std::numeric_limits<std::uint64_t>::max())))
        throw JSONRPCFailure(JSONRPCError::kDrawingFailed, error->reason());
      return protocol::write(
          protocol::Rendered{image->pixelWidth(), image->pixelHeight(), image->stride(), image->scale()});
    };
    return json();
  });
}

}  // namespace nimbo
