#pragma once

// Reading packets from files. The format is told by the contents, never by the
// file name:
//
//   property list   one packet (an IFX report), XML or binary
//   snapshot        a property list whose root dictionary holds "Timestamp"
//                   and "Data": the packets kept in its history are replayed
//   DLF             any other binary: a sequence of diagnostic log records
//   hex text        text with one packet per line in hex: blanks and colons may
//                   stand between bytes, blank lines and lines starting with
//                   "#" are skipped
//
// A log packet is a type byte (0x01 ordinary, 0xFF extra code) followed by one
// log record: 16-bit length (of the whole record), 16-bit code, 8-byte
// timestamp, payload; little-endian. Records read from DLF files become packets
// with the type byte put back.
//
// DLF. Records follow one another; each becomes a packet of type 0x01, or 0xFF
// when its payload is a binary property list ("bplist00"), as only extra codes
// carry one. Version reports (code 0x1FFD) are not packets and are skipped.
// A DLF that this application saved opens with its version report (161 bytes,
// "EXECUTABLE_NAME" at offset 23) and keeps the type bytes of all but the first
// packet of each display interval, so a 0x01 or 0xFF may stand before a record
// there. Of all the ways to read such a file, the reader takes the one that
// ends at the end of the file (else at a record cut off by it), with the most
// records, then the fewest records without a type byte; on a tie, the record
// without a type byte. Taking each record as it comes fails: 0x01 0x20 also
// reads as a record of 8193 bytes, which fits in any larger file and swallows
// the records behind it. Other DLFs are read record after record.
//
// Snapshot. Every entry of "Data" that holds "DisplayState" contributes its
// packets, in order: a property list (or a "DisplayState" that is not data) is
// one IFX packet; other data is the packets of one display interval, each as
// received: an optional 2-byte prefix (when its first byte is 0x81), the type
// byte and the record of the length its header gives. The entry that holds
// "DLF" is replayed only when no entry held packets.
//
// Truncated trailing data ends the list at the last whole record or packet,
// with a warning that names the offset. Anything else that cannot be read is an
// error. Nothing is ever read past the end of the contents.

#include <optional>
#include <span>
#include <string>
#include <vector>

#include "platform/Value.h"

namespace corvane::tools {

struct InputError {
  std::string message;  // one line, naming the source and where in it
};

struct PacketList {
  std::vector<Bytes> packets;
  std::vector<std::string> warnings;  // one line each, naming the source and where in it
};

enum class InputFormat { PropertyList, Snapshot, Dlf, HexText, Framed };

InputFormat detectInputFormat(std::span<const std::uint8_t> contents);

// Splits the contents of one input into packets, in whichever of the formats
// above it is. `source` names the input in messages.
std::optional<PacketList> packetsFromContents(std::span<const std::uint8_t> contents, const std::string& source,
                                              InputError& error);

std::optional<PacketList> packetsFromDlf(std::span<const std::uint8_t> dlf, const std::string& source,
                                         InputError& error);

// True for a dictionary with "Timestamp" and "Data".
bool isSnapshot(const Value& root);
std::optional<PacketList> packetsFromSnapshot(const Value& snapshot, const std::string& source, InputError& error);
std::optional<PacketList> packetsFromSnapshotContents(std::span<const std::uint8_t> contents,
                                                      const std::string& source, InputError& error);

// Parses one line of hex text; nullopt with a reason for a bad line.
std::optional<Bytes> parseHexLine(std::string_view line, std::string& reason);
// The same into a buffer that is reused from line to line; false with a reason.
bool parseHexLineInto(std::string_view line, Bytes& out, std::string& reason);

// Reads a whole file ("-" is standard input).
std::optional<Bytes> readInput(const std::string& path, InputError& error);

}  // namespace corvane::tools
