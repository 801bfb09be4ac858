// Code page, path mapping, clock formats and file errors.
#include <gtest/gtest.h>

#include "droqbxml/runtime/Clock.hpp"
#include "droqbxml/runtime/Codepage.hpp"
#include "droqbxml/runtime/FileSystem.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

using test::raisesRuntime;

TEST(CodepageTest, UsesWindows1252) {
  EXPECT_EQ(ansiCode(u'A'), 65);
  EXPECT_EQ(ansiCode(u'\u20ac'), 128);
  EXPECT_EQ(ansiCode(u'\u00e9'), 233);
  EXPECT_EQ(ansiCode(u'\u0081'), 0x81);
  EXPECT_EQ(ansiCode(u'\u4e2d'), 63);
  EXPECT_EQ(ansiCode(u'\u0080'), 63);  // not in cp1252: 0x80 is the euro sign
  EXPECT_EQ(ansiChar(128), u'\u20ac');
  EXPECT_EQ(ansiChar(0x9d), u'\u009d');
  EXPECT_TRUE(raisesRuntime([] { ansiChar(256); }, RuntimeError::kInvalidProcedureCall));
  EXPECT_EQ(unicodeChar(-1), u'\uffff');
  EXPECT_TRUE(raisesRuntime([] { unicodeChar(65536); }, RuntimeError::kInvalidProcedureCall));
}

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

TEST(ClockTest, FormatsOleDatesAndTheFixedClock) {
  EXPECT_EQ(formatLongDateTime({2026, 11, 15, 0, 24, 51}), u"Sun Nov 15, 2026  12:24:51 AM");
  EXPECT_EQ(formatLongDateTime({2024, 2, 29, 13, 5, 9}), u"Thu Feb 29, 2024  01:05:09 PM");
  EXPECT_EQ(formatLongDateTime({2026, 1, 5, 12, 0, 0}), u"Mon Jan 05, 2026  12:00:00 PM");
  EXPECT_EQ(formatIsoDateTime({2026, 11, 15, 13, 5, 9}), u"2026-11-15 13:05:09");
  EXPECT_EQ(formatIsoDateTime(kZeroDate), u"1899-12-30 00:00:00");
  EXPECT_EQ(fromOleDate(0), kZeroDate);
  EXPECT_EQ(fromOleDate(46341.75), (LocalTime{2026, 11, 15, 18, 0, 0}));
  EXPECT_EQ(fromOleDate(-1.25), (LocalTime{1899, 12, 29, 6, 0, 0}));
  EXPECT_DOUBLE_EQ(toOleDate({1899, 12, 29, 6, 0, 0}), -1.25);
  EXPECT_DOUBLE_EQ(toOleDate({2026, 11, 15, 18, 0, 0}), 46341.75);
  {
    ScopedClock fixed({2001, 2, 3, 4, 5, 6});
    EXPECT_EQ(now(), (LocalTime{2001, 2, 3, 4, 5, 6}));
  }
  EXPECT_NE(now().year, 2001);
}

}  // namespace
}  // namespace droqbxml
