/** 64-bit integers, such as identifiers: a bigint, or a number that is integral and exact. */
export type Integer = bigint | number;
/** A list of numbers. */
export type Numbers =
  | readonly number[] | Float64Array | Float32Array | Int8Array | Int16Array | Int32Array | Uint8Array | Uint8ClampedArray
  | Uint16Array | Uint32Array;
/** [x, y] or {x, y}. */
export type Point = Numbers | { readonly x: number; readonly y: number };
/** Types that convert to `Unstructured`, also typed arrays, plain objects and Maps of such. */
export type Data = undefined | null | number | bigint | boolean | string | readonly Data[] | object;
/** Types that convert to `Value`: arrays of 2, 3, 4 or 16 numbers; other plain objects become unstructured data. */
export type ValueLike = number | bigint | boolean | string | Numbers | object;
/** Types that can be eased; both ends have the same type. */
export type Eased = number | bigint | Numbers | Value;

export declare const Type: {
  readonly Float: 0; readonly Vec2: 1; readonly Vec3: 2; readonly Vec4: 3; readonly Mat4: 4; readonly Boolean: 5;
  readonly Int: 6; readonly Image: 7; readonly Video: 8; readonly Sound: 9; readonly Path: 10; readonly String: 11;
  readonly Model: 12; readonly Unstructured: 13;
};
export type Type = (typeof Type)[keyof typeof Type];
export declare function typeToString(type: Type): string;
export declare function stringToType(name: string): Type | null;
export declare function typeIsResource(type: Type): boolean;
export declare function typeShouldCopyAcrossDeletedConnections(type: Type): boolean;

export declare const UnstructuredType: {
  readonly Null: 0; readonly Map: 1; readonly Array: 2; readonly Float: 3; readonly Integer: 4;
  readonly UnsignedInteger: 5; readonly String: 6;
};
export type UnstructuredType = (typeof UnstructuredType)[keyof typeof UnstructuredType];

/** JSON-like data. Immutable. */
export declare class Unstructured {
  constructor(data?: Data);
  static identifier(id: Integer): Unstructured;
  readonly type: UnstructuredType;
  readonly size: number;
  isNull(): boolean;
  isMap(): boolean;
  isArray(): boolean;
  isNumber(): boolean;
  isIdentifier(): boolean;
  isString(): boolean;
  asFloat(): number;
  asInteger(): bigint;
  asId(): bigint;
  asBool(): boolean;
  asString(): string;
  toJS(): unknown;
  toJSON(): unknown;
  find(...path: (string | number)[]): Unstructured | null;
  numberAt(path: string | number | readonly (string | number)[], otherwise: number): number;
  integerAt(path: string | number | readonly (string | number)[], otherwise: Integer): bigint;
  boolAt(path: string | number | readonly (string | number)[], otherwise: boolean): boolean;
  stringAt(path: string | number | readonly (string | number)[], otherwise: string): string;
  toText(maxBytes?: number, maxDepth?: number): string;
  toString(): string;
  equals(other: Unstructured): boolean;
}

/** A value of one of the fourteen types. Immutable. */
export declare class Value {
  constructor(content?: ValueLike);
  static Image(id: Integer): Value;
  static Video(id: Integer): Value;
  static Sound(id: Integer): Value;
  static Model(id: Integer): Value;
  static defaultValue(type: Type, qualifier?: number): Value;
  readonly type: Type;
  readonly number: number;
  readonly integer: bigint;
  readonly boolean: boolean;
  readonly id: bigint;
  readonly vec2: Float64Array;
  readonly vec3: Float64Array;
  readonly vec4: Float64Array;
  readonly mat4: Float64Array;
  readonly string: string;
  readonly path: Path;
  asUnstructured(): Unstructured;
  asType(type: Type): Value;
  toString(): string;
  [Symbol.toPrimitive](hint: string): string | number;
  equals(other: Value): boolean;
}

export interface TypeInfo {
  readonly type?: Type;
  readonly subtype?: number;
  readonly min?: ValueLike | null;
  readonly max?: ValueLike | null;
  readonly extra?: ValueLike | null;
}
export declare function castValueToType(value: ValueLike, typeInfo: TypeInfo): Value;
export declare function portNameForTypeInfo(typeInfo: TypeInfo, plural?: boolean): string;

export declare const PathInstruction: {
  readonly moveTo: 0; readonly lineTo: 1; readonly curveTo: 2; readonly quadCurveTo: 3; readonly close: 4;
};
export type PathInstruction = (typeof PathInstruction)[keyof typeof PathInstruction];
export declare function pathInstructionToString(instruction: PathInstruction): string;
export declare function stringToPathInstruction(name: string): PathInstruction | null;
export interface PathElement {
  readonly instruction: PathInstruction;
  readonly points: readonly (readonly [number, number])[];
}
/** A vector path. Immutable. */
export declare class Path {
  constructor(elements?: Iterable<{ readonly instruction: PathInstruction; readonly points?: readonly Point[] }>);
  readonly length: number;
  readonly elements: readonly PathElement[];
  equals(other: Path): boolean;
  toString(): string;
}
export declare function svgPathData(path: Path): string;
/** Throws a SyntaxError with the position of the first invalid byte. */
export declare function pathFromSvgPathData(data: string): Path;
export declare function bounds(path: Path): { min: [number, number]; max: [number, number] } | null;
export declare function translated(path: Path, offset: Point): Path;
export declare function scaled(path: Path, factors: Point): Path;
export declare function interpolate(a: Path, b: Path, t: number): Path | null;
export declare class PathBuilder {
  /** Linear in what was drawn since the last call. */
  readonly currentPoint: readonly [number, number];
  moveTo(p: Point): this;
  lineTo(p: Point): this;
  curveTo(c1: Point, c2: Point, p: Point): this;
  quadCurveTo(c: Point, p: Point): this;
  close(): this;
  append(path: Path): this;
  arcTo(p: Point, verticalFirst: boolean): this;
  ellipse(center: Point, radii: Point): this;
  circle(center: Point, radius: number): this;
  roundRect(origin: Point, size: Point, radius: number): this;
  hexaRect(origin: Point, size: Point, cut: number): this;
  build(): Path;
}

export declare const EasingFunction: {
  readonly Linear: 0; readonly QuadraticIn: 1; readonly QuadraticOut: 2; readonly QuadraticInOut: 3;
  readonly CubicIn: 4; readonly CubicOut: 5; readonly CubicInOut: 6; readonly ExponentialIn: 7;
  readonly ExponentialOut: 8; readonly ExponentialInOut: 9; readonly SinusoidalIn: 10; readonly SinusoidalOut: 11;
  readonly SinusoidalInOut: 12;
};
export type EasingFunction = (typeof EasingFunction)[keyof typeof EasingFunction];
export declare function easingFunctionNames(): string[];
export declare function stringToEasingFunction(name: string): EasingFunction | null;
export declare function ease(easingFunction: EasingFunction, start: number, end: number, t: number): number;
export declare function ease(easingFunction: EasingFunction, start: bigint, end: bigint, t: number): bigint;
export declare function ease(easingFunction: EasingFunction, start: Numbers, end: Numbers, t: number): Float64Array;
export declare function ease(easingFunction: EasingFunction, start: Value, end: Eased, t: number): Value;
export declare function ease(easingFunction: EasingFunction, start: Eased, end: Value, t: number): Value;
/** One result per progress; vectors as their components, point after point. */
export declare function ease(
  easingFunction: EasingFunction, start: number | Numbers, end: number | Numbers, t: Numbers): Float64Array;
export declare function ease(
  easingFunction: EasingFunction, start: number | Numbers, end: number | Numbers, t: number | Numbers):
  number | Float64Array;

export interface Port {
  readonly id: bigint;
  readonly tag: bigint;
  readonly name: string;
  readonly typeInfo: Readonly<{ type: Type; subtype: number; min: Value | null; max: Value | null; extra: Value | null }>;
  readonly defaultValue: Value;
  readonly attributes: Unstructured;
}
export interface Connection {
  readonly fromPatchId: bigint;
  readonly fromPortId: bigint;
  readonly toPatchId: bigint;
  readonly toPortId: bigint;
}
export interface ModelLayer {
  readonly id: bigint;
  readonly children: readonly ModelLayer[];
  readonly additionalLayers: readonly ModelLayer[];
}
export interface NewPort {
  readonly id?: Integer;
  readonly tag?: Integer;
  readonly name?: string;
  readonly typeInfo?: TypeInfo;
  /** By default that of the type. */
  readonly defaultValue?: ValueLike;
  readonly attributes?: object;
}
export type NewConnection = { readonly [end in keyof Connection]: Integer };
export interface NewModelLayer {
  readonly id?: Integer;
  readonly children?: readonly NewModelLayer[];
  readonly additionalLayers?: readonly NewModelLayer[];
}
export interface NewPatch {
  readonly id?: Integer;
  readonly builtin?: Integer;
  readonly name?: string;
  readonly descriptor?: string;
  readonly attributes?: object;
  readonly modelLayer?: NewModelLayer;
  readonly inputs?: readonly NewPort[];
  readonly outputs?: readonly NewPort[];
  readonly connections?: readonly NewConnection[];
  readonly children?: readonly (NewPatch | Patch)[];
}

/** A graph, or a patch of one. Immutable. `free` releases the whole graph at once instead of by garbage collection. */
export declare class Patch {
  constructor(fields?: NewPatch);
  readonly id: bigint;
  readonly builtin: bigint;
  readonly name: string;
  readonly descriptor: string;
  readonly attributes: Unstructured;
  readonly modelLayer: ModelLayer;
  readonly inputs: readonly Port[];
  readonly outputs: readonly Port[];
  readonly connections: readonly Connection[];
  readonly children: readonly Patch[];
  equals(other: Patch): boolean;
  free(): void;
}
export declare function findPatchRecursive(root: Patch, id: Integer): Patch | null;
export declare function inPortForTag(patch: Patch, tag: Integer): Port | null;
export declare function outPortForTag(patch: Patch, tag: Integer): Port | null;

export declare class PatchIndex {
  constructor(root: Patch);
  readonly root: Patch;
  findPatch(id: Integer): Patch | null;
  parentOf(id: Integer): Patch | null;
  ownerOfPort(portId: Integer): Patch | null;
  findInputPort(portId: Integer): Port | null;
  findOutputPort(portId: Integer): Port | null;
  incomingConnection(portId: Integer): Connection | null;
  outgoingConnections(portId: Integer): readonly Connection[];
  incomingConnectionsToPatch(id: Integer): readonly Connection[];
  outgoingConnectionsFromPatch(id: Integer): readonly Connection[];
  update(root: Patch): void;
  free(): void;
}

/** A patch in an edit: assigning to its properties changes the edit. */
export interface PatchInEdit {
  readonly id: bigint;
  get builtin(): bigint;
  set builtin(builtin: Integer);
  name: string;
  descriptor: string;
  get attributes(): Unstructured;
  set attributes(attributes: object);
  get modelLayer(): ModelLayer;
  set modelLayer(layer: NewModelLayer);
}
export interface PortInEdit {
  readonly id: bigint;
  get tag(): bigint;
  set tag(tag: Integer);
  name: string;
  get typeInfo(): Port["typeInfo"];
  set typeInfo(typeInfo: TypeInfo);
  get defaultValue(): Value;
  set defaultValue(value: ValueLike);
  get attributes(): Unstructured;
  set attributes(attributes: object);
}
export declare class PatchEdit {
  constructor(index: PatchIndex);
  patch(id: Integer): PatchInEdit | null;
  inputPort(portId: Integer): PortInEdit | null;
  outputPort(portId: Integer): PortInEdit | null;
  addInputPort(patchId: Integer, port: NewPort, position?: number): boolean;
  addOutputPort(patchId: Integer, port: NewPort, position?: number): boolean;
  removeInputPort(portId: Integer): boolean;
  removeOutputPort(portId: Integer): boolean;
  addPatch(parentId: Integer, patch: NewPatch | Patch, position?: number): boolean;
  removePatch(id: Integer): boolean;
  movePatch(id: Integer, parentId: Integer, position?: number): boolean;
  connect(connection: NewConnection): boolean;
  disconnect(connection: NewConnection): boolean;
  freshPatchId(): bigint;
  freshPortId(): bigint;
  commit(): Patch;
  free(): void;
}

export declare const PatchChangeKind: { readonly Added: 0; readonly Removed: 1; readonly Moved: 2; readonly Changed: 3 };
export type PatchChangeKind = (typeof PatchChangeKind)[keyof typeof PatchChangeKind];
export interface PatchChange {
  readonly kind: PatchChangeKind;
  readonly id: bigint;
  readonly before: Patch | null;
  readonly after: Patch | null;
  readonly text: string;
}
export declare function patchChanges(before: Patch, after: Patch): readonly PatchChange[];

export declare class DocumentError extends SyntaxError {
  readonly pointer: string;
  readonly line: number;
  readonly column: number;
}
export declare const DocumentForm: { readonly Own: 0; readonly NodeGraph: 1 };
export type DocumentForm = (typeof DocumentForm)[keyof typeof DocumentForm];
export interface DocumentInfo {
  readonly form: DocumentForm;
  readonly framesPerSecond: number;
  readonly renumberedNodes: number;
  readonly omittedLinks: number;
  readonly unusedDefinitions: number;
  readonly notes: readonly string[];
  readonly summary: string;
}
/** Throws a DocumentError for an invalid document. */
export declare function readDocument(text: string | Uint8Array): Patch;
export declare function readDocumentWithInfo(text: string | Uint8Array): { root: Patch; info: DocumentInfo };
export declare function writeDocument(root: Patch, framesPerSecond?: number): string;
export declare function kindToString(builtin: Integer): string;
export declare function stringToKind(name: string): bigint | null;

export interface Drawn {
  readonly name: string;
  readonly path: Path;
  readonly svgPathData: string;
  /** A layer is stroked with the colour and the width; an output that is a path is filled. */
  readonly isLayer: boolean;
  readonly color: Float64Array;
  readonly width: number;
}
/** Evaluates a document and its drawing, frame by frame. */
export declare class Evaluator {
  constructor(root: Patch, framesPerSecond?: number);
  evaluate(frame: number): this;
  inputValues(portId: Integer): readonly Value[] | null;
  outputValues(portId: Integer): readonly Value[] | null;
  drawn(): Drawn[];
  free(): void;
}
