// EXPECT_RAISES(expression, "category:leaf", arguments...): the expression throws an IException whose diagnostic
// begins with that message and holds those arguments, in that order.
#pragma once

#include <functional>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "qlplatform/services/Diagnostics.h"

namespace testsupport {

/// A message as one line: category:leaf(argument, argument); narrow texts in '', wide ones in u''.
std::string describe(const resource_core::BaseMsgID& message);

/// All messages of a diagnostic as lines; "no diagnostic" for null.
std::string describe(const qlsvDiagnosticImpl* diagnostic);

/// Runs `work` and describes the first message of the IException that it throws; "nothing thrown" otherwise.
std::string raisedBy(const std::function<void()>& work);

template <class T> resource_core::MsgArgument expectedArgument(const T& value) {
    if constexpr (std::is_integral_v<T>)
        return static_cast<long>(value);
    else if constexpr (std::is_convertible_v<T, std::u16string>)
        return std::u16string(value);
    else
        return std::string(value);
}

template <class... Args> std::string expectedMessage(const std::string& identifier, const Args&... args) {
    const std::size_t colon = identifier.rfind(':');
    resource_core::BaseMsgID message(identifier.substr(0, colon), identifier.substr(colon + 1), 0);
    (message.arguments.push_back(expectedArgument(args)), ...);
    return describe(message);
}

} // namespace testsupport

#define EXPECT_RAISES(expression, ...)                                                                                 \
    EXPECT_EQ(testsupport::raisedBy([&] { (void)(expression); }), testsupport::expectedMessage(__VA_ARGS__))
