#include "output/Forms.h"

namespace app {

namespace {

struct ToText {
  std::string operator()(std::monostate) const { return {}; }
  std::string operator()(bool value) const { return value ? "true" : "false"; }
  template <class Integer>
  std::string operator()(Integer value) const {
    return std::to_string(value);
  }
  std::string operator()(float value) const { return exact(value); }
  std::string operator()(std::string const& value) const { return value; }
};

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
  if (!fields.empty()) {
    return fields;
  }
  for (auto const& field : allFields()) {
    fields.push_back(&field);
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
      row += quoted(std::visit(ToText(), field->value(outcome)));
      row += ',';
    }
    row.back() = '\r';
    return row + '\n';
  };
}

}  // namespace app
