#include <LumoraKit/platform/ValueInternals.h>

#include <algorithm>
#include <cmath>
#include <type_traits>
#include <utility>

namespace lumora {
namespace {

using Entries = std::vector<const Dictionary::Entry*>;

Entries sortedByKey(const Dictionary& dictionary) {
  Entries entries;
  entries.reserve(dictionary.size());
  for (const Dictionary::Entry& entry : dictionary) {
    entries.push_back(&entry);
  }
  std::sort(entries.begin(), entries.end(), [](const auto* a, const auto* b) { return a->first < b->first; });
  return entries;
}

bool sameReal(double left, double right) {
  return left == right || (std::isnan(left) && std::isnan(right));
}

} // namespace

void Value::Internals::copy(const Value& from, Value& to) {
  std::vector<Copy> left;
  copyOne(from, to, left);
  while (!left.empty()) {
    const Copy next = left.back();
    left.pop_back();
    copyOne(*next.from, *next.to, left);
  }
}

void Value::Internals::copyOne(const Value& from, Value& to, std::vector<Copy>& left) {
  const auto assign = [&]<class T>(const T& content) {
    if constexpr (std::is_same_v<T, Array>) {
      copyArray(content, to.storage_.emplace<Array>(), left);
    } else if constexpr (std::is_same_v<T, Dictionary>) {
      copyDictionary(content, to.storage_.emplace<Dictionary>(), left);
    } else {
      to.storage_ = content;
    }
  };
  std::visit(assign, from.storage_);
}

// All elements are made in the room reserved for them and never move again, so those left to fill can be pointed at.
void Value::Internals::copyArray(const Array& from, Array& to, std::vector<Copy>& left) {
  to.reserve(from.size());
  for (const Value& element : from) {
    copyInside(element, to.emplace_back(false), left);
  }
}

void Value::Internals::copyDictionary(const Dictionary& from, Dictionary& to, std::vector<Copy>& left) {
  to.entries_.reserve(from.size());
  for (const auto& [key, value] : from) {
    copyInside(value, to.entries_.emplace_back(key, false).second, left);
  }
}

void Value::Internals::copyInside(const Value& from, Value& to, std::vector<Copy>& left) {
  if (isCollection(from)) {
    left.push_back({&from, &to});
  } else {
    copyOne(from, to, left);
  }
}

// What holds collections itself is taken out and waits its turn; it leaves an empty collection behind. The destructors
// that follow find one flat level.
void Value::Internals::dismantle(Value& value) noexcept {
  std::vector<Value> waiting;
  takeNested(value, waiting);
  while (!waiting.empty()) {
    Value next = std::move(waiting.back());
    waiting.pop_back();
    takeNested(next, waiting);
  }
}

template <class Visit> void Value::Internals::forEachInside(Value& value, Visit visit) {
  if (auto* const array = std::get_if<Array>(&value.storage_)) {
    std::for_each(array->begin(), array->end(), visit);
  } else if (auto* const dictionary = std::get_if<Dictionary>(&value.storage_)) {
    for (auto& entry : dictionary->entries_) {
      visit(entry.second);
    }
  }
}

void Value::Internals::takeNested(Value& value, std::vector<Value>& taken) {
  forEachInside(value, [&taken](Value& inside) {
    bool nested = false;
    forEachInside(inside, [&nested](Value& innermost) { nested |= isCollection(innermost); });
    if (nested) {
      taken.push_back(std::move(inside));
    }
  });
}

bool Value::Internals::equal(const Value& left, const Value& right) {
  return equalPairs({{&left, &right}});
}

bool Value::Internals::equal(const Dictionary& left, const Dictionary& right) {
  std::vector<Pair> inside;
  return pairEntries(left, right, inside) && equalPairs(std::move(inside));
}

bool Value::Internals::equalPairs(std::vector<Pair> left) {
  while (!left.empty()) {
    const Pair next = left.back();
    left.pop_back();
    if (!equalOne(*next.left, *next.right, left)) {
      return false;
    }
  }
  return true;
}

bool Value::Internals::equalOne(const Value& left, const Value& right, std::vector<Pair>& inside) {
  if (left.type() != right.type()) {
    return false;
  }
  switch (left.type()) {
  case Type::Array:
    return pairElements(*left.array(), *right.array(), inside);
  case Type::Dictionary:
    return pairEntries(*left.dictionary(), *right.dictionary(), inside);
  case Type::Real:
    return sameReal(*left.real(), *right.real());
  default:
    return left.storage_ == right.storage_;
  }
}

bool Value::Internals::pairElements(const Array& left, const Array& right, std::vector<Pair>& inside) {
  if (left.size() != right.size()) {
    return false;
  }
  for (std::size_t i = 0; i < left.size(); ++i) {
    inside.push_back({&left[i], &right[i]});
  }
  return true;
}

bool Value::Internals::pairEntries(const Dictionary& left, const Dictionary& right, std::vector<Pair>& inside) {
  if (left.size() != right.size()) {
    return false;
  }
  const Entries leftEntries = sortedByKey(left);
  const Entries rightEntries = sortedByKey(right);
  for (std::size_t i = 0; i < leftEntries.size(); ++i) {
    if (leftEntries[i]->first != rightEntries[i]->first) {
      return false;
    }
    inside.push_back({&leftEntries[i]->second, &rightEntries[i]->second});
  }
  return true;
}

} // namespace lumora
