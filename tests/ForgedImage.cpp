#include "ForgedImage.h"

#include <algorithm>

#define XXH_INLINE_ALL
#include <xxhash.h>

namespace wordcatcher::testing {

namespace {

template <typename Record>
Record readAt(const ImageBytes& image, std::size_t offset) {
  Record record;
  std::memcpy(&record, image.data() + offset, sizeof record);
  return record;
}

template <typename Record>
void writeAt(ImageBytes& image, std::size_t offset, const Record& record) {
  std::memcpy(image.data() + offset, &record, sizeof record);
}

}  // namespace

void forgeChecksums(ImageBytes& image) {
  if (image.size() < image::headerBytes(0)) {
    return;
  }
  const auto header = readAt<image::Header>(image, 0);
  const std::size_t room = (image.size() - image::headerBytes(0)) / sizeof(image::Section);
  if (header.sectionCount > room) {
    return;
  }
  for (std::size_t i = 0; i < header.sectionCount; ++i) {
    const std::size_t at = sizeof(image::Header) + i * sizeof(image::Section);
    auto section = readAt<image::Section>(image, at);
    if (section.offset <= image.size() && section.bytes <= image.size() - section.offset) {
      section.checksum = XXH3_64bits(image.data() + section.offset, section.bytes);
      writeAt(image, at, section);
    }
  }
  const std::size_t covered = image::headerBytes(header.sectionCount) - sizeof(std::uint64_t);
  writeAt(image, covered, std::uint64_t{XXH3_64bits(image.data(), covered)});
}

std::vector<image::Section> sectionTable(const ImageBytes& image) {
  std::vector<image::Section> sections(image::kSectionKinds);
  for (std::size_t i = 0; i < sections.size(); ++i) {
    sections[i] = readAt<image::Section>(image, sizeof(image::Header) + i * sizeof(image::Section));
  }
  return sections;
}

ForgedImage::ForgedImage(const ImageBytes& image) : _header(readAt<image::Header>(image, 0)) {
  for (const auto& section : sectionTable(image)) {
    const auto kind = static_cast<std::size_t>(section.kind);
    const auto first = image.begin() + static_cast<std::ptrdiff_t>(section.offset);
    _sections.at(kind).assign(first, first + static_cast<std::ptrdiff_t>(section.bytes));
    _elementBytes.at(kind) = section.elementBytes;
  }
}

ImageBytes ForgedImage::bytes() const {
  ImageBytes image(image::headerBytes(image::kSectionKinds));
  for (std::size_t kind = 1; kind <= image::kSectionKinds; ++kind) {
    constexpr std::size_t kAlignment = image::kSectionAlignment;
    image.resize((image.size() + kAlignment - 1) / kAlignment * kAlignment);
    const image::Section section = {static_cast<image::SectionKind>(kind), _elementBytes.at(kind),
                                    image.size(), _sections.at(kind).size(), 0};
    writeAt(image, sizeof(image::Header) + (kind - 1) * sizeof section, section);
    image.insert(image.end(), _sections.at(kind).begin(), _sections.at(kind).end());
  }
  image::Header header = _header;
  header.fileBytes = image.size();
  header.sectionCount = image::kSectionKinds;
  writeAt(image, 0, header);
  forgeChecksums(image);
  return image;
}

}  // namespace wordcatcher::testing
