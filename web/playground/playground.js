// The page and its tabs.

import createNative from "native";
import wasmBinary from "playground.wasm";

import { setNative } from "../src/native.js";
import * as curves from "./curves.js";
import * as documents from "./documents.js";
import { byId, say } from "./dom.js";
import { answerOfDot } from "./layout.js";
import * as shapes from "./shapes.js";
import { keep, stateOf } from "./state.js";
import * as values from "./values.js";

const tabs = [...document.querySelectorAll("[role=tab]")];

function show(tab) {
  for (const each of tabs) {
    const isShown = each === tab;
    each.setAttribute("aria-selected", String(isShown));
    each.tabIndex = isShown ? 0 : -1;
    byId(each.getAttribute("aria-controls")).hidden = !isShown;
  }
  keep("show", tab.getAttribute("aria-controls"));
}

for (const [i, tab] of tabs.entries()) {
  tab.addEventListener("click", () => show(tab));
  tab.addEventListener("keydown", (event) => {
    const step = { ArrowLeft: -1, ArrowRight: 1 }[event.key];
    const next = event.key === "Home" ? 0 : event.key === "End" ? tabs.length - 1 : step === undefined ? undefined : (i + step + tabs.length) % tabs.length;
    if (next === undefined) return;
    event.preventDefault();
    show(tabs[next]);
    tabs[next].focus();
  });
}

for (const button of document.querySelectorAll("[data-copies]")) {
  button.addEventListener("click", async () => {
    const text = byId(button.dataset.copies);
    try {
      await navigator.clipboard.writeText(text.textContent);
      say("Copied");
    } catch {
      // Pages opened from files may not write to the clipboard: then the link is selected, to be
      // copied by hand.
      getSelection().selectAllChildren(text);
      say("Selected");
    }
  });
}

setNative(await createNative({ wasmBinary, answerOfDot }));
values.start();
curves.start();
shapes.start();
show(byId(`tab-${stateOf("show", "values")}`) ?? tabs[0]);
// Without this the link would change the address.
document.querySelector(".skip").addEventListener("click", (event) => {
  event.preventDefault();
  byId("main").focus();
});
await documents.start();
document.documentElement.dataset.state = "ready";
