// The histogram and the tone curve, drawn by the page.

function colours(canvas) {
  const style = getComputedStyle(canvas);
  return { text: style.getPropertyValue("--text"), line: style.getPropertyValue("--line"),
    soft: style.getPropertyValue("--soft"), accent: style.getPropertyValue("--accent") };
}

function area(context, bins, most, width, height) {
  context.beginPath();
  context.moveTo(0, height);
  bins.forEach((count, i) =>
    context.lineTo((i / 255) * width, height - Math.min(1, Math.sqrt(count / most)) * height));
  context.lineTo(width, height);
  context.closePath();
}

/** @param before, after  three lists of 256 counts each. */
export function drawHistogram(canvas, before, after) {
  const context = canvas.getContext("2d");
  const { width, height } = canvas;
  const dark = matchMedia("(prefers-color-scheme: dark)").matches;
  context.clearRect(0, 0, width, height);
  // Single spikes, such as pure white, are cut off.
  const counts = [...before, ...after].flatMap((bins) => [...bins.slice(1, 255)]).sort((a, b) => a - b);
  const most = Math.max(1, counts[Math.floor(counts.length * 0.995)]);
  context.globalCompositeOperation = "source-over";
  context.fillStyle = colours(canvas).line;
  const light = before[0].map((count, i) => (count + before[1][i] + before[2][i]) / 3);
  area(context, light, most, width, height);
  context.fill();
  context.globalCompositeOperation = dark ? "screen" : "multiply";
  const tones = dark ? ["#c8303cb0", "#2b9a4cb0", "#3a6cf0b0"] : ["#f0a0a0c0", "#9fdcaac0", "#a0bcf8c0"];
  after.forEach((bins, channel) => {
    context.fillStyle = tones[channel];
    area(context, bins, most, width, height);
    context.fill();
  });
}

/** @param curve  256 mean levels, NaN where there is nothing. */
export function drawCurve(canvas, curve) {
  const context = canvas.getContext("2d");
  const { width, height } = canvas;
  const { line, accent } = colours(canvas);
  context.clearRect(0, 0, width, height);
  context.strokeStyle = line;
  context.lineWidth = 2;
  context.beginPath();
  for (let i = 0; i <= 4; ++i) {
    context.moveTo((i / 4) * width, 0);
    context.lineTo((i / 4) * width, height);
    context.moveTo(0, (i / 4) * height);
    context.lineTo(width, (i / 4) * height);
  }
  context.moveTo(0, height);
  context.lineTo(width, 0);
  context.stroke();
  context.strokeStyle = accent;
  context.lineWidth = 5;
  context.lineJoin = "round";
  context.beginPath();
  let drawing = false;
  curve.forEach((level, i) => {
    if (Number.isNaN(level)) return;
    const x = (i / 255) * width;
    const y = height - (level / 255) * height;
    if (drawing) context.lineTo(x, y);
    else context.moveTo(x, y);
    drawing = true;
  });
  context.stroke();
}
