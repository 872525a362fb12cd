#pragma once

#include "protocol/Feeds.h"
#include "protocol/Handoff.h"
#include "protocol/Lines.h"
#include "protocol/Messages.h"
#include "protocol/Snapshot.h"

namespace nimbo::protocol {

/// A request: its name, what it is made with, and what is answered.
template <class Params, class Result = Nothing>
struct Method {
  const char* name;
  bool waitsForFeeds = false;  ///< others are answered before it, and it takes as long as servers do
};

/// What is told without an answer.
template <class Params>
struct Notification {
  const char* name;
};

// The host's requests.
inline constexpr Method<InitializeParams, Initialized> kInitialize{"initialize"};
inline constexpr Method<Nothing> kLoadView{"loadView"};
inline constexpr Method<Nothing> kViewWillAppear{"viewWillAppear"};
inline constexpr Method<Nothing> kViewDidAppear{"viewDidAppear"};
inline constexpr Method<Nothing, Kept> kViewWillDisappear{"viewWillDisappear"};
inline constexpr Method<Nothing> kViewDidDisappear{"viewDidDisappear"};
inline constexpr Method<Nothing> kDidReceiveMemoryWarning{"didReceiveMemoryWarning"};
inline constexpr Method<UpdateParams, UpdateResult> kPerformUpdate{"performUpdate", true};
inline constexpr Method<ActiveDisplayModeParams> kSetActiveDisplayMode{"setActiveDisplayMode"};
inline constexpr Method<TransitionParams> kTransitionToSize{"transitionToSize"};
inline constexpr Method<TextSizeParams> kSetTextSize{"setTextSize"};
inline constexpr Method<AppearanceParams> kSetAppearance{"setAppearance"};
inline constexpr Method<ScaleParams> kSetScale{"setScale"};
inline constexpr Method<RowParams, Selected> kSelectRow{"selectRow"};
inline constexpr Method<HighlightParams, Highlighted> kHighlightRow{"highlightRow"};
inline constexpr Method<SnapshotParams, Snapshot> kSnapshot{"snapshot"};
inline constexpr Method<LinesParams, Lines> kLines{"lines"};
inline constexpr Method<MarkSeenParams, Kept> kMarkSeen{"markSeen"};
inline constexpr Method<Nothing, Downloads> kDownloads{"downloads"};
inline constexpr Method<RenderParams, Rendered> kRender{"render"};
inline constexpr Method<AdvanceParams, Advanced> kAdvanceTime{"advanceTime"};
inline constexpr Method<DecodeParams, Handoff> kDecode{"decode"};
inline constexpr Method<FindLinesParams, FoundLines> kFindLines{"findLines", true};
inline constexpr Method<DescribeLinesParams, DescribedLines> kDescribeLines{"describeLines", true};
inline constexpr Method<CheckFeedParams, FeedReport> kCheckFeed{"checkFeed", true};
inline constexpr Method<ImageParams, Rendered> kImage{"image", true};
inline constexpr Method<CancelParams> kCancel{"cancel"};
inline constexpr Method<Nothing> kShutdown{"shutdown"};

// The widget's requests.
inline constexpr Method<OpenURLParams, Opened> kOpenURL{"openURL"};
inline constexpr Method<OpenUserActivityParams, Opened> kOpenUserActivity{"openUserActivity"};

// What the widget tells.
inline constexpr Notification<PreferredSizeParams> kPreferredContentSizeDidChange{"preferredContentSizeDidChange"};
inline constexpr Notification<LargestDisplayModeParams> kLargestAvailableDisplayModeDidChange{
    "largestAvailableDisplayModeDidChange"};
inline constexpr Notification<Nothing> kFrame{"frame"};
inline constexpr Notification<Nothing> kUpdated{"updated"};
inline constexpr Notification<Nothing> kChanged{"changed"};
inline constexpr Notification<NoticeParams> kNotice{"notice"};
inline constexpr Notification<ProgressParams> kProgress{"progress"};
inline constexpr Notification<LogParams> kLog{"log"};

}  // namespace nimbo::protocol
