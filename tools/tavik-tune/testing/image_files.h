// Checks that picture files are what they claim to be, without decoding pixels: a PNG's chunk
// structure, checksums and size, an SVG's well-formed XML under one <svg> root.
#ifndef TOOLS_TAVIK_TUNE_TESTING_IMAGE_FILES_H_
#define TOOLS_TAVIK_TUNE_TESTING_IMAGE_FILES_H_

#include <array>
#include <cstdint>
#include <string>
#include <vector>

#include "tavik/base/strings.h"
#include "tools/common/text_proto.h"

namespace tavik::tune::test {

inline uint32_t Crc32(const std::string& bytes, size_t begin, size_t end) {
  static const std::array<uint32_t, 256> table = [] {
    std::array<uint32_t, 256> entries{};
    for (uint32_t n = 0; n < 256; ++n) {
      uint32_t c = n;
      for (int k = 0; k < 8; ++k) c = (c & 1) ? 0xEDB88320u ^ (c >> 1) : c >> 1;
      entries[n] = c;
    }
    return entries;
  }();
  uint32_t crc = 0xFFFFFFFFu;
  for (size_t i = begin; i < end; ++i) {
    crc = table[(crc ^ static_cast<uint8_t>(bytes[i])) & 0xFF] ^ (crc >> 8);
  }
  return crc ^ 0xFFFFFFFFu;
}

inline uint32_t BigEndian32(const std::string& bytes, size_t at) {
  return (uint32_t{static_cast<uint8_t>(bytes[at])} << 24) |
         (uint32_t{static_cast<uint8_t>(bytes[at + 1])} << 16) |
         (uint32_t{static_cast<uint8_t>(bytes[at + 2])} << 8) |
         uint32_t{static_cast<uint8_t>(bytes[at + 3])};
}

// What is wrong with the PNG file at `path` of `width` by `height` pixels; empty when nothing is:
// the signature, then chunks whose checksums hold, IHDR first with the size, IDAT, IEND last.
inline std::string PngProblem(const std::string& path, int width, int height) {
  StatusOr<std::string> read = tools::ReadFileToString(path);
  if (!read.ok()) return std::string(read.status().message());
  const std::string& bytes = *read;
  static constexpr char kSignature[] = "\x89PNG\r\n\x1a\n";
  if (bytes.compare(0, 8, kSignature, 8) != 0) return "no PNG signature";
  std::vector<std::string> types;
  size_t at = 8;
  while (at < bytes.size()) {
    if (bytes.size() - at < 12) return StrCat("truncated chunk at byte ", at);
    const uint32_t length = BigEndian32(bytes, at);
    if (bytes.size() - at - 12 < length) return StrCat("chunk at byte ", at, " runs past the end");
    const std::string type = bytes.substr(at + 4, 4);
    if (Crc32(bytes, at + 4, at + 8 + length) != BigEndian32(bytes, at + 8 + length)) {
      return StrCat("bad checksum of chunk ", type);
    }
    if (types.empty()) {
      if (type != "IHDR" || length != 13) return "IHDR is not the first chunk";
      if (BigEndian32(bytes, at + 8) != static_cast<uint32_t>(width) ||
          BigEndian32(bytes, at + 12) != static_cast<uint32_t>(height)) {
        return StrCat("size ", BigEndian32(bytes, at + 8), " by ", BigEndian32(bytes, at + 12));
      }
    }
    types.push_back(type);
    at += 12 + length;
  }
  if (types.empty() || types.back() != "IEND") return "IEND is not the last chunk";
  for (const std::string& type : types) {
    if (type == "IDAT") return "";
  }
  return "no IDAT chunk";
}

// What is wrong with the SVG file at `path`; empty when nothing is: an XML declaration, then
// elements that nest properly (comments, declarations and quoted attribute values skipped) under
// a single root element <svg>.
inline std::string SvgProblem(const std::string& path) {
  StatusOr<std::string> read = tools::ReadFileToString(path);
  if (!read.ok()) return std::string(read.status().message());
  const std::string& text = *read;
  if (text.rfind("<?xml", 0) != 0) return "no XML declaration";
  std::vector<std::string> open;
  int roots = 0;
  size_t at = 0;
  while ((at = text.find('<', at)) != std::string::npos) {
    if (text.compare(at, 4, "<!--") == 0) {
      const size_t end = text.find("-->", at);
      if (end == std::string::npos) return "unclosed comment";
      at = end + 3;
      continue;
    }
    // The end of the tag, past quoted attribute values.
    size_t end = at + 1;
    char quote = 0;
    for (; end < text.size(); ++end) {
      if (quote != 0) {
        if (text[end] == quote) quote = 0;
      } else if (text[end] == '"' || text[end] == '\'') {
        quote = text[end];
      } else if (text[end] == '>') {
        break;
      }
    }
    if (end >= text.size()) return StrCat("unclosed tag at byte ", at);
    const std::string tag = text.substr(at + 1, end - at - 1);
    at = end + 1;
    if (tag.empty()) return "empty tag";
    if (tag[0] == '?' || tag[0] == '!') continue;
    const bool closing = tag[0] == '/';
    const bool self_closing = tag.back() == '/';
    const size_t name_start = closing ? 1 : 0;
    const size_t name_end = tag.find_first_of(" \t\r\n/", name_start);
    const std::string name = tag.substr(
        name_start, name_end == std::string::npos ? std::string::npos : name_end - name_start);
    if (name.empty()) return "tag without a name";
    if (closing) {
      if (open.empty() || open.back() != name) return StrCat("</", name, "> closes nothing open");
      open.pop_back();
      continue;
    }
    if (open.empty()) {
      if (++roots > 1) return "more than one root element";
      if (name != "svg") return StrCat("root element <", name, ">");
    }
    if (!self_closing) open.push_back(name);
  }
  if (roots == 0) return "no root element";
  if (!open.empty()) return StrCat("<", open.back(), "> is never closed");
  return "";
}

}  // namespace tavik::tune::test

#endif  // TOOLS_TAVIK_TUNE_TESTING_IMAGE_FILES_H_
