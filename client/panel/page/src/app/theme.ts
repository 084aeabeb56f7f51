import { Store } from './store';

export type Theme = 'auto' | 'light' | 'dark';

const KEY = 'vexa-theme';
const THEMES: readonly Theme[] = ['auto', 'light', 'dark'];

// Without a storage the choice lasts as long as the page.
function remembered(): Theme {
    try {
        const stored = localStorage.getItem(KEY) as Theme;
        return THEMES.includes(stored) ? stored : 'auto';
    } catch {
        return 'auto';
    }
}

/** What the user chose. */
export const theme = new Store<Theme>('auto');

/** Counts the changes of how the page looks, for what draws by itself: a canvas has no custom properties. */
export const look = new Store(0);

const dark = () => window.matchMedia('(prefers-color-scheme: dark)');

function apply(): void {
    document.documentElement.style.colorScheme = theme.get() === 'auto' ? 'light dark' : theme.get();
    look.update((count) => count + 1);
}

export function startTheme(): void {
    theme.set(remembered());
    theme.subscribe(apply);
    dark().addEventListener('change', apply);
    apply();
}

export function nextTheme(): void {
    theme.update((now) => THEMES[(THEMES.indexOf(now) + 1) % THEMES.length]);
    try {
        localStorage.setItem(KEY, theme.get());
    } catch {
        // It is the choice of this page alone then.
    }
}

let probe: HTMLElement | null = null;

/** A colour of the theme, such as `--accent`, as a canvas takes it. */
export function themeColour(name: string): string {
    if (!probe) {
        probe = document.createElement('span');
        probe.hidden = true;
        document.body.append(probe);
    }
    probe.style.color = `var(${name})`;
    return getComputedStyle(probe).color;
}
