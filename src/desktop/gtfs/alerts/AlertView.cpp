#include "desktop/gtfs/alerts/AlertView.h"

#include "desktop/gtfs/alerts/RealtimeFields.h"

namespace nimbo {

namespace {

std::int32_t causeOf(std::uint64_t number) {
  return number >= kLeastCause && number <= kGreatestCause ? static_cast<std::int32_t>(number) : kUnknownCause;
}

AlertEffect effectOf(std::uint64_t number) {
  constexpr auto kLeast = static_cast<std::uint64_t>(AlertEffect::noService);
  constexpr auto kGreatest = static_cast<std::uint64_t>(AlertEffect::accessibilityIssue);
  return number >= kLeast && number <= kGreatest ? static_cast<AlertEffect>(number) : AlertEffect::unknownEffect;
}

}  // namespace

AlertView readAlertView(std::string_view alert, const std::function<void(const EntitySelector&)>& onSelector) {
  AlertView view;
  const auto take = [&](std::string_view& text, std::string_view message) { text = text.empty() ? message : alert; };
  for (auto message = messageIn<AlertField>(alert); message.next();) {
    switch (message.tag()) {
      case AlertField::informedEntity:
        onSelector(readEntitySelector(takeView(message)));
        break;
      case AlertField::cause:
        view.content.cause = causeOf(takeNumber(message));
        break;
      case AlertField::effect:
        view.content.effect = effectOf(takeNumber(message));
        break;
      case AlertField::url:
        take(view.content.url, takeView(message));
        break;
      case AlertField::headerText:
        take(view.content.header, takeView(message));
        break;
      case AlertField::descriptionText:
        take(view.content.description, takeView(message));
        break;
      case AlertField::effectDetail:
        take(view.content.effectDetail, takeView(message));
        break;
      case AlertField::severityLevel:
        view.isSevere = takeNumber(message) == kSeveritySevere;
        break;
      default:
        message.skip();
    }
  }
  return view;
}

}  // namespace nimbo
