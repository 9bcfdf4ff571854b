# How much of what is wanted each row takes up: a bar from the least to the most, a point for the median.
# In: `data`, columns place, name, median, min, max, all in multiples of what is wanted; `count` rows.
set terminal pngcairo size 1100, 60 + 22 * count font "Liberation Sans,10"
set output picture
set datafile separator "\t"
set title "In multiples of what is wanted (left is good)"
set logscale x
set xrange [0.001:*]
set yrange [count:-1]
set grid x
set key off
set arrow from 1, graph 0 to 1, graph 1 nohead lw 2 lc "red"
plot data using 3:1:4:5:ytic(2) with xerrorbars pt 7 lc "#1f5fa8" lw 2
