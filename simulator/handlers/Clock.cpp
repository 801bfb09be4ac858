// Civil dates from day counts (and back) on the proleptic Gregorian calendar, the local
// offset from the C library or from DROQBXML_SIMULATOR_NOW.
#include "simulator/handlers/Clock.hpp"

#include <cstdio>
#include <cstdlib>
#include <ctime>

#include "droqbxml/runtime/Clock.hpp"

namespace droqbxml::simulator::handlers {
namespace {

struct CivilTime {
  int year = 0, month = 0, day = 0, hour = 0, minute = 0, second = 0;
  std::optional<int> offsetSeconds;  // present when the text carried one
  bool hasTime = false;
};

bool digits(std::string_view text, size_t at, size_t count, int& value) {
  if (at + count > text.size()) return false;
  value = 0;
  for (size_t i = at; i < at + count; ++i) {
    if (text[i] < '0' || text[i] > '9') return false;
    value = value * 10 + (text[i] - '0');
  }
  return true;
}

int daysInMonth(int year, int month) {
  static constexpr int kDays[] = {31, 28, 31, 30, 31, 30, 31, 31, 30, 31, 30, 31};
  const bool leap = (year % 4 == 0 && year % 100 != 0) || year % 400 == 0;
  return month == 2 && leap ? 29 : kDays[month - 1];
}

// "yyyy-mm-dd", optionally "Thh:mm:ss", optionally "+hh:mm" or "-hh:mm".
std::optional<CivilTime> parseCivil(std::string_view text) {
  CivilTime civil;
  if (!digits(text, 0, 4, civil.year) || text.size() < 10 || text[4] != '-' ||
      !digits(text, 5, 2, civil.month) || text[7] != '-' || !digits(text, 8, 2, civil.day)) {
    return std::nullopt;
  }
  if (civil.month < 1 || civil.month > 12 || civil.day < 1 ||
      civil.day > daysInMonth(civil.year, civil.month)) {
    return std::nullopt;
  }
  size_t at = 10;
  if (at < text.size() && text[at] == 'T') {
    if (!digits(text, at + 1, 2, civil.hour) || text.size() < at + 9 || text[at + 3] != ':' ||
        !digits(text, at + 4, 2, civil.minute) || text[at + 6] != ':' ||
        !digits(text, at + 7, 2, civil.second) || civil.hour > 23 || civil.minute > 59 ||
        civil.second > 59) {
      return std::nullopt;
    }
    civil.hasTime = true;
    at += 9;
  }
  if (at < text.size() && (text[at] == '+' || text[at] == '-')) {
    int hours = 0;
    int minutes = 0;
    if (!digits(text, at + 1, 2, hours) || text.size() < at + 6 || text[at + 3] != ':' ||
        !digits(text, at + 4, 2, minutes)) {
      return std::nullopt;
    }
    civil.offsetSeconds = (text[at] == '-' ? -1 : 1) * (hours * 3600 + minutes * 60);
    at += 6;
  }
  if (at != text.size()) return std::nullopt;
  return civil;
}

int64_t secondsOf(const CivilTime& civil) {
  return daysFromCivil(civil.year, civil.month, civil.day) * 86400 + civil.hour * 3600 +
         civil.minute * 60 + civil.second;
}

// The present and offset DROQBXML_SIMULATOR_NOW fixes, if it holds a full date and time.
std::optional<CivilTime> fixedNow() {
  const char* value = std::getenv("DROQBXML_SIMULATOR_NOW");
  if (value == nullptr) return std::nullopt;
  auto civil = parseCivil(value);
  if (!civil || !civil->hasTime) return std::nullopt;
  if (!civil->offsetSeconds) civil->offsetSeconds = 0;
  return civil;
}

int localOffsetAt(int64_t unixTime) {
  if (const auto fixed = fixedNow()) return *fixed->offsetSeconds;
  const auto moment = static_cast<std::time_t>(unixTime);
  std::tm local{};
  localtime_r(&moment, &local);
  return static_cast<int>(local.tm_gmtoff);
}

}  // namespace

int64_t currentTime() {
  if (const auto fixed = fixedNow()) return secondsOf(*fixed) - *fixed->offsetSeconds;
  return static_cast<int64_t>(std::time(nullptr));
}

std::string formatDateTime(int64_t unixTime) {
  const int offset = localOffsetAt(unixTime);
  const int64_t local = unixTime + offset;
  const int64_t days = (local >= 0 ? local : local - 86399) / 86400;
  const auto secondOfDay = static_cast<int>(local - days * 86400);
  int year = 0;
  int month = 0;
  int day = 0;
  civilFromDays(days, year, month, day);
  const int magnitude = offset < 0 ? -offset : offset;
  if (year < 0 || year > 9999 || magnitude / 3600 > 99) {
    char text[40];
    std::snprintf(text, sizeof text, "%04d-%02d-%02dT%02d:%02d:%02d%c%02d:%02d", year, month, day,
                  secondOfDay / 3600, secondOfDay / 60 % 60, secondOfDay % 60,
                  offset < 0 ? '-' : '+', magnitude / 3600, magnitude / 60 % 60);
    return text;
  }
  // "yyyy-mm-ddThh:mm:ss+hh:mm", written digit by digit: a query writes one per record.
  std::string text = "0000-00-00T00:00:00+00:00";
  const auto put = [&](size_t at, int value, int width) {
    for (size_t end = at + static_cast<size_t>(width); end > at; value /= 10) {
      text[--end] = static_cast<char>('0' + value % 10);
    }
  };
  put(0, year, 4);
  put(5, month, 2);
  put(8, day, 2);
  put(11, secondOfDay / 3600, 2);
  put(14, secondOfDay / 60 % 60, 2);
  put(17, secondOfDay % 60, 2);
  text[19] = offset < 0 ? '-' : '+';
  put(20, magnitude / 3600, 2);
  put(23, magnitude / 60 % 60, 2);
  return text;
}

std::string formatDate(int64_t unixTime) { return formatDateTime(unixTime).substr(0, 10); }

std::optional<int64_t> parseDateTime(std::string_view text, bool endOfDay) {
  auto civil = parseCivil(text);
  if (!civil) return std::nullopt;
  if (!civil->hasTime && endOfDay) {
    civil->hour = 23;
    civil->minute = 59;
    civil->second = 59;
  }
  const int64_t wallClock = secondsOf(*civil);
  if (civil->offsetSeconds) return wallClock - *civil->offsetSeconds;
  // Local time: the offset in force at that wall-clock moment (checked once more after the
  // first guess, which matters only around a change of daylight-saving time).
  int64_t guess = wallClock - localOffsetAt(wallClock);
  guess = wallClock - localOffsetAt(guess);
  return guess;
}

}  // namespace droqbxml::simulator::handlers
