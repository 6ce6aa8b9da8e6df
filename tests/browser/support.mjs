// Shared by the checks of all pages.

import assert from "node:assert/strict";
import { readFileSync } from "node:fs";
import { createRequire } from "node:module";
import path from "node:path";

export const SCHEMES = ["light", "dark"];

export let checks = 0;
export function check(condition, what) {
    assert.ok(condition, what);
    ++checks;
}
export function checkEqual(actual, expected, what) {
    assert.deepEqual(actual, expected, what);
    ++checks;
}

// The folders of Node.js's packages and of the screenshots.
let folder;
let axe;

export async function launch(out, executablePath = "/usr/bin/chromium") {
    folder = path.resolve(out);
    const require = createRequire(path.join(folder, "package.json"));
    axe = readFileSync(require.resolve("axe-core/axe.min.js"), "utf8");
    return require("playwright-core").chromium.launch({ executablePath, args: ["--no-sandbox"] });
}

// Opens the page; a console message, an error or a request is a failure.
export async function open(browser, url, options) {
    const page = await browser.newPage(options);
    page.on("console", (message) => assert.fail(`console: ${message.type()}: ${message.text()}`));
    page.on("pageerror", (error) => assert.fail(`error: ${error.message}`));
    page.on("request", (request) => {
        const asked = request.url();
        assert.ok(asked.replace(/#.*/, "") === url.replace(/#.*/, "") || asked.startsWith("data:"), `loads ${asked}`);
    });
    await page.goto(url);
    return page;
}

// Texts with too little contrast. axe cannot determine the background of texts in a graph and some others.
const faintTexts = (fewest) => {
    const channels = (color) => color.match(/[\d.]+/g).map(Number);
    const luminance = (color) => channels(color).slice(0, 3)
        .map((c) => (c / 255 <= 0.04045 ? c / 255 / 12.92 : ((c / 255 + 0.055) / 1.055) ** 2.4))
        .reduce((sum, c, i) => sum + c * [0.2126, 0.7152, 0.0722][i], 0);
    const isSeen = (color) => (channels(color)[3] ?? 1) > 0;
    const found = [];
    let count = 0;
    const walker = document.createTreeWalker(document.body, NodeFilter.SHOW_TEXT);
    while (walker.nextNode()) {
        const element = walker.currentNode.parentElement;
        if (!walker.currentNode.data.trim() || element.closest("script, .skip") || !element.checkVisibility()) continue;
        const colors = [];
        if (element.closest(".graph")) {
            const behind = element.closest(".heading")?.querySelector(".bar") ?? element.closest(".patch").querySelector(".body");
            colors.push(getComputedStyle(element).fill, getComputedStyle(behind).fill);
        } else {
            let behind = element;
            while (!isSeen(getComputedStyle(behind).backgroundColor)) behind = behind.parentElement;
            colors.push(getComputedStyle(element).color, getComputedStyle(behind).backgroundColor);
        }
        const [light, dark] = colors.map(luminance).sort((x, y) => y - x);
        const contrast = (light + 0.05) / (dark + 0.05);
        if (!(contrast >= 4.5)) found.push(`${element.textContent}: ${contrast}`);
        ++count;
    }
    return count > fewest ? found : [`${count} texts were looked at`];
};

// Texts that are cut off or overlap.
const misplacedTexts = () => {
    const found = [];
    const texts = [];
    const walker = document.createTreeWalker(document.body, NodeFilter.SHOW_TEXT);
    while (walker.nextNode()) {
        const node = walker.currentNode;
        const parent = node.parentElement;
        if (!node.data.trim() || parent.closest("script, .skip")) continue;
        if (!parent.checkVisibility({ checkOpacity: true })) continue;
        const range = document.createRange();
        range.selectNodeContents(node);
        // A graph scrolls in its frame, so its texts are only compared with one another.
        const graph = parent.closest(".graph");
        for (let e = parent; e !== document.body; e = e.parentElement) {
            const style = getComputedStyle(e);
            const hides = /hidden|clip/.test(style.overflowX + style.overflowY);
            if (hides && e.clientWidth > 0 && (e.scrollWidth > e.clientWidth + 1 || e.scrollHeight > e.clientHeight + 1)) {
                found.push(`is cut off: ${node.data}`);
            }
            if (e instanceof SVGElement) break;
        }
        for (const box of range.getClientRects()) {
            if (box.width < 1) continue;
            texts.push({ text: node.data.trim(), box, graph, scrolls: parent.closest(".now") });
            if (graph) {
                const patch = parent.closest(".patch").querySelector(".body").getBoundingClientRect();
                if (box.left < patch.left || box.right > patch.right) found.push(`leaves its patch: ${node.data}`);
            } else if (box.left < 0 || box.right > innerWidth + 0.5) {
                found.push(`leaves the page: ${node.data}`);
            }
        }
    }
    const shown = texts.filter(({ scrolls }) => !scrolls);
    for (let i = 0; i < shown.length; ++i) {
        for (let j = i + 1; j < shown.length; ++j) {
            const a = shown[i];
            const b = shown[j];
            if (a.graph !== b.graph) continue;
            const width = Math.min(a.box.right, b.box.right) - Math.max(a.box.left, b.box.left);
            const height = Math.min(a.box.bottom, b.box.bottom) - Math.max(a.box.top, b.box.top);
            if (width > 2 && height > 6) found.push(`overlap: ${a.text} / ${b.text}`);
        }
    }
    if (document.documentElement.scrollWidth > innerWidth) found.push("the page scrolls sideways");
    return { found, count: texts.length };
};

// The rules of axe.
export async function checkAccessibility(page, what) {
    await page.evaluate(axe);
    const result = await page.evaluate(() => globalThis.axe.run(document, {
        preload: false,
        runOnly: ["wcag2a", "wcag2aa", "wcag21a", "wcag21aa", "wcag22aa", "best-practice"],
    }));
    const wrong = result.violations.map((v) => `${v.id}: ${v.help}: ${v.nodes.map((n) => n.html).slice(0, 3)}`);
    checkEqual(wrong, [], `accessibility of ${what}`);
    const untold = result.incomplete.filter(({ id }) => id !== "color-contrast").map(({ id }) => id);
    checkEqual(untold, [], `accessibility of ${what} that axe cannot tell`);
    check(result.passes.some(({ id }) => id === "color-contrast"), "contrast was looked at");
}

// Checks the page in this size and colour scheme, with at least `fewest` texts, and takes a screenshot.
export async function checkLooks(page, name, size, scheme, fewest = 50) {
    const paper = await page.evaluate(() => getComputedStyle(document.body).backgroundColor);
    const brightest = Math.max(...paper.match(/\d+/g).map(Number));
    checkEqual(brightest < 128 ? "dark" : "light", scheme, `${name} is on ${paper}`);
    const { found, count } = await page.evaluate(misplacedTexts);
    checkEqual(found, [], `${name}, ${size.width}, ${scheme}`);
    check(count > fewest, "texts were looked at");
    checkEqual(await page.evaluate(faintTexts, fewest), [], `contrast in ${name}, ${size.width}, ${scheme}`);
    await checkAccessibility(page, `${name}, ${size.width}, ${scheme}`);
    await page.screenshot({ path: path.join(folder, `${name}-${size.width}-${scheme}.png`), fullPage: true });
}
