// ICU's resource bundles.
#include <unicode/ures.h>

#include <algorithm>
#include <numeric>
#include <ostream>
#include <stdexcept>

#include "bench/kolvane/lib/PeerFiles.h"
#include "bench/kolvane/lib/Subjects.h"

namespace {

namespace fs = std::filesystem;

// genrb inserts into a sorted list, which takes quadratic time.
std::vector<size_t> DescendingByKey(const KeySet& set) {
  std::vector<size_t> order(set.Size());
  std::iota(order.begin(), order.end(), size_t{0});
  std::sort(order.begin(), order.end(),
            [&](size_t a, size_t b) { return set.keys[a] > set.keys[b]; });
  return order;
}

void FillBundle(std::ostream& stream, const KeySet& set) {
  stream << "bench:table(nofallback) {\n";
  for (const size_t i : DescendingByKey(set)) {
    stream << InQuotes(set.keys[i]) << " { " << InQuotes(set.valuesInUTF8[i]) << " }\n";
  }
  stream << "}\n";
}

// ICU caches closed bundles. Each load therefore uses the same file under another name.
class ICUSubject final : public AskedSubject<ICUSubject, uint16_t> {
 public:
  ICUSubject(const KeySet& set, fs::path workFolder)
      : AskedSubject("icu"), folder(std::move(workFolder)) {
    const auto source = folder / "bench.txt";
    WriteSource(source, [&](std::ostream& stream) { FillBundle(stream, set); });
    RunCompiler(GENRB " -q -e UTF-8 -d " + folder.string() + " " + source.string());
    remove(source);
    PrepareReload();
  }

  void Load() override {
    UErrorCode error = U_ZERO_ERROR;
    bundle = ures_openDirect(folder.c_str(), bundleName.c_str(), &error);
    if (U_FAILURE(error)) throw std::runtime_error(u_errorName(error));
  }

  void Unload() override { ures_close(bundle); }

  void PrepareReload() override { bundleName = OneMoreName(folder / "bench.res"); }

  void Ask(const Query& query, std::vector<uint16_t>& answer) {
    UErrorCode error = U_ZERO_ERROR;
    int32_t length = 0;
    const UChar* const text = ures_getStringByKey(bundle, query.key, &length, &error);
    if (U_FAILURE(error)) return AnswerDefault(query, answer);
    const auto* const units = reinterpret_cast<const uint16_t*>(text);
    answer.assign(units, units + length);
  }

 private:
  const fs::path folder;
  std::string bundleName;
  UResourceBundle* bundle = nullptr;
};

}  // namespace

std::unique_ptr<Subject> MakeICU(const KeySet& set, const fs::path& folder) {
  return std::make_unique<ICUSubject>(set, folder);
}
