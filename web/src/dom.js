// Shorthands for elements.

export const $ = (id) => document.getElementById(id);

export function element(name, properties = {}, ...children) {
  const made = Object.assign(document.createElement(name), properties);
  made.append(...children);
  return made;
}

export function paint(canvas, picture) {
  Object.assign(canvas, { width: picture.width, height: picture.height });
  canvas.getContext("2d").putImageData(picture, 0, 0);
}
