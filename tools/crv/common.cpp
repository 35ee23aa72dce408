// Shared pieces of the crv subcommands; see common.h.
#include "common.h"

#include <cmath>
#include <cstdio>
#include <iostream>

namespace crv {

int UsageError(const std::string& command, const std::string& message) {
  std::cerr << "crv " << command << ": " << message << " (see 'crv " << command << " --help')\n";
  return kUsage;
}

int InputError(const std::string& file, const std::string& message) {
  std::cerr << "crv: " << file << ": " << message << "\n";
  return kInputError;
}

bool LoadDocument(const std::string& file, OstraCrv::svgdoc::Document& doc) {
  std::string error;
  if (!OstraCrv::svgdoc::ReadFile(file, doc, error)) {
    InputError(file, error);
    return false;
  }
  for (const std::string& w : doc.warnings) std::cerr << "crv: " << file << ": " << w << "\n";
  return true;
}

std::string Number(double v, int digits) {
  if (v == 0) return "0";
  char buf[64];
  std::snprintf(buf, sizeof buf, "%.*g", digits, v);
  return buf;
}

bool Args::Parse(const std::vector<std::string>& argv, const std::vector<std::string>& withValue,
                 const std::vector<std::string>& flags, std::string& message) {
  auto known = [](const std::vector<std::string>& list, const std::string& s) {
    for (const auto& x : list)
      if (x == s) return true;
    return false;
  };
  for (std::size_t i = 0; i < argv.size(); ++i) {
    const std::string& a = argv[i];
    if (a == "-h" || a == "--help") {
      help = true;
      continue;
    }
    if (a.size() > 1 && a[0] == '-') {
      std::string name = a, value;
      const std::size_t eq = a.find('=');
      const bool inlineValue = eq != std::string::npos && a.rfind("--", 0) == 0;
      if (inlineValue) {
        name = a.substr(0, eq);
        value = a.substr(eq + 1);
      }
      if (known(withValue, name)) {
        if (!inlineValue) {
          if (i + 1 >= argv.size()) {
            message = "option " + name + " needs a value";
            return false;
          }
          value = argv[++i];
        }
        options.emplace_back(name, value);
      } else if (known(flags, name) && !inlineValue) {
        options.emplace_back(name, "");
      } else {
        message = "unknown option " + a;
        return false;
      }
      continue;
    }
    positional.push_back(a);
  }
  return true;
}

std::vector<std::string> WithLongOutput(const std::vector<std::string>& argv) {
  std::vector<std::string> out = argv;
  for (auto& a : out)
    if (a == "-o") a = "--output";
  return out;
}

bool Args::Has(const std::string& name) const {
  for (const auto& o : options)
    if (o.first == name) return true;
  return false;
}

std::string Args::Value(const std::string& name) const {
  std::string v;
  for (const auto& o : options)
    if (o.first == name) v = o.second;
  return v;
}

}  // namespace crv
