// Values as people read them.

const HIDDEN =
    /[\u0000-\u001f\u007f-\u009f\u00ad\u034f\u0600-\u0605\u061c\u06dd\u070f\u0890\u0891\u08e2\u115f\u1160\u17b4\u17b5\u180e\u200b-\u200f\u2028-\u202e\u2060-\u206f\u3164\ufeff\uffa0\ufff0-\ufffb\u{110bd}\u{110cd}\u{13430}-\u{1343f}\u{1bca0}-\u{1bca3}\u{1d173}-\u{1d17a}\u{e0000}-\u{e0fff}]/gu;

function escaped(character: string): string {
    const code = character.codePointAt(0)!;
    const [sign, digits] = code < 0x100 ? ['x', 2] : code < 0x10000 ? ['u', 4] : ['U', 8];
    return `\\${sign}${code
        .toString(16)
        .toUpperCase()
        .padStart(digits as number, '0')}`;
}

/** A text from the air or from a file, with an escape for what would not be seen or would change what is around it. */
export function printable(text: string): string {
    return text.replace(HIDDEN, escaped);
}

/** `1:02:03`, or `02:03` below an hour. */
export function durationText(milliseconds: number): string {
    const seconds = Math.max(0, Math.floor(milliseconds / 1000));
    const two = (value: number) => String(value).padStart(2, '0');
    const short = `${two(Math.floor(seconds / 60) % 60)}:${two(seconds % 60)}`;
    return seconds >= 3600 ? `${Math.floor(seconds / 3600)}:${short}` : short;
}

/** The time of day, `14:02:11`. */
export function clockText(epoch: number): string {
    const date = new Date(epoch);
    const two = (value: number) => String(value).padStart(2, '0');
    return `${two(date.getHours())}:${two(date.getMinutes())}:${two(date.getSeconds())}`;
}

export function bytesText(bytes: number): string {
    const units = ['B', 'kB', 'MB', 'GB'];
    let value = bytes;
    let unit = 0;
    while (value >= 1000 && unit < units.length - 1) {
        value /= 1000;
        unit++;
    }
    return `${unit === 0 || value >= 100 ? Math.round(value) : value.toFixed(1)} ${units[unit]}`;
}

export function counted(count: number, noun: string): string {
    return `${count.toLocaleString('en')} ${noun}${count === 1 ? '' : 's'}`;
}
