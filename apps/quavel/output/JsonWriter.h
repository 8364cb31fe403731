#ifndef QUAVEL_APPS_JSONWRITER_H
#define QUAVEL_APPS_JSONWRITER_H

#include "output/Writer.h"

namespace app {

/// JSON objects, one a line, alone or as one array. An infinity, which JSON has no number for, is
/// the text "Infinity" or "-Infinity".
class JsonWriter : public Writer {
 public:
  /// Writes the array's head.
  JsonWriter(Form const& form, Output& output);

  void prepare(Outcome& outcome) const override;
  void add(Outcome&& outcome) override;
  void end() override;

 private:
  struct Member {
    Field const* field;
    std::string name;  // as JSON, with the colon
  };
  using Members = std::vector<Member>;

  static Members membersOf(Fields const& fields);

  Members members_;
  Members errorMembers_;
  Members bytesOfErrors_;  // pathBytes, shown where it is needed
  Members pathBytes_;      // the same, unless the fields name it or leave out the path
  bool showAbsent_;
  bool isArray_;
  bool isFirst_ = true;
  Output& output_;
};

}  // namespace app

#endif  // QUAVEL_APPS_JSONWRITER_H
