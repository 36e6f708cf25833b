#include "wordcatcher/storage/SearchImage.h"

#include <fcntl.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <system_error>

#define XXH_INLINE_ALL
#include <xxhash.h>

#include "wordcatcher/Error.h"

namespace wordcatcher {

namespace {

using image::SectionKind;
using image::TreeSlot;

/// A descriptor that closes itself.
class Descriptor {
 public:
  explicit Descriptor(int number) : _number(number) {}
  ~Descriptor() {
    if (_number >= 0) {
      close(_number);
    }
  }
  Descriptor(const Descriptor&) = delete;
  Descriptor& operator=(const Descriptor&) = delete;
  int number() const noexcept { return _number; }

 private:
  int _number;
};

[[noreturn]] void throwUnreadable(const std::string& path, int code) {
  const std::string reason = std::generic_category().message(code);
  if (code == ENOENT || code == ENOTDIR) {
    throw Error(ErrorCode::notFound, "There is no index at " + path + " (" + reason +
                                         "); check the path, or build one there.");
  }
  throw Error(ErrorCode::notReadable, "The index " + path + " cannot be read (" + reason +
                                          "); check its permissions and its path.");
}

std::vector<std::byte> readAll(int descriptor, std::size_t bytes, const std::string& path) {
  std::vector<std::byte> content(bytes);
  std::size_t done = 0;
  while (done < bytes) {
    const ssize_t got = read(descriptor, content.data() + done, bytes - done);
    if (got < 0 && errno == EINTR) {
      continue;
    }
    if (got < 0) {
      throwUnreadable(path, errno);
    }
    if (got == 0) {
      break;
    }
    done += static_cast<std::size_t>(got);
  }
  content.resize(done);
  return content;
}

}  // namespace

std::shared_ptr<const SearchImage> SearchImage::open(const std::string& path, Load load) {
  // Without O_NONBLOCK a pipe would be waited for until somebody writes to it.
  const Descriptor file(::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK));
  struct stat status = {};
  if (file.number() < 0 || fstat(file.number(), &status) != 0) {
    throwUnreadable(path, errno);
  }
  if (!S_ISREG(status.st_mode)) {
    throw Error(ErrorCode::notAnIndex, path + " is not a file; name a search image (.wci).");
  }
  const auto bytes = static_cast<std::size_t>(status.st_size);
  std::shared_ptr<SearchImage> opened(new SearchImage);
  if (load == Load::copy || bytes == 0) {
    opened->_copy = readAll(file.number(), bytes, path);
    opened->_bytes = opened->_copy;
  } else {
    void* mapping = mmap(nullptr, bytes, PROT_READ, MAP_SHARED, file.number(), 0);
    if (mapping == MAP_FAILED) {
      throwUnreadable(path, errno);
    }
    opened->_mapping = mapping;
    opened->_mappedBytes = bytes;
    opened->_bytes = {static_cast<const std::byte*>(mapping), bytes};
  }
  opened->bind(path);
  return opened;
}

std::shared_ptr<const SearchImage> SearchImage::fromBytes(std::vector<std::byte> bytes) {
  std::shared_ptr<SearchImage> opened(new SearchImage);
  opened->_copy = std::move(bytes);
  opened->_bytes = opened->_copy;
  opened->bind("in memory");
  return opened;
}

void SearchImage::throwDamaged(const std::string& what) const {
  throw Error(ErrorCode::damaged, "The index " + _name + " is damaged (" + what +
                                      "); build it again from its phrases.");
}

SearchImage::~SearchImage() {
  if (_mapping != nullptr) {
    munmap(_mapping, _mappedBytes);
  }
}

const image::Section& SearchImage::find(SectionKind kind) const {
  const auto section =
      std::find_if(_sections.begin(), _sections.end(),
                   [kind](const image::Section& candidate) { return candidate.kind == kind; });
  if (section == _sections.end()) {
    throwDamaged("a section is missing");
  }
  return *section;
}

template <typename Element>
std::span<const Element> SearchImage::sectionOf(SectionKind kind) const {
  const image::Section& section = find(kind);
  if (section.elementBytes != sizeof(Element) || section.bytes % sizeof(Element) != 0) {
    throwDamaged("a section has elements of another size");
  }
  const auto bytes = _bytes.subspan(section.offset, section.bytes);
  return {reinterpret_cast<const Element*>(bytes.data()), bytes.size() / sizeof(Element)};
}

template <typename Narrow, typename Wide>
TwoWidths<Narrow, Wide> SearchImage::sectionOfEither(SectionKind kind) const {
  if (find(kind).elementBytes == sizeof(Wide)) {
    const auto elements = sectionOf<Wide>(kind);
    return {std::as_bytes(elements).data(), elements.size(), true};
  }
  const auto elements = sectionOf<Narrow>(kind);
  return {std::as_bytes(elements).data(), elements.size(), false};
}

/// Checks all that the accessors rely on without looking again: the sections' places and sizes.
void SearchImage::bind(const std::string& name) {
  _name = name;
  if (_bytes.size() < sizeof(image::Header) ||
      std::memcmp(_bytes.data(), image::kMagic.data(), image::kMagic.size()) != 0) {
    throw Error(
        ErrorCode::notAnIndex,
        name + " is not a search image; build one with IndexBuilder or `wordcatcher index`.");
  }
  _header = reinterpret_cast<const image::Header*>(_bytes.data());
  if (_header->byteOrder != image::kByteOrderMark || _header->version != image::kVersion) {
    throw Error(ErrorCode::notAnIndex,
                "The search image " + name +
                    " was written by another version or kind of machine; build it again.");
  }
  if (_header->fileBytes != _bytes.size()) {
    throwDamaged("its length is not what its header says");
  }
  if (_header->sectionCount > image::kSectionKinds ||
      image::headerBytes(_header->sectionCount) > _bytes.size()) {
    throwDamaged("its section table is too long");
  }
  const std::size_t covered = image::headerBytes(_header->sectionCount) - sizeof(std::uint64_t);
  std::uint64_t checksum = 0;
  std::memcpy(&checksum, _bytes.data() + covered, sizeof checksum);
  if (XXH3_64bits(_bytes.data(), covered) != checksum) {
    throwDamaged("its header does not have its checksum");
  }
  _sections = {reinterpret_cast<const image::Section*>(_bytes.data() + sizeof(image::Header)),
               _header->sectionCount};
  for (const auto& section : _sections) {
    if (section.offset > _bytes.size() || section.bytes > _bytes.size() - section.offset ||
        section.offset % image::kSectionAlignment != 0) {
      throwDamaged("a section lies outside the file");
    }
  }
  if (_header->wordCount > TreeSlot::kIndex || _header->valueCount > TreeSlot::kIndex) {
    throwDamaged("its counts are too large");
  }
  if (_header->mode > image::kLastMode) {
    throwDamaged("its mode is unknown");
  }
  _wordCount = static_cast<std::uint32_t>(_header->wordCount);
  _valueCount = static_cast<std::uint32_t>(_header->valueCount);

  _labels = sectionOf<std::uint16_t>(SectionKind::labels);
  _wordOffsets = sectionOf<std::uint32_t>(SectionKind::wordOffsets);
  _wordText = sectionOfEither<std::uint8_t, std::uint16_t>(SectionKind::wordText);
  _forward.slots = sectionOf<TreeSlot>(SectionKind::forwardTree);
  _forward.order = sectionOf<std::uint32_t>(SectionKind::forwardOrder);
  _backward.slots = sectionOf<TreeSlot>(SectionKind::backwardTree);
  _backward.order = sectionOf<std::uint32_t>(SectionKind::backwardOrder);
  _postingOffsets = sectionOfEither<std::uint32_t, std::uint64_t>(SectionKind::postingOffsets);
  _postings = sectionOf<std::uint32_t>(SectionKind::postings);
  _valueOffsets = sectionOf<std::uint64_t>(SectionKind::valueOffsets);
  _valueText = sectionOf<char>(SectionKind::valueText);
  _countedWords = sectionOf<std::uint32_t>(SectionKind::countedWords);
  _phraseOffsets = sectionOf<std::uint32_t>(SectionKind::phraseOffsets);
  _phraseWords = sectionOf<std::uint32_t>(SectionKind::phraseWords);
  _phraseClasses = sectionOf<image::PhraseClass>(SectionKind::phraseClasses);
  const std::size_t words = _wordCount;
  const std::size_t values = _valueCount;
  if (_labels.empty() || _labels.size() > image::kMaxLabels || _wordOffsets.size() != words + 1 ||
      _postingOffsets.size() != words + 1 ||
      (!_forward.order.empty() && _forward.order.size() != words) ||
      _backward.order.size() != words || _forward.slots.empty() || _backward.slots.empty() ||
      _forward.slots.size() > TreeSlot::kIndex || _backward.slots.size() > TreeSlot::kIndex ||
      _valueOffsets.size() != values + 1 || _countedWords.size() != values ||
      _phraseOffsets.size() != values + 1 || _phraseClasses.size() > values) {
    throwDamaged("its sections do not have the lengths that its counts ask for");
  }
  for (std::size_t unit = 0; unit < _asciiLabels.size(); ++unit) {
    _asciiLabels[unit] = findLabel(static_cast<char16_t>(unit));
  }
}

std::uint16_t SearchImage::findLabel(char16_t unit) const noexcept {
  const auto common =
      _labels.subspan(1, std::min<std::size_t>(_labels.size(), image::kRareBit) - 1);
  const auto rare = _labels.subspan(1 + common.size());
  for (const auto group : {common, rare}) {
    const auto found = std::lower_bound(group.begin(), group.end(), unit);
    if (found != group.end() && *found == unit) {
      return static_cast<std::uint16_t>(&*found - _labels.data());
    }
  }
  return 0;
}

std::u16string SearchImage::textOf(std::uint32_t word) const {
  std::u16string text;
  const Labels labels = labelsOf(word);
  text.reserve(labels.size());
  for (std::size_t i = 0; i < labels.size(); ++i) {
    text += unitOf(labels[i]);
  }
  return text;
}

std::span<const std::uint32_t> SearchImage::postingsOf(std::uint32_t word) const {
  if (word >= _wordCount) {
    throwDamaged("it refers to a word that is not there");
  }
  const std::uint64_t begin = _postingOffsets[word];
  const std::uint64_t end = _postingOffsets[word + 1];
  if (begin > end || end > _postings.size()) {
    throwDamaged("a posting list lies outside its section");
  }
  if (end - begin > _valueCount) {
    throwDamaged("a posting list is longer than there are values");
  }
  return _postings.subspan(begin, end - begin);
}

std::string_view SearchImage::valueText(std::uint32_t value) const {
  if (value >= _valueCount) {
    throwDamaged("it refers to a data string that is not there");
  }
  const std::uint64_t begin = _valueOffsets[value];
  const std::uint64_t end = _valueOffsets[value + 1];
  if (begin > end || end > _valueText.size()) {
    throwDamaged("a data string lies outside its section");
  }
  return {_valueText.data() + begin, end - begin};
}

std::uint32_t SearchImage::countedWordsOf(std::uint32_t value) const {
  if (value >= _valueCount) {
    throwDamaged("it refers to a data string that is not there");
  }
  return _countedWords[value];
}

}  // namespace wordcatcher
