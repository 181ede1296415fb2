// Text forms of instances: the model path that embeds an instance's identity
// in a string, and the diagnostic dumps.
#include <cinttypes>
#include <cstdio>
#include <string>

#include "framework/Instance.h"
#include "framework/Type_Visit.h"

namespace cimple {

namespace {

template <class T>
std::string scalar_text(const T& v, bool quote_strings) {
  char buf[64];
  if constexpr (std::is_same_v<T, boolean>) {
    return v ? "true" : "false";
  } else if constexpr (std::is_same_v<T, String>) {
    return quote_strings ? "\"" + v.str() + "\"" : v.str();
  } else if constexpr (std::is_same_v<T, Datetime>) {
    return v.ascii();
  } else if constexpr (std::is_same_v<T, char16>) {
    std::snprintf(buf, sizeof buf, "'%c'", static_cast<char>(v.code));
  } else if constexpr (std::is_same_v<T, real32> || std::is_same_v<T, real64>) {
    std::snprintf(buf, sizeof buf, "%f", static_cast<double>(v));
  } else if constexpr (std::is_same_v<T, uint64>) {
    std::snprintf(buf, sizeof buf, "%llu", static_cast<unsigned long long>(v));
  } else if constexpr (std::is_same_v<T, sint64>) {
    std::snprintf(buf, sizeof buf, "%lld", static_cast<long long>(v));
  } else if constexpr (std::is_unsigned_v<T>) {
    std::snprintf(buf, sizeof buf, "%u", static_cast<unsigned>(v));
  } else {
    std::snprintf(buf, sizeof buf, "%d", static_cast<int>(v));
  }
  return buf;
}

std::string property_text(const Instance* instance, const Meta_Property* mp, bool quote_strings) {
  return visit_type(mp->type, [&](auto tag) -> std::string {
    using T = typename decltype(tag)::type;
    const void* where = slot(instance, mp->offset);
    if (!is_array(mp)) return scalar_text(*static_cast<const T*>(where), quote_strings);
    std::string out = "{";
    const auto& array = *static_cast<const Array<T>*>(where);
    for (size_t i = 0; i < array.size(); ++i) out += (i ? ", " : "") + scalar_text(array[i], quote_strings);
    return out + "}";
  });
}

std::string escape_quotes(const std::string& text) {
  std::string out;
  for (char c : text) {
    if (c == '"') out += '\\';
    out += c;
  }
  return out;
}

void print_instance(const Instance* instance, int depth);

void print_features(const Instance* instance, int depth) {
  const Meta_Class* mc = instance->meta_class;
  std::string indent(static_cast<size_t>(depth) * 4 + 4, ' ');
  for (size_t i = 0; i < mc->num_meta_features; ++i) {
    const Meta_Feature* mf = mc->meta_features[i];
    if (mf->flags & FLAG_PROPERTY) {
      auto* mp = reinterpret_cast<const Meta_Property*>(mf);
      const char* tname = mp->type < 14 ? type_name[mp->type] : "?";
      if (is_array(mp))
        std::printf("%s%s %s[] =", indent.c_str(), tname, mp->name);
      else
        std::printf("%s%s %s = ", indent.c_str(), tname, mp->name);
      if (*null_flag(instance, mp))
        std::printf("%sNULL;\n", is_array(mp) ? " " : "");
      else
        std::printf("%s%s;\n", is_array(mp) ? " " : "", property_text(instance, mp, true).c_str());
    } else if (mf->flags & FLAG_REFERENCE) {
      auto* mr = reinterpret_cast<const Meta_Reference*>(mf);
      std::printf("%s%s %s = ", indent.c_str(), mr->meta_class ? mr->meta_class->name : "?", mr->name);
      if (is_reference_array(mr)) {
        std::printf("[%zu references];\n", static_cast<const Array<Instance*>*>(slot(instance, mr->offset))->size());
      } else if (const Instance* target = reference_of(instance, mr)) {
        std::printf("\n");
        print_instance(target, depth + 1);
      } else {
        std::printf("NULL;\n");
      }
    }
  }
}

void print_instance(const Instance* instance, int depth) {
  std::string indent(static_cast<size_t>(depth) * 4, ' ');
  std::printf("%sinstance of %s\n%s{\n", indent.c_str(), instance->meta_class->name, indent.c_str());
  std::printf("%s    string __name_space = \"%s\";\n", indent.c_str(), instance->__name_space.c_str());
  print_features(instance, depth);
  std::printf("%s}\n", indent.c_str());
}

void print_parameter(const Meta_Feature* mf) {
  if (mf->flags & FLAG_PROPERTY) {
    auto* mp = reinterpret_cast<const Meta_Property*>(mf);
    std::printf("    %s%s%s %s%s", (mf->flags & FLAG_IN) ? "[In]" : "", (mf->flags & FLAG_OUT) ? "[Out]" : "",
                mp->type < 14 ? type_name[mp->type] : "?", mp->name, is_array(mp) ? "[]" : "");
  } else {
    auto* mr = reinterpret_cast<const Meta_Reference*>(mf);
    std::printf("    %s%s%s REF %s", (mf->flags & FLAG_IN) ? "[In]" : "", (mf->flags & FLAG_OUT) ? "[Out]" : "",
                mr->meta_class ? mr->meta_class->name : "?", mr->name);
  }
}

}  // namespace

bool instance_to_model_path(const Instance* instance, std::string& out) {
  const Meta_Class* mc = instance->meta_class;
  std::string path = std::string(mc->name) + ".";
  size_t keys = 0;
  for (size_t i = 0; i < mc->num_meta_features; ++i) {
    const Meta_Feature* mf = mc->meta_features[i];
    if (!(mf->flags & FLAG_KEY)) continue;
    if (keys++) path += ',';
    path += mf->name;
    path += '=';
    if (mf->flags & FLAG_PROPERTY) {
      auto* mp = reinterpret_cast<const Meta_Property*>(mf);
      if (is_array(mp) || *null_flag(instance, mp)) return false;
      path += property_text(instance, mp, true);
    } else {
      auto* mr = reinterpret_cast<const Meta_Reference*>(mf);
      const Instance* target = is_reference_array(mr) ? nullptr : reference_of(instance, mr);
      std::string target_path;
      if (target == nullptr || !instance_to_model_path(target, target_path)) return false;
      path += "\"" + escape_quotes(target_path) + "\"";
    }
  }
  if (keys == 0) return false;
  out = std::move(path);
  return true;
}

void print(const Instance* instance) {
  if (instance) print_instance(instance, 0);
}

void print(const Meta_Class* mc) {
  if (mc->super_meta_class)
    std::printf("class %s : %s\n{\n", mc->name, mc->super_meta_class->name);
  else
    std::printf("class %s\n{\n", mc->name);
  for (size_t i = 0; i < mc->num_meta_features; ++i) {
    const Meta_Feature* mf = mc->meta_features[i];
    if (mf->flags & FLAG_METHOD) {
      print(reinterpret_cast<const Meta_Method*>(mf));
    } else {
      print_parameter(mf);
      std::printf(";\n");
    }
  }
  std::printf("};\n");
}

void print(const Meta_Method* mm) {
  std::printf("%s %s(", mm->return_type < 14 ? type_name[mm->return_type] : "?", mm->name);
  for (size_t i = 0; i + 1 < mm->num_meta_features; ++i) {
    std::printf(i ? ",\n" : "\n");
    print_parameter(mm->meta_features[i]);
  }
  std::printf(");\n");
}

}  // namespace cimple
