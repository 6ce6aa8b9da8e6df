// The compiled part of the library, once it is there.

export let native;

let isEnded = false;
export const hasEnded = () => isEnded;

function ended(cause) {
  isEnded = true;
  return new RangeError("there is not enough memory or stack for this", { cause });
}

// Arguments were looked at before. What comes out of a function all the same has stopped it half-way, but for what embind
// says of objects that were deleted before it calls anything.
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

/** Takes the functions over, so that none is called once one has ended for lack of memory or of stack. */
export function setNative(compiled) {
  native = {};
  for (const [name, call] of Object.entries(compiled)) {
    if (typeof call === "function") native[name] = guarded(call);
  }
}

/** Lets go of what a handle stands for. After the end there is nothing to let go of. */
export function release(handle) {
  if (isEnded) return;
  try {
    handle.delete();
  } catch (error) {
    ended(error);
  }
}
