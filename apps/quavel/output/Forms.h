#ifndef QUAVEL_APPS_FORMS_H
#define QUAVEL_APPS_FORMS_H

#include <functional>
#include <memory>
#include <string>

#include "output/Writer.h"

namespace app {

/// Gives the text that a form shows for one file. Called on any thread. If the form is given
/// `isForTerminal`, characters that could steer the terminal are escaped.
using TextOf = std::function<std::string(Outcome const&)>;

/// A card: labelled lines for people. Empty when the file gave no record.
std::string cardOf(Form const& form, Outcome const& outcome);

/// Why a file gives no record, or which fields its record lacks and why: a verdict, then details.
std::string explanationOf(Outcome const& outcome);

/// CSV by RFC 4180: a header row, then a row for each file. Absent values are empty.
std::string csvHeader(Form const& form);
TextOf csvRows(Form const& form, bool isForTerminal);

/// JSON objects, each on one line. For JSON Lines, each includes its line end; in an array, the
/// writer adds commas and line ends. An infinity, which JSON lacks, is "Infinity" or "-Infinity".
TextOf jsonObjects(Form const& form, bool isForTerminal);

/// A table for people, laid out page by page so that no more than a page is ever held. On a
/// terminal it fits the width, and a page ends early if rows come slowly; elsewhere nothing is cut
/// and each page is filled. A single file becomes a card, unless a table is asked for.
std::unique_ptr<Writer> makeTable(Form const& form, Output& output);

}  // namespace app

#endif  // QUAVEL_APPS_FORMS_H
