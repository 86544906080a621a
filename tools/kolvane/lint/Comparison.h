// The comparison of a translation with its reference text.
#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "tools/kolvane/lint/Finding.h"
#include "tools/kolvane/text/Placeholders.h"

struct Difference {
  const Rule* rule;
  std::string message;  // as a Finding's
};

// What a translation lacks or has too much, in the rules' order. Both texts are decoded values, and
// may be damaged.
//
// An empty reference says nothing of its translation, and an empty translation differs in nothing
// else. Of accelerators the translation needs one where the reference has any, and may have as
// many. White space at the start or end of one text, however much, wants some in the other, unless
// that has a Chinese or Japanese character there; a line end there counts as a line break only.
//
// Takes time linear in the texts, but for the sorting of their placeholders.
std::vector<Difference> Compare(std::span<const uint16_t> reference,
                                std::span<const uint16_t> translation);

// Whether the text has a letter outside of its placeholders, and so anything to translate.
bool HasLetter(std::span<const uint16_t> text, const Placeholders& placeholders);
