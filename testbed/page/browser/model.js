// The document as the server tells it, and its elements by key.

export class Model {
  constructor() {
    this.serial = 0;
    this.rest = {};
    this.elements = new Map();
    this.volumesOf = new Map(); // drive's key -> volumes' keys
  }

  /// Takes a whole document. Every element may have changed.
  load(text) {
    const { serial, page, ...rest } = text;
    this.serial = serial;
    this.page = page;
    this.rest = {};
    this.elements.clear();
    for (const [name, value] of Object.entries(rest)) {
      if (this.isClass(name)) for (const element of value) this.put(element);
      else this.rest[name] = value;
    }
    this.relate();
  }

  /// Takes a change to this very version; gives the keys of what differs. Null when the change is
  /// not one to this version.
  change({ base, serial, set, elements }) {
    if (base !== this.serial) return null;
    this.serial = serial;
    Object.assign(this.rest, set);
    const touched = new Set();
    for (const { put, gone } of Object.values(elements)) {
      for (const element of put) touched.add(this.put(element));
      for (const key of gone) {
        this.elements.delete(key);
        touched.add(key);
      }
    }
    if (touched.size > 0) this.relate();
    return { touched, set };
  }

  isClass(name) {
    return Object.values(this.page.kinds).some((kind) => kind.class === name);
  }

  put(element) {
    this.elements.set(element.view.key, element);
    return element.view.key;
  }

  relate() {
    this.volumesOf.clear();
    for (const { view } of this.elements.values())
      for (const drive of view.members ?? [])
        this.volumesOf.set(drive, [...(this.volumesOf.get(drive) ?? []), view.key]);
  }

  get(key) {
    return this.elements.get(key);
  }

  ofKind(kind, controller) {
    return [...this.elements.values()].filter(
      ({ view }) => view.kind === kind && (controller === undefined || view.controller === controller));
  }

  /// What is highlighted with an element: a volume's drives, a drive's volumes.
  related(key) {
    return this.get(key)?.view.members ?? this.volumesOf.get(key) ?? [];
  }
}
