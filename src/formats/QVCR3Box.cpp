#include "quavel/QVCR3Box.h"

#include "formats/BoxWalk.h"

namespace quavel {

QVCR3Box::~QVCR3Box() = default;

bool QVCR3Box::read(std::shared_ptr<QVStream>& stream) {
  auto const scope = detail::ReadScope::beginOrJoin(*stream);
  boxHeader = std::make_shared<QVCR3BoxHeader>();
  detail::BoxWalk walk(stream, /*place=*/{});  // a box around this one is not known here
  return walk.stepOver(*boxHeader);
}

std::shared_ptr<QVCR3BoxHeader> QVCR3Box::header() const { return boxHeader; }

}  // namespace quavel
