// The full-screen view: keys, swiping, preloading. Without this script, links open the pictures.
(() => {
  "use strict";
  const viewer = document.querySelector(".viewer");
  const links = [...document.querySelectorAll(".pictures a")];
  if (!viewer || !viewer.showModal || links.length === 0) return;
  const find = (name) => viewer.querySelector(name);
  const picture = find("img"), caption = find(".caption"), details = find(".details");
  const position = find(".position"), original = find(".original");
  const previous = find(".previous"), next = find(".next");
  const pages = [...document.querySelectorAll(".pages a")];
  const here = pages.findIndex((page) => page.hasAttribute("aria-current"));
  let current = -1;

  const load = (image, link) => {
    image.sizes = "100vw";
    image.srcset = link.querySelector("img").srcset;
    image.src = link.href;
  };

  const neighbor = (step) => {
    if (current + step >= 0 && current + step < links.length) return null;
    return here < 0 ? null : pages[here + step] || null;
  };

  const show = (index) => {
    current = index;
    const link = links[index], thumbnail = link.querySelector("img");
    picture.alt = thumbnail.alt;
    load(picture, link);
    caption.textContent = link.dataset.caption || thumbnail.alt;
    details.textContent = link.dataset.details || "";
    position.textContent = `${index + 1} / ${links.length}`;
    original.hidden = !link.dataset.original;
    if (link.dataset.original) original.href = link.dataset.original;
    previous.disabled = index === 0 && !neighbor(-1);
    next.disabled = index === links.length - 1 && !neighbor(1);
    history.replaceState(null, "", "#" + link.id);
    if (!viewer.open) viewer.showModal();
    for (const step of [1, -1]) {
      if (links[index + step]) load(new Image(), links[index + step]);
    }
  };

  const move = (step) => {
    const page = neighbor(step);
    if (page) {
      location.href = page.href + (step > 0 ? "#first" : "#last");
    } else if (links[current + step]) {
      show(current + step);
    }
  };

  const leave = () => {
    if (viewer.open) viewer.close();
    history.replaceState(null, "", location.pathname + location.search);
    if (links[current]) links[current].focus();
  };

  const openHash = () => {
    const name = location.hash.slice(1);
    const index = name === "first" ? 0 : name === "last" ? links.length - 1
      : links.findIndex((link) => link.id === name);
    if (name !== "" && index >= 0) show(index);
  };

  const keys = {
    ArrowLeft: () => move(-1),
    ArrowRight: () => move(1),
    PageUp: () => move(-1),
    PageDown: () => move(1),
    " ": () => move(1),
    Home: () => show(0),
    End: () => show(links.length - 1),
    Escape: leave,
  };

  links.forEach((link, index) => {
    link.addEventListener("click", (event) => {
      if (event.ctrlKey || event.metaKey || event.shiftKey) return;
      event.preventDefault();
      show(index);
    });
  });
  viewer.addEventListener("keydown", (event) => {
    const onControl = event.key === " " && event.target.closest("button, a");
    const act = onControl || event.ctrlKey || event.altKey || event.metaKey ? null : keys[event.key];
    if (!act) return;
    event.preventDefault();
    act();
  });
  viewer.addEventListener("close", leave);
  viewer.addEventListener("click", (event) => {
    if (event.target.closest(".close")) leave();
    else if (event.target.closest(".previous")) move(-1);
    else if (event.target.closest(".next")) move(1);
  });

  let start = null;
  viewer.addEventListener("pointerdown", (event) => {
    start = event.isPrimary && event.pointerType !== "mouse" ? event : null;
  });
  viewer.addEventListener("pointerup", (event) => {
    if (!start) return;
    const across = event.clientX - start.clientX, down = event.clientY - start.clientY;
    start = null;
    if (Math.abs(across) > 40 && Math.abs(across) > 2 * Math.abs(down)) move(across < 0 ? 1 : -1);
  });
  viewer.addEventListener("pointercancel", () => { start = null; });

  openHash();
  window.addEventListener("hashchange", openHash);
})();
