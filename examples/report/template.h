// Fills in page templates.
//
//     fillTemplate("<h1>{{NAME}}</h1>", {{"NAME", "badge"}});  // "<h1>badge</h1>"

#ifndef REPORT_TEMPLATE_H
#define REPORT_TEMPLATE_H

#include <map>
#include <string>

// Replaces each {{NAME}}. The part from {{#NAME}} to {{/NAME}} is removed where that value is
// empty.
std::string fillTemplate(std::string const& page, std::map<std::string, std::string> const& parts);

#endif
