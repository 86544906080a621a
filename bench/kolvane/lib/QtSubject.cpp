// Qt's QTranslator.
#include <QString>
#include <QTranslator>
#include <ostream>
#include <stdexcept>

#include "bench/kolvane/lib/PeerFiles.h"
#include "bench/kolvane/lib/Subjects.h"

namespace {

namespace fs = std::filesystem;

constexpr char kContext[] = "Bench";

std::string InXML(std::string_view text) {
  std::string escaped;
  for (const char byte : text) {
    if (byte == '<' || byte == '&') {
      escaped += byte == '<' ? "&lt;" : "&amp;";
    } else {
      escaped += byte;
    }
  }
  return escaped;
}

void FillSource(std::ostream& stream, const KeySet& set) {
  stream << "<?xml version=\"1.0\" encoding=\"utf-8\"?>\n<!DOCTYPE TS>\n"
            "<TS version=\"2.1\" language=\"de_DE\">\n<context><name>"
         << kContext << "</name>\n";
  for (size_t i = 0; i < set.Size(); ++i) {
    stream << "<message><source>" << InXML(set.keys[i]) << "</source><translation>"
           << InXML(set.valuesInUTF8[i]) << "</translation></message>\n";
  }
  stream << "</context>\n</TS>\n";
}

class QtSubject final : public AskedSubject<QtSubject, uint16_t> {
 public:
  QtSubject(const KeySet& set, const fs::path& folder)
      : AskedSubject("qt"), catalogue(folder / "bench.qm") {
    const auto source = folder / "bench.ts";
    WriteSource(source, [&](std::ostream& stream) { FillSource(stream, set); });
    RunCompiler(LRELEASE " -silent " + source.string() + " -qm " + catalogue.string());
    remove(source);
  }

  void Load() override {
    translator = std::make_unique<QTranslator>();
    if (!translator->load(QString::fromStdString(catalogue))) {
      throw std::runtime_error("Qt cannot load its catalogue");
    }
  }

  void Unload() override { translator.reset(); }

  void Ask(const Query& query, std::vector<uint16_t>& answer) {
    const QString text = translator->translate(kContext, query.key);
    if (text.isNull()) return AnswerDefault(query, answer);
    answer.assign(text.utf16(), text.utf16() + text.size());
  }

 private:
  const fs::path catalogue;
  std::unique_ptr<QTranslator> translator;
};

}  // namespace

std::unique_ptr<Subject> MakeQt(const KeySet& set, const fs::path& folder) {
  return std::make_unique<QtSubject>(set, folder);
}
