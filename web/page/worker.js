// Answers the page: one message, one call of the engine.
const opened = openWith(createVtsym, packed);

onmessage = async ({ data: { id, name, args } }) => {
    try {
        const engine = await opened;
        const member = engine[name];
        postMessage({ id, result: typeof member === 'function' ? member(...args) : member });
    } catch (failure) {
        postMessage({ id, error: { message: failure.message, offset: failure.offset } });
    }
};
