import { blockName, rankBlocks, reasonFor, type ChannelLoad, type Width } from './blocks';
import { bandOf } from './channels';
import { change } from './settings';
import { Choices } from './Choices';

const WIDTHS: readonly Width[] = [20, 40, 80];
const SHOWN = 5;

/** The channels on which an access point would do best, and why. */
export function BestChannel({ loads, width, label }: { loads: readonly ChannelLoad[]; width: Width; label: string }) {
    const ranked = rankBlocks(loads, width);
    const isKnown = ranked.length > 0;
    return (
        <section class="card best" aria-labelledby="best-title">
            <div class="card-head">
                <h2 id="best-title">Best channel</h2>
                <Choices
                    label="Width of the access point"
                    choices={WIDTHS.map((value) => ({ value, label: `${value} MHz` }))}
                    chosen={width}
                    onChoose={(value) => change({ width: value })}
                />
            </div>
            <div class="card-body">
                <p class="best-reason">
                    {isKnown
                        ? reasonFor(ranked)
                        : loads.length === 0
                          ? 'The adapter has told no channels yet.'
                          : `Nothing is known yet of a channel with room for ${width} MHz.`}
                </p>
                <table class="table best-table">
                    <thead>
                        <tr>
                            <th scope="col">Channel</th>
                            <th scope="col">Band</th>
                            <th scope="col" class="number">
                                Mean
                            </th>
                            <th scope="col" class="number">
                                Worst
                            </th>
                            <th scope="col" class="number">
                                Now
                            </th>
                        </tr>
                    </thead>
                    <tbody>
                        {Array.from({ length: SHOWN }, (_, place) => {
                            const block = ranked[place];
                            const cell = (level: number | undefined) =>
                                level === undefined || Number.isNaN(level) ? '\u2013' : `${Math.round(level)} %`;
                            return (
                                <tr key={place} class={place === 0 && block ? 'is-best' : ''}>
                                    <th scope="row">{block ? blockName(block) : '\u2013'}</th>
                                    <td>{block ? bandOf(block.channels[0]) : '\u2013'}</td>
                                    <td class="number">{cell(block?.mean)}</td>
                                    <td class="number">{cell(block?.worst)}</td>
                                    <td class="number">{cell(block?.now)}</td>
                                </tr>
                            );
                        })}
                    </tbody>
                </table>
                <p class="muted note">Congestion of the channels that it covers, over {label}.</p>
            </div>
        </section>
    );
}
