// Local time from the C library, civil-date arithmetic, and the fixed-English formats.
#include "droqbxml/runtime/Clock.hpp"

#include <array>
#include <cmath>
#include <cstdio>
#include <ctime>
#include <string>

namespace droqbxml {
namespace {

thread_local std::optional<LocalTime> fixedClock;

constexpr std::array<const char*, 7> kDays{"Sun", "Mon", "Tue", "Wed", "Thu", "Fri", "Sat"};
constexpr std::array<const char*, 12> kMonths{"Jan", "Feb", "Mar", "Apr", "May", "Jun",
                                              "Jul", "Aug", "Sep", "Oct", "Nov", "Dec"};

const int64_t kOleEpochDays = -25569;  // 1899-12-30

int32_t hour12(int32_t hour) {
  const int32_t h = hour % 12;
  return h == 0 ? 12 : h;
}

Text ascii(const std::string& s) { return asciiText(s); }

}  // namespace

int64_t daysFromCivil(int64_t y, int32_t m, int32_t d) {
  y -= m <= 2;
  const int64_t era = (y >= 0 ? y : y - 399) / 400;
  const int64_t yoe = y - era * 400;
  const int64_t doy = (153 * (m + (m > 2 ? -3 : 9)) + 2) / 5 + d - 1;
  const int64_t doe = yoe * 365 + yoe / 4 - yoe / 100 + doy;
  return era * 146097 + doe - 719468;
}

void civilFromDays(int64_t z, int32_t& year, int32_t& month, int32_t& day) {
  z += 719468;
  const int64_t era = (z >= 0 ? z : z - 146096) / 146097;
  const int64_t doe = z - era * 146097;
  const int64_t yoe = (doe - doe / 1460 + doe / 36524 - doe / 146096) / 365;
  const int64_t doy = doe - (365 * yoe + yoe / 4 - yoe / 100);
  const int64_t mp = (5 * doy + 2) / 153;
  day = static_cast<int32_t>(doy - (153 * mp + 2) / 5 + 1);
  month = static_cast<int32_t>(mp < 10 ? mp + 3 : mp - 9);
  year = static_cast<int32_t>(yoe + era * 400 + (month <= 2));
}

LocalTime now() {
  if (fixedClock) return *fixedClock;
  const std::time_t t = std::time(nullptr);
  std::tm parts{};
#ifdef _WIN32
  localtime_s(&parts, &t);
#else
  localtime_r(&t, &parts);
#endif
  return LocalTime{parts.tm_year + 1900, parts.tm_mon + 1, parts.tm_mday,
                   parts.tm_hour,        parts.tm_min,     parts.tm_sec};
}

ScopedClock::ScopedClock(LocalTime fixed) : previous_(fixedClock) { fixedClock = fixed; }
ScopedClock::~ScopedClock() { fixedClock = previous_; }

int32_t weekday(const LocalTime& time) {
  const int64_t days = daysFromCivil(time.year, time.month, time.day);
  // 1970-01-01 was a Thursday.
  return static_cast<int32_t>(((days % 7) + 7 + 4) % 7);
}

Text formatLongDateTime(const LocalTime& time) {
  std::array<char, 64> buffer{};
  const int month = time.month >= 1 && time.month <= 12 ? time.month - 1 : 0;
  std::snprintf(buffer.data(), buffer.size(), "%s %s %02d, %04d  %02d:%02d:%02d %s",
                kDays[static_cast<size_t>(weekday(time))], kMonths[static_cast<size_t>(month)],
                time.day, time.year, hour12(time.hour), time.minute, time.second,
                time.hour < 12 ? "AM" : "PM");
  return ascii(buffer.data());
}

Text formatIsoDateTime(const LocalTime& time) {
  std::array<char, 64> buffer{};
  std::snprintf(buffer.data(), buffer.size(), "%04d-%02d-%02d %02d:%02d:%02d", time.year,
                time.month, time.day, time.hour, time.minute, time.second);
  return ascii(buffer.data());
}

Text formatShortDateTime(const LocalTime& time) {
  std::array<char, 64> buffer{};
  std::snprintf(buffer.data(), buffer.size(), "%d/%d/%d", time.month, time.day, time.year);
  std::string out = buffer.data();
  if (time.hour != 0 || time.minute != 0 || time.second != 0) {
    std::snprintf(buffer.data(), buffer.size(), " %d:%02d:%02d %s", hour12(time.hour), time.minute,
                  time.second, time.hour < 12 ? "AM" : "PM");
    out += buffer.data();
  }
  return ascii(out);
}

LocalTime fromOleDate(double oleDate) {
  if (!std::isfinite(oleDate)) return kZeroDate;
  const double wholeDays = std::trunc(oleDate);
  // Seconds of the day, rounded; the time part of a negative date counts forward too.
  auto seconds = static_cast<int64_t>(std::llround(std::fabs(oleDate - wholeDays) * 86400.0));
  auto days = static_cast<int64_t>(wholeDays);
  if (seconds >= 86400) {
    seconds -= 86400;
    days += oleDate < 0 ? -1 : 1;
  }
  LocalTime time;
  civilFromDays(kOleEpochDays + days, time.year, time.month, time.day);
  time.hour = static_cast<int32_t>(seconds / 3600);
  time.minute = static_cast<int32_t>((seconds / 60) % 60);
  time.second = static_cast<int32_t>(seconds % 60);
  return time;
}

double toOleDate(const LocalTime& time) {
  const auto days =
      static_cast<double>(daysFromCivil(time.year, time.month, time.day) - kOleEpochDays);
  const double fraction = (time.hour * 3600.0 + time.minute * 60.0 + time.second) / 86400.0;
  return days >= 0 ? days + fraction : days - fraction;
}

}  // namespace droqbxml
