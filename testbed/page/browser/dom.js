// Elements without markup: every text becomes a text node, whatever is in it.

export function make(tag, attributes = {}, ...children) {
  const node = document.createElement(tag);
  for (const [name, value] of Object.entries(attributes)) setAttribute(node, name, value);
  node.append(...children.filter((child) => child !== null && child !== undefined));
  return node;
}

export function setAttribute(node, name, value) {
  if (value === null || value === undefined || value === false) node.removeAttribute(name);
  else if (node.getAttribute(name) !== String(value)) node.setAttribute(name, value);
}

export function setText(node, text) {
  if (node.textContent !== text) node.textContent = text;
}

export const byId = (id) => document.getElementById(id);

/// Gives a parent these children, leaving alone what is in its place already.
export function setChildren(parent, children) {
  children.forEach((child, i) => {
    if (parent.children[i] !== child) parent.insertBefore(child, parent.children[i] ?? null);
  });
  while (parent.children.length > children.length) parent.lastElementChild.remove();
}
