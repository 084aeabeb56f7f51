// The colours of levels: from a dark blue through grey to a light yellow. Lightness rises evenly and hue keeps to
// the one axis that most colour-blind people see, so the order reads without telling red from green.

import { TOP_LEVEL } from './quantity';

type Rgb = [number, number, number];

const DARKEST = 0.22;
const LIGHTEST = 0.95;
const BLUE = -0.11;
const YELLOW = 0.165;

function channelOf(linear: number): number {
    const value = Math.min(1, Math.max(0, linear));
    return Math.round(255 * (value <= 0.0031308 ? 12.92 * value : 1.055 * value ** (1 / 2.4) - 0.055));
}

/** A colour of the OKLab space as sRGB. */
function rgbOfLab(lightness: number, a: number, b: number): Rgb {
    const long = (lightness + 0.3963377774 * a + 0.2158037573 * b) ** 3;
    const medium = (lightness - 0.1055613458 * a - 0.0638541728 * b) ** 3;
    const short = (lightness - 0.0894841775 * a - 1.291485548 * b) ** 3;
    return [
        channelOf(4.0767416621 * long - 3.3077115913 * medium + 0.2309699292 * short),
        channelOf(-1.2684380046 * long + 2.6097574011 * medium - 0.3413193965 * short),
        channelOf(-0.0041960863 * long - 0.7034186147 * medium + 1.707614701 * short),
    ];
}

/** The colour of each level. */
export const LEVEL_COLOURS: readonly Rgb[] = Array.from({ length: TOP_LEVEL + 1 }, (_, level) => {
    const share = level / TOP_LEVEL;
    const lightness = DARKEST + (LIGHTEST - DARKEST) * share;
    const b = BLUE + (YELLOW - BLUE) * share;
    return rgbOfLab(lightness, -0.012 + 0.012 * share - 0.03 * share * share, b);
});

export function cssColour([red, green, blue]: Rgb): string {
    return `rgb(${red} ${green} ${blue})`;
}

/** The scale as a picture for a legend, from left to right. */
export function scaleGradient(): string {
    const stops = Array.from({ length: 11 }, (_, i) => cssColour(LEVEL_COLOURS[i * 10]));
    return `linear-gradient(to right, ${stops.join(', ')})`;
}
