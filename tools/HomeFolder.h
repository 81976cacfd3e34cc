#pragma once

#include <iosfwd>
#include <memory>
#include <string>

class DATABASE;

// The program's folder, for commands that only read what is in it.

// The folder to use when none is named: that of quorvan-cli itself when it holds an invest.db, else
// "Quorvan" in the person's own folder.
[[nodiscard]] std::string DefaultHomeFolder();

// Opens the investment file of the folder for a portfolio, which must be listed in the portfolio file;
// `portfolio` becomes its name as it is written there. Null, with one sentence on `errors`, when a file
// cannot be read or there is no such portfolio.
[[nodiscard]] std::unique_ptr<DATABASE> OpenInvestments(const std::string& homeFolder, std::string& portfolio,
                                                        std::ostream& errors);
