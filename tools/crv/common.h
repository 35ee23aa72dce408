// Shared pieces of the crv subcommands: exit codes, messages, loading a
// document, and the argument reader.
#pragma once

#include <string>
#include <vector>

#include "svg_document.h"

namespace crv {

// Exit statuses of every subcommand.
constexpr int kOk = 0;
constexpr int kInputError = 1;  // the input file cannot be read
constexpr int kUsage = 2;       // bad command line

// "crv COMMAND: message" and a pointer to the help; returns kUsage.
int UsageError(const std::string& command, const std::string& message);
// "crv: FILE: message"; returns kInputError.
int InputError(const std::string& file, const std::string& message);

// Reads an SVG file; on failure prints the one-line message and returns
// false. Warnings about the drawing go to standard error as
// "crv: FILE: line N: ...".
bool LoadDocument(const std::string& file, OstraCrv::svgdoc::Document& doc);

// A number for people: up to `digits` significant digits, no trailing zeros,
// "0" for negative zero.
std::string Number(double v, int digits = 8);

// argv with the short form -o spelled out as --output, for the commands
// that write a file.
std::vector<std::string> WithLongOutput(const std::vector<std::string>& argv);

// Command-line arguments of a subcommand: positional arguments and options
// with or without a value.
struct Args {
  std::vector<std::string> positional;
  bool help = false;
  std::vector<std::pair<std::string, std::string>> options;  // name, value ("" for flags)

  // Splits argv; names in withValue take the next argument (or "=value").
  // Returns false with a message for an unknown option or a missing value.
  bool Parse(const std::vector<std::string>& argv, const std::vector<std::string>& withValue,
             const std::vector<std::string>& flags, std::string& message);
  bool Has(const std::string& name) const;
  std::string Value(const std::string& name) const;  // last value given, "" if none
};

// The subcommands: each takes the arguments after its name.
int RunInfo(const std::vector<std::string>& args);
int RunRender(const std::vector<std::string>& args);
int RunInside(const std::vector<std::string>& args);
int RunIntersectPoints(const std::vector<std::string>& args);
extern const char* const kInfoHelp;
extern const char* const kRenderHelp;
extern const char* const kInsideHelp;
extern const char* const kIntersectPointsHelp;
// union, intersect, subtract, xor: command is the name.
int RunWeld(const std::string& command, const std::vector<std::string>& args);
extern const char* const kWeldHelp;

}  // namespace crv
