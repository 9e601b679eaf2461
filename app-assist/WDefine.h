#pragma once
// Object data keys through which controllers are found from Evas objects.

namespace app_assist {

constexpr const char kWindowInstanceKey[] = "__@WWindowInstance";
constexpr const char kBaseLayoutTagKey[] = "__@WBaselayoutTag";
constexpr const char kViewInstanceKey[] = "__@WViewInstance";
constexpr const char kNaviframeInstanceKey[] = "__@WNaviframeInstance";
// On a page's object: its "more" button.
constexpr const char kMoreButtonKey[] = "__@WMoreButton";

}  // namespace app_assist
