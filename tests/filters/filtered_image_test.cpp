#include "image_processing/filters/filtered_image.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <atomic>
#include <boost/lexical_cast.hpp>
#include <chrono>
#include <cstring>
#include <future>
#include <memory>
#include <mutex>
#include <stdexcept>
#include <thread>
#include <utility>
#include <vector>

#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/pass_through.h"
#include "tests/support/fingerprint.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::fingerprint;
using test_support::flatPicture;
using test_support::noisePicture;
using test_support::photoLikePicture;
using testing::ElementsAre;
using testing::IsEmpty;

/// What the recording filters of all sessions were asked to do.
struct Log {
  std::vector<std::string> inits, applications;
  int made = 0;
  bool failInit = false;
};
Log* currentLog = nullptr;

class RecordingFilter : public AbstractFilter {
 public:
  explicit RecordingFilter(std::shared_ptr<FilteredImageState> state)
      : AbstractFilter(std::move(state)) {
    ++currentLog->made;
  }
  void init(const std::string& params) override {
    if (currentLog->failInit) throw std::out_of_range("map::at");
    currentLog->inits.push_back(params);
  }
  void applyConfig(const std::string& params, const FilterConfig&,
                   Image<RGBA8Pixel>& output) override {
    currentLog->applications.push_back(params);
    output.data.get()[0] = state->image->data.get()[0];
  }
};

class FilteredImageTest : public testing::Test {
 protected:
  FilteredImageTest() {
    currentLog = &log;
    factory->addFilterDescription(&description);
  }

  Log log;
  ConcreteDescription<RecordingFilter> description{"Recording", "", ""};
  std::shared_ptr<FilterFactory> factory = std::make_shared<FilterFactory>();
  std::shared_ptr<Image<RGBA8Pixel>> image =
      std::make_shared<Image<RGBA8Pixel>>(noisePicture(8, 6, 1));
};

TEST_F(FilteredImageTest, InitialisesAFilterOnceAndThenOnlyAppliesIt) {
  FilteredImage session(image, {}, "", defaultFilterConfigValue, factory);
  Image<RGBA8Pixel> output(8, 6);
  EXPECT_TRUE(session.applyFilterWithParams("Recording", "slider=0.4;", {}, output));
  EXPECT_TRUE(session.applyFilterWithParams("Recording", "slider=0.9;", {}, output));
  EXPECT_EQ(log.made, 1);
  EXPECT_THAT(log.inits, ElementsAre("slider=0.4;"));
  EXPECT_THAT(log.applications, ElementsAre("slider=0.4;", "slider=0.9;"));
}

TEST_F(FilteredImageTest, LeavesTheOutputUntouchedForAnUnknownName) {
  FilteredImage session(image, {}, "", defaultFilterConfigValue, factory);
  Image<RGBA8Pixel> output = flatPicture(8, 6, {1, 2, 3, 4});
  const std::string before = fingerprint(output);
  EXPECT_FALSE(session.applyFilterWithParams("NoSuchFilter", "slider=0.4;", {}, output));
  EXPECT_EQ(fingerprint(output), before);
  EXPECT_EQ(session.setupFilter("NoSuchFilter", ""), nullptr);
  // An unknown name is not remembered: registered later, it is found.
  ConcreteDescription<RecordingFilter> late("NoSuchFilter", "", "");
  factory->addFilterDescription(&late);
  EXPECT_TRUE(session.applyFilterWithParams("NoSuchFilter", "", {}, output));
}

TEST_F(FilteredImageTest, RefusesAnOutputOfAnotherSizeAndWritesNothing) {
  FilteredImage session(image, {}, "", defaultFilterConfigValue,
                        DefaultFilterFactory::filterFactory());
  for (const auto& [width, height] :
       {std::pair{7u, 6u}, {8u, 5u}, {9u, 6u}, {8u, 7u}, {6u, 8u}, {0u, 0u}}) {
    Image<RGBA8Pixel> output = flatPicture(width, height, {1, 2, 3, 4});
    const std::string before = fingerprint(output);
    for (const auto& [name, description] : DefaultFilterFactory::filterFactory()->descriptions) {
      if (name == "PassThrough") continue;
      EXPECT_THROW(session.applyFilterWithParams(name, "slider=0.4;s1=0.5;s2=0.5;s3=0.5;s4=0.5;",
                                                 {}, output),
                   std::invalid_argument)
          << name << " " << width << " x " << height;
    }
    EXPECT_FALSE(session.applyFilterWithParams("NoSuchFilter", "", {}, output));
    EXPECT_EQ(fingerprint(output), before);
  }
}

TEST_F(FilteredImageTest, LetsPassThroughCopyWhatFitsAnOutputOfAnotherSize) {
  FilteredImage session(image, {}, "", defaultFilterConfigValue,
                        DefaultFilterFactory::filterFactory());
  Image<RGBA8Pixel> smaller(4, 6), larger = flatPicture(10, 6, {1, 2, 3, 4});
  EXPECT_TRUE(session.applyFilterWithParams("PassThrough", "", {}, smaller));
  EXPECT_EQ(std::memcmp(smaller.data.get(), image->data.get(), smaller.byteSize()), 0);
  EXPECT_TRUE(session.applyFilterWithParams("PassThrough", "", {}, larger));
  EXPECT_EQ(std::memcmp(larger.data.get(), image->data.get(), image->byteSize()), 0);
  EXPECT_EQ(larger.data.get()[48], (RGBA8Pixel{1, 2, 3, 4}));
}

TEST_F(FilteredImageTest, LetsPassThroughCopyIntoAnOverlappingOutput) {
  // Each part would overwrite what another one still has to read.
  struct InOrder : Workers {
    explicit InOrder(bool last) : lastFirst(last) {}
    std::size_t count() const override { return 4; }
    void run(std::size_t tasks, const Task& task) override {
      for (std::size_t i = 0; i < tasks; ++i) task(lastFirst ? tasks - 1 - i : i);
    }
    bool lastFirst;
  } forwards(false), backwards(true);
  const std::vector<RGBA8Pixel> pixels = test_support::randomPixels(60, 3);
  const std::shared_ptr<RGBA8Pixel> memory(new RGBA8Pixel[60], std::default_delete<RGBA8Pixel[]>());
  for (const int shift : {-5, 5}) {
    std::copy(pixels.begin(), pixels.end(), memory.get());
    const auto at = [&](int first) {
      return std::shared_ptr<RGBA8Pixel>(memory, memory.get() + first);
    };
    auto source = std::make_shared<Image<RGBA8Pixel>>(8, 6, at(6));
    Image<RGBA8Pixel> output(8, 6, at(6 + shift));
    FilteredImage session(source, {}, "", defaultFilterConfigValue,
                          DefaultFilterFactory::filterFactory(),
                          shift > 0 ? &forwards : &backwards);
    EXPECT_TRUE(session.applyFilterWithParams("PassThrough", "", {}, output));
    EXPECT_EQ(std::memcmp(output.data.get(), pixels.data() + 6, output.byteSize()), 0);
  }
}

TEST_F(FilteredImageTest, TriesAgainAfterAnInitThatThrew) {
  FilteredImage session(image, {}, "", defaultFilterConfigValue, factory);
  Image<RGBA8Pixel> output(8, 6);
  log.failInit = true;
  EXPECT_THROW(session.applyFilterWithParams("Recording", "a", {}, output), std::out_of_range);
  log.failInit = false;
  EXPECT_TRUE(session.applyFilterWithParams("Recording", "b", {}, output));
  EXPECT_EQ(log.made, 2);
  EXPECT_THAT(log.inits, ElementsAre("b"));
}

TEST_F(FilteredImageTest, LeavesAFilterUsableThatOutlivesIt) {
  auto session = std::make_unique<FilteredImage>(image, ImageMetadata{}, "",
                                                 defaultFilterConfigValue, factory);
  const auto filter = session->setupFilter("Recording", "");
  session.reset();
  Image<RGBA8Pixel> output(8, 6);
  filter->applyConfig("late", {}, output);
  EXPECT_EQ(output.data.get()[0], image->data.get()[0]);
}

TEST_F(FilteredImageTest, SharesTheSourceImageAndTheFactory) {
  const FilteredImage session(image, {}, "", defaultFilterConfigValue, factory);
  EXPECT_EQ(image.use_count(), 2);
  EXPECT_EQ(factory.use_count(), 2);
}

TEST_F(FilteredImageTest, MakesAtLeastOneFilterAndCachesOneWhenThreadsMissTogether) {
  // PassThrough keeps no record, so this also runs clean under a thread sanitizer.
  FilteredImage session(image, {}, "", defaultFilterConfigValue,
                        DefaultFilterFactory::filterFactory());
  std::vector<Image<RGBA8Pixel>> outputs;
  for (int i = 0; i < 8; ++i) outputs.emplace_back(8, 6);
  std::vector<std::thread> threads;
  for (auto& output : outputs) {
    threads.emplace_back([&session, &output] {
      for (int i = 0; i < 20; ++i) session.applyFilterWithParams("PassThrough", "", {}, output);
    });
  }
  for (std::thread& thread : threads) thread.join();
  for (const auto& output : outputs) EXPECT_EQ(fingerprint(output), fingerprint(*image));
  EXPECT_EQ(session.setupFilter("PassThrough", ""), session.setupFilter("PassThrough", ""));
}

/// Asks its session for another filter, from another thread, while it is made, initialised and
/// applied. A session that kept its lock would answer when that is over.
class AskingFilter : public AbstractFilter {
 public:
  explicit AskingFilter(std::shared_ptr<FilteredImageState> state)
      : AbstractFilter(std::move(state)) {
    ask("make");
  }
  void init(const std::string&) override { ask("init"); }
  void applyConfig(const std::string&, const FilterConfig&, Image<RGBA8Pixel>&) override {
    ask("apply");
  }

  static inline FilteredImage* session = nullptr;
  static inline std::vector<std::string> answered = {}, unanswered = {};

 private:
  void ask(const std::string& when) {
    auto asked = std::async(std::launch::async, [] { session->setupFilter("PassThrough", ""); });
    const bool inTime = asked.wait_for(std::chrono::seconds(10)) == std::future_status::ready;
    (inTime ? answered : unanswered).push_back(when);
    threads_.push_back(std::move(asked));
  }

  std::vector<std::future<void>> threads_;
};

TEST_F(FilteredImageTest, AnswersOthersWhileAFilterIsMadeInitialisedAndApplied) {
  ConcreteDescription<AskingFilter> asking("Asking", "", "");
  ConcreteDescription<PassThrough> passThrough("PassThrough", "", "");
  factory->addFilterDescription(&asking);
  factory->addFilterDescription(&passThrough);
  FilteredImage session(image, {}, "", defaultFilterConfigValue, factory);
  AskingFilter::session = &session;
  Image<RGBA8Pixel> output(8, 6);
  EXPECT_TRUE(session.applyFilterWithParams("Asking", "", {}, output));
  EXPECT_THAT(AskingFilter::answered, ElementsAre("make", "init", "apply"));
  EXPECT_THAT(AskingFilter::unanswered, IsEmpty());
}

/// The first of these has its session make another of the same name while it is initialised, as a
/// second thread would that misses it in the cache.
class RivalFilter : public PassThrough {
 public:
  using PassThrough::PassThrough;
  void init(const std::string&) override {
    if (rival != nullptr) return;
    rival = this;  // stands for one that is still to come
    rival = session->setupFilter("Rival", "").get();
  }

  static inline FilteredImage* session = nullptr;
  static inline const AbstractFilter* rival = nullptr;
};

TEST_F(FilteredImageTest, KeepsTheFilterStoredLastOfTwoThatMissedTogether) {
  ConcreteDescription<RivalFilter> description("Rival", "", "");
  factory->addFilterDescription(&description);
  FilteredImage session(image, {}, "", defaultFilterConfigValue, factory);
  RivalFilter::session = &session;
  const auto later = session.setupFilter("Rival", "");
  EXPECT_NE(later.get(), RivalFilter::rival) << "each gets its own";
  EXPECT_EQ(session.setupFilter("Rival", ""), later);
}

TEST(FilteredImage, PassThroughGivesACopyOfTheSource) {
  auto image = std::make_shared<Image<RGBA8Pixel>>(noisePicture(31, 17, 5));
  FilteredImage session(image, {}, "", defaultFilterConfigValue,
                        DefaultFilterFactory::filterFactory());
  Image<RGBA8Pixel> output(31, 17);
  EXPECT_TRUE(session.applyFilterWithParams("PassThrough", "", defaultFilterConfigValue, output));
  EXPECT_EQ(fingerprint(output), fingerprint(*image));
}

TEST(FilteredImage, ServesSeveralThreadsWithTheSameBytesAsOne) {
  auto image = std::make_shared<Image<RGBA8Pixel>>(photoLikePicture(120, 90, 7));
  const std::vector<std::string> filters = {"AE0", "AE08bit", "PassThrough"};
  const std::vector<std::string> params = {"slider=0.2;", "slider=0.9;"};
  const auto applied = [&](FilteredImage& session, std::size_t i) {
    Image<RGBA8Pixel> output(120, 90);
    session.applyFilterWithParams(filters[i % 3], params[i % 2], defaultFilterConfigValue, output);
    return fingerprint(output);
  };
  std::vector<std::string> expected;
  {
    FilteredImage alone(image, {}, "", defaultFilterConfigValue,
                        DefaultFilterFactory::filterFactory());
    for (std::size_t i = 0; i < 6; ++i) expected.push_back(applied(alone, i));
  }
  FilteredImage shared(image, {}, "", defaultFilterConfigValue,
                       DefaultFilterFactory::filterFactory());
  std::vector<std::string> results(24);
  std::vector<std::thread> threads;
  for (std::size_t t = 0; t < 4; ++t) {
    threads.emplace_back([&, t] {
      for (std::size_t i = t; i < results.size(); i += 4) results[i] = applied(shared, i);
    });
  }
  for (std::thread& thread : threads) thread.join();
  for (std::size_t i = 0; i < results.size(); ++i) EXPECT_EQ(results[i], expected[i % 6]) << i;
}

}  // namespace
}  // namespace pelorin::image_processing
