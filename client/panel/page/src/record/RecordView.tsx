import { useCanCommand, useService, useServiceState } from '../app/service';
import { useStore } from '../app/store';
import { bytesText, counted, durationText, printable } from '../app/text';
import { openFile, openRecording, player, reading } from './playback';
import './record.css';

function Recorder() {
    const service = useService();
    const canCommand = useCanCommand();
    const isLinked = useServiceState((state) => state.link === 'open');
    const recording = useServiceState((state) => state.recording);
    const isActive = recording?.active === true;
    const turn = () => service.askPanel(isActive ? 'stopRecording' : 'startRecording');
    return (
        <section class="card" aria-labelledby="recorder-title">
            <div class="card-head">
                <h2 id="recorder-title">Record</h2>
                <button
                    type="button"
                    class={`button record-button ${isActive ? 'danger' : 'primary'}`}
                    disabled={isActive ? !isLinked : !canCommand}
                    onClick={turn}
                >
                    {isActive ? 'Stop recording' : 'Start recording'}
                </button>
            </div>
            <div class="card-body">
                <dl class="facts">
                    <div>
                        <dt>File</dt>
                        <dd>{recording?.name ? printable(recording.name) : 'none'}</dd>
                    </div>
                    <div>
                        <dt>Time</dt>
                        <dd class="figures">{durationText(recording?.elapsed ?? 0)}</dd>
                    </div>
                    <div>
                        <dt>Events</dt>
                        <dd class="figures">{(recording?.events ?? 0).toLocaleString('en')}</dd>
                    </div>
                </dl>
                <p class="muted">
                    All that the service tells is written down, without passwords. It tells of the spectrum while a scan
                    runs.
                </p>
            </div>
        </section>
    );
}

function ReadingBar() {
    const read = useStore(reading, (value) => value);
    return (
        <div class="reading" role="status">
            {read && (
                <>
                    <label class="reading-label">
                        <span>Reading {printable(read.name)}</span>
                        <progress max={1} value={read.share ?? undefined} />
                    </label>
                    <button type="button" class="button small" onClick={() => read.cancel()}>
                        Cancel
                    </button>
                </>
            )}
        </div>
    );
}

function OpenButton() {
    return (
        <label class="button file-button">
            Open a file
            <input
                type="file"
                class="unseen"
                accept=".jsonl,.gz,.rec,application/gzip"
                onChange={(event) => {
                    const file = event.currentTarget.files?.[0];
                    if (file) openFile(file);
                    event.currentTarget.value = '';
                }}
            />
        </label>
    );
}

function RecordingList() {
    const files = useServiceState((state) => state.recordings);
    const newestFirst = [...files].sort((a, b) => (a.name < b.name ? 1 : -1));
    return (
        <section class="card" aria-labelledby="recordings-title">
            <div class="card-head">
                <h2 id="recordings-title">Recordings</h2>
                <ReadingBar />
                <OpenButton />
            </div>
            <div class="scroll">
                <table class="table">
                    <thead>
                        <tr>
                            <th scope="col">File</th>
                            <th scope="col" class="number">
                                Size
                            </th>
                            <th scope="col">
                                <span class="unseen">What to do</span>
                            </th>
                        </tr>
                    </thead>
                    <tbody>
                        {newestFirst.map(({ name, bytes }) => (
                            <tr key={name}>
                                <td class="recording-name">{printable(name)}</td>
                                <td class="number">{bytesText(bytes)}</td>
                                <td>
                                    <div class="bar row-actions">
                                        <button
                                            type="button"
                                            class="button small"
                                            aria-label={`Play ${printable(name)}`}
                                            onClick={() => openRecording(name)}
                                        >
                                            Play
                                        </button>
                                        <a
                                            class="button small"
                                            href={`/recordings/${encodeURIComponent(name)}`}
                                            download={name}
                                            aria-label={`Download ${printable(name)}`}
                                        >
                                            Download
                                        </a>
                                    </div>
                                </td>
                            </tr>
                        ))}
                    </tbody>
                </table>
                {files.length === 0 && (
                    <p class="empty">No recordings yet. One that was made elsewhere can be opened as a file.</p>
                )}
            </div>
        </section>
    );
}

function Opened() {
    const opened = useStore(player, (value) => value);
    if (!opened) return null;
    const { header, duration, sampleCount, eventCount, isWhole } = opened.index;
    const facts: [string, string][] = [
        ['File', printable(opened.name)],
        ['Begun', new Date(header.started).toLocaleString('en-GB')],
        ['Time', durationText(duration)],
        ['Values', sampleCount.toLocaleString('en')],
        ['Other events', eventCount.toLocaleString('en')],
        ['Made by', `vexa ${printable(header.version)}`],
    ];
    return (
        <section class="card" aria-labelledby="opened-title">
            <div class="card-head">
                <h2 id="opened-title">What is played</h2>
            </div>
            <div class="card-body">
                <dl class="facts">
                    {facts.map(([name, value]) => (
                        <div key={name}>
                            <dt>{name}</dt>
                            <dd class="figures">{value}</dd>
                        </div>
                    ))}
                </dl>
                <p class="muted">
                    {isWhole
                        ? 'The other tabs show it as they show the service. Nothing can be changed in it.'
                        : `It was cut off after ${counted(Math.round(duration / 1000), 'second')}: its recorder did not end it.`}
                </p>
            </div>
        </section>
    );
}

/** Recordings: made, listed, and played back. */
export function RecordView() {
    return (
        <div class="record">
            <Recorder />
            <Opened />
            <RecordingList />
        </div>
    );
}
