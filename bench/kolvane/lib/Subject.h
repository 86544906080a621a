// What the benchmark compares, behind one interface.
#pragma once

#include <algorithm>
#include <cstdint>
#include <filesystem>
#include <memory>
#include <span>
#include <string>
#include <vector>

#include "bench/kolvane/lib/Queries.h"

enum class Yields : uint8_t { kUTF16, kUTF8, kNothing };

// Made with a key set, which it has turned into whatever it loads.
class Subject {
 public:
  Subject(std::string subjectName, Yields kind) : name(std::move(subjectName)), yields(kind) {}
  Subject(const Subject&) = delete;
  Subject& operator=(const Subject&) = delete;
  virtual ~Subject() = default;

  // Load makes the keys ready to be asked for, Unload undoes it. Both are timed.
  virtual void Load() = 0;
  virtual void Unload() = 0;

  // What must happen before it can be loaded once more; not timed.
  virtual void Renew() {}

  // Asks the queries one after the other, copies each answer over the one before, and returns how
  // many units they had together. A subject that yields nothing is never asked.
  virtual size_t AskAll(std::span<const Query>) { return 0; }

  // Whether it answers the query with the text, of which it is given both forms.
  virtual bool Answers(const Query&, std::u16string_view, std::string_view) { return true; }

  const std::string name;
  const Yields yields;
};

// A subject whose class has `void Ask(const Query&, std::vector<Unit>& answer)`, which is compiled
// into the loop.
template <class Derived, class Unit>
class AskedSubject : public Subject {
 public:
  explicit AskedSubject(std::string subjectName)
      : Subject(std::move(subjectName), sizeof(Unit) == 2 ? Yields::kUTF16 : Yields::kUTF8) {}

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

// The answer of a host whose library has none: the default text that stands in the query.
template <class Unit>
void AnswerDefault(const Query& query, std::vector<Unit>& answer) {
  const std::string_view text = query.DefaultText();
  answer.assign(text.begin(), text.end());
}
