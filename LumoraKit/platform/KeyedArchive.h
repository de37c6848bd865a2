#pragma once

#include <LumoraKit/platform/LMRError.h>

#include <cstddef>
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

/// Domain of errors of the unarchiver's own; a text that is no property list keeps the error of its reader.
inline constexpr std::string_view KeyedArchiveErrorDomain = "org.vantor.lumora.archive";

/// Why a property list was refused (the code of the error).
enum class KeyedArchiveError { NotAnArchive = 1, UnknownClass };

/// What can be archived.
class LUMORA_EXPORT Archivable {
public:
  virtual ~Archivable();
  /// The name under which the class is found again when it is decoded.
  virtual std::string className() const = 0;
  /// Encodes what the object is made again from, under keys of its own class.
  virtual void encodeWithCoder(KeyedArchiver& coder) const = 0;
};

/// Collects one object's keys.
class LUMORA_EXPORT KeyedArchiver {
public:
  /// The archive of an object: a property list in XML. Empty, with the error set, when an encoded text holds what XML
  /// cannot carry.
  static std::string archivedData(const Archivable& object, LMRErrorRef* error = nullptr);

  /// A key encoded twice keeps the last value.
  void encode(std::string_view key, Value value);
  /// Encodes an array of objects, each with the name of its class.
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
  /// The factory of each class, by Archivable::className().
  using ClassTable = std::map<std::string, Factory, std::less<>>;

  /// The object in an archive. Null, with the error set, when the text is no archive or names an unknown class; null
  /// with a null error when the class refused.
  static std::shared_ptr<Archivable> unarchivedObject(std::string_view archive, const ClassTable& classes,
                                                      LMRErrorRef* error = nullptr);

  /// Nothing when the key is absent or of another type.
  std::optional<std::string> decodeString(std::string_view key) const;
  /// The objects under a key; those that their class refused, or whose class is unknown, are left out.
  std::vector<std::shared_ptr<Archivable>> decodeObjects(std::string_view key) const;

private:
  // Decoding recurses through the classes' own code, so a made-up archive must not nest without end.
  static constexpr std::size_t depthLimit = 100;

  KeyedUnarchiver(const Dictionary& keys, const ClassTable& classes, std::size_t depth);
  static std::shared_ptr<Archivable> decoded(const Dictionary& object, const ClassTable& classes, std::size_t depth,
                                             LMRErrorRef* error);

  const Dictionary& keys_;
  const ClassTable& classes_;
  std::size_t depth_;
};

} // namespace lumora
