// The programs in the guide's page print the documented output.

import assert from "node:assert/strict";
import { execFileSync } from "node:child_process";
import { readFileSync, writeFileSync } from "node:fs";
import { test } from "node:test";
import { fileURLToPath } from "node:url";

const page = readFileSync(new URL("../../docs/javascript.md", import.meta.url), "utf8");
const programs = [...page.matchAll(/```js\n(.*?)```\n\n```text\n(.*?)```/gs)];

test("the programs in the guide print the documented output", () => {
  assert.equal(programs.length, 3);
  assert.equal([...page.matchAll(/```js/g)].length, 3);
  for (const [i, [, program, printed]] of programs.entries()) {
    const file = fileURLToPath(new URL(`../../build/web/guide_${i + 1}.mjs`, import.meta.url));
    writeFileSync(file, program);
    assert.equal(execFileSync(process.execPath, [file], { encoding: "utf8" }), printed);
  }
});
