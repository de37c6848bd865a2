#include <LumoraKit/platform/Value.h>
#include <LumoraKit/platform/ValueInternals.h>

#include <algorithm>
#include <numeric>
#include <utility>

namespace lumora {
namespace {

using Entries = std::vector<Dictionary::Entry>;

// For each entry the place of the first one with its key.
std::vector<std::size_t> firstPlaces(const Entries& entries) {
  std::vector<std::size_t> sorted(entries.size());
  std::iota(sorted.begin(), sorted.end(), std::size_t{0});
  std::sort(sorted.begin(), sorted.end(), [&](std::size_t a, std::size_t b) {
    const int order = entries[a].first.compare(entries[b].first);
    return order < 0 || (order == 0 && a < b);
  });
  std::vector<std::size_t> first(entries.size());
  for (std::size_t i = 0; i < sorted.size(); ++i) {
    const bool repeated = i > 0 && entries[sorted[i]].first == entries[sorted[i - 1]].first;
    first[sorted[i]] = repeated ? first[sorted[i - 1]] : sorted[i];
  }
  return first;
}

// Few keys are compared with one another; that is quicker than sorting, and nearly every dictionary has few.
bool areFewAndDistinct(const Entries& entries) {
  constexpr std::size_t few = 12;
  if (entries.size() > few) {
    return false;
  }
  for (std::size_t i = 1; i < entries.size(); ++i) {
    for (std::size_t j = 0; j < i; ++j) {
      if (entries[i].first == entries[j].first) {
        return false;
      }
    }
  }
  return true;
}

void dropRepeated(Entries& entries) {
  const std::vector<std::size_t> first = firstPlaces(entries);
  for (std::size_t i = 0; i < entries.size(); ++i) {
    if (first[i] != i) {
      entries[first[i]].second = std::move(entries[i].second);
    }
  }
  std::size_t kept = 0;
  for (std::size_t i = 0; i < entries.size(); ++i) {
    if (first[i] == i && kept++ != i) {
      entries[kept - 1] = std::move(entries[i]);
    }
  }
  entries.erase(entries.begin() + static_cast<std::ptrdiff_t>(kept), entries.end());
}

} // namespace

Dictionary::Dictionary() = default;
Dictionary::Dictionary(const Dictionary& other) = default;
Dictionary::Dictionary(Dictionary&& other) noexcept = default;
Dictionary& Dictionary::operator=(const Dictionary& other) = default;
Dictionary& Dictionary::operator=(Dictionary&& other) noexcept = default;
Dictionary::~Dictionary() = default;

Dictionary::Dictionary(std::initializer_list<Entry> entries) : Dictionary(fromEntries(Entries(entries))) {}

Dictionary Dictionary::fromEntries(std::vector<Entry> entries) {
  if (!areFewAndDistinct(entries)) {
    dropRepeated(entries);
  }
  Dictionary dictionary;
  dictionary.entries_ = std::move(entries);
  return dictionary;
}

bool Dictionary::empty() const {
  return entries_.empty();
}

std::size_t Dictionary::size() const {
  return entries_.size();
}

std::vector<Dictionary::Entry>::const_iterator Dictionary::begin() const {
  return entries_.begin();
}

std::vector<Dictionary::Entry>::const_iterator Dictionary::end() const {
  return entries_.end();
}

const Value* Dictionary::find(std::string_view key) const {
  const auto found = std::find_if(entries_.begin(), entries_.end(), [&](const Entry& e) { return e.first == key; });
  return found == entries_.end() ? nullptr : &found->second;
}

Value* Dictionary::find(std::string_view key) {
  return const_cast<Value*>(std::as_const(*this).find(key));
}

bool Dictionary::contains(std::string_view key) const {
  return find(key) != nullptr;
}

std::optional<std::string> Dictionary::string(std::string_view key) const {
  const Value* const value = find(key);
  const std::string* const text = value ? value->string() : nullptr;
  return text ? std::optional(*text) : std::nullopt;
}

const Dictionary* Dictionary::dictionary(std::string_view key) const {
  const Value* const value = find(key);
  return value ? value->dictionary() : nullptr;
}

const Array* Dictionary::array(std::string_view key) const {
  const Value* const value = find(key);
  return value ? value->array() : nullptr;
}

void Dictionary::set(std::string_view key, Value value) {
  if (Value* const old = find(key)) {
    *old = std::move(value);
  } else {
    entries_.emplace_back(key, std::move(value));
  }
}

bool Dictionary::remove(std::string_view key) {
  return std::erase_if(entries_, [&](const Entry& entry) { return entry.first == key; }) != 0;
}

bool operator==(const Dictionary& left, const Dictionary& right) {
  return Value::Internals::equal(left, right);
}

} // namespace lumora
