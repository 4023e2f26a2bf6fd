#include "paths/normalize_directory_text.h"

#include <gtest/gtest.h>

#include <string>
#include <utility>

namespace {

TEST(NormalizeDirectoryText, Table) {
  const std::pair<std::string, std::string> cases[] = {
      {"/var/lib", "/var/lib"},
      {"/var/lib/", "/var/lib"},
      {"/var/lib//\n", "/var/lib"},
      {"/var/lib/ \t\r\n/", "/var/lib"},
      {std::string("/opt/x/\0\0", 9), "/opt/x"},
      {"  \t/opt/x", "/opt/x"},
      {" /opt/ x /", "/opt/ x"},
      {"/", ""},
      {"//", ""},
      {" \n/\t", ""},
      {"", ""},
      // Only white space leaves the start: a leading slash stays.
      {"//double", "//double"},
      {"\v\fa\v", "a"},
  };
  for (const auto &c : cases) {
    std::string text = c.first;
    ovsysq::NormalizeDirectoryText(text);
    EXPECT_EQ(text, c.second) << "input [" << c.first << "]";
  }
}

}  // namespace
