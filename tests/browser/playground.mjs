// The playground in a real browser: Debian's chromium, at two sizes and in both colour schemes, as a file.
//
//     node playground.mjs PLAYGROUND DOCUMENT_ROAD DOCUMENTS FOLDER [CHROMIUM]
//
// Writes documents and screenshots into FOLDER. Ends non-zero at the first check that fails.

import { execFileSync, spawnSync } from "node:child_process";
import { readFileSync, writeFileSync } from "node:fs";
import path from "node:path";
import { pathToFileURL } from "node:url";

import { largeDocument } from "./documents.mjs";
import { check, checkEqual, checkLooks, checks, launch, open, SCHEMES } from "./support.mjs";

const [playground, program, documents, out, executablePath] = process.argv.slice(2);
const folder = path.resolve(out);
const url = pathToFileURL(playground).href;

const FRAMES = 120;
const SIZES = [{ width: 1400, height: 900 }, { width: 390, height: 844 }];
const EDIT_MILLISECONDS = 200;
const SUBJECTS = ["values", "curves", "shapes", "documents"];
// A lower bound of the number of texts in a tab.
const FEWEST = { values: 40, curves: 15, shapes: 20, documents: 100 };

const sample = (name) => path.join(documents, `${name}.json`);

async function openPage(browser, viewport, more = {}, state = "") {
    const page = await open(browser, url + state, { viewport, reducedMotion: "reduce", ...more });
    await page.waitForSelector("html[data-state=ready]");
    return page;
}

async function show(page, subject) {
    await page.click(`#tab-${subject}`);
    check(await page.locator(`#${subject}`).isVisible(), `${subject} are shown`);
}

const text = (page, id) => page.locator(`#${id}`).textContent();

async function conversions(page) {
    return page.$$eval("#value-conversions tr", (rows) => Object.fromEntries(rows.map((row) => [...row.children].map((c) => c.textContent))));
}

async function checkTabs(page) {
    await page.focus("#tab-values");
    for (const [key, subject] of [["ArrowRight", "curves"], ["End", "documents"], ["ArrowRight", "values"], ["ArrowLeft", "documents"], ["Home", "values"]]) {
        await page.keyboard.press(key);
        checkEqual(await page.evaluate(() => document.activeElement.id), `tab-${subject}`, `the key ${key}`);
        const seen = await page.$$eval("[role=tabpanel]", (all) => all.filter((p) => p.checkVisibility()).map((p) => p.id));
        checkEqual(seen, [subject], `the key ${key}`);
    }
}

const oneAsNumber = {
    float: "2.5", vec2: "2.5, 2.5", vec3: "2.5, 2.5, 2.5", vec4: "2.5, 2.5, 2.5, 2.5", int: "2", boolean: "1", string: "2.5",
    unstructured: "2.5",
};

async function checkValues(page) {
    await show(page, "values");
    const read = await conversions(page);
    checkEqual(Object.keys(read).length, 14, "a row for each type");
    for (const [type, wanted] of Object.entries(oneAsNumber)) checkEqual(read[type], wanted, `2.5 as ${type}`);

    // Every kind of value, chosen by the keyboard.
    const kinds = await page.$$eval("#value-type option", (all) => all.map(({ value }) => value));
    const seen = new Set();
    await page.focus("#value-type");
    await page.keyboard.press("Home");
    for (const kind of kinds) {
        checkEqual(await page.inputValue("#value-type"), kind);
        checkEqual(await text(page, "value-error"), "", `what a ${kind} begins with`);
        seen.add(JSON.stringify(await conversions(page)));
        await page.keyboard.press("ArrowDown");
    }
    checkEqual(seen.size, kinds.length, "each kind reads otherwise");

    const rows = [
        ["number", "-inf", "float", "-inf"], ["number", " 1e3 ", "float", "1000"], ["integer", "9223372036854775807", "int", "9223372036854775807"],
        ["boolean", "false", "float", "0"], ["vec2", "1;2", "vec2", "1, 2"], ["vec3", "1 2 3", "float", "1"], ["vec4", "1,2,3,4", "vec2", "1, 2"],
        ["colour", "#ff0000", "vec4", "1, 0, 0, 1"], ["colour", "#00000000", "vec4", "0, 0, 0, 0"],
        ["string", "<b>12</b>", "string", "<b>12</b>"], ["string", "12", "float", "12"], ["data", '{"X": 3}', "vec2", "3, 0"], ["image", "7", "image", "7"],
    ];
    for (const [kind, content, type, wanted] of rows) {
        await page.selectOption("#value-type", kind);
        await page.fill("#value-content", content);
        checkEqual(await text(page, "value-error"), "", `${kind} ${content}`);
        checkEqual((await conversions(page))[type], wanted, `${kind} ${content} as ${type}`);
    }
    // Invalid input shows an error of one line and leaves the conversions unchanged.
    await page.selectOption("#value-type", "number");
    await page.fill("#value-content", "17");
    const before = await conversions(page);
    for (const [kind, content] of [["number", "1,5"], ["number", ""], ["number", "0x"]]) {
        await page.fill("#value-content", content);
        const line = await text(page, "value-error");
        check(line !== "" && !line.includes("\n"), `${kind} ${content} is refused`);
        checkEqual(await conversions(page), before, `${kind} ${content} changes nothing`);
    }
    for (const [kind, content] of [["integer", "1.5"], ["integer", "9223372036854775808000"], ["boolean", "yes"], ["vec2", "1"], ["colour", "red"], ["data", "{"], ["image", "-1"]]) {
        await page.selectOption("#value-type", kind);
        await page.fill("#value-content", content);
        check((await text(page, "value-error")) !== "", `${kind} ${content} is refused`);
    }

    // A port with bounds.
    await page.selectOption("#value-type", "number");
    await page.fill("#value-content", "2.5");
    for (const [type, min, max, name, wanted] of [["Float", "0", "1", "Number", "1"], ["Float", "", "", "Number", "2.5"], ["Vec2", "3", "4", "Position", "2.5, 2.5"], ["Int", "", "1", "Number", "2"]]) {
        await page.selectOption("#port-type", type);
        await page.fill("#port-min", min);
        await page.fill("#port-max", max);
        checkEqual([await text(page, "port-name"), await text(page, "port-value")], [name, wanted], `a port of ${type} from ${min} to ${max}`);
    }
    checkEqual((await text(page, "value-code")).split("\n")[0], "Value const value = 2.5;");
}

async function checkCurves(page) {
    await show(page, "curves");
    checkEqual(await text(page, "curve-value"), "6.25", "a quarter of Cubic In Out from 0 to 100");
    const names = await page.$$eval("#curve-function option", (all) => all.map((o) => o.textContent));
    checkEqual(names.length, 13);
    const lines = new Set();
    await page.focus("#curve-function");
    await page.keyboard.press("Home");
    for (const name of names) {
        checkEqual(await page.locator("#curve-function option:checked").textContent(), name, "the keys reach every curve");
        lines.add(await page.getAttribute("#curve-line", "d"));
        await page.keyboard.press("ArrowDown");
    }
    checkEqual(lines.size, 13, "thirteen curves");

    await page.selectOption("#curve-function", "CubicIn");
    await page.focus("#curve-progress");
    await page.keyboard.press("End");
    checkEqual([await text(page, "curve-at"), await text(page, "curve-value")], ["1.000", "100"], "the key End");
    await page.keyboard.press("Home");
    await page.keyboard.press("ArrowRight");
    checkEqual(await text(page, "curve-at"), "0.001", "the key ArrowRight");
    // Drag over the picture.
    const box = await page.locator("#curve-picture").boundingBox();
    const at = (progress) => [box.x + box.width * (20 + 200 * progress) / 240, box.y + box.height / 2];
    await page.mouse.move(...at(0.1));
    await page.mouse.down();
    await page.mouse.move(...at(0.5), { steps: 4 });
    await page.mouse.up();
    await page.mouse.move(...at(0.9));
    check(Math.abs(Number(await text(page, "curve-at")) - 0.5) < 0.01, "dragged to the middle");

    await page.fill("#curve-progress", "0.5");
    for (const [from, to, value, code] of [
        ["0", "100", "12.5", "ease(EasingFunction::CubicIn, 0.0, 100.0, 0.5)  // 12.5"],
        ["1, 2", "9, 2", "2, 2", "ease(EasingFunction::CubicIn, FloatVec2{1.0, 2.0}, FloatVec2{9.0, 2.0}, 0.5)  // 2, 2"],
        ["1 2 3", "1 2 11", "1, 2, 4", "ease(EasingFunction::CubicIn, FloatVec3{1.0, 2.0, 3.0}, FloatVec3{1.0, 2.0, 11.0}, 0.5)  // 1, 2, 4"],
    ]) {
        await page.fill("#curve-from", from);
        await page.fill("#curve-to", to);
        checkEqual([await text(page, "curve-value"), await text(page, "curve-code")], [value, code], `from ${from} to ${to}`);
    }
    await page.fill("#curve-from", "#000000");
    await page.fill("#curve-to", "#ffffff");
    checkEqual(await text(page, "curve-value"), "#202020ff", "between two colours");
    check(await page.locator("#curve-swatch").isVisible(), "the colour is shown");
    await page.fill("#curve-to", "blue");
    check((await text(page, "curve-error")) !== "", "a name is no colour");
    checkEqual(await text(page, "curve-value"), "#202020ff", "what was there stays");
    await page.fill("#curve-to", "1, 2");
    check((await text(page, "curve-error")) !== "", "ends of two kinds are refused");
}

async function checkShapes(page) {
    await show(page, "shapes");
    const kinds = await page.$$eval("#shape-kind option", (all) => all.map(({ value }) => value));
    checkEqual(kinds.length, 9);
    for (const kind of kinds) {
        await page.selectOption("#shape-kind", kind);
        const before = await page.getAttribute("#shape-outline", "d");
        checkEqual(await text(page, "shape-svg"), before, "the data is that of the drawing");
        // Every handle by the keyboard, forth and back.
        const handles = await page.$$("#shape-handles circle");
        check(handles.length >= 2, `handles of ${kind}`);
        for (const handle of handles) {
            await handle.focus();
            await page.keyboard.press("Shift+ArrowRight");
            const moved = await page.getAttribute("#shape-outline", "d");
            check(moved !== before, `a handle of ${kind} moves by the keyboard`);
            await page.keyboard.press("Shift+ArrowLeft");
            checkEqual(await page.getAttribute("#shape-outline", "d"), before, `a handle of ${kind} moves back`);
        }
        // And by the pointer.
        for (const handle of handles) {
            const start = await page.getAttribute("#shape-outline", "d");
            await handle.scrollIntoViewIfNeeded();
            const box = await handle.boundingBox();
            await page.mouse.move(box.x + box.width / 2, box.y + box.height / 2);
            await page.mouse.down();
            await page.mouse.move(box.x + box.width / 2 + 12, box.y + box.height / 2 + 9, { steps: 3 });
            await page.mouse.up();
            check((await page.getAttribute("#shape-outline", "d")) !== start, `a handle of ${kind} is dragged`);
        }
        // Every field.
        const labels = await page.$$eval("#shape-fields label input", (all) => all.length);
        for (let i = 0; i < labels; ++i) {
            const field = page.locator("#shape-fields label input").nth(i);
            const start = await page.getAttribute("#shape-outline", "d");
            const number = await field.inputValue();
            await field.fill("13.5");
            check((await page.getAttribute("#shape-outline", "d")) !== start, `field ${i} of ${kind}`);
            await field.fill("");
            check((await text(page, "shape-error")) !== "", "an empty field is refused");
            await field.fill(number);
            checkEqual([await text(page, "shape-error"), await page.getAttribute("#shape-outline", "d")], ["", start]);
        }
    }
    for (const number of ["inf", "nan", "1e9", "abc"]) {
        const field = page.locator("#shape-fields input").first();
        const shape = [await field.inputValue(), await page.getAttribute("#shape-outline", "d")];
        await field.fill(number);
        check((await text(page, "shape-error")) !== "", `${number} is no place`);
        await page.locator("#shape-handles circle").first().focus();
        await page.keyboard.press("ArrowRight");
        checkEqual([await field.inputValue(), await page.getAttribute("#shape-outline", "d")], [number, shape[1]], "handles do not move what is nowhere");
        await field.fill(shape[0]);
    }
    await page.selectOption("#shape-kind", "circle");
    for (const [i, number] of ["0", "0", "10"].entries()) await page.locator("#shape-fields input").nth(i).fill(number);
    checkEqual(await text(page, "shape-code"), "Path const path = PathBuilder().circle({0, 0}, 10).build();");
    checkEqual(await page.locator("#shape-elements li").allTextContents().then((all) => [all.length, all[0]]), [6, "moveTo 10 0"]);

    await page.selectOption("#morph-kind", "ellipse");
    await page.fill("#morph-progress", "0");
    const none = await text(page, "shape-svg");
    await page.fill("#morph-progress", "1");
    check((await text(page, "shape-svg")).startsWith("M80 0C"), "the morph ends at the other shape");
    check(none.startsWith("M10 0C"), "and begins at the first");
    check((await text(page, "shape-code")).endsWith("interpolate(path, other, 1);"), "the C++ of a morph");
    await page.selectOption("#morph-kind", "curveTo");
    check((await text(page, "morph-note")) !== "", "shapes of other instructions have nothing between them");
    await page.selectOption("#morph-kind", "");

    await page.click("[data-copies=shape-code]");
    await page.waitForFunction(() => document.getElementById("said").textContent !== "");
    const said = await text(page, "said");
    const copied = said === "Copied" ? null : await page.evaluate(() => String(getSelection()));
    check(said === "Copied" || copied === await text(page, "shape-code"), "the line is copied or selected");
}

// The output of document_road for each frame of a file.
function printedPaths(file) {
    const printed = Array.from({ length: FRAMES }, () => []);
    for (const line of execFileSync(program, [file, "--frames", String(FRAMES), "--paths"], { encoding: "utf8", maxBuffer: 1 << 28 }).split("\n")) {
        const match = /^frame (\d+), [^:]*: (M .*)$/.exec(line);
        if (match) printed[Number(match[1])].push(match[2]);
    }
    return printed;
}
const drawnNow = (page) => page.$$eval("#drawn path[d]", (paths) => paths.map((p) => p.getAttribute("d")));

async function drawnFrames(page) {
    const frames = [];
    for (let frame = 0; frame < FRAMES; ++frame) {
        await page.fill("#frame", String(frame));
        frames.push(await drawnNow(page));
    }
    return frames;
}

async function saved(page, name) {
    const [download] = await Promise.all([page.waitForEvent("download"), page.click("#save")]);
    const file = path.join(folder, `${name}-saved.json`);
    await download.saveAs(file);
    return file;
}

const summary = (page) => text(page, "document-notes");

async function checkDocuments(page) {
    await show(page, "documents");
    check((await summary(page)).includes("40 patches in 3 levels"), "what the document has");
    checkEqual(await drawnFrames(page), printedPaths(sample("animation")), "the frames are those of the program");

    // An edit of the chosen patch, by its field and by its slider; every frame follows.
    const field = page.locator("#inputs input:not([type=range])").first();
    const slider = page.locator("#inputs input[type=range]").first();
    await page.fill("#frame", "5");
    const before = await drawnNow(page);
    await field.fill("2.5");
    const edited = await drawnNow(page);
    check(JSON.stringify(edited) !== JSON.stringify(before), "the frame follows an edited input");
    checkEqual(await slider.inputValue(), "2.5", "the slider follows the field");
    const file = await saved(page, "edited");
    const wanted = printedPaths(file);
    checkEqual(await drawnFrames(page), wanted, "the frames are those of the saved document");
    checkEqual(JSON.parse(readFileSync(file, "utf8")).framesPerSecond, JSON.parse(readFileSync(sample("animation"), "utf8")).framesPerSecond);

    await page.fill("#frame", "5");
    await slider.focus();
    await page.keyboard.press("Home");
    check(JSON.stringify(await drawnNow(page)) !== JSON.stringify(edited), "the slider moves by the keyboard");
    checkEqual(await field.inputValue(), await slider.inputValue(), "the field follows the slider");
    // Undo and redo, step by step.
    const last = await drawnNow(page);
    await page.click("#undo");
    checkEqual([await drawnNow(page), await field.inputValue()], [edited, "2.5"], "undone once");
    await page.focus("#undo");
    await page.keyboard.press("Enter");
    checkEqual(await drawnNow(page), before, "undone twice, by the keyboard");
    checkEqual(await page.getAttribute("#undo", "aria-disabled"), "true", "there is nothing more to undo");
    checkEqual(await page.evaluate(() => document.activeElement.id), "undo", "and the button keeps the focus");
    await page.click("#redo");
    await page.click("#redo");
    checkEqual(await drawnNow(page), last, "done again");
    checkEqual(await page.getAttribute("#redo", "aria-disabled"), "true", "there is nothing more to redo");
    // Invalid input is ignored, and is discarded when the field loses the focus.
    const number = await field.inputValue();
    await field.fill("fast");
    check((await text(page, "input-error")) !== "", "a word is no number");
    checkEqual(await field.getAttribute("aria-invalid"), "true");
    checkEqual(await drawnNow(page), last, "and changes nothing");
    await field.blur();
    checkEqual([await field.inputValue(), await text(page, "input-error"), await field.getAttribute("aria-invalid")], [number, "", null], "what was there comes back");
    await page.focus("#undo");
    await page.keyboard.press("Control+z");
    checkEqual(await drawnNow(page), edited, "undone by the keys");
    await page.keyboard.press("Control+Shift+z");
    checkEqual(await drawnNow(page), last, "done again by the keys");
    // The player still works after edits: it plays, and a key moves by one frame.
    await page.check("#show-points");
    await field.fill("2.25");
    check(await page.isChecked("#show-points"), "points stay");
    await page.uncheck("#show-points");
    await page.focus("#play");
    await page.keyboard.press("Home");
    await page.keyboard.press("ArrowRight");
    checkEqual(await page.inputValue("#frame"), "1", "a key is a frame");
    await page.keyboard.press("Enter");
    await page.waitForFunction(() => Number(document.getElementById("frame").value) > 5);
    await field.fill("2");
    checkEqual(await text(page, "play"), "Pause", "it goes on playing");
    await page.waitForFunction((hash) => location.hash !== hash, await page.evaluate(() => location.hash));
    await page.click("#play");
    checkEqual(await text(page, "play"), "Play");
    await page.click("#undo");
    await page.click("#undo");

    // Every type of input can be set.
    const patches = await page.$$eval("#input-patch option", (all) => all.map(({ value }) => value));
    let set = 0;
    for (const patch of patches) {
        await page.selectOption("#input-patch", patch);
        for (const input of await page.$$("#inputs input:not([type=range]):not([disabled])")) {
            const value = await input.inputValue();
            await input.fill(value);
            checkEqual(await text(page, "input-error"), "", `patch ${patch}: ${value}`);
            ++set;
        }
    }
    check(set > 40, "inputs of every patch");

    // Clicking a patch in the graph shows its inputs.
    const box = page.locator("#report-graph .patch").nth(3);
    await box.locator(".heading").focus();
    const name = (await box.locator(".heading text").first().textContent()).trim();
    check((await page.locator("#input-patch option:checked").textContent()).startsWith(name), "a patch of the graph is chosen by the keyboard");
}

const handTo = (page, files) => page.evaluate((list) => {
    const data = new DataTransfer();
    for (const { name, content } of list) data.items.add(new File([content], name));
    dispatchEvent(new DragEvent("drop", { dataTransfer: data, bubbles: true, cancelable: true }));
}, files);

async function checkFiles(page) {
    await show(page, "documents");
    for (const name of ["small", "node_graph"]) {
        await page.setInputFiles("#document-file", sample(name));
        await page.waitForFunction((n) => document.getElementById("document-name").textContent === n, `${name}.json`);
        checkEqual(await text(page, "document-error"), "");
    }
    check((await summary(page)).includes("3 nodes renumbered, 1 link left out"), "what was left out is said");
    // Invalid files.
    const shownNow = async () => [await page.locator("#report-graph").innerHTML(), await text(page, "document-name"), await drawnNow(page)];
    const before = await shownNow();
    for (const [name, content] of [["empty.json", ""], ["cut.json", '{"root": {"id": 1'], ["deep.json", "[".repeat(100000)], ["picture.png", "\u0089PNG\r\n"], ["type.json", '{"root": {"id": 1, "inputs": 3}}']]) {
        await handTo(page, [{ name, content }]);
        await page.waitForFunction((n) => document.getElementById("document-error").textContent.startsWith(n), name);
        const line = await text(page, "document-error");
        check(!line.includes("\n") && line.length < 320, `one line for ${name}`);
        checkEqual(await shownNow(), before, `${name} changes nothing`);
    }
    // Two dropped files are compared.
    const document = JSON.parse(readFileSync(sample("small"), "utf8"));
    const content = JSON.stringify(document);
    document.root.children[0].name = "renamed <b>";
    document.root.children.push({ id: 900, name: "added" });
    const after = path.join(folder, "playground-after.json");
    writeFileSync(after, JSON.stringify(document));
    await handTo(page, [{ name: "after.json", content: JSON.stringify(document) }, { name: "before.json", content }]);
    await page.waitForSelector("#changes");
    const wanted = spawnSync(program, [sample("small"), "--compare", after], { encoding: "utf8" }).stdout.trimEnd().split("\n");
    const listed = () => page.$$eval("#changes li", (all) => all.map((li) => li.textContent.slice(2)));
    checkEqual(await listed(), wanted, "every change is listed");
    await page.locator("#changes a").last().focus();
    await page.keyboard.press("Enter");
    checkEqual(await page.evaluate(() => document.activeElement.id), "patch-900", "a change leads to its patch");
    // Edits are compared too; with the document as it was opened, only they are.
    await page.selectOption("#compare", "opened");
    checkEqual(await page.locator("#changes").textContent().then((t) => t.includes("The documents are the same.")), true);
    await page.locator("#inputs input:not([disabled])").first().fill("0.125");
    await page.waitForFunction(() => document.querySelectorAll("#changes li").length === 1);
    check((await listed())[0].endsWith("-> 0.125"), "an edit is a change");
    await page.selectOption("#compare", "");
    checkEqual(await page.locator("#changes").count(), 0, "compared with nothing");
}

const port = (id, type, fallback, more = {}) => ({ id, name: `in ${id}`, type, default: fallback, ...more });
const openText = async (page, name, document) => {
    const content = typeof document === "string" ? document : JSON.stringify(document);
    await page.setInputFiles("#document-file", { name, mimeType: "application/json", buffer: Buffer.from(content) });
    await page.waitForFunction((n) => [document.getElementById("document-name").textContent, document.getElementById("document-error").textContent].some((text) => text.startsWith(n)), name);
};
const inputs = (page) => page.$$eval("#inputs label", (all) => all.map((label) => {
    const field = label.querySelector("input");
    return [field.value, field.disabled, label.querySelector("[type=range]") !== null];
}));

// Unusual documents.
async function checkOdd(browser) {
    const page = await openPage(browser, SIZES[0], {}, "#show=documents");
    await openText(page, "odd.json", { root: { id: 1, children: [{ id: 2, kind: "text", name: "odd", inputs: [
        port(10, "unstructured", { a: { $integer: "9007199254740993" } }), port(11, "unstructured", { b: [1.5, "c"] }),
        port(12, "string", "two\nlines"), port(13, "float", 300, { min: "-inf", max: "inf" }), port(14, "float", 3, { min: 0, max: 5 }),
        port(15, "path", [["lineTo", 1, 2]]), port(16, "float", "nan"), port(17, "vec2", [1, "inf"]), port(18, "boolean", true),
    ] }] } });
    checkEqual(await text(page, "document-error"), "");
    const odd = await inputs(page);
    checkEqual(odd.map(([, isDisabled]) => isDisabled), [true, false, true, false, false, true, false, false, false], "what a field cannot hold cannot be set");
    checkEqual(odd.map(([, , hasSlider]) => hasSlider), [false, false, false, false, true, false, false, false, false], "sliders have bounds");
    checkEqual([odd[1][0], odd[3][0], odd[7][0]], ['{"b":[1.5,"c"]}', "300", "1, Infinity"]);
    // The graph shows the new value.
    const said = () => page.locator('[data-port="14"]').getAttribute("aria-label");
    check((await said()).includes("default 3"), "the graph says the default");
    await page.locator("#inputs input").nth(4).fill("4.5");
    check((await said()).includes("default 4.5"), "and follows an edit");
    await page.click("#undo");
    check((await said()).includes("default 3"), "and its undoing");
    await page.locator("#inputs label:last-child input").fill("__proto__");
    check((await text(page, "input-error")) !== "", "no truth is called so");
    await page.locator("#inputs label:last-child input").blur();
    // Opening a document is one undo step; a file with the name of a bundled document is a different one.
    await openText(page, "small", { root: { id: 1, name: "mine" } });
    check((await summary(page)).includes("1 patch"), "a document without children");
    await page.waitForFunction(() => location.hash.includes("document=%7E") && location.hash.includes("document-name=small"));
    checkEqual(await page.inputValue("#sample"), "");
    await page.click("#undo");
    checkEqual([await text(page, "document-name"), (await inputs(page)).length], ["odd.json", 9], "the former document");

    await openText(page, "repeated.json", { identifiers: "any", root: { id: 1, children: [
        { id: 2, name: "a", inputs: [port(11, "float", 1), port(11, "float", 2)] }, { id: 2, name: "b", inputs: [port(12, "float", 3)] },
    ] } });
    checkEqual(await page.$$eval("#input-patch option", (all) => all.map((o) => o.textContent)), ["a (2)", "b (2)"]);
    checkEqual((await inputs(page)).map(([value, isDisabled]) => [value, isDisabled]), [["1", true], ["2", true]], "inputs that cannot be told apart");
    await page.focus("#input-patch");
    await page.keyboard.press("ArrowDown");
    checkEqual((await inputs(page)).map(([value]) => value), ["3"], "both patches can be reached");

    // An invalid file and a valid one: the valid one does not become the first document.
    const before = await text(page, "document-name");
    await handTo(page, [{ name: "bad.json", content: "{" }, { name: "good.json", content: readFileSync(sample("small"), "utf8") }]);
    await page.waitForFunction(() => document.getElementById("document-error").textContent.startsWith("bad.json"));
    checkEqual([await text(page, "document-name"), await page.inputValue("#compare")], [before, ""]);
    // The skip link does not close the document.
    await page.evaluate(() => document.querySelector(".skip").focus());
    await page.keyboard.press("Enter");
    checkEqual([await page.evaluate(() => document.activeElement.id), await text(page, "document-name")], ["main", before]);
    await page.close();

    // Slow evaluation is cut off.
    const slow = { root: { id: 1, children: [
        { id: 2, kind: "loop", inputs: [port(20, "int", 1000)], outputs: [{ id: 21, type: "int" }, { id: 22, type: "float" }] },
        ...Array.from({ length: 300 }, (_, i) => ({ id: 10 + i, kind: "ease", inputs: [port(1000 + 10 * i, "float", 0), port(1001 + 10 * i, "float", 1), port(1002 + 10 * i, "float", 0)], outputs: [{ id: 1005 + 10 * i, type: "float" }] })),
    ], connections: Array.from({ length: 300 }, (_, i) => ({ from: i === 0 ? [2, 22] : [9 + i, 995 + 10 * i], to: [10 + i, 1002 + 10 * i] })) } };
    const again = await openPage(browser, SIZES[0], {}, "#show=documents");
    const start = performance.now();
    await openText(again, "slow.json", slow);
    check(performance.now() - start < 15000, "a document that takes long is shown");
    await again.close();
}

// Uses controls in the way that the other checks do not: choices and buttons by keys, sliders and tabs by the
// pointer.
async function checkBothWays(browser) {
    const page = await openPage(browser, SIZES[0], {}, "#show=values");
    const choose = async (id, key) => {
        const before = await page.inputValue(`#${id}`);
        await page.focus(`#${id}`);
        await page.keyboard.press(key);
        check((await page.inputValue(`#${id}`)) !== before, `${id} by the key ${key}`);
    };
    const slide = async (id) => {
        const before = await page.inputValue(`#${id}`);
        await page.locator(`#${id}`).scrollIntoViewIfNeeded();
        const box = await page.locator(`#${id}`).boundingBox();
        await page.mouse.click(box.x + box.width * 0.8, box.y + box.height / 2);
        check((await page.inputValue(`#${id}`)) !== before, `${id} by the pointer`);
    };
    const copy = async (id) => {
        await page.evaluate(() => (document.getElementById("said").textContent = ""));
        await page.focus(`[data-copies=${id}]`);
        await page.keyboard.press("Enter");
        await page.waitForFunction(() => document.getElementById("said").textContent !== "");
        check(true, `${id} is copied by the keyboard`);
    };
    await choose("port-type", "ArrowDown");
    await copy("value-code");
    await show(page, "curves");
    await slide("curve-progress");
    await copy("curve-code");
    await show(page, "shapes");
    await choose("shape-kind", "ArrowDown");
    await choose("morph-kind", "ArrowDown");
    await slide("morph-progress");
    await page.focus("#morph-progress");
    await choose("morph-progress", "Home");
    for (const id of ["shape-svg", "shape-code"]) await copy(id);
    await show(page, "documents");
    await choose("sample", "ArrowDown");
    check((await text(page, "document-name")) === "small", "a sample by the keyboard");
    await choose("compare", "ArrowDown");
    await page.waitForSelector("#changes");
    await choose("input-patch", "ArrowDown");
    for (const id of ["document-file", "compare-file"]) {
        await page.focus(`#${id}`);
        const [chooser] = await Promise.all([page.waitForEvent("filechooser", { timeout: 5000 }), page.keyboard.press("Space")]);
        await chooser.setFiles(sample("animation"));
    }
    await page.waitForFunction(() => document.getElementById("compare").value === "file");
    await page.focus("#save");
    const [download] = await Promise.all([page.waitForEvent("download"), page.keyboard.press("Enter")]);
    checkEqual(download.suggestedFilename(), "animation.json", "saved by the keyboard");
    await page.locator("#inputs input[type=range]").first().evaluate((slider) => (slider.id = "an-input"));
    await slide("an-input");
    await page.focus("#undo");
    await page.keyboard.press("Enter");
    await page.focus("#redo");
    await page.keyboard.press("Enter");
    checkEqual(await page.getAttribute("#redo", "aria-disabled"), "true", "done again by the keyboard");
    await page.close();
}

// A link restores the settings.
async function checkLinks(browser) {
    const page = await openPage(browser, SIZES[0]);
    await page.fill("#value-content", "7.25");
    await show(page, "shapes");
    await page.selectOption("#shape-kind", "ellipse");
    await page.locator("#shape-fields input").nth(2).fill("44");
    await show(page, "documents");
    await page.setInputFiles("#document-file", sample("small"));
    await page.waitForFunction(() => document.getElementById("document-name").textContent === "small.json");
    await page.locator("#inputs input:not([disabled])").first().fill("5.5");
    await page.setInputFiles("#compare-file", sample("small"));
    await page.waitForSelector("#changes");
    await page.fill("#frame", "17");
    const changes = await page.locator("#changes").textContent();
    const drawn = await drawnNow(page);
    await page.waitForFunction(() => location.hash.includes("frame=17") && location.hash.includes("other=") && location.hash.includes("document="));
    const { hash } = new URL(page.url());
    const again = await openPage(browser, SIZES[1], {}, hash);
    checkEqual(await drawnNow(again), drawn, "the frame of a link");
    checkEqual(await again.locator("#changes").textContent(), changes, "the comparison of a link");
    checkEqual(await text(again, "document-name"), "small.json");
    checkEqual(await again.inputValue("#value-content"), "7.25");
    await show(again, "shapes");
    checkEqual([await again.inputValue("#shape-kind"), await again.locator("#shape-fields input").nth(2).inputValue()], ["ellipse", "44"]);
    await again.close();
    // The document as it was opened is in the link too.
    await page.selectOption("#compare", "opened");
    await page.waitForFunction(() => location.hash.includes("compare=opened") && location.hash.includes("opened=%7E"));
    const listed = await page.locator("#changes").textContent();
    check(listed.includes("-> 5.5"), "what was edited since");
    const third = await openPage(browser, SIZES[0], {}, new URL(page.url()).hash);
    checkEqual(await third.locator("#changes").textContent(), listed, "the comparison with the document as it was opened");
    await third.click("#undo");
    check((await third.locator("#changes").textContent()).includes("the same") || (await third.waitForFunction(() => document.getElementById("changes").textContent.includes("the same"))), "and can be gone back to");
    await third.close();
    await page.close();

    // Malformed addresses.
    for (const state of ["#document=~!!!", "#document=~AAAA", "#document=nothing", "#show=nothing&frame=-5&value-type=x&curve-progress=9&shape=a+b&shape-kind=y",
        "#frame=0.5", "#frame=1e9&input-patch=77&compare=file&port-min=x&curve-from=%00&other=~x", `#document=${"~".repeat(5000)}`]) {
        const odd = await openPage(browser, SIZES[0], {}, state);
        await show(odd, "documents");
        check((await summary(odd)).includes("40 patches"), `the sample is shown for ${state.slice(0, 20)}`);
        await odd.close();
    }
}

async function checkLarge(browser) {
    const page = await openPage(browser, SIZES[0]);
    await show(page, "documents");
    const file = path.join(folder, "playground-large.json");
    writeFileSync(file, JSON.stringify(largeDocument(2000)));
    await page.setInputFiles("#document-file", file);
    await page.waitForFunction(() => document.querySelectorAll("#report-graph .patch").length === 2000);
    await page.evaluate(() => new Promise((done) => requestAnimationFrame(() => setTimeout(done, 0))));
    // Measures from the key press to the updated picture, inside the page.
    const times = await page.evaluate(async () => {
        const field = document.querySelector("#inputs input:not([disabled])");
        const all = [];
        for (let i = 0; i < 7; ++i) {
            const start = performance.now();
            field.value = String(i);
            field.dispatchEvent(new Event("input", { bubbles: true }));
            await new Promise((done) => requestAnimationFrame(() => setTimeout(done, 0)));
            all.push(performance.now() - start);
        }
        return all.sort((a, b) => a - b);
    });
    checkEqual(await text(page, "input-error"), "");
    check(times[3] < EDIT_MILLISECONDS, `an edit of 2,000 patches is shown after ${times.map(Math.round)} ms`);
    console.log(`2,000 patches: an edit is shown after ${Math.round(times[3])} ms`);
    await page.close();
}

// The picture of README.md.
async function takePicture(browser) {
    const page = await openPage(browser, { width: 1100, height: 1340 }, {}, "#show=documents&frame=24");
    await page.click("#show-points");
    await page.evaluate(() => scrollTo(0, 0));
    await page.screenshot({ path: path.join(folder, "playground.png") });
    await page.close();
}

const browser = await launch(out, executablePath);
try {
    await takePicture(browser);
    for (const viewport of SIZES) {
        for (const colorScheme of SCHEMES) {
            const page = await openPage(browser, viewport, { colorScheme });
            for (const subject of SUBJECTS) {
                await show(page, subject);
                await checkLooks(page, `playground-${subject}`, viewport, colorScheme, FEWEST[subject]);
            }
            await page.close();
        }
        const page = await openPage(browser, viewport);
        for (const checkSubject of [checkTabs, checkValues, checkCurves, checkShapes, checkDocuments, checkFiles]) await checkSubject(page);
        // The final state.
        await checkLooks(page, "playground-used", viewport, "light", FEWEST.curves);
        await page.close();
    }
    await checkBothWays(browser);
    await checkOdd(browser);
    await checkLinks(browser);
    await checkLarge(browser);
} finally {
    await browser.close();
}
console.log(`${checks} checks of the playground passed in chromium`);
