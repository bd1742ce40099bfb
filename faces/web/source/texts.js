// The page's texts in the user's language: the build takes them from the language file. A text's key is its English.
import texts from 'page:texts';

export const languages = texts.map(({code, name}) => ({code, name}));

let current = texts[0];

// The first of the browser's languages that the page has.
export function preferredLanguage() {
    const codes = navigator.languages.map((language) => language.slice(0, 2).toLowerCase());
    return codes.find((code) => texts.some((language) => language.code === code)) ?? 'en';
}

export function setLanguage(code) {
    current = texts.find((language) => language.code === code) ?? texts[0];
    document.documentElement.lang = current.code;
    showTexts(document);
}

export const language = () => current.code;

export const text = (key) => current.texts[key] ?? key;

// Elements name their texts: data-text for what is inside, data-label for the label and the hint.
export function showTexts(root) {
    for (const element of root.querySelectorAll('[data-text]')) element.textContent = text(element.dataset.text);
    for (const element of root.querySelectorAll('[data-label]')) {
        const label = text(element.dataset.label);
        element.setAttribute('aria-label', label);
        if (element.matches('button, label')) {
            element.title = element.dataset.keys ? `${label} (${element.dataset.keys})` : label;
        }
    }
}
