#pragma once

#include <gtest/gtest.h>

#include "StepDriver.h"

// The steps of a test: what goes wrong in one fails it.
class Driver : public StepDriver {
  public:
    ~Driver() override { FailForStepsLeft(); }

    // Once the keyboard is in a field.
    void InField(Action action) { When("a field", Field, std::move(action)); }

  protected:
    void Fail(const std::string& sentence) override { ADD_FAILURE() << sentence; }
};
