// Prints the size of the module in a folder, uncompressed and compressed as web servers do. Exits
// with 1 where it exceeds the limit.
//
//     node web/sizes.mjs build/web

import { readFileSync } from "node:fs";
import { argv, exit } from "node:process";
import { brotliCompressSync } from "node:zlib";

const promised = { "engine_base.wasm": [350e3, 130e3], "engine_base.mjs": [70e3, 25e3] };

let isLarger = false;
for (const [name, [most, mostCompressed]] of Object.entries(promised)) {
  const bytes = readFileSync(`${argv[2]}/${name}`);
  const compressed = brotliCompressSync(bytes).length;
  console.log(`${name}: ${bytes.length} bytes (at most ${most}), ${compressed} compressed (at most ${mostCompressed})`);
  isLarger ||= bytes.length > most || compressed > mostCompressed;
}
exit(isLarger ? 1 : 0);
