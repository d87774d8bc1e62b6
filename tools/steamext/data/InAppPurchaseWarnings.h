// Warnings of "steamext data check" for the store's configuration,
// "in-app-purchases/in-app-purchases.xml": what the module reads without a word
// but can never sell or never report.
#pragma once

#include <ostream>
#include <string>

#include "data/DataTool.h"

namespace datatool {

// For any other file, or one that did not load: nothing. Otherwise one line per
// finding, "FILE:LINE: warning: ...", and the number of findings. `bytes` is the
// file as read (plain or scrambled), `outcome` the module's load of it.
int WarnAboutInAppPurchases(const std::string& path, const std::string& bytes, const LoadOutcome& outcome,
                            std::ostream& out);

}  // namespace datatool
