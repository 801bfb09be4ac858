// Log file layouts. Each call opens, writes and closes its file.
#include "droqbxml/diagnostics/Logs.hpp"

#include <string>

#include "droqbxml/component/basGlobals.hpp"
#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/FileSystem.hpp"

namespace droqbxml {
namespace {

constexpr TextView kCrLf = u"\r\n";
constexpr int64_t kFailedExchangeLogLimit = 512000;

void createFolderQuietly(TextView path) {
  try {
    createFolder(path);
  } catch (const ComError&) {
    // typically: the folder exists already
  }
}

}  // namespace

void appendErrorLog(int32_t number, TextView source, TextView description) {
  Text path = basGlobals::DroPathAccess();
  if (path.empty()) {
    // For this call only: the shared path stays empty.
    path = Text(kDefaultInstallPath);
    createFolderQuietly(u"C:\\Program Files");
    createFolderQuietly(u"C:\\Program Files\\Orvanne");
    createFolderQuietly(u"C:\\Program Files\\Orvanne\\Tessaly");
  }
  createFolderQuietly(path + u"\\Logs");
  TextFile file(path + u"\\Logs\\ErrorLog.txt", OpenMode::Append);
  Text record = u"Error Date: " + formatLongDateTime(now()) + Text(kCrLf);
  record += u"\terror number: " + asciiText(std::to_string(number)) + Text(kCrLf);
  record += u"\terror source: " + Text(source) + Text(kCrLf);
  record += u"\terror description: " + Text(kCrLf);
  record += u"\t" + Text(description) + Text(kCrLf);
  // A line holding CR LF: every record is followed by two empty lines.
  record += Text(kCrLf) + Text(kCrLf);
  file.write(record);
}

void LogFailedExchange(TextView request, TextView response, const LocalTime& sent,
                       const LocalTime& received) {
  try {
    const FileNumber number = FileNumber::take();
    if (number.value() == 0) return;
    const Text path = basGlobals::DroPathAccess();
    createFolderQuietly(path + u"\\Logs");
    createFolderQuietly(path + u"\\Logs\\qbXmlErrors");
    const Text name = path + u"\\Logs\\qbXmlErrors\\qbXML-Error.txt";
    int64_t length = 0;
    try {
      length = fileLength(name);
    } catch (const ComError&) {
      length = 0;  // missing: start a new log
    }
    const bool restart = length == 0 || length > kFailedExchangeLogLimit;
    TextFile file(name, restart ? OpenMode::Overwrite : OpenMode::Append);
    Text entry;
    if (!restart) entry = u"\r\n\r\n\r\n\r\n\r\n";
    entry += u"SENDING: " + formatIsoDateTime(sent) + u"\r\n\r\n" + Text(request) + Text(kCrLf);
    entry += u"\r\n\r\nRECEIVING: " + formatIsoDateTime(received) +
             u"\trequest response status <> success\r\n\r\n\t" + Text(response) + Text(kCrLf);
    file.write(entry);
  } catch (const ComError&) {
    // The failed-exchange log never gets in the way of the exchange itself.
  }
}

}  // namespace droqbxml
