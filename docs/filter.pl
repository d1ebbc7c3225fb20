#!/usr/bin/perl
# Hands a header to Doxygen. A banner opens a page, with the example of its name below it; a comment stands for all
# declarations that follow it without a blank line.
use strict;
use warnings;

my ($path) = @ARGV;
open my $file, '<', $path or die "$path: $!";
my @lines = <$file>;
my $group;  # The page that is open.

sub slug {
  my $slug = lc shift;
  $slug =~ s/[^a-z0-9]+/_/g;
  return $slug;
}

# Doxygen does not miss the comment of an enumerator.
my $text = join '', @lines;
while ($text =~ /\benum\b[^{;]*\{\n(.*?)\n\};/sg) {
  $_ =~ /\/\/\/</ || $_ =~ /^\s*\/\// || die "$path: not documented: $_\n" for split /\n/, $1;
}

for (my $i = 0; $i < @lines; ++$i) {
  local $_ = $lines[$i];
  if (/^\/\/ -----/) {
    my @text;
    push @text, $lines[$i] =~ s/^\/\/ ?//r while $lines[++$i] !~ /^\/\/ -----/;
    my ($title, $rest) = join('', @text) =~ /^(.*?)(?:(?:[.:]\s|\n\n)(.*))?\n$/s;
    print "/** \@} */\n" if $group;
    $group = slug($title);
    print "/** \\defgroup $group $title\n", $rest // '', "\n";
    my $example = "$group.cpp";
    print "\\par Example\n\\include $example\n" if $path =~ /\bM_/;
    print "\@{ */\n";
  } elsif (/^#pragma GCC visibility pop/ && $group) {
    print "/** \@} */\n";
    $group = undef;
  } elsif (/^\/\/ / && $group) {
    # A comment between declarations is about the page.
    my @text = s/^\/\/ ?//r;
    push @text, $lines[$i] =~ s/^\/\/ ?//r while $lines[++$i] =~ /^\/\//;
    print "/** \@} */\n/** \\addtogroup $group\n\\verbatim\n", @text, "\\endverbatim\n\@{ */\n";
    redo if $i < @lines;
  } elsif (/^template <>$/) {
    ++$i;  # A specialisation is no declaration of its own.
  } elsif (/^\/\/\/ \\file/) {
    # The head of a header, with its table of contents as it stands.
    my $is_table = 0;
    for (; $lines[$i] =~ /^\/\/\//; ++$i) {
      print "/// \\endverbatim\n" if $is_table && $lines[$i] !~ /^\/\/\/ /;
      $is_table &&= $lines[$i] =~ /^\/\/\/ /;
      print $lines[$i];
      next if $lines[$i] !~ /^\/\/\/ Contents/;
      print "/// \\verbatim\n";
      $is_table = 1;
    }
    redo;
  } elsif (/^\s*\/\/\/(?!<)/) {
    my @comment = ($_);
    push @comment, $lines[++$i] while $lines[$i + 1] =~ /^\s*\/\/\//;
    # Once more for each declaration up to a blank line, another comment, or the end of a body.
    my $depth = 0;
    my $is_first = 1;
    while ($i + 1 < @lines) {
      last if $depth == 0 && $lines[$i + 1] =~ /^\s*($|\/\/|\}|#|static_assert)/;
      print @comment if $is_first;
      $_ = $lines[++$i];
      $depth += () = /\{/g;
      $depth -= () = /\}/g;
      $is_first = $depth == 0 && /[;}]\s*(\/\/.*)?$/;
      print;
      last if /\{\s*$/;  # A body, whose members have comments of their own.
    }
  } else {
    print;
  }
}
