// The stand-in's request processor: QuickBooks' connection, session and access rules over
// the company files of this process, and a session's requests read, checked and answered
// from its company file. Hosts reach it through RequestProcessor; tests and diagnostics
// use this class directly for what a refused request broke.
#ifndef DROQBXML_SIMULATOR_INTERNAL_SIMULATEDPROCESSOR_HPP_
#define DROQBXML_SIMULATOR_INTERNAL_SIMULATEDPROCESSOR_HPP_

#include <cstdint>
#include <map>
#include <memory>
#include <set>
#include <string>
#include <vector>

#include "droqbxml/connection/RequestProcessor.hpp"
#include "droqbxml/runtime/Text.hpp"
#include "simulator/CompanyFile.hpp"
#include "simulator/RequestDocument.hpp"
#include "simulator/handlers/Store.hpp"

namespace droqbxml::simulator::internal {

// QuickBooks' failures as this processor raises them: ComErrors whose Number is the HRESULT
// and whose Description is QuickBooks' text, with source "QBXMLRP.RequestProcessor.1".
namespace ProcessorHresult {
inline constexpr int32_t kParseError = static_cast<int32_t>(0x80040400u);
inline constexpr int32_t kUnexpected = static_cast<int32_t>(0x80040402u);
inline constexpr int32_t kCouldNotOpenFile = static_cast<int32_t>(0x80040403u);
inline constexpr int32_t kOtherFileOpen = static_cast<int32_t>(0x8004040Au);
inline constexpr int32_t kInvalidTicket = static_cast<int32_t>(0x8004040Du);
inline constexpr int32_t kNotYetAccessed = static_cast<int32_t>(0x80040418u);
inline constexpr int32_t kAccessDenied = static_cast<int32_t>(0x8004041Au);
inline constexpr int32_t kNoAutoLogin = static_cast<int32_t>(0x8004041Du);
}  // namespace ProcessorHresult

class SimulatedProcessor final : public RequestProcessor {
 public:
  SimulatedProcessor() = default;
  // Ends the sessions still open, so that their company file is free for other sessions.
  ~SimulatedProcessor() override;
  SimulatedProcessor(const SimulatedProcessor&) = delete;
  SimulatedProcessor& operator=(const SimulatedProcessor&) = delete;

  // Opens the connection for the application named `appName` (the integrated-application
  // list of a company file knows applications by name). A second call renames it.
  void OpenConnection(const Text& appID, const Text& appName) override;
  // Opens the company file at `qbFile` (a platform path, mapped as the component maps paths;
  // empty: the company file open in this process) and returns a new ticket. Only one company
  // file is open in a process at a time; further sessions on it are allowed. An application
  // the file has not seen is added to its list as allowed with automatic login.
  Text BeginSession(const Text& qbFile, QBFileMode mode) override;
  // Reads and checks `request` and answers it from the session's company file. A request
  // that is not well formed or breaks the schema raises the parse error; lastProblems()
  // then says why.
  Text ProcessRequest(const Text& ticket, const Text& request) override;
  void EndSession(const Text& ticket) override;
  // Ends the sessions still open and the connection.
  void CloseConnection() override;
  // The company file path the session was begun with.
  Text GetCurrentCompanyFileName(const Text& ticket) override;
  int16_t MajorVersion() override { return 13; }
  int16_t MinorVersion() override { return 0; }

  // The problems of the last request ProcessRequest refused; empty after one it answered.
  const std::vector<Problem>& lastProblems() const noexcept { return lastProblems_; }

 private:
  struct Session {
    Text path;  // as the session was begun with, or the open file's path for an empty one
    std::unique_ptr<CompanyFile> company;
    // Prepared on the company file's connection for the session's requests; ends before it.
    std::unique_ptr<handlers::StatementCache> statements;
    std::string response;  // the last response document, whose room the next one reuses
  };

  void requireConnection() const;
  // The open session of `ticket`, or the error QuickBooks raises for it.
  Session& sessionOf(const Text& ticket);
  void endAllSessions();

  bool connected_ = false;
  Text appName_;
  std::map<Text, Session> sessions_;
  std::set<Text> endedTickets_;
  std::vector<Problem> lastProblems_;
};

}  // namespace droqbxml::simulator::internal

#endif  // DROQBXML_SIMULATOR_INTERNAL_SIMULATEDPROCESSOR_HPP_
