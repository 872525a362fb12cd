#include "host/window/OpenRequest.h"

#include <glib.h>

#include "desktop/archive/HandoffDecoder.h"
#include "desktop/rpc/Base64.h"
#include "handoff/NBUserActivityData.h"
#include "handoff/NimboActivity.h"
#include "platform/HostApplication.h"
#include "platform/Localization.h"
#include "platform/wire/StoredTransitIncident.h"

namespace nimbo {

namespace {

constexpr std::string_view kOpenErrorDomain = "org.nimbo.Open";
constexpr std::string_view kActivityHost = "activity";
constexpr std::string_view kIncidentKey = "bs";

ErrorRef refusal(std::string_view key, const std::string& detail) {
  return Error::errorWithDomain_code_reason(std::string(kOpenErrorDomain), 0,
                                            LocalizedFormat(LocalizedString(key), {detail}));
}

ErrorRef badPayload(const std::string& why) { return refusal("Window_Open_BadPayload", why); }

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

}  // namespace

Outcome<OpenRequest> openRequestOfURL(std::string_view text) {
  const std::string url(text);
  const auto parts = partsOf(url);
  if (!parts || parts->scheme != kHostApplicationURLScheme) return refusal("Window_Open_BadURL", url);
  if (parts->host == kActivityHost) return requestOfActivityURL(*parts);
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
  const std::string_view key = isLine ? kIncidentKey : kNimboTransitWidgetIncidentSummaryActivityUserInfoKey;
  const auto payload = userInfo.find(key);
  if (payload == userInfo.end()) return badPayload("\"" + std::string(key) + "\"");
  const auto [content, error] = readHandoff(payload->second);
  if (error) return badPayload(error->reason());
  if (const auto* activity = dynamic_cast<const NimboActivity*>(content.get());
      isLine && activity && activity->hasLineItem())
    return OpenRequest(ShowLine{activity->lineItem()});
  if (const auto* incidents = dynamic_cast<const BoxedArray*>(content.get()); !isLine && incidents) {
    TransitIncidents list;
    for (const auto& incident : incidents->elementsOfClass<StoredTransitIncident>()) list.push_back(incident);
    return OpenRequest(ShowIncidents{std::move(list)});
  }
  return badPayload("\"" + std::string(key) + "\"");
}

}  // namespace nimbo
