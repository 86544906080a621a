#include "ReferenceCheck.h"

#include <fmt/format.h>

#include <map>
#include <optional>
#include <utility>

#include "Accelerators.h"
#include "Comparison.h"
#include "Messages.h"
#include "Rules.h"
#include "Text.h"

namespace {

// What siblings share: all up to the last slash.
std::string FolderOf(const std::string& key) {
  const size_t slash = key.rfind('/');
  return slash == key.npos ? "" : key.substr(0, slash);
}

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
          .notes.push_back({source->place, "the reference is here"});
    }
  }

  void CheckAccelerator(const Definition& translation) {
    const std::optional<char32_t> letter = AcceleratorOf(translation.value);
    if (!letter) return;
    const auto [first, isFirst] =
        accelerators.try_emplace({FolderOf(translation.key), *letter}, &translation);
    if (isFirst || ClashesInReference(*first->second, translation)) return;
    Report(rules::kAcceleratorClash, translation,
           fmt::format("'{}' has the same accelerator as '{}'", Shown(translation),
                       Shown(*first->second)))
        .notes.push_back({first->second->place, "the other one is here"});
  }

  bool ClashesInReference(const Definition& one, const Definition& other) const {
    if (reference == nullptr) return false;
    const Definition* const first = reference->Find(one.key);
    const Definition* const second = reference->Find(other.key);
    if (first == nullptr || second == nullptr) return false;
    const auto letter = AcceleratorOf(first->value);
    return letter && letter == AcceleratorOf(second->value);
  }

  void CheckMissing() {
    for (const Definition& source : reference->All()) {
      if (translations.Find(source.key) != nullptr) continue;
      Finding finding{.rule = &rules::kMissingKey,
                      .place = {.file = file},
                      .message = fmt::format("key '{}' is missing", Shown(source)),
                      .key = KeyText(source.key)};
      finding.notes.push_back({source.place, "the reference is here"});
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
  std::map<std::pair<std::string, char32_t>, const Definition*> accelerators;
};

}  // namespace

void CheckTranslations(const std::string& file, const Definitions& translations,
                       const Definitions* reference, std::vector<Finding>& findings) {
  ReferenceCheck(file, translations, reference, findings).Run();
}
