#include "bench/kolvane/lib/Subjects.h"

#include <fmt/format.h>
#include <gnu/libc-version.h>
#include <xxhash.h>

#include <boost/version.hpp>

namespace {

const std::string kXXHash =
    fmt::format("xxHash {}.{}.{}", XXH_VERSION_MAJOR, XXH_VERSION_MINOR, XXH_VERSION_RELEASE);

std::vector<SubjectKind> FindKinds() {
  std::vector<SubjectKind> kinds;
  kinds.push_back({"kolvane-binary", MakeKolvaneBinary, {}});
  kinds.push_back({"kolvane-utf16", MakeKolvaneUTF16, {}});
  kinds.push_back({"kolvane-code-page", MakeKolvaneCodePage, {}});
  kinds.push_back({"kernel-message", MakeMessage, {}});
  kinds.push_back({"kernel-coercion", MakeCoercion, {}});
  kinds.push_back({"limit", MakeLimit, "Boost.Unordered " BOOST_LIB_VERSION});
  kinds.push_back({"limit-xxh3", MakeLimitXXH3, kXXHash});
#ifdef PEER_ICU
  kinds.push_back({"icu", MakeICU, "ICU " PEER_ICU});
#endif
#ifdef PEER_QT
  kinds.push_back({"qt", MakeQt, "Qt " PEER_QT});
#endif
#ifdef PEER_GETTEXT
  kinds.push_back({"gettext", MakeGettext, std::string("glibc ") + gnu_get_libc_version()});
#endif
#ifdef PEER_BOOST_LOCALE
  kinds.push_back({"boost-locale", MakeBoostLocale, "Boost.Locale " PEER_BOOST_LOCALE});
#endif
  kinds.push_back({"read-binary", MakeReadBinary, {}});
  kinds.push_back({"read-utf16", MakeReadUTF16, {}});
  kinds.push_back({"read-code-page", MakeReadCodePage, {}});
  return kinds;
}

}  // namespace

const std::vector<SubjectKind>& SubjectKinds() {
  static const std::vector<SubjectKind> kinds = FindKinds();
  return kinds;
}
