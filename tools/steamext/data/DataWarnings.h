// Warnings of "steamext data check": what a data file says that the module would quietly
// take as a default or never read. These are the tool's own words, printed apart from the
// module's messages. Each data file the module reads may have a check of its own, chosen
// by the ending of the file's path (the table in DataWarnings.cpp).
#pragma once

#include <functional>
#include <iosfwd>
#include <string>
#include <vector>

#include "data/DataTool.h"
#include "data/XmlReader.h"

namespace datatool {

struct DataWarning {
    int line = 0;  // 1-based line of the file's plain text
    std::string text;
};

// Gets the file's path, its bytes as read from disk (plain or scrambled) and the module's
// load of it.
using WarnFunction = std::vector<DataWarning> (*)(const std::string& path, const std::string& bytes,
                                                  const LoadOutcome& outcome);

struct WarningCheck {
    const char* pathEnding;  // matched after a '/' or at the start of the path
    WarnFunction warn;
};

// Prints "warning: PATH:LINE: TEXT" (without ":LINE" when the line is unknown) for each
// warning of the check whose ending `path` has (none without one); gives the number printed.
int PrintDataWarnings(const std::string& path, const std::string& bytes, const LoadOutcome& outcome,
                      std::ostream& out);

// Walks the blocks of an XML data file as the module's reader reads them, giving each
// block with the line its tag starts on (a text block: the line where it ends). Stops at
// the end of the file or at a parse error. False when the file can't be opened.
bool WalkXmlBlocks(const std::string& path, const std::string& bytes,
                   const std::function<void(const XmlBlock& block, int line)>& visit);

// The value of the first attribute called `name` (as the module's node lookup finds it),
// or of the last one when `last` (as an id is taken); null if there is none.
const char* AttributeValue(const XmlBlock& block, const char* name, bool last = false);

// "leaderboards/leaderboards.xml" (LeaderboardWarnings.cpp).
std::vector<DataWarning> WarnLeaderboards(const std::string& path, const std::string& bytes,
                                          const LoadOutcome& outcome);

// "in-app-purchases/in-app-purchases.xml" (InAppPurchaseWarnings.cpp).
std::vector<DataWarning> WarnInAppPurchases(const std::string& path, const std::string& bytes,
                                            const LoadOutcome& outcome);

}  // namespace datatool
