// Texts of results.
#include "bindings/c/handles.h"

extern "C" {

const char* secpolicy_text_data(const secpolicy_text* text) {
  return text == nullptr ? nullptr : text->value.c_str();
}

size_t secpolicy_text_size(const secpolicy_text* text) {
  return text == nullptr ? 0 : text->value.size();
}

void secpolicy_text_free(secpolicy_text* text) { delete text; }

}  // extern "C"
