#include "picture/Escape.h"

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

} // namespace inspector
