// The C library's gettext.
#include <libintl.h>

#include <clocale>
#include <cstdlib>
#include <cstring>

#include "bench/kolvane/lib/PeerFiles.h"
#include "bench/kolvane/lib/Subjects.h"

namespace {

namespace fs = std::filesystem;

// gettext never unloads a catalogue and caches each translation. Each load therefore uses a new
// domain, whose catalogue is the same file under another name.
class GettextSubject final : public AskedSubject<GettextSubject, char> {
 public:
  GettextSubject(const KeySet& set, fs::path workFolder)
      : AskedSubject("gettext"),
        folder(std::move(workFolder)),
        catalogue(CatalogueFile(set, folder)) {
    if (std::setlocale(LC_ALL, "C.UTF-8") == nullptr) throw LeftOut("there is no C.UTF-8");
    setenv("LANGUAGE", "de", 1);
    PrepareReload();
  }

  // The first query loads the catalogue.
  void Load() override {
    bindtextdomain(domain.c_str(), folder.c_str());
    bind_textdomain_codeset(domain.c_str(), "UTF-8");
    dgettext(domain.c_str(), "/");
  }

  void Unload() override {}

  void PrepareReload() override { domain = OneMoreName(catalogue); }

  void Ask(const Query& query, std::vector<char>& answer) {
    const char* const text = dgettext(domain.c_str(), query.key);
    if (text == query.key) return AnswerDefault(query, answer);
    answer.assign(text, text + std::strlen(text));
  }

 private:
  const fs::path folder;
  const fs::path catalogue;
  std::string domain;
};

}  // namespace

std::unique_ptr<Subject> MakeGettext(const KeySet& set, const fs::path& folder) {
  return std::make_unique<GettextSubject>(set, folder);
}
