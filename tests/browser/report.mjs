// The report in a real browser: Debian's chromium, at two sizes and in both colour schemes.
//
//     node report.mjs DOCUMENT_ROAD DOCUMENTS FOLDER [CHROMIUM]
//
// Writes the pages and screenshots of them into FOLDER. Ends non-zero at the first check that fails.

import { execFileSync, spawnSync } from "node:child_process";
import { readFileSync, writeFileSync } from "node:fs";
import path from "node:path";
import { pathToFileURL } from "node:url";

import { largeDocument } from "./documents.mjs";
import { check, checkEqual, checkLooks, checks, launch, open, SCHEMES } from "./support.mjs";

const [program, documents, out, executablePath] = process.argv.slice(2);
const folder = path.resolve(out);

const FRAMES = 120;
const SIZES = [{ width: 1280, height: 800 }, { width: 390, height: 844 }];
const OPENING_SECONDS = 5;

const run = (...options) => execFileSync(program, options, { encoding: "utf8", maxBuffer: 1 << 28 });

function writePage(file, name) {
    const page = path.join(folder, `${name}.html`);
    run(file, "--frames", "0", "--report", page, "--report-frames", String(FRAMES));
    return pathToFileURL(page).href;
}

// The `d` of every drawn path, in order.
const drawnNow = (page) => page.$$eval("#drawn path[d]", (paths) => paths.map((p) => p.getAttribute("d")));

async function checkAnimation(page, file) {
    // The program's output for each frame.
    const printed = Array.from({ length: FRAMES }, () => []);
    const lines = run(file, "--frames", String(FRAMES), "--paths").split("\n");
    for (const line of lines) {
        const match = /^frame (\d+), [^:]*: (M .*)$/.exec(line);
        if (match) printed[Number(match[1])].push(match[2]);
    }
    check(printed.every((paths) => paths.length === 2), "an outline and a layer in every frame");
    checkEqual(await drawnNow(page), printed[0], "the first frame");

    for (let frame = 0; frame < FRAMES; ++frame) {
        await page.fill("#frame", String(frame));
        checkEqual(await drawnNow(page), printed[frame], `the slider at frame ${frame}`);
    }
    await page.focus("#frame");
    await page.keyboard.press("Home");
    checkEqual(await drawnNow(page), printed[0], "the key Home");
    for (const [key, frame] of [["ArrowRight", 1], ["ArrowRight", 2], ["ArrowLeft", 1], ["End", FRAMES - 1]]) {
        await page.keyboard.press(key);
        checkEqual(await drawnNow(page), printed[frame], `the key ${key}`);
    }
    await page.keyboard.press("Home");

    await page.evaluate(() => {
        globalThis.shifts = [];
        new PerformanceObserver((list) => globalThis.shifts.push(...list.getEntries()))
            .observe({ type: "layout-shift", buffered: false });
    });
    const height = await page.evaluate(() => document.documentElement.scrollHeight);
    await page.click("#play");
    checkEqual(await page.textContent("#play"), "Pause");
    const seen = new Set();
    for (let i = 0; i < 20; ++i) {
        await page.waitForTimeout(60);
        seen.add((await drawnNow(page))[0]);
        checkEqual(await page.evaluate(() => document.documentElement.scrollHeight), height, "no jump of the page");
    }
    check(seen.size >= 5, `playing showed ${seen.size} frames`);
    await page.keyboard.press("Space");
    checkEqual(await page.textContent("#play"), "Play");
    const stopped = await drawnNow(page);
    await page.waitForTimeout(250);
    checkEqual(await drawnNow(page), stopped, "a pause");
    checkEqual(await page.evaluate(() => globalThis.shifts.filter((s) => !s.hadRecentInput).length), 0, "no layout shift");

    checkEqual(await page.locator("#points").isVisible(), false);
    await page.check("#show-points");
    checkEqual(await page.locator("#points").isVisible(), true);
    for (const name of ["handle", "control", "dot"]) {
        check((await page.getAttribute(`#points .${name}`, "d")).length > 100, `${name}s are shown`);
    }
    await page.uncheck("#show-points");
    checkEqual(await page.locator("#points").isVisible(), false);
}

async function checkPlots(page, file) {
    const rows = run(file, "--frames", String(FRAMES)).trimEnd().split("\n").slice(-FRAMES - 1)
        .map((line) => line.trim().split(/ {2,}/));
    const [headings, ...cells] = rows;
    const charts = await page.$$(".chart");
    checkEqual(charts.length, headings.length - 1, "a plot for each output");
    for (const frame of [0, 37, FRAMES - 1]) {
        await page.fill("#frame", String(frame));
        for (const [i, chart] of charts.entries()) {
            const text = `frame ${frame}: ${cells[frame][i + 1]}`;
            checkEqual(await chart.getAttribute("aria-valuetext"), text, headings[i + 1]);
            const plot = await chart.evaluate((c) => c.parentElement.querySelector(".value").textContent);
            checkEqual(plot, cells[frame][i + 1], headings[i + 1]);
        }
    }
    // Pointing at a plot shows that frame's value; leaving it, the current one.
    await page.fill("#frame", "0");
    for (const [i, chart] of charts.entries()) {
        await chart.scrollIntoViewIfNeeded();
        const box = await chart.boundingBox();
        await page.mouse.move(box.x + box.width * 60 / (FRAMES - 1), box.y + box.height / 2);
        const shown = await chart.evaluate((c) => c.parentElement.querySelector(".now").textContent.trim());
        checkEqual(shown, `frame 60 ${cells[60][i + 1]}`, `pointing at ${headings[i + 1]}`);
        await page.mouse.move(box.x + box.width / 2, box.y - 40);
    }
    checkEqual(await page.textContent(".plot .frame"), "frame 0");
}

async function checkGraph(page) {
    const level = page.locator("#level-13");
    checkEqual(await level.isVisible(), false, "a group is closed");
    const heading = page.locator('[data-level="level-13"]');
    await heading.click();
    checkEqual(await level.isVisible(), true, "a group opens");
    checkEqual(await heading.getAttribute("aria-expanded"), "true");
    await page.getByRole("button", { name: "Close colors" }).click();
    checkEqual(await level.isVisible(), false, "a group closes");
    checkEqual(await heading.evaluate((h) => h === document.activeElement), true, "the focus goes back");
    await page.keyboard.press("Enter");
    checkEqual(await level.isVisible(), true, "a key opens a group");
    await page.keyboard.press("Space");
    checkEqual(await level.isVisible(), false, "a key closes a group");

    const info = page.locator("#level-1 > .info");
    await page.locator('#level-1 [aria-label^="input speed;"]').first().hover();
    const lines = ["input speed", "Number [type: float] from 0.1 to 4, default 1", "port 201, tag 1",
        'ui: {"slider": 1, "steps": [0.1, 1, 4]}', 'unit: "times"'];
    checkEqual(await info.locator("p").allTextContents(), lines, "pointing at a port");

    // The arrow keys visit every patch and port of the level, and return.
    const items = await page.$$eval("#level-1 > .scroll [tabindex]", (all) => all.map((e) => e.ariaLabel).filter(Boolean));
    await page.locator("#level-1 > .scroll .heading").first().focus();
    await page.keyboard.press("Home");
    const reached = [];
    for (let i = 0; i < items.length; ++i) {
        reached.push(await page.evaluate(() => document.activeElement.ariaLabel));
        checkEqual((await info.locator("p").allTextContents()).join("; "), reached[i], "the focus shows what is there");
        await page.keyboard.press("ArrowDown");
    }
    checkEqual(reached, items, "every patch and port by the keyboard");
    await page.keyboard.press("Home");
    await page.keyboard.press("ArrowRight");
    check((await page.evaluate(() => document.activeElement.ariaLabel)).startsWith("colors;"), "the next patch");

    const width = () => page.locator("#level-1 > .scroll svg").evaluate((s) => s.width.baseVal.value);
    const before = await width();
    await page.getByRole("button", { name: "Draw bouncing badge larger" }).click();
    check(Math.abs(await width() - before * 1.25) < 0.01, "a graph is drawn larger");
    await page.getByRole("button", { name: "Draw bouncing badge smaller" }).click();
}

async function checkKeyboard(page) {
    for (const closed of await page.$$("details:not([open]) > summary")) {
        if (!await closed.isVisible()) continue;
        await closed.focus();
        await page.keyboard.press("Enter");
        check(await closed.evaluate((s) => s.parentElement.open), "a key opens an attribute");
    }
    const wanted = await page.$$eval("a[href], button, input, summary, .chart, .graph", (all) => {
        const visible = all.filter((e) => e.checkVisibility());
        visible.forEach((e, i) => { e.dataset.wanted = i; });
        return visible.length;
    });
    await page.evaluate(() => {
        document.activeElement.blur();
        getSelection().collapse(document.body, 0);
    });
    const reached = new Set();
    for (let i = 0; i < wanted * 2 + 20; ++i) {
        await page.keyboard.press("Tab");
        const at = await page.evaluate(() => document.activeElement.closest("[data-wanted]")?.dataset.wanted);
        if (at !== undefined) reached.add(at);
    }
    checkEqual(reached.size, wanted, "the tab key reaches everything");
}

// Long names and strings, wide characters, many levels, small and large numbers.
function oddDocument() {
    const long = "a name that is longer than any box could show without becoming unreadable ";
    const wide = "\u6f22\u5b57\u306e\u540d\u524d".repeat(12);
    let inner = { id: 40, name: "innermost", outputs: [{ id: 4000, name: "x", type: "float" }] };
    for (let id = 39; id > 20; --id) inner = { id, name: `${long}${id}`, children: [inner] };
    const text = (id, value) => ({ id, kind: "constant", name: wide, attributes: { [long]: long.repeat(9) },
        inputs: [{ id: id * 10, name: wide, type: "string", default: value }],
        outputs: [{ id: id * 10 + 1, name: long, type: "string" }] });
    const tiny = { id: 5, kind: "roundRect", inputs: [{ id: 50, type: "vec2", default: [0, 0] },
        { id: 51, type: "vec2", default: [0.003, 0.002] }, { id: 52, type: "float", default: 0.0005 }],
        outputs: [{ id: 53, name: "tiny", type: "path" }] };
    const huge = { id: 6, kind: "constant", inputs: [{ id: 60, type: "float", default: 1.5e300 }],
        outputs: [{ id: 61, name: "huge", type: "float" }] };
    return { root: { id: 1, name: long.repeat(3), attributes: { [wide]: { [long]: [wide] } },
        children: [text(2, long.repeat(30)), text(3, wide.repeat(9)), inner, tiny, huge] } };
}

async function checkOdd(browser) {
    const file = path.join(folder, "odd.json");
    writeFileSync(file, JSON.stringify(oddDocument()));
    const url = writePage(file, "odd");
    for (const viewport of SIZES) {
        const page = await open(browser, url, { viewport, reducedMotion: "reduce" });
        for (const heading of await page.$$('[data-level][aria-expanded="false"]')) {
            await heading.evaluate((h) => h.dispatchEvent(new MouseEvent("click", { bubbles: true })));
        }
        await checkLooks(page, "odd", viewport, "light");
        const stage = await page.locator("#stage").boundingBox();
        const drawn = await page.locator("#drawn path").first().boundingBox();
        check(drawn.height > stage.height / 2, "a small drawing fills the stage");
        checkEqual(await page.locator("#outputs").count(), 0, "outputs that never change are not plotted");
        await page.close();
    }
}

// Graphviz takes minutes for this graph, so it is drawn in rows.
async function checkTangled(browser) {
    const { root } = largeDocument(2000);
    let seed = 1;
    for (const connection of root.connections) {
        seed = seed * 48271 % 2147483647;
        const from = 2 + seed % 2000;
        connection.from = [from, from * 10 + 2];
    }
    const file = path.join(folder, "tangled.json");
    writeFileSync(file, JSON.stringify({ root }));
    const start = performance.now();
    const url = writePage(file, "tangled");
    const seconds = (performance.now() - start) / 1000;
    check(seconds < 30, `the page is written in ${seconds.toFixed(1)} s`);
    const page = await open(browser, url, { viewport: SIZES[0] });
    checkEqual(await page.locator(".patch").count(), 2000);
    await page.close();
}

// Two documents: every change is listed, marked in the graph by more than a colour, and leads to its patch.
async function checkChanges(browser) {
    const before = path.join(documents, "animation.json");
    const file = path.join(folder, "edited.json");
    const edited = JSON.parse(readFileSync(before, "utf8"));
    const patches = edited.root.children;
    const removed = patches.findIndex((p) => !p.children && !edited.root.connections.some((c) => c.from[0] === p.id));
    const { id: removedId } = patches.splice(removed, 1)[0];
    edited.root.connections = edited.root.connections.filter((c) => c.to[0] !== removedId);
    const inner = patches.flatMap((p) => p.children ?? [])[0];
    inner.name = "renamed";
    patches.push({ id: 900, name: "added", outputs: [{ id: 9000, type: "float" }] });
    writeFileSync(file, JSON.stringify(edited));

    const report = path.join(folder, "changes.html");
    const { status, stdout } = spawnSync(program, [before, "--compare", file, "--report", report], { encoding: "utf8" });
    checkEqual(status, 1, "the documents differ");
    const lines = stdout.trimEnd().split("\n");
    const kinds = new Set(lines.map((line) => line.split(" ")[0]));
    checkEqual([...kinds].sort(), ["added", "changed", "removed"]);
    for (const viewport of SIZES) {
        for (const colorScheme of SCHEMES) {
            const page = await open(browser, pathToFileURL(report).href, { viewport, colorScheme, reducedMotion: "reduce" });
            await checkLooks(page, "changes", viewport, colorScheme);
            const listed = await page.$$eval("#changes li", (all) => all.map((li) => li.textContent));
            checkEqual(listed.map((text) => text.slice(2)), lines, "every change is listed");
            const links = await page.$$("#changes a");
            check(links.length >= 3, "changes lead to their patches");
            for (const link of links) {
                const wanted = await link.evaluate((a) => a.hash.slice(1));
                await link.focus();
                await page.keyboard.press("Enter");
                checkEqual(await page.evaluate(() => document.activeElement.id), wanted, "the entry leads to its patch");
                check(await page.locator(`#${wanted}`).isVisible(), "its groups are open");
            }
            for (const [kind, sign] of [["added", "+"], ["removed", "\u2212"], ["changed", "~"]]) {
                const texts = page.locator(`.patch.${kind} > .heading`).first().locator("text");
                check((await texts.allTextContents()).includes(sign), `the sign of what is ${kind}`);
            }
            checkEqual(await page.locator("#patch-900").evaluate((h) => JSON.parse(h.dataset.parts).at(-1)),
                lines.find((line) => line.startsWith("added")), "a patch says what was changed");
            await page.close();
        }
    }
}

// A group inside a group closes with the outer one.
async function checkNested(browser) {
    let root = { id: 5, name: "level 5" };
    for (let id = 4; id > 0; --id) root = { id, name: `level ${id}`, children: [root] };
    const file = path.join(folder, "nested.json");
    writeFileSync(file, JSON.stringify({ root }));
    const page = await open(browser, writePage(file, "nested"), { viewport: SIZES[1] });
    const shown = () => page.$$eval(".level", (all) => all.filter((l) => l.checkVisibility()).map((l) => l.id));
    const levels = ["level-1", "level-2", "level-3", "level-4"];
    for (let i = 1; i < levels.length; ++i) {
        checkEqual(await shown(), levels.slice(0, i));
        await page.locator(`[data-level="${levels[i]}"]`).click();
    }
    checkEqual(await shown(), levels);
    await page.locator('[data-level="level-2"]').click();
    checkEqual(await shown(), ["level-1"]);
    await page.close();
}

// Browsers would restructure elements that are nested deeper.
async function checkDeep(browser) {
    const levels = 900;
    let text = `{"id": ${levels}, "name": "innermost"}`;
    for (let id = levels - 1; id > 0; --id) text = `{"id": ${id}, "children": [${text}]}`;
    const file = path.join(folder, "deep.json");
    writeFileSync(file, `{"root": ${text}}`);
    const page = await open(browser, writePage(file, "deep"), { viewport: SIZES[0] });
    const depths = await page.$$eval(".level", (all) => all.map((level) => {
        let depth = 0;
        for (let e = level; e; e = e.parentElement) depth += e.classList.contains("level");
        return depth;
    }));
    checkEqual(depths, Array.from({ length: 257 }, (_, i) => i + 1));
    const last = page.locator("#level-257");
    check((await last.textContent()).includes("Nested deeper than this page shows."), "what is left out is said");
    await page.close();
}

async function checkLarge(browser) {
    const file = path.join(folder, "large.json");
    writeFileSync(file, JSON.stringify(largeDocument(2000)));
    const url = writePage(file, "large");
    const start = performance.now();
    const page = await open(browser, url, { viewport: SIZES[0] });
    checkEqual(await page.locator(".patch").count(), 2000);
    await page.evaluate(() => new Promise((done) => requestAnimationFrame(() => setTimeout(done, 0))));
    const seconds = (performance.now() - start) / 1000;
    check(seconds < OPENING_SECONDS, `2,000 patches open in ${seconds.toFixed(1)} s`);
    const last = page.locator('.heading[aria-label^="patch 2001;"]');
    await last.scrollIntoViewIfNeeded();
    check(await last.isVisible(), "the last patch can be scrolled to");
    const scrolled = await page.locator(".scroll").evaluate((s) => s.scrollTop + s.scrollLeft);
    check(scrolled > 1000, "the graph scrolls");
    console.log(`2,000 patches: ${seconds.toFixed(2)} s until they are drawn`);
    await page.close();
}

const browser = await launch(out, executablePath);
try {
    for (const name of ["animation", "small", "node_graph"]) {
        const url = writePage(path.join(documents, `${name}.json`), name);
        for (const viewport of SIZES) {
            for (const colorScheme of SCHEMES) {
                const page = await open(browser, url, { viewport, colorScheme, reducedMotion: "reduce" });
                await checkLooks(page, name, viewport, colorScheme);
                await page.close();
            }
        }
    }
    const file = path.join(documents, "animation.json");
    const url = pathToFileURL(path.join(folder, "animation.html")).href;
    for (const viewport of SIZES) {
        const page = await open(browser, url, { viewport, reducedMotion: "reduce" });
        await checkAnimation(page, file);
        await checkPlots(page, file);
        await checkGraph(page);
        await checkKeyboard(page);
        // With all groups open.
        for (const heading of await page.$$('[data-level][aria-expanded="false"]')) {
            await heading.evaluate((h) => h.dispatchEvent(new MouseEvent("click", { bubbles: true })));
        }
        await page.check("#show-points");
        await checkLooks(page, "animation-open", viewport, "light");
        await page.close();
    }
    await checkNested(browser);
    await checkDeep(browser);
    await checkChanges(browser);
    await checkOdd(browser);
    await checkTangled(browser);
    await checkLarge(browser);
} finally {
    await browser.close();
}
console.log(`${checks} checks passed in chromium`);
