// Reads photos and tells of each why it gives no record, or why fields of its record are absent.
#include <quavel/QVJournal.h>

#include <iostream>

int main(int argc, char** argv) {
  quavel::QVJournal journal;
  for (int i = 1; i < argc; ++i) {
    auto const record = journal.read(argv[i]);
    if (!record) {
      quavel::QVNote const& why = *journal.refusal();
      std::cout << "no record, " << quavel::QVJournal::reasonName(why.reason) << ": " << why.text
                << '\n';
      continue;
    }
    std::cout << record->width << 'x' << record->height << '\n';
    for (quavel::QVNote const& note : journal.notes()) {
      if (note.kind == quavel::QVNoteKind::Absence && note.reason == quavel::QVReason::NotInFile) {
        std::cout << "no " << note.field << ": " << note.text << '\n';
      }
    }
  }
}
