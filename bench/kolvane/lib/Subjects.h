// The list of subjects.
#pragma once

#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

#include "bench/kolvane/lib/Subject.h"

// Thrown by a subject that cannot take part in a key set; says why.
class LeftOut : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};

struct SubjectKind {
  std::string name;
  // Creates the subject and the files that it loads, in the folder. Null if the set is not meant
  // for the subject. Throws: LeftOut.
  std::unique_ptr<Subject> (*make)(const KeySet& set, const std::filesystem::path& folder);
  std::string library;  // name and version of a peer's library
};

// The subjects whose libraries were found.
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
