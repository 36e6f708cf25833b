#ifndef WORDCATCHER_TESTS_FORGEDIMAGE_H
#define WORDCATCHER_TESTS_FORGEDIMAGE_H

#include <array>
#include <cstddef>
#include <cstring>
#include <span>
#include <vector>

#include "wordcatcher/storage/SearchImageFormat.h"

namespace wordcatcher::testing {

using ImageBytes = std::vector<std::byte>;

/// Gives an image whose bytes were altered the checksums that it asks for, its sections' where they
/// lie within the file, and its header's: what checks the content is reached then.
void forgeChecksums(ImageBytes& image);

/// The section table as it stands in an image of all sections.
std::vector<image::Section> sectionTable(const ImageBytes& image);

/// A search image taken apart, whose sections can be exchanged.
class ForgedImage {
 public:
  explicit ForgedImage(const ImageBytes& image);

  template <typename Element>
  std::vector<Element> get(image::SectionKind kind) const {
    const ImageBytes& bytes = _sections.at(static_cast<std::size_t>(kind));
    std::vector<Element> elements(bytes.size() / sizeof(Element));
    if (!elements.empty()) {
      std::memcpy(elements.data(), bytes.data(), bytes.size());
    }
    return elements;
  }

  template <typename Element>
  void set(image::SectionKind kind, const std::vector<Element>& elements) {
    const auto bytes = std::as_bytes(std::span(elements));
    _sections.at(static_cast<std::size_t>(kind)).assign(bytes.begin(), bytes.end());
  }

  image::Header& header() { return _header; }

  /// The image put together again, with the right places, lengths and checksums.
  ImageBytes bytes() const;

 private:
  image::Header _header = {};
  std::array<ImageBytes, image::kSectionKinds + 1> _sections;
  std::array<std::uint32_t, image::kSectionKinds + 1> _elementBytes = {};
};

}  // namespace wordcatcher::testing

#endif
