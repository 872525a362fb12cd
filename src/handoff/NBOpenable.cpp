#include "handoff/NBOpenable.h"

#include "platform/UserSession.h"
#include "platform/foundation/Hash.h"
#include "platform/ui/ViewController.h"
#include "platform/ui/WidgetHost.h"

namespace nimbo {

void NBURLOpenable::openInContext_completionHandler(Object* context, Completion completion) const {
  const auto* controller = dynamic_cast<const ViewController*>(context);
  WidgetHost* host = controller ? controller->widgetHost() : nullptr;
  if (!host) return;
  UserSession::prepareSharedSession(true, false);
  host->openURL(UserSession::sharedSessionURLForPunchoutURL(_url.absoluteString()),
                [completion = std::move(completion)](bool opened) {
                  if (completion) completion(opened, nullptr);
                });
}

bool NBURLOpenable::isEqual(const Object* other) const {
  const auto* openable = instanceOf<NBURLOpenable>(other);
  return openable && openable->_url == _url;
}

std::uint64_t NBURLOpenable::hash() const { return hashOfBytes(_url.absoluteString()); }

}  // namespace nimbo
