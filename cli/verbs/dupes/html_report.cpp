#include "cli/verbs/dupes/html_report.h"

#include <fmt/format.h>

#include <map>
#include <optional>
#include <string_view>

#include "cli/frame/html_page.h"
#include "cli/frame/shown_text.h"
#include "cli/verbs/dupes/plan_file.h"
#include "photo/collection/removal.h"

namespace pelorin::cli {
namespace {

constexpr std::string_view style = R"(.photos { display: flex; flex-wrap: wrap; gap: 1rem; }
figure { width: 16rem; }
figure.keep img, figure.keep .none { outline: 3px solid #2a8a3e; }
figure.goes img, figure.goes .none { opacity: .35; }
label { display: block; cursor: pointer; overflow-wrap: anywhere; margin-bottom: .3rem; }
input { width: 1.1rem; height: 1.1rem; vertical-align: text-bottom; }
.plan { position: sticky; bottom: 0; padding: .8rem 0; background: Canvas; }
.plan { border-top: 1px solid #8886; }
.plan p { margin: .3rem 0; }
button { font: inherit; padding: .3rem .9rem; }
img, .none { display: block; max-width: 100%; border-radius: 3px; }
.none { width: 16rem; line-height: 8rem; text-align: center; background: #8883; }
figcaption { overflow-wrap: anywhere; }
table { border-collapse: collapse; margin-top: 1rem; font-variant-numeric: tabular-nums; }
th, td { text-align: left; padding: .15rem .8rem .15rem 0; overflow-wrap: anywhere; }
)";

constexpr std::string_view planBar = R"(<div class="plan" role="region" aria-label="Plan">
<p id="chosen" role="status">Every photo stays.</p>
<p><button id="save" type="button" disabled>Save the plan</button>
<button id="all" type="button">Keep all</button></p>
<p><small>Then: quenby dupes --plan duplicates.json --move-to DIR, which says what it would do, and with
--apply does it.</small></p>
</div>
<script>
'use strict';
const boxes = [...document.querySelectorAll('input[data-file]')];
const fileOf = box => JSON.parse(box.dataset.file);
const inGroup = group => boxes.filter(box => box.closest('section') === group);
const chosen = document.getElementById('chosen');
const save = document.getElementById('save');
function show() {
  const going = boxes.filter(box => !box.checked);
  for (const box of boxes) box.closest('figure').classList.toggle('goes', !box.checked);
  const bytes = going.reduce((sum, box) => sum + fileOf(box).bytes, 0);
  chosen.textContent = going.length === 0 ? 'Every photo stays.'
    : `${going.length} of ${boxes.length} photos would go, ${(bytes / 1e6).toFixed(1)} MB.`;
  save.disabled = going.length === 0;
}
for (const box of boxes) {
  box.addEventListener('change', () => {
    const lonely = inGroup(box.closest('section')).every(other => !other.checked);
    if (lonely) box.checked = true;
    show();
    if (lonely) chosen.textContent += ' One photo of each group stays.';
  });
}
document.getElementById('all').addEventListener('click', () => {
  for (const box of boxes) box.checked = true;
  show();
});
save.addEventListener('click', () => {
  const groups = [...document.querySelectorAll('section')].map(inGroup).map(group => ({
    keep: group.filter(box => box.checked).map(fileOf),
    remove: group.filter(box => !box.checked).map(fileOf),
  })).filter(group => group.remove.length > 0);
  const plan = JSON.stringify({schema: 1, plan: 'dupes', groups}, null, 1) + '\n';
  const link = document.createElement('a');
  link.href = URL.createObjectURL(new Blob([plan], {type: 'application/json'}));
  link.download = 'duplicates.json';
  link.click();
  URL.revokeObjectURL(link.href);
});
show();
</script>
)";

// Whether the photo stays, for the plan; nothing for one that is no file.
std::string keepBox(const photo::ScannedPhoto& photo, bool keep) {
  const std::optional<photo::KnownFile> file = photo::knownFile(photo);
  if (!file) return "";
  return fmt::format("<input type=\"checkbox\" data-file=\"{}\"{}{}> keep ",
                     escapedHtml(planEntry(*file)), keep ? " checked" : "",
                     photo.isReference ? " disabled" : "");
}

std::string figure(const photo::ScannedPhoto& photo, const std::vector<std::uint8_t>& thumbnail,
                   const photo::Ranked* ranked) {
  const std::string name = escapedHtml(shownName(photo.path));
  const bool keep = ranked != nullptr && ranked->keep;
  std::string html = keep ? "<figure class=\"keep\">\n<label>" : "<figure>\n<label>";
  html += thumbnail.empty()
              ? std::string("<div class=\"none\">no picture</div>\n")
              : fmt::format("<img alt=\"{}\" src=\"{}\">\n", name, jpegAddress(thumbnail));
  html += fmt::format("{}{}</label>\n<figcaption><small>{} × {}, {}</small>\n",
                      keepBox(photo, ranked == nullptr || ranked->keep), name, photo.width,
                      photo.height, escapedHtml(shownText(timeText(photo))));
  if (ranked != nullptr) {
    html += fmt::format("<small>{}{}</small>\n", keep ? "keep: " : "", escapedHtml(ranked->reason));
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
        escapedHtml(shownName(report.photos[pair.first].path)),
        escapedHtml(shownName(report.photos[pair.second].path)), pair.score,
        pair.timesKnown ? fmt::format("{:.2f}", pair.seconds)
                        : std::string("not known, taken as 0"),
        pair.distance, pair.sameOrientation ? "same" : "different");
  }
  return html + "</table>\n";
}

}  // namespace

std::string htmlReport(const DupeReport& report,
                       const std::vector<std::vector<std::uint8_t>>& thumbnails) {
  std::string html = htmlHead("Near-duplicates", style);
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
      html += figure(report.photos[i], thumbnails[i], ranked);
    }
    html += "</div>\n" + pairTable(report, group) + "</section>\n";
  }
  if (!report.failed.empty()) html += "<section>\n<h2>Not read</h2>\n<ul>\n";
  for (const photo::FailedPhoto& failed : report.failed) {
    html += fmt::format("<li>{}: {}</li>\n", escapedHtml(shownName(failed.path)),
                        escapedHtml(shownText(failed.reason)));
  }
  if (!report.failed.empty()) html += "</ul>\n</section>\n";
  if (all > 0) html += planBar;
  return html + "</body>\n</html>\n";
}

}  // namespace pelorin::cli
