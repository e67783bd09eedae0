#include "operation/control/ControlAnswer.h"

#include "diagnosis/CC_JsonLine.h"

namespace
{
std::string STATUS_OF(std::string const& error, bool isJson)
{
    if (!isJson)
        return error.empty() ? "ok" : "error: " + error;
    CC_JsonLine line;
    line.add("status", std::string_view(error.empty() ? "ok" : "error"));
    if (!error.empty())
        line.add("reason", error);
    return line.get();
}
} // namespace

std::string ControlAnswer::getText(bool isJson) const
{
    std::string text = STATUS_OF(error, isJson) + '\n';
    for (std::string const& line : lines)
        text += (line.empty() ? " " : line) + '\n'; // an empty one is the end
    return text + '\n';
}
