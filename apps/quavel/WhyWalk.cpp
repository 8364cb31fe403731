#include "WhyWalk.h"

#include <iomanip>
#include <sstream>

namespace app::why {

namespace {

constexpr std::size_t kMostSteps = 8;

// Offsets below it read the same in both notations.
constexpr std::int64_t kFirstHexadecimal = 10;

}  // namespace

std::string offsetText(std::int64_t offset) {
  std::ostringstream text;
  if (offset < kFirstHexadecimal) {
    text << offset;
  } else {
    text << "0x" << std::hex << offset << " (" << std::dec << offset << ')';
  }
  return text.str();
}

std::string hexText(std::vector<std::uint8_t> const& bytes) {
  std::ostringstream text;
  text << std::hex << std::setfill('0');
  char const* separator = "";
  for (std::uint8_t const byte : bytes) {
    text << separator << std::setw(2) << unsigned{byte};
    separator = " ";
  }
  return text.str();
}

Walk::Walk(std::string const& path, std::int64_t fileByteCount)
    : fileSize(fileByteCount), trace(std::make_shared<Trace>(path)), stream(trace) {}

bool Walk::stop(std::string const& why) {
  if (reason.empty()) {
    reason = why;
  }
  return false;
}

bool Walk::exceed(std::string const& what) {
  exceeded = what;
  return false;
}

std::string Walk::limit() const {
  return trace->isSpent() ? "it asks for millions of reads" : exceeded;
}

void Walk::passed(std::string const& step) {
  if (steps.size() < kMostSteps) {
    steps.push_back(step);
  } else {
    ++furtherSteps;
  }
}

void Walk::absent(std::string const& field, std::string const& why) { absences[field] = why; }

std::int64_t Walk::position() const { return inFile(stream->getOffset()); }

std::int64_t Walk::inFile(std::int64_t offset) const { return stream->baseOffset + offset; }

std::vector<std::uint8_t> Walk::peek(std::int64_t at, std::size_t count) const {
  long const before = stream->getOffset();
  stream->setOffset(static_cast<long>(at - stream->baseOffset));
  std::vector<std::uint8_t> bytes(count);
  bytes.resize(static_cast<std::size_t>(stream->readBuffer(bytes.data(), count)));
  stream->setOffset(before);
  return bytes;
}

std::string Walk::cut(std::string const& what) const {
  ShortRead const& missing = trace->shortRead;
  auto const wanted = static_cast<std::int64_t>(missing.wanted);
  std::string const place = what + ": " + std::to_string(wanted) +
                            (wanted == 1 ? " byte" : " bytes") + " wanted at " +
                            offsetText(missing.position);
  bool const isInFile = missing.position + wanted <= fileSize;
  return place + (isInFile ? ", but reading there fails" : ", but " + fileEnd());
}

std::string Walk::fileEnd() const { return "the file ends at " + offsetText(fileSize); }

}  // namespace app::why
