#pragma once

#include <functional>
#include <map>
#include <memory>
#include <stop_token>

#include "desktop/gtfs/feeds/FeedCatalog.h"
#include "desktop/gtfs/feeds/GTFSTransitLineService.h"
#include "desktop/rpc/JSONRPCConnection.h"
#include "platform/RunLoop.h"
#include "protocol/Feeds.h"
#include "protocol/Messages.h"

namespace nimbo {

/// Answers what the host asks of feeds, each request on a thread of its own, since feeds may take as long as servers
/// do. What searches compare is kept for a minute after the last request. Of a request that runs for longer the host
/// hears every second how far it is. Main thread only.
class FeedRequests {
 public:
  /// The service, the loop and the connection outlive this. `pictures` is the host's memory for images; -1: none.
  FeedRequests(const GTFSTransitLineService& service, RunLoop& runLoop, JSONRPCConnection& connection, int pictures);
  /// Ends what still runs, with an error as its answer.
  ~FeedRequests();

  // Each throws JSONRPCFailure for parameters that do not fit, and when too much runs already.

  void findLines(const protocol::FindLinesParams& params, const JSONRPCResponder& responder);
  void describeLines(const protocol::DescribeLinesParams& params, const JSONRPCResponder& responder);
  void checkFeed(const protocol::CheckFeedParams& params, const JSONRPCResponder& responder);
  /// Fetches an image of an incident that the last lookup found, and puts it into the host's memory.
  void image(const protocol::ImageParams& params, const JSONRPCResponder& responder);
  /// Ends a request that still runs, with an error as its answer.
  void cancel(const protocol::RequestID& request);

  /// So many run at once at most.
  static constexpr std::size_t kMostRunning = 16;

 private:
  struct Running;
  /// What is done on the request's thread; answers the result, or throws.
  using Work = std::function<nlohmann::json(Running& running, const std::stop_token& stop)>;
  void start(const JSONRPCResponder& responder, Work work);
  void finish(std::uint64_t number);
  void tellProgress();

  const GTFSTransitLineService& _service;
  const FeedLibrary& _library;
  FeedCatalog _catalog;
  RunLoop& _runLoop;
  JSONRPCConnection& _connection;
  int _pictures;
  std::map<std::uint64_t, std::shared_ptr<Running>> _running;
  std::uint64_t _nextNumber = 0;
  std::shared_ptr<Timer> _second;   // while something runs
  std::shared_ptr<Timer> _leisure;  // until what is kept goes
  std::shared_ptr<bool> _alive = std::make_shared<bool>(true);
};

}  // namespace nimbo
