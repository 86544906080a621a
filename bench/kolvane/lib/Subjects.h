// All that the benchmark can compare.
#pragma once

#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

#include "bench/kolvane/lib/Subject.h"

// Why a subject takes no part in a key set.
class LeftOut : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

struct SubjectKind {
  std::string name;
  // Puts what the subject loads into the folder. Null for a set that the subject is not meant for;
  // throws LeftOut.
  std::unique_ptr<Subject> (*make)(const KeySet& set, const std::filesystem::path& folder);
  std::string library;  // its name and version, of a subject that is not ours
};

// Those whose libraries were found.
const std::vector<SubjectKind>& SubjectKinds();

std::unique_ptr<Subject> MakeKolvaneUTF16(const KeySet&, const std::filesystem::path&);
std::unique_ptr<Subject> MakeKolvaneCodePage(const KeySet&, const std::filesystem::path&);
std::unique_ptr<Subject> MakeKolvaneBinary(const KeySet&, const std::filesystem::path&);
std::unique_ptr<Subject> MakeLimit(const KeySet&, const std::filesystem::path&);
std::unique_ptr<Subject> MakeLimitXXH3(const KeySet&, const std::filesystem::path&);
std::unique_ptr<Subject> MakeMessage(const KeySet&, const std::filesystem::path&);
std::unique_ptr<Subject> MakeCoercion(const KeySet&, const std::filesystem::path&);
std::unique_ptr<Subject> MakeICU(const KeySet&, const std::filesystem::path&);
std::unique_ptr<Subject> MakeQt(const KeySet&, const std::filesystem::path&);
std::unique_ptr<Subject> MakeGettext(const KeySet&, const std::filesystem::path&);
std::unique_ptr<Subject> MakeBoostLocale(const KeySet&, const std::filesystem::path&);
std::unique_ptr<Subject> MakeReadUTF16(const KeySet&, const std::filesystem::path&);
std::unique_ptr<Subject> MakeReadCodePage(const KeySet&, const std::filesystem::path&);
std::unique_ptr<Subject> MakeReadBinary(const KeySet&, const std::filesystem::path&);
