#include "cli/verbs/dupes/html_report.h"

#include <fmt/format.h>

#include <map>
#include <string_view>

#include "cli/frame/base64.h"
#include "cli/frame/shown_text.h"

namespace pelorin::cli {
namespace {

constexpr std::string_view head = R"(<!DOCTYPE html>
<html lang="en">
<head>
<meta charset="utf-8">
<meta name="viewport" content="width=device-width, initial-scale=1">
<title>Near-duplicates</title>
<style>
:root { color-scheme: light dark; }
body { font: 15px/1.45 system-ui, sans-serif; }
body { margin: 2rem auto; max-width: 75rem; padding: 0 1rem; }
section { border-top: 1px solid #8886; padding: 1rem 0; }
.photos { display: flex; flex-wrap: wrap; gap: 1rem; }
figure { margin: 0; width: 16rem; }
figure.keep img, figure.keep .none { outline: 3px solid #2a8a3e; }
img, .none { display: block; max-width: 100%; border-radius: 3px; }
.none { width: 16rem; line-height: 8rem; text-align: center; background: #8883; }
figcaption { overflow-wrap: anywhere; margin-top: .3rem; }
small { display: block; opacity: .75; }
table { border-collapse: collapse; margin-top: 1rem; font-variant-numeric: tabular-nums; }
th, td { text-align: left; padding: .15rem .8rem .15rem 0; overflow-wrap: anywhere; }
</style>
</head>
<body>
<h1>Near-duplicates</h1>
)";

std::string escaped(std::string_view text) {
  std::string html;
  for (const char letter : text) {
    switch (letter) {
      case '&':
        html += "&amp;";
        break;
      case '<':
        html += "&lt;";
        break;
      case '>':
        html += "&gt;";
        break;
      case '"':
        html += "&quot;";
        break;
      default:
        html += letter;
    }
  }
  return html;
}

std::string figure(const photo::ScannedPhoto& photo, const std::vector<std::uint8_t>& thumbnail,
                   const photo::Ranked* ranked, bool keep) {
  const std::string name = escaped(shownName(photo.path));
  std::string html = keep ? "<figure class=\"keep\">\n" : "<figure>\n";
  html += thumbnail.empty() ? std::string("<div class=\"none\">no picture</div>\n")
                            : fmt::format("<img alt=\"{}\" src=\"data:image/jpeg;base64,{}\">\n",
                                          name, base64(thumbnail));
  html += fmt::format("<figcaption>{}\n<small>{} × {}, {}</small>\n", name, photo.width,
                      photo.height, escaped(shownText(timeText(photo))));
  if (ranked != nullptr) {
    html += fmt::format("<small>{}{}</small>\n", keep ? "keep: " : "", escaped(ranked->reason));
  }
  return html + "</figcaption>\n</figure>\n";
}

std::string pairTable(const DupeReport& report, const photo::DupeGroup& group) {
  if (toldPairs(report, group).empty()) return "";
  std::string html =
      "<table>\n<tr><th>Photo</th><th>Photo</th><th>Score</th><th>Seconds apart</th>"
      "<th>Distance</th><th>Orientation</th></tr>\n";
  for (const photo::ShotPair& pair : group.pairs) {
    html += fmt::format(
        "<tr><td>{}</td><td>{}</td><td>{:.2f}</td><td>{}</td><td>{:.4f}</td><td>{}</td></tr>\n",
        escaped(shownName(report.photos[pair.first].path)),
        escaped(shownName(report.photos[pair.second].path)), pair.score,
        pair.timesKnown ? fmt::format("{:.2f}", pair.seconds)
                        : std::string("not known, taken as 0"),
        pair.distance, pair.sameOrientation ? "same" : "different");
  }
  return html + "</table>\n";
}

}  // namespace

std::string htmlReport(const DupeReport& report,
                       const std::vector<std::vector<std::uint8_t>>& thumbnails) {
  std::string html(head);
  html += fmt::format("<p>{}, threshold {}.</p>\n", summaryOf(report), report.threshold);
  const std::size_t all = report.groups.size() + report.lookAlikes.size();
  for (std::size_t g = 0; g < all; ++g) {
    const bool looksAlone = g >= report.groups.size();
    const photo::DupeGroup& group =
        looksAlone ? report.lookAlikes[g - report.groups.size()] : report.groups[g];
    const bool rank = report.rank && !looksAlone;
    const std::vector<photo::Ranked> ranking =
        rank ? photo::rankGroup(group, report.photos) : std::vector<photo::Ranked>{};
    std::map<std::size_t, const photo::Ranked*> rankedOf;
    for (const photo::Ranked& ranked : ranking) rankedOf[ranked.photo] = &ranked;
    html += fmt::format("<section>\n<h2>Group {}{}</h2>\n<p>{}</p>\n<div class=\"photos\">\n",
                        g + 1, looksAlone ? ": look alike, time unknown" : "", groupSummary(group));
    for (const std::size_t i : group.photos) {
      const photo::Ranked* ranked = rank ? rankedOf[i] : nullptr;
      html += figure(report.photos[i], thumbnails[i], ranked,
                     ranked != nullptr && ranked == ranking.data());
    }
    html += "</div>\n" + pairTable(report, group) + "</section>\n";
  }
  if (!report.failed.empty()) html += "<section>\n<h2>Not read</h2>\n<ul>\n";
  for (const photo::FailedPhoto& failed : report.failed) {
    html += fmt::format("<li>{}: {}</li>\n", escaped(shownName(failed.path)),
                        escaped(shownText(failed.reason)));
  }
  if (!report.failed.empty()) html += "</ul>\n</section>\n";
  return html + "</body>\n</html>\n";
}

}  // namespace pelorin::cli
