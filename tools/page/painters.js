// Two ways to draw the same: on a canvas, and as SVG to save and to print.
const FONT = 'system-ui, "Segoe UI", "DejaVu Sans", sans-serif';

const LEAST_LETTERS = 3;

const rulerContext = document.createElement('canvas').getContext('2d');

class Ruler {
  static widths = new Map();

  static widthOf(text, {size, isBold = false}) {
    const font = `${isBold ? '600 ' : ''}${size}px ${FONT}`;
    const key = `${font}|${text}`;
    if (!Ruler.widths.has(key)) {
      if (Ruler.widths.size > 5000) Ruler.widths.clear();
      rulerContext.font = font;
      Ruler.widths.set(key, rulerContext.measureText(text).width);
    }
    return Ruler.widths.get(key);
  }

  // Shortened with an ellipsis until it fits; empty where fewer than LEAST_LETTERS would be left.
  static elide(text, width, style) {
    if (Ruler.widthOf(text, style) <= width) return text;
    const letters = [...text];
    const fits = (count) => Ruler.widthOf(`${letters.slice(0, count).join('')}\u2026`, style) <= width;
    const count = partitionPoint(letters.length, (n) => !fits(n + 1));
    return count < LEAST_LETTERS ? '' : `${letters.slice(0, count).join('')}\u2026`;
  }
}

class CanvasPainter {
  constructor(canvas, width, height) {
    const ratio = window.devicePixelRatio || 1;
    canvas.width = Math.round(width * ratio);
    canvas.height = Math.round(height * ratio);
    this.context = canvas.getContext('2d');
    this.context.setTransform(ratio, 0, 0, ratio, 0, 0);
    this.context.clearRect(0, 0, width, height);
  }

  rectangle(x, y, width, height, color) {
    this.context.fillStyle = color;
    this.context.fillRect(x, y, width, height);
  }

  // Many rectangles of one colour, [x, y, width, height, x, ...].
  rectangles(numbers, color) {
    this.context.fillStyle = color;
    this.context.beginPath();
    for (let i = 0; i < numbers.length; i += 4) {
      this.context.rect(numbers[i], numbers[i + 1], numbers[i + 2], numbers[i + 3]);
    }
    this.context.fill();
  }

  // Through [x, y, x, ...].
  polyline(numbers, color, {width = 1, isDashed = false} = {}) {
    this.context.strokeStyle = color;
    this.context.lineWidth = width;
    this.context.setLineDash(isDashed ? [3, 3] : []);
    this.context.beginPath();
    for (let i = 0; i < numbers.length; i += 2) this.context.lineTo(numbers[i], numbers[i + 1]);
    this.context.stroke();
  }

  polygon(numbers, color) {
    this.context.fillStyle = color;
    this.context.beginPath();
    for (let i = 0; i < numbers.length; i += 2) this.context.lineTo(numbers[i], numbers[i + 1]);
    this.context.fill();
  }

  text(x, y, text, {size, color, isBold = false, align = 'left'}) {
    this.context.font = `${isBold ? '600 ' : ''}${size}px ${FONT}`;
    this.context.fillStyle = color;
    this.context.textAlign = align;
    this.context.fillText(text, x, y);
  }

  // Draws what `draw` draws inside a rectangle alone.
  clipped(x, y, width, height, draw) {
    this.context.save();
    this.context.beginPath();
    this.context.rect(x, y, width, height);
    this.context.clip();
    draw();
    this.context.restore();
  }
}

const escapeXml = (text) => text.replace(/[\u0000-\u0008\u000b\u000c\u000e-\u001f]/g, '\ufffd')
    .replace(/[&<>"]/g, (c) => ({'&': '&amp;', '<': '&lt;', '>': '&gt;', '"': '&quot;'})[c]);
const round = (number) => String(Math.round(number * 100) / 100);

class SvgPainter {
  constructor(width, height, title) {
    this.clips = 0;
    this.parts = [
      `<svg xmlns="http://www.w3.org/2000/svg" width="${width}" height="${height}" viewBox="0 0 ${width} ${height}" `
      + `font-family="${escapeXml(FONT)}" role="img"><title>${escapeXml(title)}</title>`,
    ];
  }

  rectangle(x, y, width, height, color) {
    this.parts.push(`<rect x="${round(x)}" y="${round(y)}" width="${round(Math.max(0, width))}" `
      + `height="${round(height)}" fill="${color}"/>`);
  }

  rectangles(numbers, color) {
    let path = '';
    for (let i = 0; i < numbers.length; i += 4) {
      const [x, y, width, height] = [0, 1, 2, 3].map((k) => round(numbers[i + k]));
      path += `M${x} ${y}h${width}v${height}h-${width}z`;
    }
    if (path !== '') this.parts.push(`<path d="${path}" fill="${color}"/>`);
  }

  static pointsOf(numbers) { return Array.from(numbers, round).join(' '); }

  polyline(numbers, color, {width = 1, isDashed = false} = {}) {
    const dashes = isDashed ? ' stroke-dasharray="3 3"' : '';
    this.parts.push(`<polyline points="${SvgPainter.pointsOf(numbers)}" fill="none" stroke="${color}" `
      + `stroke-width="${width}"${dashes}/>`);
  }

  polygon(numbers, color) {
    this.parts.push(`<polygon points="${SvgPainter.pointsOf(numbers)}" fill="${color}"/>`);
  }

  text(x, y, text, {size, color, isBold = false, align = 'left'}) {
    const anchor = {left: 'start', center: 'middle', right: 'end'}[align];
    this.parts.push(`<text x="${round(x)}" y="${round(y)}" font-size="${size}" fill="${color}" `
      + `text-anchor="${anchor}"${isBold ? ' font-weight="600"' : ''}>${escapeXml(text)}</text>`);
  }

  clipped(x, y, width, height, draw) {
    const name = `clip${++this.clips}`;
    this.parts.push(`<clipPath id="${name}"><rect x="${round(x)}" y="${round(y)}" width="${round(width)}" `
      + `height="${round(height)}"/></clipPath><g clip-path="url(#${name})">`);
    draw();
    this.parts.push('</g>');
  }

  finish() { return `${this.parts.join('\n')}\n</svg>\n`; }
}
