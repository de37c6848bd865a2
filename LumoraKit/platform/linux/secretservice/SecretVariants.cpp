#include "SecretVariants.h"

namespace lumora::backend::secret_service {

GVariant* variantOf(const std::map<std::string, std::string>& attributes) {
  GVariantBuilder builder;
  g_variant_builder_init(&builder, G_VARIANT_TYPE("a{ss}"));
  for (const auto& [key, value] : attributes) {
    g_variant_builder_add(&builder, "{ss}", key.c_str(), value.c_str());
  }
  return g_variant_builder_end(&builder);
}

GVariant* variantOf(const std::vector<std::string>& paths) {
  GVariantBuilder builder;
  g_variant_builder_init(&builder, G_VARIANT_TYPE("ao"));
  for (const std::string& path : paths) {
    g_variant_builder_add(&builder, "o", path.c_str());
  }
  return g_variant_builder_end(&builder);
}

GLibPtr<GVariant> childOf(GVariant& value, gsize index) {
  return GLibPtr<GVariant>(g_variant_get_child_value(&value, index));
}

std::string textIn(GVariant& value, gsize index) {
  return g_variant_get_string(childOf(value, index).get(), nullptr);
}

std::vector<std::string> pathsIn(GVariant& value, gsize index) {
  const auto list = childOf(value, index);
  std::vector<std::string> paths;
  for (gsize i = 0; i < g_variant_n_children(list.get()); ++i) {
    paths.push_back(textIn(*list, i));
  }
  return paths;
}

std::map<std::string, GLibPtr<GVariant>> dictionaryIn(GVariant& value, gsize index) {
  const auto list = childOf(value, index);
  std::map<std::string, GLibPtr<GVariant>> dictionary;
  for (gsize i = 0; i < g_variant_n_children(list.get()); ++i) {
    const auto entry = childOf(*list, i);
    dictionary.insert_or_assign(textIn(*entry, 0), childOf(*entry, 1));
  }
  return dictionary;
}

std::optional<std::string> attributeIn(GVariant& answer, const char* name) {
  if (g_variant_is_of_type(&answer, G_VARIANT_TYPE("(v)")) == FALSE) {
    return std::nullopt;
  }
  const auto boxed = childOf(answer, 0);
  const GLibPtr<GVariant> attributes(g_variant_get_variant(boxed.get()));
  const char* value = nullptr;
  const bool isThere = g_variant_is_of_type(attributes.get(), G_VARIANT_TYPE("a{ss}")) != FALSE &&
                       g_variant_lookup(attributes.get(), name, "&s", &value) != FALSE;
  return isThere ? std::optional<std::string>(value) : std::nullopt;
}

} // namespace lumora::backend::secret_service
