#include "qlplatform/strings/EnumStrings.h"

#include <cstring>

const char* utEnumStrs_EnumValue_to_string(const utEnumStrs* table, int value) {
    for (std::int32_t i = 0; i < table->count; ++i)
        if (table->entries[i].value == value) return table->entries[i].name;
    return "";
}

int utOldEnumStrs_string_to_EnumValue(const utEnumStrs* table, const char* name) {
    for (std::int32_t i = 0; name && i < table->count; ++i)
        if (std::strcmp(table->entries[i].name, name) == 0) return table->entries[i].value;
    return -1;
}
