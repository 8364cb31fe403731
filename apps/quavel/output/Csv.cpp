#include "output/Forms.h"
#include "terminal/Text.h"

namespace app {

namespace {

std::string quoted(std::string const& text) {
  if (text.find_first_of("\",\r\n") == std::string::npos) {
    return text;
  }
  std::string result = "\"";
  for (char const c : text) {
    result.append(c == '"' ? 2 : 1, c);  // doubles the quotes within
  }
  return result + '"';
}

char const* lineEnd(Form const& form) { return form.endsWithLf ? "\n" : "\r\n"; }

Fields fieldsOf(Form const& form) {
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
  for (auto const* field : fieldsOf(form)) {
    header.append(header.empty() ? "" : ",").append(field->name);
  }
  return header + lineEnd(form);
}

TextMaker csvRowMaker(Form const& form, bool isForTerminal) {
  return [fields = fieldsOf(form), isForTerminal, end = lineEnd(form)](Outcome const& outcome) {
    std::string row;
    for (auto const* field : fields) {
      std::string text;
      appendExact(text, field->value(outcome));
      if (isForTerminal) {
        // In the text of a path, U+FFFD stands for bytes that are not UTF-8; a terminal can get
        // them escaped.
        text = field->name == "path" ? escapedPath(outcome.path) : escaped(text);
      }
      row += quoted(text) + ',';
    }
    row.pop_back();  // the last comma
    return row + end;
  };
}

}  // namespace app
