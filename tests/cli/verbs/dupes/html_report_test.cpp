#include "cli/verbs/dupes/html_report.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace pelorin::cli {
namespace {

using testing::HasSubstr;
using testing::Not;

DupeReport smallReport() {
  DupeReport report = {0.5f, {}, {}, {}, {}, /*rank=*/true, /*pairs=*/true};
  for (const char* name : {"one.jpg", "<b>&\"two\".jpg", "three.jpg"}) {
    report.photos.push_back({name, 400, 300, 1, 1000, photo::TimeSource::none, ""});
  }
  photo::ShotPair pair{};
  pair.second = 1;
  pair.score = 2.345f;
  pair.timesKnown = true;
  report.groups = {{{0, 1}, {pair}}};
  report.failed = {{"broken.jpg", "is <empty>"}};
  return report;
}

TEST(HtmlReport, HoldsItsPicturesAndNamesNoOtherFile) {
  const std::string html = htmlReport(smallReport(), {{'M', 'a', 'n'}, {'M', 'a'}, {}});
  EXPECT_THAT(html, HasSubstr("src=\"data:image/jpeg;base64,TWFu\""));
  EXPECT_THAT(html, HasSubstr("src=\"data:image/jpeg;base64,TWE=\""));
  EXPECT_THAT(html, Not(HasSubstr("http")));
  EXPECT_THAT(html, Not(HasSubstr("<script")));
  EXPECT_THAT(html, Not(HasSubstr("<link")));
  EXPECT_THAT(html, Not(HasSubstr("url(")));
}

TEST(HtmlReport, TellsPairsTheChoiceAndWhatWasNotRead) {
  const std::string html = htmlReport(smallReport(), {{}, {}, {}});
  EXPECT_THAT(html, HasSubstr("<td>2.35</td>"));
  EXPECT_THAT(html, HasSubstr("keep: the first of those"));
  EXPECT_THAT(html, HasSubstr("broken.jpg: is &lt;empty&gt;"));
  EXPECT_THAT(html, HasSubstr("no picture"));
  EXPECT_THAT(html, HasSubstr("1 group with 2 of 3 photos"));
  EXPECT_THAT(html, Not(HasSubstr("three.jpg")));
}

TEST(HtmlReport, RanksNothingWhereATimeIsNotKnown) {
  DupeReport report = smallReport();
  report.lookAlikes = std::move(report.groups);
  report.groups.clear();
  report.lookAlikes[0].pairs[0].timesKnown = false;
  const std::string html = htmlReport(report, {{}, {}, {}});
  EXPECT_THAT(html, HasSubstr("Group 1: look alike, time unknown"));
  EXPECT_THAT(html, HasSubstr("not known, taken as 0"));
  EXPECT_THAT(html, Not(HasSubstr("keep: ")));
}

TEST(HtmlReport, TakesNamesForTextAndNotForMarkup) {
  const std::string html = htmlReport(smallReport(), {{}, {'M'}, {}});
  EXPECT_THAT(html, HasSubstr("&lt;b&gt;&amp;&quot;two&quot;.jpg"));
  EXPECT_THAT(html, HasSubstr("base64,TQ=="));
  EXPECT_THAT(html, Not(HasSubstr("<b>")));
}

}  // namespace
}  // namespace pelorin::cli
