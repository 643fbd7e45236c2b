#include "photo/metadata/xmp_depth.h"

#include <algorithm>

namespace pelorin::photo {
namespace {

struct View {
  std::string_view space;
  bool staysWithThePicture;  // as long as that is neither turned nor scaled
  std::string_view what, why;
  std::string_view local = "";  // of the one property that speaks of the view; else all do
};

constexpr std::string_view depth = "depth map", otherwise = "describes the picture as it was";
constexpr View views[] = {
    {"http://ns.google.com/photos/1.0/depthmap/", true, depth, otherwise},
    {"http://ns.google.com/photos/1.0/focus/", true, depth, otherwise},
    {"http://ns.google.com/photos/dd/1.0/device/", false, depth, otherwise},
    {"http://ns.google.com/photos/1.0/image/", false, "second picture",
     "shows the picture as it was"},
    {"http://ns.apple.com/depthBlurEffect/1.0/", false, depth, otherwise},
    {"http://ns.apple.com/depthData/1.0/", false, depth, otherwise},
    {"http://ns.apple.com/portraitEffectsMatte/1.0/", false, depth, otherwise},
    {"http://ns.xiaomi.com/photos/1.0/camera/", false, depth, otherwise, "XMPMeta"},
};

}  // namespace

void removeUntrueViews(XmpPacket& packet, const PictureChange& change, std::vector<Loss>& lost) {
  packet.keepOnly([&](XmpName name) {
    const auto view = std::ranges::find_if(views, [&](const View& known) {
      return known.space == name.space && (known.local.empty() || known.local == name.local);
    });
    if (view == std::end(views) || (view->staysWithThePicture && isUnmoved(change))) return true;
    // A packet and its extension share them.
    const Loss loss = {std::string(view->what), std::string(view->why)};
    if (std::ranges::find(lost, loss) == lost.end()) lost.push_back(loss);
    return false;
  });
}

}  // namespace pelorin::photo
