// A page with holes, and what goes into them.
//
//     fillTemplate("<h1>{{NAME}}</h1>", {{"NAME", "badge"}});  // "<h1>badge</h1>"

#ifndef REPORT_TEMPLATE_H
#define REPORT_TEMPLATE_H

#include <map>
#include <string>

// The template with its {{NAMES}} filled in; what is from {{#NAME}} to {{/NAME}} stays where that
// part is not empty.
std::string fillTemplate(std::string const& page, std::map<std::string, std::string> const& parts);

#endif
