// The interface of everything that the benchmark compares.
#pragma once

#include <algorithm>
#include <cstdint>
#include <filesystem>
#include <memory>
#include <span>
#include <string>
#include <vector>

#include "bench/kolvane/lib/Queries.h"

enum class AnswerEncoding : uint8_t { kUTF16, kUTF8, kNothing };

// Constructed with a key set, from which it has made the file or image that it loads.
class Subject {
 public:
  Subject(std::string subjectName, AnswerEncoding kind)
      : name(std::move(subjectName)), encoding(kind) {}
  Subject(const Subject&) = delete;
  Subject& operator=(const Subject&) = delete;
  virtual ~Subject() = default;

  // Load makes the keys ready for queries; Unload undoes it. Both are timed.
  virtual void Load() = 0;
  virtual void Unload() = 0;

  // Prepares another load. Not timed.
  virtual void PrepareReload() {}

  // Asks the queries in order, copies each answer over the previous one, and returns their total
  // length in units. Not called for kNothing.
  virtual size_t AskAll(std::span<const Query>) { return 0; }

  // Whether the subject's answer to the query is the text, given as UTF-16 and UTF-8.
  virtual bool Answers(const Query&, std::u16string_view, std::string_view) { return true; }

  const std::string name;
  const AnswerEncoding encoding;
};

// The base of subjects with `void Ask(const Query&, std::vector<Unit>& answer)`, which is inlined
// into the loop.
template <class Derived, class Unit>
class AskedSubject : public Subject {
 public:
  explicit AskedSubject(std::string subjectName)
      : Subject(std::move(subjectName),
                sizeof(Unit) == 2 ? AnswerEncoding::kUTF16 : AnswerEncoding::kUTF8) {}

  size_t AskAll(std::span<const Query> queries) final {
    size_t total = 0;
    for (const Query& query : queries) {
      static_cast<Derived*>(this)->Ask(query, latest);
      total += latest.size();
    }
    return total;
  }

  bool Answers(const Query& query, std::u16string_view units, std::string_view bytes) final {
    static_cast<Derived*>(this)->Ask(query, latest);
    if constexpr (sizeof(Unit) == 2) {
      return std::equal(latest.begin(), latest.end(), units.begin(), units.end());
    } else {
      return std::equal(latest.begin(), latest.end(), bytes.begin(), bytes.end());
    }
  }

 private:
  std::vector<Unit> latest;
};

// Answers with the query's default text, as a host does if its library has no translation.
template <class Unit>
void AnswerDefault(const Query& query, std::vector<Unit>& answer) {
  const std::string_view text = query.DefaultText();
  answer.assign(text.begin(), text.end());
}
