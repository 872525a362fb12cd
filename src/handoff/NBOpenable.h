#pragma once

#include <functional>

#include "platform/foundation/Error.h"
#include "platform/foundation/URL.h"

namespace nimbo {

/// What a tapped row opens. Immutable, made with its row and opened on the main thread.
class NBOpenable : public Object {
 public:
  /// `error` is null after a success, and where the one who opens knows no reason.
  using Completion = std::function<void(bool opened, const ErrorRef& error)>;

  /// Opens this from `context`, the view controller whose row was tapped. Calls `completion`, when there is one, once:
  /// at once for a failure found here, else when and where the opener reports.
  virtual void openInContext_completionHandler(Object* context, Completion completion) const = 0;
};

using NBOpenableRef = std::shared_ptr<const NBOpenable>;

/// A URL as what a row opens. Equal when the URLs are.
class NBURLOpenable final : public NBOpenable {
 public:
  explicit NBURLOpenable(URL url) : _url(std::move(url)) {}
  const URL& url() const { return _url; }

  /// Asks the host of the view controller `context` to open the URL, tagged with the shared session. With a context
  /// that is no view controller, or one without a host, nothing is opened and `completion` is never called.
  void openInContext_completionHandler(Object* context, Completion completion) const override;

  std::string_view className() const override { return "URL"; }
  bool isEqual(const Object* other) const override;
  std::uint64_t hash() const override;
  std::string description() const override { return _url.absoluteString(); }

 private:
  URL _url;
};

}  // namespace nimbo
