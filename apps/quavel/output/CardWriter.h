#ifndef QUAVEL_APPS_CARDWRITER_H
#define QUAVEL_APPS_CARDWRITER_H

#include "output/Writer.h"

namespace app {

/// The card of a file that gave a record, labelled lines for people; empty for any other.
std::string cardOf(Form const& form, Outcome const& outcome);

/// A card for every file that gave a record.
class CardWriter : public Writer {
 public:
  CardWriter(Form const& form, Output& output);

  void prepare(Outcome& outcome) const override;
  void add(Outcome&& outcome) override;

 private:
  Form const& form_;
  Output& output_;
  bool isFirst_ = true;
};

}  // namespace app

#endif  // QUAVEL_APPS_CARDWRITER_H
