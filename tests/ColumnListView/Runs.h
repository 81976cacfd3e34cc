#pragma once

#include <sstream>
#include <string>

// What answers there are from one place to before another: each with where it begins.
template <class AnswerAt>
std::string Runs(float begin, float end, float step, const AnswerAt& answerAt) {
    std::ostringstream runs;
    std::string last;
    for (float x = begin; x < end; x += step)
        if (const std::string answer = answerAt(x); answer != last) {
            runs << x << answer << " ";
            last = answer;
        }
    return runs.str();
}
