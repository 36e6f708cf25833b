#ifndef WORDCATCHER_FUZZY_TABLEIMAGE_H
#define WORDCATCHER_FUZZY_TABLEIMAGE_H

#include <memory>

#include "wordcatcher/storage/SearchImage.h"

namespace wordcatcher {

class PLXDFA;

/// A search image, in memory, of the strings that a walk of an automaton on disk can reach, with
/// their data: final states whose every symbol has its edge. Reads each table once, through the
/// mappings that they hold; an automaton that was never opened for reading gives an empty image.
///
/// Linear in the records, and n log n in the distinct strings. Memory: the image, and 16 bytes for
/// each distinct edge while it is made. Throws Error (tooLarge) beyond what an image can count.
std::shared_ptr<const SearchImage> makeTableImage(const PLXDFA& automaton);

}  // namespace wordcatcher

#endif
