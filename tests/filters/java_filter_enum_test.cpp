#include <gtest/gtest.h>

#include <fstream>
#include <map>
#include <regex>
#include <sstream>
#include <string>

#include "image_processing/filters/default_filter_factory.h"

namespace pelorin::image_processing {
namespace {

TEST(JavaFilterEnum, HasEveryFilterOfTheRegistryAndNoOther) {
  std::ifstream file(FILTER_JAVA);
  ASSERT_TRUE(file) << FILTER_JAVA;
  std::stringstream text;
  text << file.rdbuf();
  const std::string source = text.str();

  std::map<std::string, std::string> inJava, inRegistry;
  const std::regex constant("\\b[A-Z][A-Z0-9_]*\\(\"([^\"]*)\", \"([^\"]*)\", [^)]*\\)[,;]");
  for (std::sregex_iterator it(source.begin(), source.end(), constant), end; it != end; ++it) {
    EXPECT_TRUE(inJava.emplace((*it)[1], (*it)[2]).second) << (*it)[1] << " is there twice";
  }
  for (const auto& [name, filter] : DefaultFilterFactory::filterFactory()->descriptions) {
    inRegistry[name] = filter->displayName;
  }
  EXPECT_EQ(inJava, inRegistry);
}

}  // namespace
}  // namespace pelorin::image_processing
