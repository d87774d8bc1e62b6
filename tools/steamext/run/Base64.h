// Base64 as scenarios write bytes: {"base64": "AAEC"}.
#pragma once

#include <string>

namespace steamext::run {

// The bytes of `text`; `ok` false (and "" given) when it is not valid base64.
std::string DecodeBase64(const std::string& text, bool& ok);
std::string EncodeBase64(const std::string& bytes);

}  // namespace steamext::run
