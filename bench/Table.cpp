#include "Table.h"

#include <algorithm>
#include <iomanip>
#include <ostream>
#include <set>
#include <sstream>

namespace quavel::bench {
namespace {

using Samples = std::vector<Sample const*>;

struct Group {
  std::string name;
  std::set<std::string> extensions;
};

struct Column {
  std::string title;
  int digits;
  std::vector<std::string> values;  ///< Shown side by side.
};

std::vector<Column> columns(std::vector<std::string> const& peerNames) {
  std::vector<Column> all = {
      {"B (µs)", 2, {"floor"}}, {"path (B)", 2, {"path"}}, {"memory (B)", 2, {"memory"}}};
  for (auto const& name : peerNames) {
    all.push_back({name + " (B)", 1, {name}});
  }
  all.push_back({"allocations path / memory", 0, {"path blocks", "memory blocks"}});
  all.push_back({"heap bytes path / memory", 0, {"path heap", "memory heap"}});
  all.push_back({"large blocks by path / bytes", 0, {"large blocks", "large heap"}});
  all.push_back({"system calls / at 1 GB", 0, {"calls", "padded calls"}});
  all.push_back({"bytes read / at 1 GB", 0, {"read", "padded read"}});
  return all;
}

std::vector<Group> groups(std::vector<Sample> const& samples) {
  std::vector<Group> all = {{"**JPEG**", {"jpeg", "jpg"}},
                            {"**TIFF family**", {"tiff", "tif", "dng", "cr2", "nrw", "3fr"}},
                            {"**NEF, ARW, RAF**", {"nef", "arw", "raf"}},
                            {"**CR3**", {"cr3"}}};
  std::set<std::string> extensions;
  for (auto const& sample : samples) {
    extensions.insert(sample.extension);
  }
  for (auto const& extension : extensions) {
    all.push_back({extension, {extension}});
  }
  return all;
}

double median(std::vector<double> values) {
  std::sort(values.begin(), values.end());
  auto const middle = values.size() / 2;
  return values.size() % 2 == 1 ? values[middle] : (values[middle - 1] + values[middle]) / 2;
}

/// The median; followed by the number of files that it stands for when that is not all of them.
std::string cell(Samples const& samples, std::string const& value, int digits) {
  std::vector<double> known;
  for (auto const* const sample : samples) {
    if (auto const found = sample->values.find(value); found != sample->values.end()) {
      known.push_back(found->second);
    }
  }
  if (known.empty()) {
    return "-";
  }
  std::ostringstream text;
  text << std::fixed << std::setprecision(digits) << median(known);
  if (known.size() < samples.size()) {
    text << " (" << known.size() << ")";
  }
  return text.str();
}

void printRow(std::ostream& out, std::string const& name, Samples const& samples,
              std::vector<Column> const& all) {
  out << "| " << name << " | " << samples.size() << " |";
  for (auto const& column : all) {
    char const* separator = " ";
    for (auto const& value : column.values) {
      out << separator << cell(samples, value, column.digits);
      separator = " / ";
    }
    out << " |";
  }
  out << "\n";
}

}  // namespace

void printTable(std::ostream& out, std::vector<Sample> const& samples,
                std::vector<std::string> const& peerNames) {
  auto const all = columns(peerNames);
  out << "| format | files |";
  std::string rule = "|---|--:|";
  for (auto const& column : all) {
    out << " " << column.title << " |";
    rule += "--:|";
  }
  out << "\n" << rule << "\n";
  for (auto const& group : groups(samples)) {
    Samples members;
    for (auto const& sample : samples) {
      if (group.extensions.count(sample.extension) != 0) {
        members.push_back(&sample);
      }
    }
    if (!members.empty()) {
      printRow(out, group.name, members, all);
    }
  }
}

}  // namespace quavel::bench
