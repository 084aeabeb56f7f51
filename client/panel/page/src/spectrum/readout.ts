import { clockText } from '../app/text';
import { frequencyOf } from './channels';
import { levelText, NONE } from './quantity';
import type { SpectrumHistory } from './SpectrumHistory';
import type { Spot } from './SpectrumPicture';
import type { WaterfallRows } from './WaterfallRows';

/** What there is at a spot, in words. */
export function readoutText(
    history: SpectrumHistory,
    rows: WaterfallRows,
    { column, age }: Spot,
    epoch: number,
): string {
    const channel = history.channels[column];
    if (!channel) return '';
    const row = rows.end - 1 - age;
    const isNow = age < 0;
    const level = (quantity: 'congestion' | 'interference') =>
        isNow ? history.current(quantity, column) : rows.level(quantity, row, column);
    const congestion = level('congestion');
    const interference = level('interference');
    const values =
        congestion === NONE && interference === NONE
            ? 'no values'
            : `congestion ${levelText('congestion', congestion)}, interference ${levelText('interference', interference)}`;
    const time = isNow ? 'now' : clockText(epoch + row * rows.rowTime);
    return `Channel ${channel.number}, ${frequencyOf(channel.number)} MHz, ${time}: ${values}`;
}
