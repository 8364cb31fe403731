#include <algorithm>
#include <sstream>

#include "output/Forms.h"
#include "terminal/Text.h"

namespace app {

namespace {

constexpr std::size_t kLabelWidth = 17;  // with the blanks after the label

/// The fields of a card when none are chosen, in the order in which people look for them.
Fields cardFields() {
  std::istringstream names(
      "captureDate model lensModel exposureTime fNumber iso focalLength focalLengthIn35mmFilm "
      "exposureBiasValue meteringMode whiteBalance width height orientation isRaw "
      "dateTimeOriginal dateTimeDigitized dateTime hasShootingInfo apertureValue "
      "shutterSpeedValue apexFNumber apexExposureTime");
  Fields fields;
  for (std::string name; names >> name;) {
    fields.push_back(fieldNamed(name));
  }
  return fields;
}

}  // namespace

std::string cardOf(Form const& form, Outcome const& outcome) {
  if (!outcome.record) {
    return {};
  }
  static Fields const usualFields = cardFields();
  bool const fieldsAreChosen = !form.fields.empty();
  bool const showAbsent = form.showAbsent.value_or(fieldsAreChosen);
  // If fields are chosen, the path is shown only as one of them.
  std::string card = fieldsAreChosen ? "" : escapedPath(outcome.path) + "\n";
  for (auto const* field : fieldsAreChosen ? form.fields : usualFields) {
    std::string const text = inWords(*field, outcome);
    if (text.empty() && !showAbsent) {
      continue;
    }
    std::string label = field->label;
    label.resize(std::max(kLabelWidth, label.size() + 1), ' ');
    card += "  " + label + (text.empty() ? "-" : text) + "\n";
  }
  return card;
}

}  // namespace app
