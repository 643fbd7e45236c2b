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
  report.photos[1].modified = 12345678901234567;
  report.groups = {{{0, 1}, {pair}}};
  report.failed = {{"broken.jpg", "is <empty>"}};
  return report;
}

TEST(HtmlReport, HoldsItsPicturesAndNamesNoOtherFile) {
  const std::string html = htmlReport(smallReport(), {{'M', 'a', 'n'}, {'M', 'a'}, {}});
  EXPECT_THAT(html, HasSubstr("src=\"data:image/jpeg;base64,TWFu\""));
  EXPECT_THAT(html, HasSubstr("src=\"data:image/jpeg;base64,TWE=\""));
  EXPECT_THAT(html, Not(HasSubstr("http:")));
  EXPECT_THAT(html, Not(HasSubstr("https")));
  EXPECT_THAT(html, Not(HasSubstr("<link")));
  EXPECT_THAT(html, Not(HasSubstr("url(")));
}

// What is chosen in the page is saved with the size and time that the file had.
TEST(HtmlReport, HasABoxForEveryFile) {
  const std::string html = htmlReport(smallReport(), {{}, {}, {}});
  EXPECT_THAT(html, HasSubstr("&lt;b&gt;&amp;\\&quot;two\\&quot;.jpg&quot;,&quot;bytes&quot;:1000,"
                              "&quot;modified&quot;:&quot;12345678901234567&quot;}\"> keep "));
  EXPECT_EQ(html.find("data-file=\""), html.rfind("data-file=\""));
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
  EXPECT_THAT(html, HasSubstr("no near-duplicates among 3 photos; 1 group looks alike"));
  EXPECT_THAT(html, HasSubstr("Group 1: look alike, time unknown"));
  EXPECT_THAT(html, HasSubstr("not known, taken as 0"));
  EXPECT_THAT(html, Not(HasSubstr("<small>keep: ")));
}

TEST(HtmlReport, TakesNamesForTextAndNotForMarkup) {
  const std::string html = htmlReport(smallReport(), {{}, {'M'}, {}});
  EXPECT_THAT(html, HasSubstr("&lt;b&gt;&amp;&quot;two&quot;.jpg"));
  EXPECT_THAT(html, HasSubstr("base64,TQ=="));
  EXPECT_THAT(html, Not(HasSubstr("<b>")));
}

}  // namespace
}  // namespace pelorin::cli
