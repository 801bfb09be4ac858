// Files and folders as the component sees them: platform paths ("C:\Program Files\...")
// mapped to the file system, the platform's file errors, text files written as UTF-8,
// and the per-thread pool of file numbers 1..511.
//
// On POSIX systems "\" is a separator and a drive prefix "X:" maps to the folder named by
// the environment variable DROQBXML_DRIVE_X, by default $HOME/.local/share/droqbxml/drive_x.
// A path that starts with a single "\" is on the current drive, always C:. A drive's
// folder is created on first use, as a drive always exists.
#ifndef DROQBXML_RUNTIME_FILESYSTEM_HPP_
#define DROQBXML_RUNTIME_FILESYSTEM_HPP_

#include <cstdint>
#include <cstdio>
#include <filesystem>
#include <memory>

#include "droqbxml/runtime/Text.hpp"

namespace droqbxml {

std::filesystem::path mapPath(TextView path);

// MkDir: creates one folder. An existing folder or one that cannot be created is 75,
// a missing parent 76, an empty name 52.
void createFolder(TextView path);
// FileLen: the length in bytes; a missing file is 53.
int64_t fileLength(TextView path);

enum class OpenMode { Append, Overwrite };

// A text file opened for appending or for writing from empty. Open failures raise the
// platform's file errors: 52 empty name, 76 missing folder, 70 permission, 75 otherwise.
class TextFile {
 public:
  TextFile() = default;
  TextFile(TextView path, OpenMode mode);

  bool isOpen() const noexcept { return file_ != nullptr; }
  // Writes the text as UTF-8 and flushes it; a file that is not open is 52, a failed
  // write 75.
  void write(TextView text);
  void close() noexcept { file_.reset(); }

 private:
  struct Closer {
    void operator()(std::FILE* f) const noexcept { std::fclose(f); }
  };
  std::unique_ptr<std::FILE, Closer> file_;
};

// A log file that several threads and processes append to at once: opened for appending
// (created when missing) and locked exclusively while the object lives, so that a writer
// decides from the length and writes its entry with no other writer in between, and every
// entry reaches the file whole whatever its size. Open failures raise as TextFile's.
class LockedLogFile {
 public:
  explicit LockedLogFile(TextView path);
  ~LockedLogFile();
  LockedLogFile(const LockedLogFile&) = delete;
  LockedLogFile& operator=(const LockedLogFile&) = delete;

  // The file's length in bytes.
  int64_t length() const;
  // Empties the file, for a log that starts again; a failure is 75.
  void clear();
  // Appends the text as UTF-8, all of it; a failed write is 75.
  void append(TextView text);

 private:
  std::intptr_t handle_;  // a file descriptor, or on Windows a HANDLE
};

// A file number of this thread's pool (1..511), held while the object lives.
class FileNumber {
 public:
  FileNumber() noexcept = default;  // holds no number
  // Takes the lowest free number; the result holds 0 when all 511 are in use.
  static FileNumber take();
  ~FileNumber();
  FileNumber(FileNumber&& other) noexcept;
  FileNumber& operator=(FileNumber&& other) noexcept;
  FileNumber(const FileNumber&) = delete;
  FileNumber& operator=(const FileNumber&) = delete;

  int32_t value() const noexcept { return number_; }

 private:
  int32_t number_ = 0;
};

}  // namespace droqbxml

#endif  // DROQBXML_RUNTIME_FILESYSTEM_HPP_
