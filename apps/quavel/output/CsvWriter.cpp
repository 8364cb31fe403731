#include "output/CsvWriter.h"

namespace app {

namespace {

struct ToText {
  std::string operator()(std::monostate) const { return {}; }
  std::string operator()(bool value) const { return value ? "true" : "false"; }
  std::string operator()(std::int32_t value) const { return std::to_string(value); }
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

Fields everyField() {
  Fields fields;
  for (auto const& field : allFields()) {
    fields.push_back(&field);
  }
  return fields;
}

}  // namespace

CsvWriter::CsvWriter(Form const& form, Output& output)
    : fields_(form.fields.empty() ? everyField() : form.fields), output_(output) {
  std::string header;
  for (auto const* field : fields_) {
    header.append(header.empty() ? "" : ",").append(field->name);
  }
  output_.add(header + "\r\n");
}

void CsvWriter::prepare(Outcome& outcome) const {
  std::string row;
  for (auto const* field : fields_) {
    row += quoted(std::visit(ToText(), field->value(outcome)));
    row += ',';
  }
  row.back() = '\r';
  outcome.text = row + '\n';
  outcome.record.reset();
}

void CsvWriter::add(Outcome&& outcome) { output_.add(outcome.text); }

}  // namespace app
