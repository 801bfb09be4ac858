// company create/show/allow/deny and lint: the commands that work on the stand-in's company
// files and on request documents without talking to a processor.
#include <filesystem>
#include <iostream>

#include "cli/Cli.hpp"
#include "cli/Commands.hpp"
#include "droqbxml/runtime/FileSystem.hpp"
#include "droqbxml/runtime/Utf.hpp"
#include "simulator/CompanyFile.hpp"
#include "simulator/RequestDocument.hpp"

namespace droqbxml::cli {
namespace {

using simulator::CompanyFile;
using simulator::CompanyFileError;

// A company file's path as the command was given it, mapped as the component maps paths
// ("C:\\Books\\x.qbw").
std::filesystem::path fileOf(const std::string& path) { return mapPath(fromUtf8(path)); }

template <class F>
int withCompanyFile(Io io, const std::string& path, CompanyFile::Mode mode, F work) {
  try {
    CompanyFile company(fileOf(path), mode);
    return work(company);
  } catch (const CompanyFileError& error) {
    io.err << "droqbxml: " << error.what() << '\n';
    return kExitConnection;
  }
}

}  // namespace

int companyCreateCommand(Io io, const CompanyOptions& options) {
  try {
    CompanyFile::create(fileOf(options.path), {options.name, options.salesTax, options.allow});
  } catch (const CompanyFileError& error) {
    io.err << "droqbxml: " << error.what() << '\n';
    return error.kind() == CompanyFileError::Kind::AlreadyExists ? kExitUsage : kExitConnection;
  }
  io.out << "Created company file " << options.path << " (\"" << options.name << "\", sales tax "
         << (options.salesTax ? "on" : "off") << "; lets in";
  for (const auto& name : options.allow) io.out << " \"" << name << '"';
  io.out << ")\n";
  return kExitSuccess;
}

int companyShowCommand(Io io, const CompanyOptions& options) {
  // Opened for changes where this user may make them, so that what a process killed while
  // writing left behind is rolled back first, as any session would; otherwise for reading
  // alone, so that a file this user may not change can still be shown.
  auto mode = CompanyFile::Mode::ReadWrite;
  try {
    CompanyFile probe(fileOf(options.path), mode);
  } catch (const CompanyFileError& error) {
    if (error.kind() == CompanyFileError::Kind::ReadOnly) mode = CompanyFile::Mode::ReadOnly;
  }
  return withCompanyFile(io, options.path, mode, [&](CompanyFile& company) {
    io.out << company.summary();
    return kExitSuccess;
  });
}

int companyAllowCommand(Io io, const CompanyOptions& options) {
  return withCompanyFile(io, options.path, CompanyFile::Mode::ReadWrite, [&](CompanyFile& company) {
    company.setApplication(options.appName, {true, options.autoLogin});
    io.out << "\"" << options.appName << "\" may use " << options.path
           << (options.autoLogin ? " and log in automatically" : " when a user is logged in")
           << '\n';
    return kExitSuccess;
  });
}

int companyDenyCommand(Io io, const CompanyOptions& options) {
  return withCompanyFile(io, options.path, CompanyFile::Mode::ReadWrite, [&](CompanyFile& company) {
    company.setApplication(options.appName, {false, false});
    io.out << "\"" << options.appName << "\" may not use " << options.path << '\n';
    return kExitSuccess;
  });
}

int lintCommand(Io io, const std::string& file) {
  const auto bytes = readDocument(io, file);
  if (!bytes) return kExitUsage;
  const auto result = simulator::readRequest(*bytes);
  const std::string name = file == "-" ? "<stdin>" : file;
  for (const auto& problem : result.problems) {
    io.out << name << ':' << problem.line << ": " << problem.element << ": " << problem.message
           << '\n';
  }
  if (result.problems.empty()) {
    io.out << name << ": valid qbXML " << result.document->qbxmlVersion << " request\n";
    return kExitSuccess;
  }
  return kExitNotSuccess;
}

}  // namespace droqbxml::cli
