// Tables of steps under tests/testdata: one step a line, then " => " and what it gives;
// lines starting with '#' and empty lines are kept as they are. A runner supplies what one
// step gives; runTable checks every line and, with DROQBXML_WRITE_GOLDENS=1, rewrites the
// table with what the steps gave. Texts are quoted with \t \r \n \" \\ (and \xHH).
#ifndef DROQBXML_TESTS_TABLESUPPORT_HPP_
#define DROQBXML_TESTS_TABLESUPPORT_HPP_

#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <functional>
#include <sstream>
#include <string>
#include <string_view>

#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Utf.hpp"
#include "tests/TestSupport.hpp"

namespace droqbxml::test {

// Where the quoted text opening at `at` ends (one past its closing quote).
inline size_t afterQuoted(const std::string& text, size_t at) {
  for (++at; text[at] != '"'; ++at) at += text[at] == '\\' ? 1 : 0;
  return at + 1;
}

// The bytes in quotes; with `hex`, bytes outside printable ASCII as \xHH.
inline std::string quoted(std::string_view bytes, bool hex) {
  std::string out = "\"";
  for (const char c : bytes) {
    const auto b = static_cast<unsigned char>(c);
    const char* escape = c == '\t' ? "\\t" : c == '\r' ? "\\r" : c == '\n' ? "\\n" : nullptr;
    char code[8];
    std::snprintf(code, sizeof code, "\\x%02X", b);
    out += escape                          ? escape
           : c == '"' || c == '\\'         ? std::string{'\\', c}
           : hex && (b < 0x20 || b > 0x7E) ? code
                                           : std::string(1, c);
  }
  return out + "\"";
}

// Undoes quoted(); a token without quotes is given back as it is.
inline std::string unquoted(const std::string& token) {
  if (token.empty() || token.front() != '"') return token;
  std::string value;
  for (size_t i = 1; i + 1 < token.size(); ++i) {
    if (token[i] != '\\') {
      value += token[i];
    } else if (const char c = token[++i]; c == 'x') {
      value += static_cast<char>(std::stoi(token.substr(i + 1, 2), nullptr, 16));
      i += 2;
    } else {
      value += c == 't' ? '\t' : c == 'r' ? '\r' : c == 'n' ? '\n' : c;
    }
  }
  return value;
}

// "error NUMBER SOURCE: DESCRIPTION", the number in hexadecimal when negative.
inline std::string errorOutcome(const ComError& error, bool hex) {
  char number[16];
  std::snprintf(number, sizeof number, error.number() < 0 ? "0x%08X" : "%d", error.number());
  const std::string description = quoted(toUtf8(error.description()), hex);
  return std::string("error ") + number + " " + toUtf8(error.source()) + ": " +
         description.substr(1, description.size() - 2);
}

// Runs testdata/<name>: `outcome(step)` for every step, compared line by line; an empty
// outcome stands for a step written without one.
inline void runTable(const std::string& name,
                     const std::function<std::string(const std::string&)>& outcome) {
  const std::string path = std::string(DROQBXML_TESTDATA_DIR) + "/" + name;
  std::istringstream lines(readFile(path));
  std::string table;
  std::string line;
  for (int number = 1; std::getline(lines, line); ++number) {
    size_t arrow = 0;
    while (arrow < line.size() && line.compare(arrow, 3, " =>") != 0) {
      arrow = line[arrow] == '"' ? afterQuoted(line, arrow) : arrow + 1;
    }
    const std::string step = line.substr(0, arrow);
    const bool kept = line.empty() || line[0] == '#';
    const std::string got = kept ? "" : outcome(step);
    const std::string rewritten = kept ? line : got.empty() ? step : step + " => " + got;
    EXPECT_EQ(line, rewritten) << name << ":" << number;
    table += rewritten + "\n";
  }
  if (const char* write = std::getenv("DROQBXML_WRITE_GOLDENS"); write && *write == '1') {
    writeFile(path, table);
  }
}

}  // namespace droqbxml::test

#endif  // DROQBXML_TESTS_TABLESUPPORT_HPP_
