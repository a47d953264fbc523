#include "picture/Escape.h"

#include <nlohmann/json.hpp>

#include "qlplatform/strings/Strings.h"

namespace inspector {

std::string escapedForXml(std::string_view text) {
    std::u16string escaped;
    for (const char16_t unit : qlsvUtf16FromUtf8(text)) {
        const bool isSpace = unit == u'\t' || unit == u'\n' || unit == u'\r';
        if (unit == u'<')
            escaped += u"&lt;";
        else if (unit == u'>')
            escaped += u"&gt;";
        else if (unit == u'&')
            escaped += u"&amp;";
        else if (unit == u'"')
            escaped += u"&quot;";
        else if ((unit < 0x20 && !isSpace) || unit >= 0xfffe)
            escaped += u'\ufffd';
        else
            escaped += unit;
    }
    return qlsvUtf8FromUtf16(escaped);
}

std::string jsonForScript(const nlohmann::ordered_json& json) {
    std::string text;
    for (const char c : json.dump(-1, ' ', true, nlohmann::ordered_json::error_handler_t::replace)) {
        if (c == '<')
            text += "\\u003c"; // signs of markup stand in strings only
        else
            text += c;
    }
    return text;
}

} // namespace inspector
