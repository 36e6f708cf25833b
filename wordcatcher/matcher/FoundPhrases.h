#ifndef WORDCATCHER_MATCHER_FOUNDPHRASES_H
#define WORDCATCHER_MATCHER_FOUNDPHRASES_H

#include <cstdint>
#include <optional>
#include <string_view>

#include "wordcatcher/matcher/Find.h"
#include "wordcatcher/matcher/FindText.h"
#include "wordcatcher/storage/SearchImage.h"

namespace wordcatcher {

/// The matches of a text, as Index::find gives them. `joins`: whether neighbouring words may be
/// joined and split. Throws Error (damaged).
FindResult findPhrases(const SearchImage& image, const FindText& text, const FindOptions& options,
                       bool joins);

/// Why a value is or is not among them. Of one that is not stored nothing more is told.
FindExplanation explainFind(const SearchImage& image, const FindText& text, std::string_view value,
                            const FindOptions& options, bool joins);

/// The number of a value. Linear in the values.
std::optional<std::uint32_t> valueNumber(const SearchImage& image, std::string_view value);

}  // namespace wordcatcher

#endif
