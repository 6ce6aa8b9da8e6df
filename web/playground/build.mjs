// Writes the playground: one page with everything in it.
//
//     node web/playground/build.mjs SCRIPT PAGE

import { readFileSync, writeFileSync } from "node:fs";
import { argv } from "node:process";

const [, , script, page] = argv;
const near = (name) => readFileSync(new URL(name, import.meta.url), "utf8");
const report = "../../examples/report/page/";
const css = [`${report}graph.css`, `${report}page.css`, "playground.css"].map(near).join("\n");
// Escapes everything that could end the script element.
const parts = { CSS: css, SCRIPT: readFileSync(script, "utf8").replaceAll("</script", "<\\/script").replaceAll("<!--", "<\\!--") };
writeFileSync(page, near("index.html").replace(/\{\{([A-Z]+)\}\}/g, (_, name) => parts[name]));
