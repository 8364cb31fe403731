#include "output/Forms.h"

namespace app {

namespace {

std::string quoted(std::string const& text) {
  if (text.find_first_of("\",\r\n") == std::string::npos) {
    return text;
  }
  std::string result = "\"";
  for (char const c : text) {
    result.append(c == '"' ? 2 : 1, c);
  }
  return result + '"';
}

Fields columnsOf(Form const& form) {
  Fields fields = form.fields;
  if (fields.empty()) {
    for (auto const& field : allFields()) {
      fields.push_back(&field);
    }
  }
  return fields;
}

}  // namespace

std::string csvHeader(Form const& form) {
  std::string header;
  for (auto const* field : columnsOf(form)) {
    header.append(header.empty() ? "" : ",").append(field->name);
  }
  return header + "\r\n";
}

TextOf csvRows(Form const& form) {
  return [fields = columnsOf(form)](Outcome const& outcome) {
    std::string row;
    for (auto const* field : fields) {
      row += quoted(exact(field->value(outcome)));
      row += ',';
    }
    row.back() = '\r';
    return row + '\n';
  };
}

}  // namespace app
