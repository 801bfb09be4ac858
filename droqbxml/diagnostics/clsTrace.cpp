// Trace output to a file, with the one-open-file rule.
#include "droqbxml/diagnostics/clsTrace.hpp"

#include <utility>

#include "droqbxml/diagnostics/ErrorNumbers.hpp"
#include "droqbxml/runtime/Binding.hpp"
#include "droqbxml/runtime/ComError.hpp"

namespace droqbxml {

const ClassInfo& clsTrace::typeInfo() {
  static const ClassInfo info(u"clsTrace", Members().method(u"Trace", &clsTrace::Trace).take());
  return info;
}

bool clsTrace::Trace(const Text& sOutText, eudOutStreamStype eOutStreamType,
                     const Text& sFileName, eudTraceFileAction eFileAction,
                     bool bCloseFileWhenDone) {
  switch (eOutStreamType) {
    case eOutToDebug:
      return true;  // the debugger channel writes nothing
    case eOutToFile:
      return TraceToFile(sOutText, sFileName, eFileAction, bCloseFileWhenDone);
  }
  return false;
}

bool clsTrace::TraceToFile(const Text& text, const Text& name, eudTraceFileAction action,
                           bool closeWhenDone) {
  FileNumber number = FileNumber::take();
  if (number.value() == 0) raiseRuntimeError(RuntimeError::kTooManyFiles);
  // Registered before the file is opened: a failed open leaves the object marked open.
  FileOpen(name, std::move(number));
  if (action == eAppend) {
    file_ = TextFile(name, OpenMode::Append);
  } else if (action == eOverWrite) {
    file_ = TextFile(name, OpenMode::Overwrite);
  }
  // Any other action opens nothing, and the write below fails with the file error.
  file_.write(text + u"\r\n");
  if (closeWhenDone) {
    file_.close();
    TraceFileReset();
  }
  return true;
}

void clsTrace::FileOpen(const Text& name, FileNumber number) {
  if (fileOpen_) {
    // Raised directly, not through the shared error object, which stays as it was.
    raiseError(TOO_MANY_OPEN_TRACE_FILES, u"clsTrace.FileOpen",
               u"Cannot have more than one Trace file open at the same time.");
  }
  fileName_ = name;
  fileOpen_ = true;
  fileNumber_ = std::move(number);
}

void clsTrace::TraceFileReset() {
  fileName_.clear();
  fileOpen_ = false;
  fileNumber_ = FileNumber();
}

}  // namespace droqbxml
