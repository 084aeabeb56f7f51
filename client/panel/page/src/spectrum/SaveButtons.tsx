import type { Source } from '../app/source';
import { download, fileName, pictureOf } from './download';
import { spectrumText, type TextFormat } from './export';
import { SCALES, type Quantity } from './quantity';
import { STEP } from './SpectrumHistory';

interface Props {
    source: Source;
    quantity: Quantity;
    /** Milliseconds that are looked at. */
    length: number;
    /** One behind the last step; null: now. */
    end: number | null;
    canvas: { current: HTMLCanvasElement | null };
}

/** Saves what is shown. */
export function SaveButtons({ source, quantity, length, end, canvas }: Props) {
    const time = () => source.epoch + (end === null ? source.now() : end * STEP);
    const save = (format: TextFormat, type: string) => {
        const text = spectrumText(source.spectrum, format, length, end ?? source.spectrum.endStep, source.epoch);
        download(fileName('spectrum', time(), format), new Blob(text, { type }));
    };
    const savePicture = async () => {
        const title = `${SCALES[quantity].name}, until ${new Date(time()).toLocaleString('en-GB')}`;
        download(fileName('spectrum', time(), 'png'), await pictureOf(canvas.current!, quantity, title));
    };
    return (
        <div class="bar" role="group" aria-label="Save what is shown">
            <span class="muted">Save</span>
            <button type="button" class="button small" onClick={() => save('csv', 'text/csv')}>
                CSV
            </button>
            <button type="button" class="button small" onClick={() => save('jsonl', 'application/jsonl')}>
                JSON lines
            </button>
            <button type="button" class="button small" onClick={() => void savePicture()}>
                PNG
            </button>
        </div>
    );
}
