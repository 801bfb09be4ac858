// Path mapping, folder creation and text files with the platform's error numbers.
#include "droqbxml/runtime/FileSystem.hpp"

#include <bitset>
#include <cerrno>
#include <cstdlib>
#include <string>
#include <system_error>

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

bool hasDrive(TextView path) { return path.size() >= 2 && isDriveLetter(path[0]) && path[1] == u':'; }

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

TextFile::TextFile(TextView path, OpenMode mode) {
  if (path.empty()) raiseRuntimeError(RuntimeError::kBadFileNameOrNumber);
  ensureDrive(path);
  const auto mapped = mapPath(path);
  std::error_code ignored;
  if (std::filesystem::is_directory(mapped, ignored)) {
    raiseRuntimeError(RuntimeError::kPathFileAccessError);
  }
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

FileNumber::FileNumber(FileNumber&& other) noexcept : number_(other.number_) {
  other.number_ = 0;
}

FileNumber& FileNumber::operator=(FileNumber&& other) noexcept {
  if (this != &other) {
    if (number_ != 0) fileNumbersInUse.reset(static_cast<size_t>(number_));
    number_ = other.number_;
    other.number_ = 0;
  }
  return *this;
}

}  // namespace droqbxml
