#include <LumoraKit/platform/KeyedArchive.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/PropertyList.h>

#include <utility>

namespace lumora {
namespace {

constexpr std::string_view classKey = "class";
constexpr std::string_view keysKey = "keys";

void set(LMRErrorRef* error, KeyedArchiveError code, std::string description) {
  if (error) {
    *error = LMRError::make(KeyedArchiveErrorDomain, static_cast<std::int64_t>(code), std::move(description));
  }
}

} // namespace

Archivable::~Archivable() = default;

std::string KeyedArchiver::archivedData(const Archivable& object, LMRErrorRef* error) {
  return xmlDescription(encoded(object), error).value_or(std::string());
}

Dictionary KeyedArchiver::encoded(const Archivable& object) {
  KeyedArchiver coder;
  object.encodeWithCoder(coder);
  return {{std::string(classKey), object.className()}, {std::string(keysKey), std::move(coder.keys_)}};
}

void KeyedArchiver::encode(std::string_view key, Value value) {
  keys_.set(key, std::move(value));
}

void KeyedArchiver::encodeObjects(std::string_view key, const std::vector<std::shared_ptr<const Archivable>>& objects) {
  Array encodedObjects;
  for (const auto& object : objects) {
    encodedObjects.emplace_back(encoded(*object));
  }
  encode(key, std::move(encodedObjects));
}

KeyedUnarchiver::KeyedUnarchiver(const Dictionary& keys, const ClassTable& classes, std::size_t depth)
    : keys_(keys), classes_(classes), depth_(depth) {}

std::shared_ptr<Archivable> KeyedUnarchiver::unarchivedObject(std::string_view archive, const ClassTable& classes,
                                                              LMRErrorRef* error) {
  if (error) {
    *error = nullptr;
  }
  const std::optional<Dictionary> object = dictionaryWithXMLDescription_error(archive, error);
  return object ? decoded(*object, classes, 1, error) : nullptr;
}

std::shared_ptr<Archivable> KeyedUnarchiver::decoded(const Dictionary& object, const ClassTable& classes,
                                                     std::size_t depth, LMRErrorRef* error) {
  const std::optional<std::string> className = object.string(classKey);
  const Dictionary* const keys = object.dictionary(keysKey);
  if (!className || !keys || depth > depthLimit) {
    set(error, KeyedArchiveError::NotAnArchive, "The property list is not an archive");
    return nullptr;
  }
  const auto found = classes.find(*className);
  if (found == classes.end()) {
    set(error, KeyedArchiveError::UnknownClass, format("The archive holds an unknown class \"%@\"", {*className}));
    return nullptr;
  }
  KeyedUnarchiver coder(*keys, classes, depth);
  return found->second(coder);
}

std::optional<std::string> KeyedUnarchiver::decodeString(std::string_view key) const {
  return keys_.string(key);
}

std::vector<std::shared_ptr<Archivable>> KeyedUnarchiver::decodeObjects(std::string_view key) const {
  std::vector<std::shared_ptr<Archivable>> objects;
  const Array* const encodedObjects = keys_.array(key);
  if (!encodedObjects) {
    return objects;
  }
  for (const Value& encodedObject : *encodedObjects) {
    const Dictionary* const object = encodedObject.dictionary();
    if (auto made = object ? decoded(*object, classes_, depth_ + 1, nullptr) : nullptr) {
      objects.push_back(std::move(made));
    }
  }
  return objects;
}

} // namespace lumora
