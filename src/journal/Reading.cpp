#include "journal/Reading.h"

#include "journal/Journal.h"

namespace quavel::detail {

void noteReadError(QVStream const& stream, int error) {
  if (Journal* const journal = journalOf(stream)) {
    journal->systemError = error;
  }
}

bool Reading::refuseWork(Work work) const {
  static constexpr char const* kNames[] = {
      "open more than {} directories", "walk over more than {} directory entries",
      "take more than {} values of directory entries", "step over more than {} segments or boxes"};
  auto const index = static_cast<std::size_t>(work);
  auto const bound = static_cast<std::int64_t>(kMaxWork[index]);
  return journal != nullptr
             ? refuse(journal, QVReason::TooMuchWork, -1, "the file makes the reader {}",
                      composed(kNames[index], {bound}))
             : false;
}

}  // namespace quavel::detail
