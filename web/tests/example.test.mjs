// The example, compiled from TypeScript.

import assert from "node:assert/strict";
import { readFileSync } from "node:fs";
import { test } from "node:test";

import { framesText } from "../../build/web/examples/frames.mjs";

test("the example prints what an edit changes", () => {
  const text = readFileSync(new URL("../../examples/documents/animation.json", import.meta.url), "utf8");
  assert.deepEqual(framesText(text, 2), [
    "frame 0: outline M -100 -40 C, badge M -100 -40 C -", "frame 1: outline M -86.738 -3, badge M -86.738 -39 ",
    'changed patch 2 "motion": input 201 "speed" default 1.0 -> 4.0',
    "frame 0: outline M -100 -40 C, badge M -100 -40 C -", "frame 1: outline M -55.3948 -, badge M -55.3948 -39",
  ]);
});
