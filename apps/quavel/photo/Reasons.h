#ifndef QUAVEL_APPS_REASONS_H
#define QUAVEL_APPS_REASONS_H

#include <quavel/QVJournal.h>

#include <exception>
#include <string>

#include "photo/Outcome.h"

/// Why files give no record, in words that their owner can act on.
namespace app::reason {

// The codes of what the library is not even asked for.
inline constexpr char kFolder[] = "folder";
inline constexpr char kSpecialFile[] = "special-file";
inline constexpr char kBadPath[] = "bad-path";
inline constexpr char kUnreadableFolder[] = "unreadable-folder";
inline constexpr char kUnreadableList[] = "unreadable-list";
inline constexpr char kTooLong[] = "too-long";
inline constexpr char kOutOfMemory[] = "out-of-memory";
inline constexpr char kUnexpected[] = "unexpected";

/// The text of an error number of the system's.
std::string systemText(int error);

Problem cannotOpen(int error);
Problem cannotRead(int error);
/// What was thrown on the way.
Problem failure(std::exception const& error);
/// The library's refusal; one of what is plainly another kind of file says so first.
Problem refusal(quavel::QVJournal const& journal);

}  // namespace app::reason

#endif  // QUAVEL_APPS_REASONS_H
