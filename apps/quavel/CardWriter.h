#ifndef QUAVEL_APPS_CARDWRITER_H
#define QUAVEL_APPS_CARDWRITER_H

#include "Writer.h"

namespace app {

/// The card of a file that gave a record, labelled lines for people; empty for any other.
std::string cardOf(Options const& options, Outcome const& outcome);

/// A card for every file that gave a record.
class CardWriter : public Writer {
 public:
  CardWriter(Options const& options, Output& output);

  void prepare(Outcome& outcome) const override;
  void add(Outcome&& outcome) override;

 private:
  Options const& options_;
  Output& output_;
  bool isFirst_ = true;
};

}  // namespace app

#endif  // QUAVEL_APPS_CARDWRITER_H
