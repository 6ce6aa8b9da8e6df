// The library as an ES module, which loads engine_base.wasm from beside it.

import createNative from "native";
import { setNative } from "./src/native.js";

const file = new URL("engine_base.wasm", import.meta.url);
// In Node.js the file is read; elsewhere it is fetched.
const wasmBinary = file.protocol === "file:" && typeof process === "object"
  ? (await import("node:fs")).readFileSync(file)
  : new Uint8Array(await (await fetch(file)).arrayBuffer());
setNative(await createNative({ wasmBinary }));

export * from "./src/library.js";
