// The compiled part of the library, once it is loaded.

export let native;

let isEnded = false;
export const hasEnded = () => isEnded;

function ended(cause) {
  isEnded = true;
  return new RangeError("there is not enough memory or stack for this", { cause });
}

// Arguments were checked before. Exceptions from a function therefore mean that it stopped
// half-way, except embind's errors about deleted objects, which are thrown before the call.
function guarded(call) {
  return (...inputs) => {
    if (isEnded) throw new Error("the library ended for lack of memory or stack; load the module again");
    try {
      return call(...inputs);
    } catch (error) {
      throw error?.name === "BindingError" ? error : ended(error);
    }
  };
}

/** Wraps the functions, so that none is called after one has ended for lack of memory or stack. */
export function setNative(compiled) {
  native = {};
  for (const [name, call] of Object.entries(compiled)) {
    if (typeof call === "function") native[name] = guarded(call);
  }
}

/** Releases the object behind a handle. Does nothing after the module has ended. */
export function release(handle) {
  if (isEnded) return;
  try {
    handle.delete();
  } catch (error) {
    ended(error);
  }
}
