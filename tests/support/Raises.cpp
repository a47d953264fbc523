#include "tests/support/Raises.h"

#include "qlplatform/strings/Strings.h"

namespace testsupport {

namespace {

struct ArgumentText : boost::static_visitor<std::string> {
    std::string operator()(long value) const { return std::to_string(value); }
    std::string operator()(const std::string& value) const { return "'" + value + "'"; }
    std::string operator()(const std::u16string& value) const { return "u'" + qlsvUtf8FromUtf16(value) + "'"; }
};

} // namespace

std::string describe(const resource_core::BaseMsgID& message) {
    std::string text = message.identifier() + "(";
    for (std::size_t i = 0; i < message.arguments.size(); ++i)
        text += (i ? ", " : "") + boost::apply_visitor(ArgumentText(), message.arguments[i]);
    return text + ")";
}

std::string describe(const qlsvDiagnosticImpl* diagnostic) {
    if (!diagnostic) return "no diagnostic";
    std::string text;
    for (std::size_t i = 0; i < diagnostic->numItems(); ++i)
        text += (i ? "\n" : "") + describe(diagnostic->item(i));
    return text;
}

std::string raisedBy(const std::function<void()>& work) {
    try {
        work();
    } catch (const foundation::core::except::IException& e) {
        const qlsvDiagnosticImpl* d = e.diagnostic();
        return d && d->numItems() ? describe(d->item(0)) : "an IException without a message";
    }
    return "nothing thrown";
}

} // namespace testsupport
