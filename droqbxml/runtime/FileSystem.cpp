// Path mapping, folder creation, text files and locked log files with the platform's error
// numbers.
#include "droqbxml/runtime/FileSystem.hpp"

#include <bitset>
#include <cerrno>
#include <cstdlib>
#include <string>
#include <system_error>

#ifdef _WIN32
#include <windows.h>
#else
#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>
#endif

#include "droqbxml/runtime/ComError.hpp"
#include "droqbxml/runtime/Utf.hpp"

namespace droqbxml {
namespace {

thread_local std::bitset<512> fileNumbersInUse;

bool isDriveLetter(char16_t c) { return (c >= u'A' && c <= u'Z') || (c >= u'a' && c <= u'z'); }

std::filesystem::path driveRoot(char16_t letter) {
  const char upper = static_cast<char>(upperAscii(letter));
  const std::string variable = std::string("DROQBXML_DRIVE_") + upper;
  if (const char* configured = std::getenv(variable.c_str()); configured && *configured) {
    return configured;
  }
  const char* home = std::getenv("HOME");
  std::filesystem::path root = home && *home ? home : ".";
  const char lower = static_cast<char>(upper - 'A' + 'a');
  return root / ".local" / "share" / "droqbxml" / (std::string("drive_") + lower);
}

bool hasDrive(TextView path) {
  return path.size() >= 2 && isDriveLetter(path[0]) && path[1] == u':';
}

// "\Logs" is the root of the current drive, which for the component is always C:.
bool isDriveRelativeRoot(TextView path) {
  return !path.empty() && path[0] == u'\\' && (path.size() == 1 || path[1] != u'\\');
}

void ensureDrive(TextView path) {
#ifdef _WIN32
  (void)path;  // real drives: nothing to create
  return;
#endif
  if (!hasDrive(path) && !isDriveRelativeRoot(path)) return;
  std::error_code ignored;
  std::filesystem::create_directories(driveRoot(hasDrive(path) ? path[0] : u'C'), ignored);
}

[[noreturn]] void raiseForErrno(int error) {
  switch (error) {
    case ENOENT:
    case ENOTDIR:
      raiseRuntimeError(RuntimeError::kPathNotFound);
    case EACCES:
    case EPERM:
    case EROFS:
      raiseRuntimeError(RuntimeError::kPermissionDenied);
    case ENAMETOOLONG:
      raiseRuntimeError(RuntimeError::kBadFileNameOrNumber);
    default:
      raiseRuntimeError(RuntimeError::kPathFileAccessError);
  }
}

}  // namespace

std::filesystem::path mapPath(TextView path) {
  Text rest(path);
  std::filesystem::path root;
  if (hasDrive(path)) {
    root = driveRoot(path[0]);
    rest = rest.substr(2);
  } else if (isDriveRelativeRoot(path)) {
    root = driveRoot(u'C');
  }
#ifdef _WIN32
  (void)root;
  return std::filesystem::path(std::wstring(path.begin(), path.end()));
#else
  for (auto& c : rest) {
    if (c == u'\\') c = u'/';
  }
  if (root.empty()) return std::filesystem::path(toUtf8(rest));
  const auto first = rest.find_first_not_of(u'/');
  if (first == Text::npos) return root;
  return root / toUtf8(TextView(rest).substr(first));
#endif
}

void createFolder(TextView path) {
  if (path.empty()) raiseRuntimeError(RuntimeError::kBadFileNameOrNumber);
  ensureDrive(path);
  std::error_code error;
  const auto mapped = mapPath(path);
  if (std::filesystem::create_directory(mapped, error)) return;
  if (!error) raiseRuntimeError(RuntimeError::kPathFileAccessError);  // it exists already
  if (error == std::errc::no_such_file_or_directory) {
    raiseRuntimeError(RuntimeError::kPathNotFound);
  }
  raiseRuntimeError(RuntimeError::kPathFileAccessError);
}

int64_t fileLength(TextView path) {
  if (path.empty()) raiseRuntimeError(RuntimeError::kBadFileNameOrNumber);
  std::error_code error;
  const auto size = std::filesystem::file_size(mapPath(path), error);
  if (error) raiseRuntimeError(RuntimeError::kFileNotFound);
  return static_cast<int64_t>(size);
}

namespace {

// The file-system path of a file to open, refusing an empty path and a folder as the
// platform refuses them.
std::filesystem::path filePath(TextView path) {
  if (path.empty()) raiseRuntimeError(RuntimeError::kBadFileNameOrNumber);
  ensureDrive(path);
  const auto mapped = mapPath(path);
  std::error_code ignored;
  if (std::filesystem::is_directory(mapped, ignored)) {
    raiseRuntimeError(RuntimeError::kPathFileAccessError);
  }
  return mapped;
}

}  // namespace

TextFile::TextFile(TextView path, OpenMode mode) {
  const auto mapped = filePath(path);
  errno = 0;
#ifdef _WIN32
  // Windows paths are UTF-16; the narrow fopen would go through the ANSI code page.
  std::FILE* file = _wfopen(mapped.c_str(), mode == OpenMode::Append ? L"ab" : L"wb");
#else
  std::FILE* file = std::fopen(mapped.c_str(), mode == OpenMode::Append ? "ab" : "wb");
#endif
  if (!file) raiseForErrno(errno);
  file_.reset(file);
}

void TextFile::write(TextView text) {
  if (!file_) raiseRuntimeError(RuntimeError::kBadFileNameOrNumber);
  const std::string bytes = toUtf8(text);
  if (std::fwrite(bytes.data(), 1, bytes.size(), file_.get()) != bytes.size() ||
      std::fflush(file_.get()) != 0) {
    raiseRuntimeError(RuntimeError::kPathFileAccessError);
  }
}

#ifdef _WIN32

namespace {

HANDLE handleOf(std::intptr_t handle) { return reinterpret_cast<HANDLE>(handle); }

[[noreturn]] void raiseForLastError() {
  switch (GetLastError()) {
    case ERROR_FILE_NOT_FOUND:
    case ERROR_PATH_NOT_FOUND:
      raiseRuntimeError(RuntimeError::kPathNotFound);
    case ERROR_ACCESS_DENIED:
    case ERROR_WRITE_PROTECT:
      raiseRuntimeError(RuntimeError::kPermissionDenied);
    case ERROR_INVALID_NAME:
    case ERROR_FILENAME_EXCED_RANGE:
      raiseRuntimeError(RuntimeError::kBadFileNameOrNumber);
    default:
      raiseRuntimeError(RuntimeError::kPathFileAccessError);
  }
}

}  // namespace

LockedLogFile::LockedLogFile(TextView path) {
  const auto mapped = filePath(path);
  const HANDLE file = CreateFileW(mapped.c_str(), GENERIC_WRITE,
                                  FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr,
                                  OPEN_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr);
  if (file == INVALID_HANDLE_VALUE) raiseForLastError();
  OVERLAPPED whole{};
  if (!LockFileEx(file, LOCKFILE_EXCLUSIVE_LOCK, 0, MAXDWORD, MAXDWORD, &whole)) {
    CloseHandle(file);
    raiseRuntimeError(RuntimeError::kPathFileAccessError);
  }
  handle_ = reinterpret_cast<std::intptr_t>(file);
}

LockedLogFile::~LockedLogFile() {
  OVERLAPPED whole{};
  UnlockFileEx(handleOf(handle_), 0, MAXDWORD, MAXDWORD, &whole);
  CloseHandle(handleOf(handle_));
}

int64_t LockedLogFile::length() const {
  LARGE_INTEGER size{};
  if (!GetFileSizeEx(handleOf(handle_), &size)) return 0;
  return static_cast<int64_t>(size.QuadPart);
}

void LockedLogFile::clear() {
  if (!SetFilePointerEx(handleOf(handle_), LARGE_INTEGER{}, nullptr, FILE_BEGIN) ||
      !SetEndOfFile(handleOf(handle_))) {
    raiseRuntimeError(RuntimeError::kPathFileAccessError);
  }
}

void LockedLogFile::append(TextView text) {
  const std::string bytes = toUtf8(text);
  if (!SetFilePointerEx(handleOf(handle_), LARGE_INTEGER{}, nullptr, FILE_END)) {
    raiseRuntimeError(RuntimeError::kPathFileAccessError);
  }
  size_t written = 0;
  while (written < bytes.size()) {
    DWORD now = 0;
    const size_t left = bytes.size() - written;
    const DWORD chunk = left > (DWORD{1} << 30) ? DWORD{1} << 30 : static_cast<DWORD>(left);
    if (!WriteFile(handleOf(handle_), bytes.data() + written, chunk, &now, nullptr) || now == 0) {
      raiseRuntimeError(RuntimeError::kPathFileAccessError);
    }
    written += now;
  }
}

#else

LockedLogFile::LockedLogFile(TextView path) {
  const auto mapped = filePath(path);
  const int file = ::open(mapped.c_str(), O_WRONLY | O_CREAT | O_APPEND | O_CLOEXEC, 0666);
  if (file < 0) raiseForErrno(errno);
  int locked = 0;
  do {
    locked = ::flock(file, LOCK_EX);
  } while (locked != 0 && errno == EINTR);
  if (locked != 0) {
    ::close(file);
    raiseRuntimeError(RuntimeError::kPathFileAccessError);
  }
  handle_ = file;
}

// Closing the file releases the lock.
LockedLogFile::~LockedLogFile() { ::close(static_cast<int>(handle_)); }

int64_t LockedLogFile::length() const {
  struct stat status {};
  if (::fstat(static_cast<int>(handle_), &status) != 0) return 0;
  return static_cast<int64_t>(status.st_size);
}

void LockedLogFile::clear() {
  if (::ftruncate(static_cast<int>(handle_), 0) != 0) {
    raiseRuntimeError(RuntimeError::kPathFileAccessError);
  }
}

void LockedLogFile::append(TextView text) {
  const std::string bytes = toUtf8(text);
  size_t written = 0;
  while (written < bytes.size()) {
    const ssize_t now =
        ::write(static_cast<int>(handle_), bytes.data() + written, bytes.size() - written);
    if (now < 0 && errno == EINTR) continue;
    if (now <= 0) raiseRuntimeError(RuntimeError::kPathFileAccessError);
    written += static_cast<size_t>(now);
  }
}

#endif

FileNumber FileNumber::take() {
  FileNumber taken;
  for (size_t n = 1; n < fileNumbersInUse.size(); ++n) {
    if (!fileNumbersInUse.test(n)) {
      fileNumbersInUse.set(n);
      taken.number_ = static_cast<int32_t>(n);
      break;
    }
  }
  return taken;
}

FileNumber::~FileNumber() {
  if (number_ != 0) fileNumbersInUse.reset(static_cast<size_t>(number_));
}

FileNumber::FileNumber(FileNumber&& other) noexcept : number_(other.number_) { other.number_ = 0; }

FileNumber& FileNumber::operator=(FileNumber&& other) noexcept {
  if (this != &other) {
    if (number_ != 0) fileNumbersInUse.reset(static_cast<size_t>(number_));
    number_ = other.number_;
    other.number_ = 0;
  }
  return *this;
}

}  // namespace droqbxml
