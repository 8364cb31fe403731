#ifndef QUAVEL_SRC_FRONT_EXPLAIN_H
#define QUAVEL_SRC_FRONT_EXPLAIN_H

namespace quavel {

class QVMetadata;
class QVStream;

namespace detail {

class Journal;
struct Format;

/// Completes the notes of a read that has ended: what the content looks like when that does not fit
/// the format, and, of a record, why each absent field is absent. `record` is null after a failure.
void explain(Format const& format, QVStream& stream, QVMetadata const* record, Journal& journal);

}  // namespace detail
}  // namespace quavel

#endif  // QUAVEL_SRC_FRONT_EXPLAIN_H
