#include <quavel/QVCR3Box.h>
#include <quavel/QVCR3BoxHeader.h>
#include <quavel/QVCR3UUIDBox.h>

#include <array>
#include <string>

#include "WhyCmt.h"
#include "WhyFormats.h"
#include "terminal/Escape.h"

namespace app::why {

namespace {

constexpr std::uint32_t kMoov = 0x6d6f6f76;
constexpr std::uint32_t kUuid = 0x75756964;
constexpr std::uint32_t kCmt1 = 0x434d5431;
constexpr std::uint32_t kCmt2 = 0x434d5432;
constexpr long kHeaderSize = 8;

/// A box that a walk has come to.
struct WalkedBox {
  std::string text() const;  ///< "moov box at 0x18 (24)"

  long start = 0;
  std::uint32_t size = 0;
  std::uint32_t type = 0;
  bool isRead = false;
};

std::string WalkedBox::text() const {
  std::string name;
  for (unsigned const shift : {24U, 16U, 8U, 0U}) {
    name += static_cast<char>(type >> shift & 0xffU);
  }
  return escaped(name) + " box at " + offsetText(start);
}

/// What a walk keeps of the children it looks into.
struct KeptBoxes {
  std::string uuid;  ///< The last `uuid` box; empty: none was met.
  bool isMetadata = false;
  bool hasCmt1 = false;
  bool hasCmt2 = false;
};

/// Reads the box at the stream's position and steps over it.
WalkedBox readBox(Walk& walk, std::string const& place) {
  WalkedBox box;
  box.start = walk.stream->getOffset();
  quavel::QVCR3Box plain;
  box.isRead = plain.read(walk.stream);
  box.size = plain.header()->size();
  box.type = plain.header()->type();
  if (box.isRead) {
    return box;
  }
  walk.stream->setOffset(box.start);
  if (!walk.stream->readLong(&box.size) || !walk.stream->readLong(&box.type)) {
    walk.stop(walk.cut("the header of the next box " + place));
    return box;
  }
  walk.stop("the " + box.text() + ' ' + place + " has size " + std::to_string(box.size) +
            "; at least its header's 8 bytes are wanted" +
            (box.size == 1 ? " (1 stands for a 64-bit size, which is not read)" : "") +
            (box.size == 0 ? " (0 stands for \"to the end of the file\", which is not read)" : ""));
  return box;
}

/// Reads the payload of a CMT box and leaves the stream behind the box.
bool walkCmt(Walk& walk, WalkedBox const& box) {
  walk.stream->baseOffset = box.start + kHeaderSize;
  walk.stream->setOffset(0);
  if (!(box.type == kCmt1 ? walkCmt1(walk) : walkCmt2(walk))) {
    return false;
  }
  walk.stream->baseOffset = 0;
  walk.stream->byteOrder = quavel::ByteOrder::BigEndian;
  walk.stream->setOffset(box.start + long{box.size});
  return true;
}

bool walkMetadataChildren(Walk& walk, WalkedBox const& uuid, KeptBoxes& kept) {
  long const end = uuid.start + long{uuid.size};
  std::string const place = "in the metadata " + uuid.text();
  while (walk.stream->getOffset() < end && !(kept.hasCmt1 && kept.hasCmt2)) {
    auto const child = readBox(walk, place);
    if (!child.isRead) {
      return false;
    }
    if (child.type != kCmt1 && child.type != kCmt2) {
      continue;
    }
    if (!walkCmt(walk, child)) {
      return false;
    }
    (child.type == kCmt1 ? kept.hasCmt1 : kept.hasCmt2) = true;
  }
  return true;
}

bool walkUuid(Walk& walk, WalkedBox const& uuid, KeptBoxes& kept) {
  kept = {};
  kept.uuid = uuid.text();
  walk.stream->setOffset(uuid.start + kHeaderSize);
  std::array<std::uint32_t, 4> identifier = {};
  for (auto& word : identifier) {
    if (!walk.stream->readLong(&word)) {
      return walk.stop(walk.cut("the 16-byte identifier of the " + uuid.text()));
    }
  }
  kept.isMetadata = identifier == quavel::metadataUUID;
  walk.passed(uuid.text() + (kept.isMetadata ? ": the metadata" : ": another identifier"));
  if (kept.isMetadata && !walkMetadataChildren(walk, uuid, kept)) {
    return false;
  }
  walk.stream->setOffset(uuid.start + long{uuid.size});
  return true;
}

bool walkMoovChildren(Walk& walk, WalkedBox const& moov, KeptBoxes& kept) {
  long const end = moov.start + long{moov.size};
  std::string const place = "in the " + moov.text();
  walk.stream->setOffset(moov.start + kHeaderSize);
  while (walk.stream->getOffset() < end) {
    auto const child = readBox(walk, place);
    if (!child.isRead || (child.type == kUuid && !walkUuid(walk, child, kept))) {
      return false;
    }
  }
  return true;
}

/// What the boxes kept in the end give or do not give.
void judge(Walk& walk, WalkedBox const& moov, KeptBoxes const& kept) {
  if (kept.uuid.empty()) {
    walk.stop("the " + moov.text() + " has no uuid box, in which the metadata would be");
  } else if (!kept.isMetadata) {
    walk.stop("the last uuid box of the " + moov.text() + ", the " + kept.uuid +
              ", is not the metadata's: its identifier is another one");
  } else if (!kept.hasCmt1 && !kept.hasCmt2) {
    walk.stop("the metadata " + kept.uuid + " has neither a CMT1 nor a CMT2 box");
  } else if (!kept.hasCmt1) {
    absentCmt1(walk, "no CMT1 box in the metadata " + kept.uuid);
  } else if (!kept.hasCmt2) {
    absentCmt2(walk, "no CMT2 box in the metadata " + kept.uuid);
  }
}

}  // namespace

void walkCr3(Walk& walk) {
  std::string const place = "before a moov box was met";
  while (true) {
    auto const box = readBox(walk, place);
    if (!box.isRead) {
      return;
    }
    walk.passed(box.text() + ": " + std::to_string(box.size) + " bytes");
    if (box.type != kMoov) {
      continue;
    }
    KeptBoxes kept;
    if (walkMoovChildren(walk, box, kept)) {
      judge(walk, box, kept);
    }
    return;
  }
}

}  // namespace app::why
