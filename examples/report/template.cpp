#include "report/template.h"

std::string fillTemplate(std::string const& page, std::map<std::string, std::string> const& parts) {
    std::string text;
    std::size_t done = 0;
    for (std::size_t open = page.find("{{"); open != std::string::npos;
         open = page.find("{{", done)) {
        std::size_t const close = page.find("}}", open);
        text += page.substr(done, open - done);
        std::string const name = page.substr(open + 2, close - open - 2);
        done = close + 2;
        if (name[0] == '#' && parts.at(name.substr(1)).empty()) {
            std::string const end = "{{/" + name.substr(1) + "}}";
            done = page.find(end, done) + end.size();
        } else if (name[0] != '#' && name[0] != '/') {
            text += parts.at(name);
        }
    }
    return text + page.substr(done);
}
