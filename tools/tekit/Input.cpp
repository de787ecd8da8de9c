#include "Input.h"

#include "Commands.h"

#include <iostream>

namespace tekit::tool {

std::string InputItem::Location() const {
    return line > 0 ? "<stdin>:" + std::to_string(line) + ": " : "";
}

std::vector<InputItem> CollectInputs(std::vector<std::string> const& arguments, std::istream& in) {
    std::vector<InputItem> items;
    bool stdinRead = false;
    for (std::string const& argument : arguments) {
        if (argument != "-") {
            items.push_back({argument, 0});
            continue;
        }
        if (stdinRead)
            continue; // a second "-" finds standard input at its end
        stdinRead = true;
        std::string line;
        for (int number = 1; std::getline(in, line); ++number) {
            if (!line.empty() && line.back() == '\r')
                line.pop_back();
            items.push_back({line, number});
        }
    }
    return items;
}

std::vector<InputItem> CollectInputs(std::vector<std::string> const& arguments) {
    return CollectInputs(arguments, std::cin);
}

void Findings::Report(InputItem const& item, std::string const& message) {
    std::cerr << "tekit: " << item.Location() << message << '\n';
    ++m_count;
}

int Findings::Status() const {
    return m_count ? kFailure : kSuccess;
}

} // namespace tekit::tool
