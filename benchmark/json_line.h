// A line of JSON: one object of numbers.
#pragma once

#include <cstdio>
#include <string>

namespace orvane::bench {

class JsonLine {
  public:
    void Add(const std::string& name, double value) {
        char number[40];
        std::snprintf(number, sizeof number, "%.6g", value);
        text_ += (text_.empty() ? "{\"" : ", \"") + name + "\": " + number;
    }
    void Print() const { std::printf("%s}\n", text_.c_str()); }

  private:
    std::string text_;
};

}  // namespace orvane::bench
