// Boost.Locale's messages, with the catalogues of gettext.
#include <boost/locale.hpp>
#include <cstring>
#include <optional>

#include "bench/kolvane/lib/PeerFiles.h"
#include "bench/kolvane/lib/Subjects.h"

namespace {

namespace fs = std::filesystem;

class BoostLocaleSubject final : public AskedSubject<BoostLocaleSubject, char> {
 public:
  BoostLocaleSubject(const KeySet& set, const fs::path& folder) : AskedSubject("boost-locale") {
    CatalogueFile(set, folder);
    generator.add_messages_path(folder.string());
    generator.add_messages_domain("bench");
    generator.categories(boost::locale::category_t::message);
    generator.characters(boost::locale::char_facet_t::char_f);
  }

  void Load() override {
    locale = generator("de_DE.UTF-8");
    messages = &std::use_facet<boost::locale::message_format<char>>(*locale);
  }

  void Unload() override { locale.reset(); }

  void Ask(const Query& query, std::vector<char>& answer) {
    const char* const text = messages->get(0, nullptr, query.key);
    if (text == nullptr) return AnswerDefault(query, answer);
    answer.assign(text, text + std::strlen(text));
  }

 private:
  boost::locale::generator generator;
  std::optional<std::locale> locale;
  const boost::locale::message_format<char>* messages = nullptr;
};

}  // namespace

std::unique_ptr<Subject> MakeBoostLocale(const KeySet& set, const fs::path& folder) {
  return std::make_unique<BoostLocaleSubject>(set, folder);
}
