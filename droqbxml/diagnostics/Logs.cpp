// Log file layouts. Each call opens, locks, writes and closes its file, so that entries of
// threads and processes writing at once stay whole.
#include "droqbxml/diagnostics/Logs.hpp"

#include <string>

#include "droqbxml/component/basGlobals.hpp"
#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/FileSystem.hpp"

namespace droqbxml {
namespace {

constexpr TextView kCrLf = u"\r\n";
constexpr int64_t kFailedExchangeLogLimit = 512000;

// The most of a request or a response one failed exchange keeps: with both at most three
// bytes a code unit, an entry stays well under the log's limit.
constexpr size_t kLoggedLength = 50000;

// `text`, or its first kLoggedLength code units (a surrogate pair kept whole) and a note of
// how many were left out.
Text cutToLogged(TextView text) {
  if (text.size() <= kLoggedLength) return Text(text);
  size_t kept = kLoggedLength;
  if (text[kept - 1] >= 0xD800 && text[kept - 1] <= 0xDBFF) --kept;
  return Text(text.substr(0, kept)) + u"... [" + asciiText(std::to_string(text.size() - kept)) +
         u" characters left out]";
}

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
  LockedLogFile file(path + u"\\Logs\\ErrorLog.txt");
  Text record = u"Error Date: " + formatLongDateTime(now()) + Text(kCrLf);
  record += u"\terror number: " + asciiText(std::to_string(number)) + Text(kCrLf);
  record += u"\terror source: " + Text(source) + Text(kCrLf);
  record += u"\terror description: " + Text(kCrLf);
  record += u"\t" + Text(description) + Text(kCrLf);
  // A line holding CR LF: every record is followed by two empty lines.
  record += Text(kCrLf) + Text(kCrLf);
  file.append(record);
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
    Text entry =
        u"SENDING: " + formatIsoDateTime(sent) + u"\r\n\r\n" + cutToLogged(request) + Text(kCrLf);
    entry += u"\r\n\r\nRECEIVING: " + formatIsoDateTime(received) +
             u"\trequest response status <> success\r\n\r\n\t" + cutToLogged(response) +
             Text(kCrLf);
    // Decided and written under the file's lock: a log that starts again loses only what it
    // held, never an entry another process writes at the same moment.
    LockedLogFile file(name);
    const int64_t length = file.length();
    if (length == 0 || length > kFailedExchangeLogLimit) {
      file.clear();
      file.append(entry);
    } else {
      file.append(u"\r\n\r\n\r\n\r\n\r\n" + entry);
    }
  } catch (const ComError&) {
    // The failed-exchange log never gets in the way of the exchange itself.
  }
}

}  // namespace droqbxml
