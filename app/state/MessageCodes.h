#pragma once

#include "platform/Types.h"

// The codes of the messages by which the program's windows are worked. A message carries no data unless its
// line says so.

// To the main window: the commands of its menus and buttons, and the end of one that outlasts its message.
inline constexpr uint32 MessageSettings = 1000;
inline constexpr uint32 MessagePortfolioAdd = 1010;
inline constexpr uint32 MessagePortfolioEdit = 1011;
inline constexpr uint32 MessagePortfolioDelete = 1012;
inline constexpr uint32 MessagePortfolioChart = 1013;
inline constexpr uint32 MessagePortfolioPrint = 1014;
inline constexpr uint32 MessagePortfolioSelected = 1015; // PortfolioNameField: the portfolio to show
inline constexpr uint32 MessagePortfolioUpdate = 1016;
inline constexpr uint32 MessageUpdateEnded = 1017; // the price update has let go of the investment file
inline constexpr uint32 MessageInvestmentAdd = 1020;
inline constexpr uint32 MessageInvestmentEdit = 1021;
inline constexpr uint32 MessageInvestmentDelete = 1022;
inline constexpr uint32 MessageInvestmentCut = 1023;
inline constexpr uint32 MessageInvestmentCopy = 1024;
inline constexpr uint32 MessageInvestmentPaste = 1025;
inline constexpr uint32 MessageHelp = 1030;
inline constexpr uint32 MessageInvestmentInvoked = 1040; // a double click or Enter in the investment list

// The string field of MessagePortfolioSelected.
inline constexpr const char* PortfolioNameField = "PortfolioName";
