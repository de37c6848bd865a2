#pragma once

#include <LumoraKit/platform/LMRError.h>

#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

/// \file
/// Keyed archives: an object as its class name and what it encoded under keys, written as a property list.

namespace lumora {

class KeyedArchiver;
class KeyedUnarchiver;

/// What can be archived.
class LUMORA_EXPORT Archivable {
public:
  virtual ~Archivable();
  /// The name under which the class is found again when it is decoded.
  virtual std::string className() const = 0;
  virtual void encodeWithCoder(KeyedArchiver& coder) const = 0;
};

/// Collects one object's keys.
class LUMORA_EXPORT KeyedArchiver {
public:
  /// The archive of an object: a property list in XML.
  static std::string archivedData(const Archivable& object);

  /// A key encoded twice keeps the last value.
  void encode(std::string_view key, Value value);
  void encodeObjects(std::string_view key, const std::vector<std::shared_ptr<const Archivable>>& objects);

private:
  static Dictionary encoded(const Archivable& object);
  Dictionary keys_;
};

/// Hands out one object's keys.
class LUMORA_EXPORT KeyedUnarchiver {
public:
  /// Makes an object of a class from its keys; null when it cannot.
  using Factory = std::function<std::shared_ptr<Archivable>(KeyedUnarchiver& coder)>;
  using ClassTable = std::map<std::string, Factory, std::less<>>;

  /// The object in an archive. Null, with the error set, when the text is no archive or names an unknown class; null
  /// without an error when the class refused.
  static std::shared_ptr<Archivable> unarchivedObject(std::string_view archive, const ClassTable& classes,
                                                      LMRErrorRef* error = nullptr);

  /// Nothing when the key is absent or of another type.
  std::optional<std::string> decodeString(std::string_view key) const;
  /// The objects under a key; those that their class refused are left out.
  std::vector<std::shared_ptr<Archivable>> decodeObjects(std::string_view key) const;

private:
  KeyedUnarchiver(const Dictionary& keys, const ClassTable& classes);
  const Dictionary& keys_;
  const ClassTable& classes_;
};

} // namespace lumora
