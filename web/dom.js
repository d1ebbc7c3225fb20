// What the page's parts share. Texts are texts: nothing of a file is ever markup.

export const $ = (id) => document.getElementById(id);

export function element(tag, attributes = {}, ...children) {
  const e = document.createElement(tag);
  for (const [name, value] of Object.entries(attributes)) e.setAttribute(name, value);
  e.append(...children);
  return e;
}
