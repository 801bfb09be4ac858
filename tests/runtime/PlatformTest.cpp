// Path mapping, file errors, the fixed clock, and the short way of formatting amounts (the
// code page, date and number formats: testdata/calls/runtime_conversions.txt).
#include <gtest/gtest.h>

#include <random>

#include "droqbxml/qbxml/basValidations.hpp"
#include "droqbxml/runtime/Clock.hpp"
#include "droqbxml/runtime/FileSystem.hpp"
#include "droqbxml/runtime/Numbers.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

using test::raisesRuntime;

TEST(FileSystemTest, MapsDrivesAndBackslashes) {
  test::TemporaryDrive drive;
  EXPECT_EQ(mapPath(u"C:\\Program Files\\Orvanne"), drive.path("Program Files/Orvanne"));
  EXPECT_EQ(mapPath(u"c:/x"), drive.path("x"));
  EXPECT_EQ(mapPath(u"\\Logs\\a.txt"), drive.path("Logs/a.txt"));
  EXPECT_EQ(mapPath(u"/tmp/a"), std::filesystem::path("/tmp/a"));
  ::unsetenv("DROQBXML_DRIVE_Q");
  const std::string home = std::getenv("HOME") ? std::getenv("HOME") : ".";
  EXPECT_EQ(mapPath(u"Q:\\x"), std::filesystem::path(home) / ".local/share/droqbxml/drive_q/x");
}

TEST(FileSystemTest, RaisesThePlatformsFileErrors) {
  test::TemporaryDrive drive;
  createFolder(u"C:\\A");
  EXPECT_TRUE(std::filesystem::is_directory(drive.path("A")));
  EXPECT_TRUE(raisesRuntime([] { createFolder(u"C:\\A"); }, RuntimeError::kPathFileAccessError));
  EXPECT_TRUE(raisesRuntime([] { createFolder(u"C:\\B\\C"); }, RuntimeError::kPathNotFound));
  EXPECT_TRUE(raisesRuntime([] { createFolder(u""); }, RuntimeError::kBadFileNameOrNumber));
  EXPECT_TRUE(raisesRuntime([] { fileLength(u"C:\\none.txt"); }, RuntimeError::kFileNotFound));
  EXPECT_TRUE(raisesRuntime([] { TextFile(u"C:\\B\\x.txt", OpenMode::Append); },
                            RuntimeError::kPathNotFound));
  EXPECT_TRUE(raisesRuntime([] { TextFile(u"C:\\A", OpenMode::Append); },
                            RuntimeError::kPathFileAccessError));
  TextFile file(u"C:\\A\\x.txt", OpenMode::Overwrite);
  file.write(u"caf\u00e9\r\n");
  file.close();
  EXPECT_TRUE(raisesRuntime([&] { file.write(u"x"); }, RuntimeError::kBadFileNameOrNumber));
  EXPECT_EQ(test::readFile(drive.path("A/x.txt")), "caf\xC3\xA9\r\n");
  EXPECT_EQ(fileLength(u"C:\\A\\x.txt"), 7);
}

TEST(FileSystemTest, FileNumbersRunOutAt511) {
  std::vector<FileNumber> held;
  for (int i = 0; i < 511; ++i) held.push_back(FileNumber::take());
  EXPECT_EQ(held.front().value(), 1);
  EXPECT_EQ(held.back().value(), 511);
  EXPECT_EQ(FileNumber::take().value(), 0);
  held.erase(held.begin() + 4);
  EXPECT_EQ(FileNumber::take().value(), 5);
}

TEST(ClockTest, TheFixedClock) {
  {
    ScopedClock fixed({2001, 2, 3, 4, 5, 6});
    EXPECT_EQ(now(), (LocalTime{2001, 2, 3, 4, 5, 6}));
  }
  EXPECT_NE(now().year, 2001);
}

// Random plain numbers: up to `digits` integer digits (leading zeros too), then "." and
// up to `decimals` decimals, or no point.
Text plainNumber(std::mt19937& random, unsigned digits, int decimals) {
  Text text;
  for (auto n = 1 + random() % digits; n > 0; --n) text += char16_t(u'0' + random() % 10);
  if (const auto fraction = random() % (decimals + 1); fraction > 0) {
    text += u'.';
    for (auto k = fraction; k > 0; --k) text += char16_t(u'0' + random() % 10);
  }
  return text;
}

// Plain texts are formatted, converted and checked without the trip through a Double or a
// Currency: the same as with it.
TEST(NumbersTest, PlainNumbersReadAsThroughADouble) {
  using namespace basValidations;
  std::mt19937 random(11);
  for (int round = 0; round < 20000; ++round) {
    const int decimals = round % 2 == 0 ? 2 : 5;
    const Text text = plainNumber(random, 16 - decimals, decimals);
    const Text plain = formatFixed(text, decimals);
    ASSERT_EQ(plain, formatFixed(textToDouble(text), decimals)) << toUtf8(text);
    const Text small = plainNumber(random, 12, decimals);
    if (decimals == 2 && textToDouble(small) < 1e8) {
      ASSERT_EQ(CheckAMTTYPE(small), formatFixed(textToDouble(small), 2)) << toUtf8(small);
    } else if (decimals == 2) {
      ASSERT_THROW(CheckAMTTYPE(small), ComError) << toUtf8(small);
    }
    if (plainIntegerDigits(small) <= 10) {
      ASSERT_EQ(CheckPRICETYPE(small),
                formatFixed(textToDouble(currencyToText(textToCurrency(small))), 5));
    } else {
      ASSERT_THROW(CheckPRICETYPE(small), ComError) << toUtf8(small);
    }
    if (const double number = textToDouble(small); number < 1e7) {
      ASSERT_EQ(CheckQUANTYPE(small), formatFixed(number, 5)) << toUtf8(small);
    } else {
      ASSERT_THROW(CheckQUANTYPE(small), ComError) << toUtf8(small);
    }
    const Text digits = plainNumber(random, 10, 0);
    if (const double number = textToDouble(digits); number <= 2147483647) {
      ASSERT_EQ(textToLong(digits), doubleToLong(number)) << toUtf8(digits);
      ASSERT_EQ(CheckINTTYPE(digits, 0, 0, 0), asciiText(std::to_string(doubleToLong(number))));
    }
  }
}

}  // namespace
}  // namespace droqbxml
