import { useEffect, useRef } from 'preact/hooks';
import { useStore } from '../app/store';
import { clockText, durationText, printable } from '../app/text';
import { closeRecording, player } from './playback';
import { SPEEDS, type Player } from './Player';
import './record.css';

const SLIDER_STEP = 1000;

/** Seeks at most once a frame, however quickly the slider is moved. */
function useSeek(playing: Player): (position: number) => void {
    const wanted = useRef<number | null>(null);
    return (position) => {
        if (wanted.current === null) {
            requestAnimationFrame(() => {
                void playing.seek(wanted.current!);
                wanted.current = null;
            });
        }
        wanted.current = position;
    };
}

function Bar({ playing }: { playing: Player }) {
    const { position, isPlaying, speed } = useStore(playing.state, (state) => state);
    const { duration, header } = playing.index;
    const seek = useSeek(playing);
    useEffect(() => () => playing.pause(), [playing]);
    const time = `${durationText(position)} of ${durationText(duration)}`;
    return (
        <section class="banner transport" aria-label="Playback">
            <p class="transport-name">
                <strong>Recording</strong> <span title={printable(playing.name)}>{printable(playing.name)}</span>
            </p>
            <button
                type="button"
                class="button transport-play"
                onClick={() => (isPlaying ? playing.pause() : playing.play())}
            >
                {isPlaying ? 'Pause' : 'Play'}
            </button>
            <input
                class="transport-slider"
                type="range"
                min={0}
                max={duration}
                step={Math.min(SLIDER_STEP, Math.max(1, duration / 100))}
                value={position}
                aria-label="Time"
                aria-valuetext={time}
                onInput={(event) => seek(Number(event.currentTarget.value))}
            />
            <span class="transport-time figures">
                {clockText(header.started + position)} <span class="muted">{time}</span>
            </span>
            <label class="bar transport-speed">
                <span class="muted transport-word">Speed</span>
                <select
                    class="select"
                    aria-label="Speed"
                    value={String(speed)}
                    onChange={(event) => playing.setSpeed(Number(event.currentTarget.value))}
                >
                    {SPEEDS.map((value) => (
                        <option key={value} value={String(value)}>
                            {value}&times;
                        </option>
                    ))}
                </select>
            </label>
            <button type="button" class="button" onClick={closeRecording}>
                Back to the service
            </button>
        </section>
    );
}

/** Says that a recording is shown, and moves within it. Nothing without one. */
export function Transport() {
    const playing = useStore(player, (value) => value);
    return playing && <Bar key={playing.name} playing={playing} />;
}
