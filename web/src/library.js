// The exports of the module.

export {
  DocumentError, DocumentForm, Evaluator, findPatchRecursive, inPortForTag, kindToString, outPortForTag, Patch,
  patchChanges, PatchChangeKind, PatchEdit, PatchIndex, readDocument, readDocumentWithInfo, stringToKind, writeDocument,
} from "./graphs.js";
export {
  bounds, ease, EasingFunction, easingFunctionNames, interpolate, Path, PathBuilder, pathFromSvgPathData,
  PathInstruction, pathInstructionToString, scaled, stringToEasingFunction, stringToPathInstruction, svgPathData,
  translated,
} from "./paths.js";
export {
  castValueToType, portNameForTypeInfo, stringToType, Type, typeIsResource, typeShouldCopyAcrossDeletedConnections,
  typeToString, Unstructured, UnstructuredType, Value,
} from "./values.js";
