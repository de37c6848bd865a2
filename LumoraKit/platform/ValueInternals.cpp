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

bool Value::Internals::isCollection(const Value& value) {
  return value.array() || value.dictionary();
}

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
    if constexpr (std::is_same_v<T, std::unique_ptr<Array>>) {
      copyArray(*content, to, left);
    } else if constexpr (std::is_same_v<T, std::unique_ptr<Dictionary>>) {
      copyDictionary(*content, to, left);
    } else if constexpr (std::is_same_v<T, std::unique_ptr<Data>>) {
      to.storage_ = std::make_unique<Data>(*content);
    } else {
      to.storage_ = content;
    }
  };
  std::visit(assign, from.storage_);
}

// The elements are made first and never move again, so that those left to fill can be pointed at.
void Value::Internals::copyArray(const Array& from, Value& to, std::vector<Copy>& left) {
  auto elements = std::make_unique<Array>();
  elements->reserve(from.size());
  for (const Value& element : from) {
    Value& copied = elements->emplace_back(false);
    if (isCollection(element)) {
      left.push_back({&element, &copied});
    } else {
      copyOne(element, copied, left);
    }
  }
  to.storage_ = std::move(elements);
}

void Value::Internals::copyDictionary(const Dictionary& from, Value& to, std::vector<Copy>& left) {
  auto dictionary = std::make_unique<Dictionary>();
  dictionary->entries_.reserve(from.size());
  for (const auto& [key, value] : from) {
    Value& copied = dictionary->entries_.emplace_back(key, false).second;
    if (isCollection(value)) {
      left.push_back({&value, &copied});
    } else {
      copyOne(value, copied, left);
    }
  }
  to.storage_ = std::move(dictionary);
}

// What is taken out leaves a null box behind, so the destructors that follow find nothing to do.
void Value::Internals::dismantle(Value& value) noexcept {
  std::vector<Value> taken;
  takeCollections(value, taken);
  while (!taken.empty()) {
    Value next = std::move(taken.back());
    taken.pop_back();
    takeCollections(next, taken);
  }
}

void Value::Internals::takeCollections(Value& value, std::vector<Value>& taken) {
  const auto take = [&taken](Value& inside) {
    if (isCollection(inside)) {
      taken.push_back(std::move(inside));
    }
  };
  if (Array* const array = value.array()) {
    std::for_each(array->begin(), array->end(), take);
  } else if (Dictionary* const dictionary = value.dictionary()) {
    for (auto& entry : dictionary->entries_) {
      take(entry.second);
    }
  }
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
  case Type::Data:
    return *left.data() == *right.data();
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
