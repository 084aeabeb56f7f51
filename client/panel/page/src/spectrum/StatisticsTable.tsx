import type { Channel } from '../app/state';
import { frequencyOf } from './channels';
import type { Figures } from './figures';
import { figure, NONE, SCALES, type Quantity } from './quantity';

interface Props {
    channels: readonly Channel[];
    figures: Figures;
    quantity: Quantity;
    drawn: readonly number[];
    currentChannel: number | null;
    label: string;
    onToggle(channel: number): void;
}

interface RowProps {
    number: number;
    /** Its place among the channels. */
    column: number;
    figures: Figures;
    quantity: Quantity;
    /** Its place among the curves, -1 for none. */
    place: number;
    isConnected: boolean;
    onToggle(channel: number): void;
}

function Row({ number, column, figures, quantity, place, isConnected, onToggle }: RowProps) {
    const { mean, greatest, least } = figures.window[quantity][column] ?? { mean: NaN, greatest: NONE, least: NONE };
    return (
        <tr>
            <td>
                <label class="curve">
                    <input type="checkbox" checked={place >= 0} onChange={() => onToggle(number)} />
                    <span class={`swatch series-${place + 1}`} />
                    <span class="unseen">Draw channel {number}</span>
                </label>
            </td>
            <th scope="row" class="number">
                {isConnected && (
                    <span class="connected" title="The adapter is connected here">
                        <span class="unseen">connected, </span>
                    </span>
                )}
                {number}
            </th>
            <td class="number muted mhz">{frequencyOf(number)}</td>
            <td class="number">{figure(quantity, figures.now[quantity][column] ?? NONE)}</td>
            <td class="number">{figure(quantity, mean, 1)}</td>
            <td class="number">{figure(quantity, greatest)}</td>
            <td class="number">{figure(quantity, least)}</td>
        </tr>
    );
}

/** Mean, greatest and least of each channel over the window, and what it is now. */
export function StatisticsTable({ channels, figures, quantity, drawn, currentChannel, label, onToggle }: Props) {
    const { name, unit } = SCALES[quantity];
    return (
        <section class="card statistics" aria-labelledby="statistics-title">
            <div class="card-head">
                <h2 id="statistics-title">
                    {name}, {unit}
                </h2>
                <span class="muted">over {label}</span>
            </div>
            <div class="scroll" tabIndex={0} role="region" aria-label="Table of the channels">
                <table class="table">
                    <thead>
                        <tr>
                            <th scope="col">Curve</th>
                            <th scope="col" class="number">
                                Channel
                            </th>
                            <th scope="col" class="number mhz">
                                MHz
                            </th>
                            {['Now', 'Mean', 'Max', 'Min'].map((heading) => (
                                <th key={heading} scope="col" class="number">
                                    {heading}
                                </th>
                            ))}
                        </tr>
                    </thead>
                    <tbody>
                        {channels.map(({ number }, column) => (
                            <Row
                                key={number}
                                number={number}
                                column={column}
                                figures={figures}
                                quantity={quantity}
                                place={drawn.indexOf(number)}
                                isConnected={number === currentChannel}
                                onToggle={onToggle}
                            />
                        ))}
                    </tbody>
                </table>
                {channels.length === 0 && <p class="empty">No channels are known yet.</p>}
            </div>
        </section>
    );
}
