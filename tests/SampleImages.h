#ifndef WORDCATCHER_TESTS_SAMPLEIMAGES_H
#define WORDCATCHER_TESTS_SAMPLEIMAGES_H

#include <string>
#include <vector>

#include "ForgedImage.h"

namespace wordcatcher::testing {

struct SampleImage {
  std::string name;
  ImageBytes bytes;
};

/// Small images that have between them everything that an image can have. Each is the same in every
/// run: its generation is 0.
std::vector<SampleImage> sampleImages();

/// The rivers and towns of a short list.
ImageBytes riverImage();

/// More letters than have a bit of their own, so that the order of labels is not that of letters.
ImageBytes manyLettersImage();

/// The worked example of docs/search-image.md.
ImageBytes exampleImage();

/// Words of nothing but two letters, all heads of one another: the deepest tree of its size.
ImageBytes deepImage();

/// Phrases of several words: words twice, joined words, numbers, values with several phrases, and
/// leaves with and without tails.
ImageBytes phrasesImage();

/// Phrases in three scripts, so that letters of some words have no bit of their own.
ImageBytes rareLettersImage();

/// Phrases of more letters than one byte tells apart.
ImageBytes wideLabelsImage();

/// Phrases of phonetic codes.
ImageBytes codesImage();

/// Whole texts, one with two values and two with one.
ImageBytes textsImage();

ImageBytes emptyImage();

}  // namespace wordcatcher::testing

#endif
