// The two log files under the installation path: the error log "Logs\ErrorLog.txt" that
// clsMyErr::LogError appends to, and the failed-exchange log
// "Logs\qbXmlErrors\qbXML-Error.txt" that the connection wrapper writes after a request
// QuickBooks did not answer with success. Both are UTF-8 with CR LF line ends.
#ifndef DROQBXML_DIAGNOSTICS_LOGS_HPP_
#define DROQBXML_DIAGNOSTICS_LOGS_HPP_

#include <cstdint>

#include "droqbxml/runtime/Clock.hpp"
#include "droqbxml/runtime/Text.hpp"

namespace droqbxml {

// The installation path used when the shared one is empty.
inline constexpr TextView kDefaultInstallPath = u"C:\\Program Files\\Orvanne\\Tessaly";

// Appends one error record stamped with the present time. With an empty installation
// path the default one is used for this call (its folders are created); failures to
// create folders are ignored, a failure to open or write the file raises the file error.
void appendErrorLog(int32_t number, TextView source, TextView description);

// Writes one failed exchange: the request sent and the response received with their times,
// each cut after 50000 characters with a note of how many were left out. A log over 512000
// bytes (or empty, or missing) is started again. Never raises.
void LogFailedExchange(TextView request, TextView response, const LocalTime& sent,
                       const LocalTime& received);

}  // namespace droqbxml

#endif  // DROQBXML_DIAGNOSTICS_LOGS_HPP_
