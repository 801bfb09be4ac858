// The present local date and time, and the date formats the logs and dates use. Names of
// days and months are English whatever the process locale. The clock can be fixed for the
// current thread (ScopedClock), so that log files can be compared byte for byte.
#ifndef DROQBXML_RUNTIME_CLOCK_HPP_
#define DROQBXML_RUNTIME_CLOCK_HPP_

#include <cstdint>
#include <optional>

#include "droqbxml/runtime/Text.hpp"

namespace droqbxml {

struct LocalTime {
  int32_t year = 1899;
  int32_t month = 12;
  int32_t day = 30;
  int32_t hour = 0;
  int32_t minute = 0;
  int32_t second = 0;

  bool operator==(const LocalTime&) const = default;
};

// The zero date of the platform, 1899-12-30 00:00:00.
inline constexpr LocalTime kZeroDate{};

// The present local time, or the time fixed for this thread by a ScopedClock.
LocalTime now();

// Fixes now() for the current thread while it lives.
class ScopedClock {
 public:
  explicit ScopedClock(LocalTime fixed);
  ~ScopedClock();
  ScopedClock(const ScopedClock&) = delete;
  ScopedClock& operator=(const ScopedClock&) = delete;

 private:
  std::optional<LocalTime> previous_;
};

// 0 = Sunday ... 6 = Saturday.
int32_t weekday(const LocalTime& time);

// "ddd mmm dd, yyyy  hh:nn:ss AM/PM": "Sun Nov 15, 2026  12:24:51 AM" (two blanks).
Text formatLongDateTime(const LocalTime& time);
// "yyyy-mm-dd hh:nn:ss" on the 24-hour clock.
Text formatIsoDateTime(const LocalTime& time);
// The en-US short form of a date value: "11/15/2026 12:24:51 AM", the time left out at
// midnight.
Text formatShortDateTime(const LocalTime& time);

// Days since 1970-01-01 of a date of the proleptic Gregorian calendar, and back.
int64_t daysFromCivil(int64_t year, int32_t month, int32_t day);
void civilFromDays(int64_t days, int32_t& year, int32_t& month, int32_t& day);

// Dates as the platform keeps them: days since 1899-12-30, the time as the fraction.
LocalTime fromOleDate(double oleDate);
double toOleDate(const LocalTime& time);

}  // namespace droqbxml

#endif  // DROQBXML_RUNTIME_CLOCK_HPP_
