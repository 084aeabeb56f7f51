import { themeColour } from '../app/theme';
import { cssColour, LEVEL_COLOURS } from './colours';
import { figure, SCALES, TOP_LEVEL, type Quantity } from './quantity';

/** Hands the user a file. */
export function download(name: string, blob: Blob): void {
    const link = document.createElement('a');
    link.href = URL.createObjectURL(blob);
    link.download = name;
    link.click();
    setTimeout(() => URL.revokeObjectURL(link.href), 60_000);
}

/** A name with the time in it, as the recordings have one. */
export function fileName(kind: string, epoch: number, ending: string): string {
    const stamp = new Date(epoch - new Date(epoch).getTimezoneOffset() * 60_000).toISOString().slice(0, 19);
    return `vexa-${kind}-${stamp.replaceAll(':', '').replace('T', '-')}.${ending}`;
}

const HEAD = 40;
const LEGEND = 180;

/** The picture with a title and its legend, on an opaque ground. */
export async function pictureOf(canvas: HTMLCanvasElement, quantity: Quantity, title: string): Promise<Blob> {
    const scale = devicePixelRatio;
    const whole = document.createElement('canvas');
    whole.width = canvas.width;
    whole.height = canvas.height + HEAD * scale;
    const context = whole.getContext('2d')!;
    context.fillStyle = themeColour('--surface');
    context.fillRect(0, 0, whole.width, whole.height);
    context.drawImage(canvas, 0, HEAD * scale);
    context.scale(scale, scale);
    drawHead(context, whole.width / scale, quantity, title);
    return new Promise((resolve, reject) => {
        whole.toBlob((blob) => (blob ? resolve(blob) : reject(new Error('no picture could be made'))), 'image/png');
    });
}

function drawHead(context: CanvasRenderingContext2D, width: number, quantity: Quantity, title: string): void {
    const left = width - LEGEND - 60;
    for (let x = 0; x < LEGEND; x++) {
        context.fillStyle = cssColour(LEVEL_COLOURS[Math.round((x / LEGEND) * TOP_LEVEL)]);
        context.fillRect(left + x, 14, 1, 12);
    }
    context.fillStyle = themeColour('--text');
    context.font = '13px system-ui, sans-serif';
    context.textBaseline = 'middle';
    context.fillText(title, 12, 20, left - 60);
    context.textAlign = 'right';
    context.fillText(figure(quantity, 0), left - 6, 20);
    context.textAlign = 'left';
    context.fillText(`${figure(quantity, TOP_LEVEL)} ${SCALES[quantity].unit}`, left + LEGEND + 6, 20);
}
