#pragma once

#include <LumoraKit/platform/Value.h>

#include <memory>
#include <vector>

/// \file
/// One walk through a value and all that it holds, in order and without recursion. Not for applications.

namespace lumora {

enum class Collection { Array, Dictionary };

/// Walks through one value. The visitor is told
///
///     void leaf(const Value&)            of what is no collection,
///     void emptyCollection(Collection)   of a collection without elements,
///     void open(Collection) and close(Collection) around the elements of any other,
///     void key(const std::string&)       before each value of a dictionary,
///
/// and is asked `bool isDone()` before each step; the walk ends when it says so.
template <class Visitor> class ValueWalk {
public:
  explicit ValueWalk(Visitor& visitor) : visitor_(visitor) {}

  void through(const Value& value) {
    visit(value);
    finish();
  }
  void through(const Array& array) {
    enter(array);
    finish();
  }
  void through(const Dictionary& dictionary) {
    enter(dictionary);
    finish();
  }

private:
  // What is left of an open collection.
  struct Level {
    Collection kind{};
    const Value* element = nullptr;
    const Value* elementsEnd = nullptr;
    const Dictionary::Entry* entry = nullptr;
    const Dictionary::Entry* entriesEnd = nullptr;
  };

  void finish() {
    while (!levels_.empty() && !visitor_.isDone()) {
      step(levels_.back());
    }
  }

  void step(Level& level) {
    if (level.element != level.elementsEnd) {
      visit(*level.element++);
    } else if (level.entry != level.entriesEnd) {
      const Dictionary::Entry& entry = *level.entry++;
      visitor_.key(entry.first);
      visit(entry.second);
    } else {
      visitor_.close(level.kind);
      levels_.pop_back();
    }
  }

  void visit(const Value& value) {
    if (const Array* const array = value.array()) {
      enter(*array);
    } else if (const Dictionary* const dictionary = value.dictionary()) {
      enter(*dictionary);
    } else {
      visitor_.leaf(value);
    }
  }

  void enter(const Array& array) {
    if (array.empty()) {
      visitor_.emptyCollection(Collection::Array);
      return;
    }
    visitor_.open(Collection::Array);
    levels_.push_back({Collection::Array, array.data(), array.data() + array.size()});
  }

  void enter(const Dictionary& dictionary) {
    if (dictionary.empty()) {
      visitor_.emptyCollection(Collection::Dictionary);
      return;
    }
    visitor_.open(Collection::Dictionary);
    levels_.push_back({Collection::Dictionary, nullptr, nullptr, std::to_address(dictionary.begin()),
                       std::to_address(dictionary.end())});
  }

  Visitor& visitor_;
  std::vector<Level> levels_;
};

} // namespace lumora
