#pragma once

#include <string>

#include "Pictures.h"
#include "StepDriver.h"

class QuoteServer;

// A walk through the whole program in one sample folder: every menu and dialog, a price update from a server
// of its own, every chart and the report, until Quit. Each step waits for what it expects on screen, and what
// was changed is looked up in the files; pictures are taken on the way. It is made before the application
// object and told of failures through Failed. Interface thread.
class Tour : public StepDriver {
  public:
    // The folder holds the program's files with the sample portfolios, and its quote source is `quotes`;
    // pictures go into the other folder, which exists.
    Tour(std::string folder, std::string pictures, QuoteServer& quotes);
    ~Tour() override;

    [[nodiscard]] bool Failed() const { return failed_; }

  protected:
    void Fail(const std::string& sentence) override;

  private:
    // --- what the steps are made of ---
    // As soon as the main window is free to be worked.
    void Then(const std::string& what, Action action);
    // Waits until the main window is free and the condition holds.
    void Until(const std::string& what, const Condition& condition);
    void Shoot(const std::string& picture);
    // A modal window with this title is shown: take its picture and do the action.
    void InDialog(const char* title, const std::string& picture, Action action);
    void Choose(const char* menu, const char* item);
    void AlertAndAnswer(const char* text, const std::string& picture, const char* button);

    // --- the walk ---
    void LookAtMenus();
    void LookAtDialogs();
    void AddAnInvestment();
    void UpdatePrices();
    void LookAtCharts();
    void PrintReport();
    void Leave();

    std::string folder_;
    Pictures pictures_;
    QuoteServer& quotes_;
    bool failed_ = false;
};
