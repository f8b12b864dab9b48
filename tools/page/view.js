// The window: from one place to another, in FINE parts of a sample, so that it moves smoothly and exactly at any length.
const FINE = 1024n;
const LEAST_SPAN = 4n * FINE;

class View {
  constructor(timeline) {
    this.timeline = timeline;
    const length = greatest(timeline.sampleCount, 1n);
    this.limit = greatest(length * FINE, LEAST_SPAN);
    this.showWhole();
  }

  get span() { return this.to - this.from; }
  get firstSample() { return this.from / FINE; }
  get endSample() { return divideUp(this.to, FINE); }
  samplesPerPixel(width) { return Number(this.span) / Number(FINE) / width; }

  // Moves the window into bounds without changing its span, unless that is out of bounds itself.
  show(from, to) {
    const span = clamp(to - from, LEAST_SPAN, this.limit);
    this.from = clamp(from, 0n, this.limit - span);
    this.to = this.from + span;
  }
  showSamples(from, to) { this.show(from * FINE, to * FINE); }

  // All of a play that ends; of one that does not, what is of interest: all that changes, and some of what repeats.
  showWhole() {
    const {stretches, sampleCount, triggers} = this.timeline;
    const last = stretches.count - 1;
    if (sampleCount !== BEYOND || stretches.period[last] === BEYOND) return this.show(0n, this.limit);
    const raised = triggers.samples.length === 0 ? 0n : triggers.samples.at(-1);
    const changing = greatest(stretches.first[last], least(raised, extentProduct(stretches.first[last], 4n)));
    const repeated = extentProduct(stretches.period[last], 8n);
    return this.showSamples(0n, extentSum(changing, greatest(repeated, changing / 4n)));
  }

  // `share`: of the window's width.
  pan(share) {
    const by = BigInt(Math.round(Number(this.span) * share));
    this.show(this.from + by, this.to + by);
  }

  // What lies at that share of the width stays there.
  zoom(factor, share) {
    const span = clamp(BigInt(Math.round(Number(this.span) * factor)), LEAST_SPAN, this.limit);
    const from = this.from + BigInt(Math.round((Number(this.span) - Number(span)) * share));
    this.show(from, from + span);
  }

  centre(sample) {
    const from = sample * FINE - this.span / 2n;
    this.show(from, from + this.span);
  }

  contains(sample) { return sample * FINE >= this.from && sample * FINE < this.to; }

  // Pixels from the left edge.
  xOfFine(fine, width) { return Number(fine - this.from) * width / Number(this.span); }
  xOf(sample, width) { return this.xOfFine(sample * FINE, width); }
  // The sample that plays at a pixel.
  sampleAt(x, width) {
    const fine = this.from + BigInt(Math.floor(Number(this.span) * x / width));
    return clamp(fine / FINE, 0n, this.limit / FINE - 1n);
  }
}

// ---- The page's fragment: window, lanes, cursors and scale, so that a view can be sent and loaded again ----

const fineToText = (fine) => {
  const thousandths = fine % FINE * 1000n / FINE;
  const fraction = thousandths === 0n ? '' : `.${String(thousandths).padStart(3, '0').replace(/0+$/, '')}`;
  return `${fine / FINE}${fraction}`;
};

function fineOfText(text) {
  const match = /^(\d{1,20})(?:\.(\d{1,3}))?$/.exec(text ?? '');
  if (match === null) return null;
  return BigInt(match[1]) * FINE + divideUp(BigInt((match[2] ?? '').padEnd(3, '0')) * FINE, 1000n);
}

function writeFragment({view, lanes, allLanes, cursors, scale}) {
  const parts = [`from=${fineToText(view.from)}`, `to=${fineToText(view.to)}`];
  if (lanes.length < allLanes.length) parts.push(`lanes=${lanes.join(',')}`);
  for (const name of ['a', 'b']) {
    if (cursors[name] !== null) parts.push(`${name}=${cursors[name]}`);
  }
  if (scale !== 'full') parts.push(`scale=${scale}`);
  return `#${parts.join('&')}`;
}

// Takes what makes sense of the fragment into the state; the rest of the state becomes what it is without a fragment.
function readFragment(fragment, state) {
  const given = new URLSearchParams(fragment.replace(/^#/, ''));
  const from = fineOfText(given.get('from'));
  const to = fineOfText(given.get('to'));
  if (from !== null && to !== null && from < to) state.view.show(from, to);
  else state.view.showWhole();
  const wanted = given.get('lanes')?.split(',') ?? state.allLanes;
  const lanes = state.allLanes.filter((lane) => wanted.includes(lane));
  state.lanes = lanes.length > 0 ? lanes : state.allLanes;
  for (const name of ['a', 'b']) {
    const at = fineOfText(given.get(name));
    state.cursors[name] = at === null ? null : least(at / FINE, state.view.limit / FINE);
  }
  state.scale = given.get('scale') === 'data' ? 'data' : 'full';
}
