// The behaviour of the page's sections. Each function is called when its section is in the document, and again when
// the section was replaced.

const byId = (id) => document.getElementById(id);

// Parses the points of a path, with their control points, from its `d`.
function handlesOf(d) {
    let lines = "", points = "", controls = "";
    let start = "0 0";  // Of the outline: where a close goes back to.
    let current = start;
    for (const [, letter, numbers] of d.matchAll(/([MLCQZ])([^MLCQZ]*)/g)) {
        const all = numbers.trim().split(/\s+/);
        const p = [];
        for (let i = 0; i + 1 < all.length; i += 2) p.push(all[i] + " " + all[i + 1]);
        if (letter === "Z") current = start;
        if (p.length === 0) continue;
        const end = p[p.length - 1];
        if (letter === "C") lines += `M${current}L${p[0]}M${end}L${p[1]}`;
        if (letter === "Q") lines += `M${current}L${p[0]}L${end}`;
        for (const control of p.slice(0, -1)) controls += `M${control}h0`;
        points += `M${end}h0`;
        current = end;
        if (letter === "M") start = end;
    }
    return { handle: lines, control: controls, dot: points };
}

function svgElement(name, attributes) {
    const element = document.createElementNS("http://www.w3.org/2000/svg", name);
    for (const [key, value] of Object.entries(attributes)) element.setAttribute(key, value);
    return element;
}

function showHandles(group, d) {
    const handles = handlesOf(d);
    for (const name of ["handle", "control", "dot"]) {
        const path = group.querySelector("." + name) ?? group.appendChild(svgElement("path", { class: name }));
        path.setAttribute("d", handles[name]);
    }
}

// Animation and plots

let film;
let frame = 0;
let playing = 0;
// The elements of the animation.
let drawn, slider, play, charts;
let frameChanged;

const lastFrame = () => film.frames.length - 1;

function showScene() {
    if (!drawn) return;
    const items = film.frames[frame];
    while (drawn.children.length < items.length) drawn.append(svgElement("path", {}));
    [...drawn.children].forEach((path, i) => {
        if (i >= items.length) {
            path.removeAttribute("d");
            return;
        }
        const [d, color, width] = items[i].map((text) => film.texts[text]);
        path.setAttribute("d", d);
        path.setAttribute("class", color === undefined ? "outline" : "layer");
        if (color === undefined) {
            path.removeAttribute("stroke");
        } else {
            path.setAttribute("stroke", color);
            path.setAttribute("stroke-width", width);
        }
    });
    byId("points").style.display = byId("show-points").checked ? "" : "none";
    if (byId("show-points").checked) {
        showHandles(byId("points"), items.map(([d]) => film.texts[d]).join(" "));
    }
}

const plotText = (chart, at) => film.texts[film.plots[chart.dataset.plot][at]];

function showPlot(chart, at) {
    chart.querySelector(".cursor").setAttribute("d", `M${at} -3V103`);
    const plot = chart.parentElement;
    plot.querySelector(".frame").textContent = `frame ${at}`;
    plot.querySelector(".value").textContent = plotText(chart, at);
}

function showFrame(next) {
    frame = Math.min(Math.max(Math.round(next), 0), lastFrame());
    const time = `${frame}, ${(frame / film.framesPerSecond).toFixed(2)} s`;
    slider.value = frame;
    slider.setAttribute("aria-valuetext", time);
    if (drawn) byId("time").textContent = time;
    showScene();
    for (const chart of charts) {
        chart.setAttribute("aria-valuenow", frame);
        chart.setAttribute("aria-valuetext", `frame ${frame}: ${plotText(chart, frame)}`);
        if (!chart.matches(":hover")) showPlot(chart, frame);
    }
    frameChanged(frame);
}

function setPlaying(on) {
    cancelAnimationFrame(playing);
    playing = 0;
    play.textContent = on ? "Pause" : "Play";
    if (!on) return;
    const startFrame = frame;
    const start = performance.now();
    const step = (now) => {
        const passed = Math.floor(Math.max(now - start, 0) / 1000 * film.framesPerSecond);
        const next = (startFrame + Math.min(passed, Number.MAX_SAFE_INTEGER - startFrame)) % (lastFrame() + 1);
        if (next !== frame) showFrame(next);
        playing = requestAnimationFrame(step);
    };
    playing = requestAnimationFrame(step);
}

// The number of frames that a key moves by, or nothing for other keys.
function keyStep(key) {
    const steps = { ArrowLeft: -1, ArrowDown: -1, ArrowRight: 1, ArrowUp: 1, PageDown: -10, PageUp: 10, Home: -Infinity, End: Infinity };
    return steps[key];
}

function goTo(next) {
    setPlaying(false);
    showFrame(next);
}

// Elements that already have listeners.
const bound = new WeakSet();

function isNew(element) {
    if (bound.has(element)) return false;
    bound.add(element);
    return true;
}

function bindPlayer() {
    play.addEventListener("click", () => setPlaying(!playing));
    slider.addEventListener("input", () => goTo(Number(slider.value)));
    byId("show-points")?.addEventListener("change", showScene);
    byId("animation")?.addEventListener("keydown", (event) => {
        if (event.target === slider && event.key === " ") {
            event.preventDefault();
            setPlaying(!playing);
        }
        if (event.target === play && keyStep(event.key) !== undefined) {
            event.preventDefault();
            goTo(frame + keyStep(event.key));
        }
    });
}

function bindChart(chart) {
    const frameAt = (event) => {
        const box = chart.getBoundingClientRect();
        const at = Math.round((event.clientX - box.left) / box.width * lastFrame());
        return Math.min(Math.max(at, 0), lastFrame());
    };
    chart.addEventListener("pointermove", (event) => showPlot(chart, frameAt(event)));
    chart.addEventListener("pointerleave", () => showPlot(chart, frame));
    chart.addEventListener("click", (event) => goTo(frameAt(event)));
    chart.addEventListener("keydown", (event) => {
        if (keyStep(event.key) === undefined) return;
        event.preventDefault();
        goTo(frame + keyStep(event.key));
        showPlot(chart, frame);
    });
}

// The animation for the sections Animation and Outputs, from the frame `first`; `changed` is called with every frame
// shown.
export function showFilm(next, first = 0, changed = () => {}) {
    const isPlaying = playing !== 0;
    film = next;
    frameChanged = changed;
    drawn = byId("drawn");
    // Without a drawing there is no player, but the plots still show the frame.
    slider = byId("frame") ?? document.createElement("input");
    play = byId("play") ?? document.createElement("button");
    charts = [...document.querySelectorAll(".chart")];
    if (isNew(play)) bindPlayer();
    charts.filter(isNew).forEach(bindChart);
    showFrame(first);
    setPlaying(isPlaying && play.isConnected);
}

// Graph

// The patch or port that each info element describes.
const shownIn = new WeakMap();

function showInfo(item) {
    const info = item.closest("figure").querySelector(":scope > .info");
    shownIn.set(info, item);
    info.replaceChildren(...JSON.parse(item.dataset.parts).map((line) => {
        const paragraph = document.createElement("p");
        paragraph.textContent = line;
        return paragraph;
    }));
    const graph = item.closest(".graph");
    for (const wire of graph.querySelectorAll(".lit")) wire.classList.remove("lit");
    const port = item.dataset.port;
    if (port === undefined) return;
    for (const wire of graph.querySelectorAll(`[data-from="${port}"], [data-to="${port}"]`)) wire.classList.add("lit");
}

function setOpen(heading, open) {
    heading.setAttribute("aria-expanded", String(open));
    heading.querySelector(".fold").textContent = open ? "\u2212" : "+";
    byId(heading.dataset.level).hidden = !open;
}

const isOpen = (heading) => heading.getAttribute("aria-expanded") === "true";
const headingOfLevel = (level) => document.querySelector(`[data-level="${level}"]`);

function toggle(heading) {
    setOpen(heading, !isOpen(heading));
    if (isOpen(heading)) byId(heading.dataset.level).scrollIntoView({ block: "nearest" });
}

// One tab stop for each graph; the arrow keys move inside it.
function bindGraph(graph) {
    const items = [...graph.querySelectorAll("[tabindex]")];
    for (const item of items) item.setAttribute("aria-label", JSON.parse(item.dataset.parts).join("; "));
    let current = items[0];
    showInfo(current);
    current.setAttribute("tabindex", "0");
    const go = (item) => {
        if (!item) return;
        current.setAttribute("tabindex", "-1");
        current = item;
        current.setAttribute("tabindex", "0");
        current.focus();
    };
    const place = new Map(items.map((item, i) => [item, i]));
    const headings = items.filter((item) => item.classList.contains("heading"));
    const headingOf = new Map();
    let heading = -1;
    for (const item of items) {
        if (item.classList.contains("heading")) ++heading;
        headingOf.set(item, heading);
    }
    const itemOf = (event) => event.target.closest("[tabindex]");
    let pointedAt = null;
    graph.addEventListener("pointermove", (event) => {
        const item = itemOf(event);
        // Scrolling under a resting pointer selects nothing.
        const rests = event.movementX === 0 && event.movementY === 0;
        if (item === pointedAt || rests) return;
        pointedAt = item;
        if (item && graph.contains(item)) showInfo(item);
    });
    graph.addEventListener("focusin", (event) => {
        const item = itemOf(event);
        if (!item || !graph.contains(item)) return;
        if (item !== current) go(item);
        showInfo(item);
        item.scrollIntoView({ block: "nearest", inline: "nearest" });
    });
    graph.addEventListener("click", (event) => {
        const item = itemOf(event);
        if (item && item.getAttribute("role") === "button" && graph.contains(item)) toggle(item);
    });
    graph.addEventListener("keydown", (event) => {
        const item = itemOf(event);
        if (!item || !graph.contains(item)) return;
        if ((event.key === "Enter" || event.key === " ") && item.getAttribute("role") === "button") toggle(item);
        else if (event.key === "ArrowDown") go(items[place.get(item) + 1]);
        else if (event.key === "ArrowUp") go(items[place.get(item) - 1]);
        else if (event.key === "ArrowRight") go(headings[headingOf.get(item) + 1]);
        else if (event.key === "ArrowLeft") go(headings[item.classList.contains("heading") ? headingOf.get(item) - 1 : headingOf.get(item)]);
        else if (event.key === "Home") go(items[0]);
        else if (event.key === "End") go(items[items.length - 1]);
        else return;
        event.preventDefault();
    });
}

// Updates the description of an input, if it is drawn.
export function showParts(portId, parts) {
    const isInput = (item) => JSON.parse(item.dataset.parts)[0] === parts?.[0];
    const item = [...document.querySelectorAll(`[data-port="${portId}"]`)].find(isInput);
    if (item === undefined) return;
    item.dataset.parts = JSON.stringify(parts);
    item.setAttribute("aria-label", parts.join("; "));
    if (shownIn.get(item.closest("figure").querySelector(":scope > .info")) === item) showInfo(item);
}

export const openLevels = () => [...document.querySelectorAll("[data-level]")].filter(isOpen).map((heading) => heading.dataset.level);

// The section Graph. Opens the given levels, if they exist.
export function showGraphs(open = []) {
    for (const graph of document.querySelectorAll(".graph")) bindGraph(graph);
    for (const close of document.querySelectorAll(".close")) {
        close.addEventListener("click", () => {
            const heading = headingOfLevel(close.closest("figure").id);
            setOpen(heading, false);
            heading.focus();
        });
    }
    for (const button of document.querySelectorAll(".zoom")) {
        button.addEventListener("click", () => {
            const graph = button.closest("figure").querySelector(".graph");
            const view = graph.viewBox.baseVal;
            const scale = graph.width.baseVal.value / view.width * Number(button.dataset.factor);
            graph.setAttribute("width", view.width * Math.min(Math.max(scale, 0.1), 3));
            graph.setAttribute("height", view.height * Math.min(Math.max(scale, 0.1), 3));
        });
    }
    for (const heading of open.map(headingOfLevel)) {
        if (heading) setOpen(heading, true);
    }
}

// Changes: each links to its patch or its level, and opens the groups around it.

export function showChanges() {
    for (const link of document.querySelectorAll("#changes a")) {
        link.addEventListener("click", (event) => {
            event.preventDefault();
            const item = byId(link.hash.slice(1));
            for (let level = item.closest(".level"); level; level = level.parentElement.closest(".level")) {
                if (level.hidden) setOpen(headingOfLevel(level.id), true);
            }
            item.focus();
        });
    }
}

// Shapes

export function showShapes() {
    for (const picture of document.querySelectorAll("svg.points")) {
        const group = picture.appendChild(svgElement("g", { "aria-hidden": "true" }));
        showHandles(group, picture.querySelector(".outline").getAttribute("d"));
    }
}
