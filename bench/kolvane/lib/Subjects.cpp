#include "Subjects.h"

const std::vector<SubjectKind>& SubjectKinds() {
  static const std::vector<SubjectKind> kinds = {
      {"kolvane-utf16", MakeKolvaneUTF16},   {"kolvane-code-page", MakeKolvaneCodePage},
      {"kolvane-binary", MakeKolvaneBinary}, {"limit", MakeLimit},
      {"limit-xxh3", MakeLimitXXH3},         {"read-utf16", MakeReadUTF16},
      {"read-code-page", MakeReadCodePage},  {"read-binary", MakeReadBinary},
  };
  return kinds;
}
