// The stand-in's request processor: connection and session rules, the one company file a
// process may have open (shared by all processors of the process, hence behind a mutex),
// application access, and requests handed to the reader and the handlers.
#include "simulator/internal/SimulatedProcessor.hpp"

#include <array>
#include <cstddef>
#include <exception>
#include <filesystem>
#include <mutex>
#include <new>
#include <optional>
#include <random>
#include <string>
#include <system_error>
#include <utility>

#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/FileSystem.hpp"
#include "droqbxml/runtime/Utf.hpp"
#include "simulator/RequestHandlers.hpp"

namespace droqbxml::simulator::internal {
namespace {

enum class Failure : size_t {
  Parse,
  Unexpected,
  CouldNotOpenFile,
  OtherFileOpen,
  InvalidTicket,
  AccessDenied,
  NoAutoLogin,
  NotYetAccessed,
  OpenConnectionNotCalled,
  BeginSessionNotCalled,
};

struct FailureText {
  Failure failure;
  int32_t hresult;
  TextView text;
};

// QuickBooks' texts, word for word: the component recognises some of them by their text.
// The two "has not been called" messages have no public code of their own.
constexpr std::array<FailureText, 10> kFailures{{
    {Failure::Parse, ProcessorHresult::kParseError,
     u"QuickBooks found an error when parsing the provided XML text stream."},
    {Failure::Unexpected, ProcessorHresult::kUnexpected,
     u"Unexpected error. Check the qbsdk.log file for possible, additional information."},
    {Failure::CouldNotOpenFile, ProcessorHresult::kCouldNotOpenFile,
     u"Could not open the specified QuickBooks company data file."},
    {Failure::OtherFileOpen, ProcessorHresult::kOtherFileOpen,
     u"There is already a company data file open and it is different from the requested "
     u"one."},
    {Failure::InvalidTicket, ProcessorHresult::kInvalidTicket, u"The ticket parameter is invalid."},
    {Failure::AccessDenied, ProcessorHresult::kAccessDenied,
     u"Access denied. This application does not have permission to access this QuickBooks "
     u"company data file. If access is required, the QuickBooks administrator can grant "
     u"permission through Integrated Application preferences."},
    {Failure::NoAutoLogin, ProcessorHresult::kNoAutoLogin,
     u"This application is not allowed to log into this QuickBooks company data file "
     u"automatically. The QuickBooks administrator can grant permission for automatic login "
     u"through the Integrated Application preferences."},
    {Failure::NotYetAccessed, ProcessorHresult::kNotYetAccessed,
     u"This application has not accessed this QuickBooks company data file before.  Only the "
     u"QuickBooks administrator can grant permission for an application to access a "
     u"QuickBooks company data file for the first time."},
    {Failure::OpenConnectionNotCalled, ProcessorHresult::kUnexpected,
     u"The method \"OpenConnection\" has not been called."},
    {Failure::BeginSessionNotCalled, ProcessorHresult::kUnexpected,
     u"The \"BeginSession\" method has not been called or did not succeed."},
}};

static_assert(
    [] {
      for (size_t i = 0; i < kFailures.size(); ++i) {
        if (kFailures[i].failure != static_cast<Failure>(i)) return false;
      }
      return true;
    }(),
    "kFailures is indexed by Failure");

[[noreturn]] void raise(Failure failure) {
  const FailureText& entry = kFailures[static_cast<size_t>(failure)];
  raiseError(entry.hresult, Text(kRequestProcessorProgId), Text(entry.text));
}

// Missing, unreadable, read-only and busy files cannot be opened; anything else wrong with
// the file is QuickBooks' unexpected error.
Failure failureOf(CompanyFileError::Kind kind) {
  using Kind = CompanyFileError::Kind;
  if (kind == Kind::Missing || kind == Kind::Unreadable || kind == Kind::ReadOnly ||
      kind == Kind::Busy) {
    return Failure::CouldNotOpenFile;
  }
  return Failure::Unexpected;
}

// Runs `step` on a company file, turning its failures into QuickBooks' errors; the
// processor's own ComErrors and the runtime's failures pass through unchanged.
template <class Step>
auto onCompanyFile(Step step) {
  try {
    return step();
  } catch (const ComError&) {
    throw;
  } catch (const std::bad_alloc&) {
    throw;
  } catch (const CompanyFileError& error) {
    raise(failureOf(error.kind()));
  } catch (const std::exception&) {
    raise(Failure::Unexpected);
  }
}

// Which file a path names, so that two spellings of one file count as the same file.
std::filesystem::path identityOf(const std::filesystem::path& path) {
  std::error_code error;
  auto absolute = std::filesystem::absolute(path, error);
  if (error) return path.lexically_normal();
  auto canonical = std::filesystem::weakly_canonical(absolute, error);
  return error ? absolute.lexically_normal() : canonical;
}

// The company file open in this process: QuickBooks keeps one open at a time, for every
// application connected to it.
class OpenCompanyFile {
 public:
  // Counts one more session on the file at `path`; the first session's spelling of the path
  // is kept for sessions begun with an empty one. Raises OtherFileOpen while a different
  // file is open.
  void claim(const Text& path, const std::filesystem::path& identity) {
    const std::lock_guard lock(mutex_);
    if (sessions_ > 0 && identity != identity_) raise(Failure::OtherFileOpen);
    if (sessions_ == 0) {
      identity_ = identity;
      path_ = path;
    }
    ++sessions_;
  }
  // Counts one more session on the file already open and returns its path; raises
  // CouldNotOpenFile when none is.
  std::pair<Text, std::filesystem::path> claimCurrent() {
    const std::lock_guard lock(mutex_);
    if (sessions_ == 0) raise(Failure::CouldNotOpenFile);
    ++sessions_;
    return {path_, identity_};
  }
  void release() noexcept {
    const std::lock_guard lock(mutex_);
    if (sessions_ > 0) --sessions_;
  }

 private:
  std::mutex mutex_;
  std::filesystem::path identity_;
  Text path_;
  int sessions_ = 0;
};

OpenCompanyFile& openCompanyFile() {
  static OpenCompanyFile instance;
  return instance;
}

// Releases a claim on the open company file unless the session that made it was begun.
class ClaimGuard {
 public:
  ClaimGuard() = default;
  ~ClaimGuard() {
    if (held_) openCompanyFile().release();
  }
  ClaimGuard(const ClaimGuard&) = delete;
  ClaimGuard& operator=(const ClaimGuard&) = delete;
  void hold() noexcept { held_ = true; }
  void keep() noexcept { held_ = false; }

 private:
  bool held_ = false;
};

// Lets `appName` in as QuickBooks' integrated-application preferences say; an application
// the file has never seen is added, allowed to log in automatically.
void admit(CompanyFile& company, const Text& appName) {
  const std::string name = toUtf8(appName);
  const auto access = onCompanyFile([&] { return company.application(name); });
  // QuickBooks asks the administrator at the keyboard about a new application; with
  // nobody there to answer, the application is refused until the file allows it.
  if (!access) raise(Failure::NotYetAccessed);
  if (!access->allowed) raise(Failure::AccessDenied);
  if (!access->autoLogin) raise(Failure::NoAutoLogin);
}

// A session ticket in the form QuickBooks gives them: a braced GUID.
Text newTicket() {
  static constexpr char kHex[] = "0123456789ABCDEF";
  std::random_device source;
  std::string ticket = "{";
  for (int i = 0; i < 32; ++i) {
    if (i == 8 || i == 12 || i == 16 || i == 20) ticket += '-';
    ticket += kHex[source() % 16];
  }
  return fromUtf8(ticket + "}");
}

}  // namespace

SimulatedProcessor::~SimulatedProcessor() {
  for (size_t i = 0; i < sessions_.size(); ++i) openCompanyFile().release();
}

void SimulatedProcessor::OpenConnection(const Text& /*appID*/, const Text& appName) {
  connected_ = true;
  appName_ = appName;
}

Text SimulatedProcessor::BeginSession(const Text& qbFile, QBFileMode /*mode*/) {
  requireConnection();
  ClaimGuard guard;
  Text path = qbFile;
  std::filesystem::path file;
  if (qbFile.empty()) {
    auto [openPath, identity] = openCompanyFile().claimCurrent();
    guard.hold();
    path = std::move(openPath);
    file = std::move(identity);
  } else {
    file = mapPath(qbFile);
    openCompanyFile().claim(qbFile, identityOf(file));
    guard.hold();
  }
  auto company = onCompanyFile([&] { return std::make_unique<CompanyFile>(file); });
  admit(*company, appName_);

  Text ticket = newTicket();
  auto statements = std::make_unique<handlers::StatementCache>(company->db());
  sessions_.emplace(ticket,
                    Session{std::move(path), std::move(company), std::move(statements), {}});
  guard.keep();
  return ticket;
}

Text SimulatedProcessor::ProcessRequest(const Text& ticket, const Text& request) {
  requireConnection();
  Session& session = sessionOf(ticket);
  ReadResult read = readRequest(toUtf8(request));
  lastProblems_ = std::move(read.problems);
  // Values QuickBooks answers per request (too long, too many decimals) leave the document
  // readable; anything else is its parse error.
  if (!read.document) raise(Failure::Parse);
  return onCompanyFile([&] {
    handlers::answerRequests(*session.company, *read.document, session.statements.get(),
                             session.response);
    return fromUtf8(session.response);
  });
}

void SimulatedProcessor::EndSession(const Text& ticket) {
  sessionOf(ticket);
  sessions_.erase(ticket);
  endedTickets_.insert(ticket);
  openCompanyFile().release();
}

void SimulatedProcessor::CloseConnection() {
  endAllSessions();
  connected_ = false;
}

Text SimulatedProcessor::GetCurrentCompanyFileName(const Text& ticket) {
  return sessionOf(ticket).path;
}

void SimulatedProcessor::requireConnection() const {
  if (!connected_) raise(Failure::OpenConnectionNotCalled);
}

SimulatedProcessor::Session& SimulatedProcessor::sessionOf(const Text& ticket) {
  const auto found = sessions_.find(ticket);
  if (found != sessions_.end()) return found->second;
  // A ticket that was ended, or any ticket while no session is open, is QuickBooks'
  // "BeginSession has not been called"; a ticket it never gave out beside open ones is invalid.
  if (sessions_.empty() || endedTickets_.contains(ticket)) raise(Failure::BeginSessionNotCalled);
  raise(Failure::InvalidTicket);
}

void SimulatedProcessor::endAllSessions() {
  for (auto& [ticket, session] : sessions_) {
    endedTickets_.insert(ticket);
    openCompanyFile().release();
  }
  sessions_.clear();
}

}  // namespace droqbxml::simulator::internal
