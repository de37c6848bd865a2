#pragma once

#include <LumoraKit/platform/Export.h>

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <variant>
#include <vector>

/// \file
/// Property-list values: what the tools' requests and replies, the metadata files and the preferences carry.

namespace lumora {

class Value;

/// An ordered list of values.
using Array = std::vector<Value>;

/// Raw bytes.
using Data = std::vector<std::uint8_t>;

/// A moment in UTC with the resolution of a property list: whole seconds.
using Date = std::chrono::sys_seconds;

/// A property-list dictionary: string keys, each once, in the order of their first insertion.
class LUMORA_EXPORT Dictionary {
public:
  /// A key and its value.
  using Entry = std::pair<std::string, Value>;

  /// An empty dictionary.
  Dictionary();
  /// The entries, in their order.
  Dictionary(std::initializer_list<Entry> entries);
  Dictionary(const Dictionary& other);
  Dictionary(Dictionary&& other) noexcept;
  Dictionary& operator=(const Dictionary& other);
  Dictionary& operator=(Dictionary&& other) noexcept;
  ~Dictionary();

  /// A dictionary of entries in which a repeated key keeps the place of its first and the value of its last entry.
  static Dictionary fromEntries(std::vector<Entry> entries);

  /// Whether there is no entry.
  bool empty() const;
  /// The number of entries.
  std::size_t size() const;
  /// The first entry; entries are visited in their order.
  std::vector<Entry>::const_iterator begin() const;
  /// Behind the last entry.
  std::vector<Entry>::const_iterator end() const;

  /// The value of a key, or null.
  const Value* find(std::string_view key) const;
  Value* find(std::string_view key);
  /// Whether the key is there.
  bool contains(std::string_view key) const;

  /// The string under a key; nothing when the key is absent or its value is not a string.
  std::optional<std::string> string(std::string_view key) const;
  /// The dictionary under a key, or null when absent or of another type.
  const Dictionary* dictionary(std::string_view key) const;
  /// The array under a key, or null when absent or of another type.
  const Array* array(std::string_view key) const;

  /// Replaces the value of a key in its place, or appends the pair.
  void set(std::string_view key, Value value);
  /// Removes a key; true when it was there.
  bool remove(std::string_view key);

  /// The same keys with equal values, in whatever order.
  friend LUMORA_EXPORT bool operator==(const Dictionary& left, const Dictionary& right);

private:
  friend class Value;
  std::vector<Entry> entries_;
};

/// One property-list value. A value type: copies are deep, moves are cheap, and nesting of any depth is copied,
/// compared, described and destroyed without recursion. Signed and unsigned integers are kept apart only where it
/// matters: an integer that fits std::int64_t is always held as such, so that equal numbers compare equal whatever they
/// were made from.
class LUMORA_EXPORT Value {
public:
  /// What a value holds.
  enum class Type { String, Integer, UnsignedInteger, Real, Boolean, Date, Data, Array, Dictionary };

  /// A value that holds this. Implicit, so that a literal can stand wherever a value is asked for.
  Value(std::string text);
  Value(std::string_view text);
  Value(const char* text);
  Value(bool flag);
  Value(int number);
  Value(unsigned number);
  Value(std::int64_t number);
  Value(std::uint64_t number);
  Value(double number);
  Value(Date date);
  Value(Data bytes);
  Value(Array elements);
  Value(Dictionary entries);

  Value(const Value& other);
  Value(Value&& other) noexcept;
  Value& operator=(const Value& other);
  Value& operator=(Value&& other) noexcept;
  ~Value();

  /// What it holds. An integer that fits std::int64_t is an Integer, whatever it was made from.
  Type type() const;

  /// The text when the value is one, else null. The pointer lives as long as the value is unchanged.
  const std::string* string() const;
  /// The bytes when the value is data, else null. The pointer lives as long as the value is unchanged.
  const Data* data() const;
  /// The elements when the value is an array, else null. The pointer lives as long as the value is unchanged.
  const Array* array() const;
  /// The entries when the value is a dictionary, else null. The pointer lives as long as the value is unchanged.
  const Dictionary* dictionary() const;
  /// The same, to change it.
  std::string* string();
  /// The elements, to change them.
  Array* array();
  /// The entries, to change them.
  Dictionary* dictionary();

  /// The truth value when the value is a boolean, else nothing.
  std::optional<bool> boolean() const;
  /// The moment when the value is a date, else nothing.
  std::optional<Date> date() const;
  /// A number that fits, from an integer or a boolean (0 or 1); nothing for everything else.
  std::optional<std::int64_t> integer() const;
  /// The same for a number that is not negative.
  std::optional<std::uint64_t> unsignedInteger() const;
  /// Any number, an integer and a boolean included, as a real; nothing for everything else.
  std::optional<double> real() const;

  /// The text that "%@" prints: a string as it is, an integer in decimal, a real in its shortest round-trip form, a
  /// boolean as 1 or 0, a date as "2010-01-20 15:04:05 +0000", data as <0fbe>, an array as [first, second] and a
  /// dictionary as {key: value, key: value}.
  std::string description() const;

  /// Equality of type and content. An integer equals an integer only; a real equals a real only, and not-a-number
  /// equals itself.
  friend LUMORA_EXPORT bool operator==(const Value& left, const Value& right);

private:
  friend LUMORA_EXPORT bool operator==(const Dictionary& left, const Dictionary& right);
  struct Internals;
  void dismantle() noexcept;
  // In the order of Type.
  using Storage = std::variant<std::string, std::int64_t, std::uint64_t, double, bool, Date, Data, Array, Dictionary>;
  Storage storage_;
};

// Inline, because collections of values move and destroy them all the time.
inline Value::Value(Value&& other) noexcept = default;
inline Value::~Value() {
  if (storage_.index() >= static_cast<std::size_t>(Type::Array)) {
    dismantle();
  }
}

} // namespace lumora
