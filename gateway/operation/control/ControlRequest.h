#pragma once

#include <map>
#include <string>
#include <string_view>
#include <vector>

/// A line that an operator's tool sends: a verb, its arguments, and options that have a value but for --json.
///
///     ControlRequest const request = ControlRequest::PARSE("calls --older 60 --json");
struct ControlRequest
{
    std::string verb;
    std::vector<std::string> arguments;
    std::map<std::string, std::string> options; ///< without their "--"
    bool isJson = false;

    /// Words lie between blanks and have none. An option at the end has an empty value.
    static ControlRequest PARSE(std::string_view line);
};
