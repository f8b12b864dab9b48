// Samples are BigInt, since they may lie beyond 2^53; what is beyond 64 bits is BEYOND, to which nobody can add.
const BEYOND = 2n ** 64n - 1n;
const THIN_SPACE = '\u2009';

const extentSum = (a, b) => (a + b > BEYOND ? BEYOND : a + b);
const extentProduct = (a, b) => (a * b > BEYOND ? BEYOND : a * b);
const least = (a, b) => (a < b ? a : b);
const greatest = (a, b) => (a > b ? a : b);
const clamp = (value, low, high) => least(greatest(value, low), high);
const divideUp = (a, b) => (a + b - 1n) / b;
const divideRounded = (a, b) => (2n * a + b) / (2n * b);  // of no negative numbers
const powerOfTen = (exponent) => 10n ** BigInt(exponent);

// The first index from 0 to count for which `holds` is true, as it then is for all behind it.
function partitionPoint(count, holds) {
  let low = 0;
  let high = count;
  while (low < high) {
    const middle = (low + high) >>> 1;
    if (holds(middle)) high = middle;
    else low = middle + 1;
  }
  return low;
}

// The least power of two that is greater than half of `value`; 1 below 2.
function powerOfTwoUpTo(value) {
  return value < 2n ? 1n : 1n << BigInt(value.toString(2).length - 1);
}

function groupDigits(digits) {
  return digits.replace(/\B(?=(\d{3})+$)/g, THIN_SPACE);
}

const formatCount = (count) => groupDigits(count.toString());
const plural = (count, noun) => `${formatCount(count)} ${noun}${BigInt(count) === 1n ? '' : 's'}`;

// `numerator` / `denominator` with that many decimals, without zeros at their end.
function formatFraction(numerator, denominator, decimals) {
  const scaled = divideRounded(numerator * powerOfTen(decimals), denominator);
  const digits = scaled.toString().padStart(decimals + 1, '0');
  const whole = groupDigits(digits.slice(0, digits.length - decimals));
  const fraction = digits.slice(digits.length - decimals).replace(/0+$/, '');
  return fraction === '' ? whole : `${whole}.${fraction.replace(/(\d{3})(?=\d)/g, `$1${THIN_SPACE}`)}`;
}

const PREFIXES = [
  ['f', -15], ['p', -12], ['n', -9], ['u', -6], ['\u00b5', -6], ['\u03bc', -6], ['m', -3],
  ['k', 3], ['M', 6], ['G', 9], ['T', 12],
];
const TIME_UNITS = [['s', 0], ['ms', 3], ['\u00b5s', 6], ['ns', 9], ['ps', 12], ['fs', 15]];  // and decimals that they take

// Times as fractions: sample n is n * denominator / numerator seconds from the start.
class SampleClock {
  // The rate is mantissa * 2^exponent samples a second, which every double is.
  constructor({mantissa, exponent}) {
    this.numerator = BigInt(mantissa) << BigInt(Math.max(exponent, 0));
    this.denominator = 1n << BigInt(Math.max(-exponent, 0));
    this.rate = Number(mantissa) * 2 ** exponent;
    this.decimals = Math.max(0, Math.ceil(Math.log10(this.rate)) + 1);  // of seconds, that tell samples apart
  }

  // Of `fine` parts of a sample.
  seconds(sample, fine = 1n) {
    return {numerator: sample * this.denominator, denominator: this.numerator * fine};
  }

  unitOf({numerator, denominator}) {
    const fits = ([, exponent]) => numerator * powerOfTen(exponent) >= denominator;
    return numerator === 0n ? TIME_UNITS[0] : TIME_UNITS.find(fits) ?? TIME_UNITS.at(-1);
  }

  format(sample) {
    const {numerator, denominator} = this.seconds(sample);
    const [unit, exponent] = this.unitOf({numerator, denominator});
    const decimals = Math.max(0, this.decimals - exponent);
    return `${formatFraction(numerator * powerOfTen(exponent), denominator, decimals)} ${unit}`;
  }

  // The nearest sample.
  sampleAt({numerator, denominator}) {
    return divideRounded(numerator * this.numerator, denominator * this.denominator);
  }
}

// With four digits and a prefix: 1234.5, "Hz" is "1.235 kHz".
function formatQuantity(value, unit) {
  if (value === 0 || !Number.isFinite(value)) return `${value} ${unit}`;
  const rounded = Number(value.toPrecision(4));
  const power = Math.min(12, Math.max(-15, 3 * Math.floor(Math.log10(Math.abs(rounded)) / 3)));
  const prefix = PREFIXES.find(([letter, exponent]) => exponent === power && letter !== 'u')?.[0] ?? '';
  return `${Number((rounded / 10 ** power).toPrecision(4))} ${prefix}${unit}`;
}

const QUANTITY = /^(\d*)(?:\.(\d*))?(?:e([+-]?\d{1,3}))?(f|p|n|u|\u00b5|\u03bc|m|k|M|G|T)?(s)?$/;

// A number of samples, "1000" or "1M", or a time, "20ms", as a sample; null for any other text.
function parseSample(text, clock) {
  const match = QUANTITY.exec(text.replace(/[\s\u2009\u202f_]/g, ''));
  if (match === null || (match[1] === '' && !match[2])) return null;
  const [, whole, fraction = '', exponent = '0', prefix, second] = match;
  const power = Number(exponent) + (PREFIXES.find(([letter]) => letter === prefix)?.[1] ?? 0) - fraction.length;
  const value = {
    numerator: BigInt(whole + fraction) * powerOfTen(Math.max(power, 0)),
    denominator: powerOfTen(Math.max(-power, 0)),
  };
  if (second) return clock.sampleAt(value);
  return value.numerator % value.denominator === 0n ? value.numerator / value.denominator : null;
}

// A sample, a time or a range of either, "10ms..20ms": {from} or {from, to}; null for any other text.
function parsePlace(text, clock) {
  const parts = text.trim().split(/\s*(?:\.\.+|\u2026|\u2013|\bto\b|(?<!e)-)\s*/);
  const samples = parts.map((part) => parseSample(part, clock));
  if (parts.length > 2 || samples.includes(null)) return null;
  return parts.length === 1 ? {from: samples[0]} : {from: samples[0], to: samples[1]};
}
