#ifndef QUAVEL_APPS_FORMS_H
#define QUAVEL_APPS_FORMS_H

#include <functional>
#include <memory>
#include <string>

#include "output/Writer.h"

namespace app {

/// Makes the text that is shown for one file. Called on any thread.
using TextMaker = std::function<std::string(Outcome const&)>;

/// A card: labelled lines for people. Empty when the file gave no record.
std::string cardOf(Form const& form, Outcome const& outcome);

/// Why a file gives no record, or which fields its record lacks and why: a verdict, then details.
std::string explanationOf(Outcome const& outcome);

/// CSV by RFC 4180: a header row, then a row for each file. Absent values are empty. With
/// `isForTerminal`, characters that could steer the terminal are escaped.
std::string csvHeader(Form const& form);
TextMaker csvRowMaker(Form const& form, bool isForTerminal);

/// JSON objects, each on one line. For JSON Lines, each includes its line end; in an array, the
/// writer adds commas and line ends. An infinity, which JSON lacks, is "Infinity" or "-Infinity".
/// With `isForTerminal`, characters are escaped as for CSV. This maker keeps a reference to `form`;
/// that of CSV does not.
TextMaker jsonObjectMaker(Form const& form, bool isForTerminal);

/// A table for people. It is laid out a page of 500 rows at a time, so that no more are held in
/// memory. On a terminal it fits the width, and a page ends early if rows come slowly; elsewhere
/// nothing is cut and each page is filled. With FormKind::Automatic, a single file becomes a card.
std::unique_ptr<Writer> makeTable(Form const& form, Output& output);

}  // namespace app

#endif  // QUAVEL_APPS_FORMS_H
