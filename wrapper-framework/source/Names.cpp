#include "wrapper-framework/source/Names.h"

#include <set>

namespace orvane {
namespace {

struct byte_order {
  bool operator()(const char* left, const char* right) const noexcept {
    return std::strcmp(left, right) < 0;
  }
};

const char* intern(const char* text) {
  static std::set<const char*, byte_order> texts;
  return *texts.insert(text).first;
}

}  // namespace

name_t::name_t(const char* text)
    : interned(text == nullptr || *text == '\0' ? emptyText : intern(text)) {}

}  // namespace orvane
