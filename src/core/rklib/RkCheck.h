#pragma once

// The library's check helpers. Each check tests one condition and yields a default RkResult
// when it holds, else the failure record of the house convention:
//   code 2, the source line, where = "src/core/<library>/<File>:<qualified function>",
//   the message, and the detail "cond[<condition as written>]", "val[%s]  exp[%s]" or
//   "val[%s]  notexp[%s]".
// Report:     if (Tz::fail(RK_CHECK(ok, "ok", "Internal Error"))) { res.makeBad(1); return res; }
// Accumulate: res << RK_CHECK_EQ(n, 1, "..."); if (res.isBad()) return res;
// The condition text is passed explicitly because the recorded text is part of the
// behaviour and must not change when the code is reformatted.

#include "rklib/RkResult.h"
#include "rklib/rklib_export.h"

#include <string>
#include <type_traits>

#ifdef QT_CORE_LIB
#include <QByteArray>
#include <QString>
#endif

namespace Rk {

// "ZuBase::File::readAll" out of a __PRETTY_FUNCTION__ text.
RKLIB_EXPORT std::string qualifiedFunctionName(const char* inPrettyFunction);
// "src/core/zubase/File" out of a __FILE__ text (any prefix before src/, family folders below the
// library folder and the extension dropped).
RKLIB_EXPORT std::string sourceFamily(const char* inFile);
// The where text of a check: sourceFamily(file) + ":" + qualifiedFunctionName(function).
RKLIB_EXPORT std::string checkWhere(const char* inFile, const char* inPrettyFunction);
RKLIB_EXPORT RkResult checkFailure(int inLine, const char* inFile, const char* inPrettyFunction,
                                   const std::string& inMessage, const std::string& inDetail);

inline std::string checkText(const char* inText)
{
    return inText ? std::string(inText) : std::string();
}
inline std::string checkText(const std::string& inText)
{
    return inText;
}
template <typename T>
std::enable_if_t<std::is_arithmetic_v<T> || std::is_enum_v<T>, std::string> checkText(T inValue)
{
    if constexpr (std::is_same_v<T, bool>)
        return inValue ? "1" : "0";
    else if constexpr (std::is_enum_v<T>)
        return std::to_string(static_cast<long long>(inValue));
    else if constexpr (std::is_floating_point_v<T>)
        return std::to_string(inValue);
    else if constexpr (std::is_signed_v<T>)
        return std::to_string(static_cast<long long>(inValue));
    else
        return std::to_string(static_cast<unsigned long long>(inValue));
}
#ifdef QT_CORE_LIB
inline std::string checkText(const QString& inText)
{
    return inText.toLocal8Bit().toStdString();
}
inline std::string checkText(const QByteArray& inText)
{
    return inText.toStdString();
}
#endif

template <typename V, typename E, typename M>
RkResult checkEqual(const V& inValue, const E& inExpected, bool inWantEqual, int inLine,
                    const char* inFile, const char* inFunction, M&& inMessage)
{
    if ((inValue == inExpected) == inWantEqual)
        return RkResult();
    return checkFailure(inLine, inFile, inFunction, inMessage(),
                        "val[" + checkText(inValue) + (inWantEqual ? "]  exp[" : "]  notexp[") +
                            checkText(inExpected) + "]");
}

} // namespace Rk

// Condition check: detail "cond[<inCondText>]". The message is only built on failure.
#define RK_CHECK(inCond, inCondText, inMessage)                                                    \
    ((inCond)                                                                                      \
         ? RkResult()                                                                              \
         : ::Rk::checkFailure(__LINE__, __FILE__, __PRETTY_FUNCTION__, ::Rk::checkText(inMessage), \
                              std::string("cond[") + (inCondText) + "]"))

// Equality check: detail "val[<value>]  exp[<expected>]".
#define RK_CHECK_EQ(inValue, inExpected, inMessage)                                                \
    ::Rk::checkEqual((inValue), (inExpected), true, __LINE__, __FILE__, __PRETTY_FUNCTION__,       \
                     [&]() { return ::Rk::checkText(inMessage); })

// Inequality check: detail "val[<value>]  notexp[<forbidden>]".
#define RK_CHECK_NE(inValue, inForbidden, inMessage)                                               \
    ::Rk::checkEqual((inValue), (inForbidden), false, __LINE__, __FILE__, __PRETTY_FUNCTION__,     \
                     [&]() { return ::Rk::checkText(inMessage); })
