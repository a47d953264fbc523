#include "picture/Page.h"

#include <string_view>

#include <nlohmann/json.hpp>

#include "picture/Embedded.h"
#include "picture/Escape.h"
#include "picture/PageData.h"

namespace inspector {
namespace {

// Puts a text in the place of a mark that stands in the page once.
void put(std::string& page, std::string_view mark, std::string_view text) {
    page.replace(page.find(mark), mark.size(), text);
}

std::string scripts() {
    std::string text;
    for (const std::string_view part : {pageModel(), pageList(), pageTree(), pageMap(), pageGraph(), pageScript()})
        text += part;
    return text;
}

} // namespace

std::string layoutPage(const std::string& title, const Layout& shown, const Layout& all) {
    std::string page(pageText());
    put(page, "@STYLE@", pageStyle());
    put(page, "@SCRIPT@", scripts()); // before the data, which may hold the mark
    put(page, "@DATA@", jsonForScript(pageData(title, shown, all)));
    return page;
}

} // namespace inspector
