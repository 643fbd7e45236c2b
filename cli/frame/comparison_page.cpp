#include "cli/frame/comparison_page.h"

#include <fmt/format.h>

#include <algorithm>
#include <filesystem>
#include <string_view>

#include "cli/frame/html_page.h"
#include "cli/frame/keep_option.h"
#include "cli/frame/shown_text.h"

namespace pelorin::cli {
namespace {

// Grey around pictures, since any colour there would change how theirs look.
constexpr std::string_view style = R"(:root { --ground: #e6e6e6; --ink: #1c1c1c; --mark: #c25a00; }
@media (prefers-color-scheme: dark) {
  :root { --ground: #222; --ink: #ddd; --mark: #ff9d4d; }
}
body { background: var(--ground); color: var(--ink); max-width: 80rem; }
body.plain .faces { display: none; }
h1 { font-size: 1.5rem; margin: 0; }
h2 { font-size: 1.1rem; margin: 0; overflow-wrap: anywhere; }
header p, section > p { margin: .2rem 0 .6rem; overflow-wrap: anywhere; }
section { padding: 1.2rem 0 1.6rem; content-visibility: auto; contain-intrinsic-size: auto 60rem; }
.pair { position: relative; width: fit-content; max-width: 100%; margin: 0 auto; --at: 50%;
  line-height: 0; overflow: hidden; touch-action: pan-y; cursor: ew-resize; user-select: none;
  -webkit-user-select: none; }
.pair.one { cursor: auto; }
.pair > img { display: block; max-width: 100%; max-height: 88vh; width: auto; height: auto; }
.pair > img + img, .faces { position: absolute; inset: 0; width: 100%; height: 100%; }
.pair > img + img { clip-path: inset(0 calc(100% - var(--at)) 0 0); }
.pair input { position: absolute; inset: 0; width: 100%; margin: 0; opacity: 0;
  pointer-events: none; }
.line { position: absolute; top: 0; bottom: 0; left: var(--at); width: 2px; margin-left: -1px;
  background: #fff; box-shadow: 0 0 3px #000c; pointer-events: none; }
.line::after { content: "\2039\2009\203a"; position: absolute; top: 88%; left: 50%; width: 2.4rem;
  height: 2.4rem; transform: translate(-50%, -50%); border-radius: 50%; background: #fff;
  color: #222; font: 600 1.3rem/2.2rem system-ui, sans-serif; text-align: center;
  box-shadow: 0 0 4px #0009; }
input:focus-visible ~ .line::after { outline: 3px solid var(--mark); outline-offset: 2px; }
.tag { position: absolute; top: .6rem; padding: .1rem .6rem; border-radius: 1rem;
  background: #000a; color: #fff; font-size: .8rem; line-height: 1.4rem; pointer-events: none; }
.tag.before { left: .6rem; }
.tag.after { right: .6rem; }
.faces { pointer-events: none; }
.faces rect { fill: none; stroke: #000a; stroke-width: 3px; vector-effect: non-scaling-stroke; }
.faces rect + rect { stroke: #fff; stroke-width: 1.5px; }
.faces text { fill: #fff; stroke: #000a; stroke-width: .2em; paint-order: stroke; }
.more { display: flex; flex-wrap: wrap; gap: 1rem 2rem; margin-top: 1rem; }
.steps { display: grid; grid-template-columns: repeat(auto-fit, minmax(9rem, 1fr)); gap: .6rem;
  width: 100%; }
.steps figure { max-width: 16rem; }
figure { max-width: 100%; }
.steps img { display: block; max-width: 100%; height: auto; margin: 0 auto;
  border: 2px solid transparent; }
.steps .chosen img { border-color: var(--mark); }
.steps figcaption { text-align: center; }
figcaption { font-size: .8rem; }
.steps .chosen figcaption { color: var(--mark); font-weight: 600; }
.chart { display: block; width: 15rem; height: 8rem; background: #8882; overflow: visible; }
.chart.curve { width: 8rem; }
.chart path { fill: none; stroke-width: 1.5px; vector-effect: non-scaling-stroke; stroke: #888; }
.chart .was { fill: #888; fill-opacity: .45; }
.chart .is { stroke: var(--mark); fill: var(--mark); fill-opacity: .12; }
.chart .mapped { stroke: var(--mark); stroke-width: 2px; }
.chart .same { stroke-dasharray: 3 3; }
.lost { margin: .8rem 0 0; padding-left: 1.2rem; overflow-wrap: anywhere; }
@media (max-width: 40rem) {
  body { margin: .8rem auto; padding: 0 .6rem; }
  .steps { grid-template-columns: repeat(3, 1fr); }
  .chart { width: 11rem; height: 7rem; }
  .chart.curve { width: 7rem; }
}
)";

constexpr std::string_view script = R"(<script>
'use strict';
for (const pair of document.querySelectorAll('.pair:not(.one)')) {
  const divider = pair.querySelector('input');
  const show = at => {
    pair.style.setProperty('--at', `${at}%`);
    divider.setAttribute('aria-valuetext', `${Math.round(at)} % before`);
  };
  const put = at => {
    divider.value = at;
    show(Math.min(100, Math.max(0, at)));
  };
  const follow = event => {
    const box = pair.getBoundingClientRect();
    put(100 * (event.clientX - box.left) / box.width);
  };
  divider.addEventListener('input', () => show(divider.valueAsNumber));
  pair.addEventListener('pointerdown', event => {
    if (event.button !== 0) return;
    event.preventDefault();
    pair.setPointerCapture(event.pointerId);
    divider.focus({preventScroll: true});
    follow(event);
  });
  pair.addEventListener('pointermove', event => {
    if (pair.hasPointerCapture(event.pointerId)) follow(event);
  });
  pair.addEventListener('dblclick', () => put(50));
  put(50);
}
const box = document.getElementById('faces');
if (document.querySelector('.faces') !== null) {
  box.closest('label').hidden = false;
  box.addEventListener('change', () => document.body.classList.toggle('plain', !box.checked));
}
</script>
)";

std::string pictureOf(const std::vector<std::uint8_t>& jpeg, photo::PictureSize size,
                      std::string_view alt) {
  return fmt::format("<img width=\"{}\" height=\"{}\" alt=\"{}\" draggable=\"false\" src=\"{}\">\n",
                     size.width, size.height, alt, jpegAddress(jpeg));
}

std::string facesOf(const Comparison& pictures) {
  if (pictures.faces.empty()) return "";
  const double width = pictures.shown.width, height = pictures.shown.height;
  std::string html = fmt::format(
      "<svg class=\"faces\" viewBox=\"0 0 {} {}\" preserveAspectRatio=\"none\" "
      "aria-hidden=\"true\">\n",
      width, height);
  for (const ComparedFace& face : pictures.faces) {
    const std::string box = fmt::format(
        "<rect x=\"{:.1f}\" y=\"{:.1f}\" width=\"{:.1f}\" height=\"{:.1f}\"/>", face.left * width,
        face.top * height, (face.right - face.left) * width, (face.bottom - face.top) * height);
    const double letters = std::max(width, height) / 50;
    html += fmt::format("<g>{0}{0}", box);
    if (!face.name.empty()) {
      html += fmt::format("<text x=\"{:.1f}\" y=\"{:.1f}\" font-size=\"{:.1f}\">{}</text>",
                          face.left * width, face.bottom * height + 1.2 * letters, letters,
                          escapedHtml(shownText(face.name)));
    }
    html += "</g>\n";
  }
  return html + "</svg>\n";
}

std::string pairOf(const Comparison& pictures) {
  if (pictures.after.empty()) {
    return "<div class=\"pair one\">\n" + pictureOf(pictures.before, pictures.shown, "the photo") +
           facesOf(pictures) + "</div>\n";
  }
  return "<div class=\"pair\">\n" + pictureOf(pictures.after, pictures.shown, "after") +
         pictureOf(pictures.before, pictures.shown, "before") + facesOf(pictures) +
         "<input type=\"range\" min=\"0\" max=\"100\" step=\"any\" value=\"50\" "
         "aria-label=\"Divider between before and after\">\n"
         "<span class=\"line\"></span><span class=\"tag before\">Before</span>"
         "<span class=\"tag after\">After</span>\n</div>\n";
}

std::string stepsOf(const Comparison& pictures) {
  if (pictures.steps.empty()) return "";
  std::string html = "<div class=\"steps\">\n";
  for (const SliderStep& step : pictures.steps) {
    html += fmt::format(
        "<figure{0}><img alt=\"at slider {1}\" src=\"{2}\"><figcaption>{3}</figcaption></figure>\n",
        step.chosen ? " class=\"chosen\"" : "", step.slider, jpegAddress(step.jpeg),
        "slider " + step.slider);
  }
  return html + "</div>\n";
}

// Steps of one width each, in a box of 100 by 100.
std::string areaOf(const std::vector<float>& shares, double tallest) {
  std::string path = "M0 100";
  const double width = 100.0 / static_cast<double>(shares.size());
  for (std::size_t i = 0; i < shares.size(); ++i) {
    path += fmt::format("V{:.1f}H{:.1f}", 100 - 100 * std::min(1.0, shares[i] / tallest),
                        static_cast<double>(i + 1) * width);
  }
  return path + "V100Z";
}

// Black and white may have many pixels, which would leave nothing of the rest.
double tallestOf(const Comparison& pictures) {
  double tallest = 0.02;
  for (const auto* shares : {&pictures.lightBefore, &pictures.lightAfter}) {
    for (std::size_t i = 1; i + 2 < shares->size(); ++i)
      tallest = std::max<double>(tallest, (*shares)[i]);
  }
  return tallest;
}

std::string chartsOf(const Comparison& pictures) {
  if (pictures.lightAfter.empty()) return "";
  const double tallest = tallestOf(pictures);
  std::string html = fmt::format(
      "<figure><svg class=\"chart\" viewBox=\"0 0 100 100\" preserveAspectRatio=\"none\" "
      "role=\"img\" aria-label=\"How many pixels are how light, before and after\">"
      "<path class=\"was\" d=\"{}\"/><path class=\"is\" d=\"{}\"/></svg>"
      "<figcaption>Dark to light: before grey, after in colour</figcaption></figure>\n",
      areaOf(pictures.lightBefore, tallest), areaOf(pictures.lightAfter, tallest));
  if (pictures.curve.empty()) return html;
  std::string line;
  const double last = static_cast<double>(pictures.curve.size()) - 1;
  for (std::size_t i = 0; i < pictures.curve.size(); ++i) {
    line += fmt::format("{}{:.1f} {:.1f}", i == 0 ? "M" : "L", 100 * static_cast<double>(i) / last,
                        100 - 100 * static_cast<double>(pictures.curve[i]));
  }
  return html + fmt::format(
                    "<figure><svg class=\"chart curve\" viewBox=\"0 0 100 100\" role=\"img\" "
                    "aria-label=\"Tone curve\"><path class=\"same\" d=\"M0 100L100 0\"/>"
                    "<path class=\"mapped\" d=\"{}\"/></svg>"
                    "<figcaption>Tone curve</figcaption></figure>\n",
                    line);
}

std::string fileName(const std::string& path) {
  return path == "-" ? shownName(path) : shownText(std::filesystem::path(path).filename().string());
}

}  // namespace

std::string comparisonSection(const ComparedPhoto& photo) {
  std::string facts;
  const auto add = [&](const std::string& fact) {
    if (!fact.empty()) facts += (facts.empty() ? "" : " \xC2\xB7 ") + escapedHtml(fact);
  };
  if (photo.pictures != nullptr) {
    const photo::PictureSize size = photo.pictures->size;
    add(fmt::format("{} \xC3\x97 {}", size.width, size.height));
  }
  if (!photo.output.empty()) add("\xE2\x86\x92 " + shownText(photo.output));
  add(shownText(photo.remark));
  std::string html =
      fmt::format("<section>\n<h2 title=\"{}\">{}</h2>\n", escapedHtml(shownName(photo.input)),
                  escapedHtml(fileName(photo.input)));
  if (!facts.empty()) html += "<p>" + facts + "</p>\n";
  if (photo.pictures != nullptr) {
    const std::string more = stepsOf(*photo.pictures) + chartsOf(*photo.pictures);
    html += pairOf(*photo.pictures);
    if (!more.empty()) html += "<div class=\"more\">\n" + more + "</div>\n";
  }
  if (!photo.lost.empty()) {
    html += "<ul class=\"lost\">\n";
    for (const photo::Loss& loss : photo.lost)
      html += "<li>" + escapedHtml(shownText(lossText(loss))) + "</li>\n";
    html += "</ul>\n";
  }
  return html + "</section>\n";
}

std::string comparisonPage(const std::string& summary, const std::vector<std::string>& sections) {
  std::string html = htmlHead("Before and after", style);
  html += "<header>\n<p>" + escapedHtml(shownText(summary)) + "</p>\n";
  html +=
      "<p><small>Drag over a photo, or use the arrow keys; Home and End show one of both. Pictures "
      "and "
      "steps are smaller here than in the files.</small></p>\n"
      "<p><label hidden><input type=\"checkbox\" id=\"faces\" checked> Faces</label></p>\n"
      "</header>\n";
  for (const std::string& section : sections) html += section;
  html += script;
  return html + "</body>\n</html>\n";
}

}  // namespace pelorin::cli
