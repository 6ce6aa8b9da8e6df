// The site of the reference and the guide in a real browser: Debian's chromium, at two sizes and in both colour schemes, as
// files.
//
//     node site.mjs SITE FOLDER [CHROMIUM]
//
// Writes screenshots into FOLDER. Ends non-zero at the first check that fails.

import { readdirSync } from "node:fs";
import path from "node:path";
import { pathToFileURL } from "node:url";

import { check, checkAccessibility, checkEqual, checks, launch, SCHEMES } from "./support.mjs";

const [site, out, executablePath] = process.argv.slice(2);

const SIZES = [{ width: 1400, height: 900 }, { width: 390, height: 844 }];
const urlOf = (name) => pathToFileURL(path.join(site, name)).href;
const pages = readdirSync(site).filter((name) => /^(index|md_.*|(class|struct)tarn_1_1engine_1_1[A-Za-z]+|[a-z_]+_8h|namespacetarn_1_1engine)\.html$/.test(name));
// Checked in every size and colour scheme; the others in one combination each.
const looked = pages.filter((name) => /^(index|md_.*|classtarn_1_1engine_1_1(Value|Patch.*|Unstructured)|path_8h)\.html$/.test(name));

// Pages opened from files load only files of the site, and print nothing to the console.
async function openSite(browser, options) {
    const page = await browser.newPage({ reducedMotion: "reduce", ...options });
    page.on("console", (message) => check(false, `console: ${message.type()}: ${message.text()}`));
    page.on("pageerror", (error) => check(false, `error: ${error.message}`));
    page.on("request", (request) => {
        check(request.url().startsWith(pathToFileURL(site).href) || request.url().startsWith("data:"), `loads ${request.url()}`);
    });
    return page;
}

async function checkPage(page, name, size, scheme) {
    await page.goto(urlOf(name));
    await page.waitForSelector("#doc-content[role=main]");
    const paper = await page.evaluate(() => getComputedStyle(document.body).backgroundColor);
    checkEqual(Math.max(...paper.match(/\d+/g).map(Number)) < 128 ? "dark" : "light", scheme, `${name} is on ${paper}`);
    checkEqual(await page.evaluate(() => document.documentElement.scrollWidth <= innerWidth), true, `${name} scrolls sideways at ${size.width}`);
    await checkAccessibility(page, `${name}, ${size.width}, ${scheme}`);
    // Readable lines: no paragraph is wider than about a hundred characters.
    const widest = await page.$$eval(".contents p", (all) => Math.max(0, ...all.map((p) => p.getBoundingClientRect().width)));
    check(widest <= 920, `the lines of ${name} are ${widest} wide`);
}

async function checkSearch(page) {
    await page.goto(urlOf("index.html"));
    await page.waitForSelector("#doc-content[role=main]");
    await page.focus("#MSearchField");
    await page.keyboard.type("PatchEdit");
    const results = page.frameLocator("#MSearchResults");
    const found = results.locator(".SRResult:visible .SRSymbol").first();
    await found.waitFor();
    check((await found.textContent()).includes("PatchEdit"), "the search finds a class");
}

async function checkTree(page) {
    await page.goto(urlOf("index.html"));
    await page.waitForSelector("#nav-tree .item");
    const entries = await page.locator("#nav-tree .label").allTextContents();
    for (const entry of ["Values", "Documents", "Classes"]) check(entries.some((text) => text.includes(entry)), `the tree has ${entry}`);
}

const browser = await launch(out, executablePath);
try {
    check(pages.length > 40 && looked.length > 15, `${pages.length} pages`);
    for (const [i, viewport] of SIZES.entries()) {
        for (const [j, colorScheme] of SCHEMES.entries()) {
            const page = await openSite(browser, { viewport, colorScheme });
            for (const [k, name] of pages.entries()) {
                if (!looked.includes(name) && k % 4 !== 2 * i + j) continue;
                await checkPage(page, name, viewport, colorScheme);
            }
            await page.goto(urlOf("index.html"));
            await page.waitForSelector("#doc-content[role=main]");
            await page.screenshot({ path: path.join(out, `site-${viewport.width}-${colorScheme}.png`) });
            await page.close();
        }
    }
    const page = await openSite(browser, { viewport: SIZES[0] });
    await checkTree(page);
    await checkSearch(page);
    await page.close();
} finally {
    await browser.close();
}
console.log(`${checks} checks of ${pages.length} pages of the site passed in chromium`);
