// Trace output and its one-open-file rule.
#include <gtest/gtest.h>

#include "droqbxml/component/ClassFactory.hpp"
#include "droqbxml/component/basGlobals.hpp"
#include "droqbxml/diagnostics/clsMyErr.hpp"
#include "droqbxml/diagnostics/clsTrace.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml {
namespace {

using test::raises;
using test::readFile;

constexpr TextView kFile = u"C:\\trace.txt";

bool raisesSecondFile(const std::function<void()>& body) {
  return raises(body, TOO_MANY_OPEN_TRACE_FILES, u"clsTrace.FileOpen",
                u"Cannot have more than one Trace file open at the same time.");
}

TEST(clsTraceTest, AppendsAndOverwritesLines) {
  test::TemporaryDrive drive;
  clsTrace trace;
  EXPECT_TRUE(trace.Trace(u"one", eOutToFile, Text(kFile), eAppend, true));
  EXPECT_TRUE(trace.Trace(u"two\t\u00e9", eOutToFile, Text(kFile), eAppend, true));
  EXPECT_EQ(readFile(drive.path("trace.txt")), "one\r\ntwo\t\xC3\xA9\r\n");
  EXPECT_TRUE(trace.Trace(u"only", eOutToFile, Text(kFile), eOverWrite, true));
  EXPECT_EQ(readFile(drive.path("trace.txt")), "only\r\n");
}

TEST(clsTraceTest, AFileLeftOpenRefusesTheNextFileTrace) {
  test::TemporaryDrive drive;
  basGlobals::SharedErrorObject()->Clear();
  clsTrace trace;
  EXPECT_TRUE(trace.Trace(u"kept open", eOutToFile, Text(kFile)));
  // Deliberately strict: even the same file is refused until a call closes it.
  EXPECT_TRUE(raisesSecondFile([&] { trace.Trace(u"x", eOutToFile, Text(kFile), eAppend, true); }));
  EXPECT_EQ(basGlobals::SharedErrorObject()->Number(), 0);  // raised directly
  EXPECT_EQ(readFile(drive.path("trace.txt")), "kept open\r\n");
  clsTrace other;  // the rule is per object
  EXPECT_TRUE(other.Trace(u"other", eOutToFile, u"C:\\other.txt", eAppend, true));
}

TEST(clsTraceTest, FileFailuresLeaveTheObjectMarkedOpen) {
  test::TemporaryDrive drive;
  clsTrace badAction;
  EXPECT_TRUE(test::raisesRuntime(
      [&] {
        badAction.Trace(u"x", eOutToFile, Text(kFile), static_cast<eudTraceFileAction>(7), true);
      },
      RuntimeError::kBadFileNameOrNumber));
  EXPECT_TRUE(
      raisesSecondFile([&] { badAction.Trace(u"x", eOutToFile, Text(kFile), eAppend, true); }));

  clsTrace noName;
  EXPECT_TRUE(test::raisesRuntime([&] { noName.Trace(u"x", eOutToFile); },
                                  RuntimeError::kBadFileNameOrNumber));
  clsTrace noFolder;
  EXPECT_TRUE(test::raisesRuntime(
      [&] { noFolder.Trace(u"x", eOutToFile, u"C:\\none\\t.txt", eAppend, true); },
      RuntimeError::kPathNotFound));
}

// By name, with the arguments left out: stream 0 (debug) writes nothing, 2 is no stream.
TEST(clsTraceTest, ReachableByNameWithDefaults) {
  test::TemporaryDrive drive;
  const auto trace = CreateObject(u"DroQbXml.clsTrace");
  EXPECT_TRUE(trace->call(u"Trace", {u"x", 0}).toBoolean());
  EXPECT_TRUE(trace->call(u"Trace", {u"line", 1, u"C:\\t.txt", 0, true}).toBoolean());
  EXPECT_EQ(readFile(drive.path("t.txt")), "line\r\n");
  EXPECT_FALSE(trace->call(u"Trace", {u"x", 2}).toBoolean());
}

}  // namespace
}  // namespace droqbxml
