#include "host/window/OpenRequest.h"

#include <glib.h>

#include <charconv>

#include "desktop/rpc/Base64.h"
#include "host/FeedAnswers.h"
#include "platform/Localization.h"
#include "platform/SystemServices.h"
#include "platform/foundation/Log.h"
#include "platform/transit/BasicTransitLineItem.h"
#include "platform/transit/TransitIncident.h"

namespace nimbo {

namespace {

constexpr std::string_view kOpenErrorDomain = "org.nimbo.Open";
constexpr std::string_view kActivityHost = "activity", kLineHost = "line", kIncidentHost = "incident",
                           kPlannedHost = "planned";

ErrorRef refusal(std::string_view key, const std::string& detail) {
  return Error::errorWithDomain_code_reason(std::string(kOpenErrorDomain), 0,
                                            LocalizedFormat(LocalizedString(key), {detail}));
}

ErrorRef badPayload(const std::string& why) {
  writeLog({kDefaultLogSubsystem, "Open"}, LogLevel::error, "What was handed over cannot be shown: %{private}@", {why});
  return refusal("Window_Open_BadPayload", {});
}

struct URLParts {
  std::string scheme;
  std::string host;
  std::map<std::string, std::string, std::less<>> query;
};

std::optional<URLParts> partsOf(const std::string& url) {
  char *scheme = nullptr, *host = nullptr, *query = nullptr;
  if (!g_uri_split(url.c_str(), G_URI_FLAGS_ENCODED_QUERY, &scheme, nullptr, &host, nullptr, nullptr, &query, nullptr,
                   nullptr))
    return std::nullopt;
  URLParts parts{scheme ? scheme : "", host ? host : "", {}};
  GUriParamsIter entries;
  g_uri_params_iter_init(&entries, query ? query : "", -1, "&", G_URI_PARAMS_NONE);
  char *name = nullptr, *value = nullptr;
  while (g_uri_params_iter_next(&entries, &name, &value, nullptr)) {
    parts.query.emplace(name, value);
    g_free(name);
    g_free(value);
  }
  for (char* part : {scheme, host, query}) g_free(part);
  return parts;
}

Outcome<OpenRequest> requestOfActivityURL(const URLParts& parts) {
  std::string type;
  std::map<std::string, Bytes, std::less<>> userInfo;
  for (const auto& [key, text] : parts.query) {
    if (key == "type") {
      type = text;
    } else if (auto bytes = bytesFromBase64(text)) {
      userInfo.emplace(key, std::move(*bytes));
    }
  }
  return openRequestOfActivity(type, userInfo);
}

std::string_view payloadKey(bool isLine) {
  return isLine ? kNimboTransitWidgetIncidentActivityUserInfoKey
                : kNimboTransitWidgetIncidentSummaryActivityUserInfoKey;
}

TransitIncidents incidentsOf(const std::vector<protocol::Incident>& incidents) {
  TransitIncidents result;
  for (const protocol::Incident& incident : incidents) {
    TransitIncidentFields fields{.muid = incident.muid,
                                 .title = incident.title,
                                 .summary = incident.summary,
                                 .fullDescription = incident.fullDescription,
                                 .startDate = incident.startDate,
                                 .endDate = incident.endDate,
                                 .lastUpdated = incident.lastUpdated,
                                 .isBlockingIncident = incident.isBlocking,
                                 .linkURL = incident.linkURL};
    for (const std::uint64_t line : incident.affectedLines)
      fields.affectedEntities.push_back(std::make_shared<const BasicAffectedEntity>(line));
    result.push_back(std::make_shared<const BasicTransitIncident>(std::move(fields)));
  }
  return result;
}

TransitLineItemRef lineItemOf(const protocol::Line& line) {
  BasicTransitLineItem::Fields fields;
  fields.identifier = std::make_shared<const MapItemIdentifier>(line.muid);
  fields.name = line.name;
  if (line.system)
    fields.system = std::make_shared<const TransitSystem>(0, line.system->name, artworkOf(line.system->artwork));
  fields.artwork = artworkOf(line.artwork);
  fields.alternateArtwork = artworkOf(line.alternateArtwork);
  fields.incidents = incidentsOf(line.incidents);
  return std::make_shared<const BasicTransitLineItem>(std::move(fields));
}

}  // namespace

Outcome<OpenRequest> openRequestOfURL(std::string_view text) {
  const std::string url(text);
  const auto parts = partsOf(url);
  if (!parts || parts->scheme != kHostApplicationURLScheme) return refusal("Window_Open_BadURL", url);
  if (parts->host == kActivityHost) return requestOfActivityURL(*parts);
  const auto id = parts->query.find("id");
  if (id != parts->query.end() && parts->host == kLineHost) return OpenRequest(ShowFavoriteLine{id->second});
  if (id != parts->query.end() && parts->host == kIncidentHost) {
    std::uint64_t number = 0;
    const char* end = id->second.data() + id->second.size();
    if (const auto [stop, error] = std::from_chars(id->second.data(), end, number); error == std::errc() && stop == end)
      return OpenRequest(ShowIncident{number});
  }
  if (parts->host == kPlannedHost) return OpenRequest(ShowPlanned());
  if (!parts->host.empty()) return refusal("Window_Open_BadURL", url);
  // Without favourites the widget opens the transit map, whose place here is the lines to choose from.
  if (parts->query.contains("favorites") || parts->query.contains("t")) return OpenRequest(ShowFavorites());
  return OpenRequest(ShowWidget());
}

Outcome<OpenRequest> openRequestOfActivity(std::string_view activityType,
                                           const std::map<std::string, Bytes, std::less<>>& userInfo) {
  const bool isLine = activityType == kNimboTransitWidgetIncidentActivityType;
  if (!isLine && activityType != kNimboTransitWidgetIncidentSummaryActivityType)
    return badPayload("\"" + std::string(activityType) + "\"");
  const auto payload = userInfo.find(payloadKey(isLine));
  if (payload == userInfo.end()) return badPayload("\"" + std::string(payloadKey(isLine)) + "\"");
  return OpenRequest(ShowHandoff{isLine, payload->second});
}

Outcome<OpenRequest> openRequestOfHandoff(const ShowHandoff& handoff, const Outcome<protocol::Handoff>& decoded) {
  if (!decoded) return badPayload(decoded.error()->reason());
  if (handoff.isLine && decoded->line) return OpenRequest(ShowLine{lineItemOf(*decoded->line)});
  if (!handoff.isLine && decoded->incidents) return OpenRequest(ShowIncidents{incidentsOf(*decoded->incidents)});
  return badPayload("\"" + std::string(payloadKey(handoff.isLine)) + "\"");
}

}  // namespace nimbo
