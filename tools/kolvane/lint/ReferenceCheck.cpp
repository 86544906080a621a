#include "tools/kolvane/lint/ReferenceCheck.h"

#include <fmt/format.h>

#include <map>
#include <optional>
#include <string>
#include <utility>

#include "tools/kolvane/cli/Diagnostics.h"
#include "tools/kolvane/lint/Comparison.h"
#include "tools/kolvane/lint/Rules.h"
#include "tools/kolvane/text/Accelerators.h"
#include "tools/kolvane/text/Unicode.h"

namespace {

// What siblings share: all up to the last slash.
std::string FolderOf(const std::string& key) {
  const size_t slash = key.rfind('/');
  return slash == key.npos ? "" : key.substr(0, slash);
}

// The first of the siblings that have a letter. It may be long, and is looked at once.
struct Accelerator {
  const Definition* holder = nullptr;
  std::string shown{};
  std::optional<char32_t> sourceLetter{};  // in the reference
};

class ReferenceCheck {
 public:
  ReferenceCheck(const std::string& fileName, const Definitions& checked, const Definitions* other,
                 std::vector<Finding>& list)
      : file(fileName), translations(checked), reference(other), findings(list) {}

  void Run() {
    for (const Definition& translation : translations.All()) {
      if (reference != nullptr) CheckTranslation(translation);
      CheckAccelerator(translation);
    }
    if (reference != nullptr) CheckMissing();
  }

 private:
  void CheckTranslation(const Definition& translation) {
    const Definition* const source = reference->Find(translation.key);
    if (source == nullptr) {
      Report(rules::kExtraKey, translation,
             fmt::format("the reference has no key '{}'", Shown(translation)));
      return;
    }
    for (Difference& difference : Compare(source->value, translation.value)) {
      Report(*difference.rule, translation, std::move(difference.message))
          .notes.push_back(NoteOf(source->place, "the reference is here"));
    }
  }

  void CheckAccelerator(const Definition& translation) {
    const std::optional<char32_t> letter = AcceleratorOf(translation.value);
    if (!letter) return;
    const std::optional<char32_t> sourceLetter = LetterInReference(translation);
    const auto [place, isFirst] =
        accelerators.try_emplace({FolderOf(translation.key), *letter}, Accelerator{});
    Accelerator& first = place->second;
    if (isFirst) {
      first = {&translation, Shown(translation), sourceLetter};
    } else if (!sourceLetter || sourceLetter != first.sourceLetter) {
      Report(rules::kAcceleratorClash, translation,
             fmt::format("'{}' has the same accelerator as '{}'", Shown(translation), first.shown))
          .notes.push_back(NoteOf(first.holder->place, "the other one is here"));
    }
  }

  std::optional<char32_t> LetterInReference(const Definition& translation) const {
    const Definition* const source =
        reference == nullptr ? nullptr : reference->Find(translation.key);
    return source == nullptr ? std::nullopt : AcceleratorOf(source->value);
  }

  void CheckMissing() {
    for (const Definition& source : reference->All()) {
      if (translations.Find(source.key) != nullptr) continue;
      Finding finding{.rule = &rules::kMissingKey,
                      .place = {.file = file},
                      .message = fmt::format("key '{}' is missing", Shown(source)),
                      .key = KeyText(source.key)};
      finding.notes.push_back(NoteOf(source.place, "the reference is here"));
      findings.push_back(std::move(finding));
    }
  }

  static std::string Shown(const Definition& definition) {
    return Excerpt(KeyText(definition.key));
  }

  Finding& Report(const Rule& rule, const Definition& translation, std::string message) {
    return findings.emplace_back(Finding{.rule = &rule,
                                         .place = translation.place,
                                         .message = std::move(message),
                                         .key = KeyText(translation.key)});
  }

  const std::string& file;
  const Definitions& translations;
  const Definitions* reference;
  std::vector<Finding>& findings;
  std::map<std::pair<std::string, char32_t>, Accelerator> accelerators;
};

}  // namespace

void CheckTranslations(const std::string& file, const Definitions& translations,
                       const Definitions* reference, std::vector<Finding>& findings) {
  ReferenceCheck(file, translations, reference, findings).Run();
}
