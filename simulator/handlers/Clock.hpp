// The stand-in's clock: the present moment and the local time QuickBooks writes
// (TimeCreated "2009-03-02T10:40:23-05:00", dates "2009-03-02"). When the environment
// variable DROQBXML_SIMULATOR_NOW holds such a date and time, that is the present for every
// request, and its offset is the local offset for every time written.
#ifndef DROQBXML_SIMULATOR_HANDLERS_CLOCK_HPP_
#define DROQBXML_SIMULATOR_HANDLERS_CLOCK_HPP_

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace droqbxml::simulator::handlers {

// Seconds since 1970-01-01 00:00:00 UTC.
int64_t currentTime();

// The local date and time with its offset, as QuickBooks writes TimeCreated.
std::string formatDateTime(int64_t unixTime);
// The local date of that moment, "yyyy-mm-dd".
std::string formatDate(int64_t unixTime);

// The moment a DATETIMETYPE filter value stands for: a date alone is the start of that local
// day, or with `endOfDay` its last second; a time without offset is local time. None for text
// that is not a date and time.
std::optional<int64_t> parseDateTime(std::string_view text, bool endOfDay);

}  // namespace droqbxml::simulator::handlers

#endif  // DROQBXML_SIMULATOR_HANDLERS_CLOCK_HPP_
