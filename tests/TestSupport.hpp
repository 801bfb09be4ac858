// Helpers shared by the test suites: raised-error assertions, readable text, temporary
// drive folders and file reading.
#ifndef DROQBXML_TESTS_TESTSUPPORT_HPP_
#define DROQBXML_TESTS_TESTSUPPORT_HPP_

#include <gtest/gtest.h>
#include <unistd.h>

#include <cstdint>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <functional>
#include <iterator>
#include <optional>
#include <ostream>
#include <string>
#include <utility>

#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Text.hpp"
#include "droqbxml/runtime/Utf.hpp"

namespace droqbxml {

// Lets GoogleTest print 16-bit text in failure messages.
inline void PrintTo(const Text& text, std::ostream* os) { *os << '"' << toUtf8(text) << '"'; }

namespace test {

// Asserts that `body` raises a ComError with exactly this number, source and description.
inline ::testing::AssertionResult raises(const std::function<void()>& body, int32_t number,
                                         TextView source, TextView description) {
  try {
    body();
  } catch (const ComError& error) {
    if (error.number() == number && error.source() == source &&
        error.description() == description) {
      return ::testing::AssertionSuccess();
    }
    return ::testing::AssertionFailure()
           << "raised " << error.number() << " from \"" << toUtf8(error.source()) << "\": \""
           << toUtf8(error.description()) << "\"";
  }
  return ::testing::AssertionFailure() << "nothing was raised";
}

// Asserts that `body` raises a value check's refusal: number, source
// "DroQbXml.basValidations." + check, and the checks' one message with `shown` and
// `typeWords` in it.
inline ::testing::AssertionResult raisesRefusal(const std::function<void()>& body, int32_t number,
                                                TextView check, TextView shown,
                                                TextView typeWords) {
  return raises(body, number, Text(u"DroQbXml.basValidations.") + Text(check),
                Text(u"The value '") + Text(shown) + u"' is not an allowable " + Text(typeWords) +
                    u" value.  Please refer to the qbXML specifications.");
}

// Asserts that `body` raises the runtime's error `number` (source "DroQbXml").
inline ::testing::AssertionResult raisesRuntime(const std::function<void()>& body, int32_t number) {
  return raises(body, number, u"DroQbXml", runtimeErrorDescription(number));
}

// A fresh folder standing for drive C: for the life of the object (DROQBXML_DRIVE_C).
class TemporaryDrive {
 public:
  TemporaryDrive() {
    const auto* info = ::testing::UnitTest::GetInstance()->current_test_info();
    root_ = std::filesystem::temp_directory_path() /
            ("droqbxml-test-" + std::to_string(::getpid()) + "-" +
             (info ? std::string(info->test_suite_name()) + "." + info->name() : "x"));
    std::filesystem::remove_all(root_);
    std::filesystem::create_directories(root_);
    if (const char* old = std::getenv("DROQBXML_DRIVE_C")) previous_ = old;
    ::setenv("DROQBXML_DRIVE_C", root_.c_str(), 1);
  }
  ~TemporaryDrive() {
    if (previous_) {
      ::setenv("DROQBXML_DRIVE_C", previous_->c_str(), 1);
    } else {
      ::unsetenv("DROQBXML_DRIVE_C");
    }
    std::error_code ignored;
    std::filesystem::remove_all(root_, ignored);
  }
  TemporaryDrive(const TemporaryDrive&) = delete;
  TemporaryDrive& operator=(const TemporaryDrive&) = delete;

  // The file-system path of a path below the drive, given with "/" separators.
  std::filesystem::path path(const std::string& below) const { return root_ / below; }

 private:
  std::filesystem::path root_;
  std::optional<std::string> previous_;
};

inline std::string readFile(const std::filesystem::path& path) {
  std::ifstream in(path, std::ios::binary);
  return std::string(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
}

inline void writeFile(const std::filesystem::path& path, const std::string& bytes) {
  std::ofstream out(path, std::ios::binary | std::ios::trunc);
  out << bytes;
}

// Compares a text with the golden file tests/testdata/<name> (UTF-8, bytes exact: CR LF and
// TABs included). With DROQBXML_WRITE_GOLDENS=1 it writes the file instead and fails, so a
// new or changed golden is read by a person before it is committed.
inline ::testing::AssertionResult matchesGolden(const Text& text, const std::string& name) {
  const std::filesystem::path path = std::filesystem::path(DROQBXML_TESTDATA_DIR) / name;
  if (const char* write = std::getenv("DROQBXML_WRITE_GOLDENS"); write && *write == '1') {
    writeFile(path, toUtf8(text));
    return ::testing::AssertionFailure() << "wrote " << path;
  }
  if (!std::filesystem::exists(path)) return ::testing::AssertionFailure() << "no " << path;
  const std::string expected = readFile(path);
  if (expected == toUtf8(text)) return ::testing::AssertionSuccess();
  return ::testing::AssertionFailure() << "differs from " << path << ":\n" << toUtf8(text);
}

// A response file of ../shared/qbxml/responses, or "" when the shared folder is absent.
inline Text sharedResponse(const std::string& name) {
  return fromUtf8(readFile(std::string(DROQBXML_SHARED_DIR) + "/qbxml/responses/" + name));
}

}  // namespace test
}  // namespace droqbxml

#endif  // DROQBXML_TESTS_TESTSUPPORT_HPP_
