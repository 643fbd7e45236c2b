// What the parts of the page share: the photos, which one is shown, and its edit.

export const state = {
  photos: [],
  current: null,
  /** An edit on the way to the next one of the photo's history, as while a slider moves. */
  live: null,
  /** What the engine has, with their parameters. */
  filters: [],
};

/** What is shown now. */
export const edit = () => state.live ?? state.current.history.edit;

/** Whether the preview has all pixels of the photo. */
export const isWhole = ({ info }) =>
  info.preview.width === info.width && info.preview.height === info.height;
