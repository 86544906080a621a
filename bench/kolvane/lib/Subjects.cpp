#include "Subjects.h"

namespace {

std::vector<SubjectKind> FindKinds() {
  std::vector<SubjectKind> kinds = {{"kolvane-binary", MakeKolvaneBinary},
                                    {"kolvane-utf16", MakeKolvaneUTF16},
                                    {"kolvane-code-page", MakeKolvaneCodePage},
                                    {"kernel-message", MakeMessage},
                                    {"kernel-coercion", MakeCoercion},
                                    {"limit", MakeLimit},
                                    {"limit-xxh3", MakeLimitXXH3}};
#ifdef HAS_ICU
  kinds.push_back({"icu", MakeICU});
#endif
#ifdef HAS_QT
  kinds.push_back({"qt", MakeQt});
#endif
#ifdef HAS_GETTEXT
  kinds.push_back({"gettext", MakeGettext});
#endif
#ifdef HAS_BOOST_LOCALE
  kinds.push_back({"boost-locale", MakeBoostLocale});
#endif
  kinds.push_back({"read-binary", MakeReadBinary});
  kinds.push_back({"read-utf16", MakeReadUTF16});
  kinds.push_back({"read-code-page", MakeReadCodePage});
  return kinds;
}

}  // namespace

const std::vector<SubjectKind>& SubjectKinds() {
  static const std::vector<SubjectKind> kinds = FindKinds();
  return kinds;
}
