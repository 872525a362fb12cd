#include <openssl/ssl.h>
#include <sched.h>
#include <sys/mount.h>
#include <sys/wait.h>
#include <unistd.h>

#include "desktop/gtfs/Fixtures.h"
#include "desktop/gtfs/Gzip.h"
#include "desktop/gtfs/LoopbackServer.h"
#include "desktop/gtfs/alerts/AlertsStore.h"
#include "desktop/gtfs/feeds/TransitLineServiceError.h"
#include "desktop/gtfs/net/HTTPFetcher.h"
#include "desktop/gtfs/net/ServerWishes.h"
#include "support/TestPlatform.h"

namespace nimbo {
namespace {

using Answer = LoopbackServer::Answer;
using Code = TransitLineServiceError;

TEST(HTTPFetcher, SaysWhatWentWrong) {
  const std::string big(5000, 'x');
  const std::tuple<const char*, Answer, Code, const char*> cases[] = {
      {"key", {LoopbackServer::answer("403 Forbidden", "")}, Code::keyNeeded, "key from the publisher"},
      {"server error", {LoopbackServer::answer("503 Busy", "")}, Code::serverFailure, "status 503. Try again later"},
      {"unchanged what is not held", {LoopbackServer::answer("304 Not Modified", "")}, Code::serverFailure, "304"},
      {"redirect loop", {LoopbackServer::answer("302 Found\r\nLocation: /", "")}, Code::serverFailure, "redirects"},
      {"redirect to a file",
       {LoopbackServer::answer("302 Found\r\nLocation: file:///etc/passwd", "")},
       Code::badAddress,
       "leads to one that is not"},
      {"cut off", {"HTTP/1.1 200 OK\r\nContent-Length: 99\r\n\r\nshort"}, Code::cutOff, "broke"},
      {"announced too large", {LoopbackServer::answer("200 OK", big)}, Code::tooLarge, "larger than"},
      {"long header",
       {"HTTP/1.1 200 OK\r\nX: " + std::string(200'000, 'x')},
       Code::serverFailure,
       "header that is too long"},
      {"endless", {"HTTP/1.1 200 OK\r\n\r\n" + big, true}, Code::tooLarge, "sends more than"},
      {"unpacked too large",
       {LoopbackServer::answer("200 OK\r\nContent-Encoding: gzip", gzip(std::string(5'000'000, '\0')).substr(0, 3999))},
       Code::tooLarge,
       "sends more than"},
  };
  for (const auto& [what, answer, code, reason] : cases) {
    const LoopbackServer server([&answer = answer](const std::string&) { return answer; });
    const auto address = *FeedAddress::parse(server.address("/?key=secret"));
    const auto outcome =
        HTTPFetcher::fetch({address, {}, 4000, std::chrono::seconds(20)}, {}, [](auto) { return true; });
    ASSERT_FALSE(outcome) << what;
    EXPECT_EQ(outcome.error()->code(), static_cast<std::int64_t>(code)) << what << outcome.error()->reason();
    EXPECT_NE(outcome.error()->reason().find(reason), std::string::npos) << what << outcome.error()->reason();
    EXPECT_NE(outcome.error()->reason().find(server.address("/?...")), std::string::npos) << what;
    EXPECT_EQ(outcome.error()->subject(), server.address("/?...")) << what;
  }
}

TEST(HTTPFetcher, GivesUpOnServersThatDoNotAnswer) {
  std::mutex lock;
  lock.lock();
  auto server = std::make_unique<LoopbackServer>([&](const std::string&) {
    const std::lock_guard untilTheEnd(lock);
    return Answer{};
  });
  const std::string address = server->address();
  const auto codeOf = [&](const std::string& text, const std::stop_token& stop = {}) {
    const HTTPRequest request{*FeedAddress::parse(text), {}, 1000, std::chrono::seconds(1)};
    return static_cast<Code>(HTTPFetcher::fetch(request, stop, [](auto) { return true; }).error()->code());
  };
  EXPECT_EQ(codeOf(address), Code::timedOut);
  std::stop_source stopped;
  stopped.request_stop();
  EXPECT_EQ(codeOf(address, stopped.get_token()), Code::internal);
  lock.unlock();
  server.reset();
  EXPECT_EQ(codeOf(address), Code::unreachable);
  const LoopbackServer plain([](const std::string&) { return Answer{"no TLS"}; });
  EXPECT_EQ(codeOf("https" + plain.address().substr(4)), Code::untrustedServer);
  for (const char* begin : {"HTTP/1.1 200 OK\r\nX: ", "HTTP/1.1 200 OK\r\n\r\n"}) {
    const LoopbackServer slow([&](const std::string&) { return Answer{begin, true, true}; });
    EXPECT_EQ(codeOf(slow.address()), Code::timedOut) << begin;
  }
}

/// What a server with a certificate of its own making speaks over TLS.
class OwnCertificate {
 public:
  OwnCertificate() {
    const std::string make =
        "openssl req -x509 -newkey ec -pkeyopt ec_paramgen_curve:P-256 -nodes -subj /CN=127.0.0.1"
        " -addext subjectAltName=IP:127.0.0.1 -keyout - >" +
        path().native();
    EXPECT_EQ(std::system((make + " 2>/dev/null").c_str()), 0);
    SSL_CTX_use_certificate_file(_context.get(), path().c_str(), SSL_FILETYPE_PEM);
    SSL_CTX_use_PrivateKey_file(_context.get(), path().c_str(), SSL_FILETYPE_PEM);
  }

  void answer(int connection, const std::string& answer) const {
    const std::unique_ptr<SSL, decltype(&SSL_free)> tls(SSL_new(_context.get()), SSL_free);
    SSL_set_fd(tls.get(), connection);
    char request[4096];
    if (SSL_accept(tls.get()) != 1 || SSL_read(tls.get(), request, sizeof request) <= 0) return;
    SSL_write(tls.get(), answer.data(), static_cast<int>(answer.size()));
  }
  std::filesystem::path path() const { return _folder.path() / "certificate.pem"; }

 private:
  TemporaryFolder _folder;
  std::unique_ptr<SSL_CTX, decltype(&SSL_CTX_free)> _context{SSL_CTX_new(TLS_server_method()), SSL_CTX_free};
};

/// What comes of an answer over TLS.
Outcome<HTTPAnswer> fetchOverTLS(const OwnCertificate& certificate, const std::string& answer) {
  LoopbackServer server([](const std::string&) { return Answer{}; });
  server.speakTLS([&](int connection) { certificate.answer(connection, answer); });
  return HTTPFetcher::fetch(
      {*FeedAddress::parse("https" + server.address().substr(4)), {}, 10, std::chrono::seconds(20)}, {},
      [](auto) { return true; });
}

constexpr const char* kSystemCertificates = "/etc/ssl/certs/ca-certificates.crt";

/// Whether this process now has files of the system of its own, and these certificates are the ones that it trusts.
bool trustIn(const std::filesystem::path& certificates) {
  return ::unshare(CLONE_NEWUSER | CLONE_NEWNS) == 0 &&
         ::mount(certificates.c_str(), kSystemCertificates, nullptr, MS_BIND, nullptr) == 0;
}

TEST(HTTPFetcher, IsNotLedOffHTTPS) {
  constexpr int kNotPossible = 2;
  const OwnCertificate certificate;
  const pid_t process = ::fork();
  if (process == 0) {
    if (!trustIn(certificate.path())) ::_exit(kNotPossible);
    const LoopbackServer plain([](const std::string&) { return Answer{LoopbackServer::answer("200 OK", "plain")}; });
    const auto stayed = fetchOverTLS(certificate, LoopbackServer::answer("200 OK", "there"));
    const auto led =
        fetchOverTLS(certificate, LoopbackServer::answer("302 Found\r\nLocation: " + plain.address(), "moved"));
    ::_exit(stayed && !led && led.error()->code() == static_cast<int>(Code::badAddress) && plain.requests().empty()
                ? EXIT_SUCCESS
                : EXIT_FAILURE);
  }
  int status = 0;
  ::waitpid(process, &status, 0);
  if (WEXITSTATUS(status) == kNotPossible)
    GTEST_SKIP() << "no name space of one's own in which a certificate could be trusted";
  EXPECT_EQ(status, EXIT_SUCCESS);
}

TEST(HTTPFetcher, TrustsNoCertificateThatNobodyVouchesFor) {
  const auto outcome = fetchOverTLS(OwnCertificate(), LoopbackServer::answer("200 OK", "believed"));
  ASSERT_FALSE(outcome);
  EXPECT_EQ(outcome.error()->code(), static_cast<std::int64_t>(Code::untrustedServer)) << outcome.error()->reason();
  EXPECT_NE(outcome.error()->reason().find("certificate cannot be trusted"), std::string::npos);
}

/// An alerts feed on a server whose answer the test sets, read by a store with a cache of the test's own.
class AlertsStoreTest : public testing::Test {
 protected:
  AlertsStoreTest() { platform.time.setNow(dateFromUnixTime(kNow)); }

  /// Titles and time of the alerts, or the error's code.
  std::string load() {
    const auto alerts = store.load(feed, state, true, {});
    if (!alerts) return "error " + std::to_string(alerts.error()->code());
    return std::to_string((*alerts)->alerts().size()) + " alerts of " +
           std::to_string(static_cast<long>(intervalBetween(dateFromUnixTime(kNow), *(*alerts)->timestamp())));
  }
  static std::string error(Code code) { return "error " + std::to_string(static_cast<int>(code)); }
  static Answer good(int alerts, long made, const std::string& head = "200 OK") {
    std::string entities;
    for (int i = 0; i < alerts; ++i) entities += alert(std::to_string(i), "T", "");
    return {
        LoopbackServer::answer(head, feedBytes(entities, static_cast<std::uint64_t>(static_cast<long>(kNow) + made)))};
  }

  TestPlatform platform;
  TemporaryFolder folder;
  Answer answer;
  LoopbackServer server{[this](const std::string&) { return answer; }};
  Feed feed{"city", *FeedAddress::parse("/none"), *FeedAddress::parse(server.address())};
  AlertsStore store{FeedCache(folder.path() / "cache")};
  AlertsState state;
};

TEST_F(AlertsStoreTest, AsksConditionallyAndTakesPackedAnswers) {
  const std::string body = feedBytes(alert("a", "T", ""));
  answer.bytes = LoopbackServer::answer(
      "200 OK\r\nETag: \"v1\"\r\nLast-Modified: Sun, 15 Jun 2025 15:06:40 GMT\r\nContent-Encoding: gzip", gzip(body));
  EXPECT_EQ(load(), "1 alerts of 0");
  answer.bytes = LoopbackServer::answer("304 Not Modified", "");
  EXPECT_EQ(load(), "1 alerts of 0");
  EXPECT_EQ(load(), "1 alerts of 0");
  const auto requests = server.requests();
  EXPECT_NE(requests.at(0).find("User-Agent: nimbo-transit/"), std::string::npos);
  EXPECT_EQ(requests.at(0).find("If-"), std::string::npos);
  for (const char* line : {"If-None-Match: \"v1\"\r\n", "If-Modified-Since: Sun, 15 Jun 2025 15:06:40 GMT\r\n",
                           "Accept-Encoding: gzip\r\n"})
    EXPECT_NE(requests.at(2).find(line), std::string::npos) << line;
}

TEST_F(AlertsStoreTest, LetsTheLastAnswerStandInForAQuarterOfAnHour) {
  answer = good(2, -60);
  EXPECT_EQ(load(), "2 alerts of -60");
  const std::string one = LoopbackServer::answer("200 OK", feedBytes(alert("1", "T", ""), kNow));
  std::string hundredThousand = feedBytes("");
  for (int i = 0; i <= 100'000; ++i) hundredThousand += std::string_view("\x12\0", 2);
  const std::pair<Answer, Code> failures[] = {
      {{LoopbackServer::answer("500 Oops", "")}, Code::serverFailure},
      {{LoopbackServer::answer("200 OK", "<html>maintenance</html>")}, Code::webPage},
      {{LoopbackServer::answer("200 OK", "")}, Code::badAlerts},
      {{one.substr(0, one.size() - 1)}, Code::cutOff},
      {{"HTTP/1.1 200 OK\r\nContent-Length: 20\r\n\r\n" + feedBytes(alert("1", "T", ""))}, Code::badAlerts},
      {{LoopbackServer::answer("200 OK\r\nContent-Encoding: gzip", gzip(std::string(70'000'000, '\0')))},
       Code::tooLarge},
      {{"HTTP/1.1 200 OK\r\n\r\n" + std::string(1 << 20, '\0'), true}, Code::tooLarge},
      {{LoopbackServer::answer("200 OK", hundredThousand)}, Code::tooLarge},
      {good(1, -1200), Code::staleAlerts},
  };
  const AlertsStore other(FeedCache(folder.path() / "empty"));
  for (const auto& [failure, codeWithoutOneHeld] : failures) {
    answer = failure;
    EXPECT_EQ(load(), "2 alerts of -60") << answer.bytes.substr(0, 80);
    AlertsState none;
    const auto alone = other.load(feed, none, true, {});
    ASSERT_FALSE(alone) << answer.bytes.substr(0, 80);
    EXPECT_EQ(alone.error()->code(), static_cast<int>(codeWithoutOneHeld)) << alone.error()->reason();
  }
  answer = good(1, -120);  // older than what is held
  EXPECT_EQ(load(), "2 alerts of -60");
  platform.time.advance(14 * 60 - 1);
  EXPECT_EQ(load(), "2 alerts of -60");
  platform.time.advance(60);  // now the publisher's time is more than 15 minutes ago
  answer = failures[0].first;
  EXPECT_EQ(load(), error(Code::serverFailure));
  platform.time.advance(-86400);  // a clock that was wrong by a day tells no age
  EXPECT_EQ(load(), error(Code::serverFailure));
}

TEST_F(AlertsStoreTest, JudgesAgeByThePublishersOwnTime) {
  for (const int made : {-1200, 1200}) {
    answer = good(0, made);
    feed.maximumAlertsAge = kDefaultMaximumAlertsAge;
    EXPECT_EQ(load(), error(Code::staleAlerts));
    feed.maximumAlertsAge = std::chrono::minutes(60);
    EXPECT_EQ(load(), "0 alerts of " + std::to_string(made));
  }
  platform.time.advance(1200);
  feed.maximumAlertsAge = kDefaultMaximumAlertsAge;
  answer = good(0, 1260, "200 OK\r\nETag: \"a\"");
  EXPECT_EQ(load(), "0 alerts of 1260");
  platform.time.advance(20 * 60);
  answer.bytes = LoopbackServer::answer("304 Not Modified", "");  // unchanged, which makes it no younger
  EXPECT_EQ(load(), error(Code::staleAlerts));
}

TEST_F(AlertsStoreTest, GivesNothingThatIsHeldAndWritesWhatChangedEveryTenMinutes) {
  feed.maximumAlertsAge = std::chrono::minutes(60);
  const auto file = FeedCache(folder.path() / "cache").alerts("city");
  std::size_t hash = 0;  // of the file's bytes
  const auto outcome = [&](bool needsFeed) {
    const auto alerts = store.load(feed, state, needsFeed, {});
    if (!alerts) return "error " + std::to_string(alerts.error()->code());
    const std::size_t before = std::exchange(hash, std::hash<std::string>()(*readFile(file, 1 << 20)));
    return std::string(*alerts ? "feed" : "same") + (hash == before ? "" : ", written") +
           (fileChangeDate(file) == platform.time.now() ? ", confirmed" : "");
  };
  const std::string notModified = LoopbackServer::answer("304 Not Modified", "");
  const Answer first = good(1, 0, "200 OK\r\nETag: \"a\""), second = good(2, 0, "200 OK\r\nETag: \"b\"");
  const struct {
    int seconds;  // since the step before
    Answer answer;
    bool needsFeed;
    std::string outcome;
  } steps[] = {
      {0, first, false, "feed, written, confirmed"},
      {60, {notModified}, false, "same, confirmed"},
      {60, first, false, "same, confirmed"},
      {60, second, false, "feed"},
      {60, {notModified}, false, "same"},
      {60, second, true, "feed"},  // the body is wanted, and not in the cache
      {240, good(1, 0), false, "feed"},
      {60, second, false, "feed, written, confirmed"},
      {60, {notModified}, true, "feed, confirmed"},
      {60, {LoopbackServer::answer("500 Oops", "")}, false, "same"},
      {0, {LoopbackServer::answer("500 Oops", "")}, true, "feed"},
      {60, good(1, -60), false, "same"},  // the publisher went back: the last answer stands in
  };
  for (const auto& step : steps) {
    SCOPED_TRACE(&step - steps);
    platform.time.advance(step.seconds);
    answer = step.answer;
    EXPECT_EQ(outcome(step.needsFeed), step.outcome);
  }
  std::ofstream(file, std::ios::app) << " ";  // another process has something else to keep
  const auto date = fileChangeDate(file);
  answer.bytes = notModified;
  EXPECT_EQ(outcome(false), "same, written");
  EXPECT_EQ(fileChangeDate(file), date);
  feed.alerts = *FeedAddress::parse(server.address("/other"));
  EXPECT_EQ(outcome(false), error(Code::serverFailure)) << "what is held is of another address";
}

TEST_F(AlertsStoreTest, SharesAnswersAndObeysServers) {
  const auto cache = FeedCache(folder.path() / "cache");
  const auto mine = std::make_shared<CacheUsers>(cache.folder()), others = std::make_shared<CacheUsers>(cache.folder());
  const AlertsStore other(cache, others);
  store = AlertsStore(cache, mine);
  AlertsState otherState;
  constexpr TimeInterval kAlways = -1;  // however young an answer is
  const auto loadBy = [&](const AlertsStore& by, AlertsState& known, TimeInterval age) {
    const std::size_t before = server.requests().size();
    const Date notBefore = age == kAlways ? AlertsStore::kNow : dateByAdding(platform.time.now(), -age);
    const auto alerts = by.load(feed, known, false, {}, notBefore);
    return (alerts ? *alerts ? std::to_string((*alerts)->alerts().size()) + " alerts" : std::string("same")
                   : "error " + std::to_string(alerts.error()->code())) +
           (server.requests().size() == before ? "" : ", asked");
  };
  const auto first = [&](TimeInterval age) { return loadBy(store, state, age); };
  const auto second = [&](TimeInterval age) { return loadBy(other, otherState, age); };
  answer = good(1, 0);
  EXPECT_EQ(first(30), "1 alerts, asked");
  platform.time.advance(30);
  EXPECT_EQ(second(30), "1 alerts");
  EXPECT_EQ(otherState.fetchedAt, state.fetchedAt);
  EXPECT_EQ(first(30), "same");
  EXPECT_EQ(second(kAlways), "same, asked") << "the user wants to know";
  EXPECT_EQ(first(0), "same") << "what another process has just heard";
  platform.time.advance(31);
  answer = good(2, 0);
  EXPECT_EQ(second(30), "2 alerts, asked");
  EXPECT_EQ(first(30), "2 alerts");
  platform.time.advance(31);
  answer = good(3, 60);
  EXPECT_EQ(first(30), "3 alerts, asked");
  EXPECT_EQ(second(30), "3 alerts") << "written before ten minutes are over, since there is another process";
  std::ofstream(cache.alerts("city"), std::ios::app) << "x";
  EXPECT_FALSE(setFileChangeDate(cache.alerts("city"), platform.time.now()));
  AlertsState none;
  EXPECT_EQ(loadBy(other, none, 30), "3 alerts, asked") << "the file is damaged";
  platform.time.advance(31);
  answer = good(3, 60, "200 OK\r\nCache-Control: max-age=100");
  EXPECT_EQ(first(30), "same, asked");
  platform.time.advance(99);
  EXPECT_EQ(second(30), "same");
  EXPECT_EQ(second(kAlways), "same, asked");
  platform.time.advance(100);
  answer = {LoopbackServer::answer("503 Busy\r\nRetry-After: 600", "")};
  EXPECT_EQ(first(30), "same, asked") << "the last one stands in";
  for (const TimeInterval age : {30.0, kAlways}) EXPECT_EQ(second(age), "same");
  platform.time.advance(599);
  EXPECT_EQ(second(kAlways), "same");
  none = {};
  feed.alerts = *FeedAddress::parse(server.address("/other"));
  answer = {LoopbackServer::answer("503 Busy\r\nRetry-After: 600", "")};
  EXPECT_EQ(loadBy(store, none, 30), error(Code::serverFailure) + ", asked");
  EXPECT_EQ(loadBy(store, none, 30), error(Code::serverFailure)) << "each server is another one";
  feed.alerts = *FeedAddress::parse(server.address());
  platform.time.advance(1);
  answer = good(1, 700);
  EXPECT_EQ(second(kAlways), "1 alerts, asked");
  platform.time.setNow(dateByAdding(platform.time.now(), -3600));  // by a clock that was set back all this is to come
  answer = good(2, -3000);
  EXPECT_EQ(first(30), "2 alerts, asked");
  feed.maximumAlertsAge = std::chrono::minutes(1);
  answer = good(1, -3000);
  state = otherState = {};
  EXPECT_EQ(first(30), error(Code::staleAlerts) + ", asked");
  EXPECT_EQ(second(30), error(Code::staleAlerts) + ", asked") << "what is too old is asked for again";
}

TEST(ServerWishes, AreBounded) {
  for (const auto& [control, age, seconds] : std::initializer_list<std::tuple<const char*, const char*, int>>{
           {"max-age=60", "", 60},
           {"public,MAX-AGE=\"60\" , s-maxage=9", "20", 40},
           {"max-age=60", "61", 0},
           {"max-age=60, no-cache", "", 0},
           {"no-store", "", 0},
           {"max-age=-1", "", 0},
           {"max-age=99999999999999999999", "x", 300},
           {"max-age=60x", "", 0}})
    EXPECT_EQ(freshnessOf({control, age, {}}), seconds) << control;
  const Date now = dateFromUnixTime(kNow);
  for (const auto& [text, seconds] :
       std::initializer_list<std::pair<const char*, int>>{{"120", 120},
                                                          {"-5", 0},
                                                          {"soon", 0},
                                                          {"999999999999999", 1800},
                                                          {"Sun, 15 Jun 2025 15:16:40 GMT", 600},
                                                          {"Sun, 15 Jun 2025 15:06:39 GMT", 0},
                                                          {"Thu, 31 Dec 2099 00:00:00 GMT", 1800}})
    EXPECT_EQ(intervalBetween(now, retryDateOf({{}, {}, text}, now).value_or(now)), seconds) << text;
}

TEST_F(AlertsStoreTest, DoesWithoutADamagedCache) {
  answer = good(2, 0, "200 OK\r\nETag: \"a\"");
  EXPECT_EQ(load(), "2 alerts of 0");
  const auto file = FeedCache(folder.path() / "cache").alerts("city");
  const std::string bytes = *readFile(file, 1 << 20);
  std::string older = bytes;
  older.replace(0, 14, "nimbo-alerts 2");
  for (const std::string& damaged : {bytes.substr(0, bytes.size() - 1), std::string("?"), bytes + "x", older}) {
    std::ofstream(file, std::ios::binary) << damaged;
    state = {};
    EXPECT_EQ(load(), "2 alerts of 0");
    EXPECT_EQ(server.requests().back().find("If-None-Match"), std::string::npos);
  }
  if (::geteuid() == 0) {
    EXPECT_EQ(::chown(file.c_str(), 1, 1), 0);
    state = {};
    EXPECT_EQ(load(), "2 alerts of 0");
    EXPECT_EQ(server.requests().back().find("If-None-Match"), std::string::npos) << "another user's";
  }
  feed.alerts = *FeedAddress::parse(folder.write("alerts.pb", feedBytes("", kNow - 3600)).native());
  EXPECT_EQ(load(), "0 alerts of -3600");
  std::filesystem::remove(feed.alerts.path());
  EXPECT_EQ(load(), error(Code::unreadableFile));
}

}  // namespace
}  // namespace nimbo
