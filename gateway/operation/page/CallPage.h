#pragma once

#include "operation/http/HttpRequest.h"

#include <map>
#include <string>

/// The page for a browser that shows calls: those that are up, those that the recorder knows, and of one its ladder as
/// a picture that grows while the call runs, who holds it, its quality, the history of each property. It changes
/// nothing, and asks for all that with ControlRelay.
namespace CallPage
{
/// By path, "/calls" the first.
std::map<std::string, HttpAnswer> FILES();
} // namespace CallPage
