// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

// Draws a chart in each figure of the report, from the figure's table. Texts of the table reach the
// page through the charts' canvases only.
"use strict";
(() => {
  const root = document.documentElement;
  const colour = (name) => getComputedStyle(root).getPropertyValue("--" + name).trim();

  const shorten = (text, keepEnd) => {
    const characters = Array.from(text);
    if (characters.length <= 24) return text;
    return keepEnd ? "…" + characters.slice(-23).join("") : characters.slice(0, 23).join("") + "…";
  };

  const sizeText = (bytes) => {
    const units = ["B", "kB", "MB", "GB", "TB", "PB", "EB"];
    let unit = 0;
    while (bytes >= 999.5 && unit + 1 < units.length) {
      bytes /= 1000;
      ++unit;
    }
    return (unit > 0 && bytes < 9.95 ? bytes.toFixed(1) : bytes.toFixed(0)) + " " + units[unit];
  };
  const numberText = (unit) => (unit === "bytes" ? sizeText : (number) => number.toLocaleString("en"));

  // The first column are labels; columns with a colour are drawn, unless they are all zeros.
  const readTable = (table) => {
    const rows = Array.from(table.tBodies[0].rows);
    const labels = rows.map((row) => row.cells[0].textContent);
    const series = Array.from(table.tHead.rows[0].cells)
      .map((cell, at) => ({ name: cell.textContent, colour: cell.dataset.colour, at }))
      .filter((one) => one.colour)
      .map((one) => ({
        ...one,
        values: rows.map((row) => Number(row.cells[one.at].dataset.value)),
      }))
      .filter((one) => one.values.some((value) => value !== 0));
    return { labels, series, keepEnd: rows.length > 0 && rows[0].cells[0].className === "path" };
  };

  // The year, month or day after "2024", "2024-05" or "2024-05-01"; null after anything else.
  const next = (label) => {
    const parts = /^(\d{4})(?:-(\d\d))?(?:-(\d\d))?$/.exec(label);
    if (!parts) return null;
    const [year, month, day] = parts.slice(1).map((part) => part && Number(part));
    if (!month) return String(year + 1).padStart(4, "0");
    const date = day ? new Date(Date.UTC(year, month - 1, day + 1)) : new Date(Date.UTC(year, month));
    return date.toISOString().slice(0, label.length);
  };

  // Periods without a row get one of zeros.
  const fillGaps = ({ labels, series, ...rest }) => {
    const filled = { labels: [], series: series.map((one) => ({ ...one, values: [] })), ...rest };
    const add = (label, values) => {
      filled.labels.push(label);
      filled.series.forEach((one, at) => one.values.push(values ? values[at] : 0));
    };
    labels.forEach((label, row) => {
      const known = filled.labels.length > 0 ? next(filled.labels.at(-1)) : null;
      if (known && next(label)) {
        for (let gap = known; gap < label; gap = next(gap)) add(gap, null);
      }
      add(label, series.map((one) => one.values[row]));
    });
    return filled;
  };

  const sumUp = ({ series, ...rest }) => ({
    ...rest,
    series: series.map((one) => {
      let sum = 0;
      return { ...one, values: one.values.map((value) => (sum += value)) };
    }),
  });

  const axis = (more) => ({
    stacked: true,
    border: { display: false },
    grid: { color: colour("grid"), drawBorder: false },
    ...more,
  });

  const commonOptions = (data, unit) => ({
    animation: false,
    maintainAspectRatio: false,
    interaction: { mode: "index", intersect: false },
    plugins: {
      legend: {
        display: data.series.length > 1,
        position: "bottom",
        labels: { boxWidth: 12, boxHeight: 12 },
      },
      tooltip: {
        callbacks: {
          label: (item) => " " + item.dataset.label + ": " + numberText(unit)(item.raw),
        },
      },
    },
  });

  const periods = () =>
    axis({
      grid: { display: false, drawBorder: false },
      ticks: { maxRotation: 0, autoSkipPadding: 16 },
    });

  const numbers = (unit) => ({
    beginAtZero: true,
    ticks: { callback: numberText(unit), precision: 0, maxTicksLimit: 6 },
  });

  const dataset = (one) => ({
    label: one.name,
    data: one.values,
    backgroundColor: colour(one.colour),
  });

  const shapes = {
    ring: (data, unit) => {
      const kinds = ["music", "videos", "photos", "playlists"].map(colour);
      const values = data.series[0].values;
      const options = commonOptions(data, unit);
      options.plugins.legend = { ...options.plugins.legend, display: true, position: "right" };
      options.plugins.tooltip.callbacks = { label: (item) => " " + item.label };
      options.interaction = { mode: "nearest", intersect: true };
      options.cutout = "62%";
      return {
        type: "doughnut",
        data: {
          labels: data.labels.map((label, row) => label + "  " + numberText(unit)(values[row])),
          datasets: [
            {
              data: values,
              backgroundColor: kinds,
              borderColor: colour("card"),
            },
          ],
        },
        options,
      };
    },

    bars: (data, unit) => ({
      type: "bar",
      data: {
        labels: data.labels.map((label) => shorten(label, data.keepEnd)),
        datasets: data.series.map((one) => ({ ...dataset(one), borderRadius: 3, maxBarThickness: 18 })),
      },
      options: {
        ...commonOptions(data, unit),
        indexAxis: "y",
        scales: {
          x: axis(numbers(unit)),
          y: axis({ grid: { display: false, drawBorder: false }, ticks: { autoSkip: false } }),
        },
      },
    }),

    columns: (data, unit) => {
      const filled = fillGaps(data);
      return {
        type: "bar",
        data: {
          labels: filled.labels,
          datasets: filled.series.map((one) => ({ ...dataset(one), maxBarThickness: 28 })),
        },
        options: {
          ...commonOptions(data, unit),
          scales: {
            x: periods(),
            y: axis(numbers(unit)),
          },
        },
      };
    },

    growth: (data, unit) => {
      // One point would be no line: what comes on a single day is shown as columns.
      if (data.labels.length < 2) return shapes.columns(data, unit);
      const summed = sumUp(fillGaps(data));
      return {
        type: "line",
        data: {
          labels: summed.labels,
          datasets: summed.series.map((one) => ({
            ...dataset(one),
            borderColor: colour(one.colour),
            borderWidth: 1,
            fill: true,
            pointRadius: 0,
            stepped: summed.labels.length < 60,
          })),
        },
        options: {
          ...commonOptions(data, unit),
          scales: {
            x: periods(),
            y: axis(numbers(unit)),
          },
        },
      };
    },
  };

  const drawn = new Map();

  const draw = (figure) => {
    const data = readTable(figure.querySelector("table"));
    const plot = figure.querySelector(".plot");
    const shape = figure.dataset.chart;
    drawn.get(figure)?.destroy();
    plot.hidden = false;
    if (shape === "bars") plot.style.flexBasis = Math.max(10, 4 + 1.7 * data.labels.length) + "rem";
    drawn.set(
      figure,
      new Chart(plot.querySelector("canvas"), shapes[shape](data, figure.dataset.unit)),
    );
    figure.dataset.drawn = data.series.length;
  };

  const drawAll = () => {
    Chart.defaults.color = colour("soft");
    Chart.defaults.font.family = getComputedStyle(document.body).fontFamily;
    document.querySelectorAll("figure").forEach(draw);
  };

  drawAll();
  document.querySelectorAll("figure details").forEach((table) => {
    table.open = false;
  });

  matchMedia("(prefers-color-scheme: dark)").addEventListener("change", drawAll);
  addEventListener("beforeprint", () => {
    root.classList.add("on-paper");
    drawAll();
  });
  addEventListener("afterprint", () => {
    root.classList.remove("on-paper");
    drawAll();
  });
})();
