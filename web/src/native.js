// The compiled part of the library, once it is there.

export let native;

/** Takes the functions over, so that none is called once one has ended for lack of memory or of stack. */
export function setNative(compiled) {
  let isEnded = false;
  const guarded = (call) => (...inputs) => {
    if (isEnded) throw new Error("the library ended for lack of memory; load the module again");
    try {
      return call(...inputs);
    } catch (error) {
      isEnded = error instanceof WebAssembly.RuntimeError || error instanceof RangeError;
      throw isEnded ? new RangeError("there is not enough memory or stack for this", { cause: error }) : error;
    }
  };
  native = {};
  for (const [name, call] of Object.entries(compiled)) {
    if (typeof call === "function") native[name] = guarded(call);
  }
}
