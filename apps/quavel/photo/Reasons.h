#ifndef QUAVEL_APPS_REASONS_H
#define QUAVEL_APPS_REASONS_H

#include <quavel/QVJournal.h>

#include <exception>
#include <string>

#include "photo/Outcome.h"

/// Why files give no record, in words that their owner can act on.
namespace app::reason {

// The codes of problems other than the library's refusals.
inline constexpr char kFolder[] = "folder";  // where only a file may be, as in a list
inline constexpr char kSpecialFile[] = "special-file";
inline constexpr char kBadPath[] = "bad-path";
inline constexpr char kUnreadableFolder[] = "unreadable-folder";
inline constexpr char kUnreadableList[] = "unreadable-list";
inline constexpr char kTooLong[] = "too-long";  // more than 1 GiB on standard input
inline constexpr char kOutOfMemory[] = "out-of-memory";
inline constexpr char kUnexpected[] = "unexpected";

std::string systemText(int error);  ///< The system's text for an `errno`.

Problem cannotOpen(int error);
Problem cannotRead(int error);
/// For an exception thrown while the file was read or its output was made.
Problem failure(std::exception const& error);
/// The library's refusal. If the file looks like another format, the text says that first.
Problem refusal(quavel::QVJournal const& journal);

}  // namespace app::reason

#endif  // QUAVEL_APPS_REASONS_H
