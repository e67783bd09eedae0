#pragma once

#include "operation/http/HttpRequest.h"

#include <map>
#include <string>

/// The page for a browser that shows calls: those that are up, those that the recorder knows, and of one its ladder as
/// a picture that grows while the call runs, who holds it, its quality, the history of each property. It asks for
/// all that with ControlRelay, and changes nothing, unless whoever looks may clear a call and knows the token.
namespace CallPage
{
/// By path, "/calls" the first.
std::map<std::string, HttpAnswer> FILES(bool mayClear);
} // namespace CallPage
