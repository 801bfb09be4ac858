// clsTrace: one line of diagnostic text to the debugger (which writes nothing) or to a
// file. Each object tracks at most one open trace file: a call that does not ask to close
// the file leaves it open and marked, and the next file trace on the object is refused
// even for the same name. Hosts pass true for bCloseFileWhenDone on their last line.
#ifndef DROQBXML_DIAGNOSTICS_CLSTRACE_HPP_
#define DROQBXML_DIAGNOSTICS_CLSTRACE_HPP_

#include <cstdint>

#include "droqbxml/runtime/FileSystem.hpp"
#include "droqbxml/runtime/Object.hpp"

namespace droqbxml {

// Published spelling ("Stype").
enum eudOutStreamStype : int32_t { eOutToDebug = 0, eOutToFile = 1 };
enum eudTraceFileAction : int32_t { eAppend = 0, eOverWrite = 1 };

class clsTrace final : public Object {
 public:
  static const ClassInfo& typeInfo();
  const ClassInfo& classInfo() const override { return typeInfo(); }

  // eOutToDebug: true, nothing written. eOutToFile: the text and CR LF are written to
  // sFileName (appended, or replacing its content with eOverWrite) and true is returned.
  // Any other stream: false. A second file while one is marked open raises 0x80044E34
  // from "clsTrace.FileOpen"; file failures raise the platform's file errors.
  bool Trace(const Text& sOutText, eudOutStreamStype eOutStreamType,
             const Text& sFileName = u"", eudTraceFileAction eFileAction = eAppend,
             bool bCloseFileWhenDone = false);

 private:
  bool TraceToFile(const Text& text, const Text& name, eudTraceFileAction action,
                   bool closeWhenDone);
  void FileOpen(const Text& name, FileNumber number);
  void TraceFileReset();

  bool fileOpen_ = false;
  Text fileName_;
  FileNumber fileNumber_;
  TextFile file_;
};

}  // namespace droqbxml

#endif  // DROQBXML_DIAGNOSTICS_CLSTRACE_HPP_
