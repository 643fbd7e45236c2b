#include "photo/metadata/xmp_depth.h"

#include <algorithm>

namespace pelorin::photo {
namespace {

struct View {
  std::string_view space;
  bool staysWithThePicture;  // as long as that is neither turned nor scaled
  std::string_view what, why;
};

constexpr std::string_view depth = "depth map", otherwise = "describes the picture as it was";
constexpr View views[] = {
    {"http://ns.google.com/photos/1.0/depthmap/", true, depth, otherwise},
    {"http://ns.google.com/photos/1.0/focus/", true, depth, otherwise},
    {"http://ns.google.com/photos/dd/1.0/device/", false, depth, otherwise},
    {"http://ns.google.com/photos/1.0/image/", false, "second picture",
     "shows the picture as it was"},
};

}  // namespace

void removeUntrueViews(XmpPacket& packet, const PictureChange& change, std::vector<Loss>& lost) {
  packet.keepOnly([&](XmpName name) {
    const auto view = std::ranges::find(views, name.space, &View::space);
    if (view == std::end(views) || (view->staysWithThePicture && isUnmoved(change))) return true;
    // A packet and its extension share them.
    const Loss loss = {std::string(view->what), std::string(view->why)};
    if (std::ranges::find(lost, loss) == lost.end()) lost.push_back(loss);
    return false;
  });
}

}  // namespace pelorin::photo
