#pragma once

#include <LumoraKit/platform/PropertyList.h>

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

/// \file
/// The structure of property lists, whatever parser finds the elements. Not for applications.

namespace lumora {

/// Deepest nesting of arrays and dictionaries that is read and written.
inline constexpr std::size_t propertyListDepthLimit = 10000;

/// Makes a value from the elements and texts of a document, and finds everything that the format does not allow.
/// After the first false answer only problem() may be called.
class PropertyListBuilder {
public:
  struct Problem {
    PropertyListError code;
    std::string text;
  };

  /// With `dictionaryOnly` a root value of another type is a problem.
  explicit PropertyListBuilder(bool dictionaryOnly);

  /// Attributes are names and values in turn, ended by a null pointer.
  bool startElement(std::string_view name, const char* const* attributes);
  bool characters(std::string_view text);
  bool endElement();

  const Problem& problem() const { return problem_; }
  /// The root value of a document that ended without a problem.
  Value take();

private:
  enum class Element { Unknown, PropertyList, Array, Dictionary, Key, String, Integer, Real, Date, Data, True, False };
  /// An element that holds values. The marks say how many of values_ and keys_ belong to what is around it.
  struct Open {
    Element element;
    std::size_t valuesMark;
    std::size_t keysMark;
  };

  static Element elementNamed(std::string_view name);
  static bool isCollection(Element element);
  bool fail(PropertyListError code, std::string text);
  bool startRoot(Element element, std::string_view name, const char* const* attributes);
  bool mayStart(Element element, std::string_view name);
  bool mayStartInDictionary(Element element);
  bool mayStartAsRoot(Element element);
  bool open(Element element);
  bool endCollection();
  bool endLeaf();
  bool endNumber(Element element, std::string_view text);
  bool endBoolean(bool flag);
  template <class T> bool add(std::optional<T> value, std::string_view what, std::string_view text);
  Value takeArray(const Open& array);
  Value takeDictionary(const Open& dictionary);
  bool keyIsWaiting() const;

  bool dictionaryOnly_;
  Element leaf_ = Element::Unknown;
  std::string text_;
  std::vector<Open> open_;
  // The values and keys of all open elements together: a collection is made when its size is known.
  std::vector<Value> values_;
  std::vector<std::string> keys_;
  Problem problem_{};
};

} // namespace lumora
