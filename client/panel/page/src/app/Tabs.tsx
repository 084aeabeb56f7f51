import { useEffect, useRef, useState } from 'preact/hooks';

export interface Tab {
    /** Also the page's fragment. */
    id: string;
    label: string;
}

function tabOfFragment(tabs: readonly Tab[]): string {
    const id = location.hash.slice(1);
    return tabs.some((tab) => tab.id === id) ? id : tabs[0].id;
}

/** The tab that the page's fragment names, the first without, and what goes to another. */
export function useTab(tabs: readonly Tab[]): [string, (id: string) => void] {
    const [current, setCurrent] = useState(() => tabOfFragment(tabs));
    useEffect(() => {
        const look = () => setCurrent(tabOfFragment(tabs));
        window.addEventListener('hashchange', look);
        return () => window.removeEventListener('hashchange', look);
    }, [tabs]);
    return [current, (id) => (location.hash = id)];
}

const STEPS: Record<string, (at: number, count: number) => number> = {
    ArrowRight: (at, count) => (at + 1) % count,
    ArrowLeft: (at, count) => (at + count - 1) % count,
    Home: () => 0,
    End: (_, count) => count - 1,
};

interface Props {
    tabs: readonly Tab[];
    current: string;
    onChoose(id: string): void;
}

export function TabList({ tabs, current, onChoose }: Props) {
    const list = useRef<HTMLDivElement>(null);
    const press = (event: KeyboardEvent) => {
        const step = STEPS[event.key];
        if (!step || event.ctrlKey || event.altKey || event.metaKey) return;
        event.preventDefault();
        // A key may come before the one before it has led to another view.
        const at = tabs.findIndex((tab) => `tab-${tab.id}` === document.activeElement?.id);
        const next = tabs[step(at, tabs.length)];
        onChoose(next.id);
        list.current?.querySelector<HTMLElement>(`#tab-${next.id}`)?.focus();
    };
    return (
        <div class="tabs" role="tablist" aria-label="Views" ref={list} onKeyDown={press}>
            {tabs.map((tab) => (
                <button
                    key={tab.id}
                    id={`tab-${tab.id}`}
                    type="button"
                    role="tab"
                    class="tab"
                    aria-selected={tab.id === current}
                    aria-controls="view"
                    tabIndex={tab.id === current ? 0 : -1}
                    onClick={() => onChoose(tab.id)}
                >
                    {tab.label}
                </button>
            ))}
        </div>
    );
}
